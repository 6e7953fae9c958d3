// What is expected of operations that keep the format, copy and rotation.
#ifndef TESTS_KEPT_PLANES_H
#define TESTS_KEPT_PLANES_H

#include <stdint.h>

#include <vector>

namespace rig {

// How many planes they see of a format, and the bytes of a sample of each; none: refused.
inline std::vector<int> kept_planes(int format) {
    if (format == 0) return {1};
    if (format == 6 || format == 7) return {1, 2};
    if (format >= 1 && format <= 99 && format != 11) return {1, 1, 1};
    if (format >= 200 && format <= 299) return {2};
    return {};
}

// Every code that there may be, with room for more, and some far away.
inline std::vector<int> format_codes() {
    std::vector<int> codes = {INT32_MIN, INT32_MAX, 65536 + 1, 0x01000000, 0x01000001};
    for (int code = -3; code <= 620; code++) codes.push_back(code);
    return codes;
}

}  // namespace rig

#endif
