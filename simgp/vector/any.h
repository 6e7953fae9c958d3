// Rows between any two formats, with weights that are known at run time. Those that need none are in
// any_bytes.h.
//
// Where products of bytes widen, YUV to RGB is what any_channels.h does. Elsewhere it is computed at half
// scale, 7 fractional bits, as in matrix.h. With L, KR, KGU, KGV and
// KB the weights, `offset` 3248 in the limited ranges (L = 298) and 0 in the full ones (L = 256),
// and the rounding constant 64:
//
//   luma   L / 2 (Y - black) - offset                limited -5632 ... 32363, full 0 ... 32640
//   r      floor(KR Vc / 2) + 64 + offset            at most 459 127 / 2 + 3312 = 32458
//   g      floor(-(KGU Uc + KGV Vc) / 2) + 64 + offset
//                                                    at most 154 128 + 3312 = 23024
//   b1     KB1 / 2 Uc                                -17536 ... 17399, KB1 = KB / 2 rounded down to even
//   b2     floor(KB2 Uc / 2) + 64 + offset           KB2 = KB - KB1, at most 138 127 + 3312
//
// L is even, and of the factors of a sum at most one is odd, so that half of the whole sum, rounded
// down, is the sum of these, and the final shift, which rounds down as well, cannot tell it from the
// exact half. Products of samples, not of Uc and Vc, are computed, modulo 2^16: what they have too
// much goes into the constants. Green's two become one with a mean that rounds up,
// -ceil((KGU U + KGV V) / 2).
//
// The sums with luma saturate. Above 32767 the channel is 255 anyhow, below -32768 it is 0. Blue
// adds b1 first: luma + b1 never falls below -5632 - 17536, and where it rises above 32767, Uc and
// with it b2 is positive and keeps it there. 256 Uc and the rest would do so only with KB >= 512.
#ifndef SIMGP_VECTOR_ANY_H
#define SIMGP_VECTOR_ANY_H

#include <string.h>

#include "rows/any.h"
#include "simgp/vector/any_bytes.h"
#include "simgp/vector/any_channels.h"
#include "simgp/vector/packer.h"
#include "simgp/vector/source.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

// YUV to RGB
// ------------------------------------------------------------------------------------------------

struct any_terms {
    s16v r, g, b1, b2;
};
struct any_rgb {
    s16v r, g, b;
};
// The order of a pixel's channels. Whole vectors change places, as late as they can.
struct any_order {
    bool blue_first, alpha_first;
};

struct any_matrix {
    pair_bytes luma, green_u, green_v, blue1;
    half_factor red, blue2;
    s16v luma_c, red_c, green_c, blue1_c, blue2_c;
    any_order order;

    static s16v constant(int c) { return as_s16(set_u16(static_cast<uint16_t>(c))); }

    explicit any_matrix(const yuv_to_rgb &how) {
        const yuv_weights &w = how.weights;
        const int offset = w.black ? 3248 : 0, bias = offset + 64;
        const int of_blue1 = w.blue / 4 * 2, of_blue2 = w.blue - of_blue1;
        luma = set_pair_bytes(w.luma / 2);
        luma_c = constant(-w.luma / 2 * w.black - offset);
        red = set_half_factor(w.red);
        red_c = constant(bias - 64 * w.red);
        green_u = set_pair_bytes(w.green_u);
        green_v = set_pair_bytes(w.green_v);
        green_c = constant(bias + 64 * (w.green_u + w.green_v));
        blue1 = set_pair_bytes(of_blue1 / 2);
        blue1_c = constant(-64 * of_blue1);
        blue2 = set_half_factor(of_blue2);
        blue2_c = constant(bias - 64 * of_blue2);
        order = {how.blue_first, how.alpha_first};
    }

    any_terms terms(pair_bytes u, pair_bytes v) const {
        return {add(as_s16(half_product(v, red)), red_c),
                sub(green_c, as_s16(avg_u16(mul(u, green_u), mul(v, green_v)))),
                add(as_s16(mul(u, blue1)), blue1_c), add(as_s16(half_product(u, blue2)), blue2_c)};
    }
    any_rgb apply(pair_bytes y, const any_terms &c) const {
        const s16v l = add(as_s16(mul(y, luma)), luma_c);
        return {add_sat(l, c.r), add_sat(l, c.g), add_sat(add_sat(l, c.b1), c.b2)};
    }
};

