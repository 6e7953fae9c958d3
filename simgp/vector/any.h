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

struct any_matrix {
    pair_bytes luma, green_u, green_v, blue1;
    half_factor red, blue2;
    s16v luma_c, red_c, green_c, blue1_c, blue2_c;
    // Whole vectors change places, as late as they can.
    rgb_order order;

    static s16v constant(int16_t c) { return as_s16(set_u16(static_cast<uint16_t>(c))); }

    explicit any_matrix(const yuv_to_rgb &how)
        : luma(set_pair_bytes(how.weights.parts.luma)),
          green_u(set_pair_bytes(how.weights.parts.green_u)),
          green_v(set_pair_bytes(how.weights.parts.green_v)),
          blue1(set_pair_bytes(how.weights.parts.blue1)),
          red(set_half_factor(how.weights.parts.red)),
          blue2(set_half_factor(how.weights.parts.blue2)),
          luma_c(constant(how.weights.parts.luma_c)),
          red_c(constant(how.weights.parts.red_c)),
          green_c(constant(how.weights.parts.green_c)),
          blue1_c(constant(how.weights.parts.blue1_c)),
          blue2_c(constant(how.weights.parts.blue2_c)),
          order(how.pixels) {}

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
    static void store(uint8_t *dst, const any_rgb &even, const any_rgb &odd, const rgb_order &o) {
        store_zip16(dst, pack(even, o.blue_first), pack(odd, o.blue_first));
    }
    static void store(uint8_t *p, uint8_t *q, const any_rgb &even, const any_rgb &odd,
                      const rgb_order &o) {
        store_zip16(p, q, pack(even, o.blue_first), pack(odd, o.blue_first));
    }
};
template <>
struct any_packer<pixel_kind::three> {
    static constexpr pixel_order order = pixel_order::natural;
    static constexpr int size = 3;
    static void store(uint8_t *dst, const any_rgb &even, const any_rgb &odd, const rgb_order &o) {
        store_narrow_zip3<7, 7, 7>(dst, even.r, odd.r, even.g, odd.g, even.b, odd.b, o.blue_first);
    }
    static void store(uint8_t *p, uint8_t *q, const any_rgb &even, const any_rgb &odd,
                      const rgb_order &o) {
        store_narrow_zip3<7, 7, 7>(p, q, even.r, odd.r, even.g, odd.g, even.b, odd.b, o.blue_first);
    }
};
template <>
struct any_packer<pixel_kind::four> {
    static constexpr pixel_order order = pixel_order::by4;
    static constexpr int size = 4;
    // Calls put(bytes of the pixels ...).
    template <class Put>
    static void bytes_of(const any_rgb &even, const any_rgb &odd, const rgb_order &o, Put put) {
        const u8v r = narrow_join<7>(even.r, odd.r), g = narrow_join<7>(even.g, odd.g),
                  b = narrow_join<7>(even.b, odd.b), a = set_u8(255);
        u8v first = r, last = b;
        if (o.blue_first) first = b, last = r;
        if (o.alpha_first)
            put(a, first, g, last);
        else
            put(first, g, last, a);
    }
    static void store(uint8_t *dst, const any_rgb &even, const any_rgb &odd, const rgb_order &o) {
        bytes_of(even, odd, o, [=](u8v a, u8v b, u8v c, u8v d) { store_zip4(dst, a, b, c, d); });
    }
    static void store(uint8_t *p, uint8_t *q, const any_rgb &even, const any_rgb &odd,
                      const rgb_order &o) {
        bytes_of(even, odd, o, [=](u8v a, u8v b, u8v c, u8v d) { store_zip4(p, q, a, b, c, d); });
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
    bool luma_first;
    explicit any_source(const yuv_to_rgb &how) : luma_first(how.luma_first) {}
    static any_chroma chroma(pairs_v pairs) { return {even(pairs), odd(pairs)}; }

    template <pixel_order Order>
    yuv_half load(const samples &s, ptrdiff_t x) const {
        luma_chroma p = load_groups_for<Order>(s.y + 2 * x);
        if (!luma_first) p = exchanged(p);
        return p;
    }
};

template <chroma_in In, pixel_kind Kind>
static void any_rows_alone(const lines_to_rgb &lines) {
    if constexpr (products_widen) {
        for_each_line(lines, [&](const line_to_rgb &l) {
            channels_row<In, Kind>(*lines.how, l.y[0], l.u, l.v, l.dst[0], lines.width);
        });
    } else {
        using to = any_packer<Kind>;
        const any_matrix m(*lines.how);
        const any_source<In> from(*lines.how);
        const ptrdiff_t width = lines.width;
        for_each_line(lines, [&](const line_to_rgb &l) {
            whole_steps_ahead(
                width,
                [&](ptrdiff_t x) {
                    return from.template load<to::order>(samples{l.y[0], l.u, l.v}, x);
                },
                [&](ptrdiff_t x, const yuv_half &p) {
                    const any_chroma c = from.chroma(p.pairs);
                    const any_terms t = m.terms(c.u, c.v);
                    to::store(l.dst[0] + x * to::size, m.apply(even(p.y), t), m.apply(odd(p.y), t),
                              m.order);
                });
        });
    }
}

// Pairs of rows that are shorter than a vector, each in a half of it.
template <chroma_in In, pixel_kind Kind>
static void any_row_halves(const lines_to_rgb &lines) {
    using to = any_packer<Kind>;
    const any_matrix m(*lines.how);
    const any_source<In> from(*lines.how);
    const ptrdiff_t width = lines.width;
    for_each_line(lines, [&](const line_to_rgb &l) {
        whole_steps_ahead<bytes / 2>(
            width, [&](ptrdiff_t x) { return from.template load_halves<to::order>(l, x); },
            [&](ptrdiff_t x, const yuv_half &p) {
                const any_chroma c = from.chroma(p.pairs);
                const any_terms t = m.terms(c.u, c.v);
                to::store(l.dst[0] + x * to::size, l.dst[1] + x * to::size, m.apply(even(p.y), t),
                          m.apply(odd(p.y), t), m.order);
            });
    });
}
template <chroma_in In, pixel_kind Kind>
static void any_row_pairs(const lines_to_rgb &lines) {
    if constexpr (pairs_in_halves)
        if (lines.width < bytes) return any_row_halves<In, Kind>(lines);
    if constexpr (products_widen) {
        for_each_line(lines, [&](const line_to_rgb &l) {
            channels_row_pair<In, Kind>(*lines.how, l.y[0], l.y[1], l.u, l.v, l.dst[0], l.dst[1],
                                        lines.width);
        });
    } else {
        using to = any_packer<Kind>;
        struct pixels_pair {
            yuv_half first;
            pairs_v second_y;
        };
        const any_matrix m(*lines.how);
        const any_source<In> from(*lines.how);
        const ptrdiff_t width = lines.width;
        for_each_line(lines, [&](const line_to_rgb &l) {
            whole_steps_ahead(
                width,
                [&](ptrdiff_t x) {
                    return pixels_pair{from.template load<to::order>(samples{l.y[0], l.u, l.v}, x),
                                       load_luma<to::order>(l.y[1], x)};
                },
                [&](ptrdiff_t x, const pixels_pair &p) {
                    const any_chroma c = from.chroma(p.first.pairs);
                    const any_terms t = m.terms(c.u, c.v);
                    to::store(l.dst[0] + x * to::size, m.apply(even(p.first.y), t),
                              m.apply(odd(p.first.y), t), m.order);
                    to::store(l.dst[1] + x * to::size, m.apply(even(p.second_y), t),
                              m.apply(odd(p.second_y), t), m.order);
                });
        });
    }
}

// Rows with chroma for each pixel, alone or in pairs: chroma that two rows share is computed for each.
template <pixel_kind Kind>
static void any_rows_full(const lines_to_rgb &lines) {
    // Calls row(l, k) for the first row and for the second, if there is one.
    const auto for_each_row = [&](auto row) __attribute__((always_inline)) {
        for_each_line(lines, [&](const line_to_rgb &l) {
            for (int k = 0; k == 0 || (k == 1 && l.y[1] != l.y[0]); k++) row(l, k);
        });
    };
    if constexpr (products_widen) {
        for_each_row([&](const line_to_rgb &l, int k) {
            channels_row<chroma_in::full, Kind>(*lines.how, l.y[k], l.u, l.v, l.dst[k],
                                                lines.width);
        });
    } else {
        using to = any_packer<Kind>;
        const any_matrix m(*lines.how);
        const ptrdiff_t width = lines.width;
        const auto half = [&](pair_bytes luma, pairs_v pairs) {
            return m.apply(luma, m.terms(even(pairs), odd(pairs)));
        };
        for_each_row([&](const line_to_rgb &l, int k) {
            whole_steps_ahead(
                width,
                [&](ptrdiff_t x) {
                    return source<yuv_layout::full>::template load<to::order>(
                        samples{l.y[k], l.u, l.v}, x);
                },
                [&](ptrdiff_t x, const yuv_full &p) {
                    to::store(l.dst[k] + x * to::size, half(even(p.y), p.pairs_even),
                              half(odd(p.y), p.pairs_odd), m.order);
                });
        });
    }
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

// Whether a second line has a loop of its own: it has where loops move their pointers. Elsewhere two lines at
// once spare small pictures the way there.
constexpr bool lines_apart = moves_pointers;

// Without means only where lines are not apart, or of lines with chroma.
template <pixel_kind Kind, bool Mean>
static void any_yuv_lines(const rgb_weights &w, const lines_to_yuv &l) {
    constexpr int size = int(Kind) + 2;
    const any_yuv_matrix<Kind> m(w);
    with_load<Kind>(w, [&](const auto &load) {
        const ptrdiff_t width = l.width;
        uint8_t *u = l.u, *v = l.v;
        for (ptrdiff_t row = 0; row < l.rows; row += 1 + l.shared) {
            const bool two = l.shared && row + 1 < l.rows;
            const uint8_t *const src0 = l.src + row * l.src_step;
            const uint8_t *const src1 = two ? src0 + l.src_step : nullptr;
            uint8_t *const y0 = l.y + row * l.y_step, *const y1 = two ? y0 + l.y_step : nullptr;
            whole_steps(width, [&](ptrdiff_t x) {
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
            });
            if constexpr (!Mean && lines_apart)
                if (src1)
                    move_steps<2>(
                        width, lines_in<size>{{src1}}, lines_out<1>{{y1}},
                        [&](const uint8_t *const *p) { return load(p[0]); },
                        [&](uint8_t *const *q, const auto &p) { store(q[0], m.luma(p)); });
            if (u) u += l.u_step;
            if (v) v += l.v_step;
        }
    });
}
// Lines of luma alone.
template <pixel_kind Kind>
static void any_luma_lines(const rgb_weights &w, const lines_to_yuv &l) {
    constexpr int size = int(Kind) + 2;
    const any_yuv_matrix<Kind> m(w);
    with_load<Kind>(w, [&](const auto &load) {
        for (ptrdiff_t row = 0; row < l.rows; row++)
            move_steps<2>(
                l.width, lines_in<size>{{l.src + row * l.src_step}},
                lines_out<1>{{l.y + row * l.y_step}},
                [&](const uint8_t *const *p) { return load(p[0]); },
                [&](uint8_t *const *q, const auto &p) { store(q[0], m.luma(p)); });
    });
}
template <pixel_kind Kind>
static void any_yuv_rows(const rgb_weights &w, const lines_to_yuv &l) {
    if (l.u && w.mean) return any_yuv_lines<Kind, true>(w, l);
    if (lines_apart && !l.u) return any_luma_lines<Kind>(w, l);
    any_yuv_lines<Kind, false>(w, l);
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
    constexpr size_t k = size_t(Kind), half = size_t(chroma_in::half),
                     full = size_t(chroma_in::full), pairs = size_t(chroma_in::pairs),
                     groups = size_t(chroma_in::groups);
    t.to_rgb[half][k] = any_rows_alone<chroma_in::half, Kind>;
    t.to_rgb[groups][k] = any_rows_alone<chroma_in::groups, Kind>;
    t.to_rgb_pair[half][k] = any_row_pairs<chroma_in::half, Kind>;
    t.to_rgb_pair[pairs][k] = any_row_pairs<chroma_in::pairs, Kind>;
    t.to_rgb[full][k] = t.to_rgb_pair[full][k] = any_rows_full<Kind>;
}
template <pixel_kind Kind>
static void fill_any_rgb(any_rows &t) {
    t.to_yuv[size_t(Kind)] = any_yuv_rows<Kind>;
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
