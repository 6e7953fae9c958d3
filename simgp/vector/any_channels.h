// YUV to RGB with weights that are known at run time, where products of bytes widen.
//
// At quarter scale, with 6 fractional bits, the first channel of a pixel and the last are computed alike:
// their order is one of weights and of chroma, and nothing that a loop has to know. With L and K the weights
// of luma and of the channel's chroma C, k = K mod 4 and m = K / 4, rounded down,
//
//   l        L / 2 Y                                 at most 149 255 = 37995
//   first    floor((l + floor(k C / 2)) / 2) + m C - c
//                                                    c = 32 K - 32 + L black / 4, at most 18472
//   green    floor((l - ceil((G1 C1 + G3 C3) / 2)) / 2) + 32 (G1 + G3) + 32 - L black / 4
//
// are the exact sums, rounded down: of L, K, G1 and G3, L is even, and so is one of G1 and G3. The mean is at
// most 19188 and m C at most 135 255 = 34425, so that their sum fits 16 bits, unsigned. m C - c lies in
// -18472 ... 16000, signed, and the sum saturates at 32767, of which the channel is 255, as it should be.
// Green lies in -20900 ... 28900.
#ifndef SIMGP_VECTOR_ANY_CHANNELS_H
#define SIMGP_VECTOR_ANY_CHANNELS_H

#include "rows/any.h"
#include "simgp/vector/any_bytes.h"
#include "simgp/vector/source.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

// The layers that leave byte pairs in registers of their own do so for the sake of their products.
constexpr bool products_widen = moves_pointers;

// Chroma of the first channel and of the last.
struct chroma_of_ends {
    pair_bytes first, last;
};

// Weights of one of them.
struct end_weights {
    pair_bytes rest, whole;
    u16v offset;

    u16v half_rest(pair_bytes c) const { return shr<1>(mul(c, rest)); }
};
static end_weights weights_of_end(int factor, int of_black) {
    return {set_pair_bytes(factor % 4), set_pair_bytes(factor / 4),
            set_u16(static_cast<uint16_t>(32 * factor - 32 + of_black))};
}

struct channels_matrix {
    pair_bytes luma, green_first, green_last;
    s16v green_offset;
    end_weights first, last;

    u16v green_chroma(const chroma_of_ends &c) const {
        return avg_u16(mul(c.first, green_first), mul(c.last, green_last));
    }
    s16v green(u16v l, u16v chroma) const { return add(half_difference(l, chroma), green_offset); }
};
// The same code for all rows.
[[gnu::noinline, maybe_unused]] static channels_matrix make_channels_matrix(const yuv_to_rgb &how) {
    const yuv_weights &w = how.weights;
    const int of_black = w.luma * w.black / 4, of_green = 32 * (w.green_u + w.green_v) + 32;
    int first = w.red, last = w.blue, green_first = w.green_v, green_last = w.green_u;
    if (how.pixels.blue_first)
        first = w.blue, last = w.red, green_first = w.green_u, green_last = w.green_v;
    return {set_pair_bytes(w.luma / 2),
            set_pair_bytes(green_first),
            set_pair_bytes(green_last),
            as_s16(set_u16(static_cast<uint16_t>(of_green - of_black))),
            weights_of_end(first, of_black),
            weights_of_end(last, of_black)};
}

// What pixels that share chroma have in common.
struct end_terms {
    u16v rest;
    s16v whole;

    end_terms(pair_bytes c, const end_weights &w)
        : rest(w.half_rest(c)), whole(sub(as_s16(mul(c, w.whole)), as_s16(w.offset))) {}

    s16v of(u16v l) const { return add_sat(as_s16(mean_down_u16(l, rest)), whole); }
};

// Two pixels of each pair share chroma. Bytes of channels, in natural order.
inline channels_v channels_of_pairs(const channels_matrix &m, pairs_v y, const end_terms &first,
                                    u16v green, const end_terms &last) {
    const u16v e = mul(even(y), m.luma), o = mul(odd(y), m.luma);
    return {{narrow_join<6>(first.of(e), first.of(o)),
             narrow_join<6>(m.green(e, green), m.green(o, green)),
             narrow_join<6>(last.of(e), last.of(o))}};
}

