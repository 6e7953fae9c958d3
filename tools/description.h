// What the headers of a stream say about its pictures.
#ifndef TOOLS_DESCRIPTION_H
#define TOOLS_DESCRIPTION_H

#include <stddef.h>
#include <stdint.h>

#include <string>

namespace tools {

struct description {
    int width = 0, height = 0;  // 0: not known
    std::string profile;        // with the level; empty: not known

    // Keeps what is known.
    void add(const description &more) {
        if (!width) width = more.width, height = more.height;
        if (profile.empty()) profile = more.profile;
    }
};

// Of an MPEG-4 part 2 header that begins with its start code (ISO/IEC 14496-2, 6.2.2 and 6.2.3).
description mpeg4_description(const uint8_t *bytes, size_t size);
// Of an H.263 picture (Rec. ITU-T H.263, 5.1).
description h263_description(const uint8_t *bytes, size_t size);
// Names of H.264 profiles and levels, from the first three bytes of a sequence parameter set (Rec.
// ITU-T H.264, annex A).
std::string h264_profile(uint32_t profile, uint32_t constraints, uint32_t level);

}  // namespace tools

#endif
