// One pixel at a time: the matrices, the layouts and the packings from which scalar rows are made. They
// are the definition of what all other rows compute.
#ifndef SIMGP_PIXEL_H
#define SIMGP_PIXEL_H

#include "rows/yuv2rgb.h"

namespace simgp::scalar {

// A matrix with S fractional bits; the rounding constant is a half.
//   R = (L (Y - 16) + KR Vc + half) >> S             Uc = U - 128, Vc = V - 128
//   G = (L (Y - 16) - KGU Uc - KGV Vc + half) >> S
//   B = (L (Y - 16) + KB Uc + half) >> S, each clamped to 0 ... 255
template <int L, int KR, int KGU, int KGV, int KB, int S>
struct matrix {
    static constexpr int clamp(int v) { return v < 0 ? 0 : v > 255 ? 255 : v; }
    static constexpr int red(int y, int, int v) {
        return clamp((L * (y - 16) + KR * (v - 128) + (1 << (S - 1))) >> S);
    }
    static constexpr int green(int y, int u, int v) {
        return clamp((L * (y - 16) - KGU * (u - 128) - KGV * (v - 128) + (1 << (S - 1))) >> S);
    }
    static constexpr int blue(int y, int u, int) {
        return clamp((L * (y - 16) + KB * (u - 128) + (1 << (S - 1))) >> S);
    }
};
using bt601 = matrix<298, 409, 100, 208, 516, 8>;      // ITU-R BT.601, limited range
using bt601_coarse = matrix<75, 102, 25, 52, 129, 6>;  // the same divided by 4, rounded

// Grey has no matrix.
struct grey_matrix {
    static constexpr int red(int y, int, int) { return y; }
    static constexpr int green(int y, int, int) { return y; }
    static constexpr int blue(int y, int, int) { return y; }
};

// The samples of pixel x of a row of `width` pixels.
struct yuv_samples {
    const uint8_t *y, *u, *v;
    ptrdiff_t width;
};
struct yuv {
    int y, u, v;
};
// Packed 4:2:2: byte y0 of a group is its first luma, the second lies two bytes on; then U and V.
// Of a group with a single pixel V lies outside the row: the group before lends its own.
inline yuv read_packed(const yuv_samples &s, ptrdiff_t x, int y0, int u, int v) {
    const uint8_t *group = s.y + (x >> 1) * 4;
    const bool whole = (x | 1) < s.width;
    return {group[y0 + 2 * (x & 1)], group[u], whole ? group[v] : x ? group[v - 4] : 128};
}
template <yuv_layout Layout>
yuv read_yuv(const yuv_samples &s, ptrdiff_t x) {
    const ptrdiff_t pair = x >> 1;
    if constexpr (Layout == yuv_layout::grey) return {s.y[x], 128, 128};
    if constexpr (Layout == yuv_layout::half) return {s.y[x], s.u[pair], s.v[pair]};
    if constexpr (Layout == yuv_layout::full) return {s.y[x], s.u[x], s.v[x]};
    if constexpr (Layout == yuv_layout::uv) return {s.y[x], s.u[2 * pair], s.u[2 * pair + 1]};
    if constexpr (Layout == yuv_layout::vu) return {s.y[x], s.u[2 * pair + 1], s.u[2 * pair]};
    if constexpr (Layout == yuv_layout::uyvy) return read_packed(s, x, 1, 0, 2);
    if constexpr (Layout == yuv_layout::yuyv) return read_packed(s, x, 0, 1, 3);
}

// Pixel x of a row. The low bits that a 16-bit word lacks are 0.
struct rgb {
    int r, g, b;
};
template <rgb_packing Packing>
rgb read_rgb(const uint8_t *src, ptrdiff_t x) {
    constexpr pixel_bytes at = pixels_of[size_t(Packing)];
    const uint8_t *const p = src + at.size * x;
    if constexpr (at.size == 2) {
        const int word = p[0] | p[1] << 8;
        const int high = word >> 8 & 0xF8, mid = word >> 3 & 0xFC, low = word << 3 & 0xF8;
        return at.r > at.b ? rgb{high, mid, low} : rgb{low, mid, high};
    } else {
        return {p[at.r], p[at.g], p[at.b]};
    }
}
template <rgb_packing Packing>
void write_rgb(uint8_t *dst, ptrdiff_t x, const rgb &c) {
    constexpr pixel_bytes at = pixels_of[size_t(Packing)];
    uint8_t *const p = dst + at.size * x;
    if constexpr (at.size == 2) {
        const int high = at.r > at.b ? c.r : c.b, low = at.r > at.b ? c.b : c.r;
        const int word = high >> 3 << 11 | c.g >> 2 << 5 | low >> 3;
        p[0] = uint8_t(word);
        p[1] = uint8_t(word >> 8);
    } else {
        p[at.r] = uint8_t(c.r);
        p[at.g] = uint8_t(c.g);
        p[at.b] = uint8_t(c.b);
        if constexpr (at.a >= 0) p[at.a] = 255;
    }
}

// Rows of them.
template <yuv_layout Layout, class Matrix, rgb_packing Packing>
void to_rgb_row(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                ptrdiff_t width) {
    const yuv_samples s{y, u, v, width};
    for (ptrdiff_t x = 0; x < width; x++) {
        const yuv p = read_yuv<Layout>(s, x);
        write_rgb<Packing>(dst, x,
                           {Matrix::red(p.y, p.u, p.v), Matrix::green(p.y, p.u, p.v),
                            Matrix::blue(p.y, p.u, p.v)});
    }
}

// Calls row for each line, or for both of each pair.
using yuv_row_fn = void(const yuv_to_rgb *how, const uint8_t *y, const uint8_t *u, const uint8_t *v,
                        uint8_t *dst, ptrdiff_t width);
void for_each_row(const lines_to_rgb &l, bool pairs, yuv_row_fn *row);

}  // namespace simgp::scalar

#endif
