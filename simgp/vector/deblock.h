// The deblocking filter, with all its steps in bytes.
#ifndef SIMGP_VECTOR_DEBLOCK_H
#define SIMGP_VECTOR_DEBLOCK_H

#include <string.h>

#include "rows/deblock.h"

namespace simgp::SIMD_TARGET {

// The samples across as many edges as a vector has bytes.
struct across {
    u8v a, b, c, d;
};

// With e = (a - d) >> 2, the filter's d is (c - b + e) >> 1, as floors of floors are one:
//
//   (a - 4 b + 4 c - d) >> 3 = (((a - d) >> 2) + c - b) >> 1
//
// Called `step` below. Signed values carry a bias, and ~v is 255 - v:
//
//   avg(p, ~q)                              = 128 + ((p - q) >> 1)     0 ... 255
//   e + 64     = avg(a, ~d) >> 1                                       0 ... 127
//   step + 160 = avg(c, ~b) + ((e + 64 + parity) >> 1)                 0 ... 319
//
// with parity = (b xor c) & 1: the halves of c - b and of e lose a carry where both are odd. The sum
// does not fit a byte, but is wanted as a difference: step = x - y with
//
//   x = avg(c, ~b)                          0 ... 255
//   y = 160 - ((e + 64 + parity) >> 1)      96 ... 160
//
// of which saturating subtractions give the positive and the negative part. The rounding average of
// complements makes y, for avg(255 - m, 255 - n) = 255 - ((m + n) >> 1).
//
// t = |step| - 2 max(0, |step| - strength), at least 0, comes out right where 2 max(...) saturates
// at 255, for that is more than |step|. As t <= |step|, d1's parts are the smaller of t and those of
// step.
inline across filter(const across &v, u8v strength) {
    const u8v not_b = bit_not(v.b);
    const u8v e = half_u8(avg_u8(v.a, bit_not(v.d)));           // + 64
    const u8v even = bit_or(bit_xor(not_b, v.c), set_u8(254));  // 255 - parity
    const u8v x = avg_u8(v.c, not_b);
    const u8v y = sub_u8(avg_u8(bit_not(e), even), set_u8(95));
    const u8v up = sub_sat_u8(x, y), down = sub_sat_u8(y, x);              // of step
    const u8v size = bit_or(up, down), over = sub_sat_u8(size, strength);  // at most 160, 159
    const u8v t = sub_sat_u8(size, add_sat_u8(over, over));                // at most 160
    const u8v d1_up = min_u8(t, up), d1_down = min_u8(t, down);
    const u8v bias = set_u8(64), half = half_u8(t);  // at most 80
    const u8v d2 = sub_u8(max_u8(min_u8(e, add_u8(bias, half)), sub_sat_u8(bias, half)), bias);
    return {sub_u8(v.a, d2), sub_sat_u8(add_sat_u8(v.b, d1_up), d1_down),
            add_sat_u8(sub_sat_u8(v.c, d1_up), d1_down), add_u8(v.d, d2)};
}

static void line_edge(uint8_t *a, uint8_t *b, uint8_t *c, uint8_t *d, ptrdiff_t width,
                      int strength) {
    const u8v s = set_u8(static_cast<uint8_t>(strength));
    if (width < bytes) {
        uint8_t part[4][bytes] = {};
        uint8_t *const line[4] = {a, b, c, d};
        for (int i = 0; i < 4; i++) memcpy(part[i], line[i], static_cast<size_t>(width));
        const across v = filter({load(part[0]), load(part[1]), load(part[2]), load(part[3])}, s);
        store(part[0], v.a);
        store(part[1], v.b);
        store(part[2], v.c);
        store(part[3], v.d);
        for (int i = 0; i < 4; i++) memcpy(line[i], part[i], static_cast<size_t>(width));
        return;
    }
    const auto filtered = [&](ptrdiff_t x) {
        return filter({load(a + x), load(b + x), load(c + x), load(d + x)}, s);
    };
    const auto put = [&](ptrdiff_t x, const across &v) {
        store(a + x, v.a);
        store(b + x, v.b);
        store(c + x, v.c);
        store(d + x, v.d);
    };
    // The last vector ends at the last sample. It may do some again, from what they were.
    const across last = filtered(width - bytes);
    for (ptrdiff_t x = 0; x + bytes <= width; x += bytes) put(x, filtered(x));
    put(width - bytes, last);
}

// `bytes` bytes of each of 8 lines, with the samples across bytes / 8 vertical edges. Those of the
// even lines lie in the even lanes of 32 bits, those of the odd lines, which begin 4 columns
// earlier, in the odd lanes.
struct eight_lines {
    static constexpr ptrdiff_t begin(int line) { return line & 1 ? 2 : 6; }  // column of the first
    u8v line[8];
};

// Within blocks, 16 bytes as a matrix of 4 x 4, and four vectors as a matrix of 4 x 4 lanes of 32
// bits. Both are undone by doing them again.
struct four {
    u8v v[4];
};
inline four transpose_bytes(const four &x, u8v order) {
    return {{shuffle(x.v[0], order), shuffle(x.v[1], order), shuffle(x.v[2], order),
             shuffle(x.v[3], order)}};
}
inline four transpose_lanes(const four &x) {
    const u8v low01 = zip_low<4>(x.v[0], x.v[1]), high01 = zip_high<4>(x.v[0], x.v[1]);
    const u8v low23 = zip_low<4>(x.v[2], x.v[3]), high23 = zip_high<4>(x.v[2], x.v[3]);
    return {{zip_low<8>(low01, low23), zip_high<8>(low01, low23), zip_low<8>(high01, high23),
             zip_high<8>(high01, high23)}};
}

// Two lines fill a vector with samples a b c d a b c d ... Turned to a a a a b b b b ... in each
// block, four such vectors are transposed into the four samples across.
static constexpr uint8_t transposed[16] = {0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15};
inline eight_lines filter_lines(const eight_lines &in, u8v strength) {
    const u8v order = load_blocks(transposed, 0);
    const auto pair = [&](int i) { return blend_u32(in.line[2 * i], in.line[2 * i + 1]); };
    const four x = transpose_lanes(transpose_bytes({{pair(0), pair(1), pair(2), pair(3)}}, order));
    const across f = filter({x.v[0], x.v[1], x.v[2], x.v[3]}, strength);
    const four y = transpose_bytes(transpose_lanes({{f.a, f.b, f.c, f.d}}), order);
    eight_lines out;
    for (int i = 0; i < 4; i++) {
        out.line[2 * i] = blend_u32(y.v[i], in.line[2 * i]);
        out.line[2 * i + 1] = blend_u32(in.line[2 * i + 1], y.v[i]);
    }
    return out;
}

// From a line to the next in steps of `stride`, from the columns where they begin.
inline eight_lines load_lines(const uint8_t *p, ptrdiff_t stride) {
    eight_lines v;
    for (int i = 0; i < 8; i++) v.line[i] = load(p + i * stride + eight_lines::begin(i));
    return v;
}
inline void store_lines(uint8_t *p, ptrdiff_t stride, const eight_lines &v) {
    for (int i = 0; i < 8; i++) store(p + i * stride + eight_lines::begin(i), v.line[i]);
}

static void column_edges(uint8_t *p, ptrdiff_t stride, ptrdiff_t edges, ptrdiff_t lines,
                         int strength) {
    const u8v s = set_u8(static_cast<uint8_t>(strength));
    const ptrdiff_t size = 8 * edges;
    if (lines < 8 || size < bytes) {
        constexpr ptrdiff_t width = bytes + 8;
        for (ptrdiff_t x = 0; x < size; x += bytes) {
            uint8_t part[8 * width] = {};
            const ptrdiff_t n = size - x < bytes ? size - x : bytes;
            const auto copy = [=](uint8_t *to, const uint8_t *from) {
                memcpy(to + 2, from + 2, static_cast<size_t>(n + 4));
            };
            for (ptrdiff_t y = 0; y < lines; y++) copy(part + y * width, p + y * stride + x);
            store_lines(part, width, filter_lines(load_lines(part, width), s));
            for (ptrdiff_t y = 0; y < lines; y++) copy(p + y * stride + x, part + y * width);
        }
        return;
    }
    // The last vectors end with the last edge. They may do some again, from what they were.
    const eight_lines last = filter_lines(load_lines(p + size - bytes, stride), s);
    for (ptrdiff_t x = 0; x + bytes <= size; x += bytes)
        store_lines(p + x, stride, filter_lines(load_lines(p + x, stride), s));
    store_lines(p + size - bytes, stride, last);
}

void fill_deblock(deblock_rows &t) {
    t.line_edge = line_edge;
    t.column_edges = column_edges;
}

}  // namespace simgp::SIMD_TARGET

#endif
