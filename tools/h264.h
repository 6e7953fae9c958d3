// Where H.264 pictures begin (Rec. ITU-T H.264, 7.3 and 7.4.1.2.4).
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>

namespace tools {

class H264 {
  public:
    /// What a NAL unit is to the pictures of a stream.
    enum class Role {
        header,  // belongs to the picture that follows
        slice,   // of a new picture
        more     // belongs to the picture before
    };
    /// `nal` begins with the byte behind the start code; what follows the unit may follow.
    Role role(const uint8_t *nal, size_t size);

  private:
    struct SequenceParameters {
        uint32_t frame_num_bits, poc_type, poc_lsb_bits = 0;
        bool separate_planes = false, frames_only, delta_poc_is_zero = false;
    };
    struct PictureParameters {
        uint32_t sequence;
        bool poc_delta_per_frame;
    };
    // What differs between the slices of two pictures.
    struct Slice {
        uint32_t first_block, parameters, frame_num = 0, idr_id = 0, poc_lsb = 0;
        int32_t poc_delta[3] = {};
        bool idr, reference, field = false, bottom = false, complete = false;
    };

    void read_sequence(const uint8_t *nal, size_t size);
    void read_picture(const uint8_t *nal, size_t size);
    std::optional<Slice> read_slice(const uint8_t *nal, size_t size) const;

    std::optional<SequenceParameters> sequences_[32];
    std::optional<PictureParameters> pictures_[256];
    std::optional<Slice> last_;
};

}  // namespace tools
