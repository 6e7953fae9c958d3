// Byte pairs: interleaved and taken apart.
#ifndef SIMGP_VECTOR_LAYOUT_H
#define SIMGP_VECTOR_LAYOUT_H

#include "rows/layout.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

static void pack_pairs(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t pairs) {
    move_pairs(
        pairs, lines_in<1, 1>{{a, b}}, lines_out<2>{{dst}},
        [](const uint8_t *const *p) {
            return pair_u8{natural_to_by8(load(p[0])), natural_to_by8(load(p[1]))};
        },
        [](uint8_t *const *q, const pair_u8 &v) { store_zip8(q[0], v.even, v.odd); },
        [](uint8_t *const *q, const uint8_t *const *p) { store(q[0], load_zip(p[0], p[1])); },
        [](uint8_t *const *q, const uint8_t *const *p) {
            q[0][0] = *p[0];
            q[0][1] = *p[1];
        });
}

static void unpack_pairs(const uint8_t *src, uint8_t *a, uint8_t *b, ptrdiff_t pairs) {
    move_pairs(
        pairs, lines_in<2>{{src}}, lines_out<1, 1>{{a, b}},
        [](const uint8_t *const *p) { return load_split_natural(p[0]); },
        [](uint8_t *const *q, const pair_u8 &v) {
            store(q[0], v.even);
            store(q[1], v.odd);
        },
        [](uint8_t *const *q, const uint8_t *const *p) { store_split(q[0], q[1], load(p[0])); },
        [](uint8_t *const *q, const uint8_t *const *p) {
            *q[0] = p[0][0];
            *q[1] = p[0][1];
        });
}

void fill_layout(layout_rows &t) {
    t.pack = pack_pairs;
    t.unpack = unpack_pairs;
}

}  // namespace simgp::SIMD_TARGET

#endif