template <pixel_kind>
struct any_packer;
template <>
struct any_packer<pixel_kind::words> {
    static constexpr pixel_order order = pixel_order::by8;
    static constexpr int size = 2;
    static u16v pack(const any_rgb &p, bool blue_first) {
        s16v first = p.r, last = p.b;
        if (blue_first) first = p.b, last = p.r;
        return pack565(first, p.g, last);
    }
    static void store(uint8_t *dst, const any_rgb &even, const any_rgb &odd, const any_order &o) {
        store_zip16(dst, pack(even, o.blue_first), pack(odd, o.blue_first));
    }
};
template <>
struct any_packer<pixel_kind::three> {
    static constexpr pixel_order order = pixel_order::natural;
    static constexpr int size = 3;
    static void store(uint8_t *dst, const any_rgb &even, const any_rgb &odd, const any_order &o) {
        store_narrow_zip3<7, 7, 7>(dst, even.r, odd.r, even.g, odd.g, even.b, odd.b, o.blue_first);
    }
};
template <>
struct any_packer<pixel_kind::four> {
    static constexpr pixel_order order = pixel_order::by4;
    static constexpr int size = 4;
    static void store(uint8_t *dst, const any_rgb &even, const any_rgb &odd, const any_order &o) {
        const u8v r = narrow_join<7>(even.r, odd.r), g = narrow_join<7>(even.g, odd.g),
                  b = narrow_join<7>(even.b, odd.b), a = set_u8(255);
        u8v first = r, last = b;
        if (o.blue_first) first = b, last = r;
        if (o.alpha_first)
            store_zip4(dst, a, first, g, last);
        else
            store_zip4(dst, first, g, last, a);
    }
};

// Chroma of the even and of the odd pixels; the same where they share it.
struct any_chroma {
    pair_bytes u, v;
};

template <chroma_in>
struct any_source;
template <>
struct any_source<chroma_in::half> : source<yuv_layout::half> {
    explicit any_source(const yuv_to_rgb &) {}
    static any_chroma chroma(pairs_v pairs) { return {even(pairs), odd(pairs)}; }
};
template <>
struct any_source<chroma_in::full> : source<yuv_layout::full> {
    explicit any_source(const yuv_to_rgb &) {}
    static any_chroma chroma(pairs_v pairs) { return {even(pairs), odd(pairs)}; }
};
template <>
struct any_source<chroma_in::pairs> : source<yuv_layout::uv> {
    bool v_first;
    explicit any_source(const yuv_to_rgb &how) : v_first(how.v_first) {}
    any_chroma chroma(pairs_v from) const {
        any_chroma c{even(from), odd(from)};
        if (v_first) c = {c.v, c.u};
        return c;
    }
};
template <>
struct any_source<chroma_in::groups> {
    static constexpr bool pixels_in_pairs = true;
    bool luma_first;
    explicit any_source(const yuv_to_rgb &how) : luma_first(how.luma_first) {}
    static any_chroma chroma(pairs_v pairs) { return {even(pairs), odd(pairs)}; }

    template <pixel_order Order>
    yuv_half load(const samples &s, ptrdiff_t x) const {
        luma_chroma p = load_groups_for<Order>(s.y + 2 * x);
        if (!luma_first) p = exchanged(p);
        return p;
    }
    samples stage(staged &to, const samples &s, ptrdiff_t x, int count) const {
        return (luma_first ? source<yuv_layout::yuyv>::stage : source<yuv_layout::uyvy>::stage)(
            to, s, x, count);
    }
};

// Less than a vector goes through the stack, by the row for one, whose pixels have `size` bytes.
template <chroma_in In>
[[gnu::noinline]] static void any_part(any_to_rgb_row *row, int size, const yuv_to_rgb &how,
                                       const samples &in, uint8_t *dst, ptrdiff_t x, int count) {
    staged to;
    uint8_t pixels[bytes * 4];
    const samples s = any_source<In>(how).stage(to, in, x, count);
    row(how, s.y, s.u, s.v, pixels, bytes);
    copy_few(dst + x * size, pixels, ptrdiff_t(size) * count);
}

