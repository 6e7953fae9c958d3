// The search for start codes.
#ifndef SCMN_VECTOR_KEYFRAME_H
#define SCMN_VECTOR_KEYFRAME_H

#include "rows/keyframe.h"

namespace simgp::SIMD_TARGET {

// 0 at the places of a vector where a code begins.
inline u8v codes_at(const uint8_t *p, u8v mask, u8v code) {
    const u8v zeros = bit_or(load(p), load(p + 1));
    return bit_or(zeros, bit_xor(bit_and(load(p + 2), mask), code));
}

// Two zeros and the code byte lie in two pairs of bytes, whatever the pairs begin with: either the two
// zeros are a pair, or the second one and the code byte are. One load thus tells whether a code can begin
// among as many places, the first one a byte in front of p: whether some pair is 0 in the bits of
// `either`, which leaves out those that the code byte may have set. The highest bit, left out too, makes
// the pairs numbers that min_s16 can compare. Here for four vectors.
inline bool zeros_near(const uint8_t *p, u16v either) {
    const auto pairs = [=](int i) { return as_s16(bit_and(as_u16(load(p + i * bytes)), either)); };
    const u16v least = as_u16(min_s16(min_s16(pairs(0), pairs(1)), min_s16(pairs(2), pairs(3))));
    const u16v folded = bit_or(bit_or(least, shr<8>(least)), set_u16(0xFF00));
    return first_zero(as_u8(folded)) < bytes;
}

// Is the code byte among the bytes of four vectors?
inline bool code_near(const uint8_t *p, u8v mask, u8v code) {
    const auto other = [=](int i) { return bit_xor(bit_and(load(p + i * bytes), mask), code); };
    return first_zero(min_u8(min_u8(other(0), other(1)), min_u8(other(2), other(3)))) < bytes;
}

// Coded video has few pairs of zeros, and padding few bytes that are the code's: the test that ruled out
// the last four vectors comes first in the next.
static ptrdiff_t find_code(const uint8_t *p, ptrdiff_t count, uint8_t mask, uint8_t code) {
    ptrdiff_t x = 0;
    if (count < bytes) {
        while (x < count && (p[x] | p[x + 1] | ((p[x + 2] & mask) ^ code)) != 0) x++;
        return x;
    }
    const u8v masks = set_u8(mask), codes = set_u8(code);
    const u16v either = set_u16(static_cast<uint16_t>((mask & ~code & 0x7F) << 8 | 0xFF));
    int i = first_zero(codes_at(p, masks, codes));
    if (i < bytes) return i;
    // On from where the pairs that begin a byte later are aligned, at most a vector further.
    x = bytes - static_cast<ptrdiff_t>((reinterpret_cast<uintptr_t>(p) + 1) % bytes);
    bool code_first = false;
    for (; x + 4 * bytes <= count; x += 4 * bytes) {
        const uint8_t *at = p + x;
        if (code_first) {
            if (!code_near(at + 2, masks, codes)) continue;
            if (!zeros_near(at + 1, either)) {
                code_first = false;
                continue;
            }
        } else {
            if (!zeros_near(at + 1, either)) continue;
            if (!code_near(at + 2, masks, codes)) {
                code_first = true;
                continue;
            }
        }
        for (int k = 0; k < 4; k++) {
            i = first_zero(codes_at(at + k * bytes, masks, codes));
            if (i < bytes) return x + k * bytes + i;
        }
    }
    for (; x + bytes <= count; x += bytes) {
        i = first_zero(codes_at(p + x, masks, codes));
        if (i < bytes) return x + i;
    }
    // The rest together with places that were searched.
    if (x == count) return count;
    i = first_zero(codes_at(p + count - bytes, masks, codes));
    return i < bytes ? count - bytes + i : count;
}

void fill_keyframe(keyframe_rows &t) { t.find_code = find_code; }

}  // namespace simgp::SIMD_TARGET

#endif
