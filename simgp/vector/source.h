// Sources: how the samples of a span of pixels are read.
//
// A source loads the samples of `bytes` pixels, in the order of pixels that the packer wants: luma
// as byte pairs, chroma as byte pairs, one pair for two pixels or, with full chroma, a vector of
// pairs for the even pixels and one for the odd. Where two pixels share chroma, load_halves does so
// for half a vector of pixels of each of two rows.
#ifndef SIMGP_VECTOR_SOURCE_H
#define SIMGP_VECTOR_SOURCE_H

#include <string.h>

#include "rows/yuv2rgb.h"
#include "simgp/vector/packer.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

struct samples {
    const uint8_t *y, *u, *v;
};

template <pixel_order Order>
inline pairs_v load_luma(const uint8_t *y, ptrdiff_t x) {
    return arrange<Order>(load_pairs(y + x));
}

template <pixel_order Order>
inline pairs_v load_halves_of(const uint8_t *p, const uint8_t *q, ptrdiff_t x) {
    return arrange<Order>(load_pair_halves(p + x, q + x));
}

using yuv_half = luma_chroma;
struct yuv_full {
    pairs_v y, pairs_even, pairs_odd;
};

template <yuv_layout>
struct source;

template <>
struct source<yuv_layout::half> {
    static constexpr pair_order pairs = pair_order::uv;

    template <pixel_order Order>
    static yuv_half load(const samples &s, ptrdiff_t x) {
        return {load_luma<Order>(s.y, x),
                arrange<Order>(load_pairs(s.u + (x >> 1), s.v + (x >> 1)))};
    }
    template <pixel_order Order>
    static yuv_half load_halves(const line_to_rgb &l, ptrdiff_t x) {
        return {load_halves_of<Order>(l.y[0], l.y[1], x),
                arrange<Order>(load_pairs_twice(l.u + (x >> 1), l.v + (x >> 1)))};
    }
};

template <>
struct source<yuv_layout::full> {
    static constexpr pair_order pairs = pair_order::uv;

    template <pixel_order Order>
    static yuv_full load(const samples &s, ptrdiff_t x) {
        const pairs_v u = load_luma<Order>(s.u, x), v = load_luma<Order>(s.v, x);
        return {load_luma<Order>(s.y, x), pair_evens(u, v), pair_odds(u, v)};
    }
};

template <pair_order Pairs>
struct source_pairs {
    static constexpr pair_order pairs = Pairs;

    template <pixel_order Order>
    static yuv_half load(const samples &s, ptrdiff_t x) {
        return {load_luma<Order>(s.y, x), load_luma<Order>(s.u, x)};
    }
    template <pixel_order Order>
    static yuv_half load_halves(const line_to_rgb &l, ptrdiff_t x) {
        return {load_halves_of<Order>(l.y[0], l.y[1], x), load_halves_of<Order>(l.u, l.u, x)};
    }
};

// Packed 4:2:2: every other byte is luma, the others are pairs U V.
template <pixel_order Order>
inline luma_chroma load_groups_for(const uint8_t *p) {
    if constexpr (Order == pixel_order::by8)
        return load_groups(p);
    else if constexpr (Order == pixel_order::by4)
        return load_groups_by4(p);
    else
        return load_groups_natural(p);
}
template <bool LUMA_FIRST>
struct source_packed {
    static constexpr pair_order pairs = pair_order::uv;

    template <pixel_order Order>
    static yuv_half load(const samples &s, ptrdiff_t x) {
        const luma_chroma p = load_groups_for<Order>(s.y + 2 * x);
        if constexpr (LUMA_FIRST)
            return p;
        else
            return exchanged(p);
    }
};
template <>
struct source<yuv_layout::uyvy> : source_packed<false> {};
template <>
struct source<yuv_layout::yuyv> : source_packed<true> {};

template <>
struct source<yuv_layout::uv> : source_pairs<pair_order::uv> {};
template <>
struct source<yuv_layout::vu> : source_pairs<pair_order::vu> {};

// Calls f(line) for each of the rows, or of the pairs of rows.
template <class F>
[[gnu::always_inline]] inline void for_each_line(const lines_to_rgb &l, F f) {
    line_to_rgb at = l;
    for (ptrdiff_t left = l.count;;) {
        f(at);
        if (--left == 0) return;
        for (int k = 0; k < 2; k++) {
            at.y[k] += l.y_step;
            at.dst[k] += l.dst_step;
        }
        at.u += l.u_step;
        at.v += l.v_step;
    }
}

}  // namespace simgp::SIMD_TARGET

#endif
