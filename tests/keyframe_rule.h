// The key-frame rules, byte by byte.
#ifndef TESTS_KEYFRAME_RULE_H
#define TESTS_KEYFRAME_RULE_H

#include <stdint.h>

namespace keyframe_rule {

inline int of_h264(const uint8_t *b, int64_t size) {
    for (int64_t k = 0; k <= size - 4; k++) {
        if (b[k] != 0 || b[k + 1] != 0 || b[k + 2] != 1) continue;
        const int type = b[k + 3] % 32;
        if (type == 5) return 1;
        if (type == 1) return 0;
    }
    return 0;
}

inline int of_mpeg4(const uint8_t *b, int64_t size) {
    for (int64_t k = 0; k <= size - 5; k++)
        if (b[k] == 0 && b[k + 1] == 0 && b[k + 2] == 1 && b[k + 3] == 0xB6) return b[k + 4] < 0x40;
    return 0;
}

inline int of_h263(const uint8_t *b, int64_t size) {
    for (int64_t k = 0; k <= size - 7; k++) {
        if (b[k] != 0 || b[k + 1] != 0 || b[k + 2] < 0x80 || b[k + 2] > 0x83) continue;
        // The header's bits behind the start code and the temporal reference, from PTYPE's first
        // on.
        const auto bit = [&](int i) { return b[k + (30 + i) / 8] >> (7 - (30 + i) % 8) & 1; };
        const auto bits = [&](int i, int n) {
            int value = 0;
            while (n-- > 0) value = 2 * value + bit(i++);
            return value;
        };
        if (bits(5, 3) != 7) return bit(8) == 0;
        if (bits(8, 3) != 1) return bits(11, 3) == 0;
        return k + 7 < size ? bits(11 + 18, 3) == 0 : 0;
    }
    return 0;
}

inline int of(int32_t media_type, const uint8_t *b, int64_t size) {
    if (size <= 0) return 0;
    switch (media_type) {
        case 102:
            return of_mpeg4(b, size);
        case 103:
        case 111:
            return of_h263(b, size);
        case 104:
            return of_h264(b, size);
        case 105:
        case 110:
            return b[0] < 0x40;
        case 106:
            return b[0] < 0x80;
        default:
            return 0;
    }
}

}  // namespace keyframe_rule

#endif
