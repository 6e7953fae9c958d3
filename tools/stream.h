// Elementary video streams, cut into coded pictures.
#ifndef TOOLS_STREAM_H
#define TOOLS_STREAM_H

#include <stdint.h>

#include <vector>

#include "tools/h264.h"
#include "tools/input.h"

namespace tools {

// A coded picture with the headers in front of it.
struct coded_picture {
    uint64_t offset = 0, size = 0;  // bytes
    bool key = false;
};

// The media type (SCMN_MT_*) of a FourCC in words.
const char *media_name(int32_t media_type);

class coded_stream {
  public:
    // A stream of `media_type`, which must be one with start codes, or where that is 0, of the
    // type that the first megabyte tells. Keeps a part of the stream in memory, whatever its size.
    coded_stream(input &in, int32_t media_type);

    int32_t media_type() const { return media_type_; }
    // As far as the headers up to now have said it.
    const description &about() const { return about_; }
    // The next picture; false behind the last one.
    bool next(coded_picture &picture);

  private:
    // A start code, with some of what follows it.
    struct unit {
        uint64_t offset;
        const uint8_t *bytes;
        size_t size;
    };
    enum class role { header, picture, more };

    int32_t recognise() const;
    void reject_containers() const;
    [[noreturn]] void reject() const;
    bool read_more();
    bool find(unit &u);
    role role_of(const unit &u);

    input &input_;
    int32_t media_type_;
    h264 h264_;
    description about_;

    std::vector<uint8_t> window_;
    uint64_t window_offset_ = 0;
    size_t at_ = 0;  // where the search goes on
    bool ended_ = false;

    // The picture that is being collected.
    bool started_ = false, has_picture_ = false;
    coded_picture current_;
};

}  // namespace tools

#endif