// Each pixel has chroma of its own: the lower halves of blocks and the upper ones.
struct full_pixels {
    pairs_v y, first, last;
};
inline channels_v channels_of_full(const channels_matrix &m, const full_pixels &p) {
    const u16v low = mul(even(p.y), m.luma), high = mul(odd(p.y), m.luma);
    const auto end = [](u16v l, pair_bytes c, const end_weights &w) {
        return sub_sat_u16(mul_add(mean_down_u16(l, w.half_rest(c)), c, w.whole), w.offset);
    };
    const auto green = [&](u16v l, pair_bytes first, pair_bytes last) {
        return m.green(l, m.green_chroma({first, last}));
    };
    return {{narrow_shr<6>(end(low, even(p.first), m.first), end(high, odd(p.first), m.first)),
             narrow_sar<6>(green(low, even(p.first), even(p.last)),
                           green(high, odd(p.first), odd(p.last))),
             narrow_shr<6>(end(low, even(p.last), m.last), end(high, odd(p.last), m.last))}};
}

// Planes: that of the first channel's chroma and that of the last's.
struct chroma_planes {
    const uint8_t *first, *last;
    chroma_planes(const yuv_to_rgb &how, const uint8_t *u, const uint8_t *v)
        : first(how.pixels.blue_first ? u : v), last(how.pixels.blue_first ? v : u) {}
};

template <pixel_kind Kind>
[[gnu::always_inline]] inline void store_pixels(uint8_t *dst, const channels_v &c,
                                                bool alpha_first) {
    store_channels<Kind>(dst, c.c[0], c.c[1], c.c[2], alpha_first);
}
// Calls f(m, alpha_first) with the matrix: a copy, which no store of pixels can reach.
template <pixel_kind Kind, class F>
[[gnu::always_inline]] inline void with_matrix(const yuv_to_rgb &how, F f) {
    const channels_matrix made = make_channels_matrix(how), m = made;
    if constexpr (Kind == pixel_kind::four)
        with_flag(
            how.pixels.alpha_first, [&](auto first)
                                        __attribute__((always_inline)) { f(m, first); });
    else
        f(m, false);
}

template <pixel_kind Kind>
[[gnu::always_inline]] inline void full_row(const yuv_to_rgb &how, const uint8_t *y,
                                            const uint8_t *u, const uint8_t *v, uint8_t *dst,
                                            ptrdiff_t whole) {
    constexpr int size = int(Kind) + 2;
    const chroma_planes c(how, u, v);
    with_matrix<Kind>(
        how, [&](const channels_matrix &m, auto alpha_first) __attribute__((always_inline)) {
            move_steps_ahead<bytes>(
                whole, lines_in<1, 1, 1>{{y, c.first, c.last}}, lines_out<size>{{dst}},
                [](const uint8_t *const *p) {
                    return full_pixels{load_block_halves(p[0]), load_block_halves(p[1]),
                                       load_block_halves(p[2])};
                },
                [&](const full_pixels &p) { return channels_of_full(m, p); },
                [&](uint8_t *const *q, const channels_v &p) {
                    store_pixels<Kind>(q[0], p, alpha_first);
                });
        });
}

// One row, of which load(p) gives luma and chroma.
template <pixel_kind Kind, class In, class Load>
[[gnu::always_inline]] inline void row_of_pairs(const yuv_to_rgb &how, In in, uint8_t *dst,
                                                ptrdiff_t whole, Load load) {
    constexpr int size = int(Kind) + 2;
    with_matrix<Kind>(
        how, [&](const channels_matrix &m, auto alpha_first) __attribute__((always_inline)) {
            move_steps_ahead<bytes / 2>(
                whole / 2, in, lines_out<2 * size>{{dst}}, load,
                [&](const luma_chroma &p) {
                    const chroma_of_ends c{even(p.pairs), odd(p.pairs)};
                    return channels_of_pairs(m, p.y, {c.first, m.first}, m.green_chroma(c),
                                             {c.last, m.last});
                },
                [&](uint8_t *const *q, const channels_v &p) {
                    store_pixels<Kind>(q[0], p, alpha_first);
                });
        });
}
// Two rows that share chroma: load(p) gives the first one's, p[1] is the second one's luma.
struct two_lumas {
    pairs_v y0, y1, pairs;
};
struct two_channels {
    channels_v a, b;
};
template <pixel_kind Kind, class In, class Load>
[[gnu::always_inline]] inline void rows_of_pairs(const yuv_to_rgb &how, In in, uint8_t *dst0,
                                                 uint8_t *dst1, ptrdiff_t whole, Load chroma) {
    constexpr int size = int(Kind) + 2;
    with_matrix<Kind>(
        how, [&](const channels_matrix &m, auto alpha_first) __attribute__((always_inline)) {
            move_steps_ahead<bytes / 2>(
                whole / 2, in, lines_out<2 * size, 2 * size>{{dst0, dst1}},
                [&](const uint8_t *const *p) {
                    return two_lumas{load_pairs(p[0]), load_pairs(p[1]), chroma(p + 2)};
                },
                [&](const two_lumas &p) {
                    const chroma_of_ends c{even(p.pairs), odd(p.pairs)};
                    const end_terms first{c.first, m.first}, last{c.last, m.last};
                    const u16v green = m.green_chroma(c);
                    return two_channels{channels_of_pairs(m, p.y0, first, green, last),
                                        channels_of_pairs(m, p.y1, first, green, last)};
                },
                [&](uint8_t *const *q, const two_channels &p) {
                    store_pixels<Kind>(q[0], p.a, alpha_first);
                    store_pixels<Kind>(q[1], p.b, alpha_first);
                });
        });
}

