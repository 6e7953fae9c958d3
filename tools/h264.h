// Where H.264 pictures begin (Rec. ITU-T H.264, 7.3 and 7.4.1.2.4).
#ifndef TOOLS_H264_H
#define TOOLS_H264_H

#include <stddef.h>
#include <stdint.h>

#include <optional>

#include "tools/description.h"

namespace tools {

class h264 {
  public:
    // What a NAL unit is to the pictures of a stream.
    enum class role {
        header,  // belongs to the picture that follows
        slice,   // of a new picture
        more     // belongs to the picture before
    };
    // `nal` begins with the byte behind the start code; what follows the unit may follow.
    role role_of(const uint8_t *nal, size_t size);

    // What the first sequence parameter set says.
    const description &about() const { return about_; }

  private:
    struct sequence_parameters {
        uint32_t frame_num_bits, poc_type, poc_lsb_bits = 0;
        bool separate_planes = false, frames_only, delta_poc_is_zero = false;
    };
    struct picture_parameters {
        uint32_t sequence;
        bool poc_delta_per_frame;
    };
    // What differs between the slices of two pictures.
    struct slice_header {
        uint32_t first_block, parameters, frame_num = 0, idr_id = 0, poc_lsb = 0;
        int32_t poc_delta[3] = {};
        bool idr, reference, field = false, bottom = false, complete = false;
    };

    void read_sequence(const uint8_t *nal, size_t size);
    void read_picture(const uint8_t *nal, size_t size);
    std::optional<slice_header> read_slice(const uint8_t *nal, size_t size) const;

    std::optional<sequence_parameters> sequences_[32];
    std::optional<picture_parameters> pictures_[256];
    std::optional<slice_header> last_;
    description about_;
};

}  // namespace tools

#endif
