// Byte pairs: interleaved and taken apart.
#ifndef SIMGP_VECTOR_LAYOUT_H
#define SIMGP_VECTOR_LAYOUT_H

#include "rows/layout.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

static void pack_pairs(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t pairs) {
    in_pair_steps(
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

static void unpack_pairs(const uint8_t *src, uint8_t *a, uint8_t *b, ptrdiff_t pairs) {
    in_pair_steps(
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

void fill_layout(layout_rows &t) {
    t.pack = pack_pairs;
    t.unpack = unpack_pairs;
}

}  // namespace simgp::SIMD_TARGET

#endif