template <chroma_in In, pixel_kind Kind>
static void any_row(const yuv_to_rgb &how, const uint8_t *y, const uint8_t *u, const uint8_t *v,
                    uint8_t *dst, ptrdiff_t width) {
    using to = any_packer<Kind>;
    const samples in{y, u, v};
    const auto part = [&](ptrdiff_t x, int count) {
        any_part<In>(any_row<In, Kind>, to::size, how, in, dst, x, count);
    };
    if constexpr (products_widen) {
        const ptrdiff_t whole = In == chroma_in::full ? width : width & ~ptrdiff_t(1);
        if (whole < bytes) return part(0, int(width));
        channels_row<In, Kind>(how, y, u, v, dst, whole);
        if (whole < width) part(whole, 1);
    } else {
        const any_matrix m(how);
        const any_source<In> from(how);
        const auto write_half = [&](ptrdiff_t x, const yuv_half &p) {
            const any_chroma c = from.chroma(p.pairs);
            const any_terms t = m.terms(c.u, c.v);
            to::store(dst + x * to::size, m.apply(even(p.y), t), m.apply(odd(p.y), t), m.order);
        };
        const auto write_full = [&](ptrdiff_t x, const yuv_full &p) {
            const auto half = [&](pair_bytes luma, pairs_v pairs) {
                return m.apply(luma, m.terms(even(pairs), odd(pairs)));
            };
            to::store(dst + x * to::size, half(even(p.y), p.pairs_even),
                      half(odd(p.y), p.pairs_odd), m.order);
        };
        const auto load = [&](ptrdiff_t x) { return from.template load<to::order>(in, x); };
        if constexpr (In == chroma_in::full)
            row_of_steps<false>(width, load, write_full, part);
        else
            row_of_steps<true>(width, load, write_half, part);
    }
}

template <chroma_in In, pixel_kind Kind>
static void any_row_pair(const yuv_to_rgb &how, const uint8_t *y0, const uint8_t *y1,
                         const uint8_t *u, const uint8_t *v, uint8_t *dst0, uint8_t *dst1,
                         ptrdiff_t width);
// One row by the row for two.
template <chroma_in In, pixel_kind Kind>
static void any_row_of_pair(const yuv_to_rgb &how, const uint8_t *y, const uint8_t *u,
                            const uint8_t *v, uint8_t *dst, ptrdiff_t width) {
    any_row_pair<In, Kind>(how, y, y, u, v, dst, dst, width);
}

template <chroma_in In, pixel_kind Kind>
static void any_row_pair(const yuv_to_rgb &how, const uint8_t *y0, const uint8_t *y1,
                         const uint8_t *u, const uint8_t *v, uint8_t *dst0, uint8_t *dst1,
                         ptrdiff_t width) {
    using to = any_packer<Kind>;
    struct pixels_pair {
        yuv_half first;
        pairs_v second_y;
    };
    const samples in{y0, u, v};
    const auto part = [&](ptrdiff_t x, int count) {
        constexpr any_to_rgb_row *row = any_row_of_pair<In, Kind>;
        any_part<In>(row, to::size, how, in, dst0, x, count);
        any_part<In>(row, to::size, how, {y1, u, v}, dst1, x, count);
    };
    if constexpr (products_widen) {
        const ptrdiff_t whole = width & ~ptrdiff_t(1);
        if (whole < bytes) return part(0, int(width));
        channels_row_pair<In, Kind>(how, y0, y1, u, v, dst0, dst1, whole);
        if (whole < width) part(whole, 1);
    } else {
        const any_matrix m(how);
        const any_source<In> from(how);
        row_of_steps<true>(
            width,
            [&](ptrdiff_t x) {
                return pixels_pair{from.template load<to::order>(in, x),
                                   load_luma<to::order>(y1, x)};
            },
            [&](ptrdiff_t x, const pixels_pair &p) {
                const any_chroma c = from.chroma(p.first.pairs);
                const any_terms t = m.terms(c.u, c.v);
                to::store(dst0 + x * to::size, m.apply(even(p.first.y), t),
                          m.apply(odd(p.first.y), t), m.order);
                to::store(dst1 + x * to::size, m.apply(even(p.second_y), t),
                          m.apply(odd(p.second_y), t), m.order);
            },
            part);
    }
}

