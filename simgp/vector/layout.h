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

static void pack_lines(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b, ptrdiff_t stride_b,
                       uint8_t *dst, ptrdiff_t dst_stride, ptrdiff_t pairs, ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        pack_pairs(a + y * stride_a, b + y * stride_b, dst + y * dst_stride, pairs);
}
static void unpack_lines(const uint8_t *src, ptrdiff_t src_stride, uint8_t *a, ptrdiff_t stride_a,
                         uint8_t *b, ptrdiff_t stride_b, ptrdiff_t pairs, ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        unpack_pairs(src + y * src_stride, a + y * stride_a, b + y * stride_b, pairs);
}

// Planes, as far as a copy knows them.
struct copied_lines {
    const uint8_t *src;
    ptrdiff_t src_stride;
    uint8_t *dst;
    ptrdiff_t dst_stride, size, height;
};
// What there is to do for a line is written out, as lines are short.
template <class F>
inline void for_lines(const copied_lines &c, F f) {
    for (ptrdiff_t y = 0; y < c.height; y++) f(c.src + y * c.src_stride, c.dst + y * c.dst_stride);
}
// Copies lines of Bytes ... 2 * Bytes bytes: the first Bytes and the last.
template <int Bytes>
static void copy_ends(const copied_lines &c) {
    const ptrdiff_t last = c.size - Bytes;
    for_lines(c, [=](const uint8_t *from, uint8_t *to) {
        memcpy(to, from, Bytes);
        memcpy(to + last, from + last, Bytes);
    });
}
// Copies lines of less than Vectors vectors, but not of less than one vector less.
template <int Vectors>
static void copy_few_vectors(const copied_lines &c) {
    const ptrdiff_t last = c.size - bytes;
    for_lines(c, [=](const uint8_t *from, uint8_t *to) {
        for (int k = 0; k < Vectors - 1; k++) store(to + k * bytes, load(from + k * bytes));
        store(to + last, load(from + last));
    });
}
static void copy_vectors(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst,
                         ptrdiff_t dst_stride, ptrdiff_t size, ptrdiff_t height) {
    const copied_lines all{src, src_stride, dst, dst_stride, size, height};
    if (size > 4 * bytes)
        return for_lines(all, [=](const uint8_t *from, uint8_t *to) {
            const auto four = [=](ptrdiff_t x) {
                const u8v a = load(from + x), b = load(from + x + bytes),
                          c = load(from + x + 2 * bytes), d = load(from + x + 3 * bytes);
                store(to + x, a);
                store(to + x + bytes, b);
                store(to + x + 2 * bytes, c);
                store(to + x + 3 * bytes, d);
            };
            for (ptrdiff_t x = 0; x + 4 * bytes < size; x += 4 * bytes) four(x);
            four(size - 4 * bytes);
        });
    if (size > 3 * bytes) return copy_few_vectors<4>(all);
    if (size > 2 * bytes) return copy_few_vectors<3>(all);
    if (size > bytes) return copy_few_vectors<2>(all);
    if (size == bytes) return copy_few_vectors<1>(all);
    if (size >= 16) return copy_ends<16>(all);
    if (size >= 8) return copy_ends<8>(all);
    if (size >= 4) return copy_ends<4>(all);
    if (size >= 2) return copy_ends<2>(all);
    copy_ends<1>(all);
}

void fill_layout(layout_rows &t) {
    t.pack = pack_lines;
    t.unpack = unpack_lines;
    t.copy = copy_vectors;
}

}  // namespace simgp::SIMD_TARGET

#endif
