// The search for start codes.
#ifndef SCMN_VECTOR_KEYFRAME_H
#define SCMN_VECTOR_KEYFRAME_H

#include "rows/keyframe.h"

namespace simgp::SIMD_TARGET {

// 0 where a byte and the next are 0.
inline u8v zero_pairs(const uint8_t *p) { return bit_or(load(p), load(p + 1)); }

// The index of the first code among `bytes` places, else `bytes`.
inline int first_code(const uint8_t *p, u8v mask, u8v code) {
    return first_zero(bit_or(zero_pairs(p), bit_xor(bit_and(load(p + 2), mask), code)));
}

// Two zero bytes are rare in coded video: four vectors are searched for them at once, and only then
// for the code.
static ptrdiff_t find_code(const uint8_t *p, ptrdiff_t count, uint8_t mask, uint8_t code) {
    const u8v masks = set_u8(mask), codes = set_u8(code);
    ptrdiff_t x = 0;
    for (; x + 4 * bytes <= count; x += 4 * bytes) {
        const u8v low = min_u8(zero_pairs(p + x), zero_pairs(p + x + bytes));
        const u8v high = min_u8(zero_pairs(p + x + 2 * bytes), zero_pairs(p + x + 3 * bytes));
        if (first_zero(min_u8(low, high)) == bytes) continue;
        for (ptrdiff_t at = x; at < x + 4 * bytes; at += bytes) {
            const int i = first_code(p + at, masks, codes);
            if (i < bytes) return at + i;
        }
    }
    for (; x + bytes <= count; x += bytes) {
        const int i = first_code(p + x, masks, codes);
        if (i < bytes) return x + i;
    }
    while (x < count && (p[x] | p[x + 1] | ((p[x + 2] & mask) ^ code)) != 0) x++;
    return x;
}

void fill_keyframe(keyframe_rows &t) { t.find_code = find_code; }

}  // namespace simgp::SIMD_TARGET

#endif