// Two rows by the row for one.
template <chroma_in In, pixel_kind Kind>
static void any_pair_of_rows(const yuv_to_rgb &how, const uint8_t *y0, const uint8_t *y1,
                             const uint8_t *u, const uint8_t *v, uint8_t *dst0, uint8_t *dst1,
                             ptrdiff_t width) {
    any_row<In, Kind>(how, y0, u, v, dst0, width);
    any_row<In, Kind>(how, y1, u, v, dst1, width);
}

// RGB to YUV
// ------------------------------------------------------------------------------------------------

// Luma's sum, at most 256 255, fits 16 bits, unsigned. Chroma's lies in -32640 ... 32640. It is
// computed with negative factors, since 128 fits no signed byte but -128 does, and taken from the
// rounding constant: 128 + 32640 saturates to 32767, of which the sample is 255, as it should be.
// With the sign inverted, which adds 32768, the high byte of a lane is the sample.
template <pixel_kind>
struct any_yuv_matrix {
    channel_weights y;
    channel_factors u, v;
    s16v half = as_s16(set_u16(128));

    explicit any_yuv_matrix(const rgb_weights &w)
        : y(set_channel_weights(w.y[0], w.y[1], w.y[2], w.black)),
          u(set_channel_factors(-w.u[0], -w.u[1], -w.u[2])),
          v(set_channel_factors(-w.v[0], -w.v[1], -w.v[2])) {}

    u8v luma(const rgb_v &p) const { return dot_high(p, y); }
    // Pairs of U and V of the even pixels.
    static half_rgb_v evens(const rgb_v &p) { return even_pixels(p); }
    u8v chroma(const half_rgb_v &p) const { return bit_xor(dots_high(p, u, v, half), set_u8(128)); }
};
template <>
struct any_yuv_matrix<pixel_kind::four> {
    quad_weights y;
    quad_factors u, v;
    s16v half = as_s16(set_u16(128));

    explicit any_yuv_matrix(const rgb_weights &w)
        : y(set_quad_weights(w.alpha_first, w.y[0], w.y[1], w.y[2], w.black)),
          u(set_quad_factors(w.alpha_first, -w.u[0], -w.u[1], -w.u[2])),
          v(set_quad_factors(w.alpha_first, -w.v[0], -w.v[1], -w.v[2])) {}

    u8v luma(const quads_v &p) const { return dot_high(p, y); }
    static half_quads_v evens(const quads_v &p) { return even_quads(p); }
    u8v chroma(const half_quads_v &p) const {
        return bit_xor(dots_high(p, u, v, half), set_u8(128));
    }
};

// Calls f(load), where load(p) loads the pixels at p.
template <pixel_kind Kind, class F>
[[gnu::always_inline]] inline void with_load(const rgb_weights &w, F f) {
    if constexpr (Kind == pixel_kind::four)
        with_load_quads(w.alpha_first, f);
    else
        f([](const uint8_t *p) { return load_pixels<rgb_in(Kind)>(p); });
}

// Less than a vector goes through the stack, by the row itself. Of a last pixel alone, the mean is that of
// it and itself.
[[gnu::noinline]] static void any_yuv_part(any_to_yuv_row *row, int size, const rgb_weights &w,
                                           const uint8_t *src0, const uint8_t *src1, uint8_t *y0,
                                           uint8_t *y1, uint8_t *u, uint8_t *v, ptrdiff_t x,
                                           int count) {
    uint8_t pixels[2][bytes * 4], to_y[2][bytes], to_u[bytes], to_v[bytes];
    const auto stage = [&](uint8_t *to, const uint8_t *src) {
        stage_few(to, size, src + size * x, count, size);
        // One pixel of four bytes is staged over and over.
        if (w.mean && (count & 1) && (count > 1 || size < 4))
            copy_few(to + size * count, src + size * (x + count - 1), size);
    };
    stage(pixels[0], src0);
    if (src1) stage(pixels[1], src1);
    row(w, pixels[0], src1 ? pixels[1] : nullptr, to_y[0], to_y[1], u ? to_u : nullptr,
        v ? to_v : nullptr, bytes);
    copy_few(y0 + x, to_y[0], count);
    if (src1) copy_few(y1 + x, to_y[1], count);
    if (!u) return;
    const int samples = (count + 1) / 2;
    copy_few(v ? u + x / 2 : u + x, to_u, v ? samples : 2 * samples);
    if (v) copy_few(v + x / 2, to_v, samples);
}

