// Byte pairs: interleaved and taken apart.
#ifndef SIMGP_VECTOR_LAYOUT_H
#define SIMGP_VECTOR_LAYOUT_H

#include <string.h>

#include "simgp/rows.h"

namespace simgp::SIMD_TARGET {

// Moves `pairs` >= 1 pairs in steps of a vector: whole(i) does `bytes` of them from pair i on,
// half(i) half as many, one(i) one. The last step ends at the last pair and may do some again.
template <class Whole, class Half, class One>
inline void in_steps(ptrdiff_t pairs, Whole whole, Half half, One one) {
    if (pairs < bytes / 2) {
        for (ptrdiff_t i = 0; i < pairs; i++) one(i);
        return;
    }
    if (pairs < bytes) {
        half(0);
        return half(pairs - bytes / 2);
    }
    ptrdiff_t i = 0;
    for (; i + 2 * bytes <= pairs; i += 2 * bytes) {
        whole(i);
        whole(i + bytes);
    }
    if (i + bytes <= pairs) {
        whole(i);
        i += bytes;
    }
    if (i < pairs) whole(pairs - bytes);
}

void pack_pairs(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t pairs) {
    in_steps(
        pairs,
        [&](ptrdiff_t i) {
            store_zip8(dst + 2 * i, natural_to_by8(load(a + i)), natural_to_by8(load(b + i)));
        },
        [&](ptrdiff_t i) { store(dst + 2 * i, load_zip(a + i, b + i)); },
        [&](ptrdiff_t i) {
            dst[2 * i] = a[i];
            dst[2 * i + 1] = b[i];
        });
}

void unpack_pairs(const uint8_t *src, uint8_t *a, uint8_t *b, ptrdiff_t pairs) {
    in_steps(
        pairs,
        [&](ptrdiff_t i) {
            const pair_u8 v = load_split_natural(src + 2 * i);
            store(a + i, v.even);
            store(b + i, v.odd);
        },
        [&](ptrdiff_t i) { store_split(a + i, b + i, load(src + 2 * i)); },
        [&](ptrdiff_t i) {
            a[i] = src[2 * i];
            b[i] = src[2 * i + 1];
        });
}

void fill_layout(rows &t) {
    t.pack = pack_pairs;
    t.unpack = unpack_pairs;
}

}  // namespace simgp::SIMD_TARGET

#endif
