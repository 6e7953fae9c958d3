// Sources: how the samples of a span of pixels are read.
//
// A source loads the samples of `bytes` pixels, in the order of pixels that the packer wants: luma
// as byte pairs, chroma as byte pairs, one pair for two pixels or, with full chroma, a vector of
// pairs for the even pixels and one for the odd.
#ifndef SIMGP_VECTOR_SOURCE_H
#define SIMGP_VECTOR_SOURCE_H

#include <string.h>

#include "simgp/vector/packer.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

struct samples {
    const uint8_t *y, *u, *v;
};

// Room on the stack for the samples of less than a vector of pixels, read by the loads of a whole
// one. stage(to, s, x, count) fills it, and gives the planes that are then to be read.
struct staged {
    uint8_t y[2 * bytes], u[bytes], v[bytes];
};

template <pixel_order Order>
inline pairs_v load_luma(const uint8_t *y, ptrdiff_t x) {
    return arrange<Order>(load_pairs(y + x));
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
    static constexpr bool pixels_in_pairs = true;

    template <pixel_order Order>
    static yuv_half load(const samples &s, ptrdiff_t x) {
        return {load_luma<Order>(s.y, x),
                arrange<Order>(load_pairs(s.u + (x >> 1), s.v + (x >> 1)))};
    }
    static samples stage(staged &to, const samples &s, ptrdiff_t x, int count) {
        stage_few(to.y, 1, s.y + x, count, 1);
        stage_few(to.u, 1, s.u + x / 2, (count + 1) / 2, 1);
        stage_few(to.v, 1, s.v + x / 2, (count + 1) / 2, 1);
        return {to.y, to.u, to.v};
    }
};

template <>
struct source<yuv_layout::full> {
    static constexpr pair_order pairs = pair_order::uv;
    static constexpr bool pixels_in_pairs = false;

    template <pixel_order Order>
    static yuv_full load(const samples &s, ptrdiff_t x) {
        const pairs_v u = load_luma<Order>(s.u, x), v = load_luma<Order>(s.v, x);
        return {load_luma<Order>(s.y, x), pair_evens(u, v), pair_odds(u, v)};
    }
    static samples stage(staged &to, const samples &s, ptrdiff_t x, int count) {
        stage_few(to.y, 1, s.y + x, count, 1);
        stage_few(to.u, 1, s.u + x, count, 1);
        stage_few(to.v, 1, s.v + x, count, 1);
        return {to.y, to.u, to.v};
    }
};

template <pair_order Pairs>
struct source_pairs {
    static constexpr pair_order pairs = Pairs;
    static constexpr bool pixels_in_pairs = true;

    template <pixel_order Order>
    static yuv_half load(const samples &s, ptrdiff_t x) {
        return {load_luma<Order>(s.y, x), load_luma<Order>(s.u, x)};
    }
    static samples stage(staged &to, const samples &s, ptrdiff_t x, int count) {
        stage_few(to.y, 1, s.y + x, count, 1);
        stage_few(to.u, 1, s.u + x, (count + 1) / 2, 2);
        return {to.y, to.u, to.u};
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
    static constexpr bool pixels_in_pairs = true;

    template <pixel_order Order>
    static yuv_half load(const samples &s, ptrdiff_t x) {
        const luma_chroma p = load_groups_for<Order>(s.y + 2 * x);
        if constexpr (LUMA_FIRST)
            return p;
        else
            return exchanged(p);
    }
    // A last group of one pixel gets the V of the group before.
    static samples stage(staged &to, const samples &s, ptrdiff_t x, int count) {
        constexpr int v = LUMA_FIRST ? 3 : 2;
        const ptrdiff_t single = x + count - 1;
        const uint8_t v_before = count & 1 && single ? s.y[2 * single + v - 4] : 128;
        if (count == 1) {
            const uint8_t *const at = s.y + 2 * x;
            const u8v group = set_u32(at[0] | uint32_t(at[1]) << 8 | uint32_t(v_before) << 8 * v);
            store(to.y, group);
            store(to.y + bytes, group);
            return {to.y, to.y, to.y};
        }
        stage_few(to.y, 2, s.y + 2 * x, count, 2);
        if (count & 1) to.y[2 * (count - 1) + v] = v_before;
        return {to.y, to.y, to.y};
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

}  // namespace simgp::SIMD_TARGET

#endif