template <pixel_kind Kind>
static void any_yuv_row(const rgb_weights &w, const uint8_t *src0, const uint8_t *src1, uint8_t *y0,
                        uint8_t *y1, uint8_t *u, uint8_t *v, ptrdiff_t width);

// A line of luma alone.
template <pixel_kind Kind>
[[gnu::noinline, maybe_unused]] static void any_luma_line(const rgb_weights &w, const uint8_t *src,
                                                          uint8_t *y, ptrdiff_t width) {
    constexpr int size = int(Kind) + 2;
    if (width < bytes) {
        any_yuv_part(any_yuv_row<Kind>, size, w, src, nullptr, y, nullptr, nullptr, nullptr, 0,
                     int(width));
        return;
    }
    const any_yuv_matrix<Kind> m(w);
    with_load<Kind>(w, [&](const auto &load) {
        move_steps<2>(
            width, lines_in<size>{{src}}, lines_out<1>{{y}},
            [&](const uint8_t *const *p) { return load(p[0]); },
            [&](uint8_t *const *q, const auto &p) { store(q[0], m.luma(p)); });
    });
}

// Whether a second line has a loop of its own: it has where loops move their pointers. Elsewhere two lines at
// once spare small pictures the way there.
constexpr bool lines_apart = moves_pointers;

// Luma and chroma of a line, or of two; without means only where they are not apart.
template <pixel_kind Kind, bool Mean>
static void any_yuv_lines(const rgb_weights &w, const uint8_t *src0, const uint8_t *src1,
                          uint8_t *y0, uint8_t *y1, uint8_t *u, uint8_t *v, ptrdiff_t width) {
    constexpr int size = int(Kind) + 2;
    const any_yuv_matrix<Kind> m(w);
    with_load<Kind>(w, [&](const auto &load) {
        row_of_steps<true>(
            width, [](ptrdiff_t x) { return x; },
            [&](ptrdiff_t x, ptrdiff_t) {
                const auto p = load(src0 + size * x);
                store(y0 + x, m.luma(p));
                const auto put_chroma = [&](const auto &pixels) {
                    const u8v chroma = m.chroma(pixels);
                    if (v)
                        store_split(u + x / 2, v + x / 2, chroma);
                    else
                        store(u + x, chroma);
                };
                if (!Mean && (lines_apart || u)) put_chroma(m.evens(p));
                if (!Mean && lines_apart) return;
                auto below = p;
                if (src1) {
                    below = load(src1 + size * x);
                    store(y1 + x, m.luma(below));
                }
                if (Mean) put_chroma(block_means(p, below));
            },
            [&](ptrdiff_t x, int count) {
                any_yuv_part(any_yuv_row<Kind>, size, w, src0, src1, y0, y1, u, v, x, count);
            });
    });
}
template <pixel_kind Kind>
static void any_yuv_row(const rgb_weights &w, const uint8_t *src0, const uint8_t *src1, uint8_t *y0,
                        uint8_t *y1, uint8_t *u, uint8_t *v, ptrdiff_t width) {
    if (u && w.mean) return any_yuv_lines<Kind, true>(w, src0, src1, y0, y1, u, v, width);
    if constexpr (!lines_apart)
        return any_yuv_lines<Kind, false>(w, src0, src1, y0, y1, u, v, width);
    if (u)
        any_yuv_lines<Kind, false>(w, src0, nullptr, y0, nullptr, u, v, width);
    else
        any_luma_line<Kind>(w, src0, y0, width);
    if (src1) any_luma_line<Kind>(w, src1, y1, width);
}