// Chroma of pairs, V before U, is that of the first channel and of the last where red comes first.
inline split_moves exchange_of_pairs(const yuv_to_rgb &how) {
    return set_split_moves(how.v_first == how.pixels.blue_first);
}

// `whole` pixels, at least a vector, and where they share chroma an even number.
template <chroma_in In, pixel_kind Kind>
[[gnu::always_inline]] inline void channels_row(const yuv_to_rgb &how, const uint8_t *y,
                                                const uint8_t *u, const uint8_t *v, uint8_t *dst,
                                                ptrdiff_t whole) {
    if constexpr (In == chroma_in::full) {
        full_row<Kind>(how, y, u, v, dst, whole);
    } else if constexpr (In == chroma_in::half) {
        const chroma_planes c(how, u, v);
        row_of_pairs<Kind>(how, lines_in<2, 1, 1>{{y, c.first, c.last}}, dst, whole,
                           [](const uint8_t *const *p) {
                               return luma_chroma{load_pairs(p[0]), load_pairs(p[1], p[2])};
                           });
    } else if constexpr (In == chroma_in::pairs) {
        const split_moves moves = exchange_of_pairs(how);
        row_of_pairs<Kind>(how, lines_in<2, 2>{{y, u}}, dst, whole, [&](const uint8_t *const *p) {
            return luma_chroma{load_pairs(p[0]), exchange_pairs(load_pairs(p[1]), moves)};
        });
    } else {
        const split_moves moves = set_split_moves(!how.pixels.blue_first);
        with_flag(
            how.luma_first, [&](auto luma_first) __attribute__((always_inline)) {
                row_of_pairs<Kind>(how, lines_in<4>{{y}}, dst, whole, [&](const uint8_t *const *p) {
                    luma_chroma g = load_groups_natural(p[0]);
                    if (!luma_first) g = exchanged(g);
                    return luma_chroma{g.y, exchange_pairs(g.pairs, moves)};
                });
            });
    }
}
template <chroma_in In, pixel_kind Kind>
[[gnu::always_inline]] inline void channels_row_pair(const yuv_to_rgb &how, const uint8_t *y0,
                                                     const uint8_t *y1, const uint8_t *u,
                                                     const uint8_t *v, uint8_t *dst0, uint8_t *dst1,
                                                     ptrdiff_t whole) {
    if constexpr (In == chroma_in::half) {
        const chroma_planes c(how, u, v);
        rows_of_pairs<Kind>(how, lines_in<2, 2, 1, 1>{{y0, y1, c.first, c.last}}, dst0, dst1, whole,
                            [](const uint8_t *const *p) { return load_pairs(p[0], p[1]); });
    } else {
        static_assert(In == chroma_in::pairs);
        const split_moves moves = exchange_of_pairs(how);
        rows_of_pairs<Kind>(
            how, lines_in<2, 2, 2>{{y0, y1, u}}, dst0, dst1, whole,
            [&](const uint8_t *const *p) { return exchange_pairs(load_pairs(p[0]), moves); });
    }
}

}  // namespace simgp::SIMD_TARGET

#endif
