// The YUV to RGB matrices in 16-bit lanes, exact.
//
// BT.601 with 8 fractional bits (see the scalar rows) is computed at half its scale, 7 fractional
// bits. All terms but 409 Vc are even, and of 409 Vc the half is taken as 204 Vc + floor(Vc / 2),
// which the final shift, rounding down as well, cannot tell from the exact half. An offset of 3248
// moves from luma to chroma, so that both fit. Ranges, with the rounding constant 64:
//
//   luma   149 (Y - 16) - 3248                 -5632 ... 32363
//   r      floor(409 Vc / 2) + 64 + 3248       -22864 ... 29283
//   g      -50 Uc - 104 Vc + 64 + 3248         -16246 ... 23024
//   b256   256 Uc                              -32768 ... 32512
//   b2     2 Uc + 64 + 3248                      3056 ... 3566
//
// R = clamp((luma + r) >> 7), and so on, with sums that saturate. That happens above 32767, where
// the channel is 255 anyhow, or below -32768, where it is 0. Blue adds b256 first: where that sum
// saturates upward, b2 > 0 keeps it there; where it saturates downward, b2 is too small to lift it
// above 0.
//
// Blue with 6 fractional bits takes one sum less, and serves where channels become bytes:
//
//   luma >> 1                                  -2816 ... 16181
//   b6     129 Uc + 32 + 1624                 -14856 ... 18039
//
// The sum loses half a unit, which the final shift, B = clamp(sum >> 6), would have dropped.
//
// The coarse matrix (6 fractional bits) is computed at twice its scale and has the same form, with
// 150 for 149 and 204 Vc in r.
#ifndef SIMGP_VECTOR_MATRIX_H
#define SIMGP_VECTOR_MATRIX_H

#include "rows/yuv2rgb.h"

namespace simgp::SIMD_TARGET {

// Three channels with 7 fractional bits, and blue with 6; saturated. What a packer does not use is
// never computed.
struct rgb_s16 {
    s16v r, g, b, b6;
};
// What chroma adds to luma.
struct chroma_terms {
    s16v r, g, b256, b2, b6;
};

struct chroma_terms_full {
    chroma_terms even, odd;
};

// Which sample of a chroma pair comes first.
enum class pair_order { uv, vu };

// RED is twice the factor of Vc in r.
template <int LUMA, int RED>
struct matrix_s7 {
    static constexpr int offset = 3248;
    static constexpr int chroma_bias = offset + 64;
    static constexpr int luma_128 = LUMA * (128 - 16) - offset;

    // The luma terms of the even and of the odd pixels.
    static s16v luma_even(pairs_v y) { return pair_dot<LUMA, 0, luma_128>(y); }
    static s16v luma_odd(pairs_v y) { return pair_dot<0, LUMA, luma_128>(y); }

    template <pair_order Order>
    static chroma_terms chroma(pairs_v pairs) {
        constexpr bool uv = Order == pair_order::uv;
        chroma_terms t;
        t.r = uv ? half_product_high<RED, chroma_bias - 64 * RED>(pairs)
                 : half_product_low<RED, chroma_bias - 64 * RED>(pairs);
        t.g = pair_dot < uv ? -50 : -104, uv ? -104 : -50, chroma_bias > (pairs);
        t.b256 = uv ? low_minus_128_shl8(pairs) : high_minus_128_shl8(pairs);
        t.b2 = pair_dot < uv ? 2 : 0, uv ? 0 : 2, chroma_bias > (pairs);
        t.b6 = pair_dot < uv ? 129 : 0, uv ? 0 : 129, chroma_bias / 2 > (pairs);
        return t;
    }

    static rgb_s16 apply(s16v luma, const chroma_terms &c) {
        return {add_sat(luma, c.r), add_sat(luma, c.g), add_sat(add_sat(luma, c.b256), c.b2),
                add_sat(sar<1>(luma), c.b6)};
    }
};

using bt601 = matrix_s7<149, 409>;
using bt601_coarse = matrix_s7<150, 408>;

template <yuv_matrix>
struct matrix_of_name;
template <>
struct matrix_of_name<yuv_matrix::fine> {
    using type = bt601;
};
template <>
struct matrix_of_name<yuv_matrix::coarse> {
    using type = bt601_coarse;
};
template <yuv_matrix Name>
using matrix_named = typename matrix_of_name<Name>::type;

}  // namespace simgp::SIMD_TARGET

#endif