[[gnu::noinline]] static void chroma_plane(const int16_t *of, const uint8_t *const channels[3],
                                           uint8_t *dst, ptrdiff_t count) {
    u16v f[3];
    for (int k = 0; k < 3; k++) f[k] = set_u16(static_cast<uint16_t>(of[k]));
    const s16v half = as_s16(set_u16(128));
    const u8v sign = set_u8(128);
    in_steps(
        count,
        [&](ptrdiff_t x) {
            const u8v c[3] = {load(channels[0] + x), load(channels[1] + x), load(channels[2] + x)};
            const auto high = [&](u16v c0, u16v c1, u16v c2) {
                const s16v sum =
                    add(add(as_s16(mul(c0, f[0])), as_s16(mul(c1, f[1]))), as_s16(mul(c2, f[2])));
                return as_u16(add_sat(sum, half));
            };
            store(dst + x, bit_xor(join_high(high(even(c[0]), even(c[1]), even(c[2])),
                                             high(odd(c[0]), odd(c[1]), odd(c[2]))),
                                   sign));
        },
        [&](ptrdiff_t x) {
            const int sum =
                (of[0] * channels[0][x] + of[1] * channels[1][x] + of[2] * channels[2][x] + 128) >>
                8;
            dst[x] = static_cast<uint8_t>(sum > 127 ? 255 : sum + 128);
        });
}
static void any_chroma_row(const rgb_weights &w, const uint8_t *const channels[3], uint8_t *u,
                           uint8_t *v, ptrdiff_t count) {
    chroma_plane(w.u, channels, u, count);
    chroma_plane(w.v, channels, v, count);
}

template <pixel_kind Kind>
static void fill_any_kind(any_rows &t) {
    const size_t k = size_t(Kind);
    const auto in = [&](chroma_in layout, any_to_rgb_row *row, any_to_rgb_row_pair *pair) {
        t.to_rgb[size_t(layout)][k] = row;
        t.to_rgb_pair[size_t(layout)][k] = pair;
    };
    in(chroma_in::half, any_row<chroma_in::half, Kind>, any_row_pair<chroma_in::half, Kind>);
    in(chroma_in::full, any_row<chroma_in::full, Kind>, any_pair_of_rows<chroma_in::full, Kind>);
    in(chroma_in::pairs, any_row_of_pair<chroma_in::pairs, Kind>,
       any_row_pair<chroma_in::pairs, Kind>);
    in(chroma_in::groups, any_row<chroma_in::groups, Kind>,
       any_pair_of_rows<chroma_in::groups, Kind>);
}
template <pixel_kind Kind>
static void fill_any_rgb(any_rows &t) {
    t.to_yuv[size_t(Kind)] = any_yuv_row<Kind>;
    t.split_pixels[size_t(Kind)] = split_pixels_vectors<rgb_in(Kind)>;
}

void fill_any(any_rows &t) {
    fill_any_kind<pixel_kind::words>(t);
    fill_any_kind<pixel_kind::three>(t);
    fill_any_kind<pixel_kind::four>(t);
    constexpr size_t words = size_t(pixel_kind::words), three = size_t(pixel_kind::three),
                     four = size_t(pixel_kind::four);
    t.repack[words][words] = repack_pixels<rgb_in::words, pixel_kind::words>;
    t.repack[words][three] = repack_pixels<rgb_in::words, pixel_kind::three>;
    t.repack[words][four] = repack_pixels<rgb_in::words, pixel_kind::four>;
    t.repack[three][words] = repack_pixels<rgb_in::three, pixel_kind::words>;
    t.repack[three][three] = exchange_three;
    t.repack[three][four] = three_to_four;
    t.repack[four][words] = four_to_words;
    t.repack[four][three] = four_to_three;
    t.repack[four][four] = reorder_four;
    fill_any_rgb<pixel_kind::words>(t);
    fill_any_rgb<pixel_kind::three>(t);
    fill_any_rgb<pixel_kind::four>(t);
    t.split_pixels[size_t(rgb_in::four_alpha_first)] =
        split_pixels_vectors<rgb_in::four_alpha_first>;
    t.chroma = any_chroma_row;
    t.split_groups = any_split_groups;
    t.join_groups = any_join_groups;
    t.mean_of_lines = any_mean_of_lines;
    t.mean_of_blocks = any_mean_of_blocks;
    t.every_second = any_every_second;
    t.twice = any_twice;
}

}  // namespace simgp::SIMD_TARGET

#endif
