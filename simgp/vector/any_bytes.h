// Rows between any two formats that move bytes and know no matrix: RGB to RGB, YUV to YUV.
#ifndef SIMGP_VECTOR_ANY_BYTES_H
#define SIMGP_VECTOR_ANY_BYTES_H

#include <string.h>

#include "rows/any.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

// RGB to RGB
// ------------------------------------------------------------------------------------------------

template <rgb_in In>
inline constexpr int size_in = In == rgb_in::words   ? 2
                               : In == rgb_in::three ? 3
                                                     : 4;
template <rgb_in In>
inline rgb_v load_pixels(const uint8_t *p) {
    if constexpr (In == rgb_in::words) return load_565(p);
    if constexpr (In == rgb_in::three) return load_888(p);
    if constexpr (In == rgb_in::four) return load_8888<0>(p);
    if constexpr (In == rgb_in::four_alpha_first) return load_8888<1>(p);
}

[[gnu::noinline]] static void split_part(split_pixels_row *row, int size, const uint8_t *src,
                                         uint8_t *const channels[3], ptrdiff_t x, int count) {
    uint8_t pixels[bytes * 4], to[3][bytes];
    uint8_t *const planes[] = {to[0], to[1], to[2]};
    stage_few(pixels, size, src + size * x, count, size);
    row(pixels, planes, bytes);
    for (int k = 0; k < 3; k++) copy_few(channels[k] + x, to[k], count);
}

template <rgb_in In>
static void split_pixels_vectors(const uint8_t *src, uint8_t *const channels[3], ptrdiff_t count) {
    constexpr int size = size_in<In>;
    if (count < bytes) {
        split_part(split_pixels_vectors<In>, size, src, channels, 0, int(count));
        return;
    }
    move_steps<2>(
        count, lines_in<size>{{src}}, lines_out<1, 1, 1>{{channels[0], channels[1], channels[2]}},
        [](const uint8_t *const *p) { return channels_of(load_pixels<In>(p[0])); },
        [](uint8_t *const *q, const channels_v &c) {
            for (int k = 0; k < 3; k++) store(q[k], c.c[k]);
        });
}

template <pixel_kind Kind>
inline void store_channels(uint8_t *dst, u8v first, u8v g, u8v last, bool alpha_first) {
    if constexpr (Kind == pixel_kind::three) {
        store_zip3(dst, first, g, last);
    } else if constexpr (Kind == pixel_kind::four) {
        first = natural_to_by4(first), g = natural_to_by4(g), last = natural_to_by4(last);
        if (alpha_first)
            store_zip4(dst, set_u8(255), first, g, last);
        else
            store_zip4(dst, first, g, last, set_u8(255));
    } else {
        store_565(dst, natural_to_by8(first), natural_to_by8(g), natural_to_by8(last));
    }
}

// Calls convert(p, q) for every `bytes` pixels of Size bytes at q that become pixels of ToSize bytes
// at p.
template <int Size, int ToSize, class Convert>
[[gnu::always_inline]] inline void repack_in_steps(const lines_to_repack &l, Convert convert) {
    const ptrdiff_t width = l.width;
    const uint8_t *src = l.src;
    uint8_t *dst = l.dst;
    for (ptrdiff_t left = l.count;;) {
        move_steps(
            width, lines_in<Size>{{src}}, lines_out<ToSize>{{dst}},
            [](const uint8_t *const *p) { return p[0]; },
            [&](uint8_t *const *q, const uint8_t *from) { convert(q[0], from); });
        if (--left == 0) return;
        src += l.src_step;
        dst += l.dst_step;
    }
}

template <rgb_in In, pixel_kind To>
static void repack_pixels(const repacking &order, const lines_to_repack &l) {
    const bool alpha_first = order.to_alpha_first;
    with_flag(order.exchange, [&](auto swaps) {
        repack_in_steps<size_in<In>, int(To) + 2>(l, [&](uint8_t *p, const uint8_t *q) {
            channels_v c = channels_of(load_pixels<In>(q));
            if (swaps) c = {{c.c[2], c.c[1], c.c[0]}};
            store_channels<To>(p, c.c[0], c.c[1], c.c[2], alpha_first);
        });
    });
}
static void four_to_words(const repacking &order, const lines_to_repack &l) {
    (order.from_alpha_first ? repack_pixels<rgb_in::four_alpha_first, pixel_kind::words>
                            : repack_pixels<rgb_in::four, pixel_kind::words>)(order, l);
}
static void exchange_three(const repacking &, const lines_to_repack &l) {
    repack_in_steps<3, 3>(l, [](uint8_t *p, const uint8_t *q) { exchange_888(p, q); });
}
static void three_to_four(const repacking &order, const lines_to_repack &l) {
    with_widen_moves(order.exchange, order.to_alpha_first, [&](const auto &m) {
        repack_in_steps<3, 4>(l,
                              [&](uint8_t *p, const uint8_t *q) { repack_888_to_8888(p, q, m); });
    });
}
static void four_to_three(const repacking &order, const lines_to_repack &l) {
    with_narrow_moves(order.exchange, order.from_alpha_first, [&](const auto &m) {
        repack_in_steps<4, 3>(l,
                              [&](uint8_t *p, const uint8_t *q) { repack_8888_to_888(p, q, m); });
    });
}

// The first byte of each byte's pixel, from the start of the block.
struct first_byte {
    alignas(64) uint8_t lane[bytes];
    constexpr first_byte() : lane() {
        for (int i = 0; i < bytes; i++) lane[i] = static_cast<uint8_t>(i % 16 / 4 * 4);
    }
};
static constexpr first_byte first_byte_of_pixel;

// Four bytes to four: each stays in its pixel.
static void reorder_four(const repacking &order, const lines_to_repack &l) {
    // Where the bytes of a pixel come from.
    const int skip = order.from_alpha_first, at = order.to_alpha_first;
    uint8_t from[4];
    from[at ? 0 : 3] = skip ? 0 : 3;
    for (int k = 0; k < 3; k++)
        from[at + k] = static_cast<uint8_t>(skip + (order.exchange ? 2 - k : k));
    const u8v index = add_u8(set_u32(uint32_t(from[0]) | uint32_t(from[1]) << 8 |
                                     uint32_t(from[2]) << 16 | uint32_t(from[3]) << 24),
                             load(first_byte_of_pixel.lane));
    const ptrdiff_t size = 4 * l.width;
    for (ptrdiff_t y = 0; y < l.count; y++) {
        const uint8_t *const src = l.src + y * l.src_step;
        uint8_t *const dst = l.dst + y * l.dst_step;
        const auto vector = [=](ptrdiff_t i) { store(dst + i, shuffle(load(src + i), index)); };
        ptrdiff_t i = 0;
        for (; i + 4 * bytes <= size; i += 4 * bytes) {
            vector(i);
            vector(i + bytes);
            vector(i + 2 * bytes);
            vector(i + 3 * bytes);
        }
        for (; i + bytes < size; i += bytes) vector(i);
        vector(size - bytes);
    }
}

// YUV to YUV
// ------------------------------------------------------------------------------------------------

// The same as in_steps, for `count` >= Step samples, two steps a round: the shortest steps wait for the
// counting.
template <int Step, class Vector>
inline void in_double_steps(ptrdiff_t count, Vector vector) {
    ptrdiff_t x = 0;
    for (; x + 2 * Step < count; x += 2 * Step) {
        vector(x);
        vector(x + Step);
    }
    if (x + Step < count) vector(x);
    vector(count - Step);
}

// Pairs that are less than a vector.
[[gnu::noinline]] static void split_few_groups(const uint8_t *src, const uint8_t *other, uint8_t *y,
                                               uint8_t *u, uint8_t *v, ptrdiff_t pairs,
                                               bool luma_first) {
    for (ptrdiff_t x = 0; x < 2 * pairs; x++) {
        const uint8_t *const p = src + 2 * x;
        y[x] = p[!luma_first];
        if (!u) continue;
        const int of_p = p[luma_first], sum = of_p + (other ? other[2 * x + luma_first] + 1 : of_p);
        *(!v ? u + x : x & 1 ? v + x / 2 : u + x / 2) = static_cast<uint8_t>(sum >> 1);
    }
}

enum class groups_to { luma, planes, pairs };
template <groups_to To, bool Mean, class Moves>
static void split_line(const uint8_t *src, const uint8_t *other, uint8_t *y, uint8_t *u, uint8_t *v,
                       ptrdiff_t pairs, const Moves &moves) {
    constexpr bool planes = To == groups_to::planes;
    const auto loaded = [&](const uint8_t *p, const uint8_t *q) {
        pair_u8 a = load_split(p, moves);
        if constexpr (Mean) a.odd = avg_u8(a.odd, load_split(q, moves).odd);
        return a;
    };
    const auto put_chroma = [](uint8_t *to_u, uint8_t *to_v, u8v c) {
        if constexpr (planes)
            store_split(to_u, to_v, by8_to_natural(c));
        else
            store(to_u, by8_to_natural(c));
    };
    // A line that is not there stands where another is.
    if constexpr (moves_pointers)
        move_steps<2, bytes / 2>(
            pairs, lines_in<4, 4>{{src, Mean ? other : src}}, lines_out < 2, planes ? 1 : 2,
            planes ? 1 : 2 > {{y, To == groups_to::luma ? y : u, planes ? v : y}},
            [&](const uint8_t *const *p) { return loaded(p[0], p[1]); },
            [&](uint8_t *const *q, const pair_u8 &p) {
                store(q[0], by8_to_natural(p.even));
                if constexpr (To != groups_to::luma) put_chroma(q[1], q[2], p.odd);
            });
    else
        in_double_steps<bytes / 2>(pairs, [&](ptrdiff_t i) {
            const pair_u8 p = loaded(src + 4 * i, (Mean ? other : src) + 4 * i);
            store(y + 2 * i, by8_to_natural(p.even));
            if constexpr (planes) put_chroma(u + i, v + i, p.odd);
            if constexpr (To == groups_to::pairs) put_chroma(u + 2 * i, nullptr, p.odd);
        });
}
// One line after the other, a mean with the second of two: in cache that is faster than two at once.
template <class Moves>
static void split_lines(const groups_split &s, const Moves &moves) {
    using to = groups_to;
    for (ptrdiff_t row = 0; row < s.rows; row++) {
        const bool second = s.shared && row & 1;
        const bool gives = s.shared && s.mean ? second || row + 1 == s.rows : !second;
        const ptrdiff_t line = s.shared ? row >> 1 : row;
        const uint8_t *const src = s.src + row * s.stride;
        const uint8_t *const other = second && gives ? src - s.stride : nullptr;
        uint8_t *const y = s.y + row * s.y_stride;
        uint8_t *const u = gives ? s.u + line * s.u_stride : nullptr;
        uint8_t *const v = gives && s.v ? s.v + line * s.v_stride : nullptr;
        if (s.pairs < bytes / 2)
            split_few_groups(src, other, y, u, v, s.pairs, s.luma_first);
        else if (!u)
            split_line<to::luma, false>(src, other, y, u, v, s.pairs, moves);
        else if (other && v)
            split_line<to::planes, true>(src, other, y, u, v, s.pairs, moves);
        else if (other)
            split_line<to::pairs, true>(src, other, y, u, v, s.pairs, moves);
        else if (v)
            split_line<to::planes, false>(src, other, y, u, v, s.pairs, moves);
        else
            split_line<to::pairs, false>(src, other, y, u, v, s.pairs, moves);
    }
}
static void any_split_groups(const groups_split &s) {
    with_split_moves(!s.luma_first, [&](const auto &moves) { split_lines(s, moves); });
}
// Groups of two pixels, luma first or chroma first: rows of those, in steps of `bytes` pixels.
constexpr int groups_of_step = bytes / 2;

template <bool LumaFirst>
static void join_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                        ptrdiff_t pairs) {
    move_line<2, groups_of_step>(
        pairs, lines_in<2, 1, 1>{{y, u, v}}, lines_out<4>{{dst}},
        [](const uint8_t *const *p) { return gather_groups<LumaFirst>(p[0], p[1], p[2]); },
        [](uint8_t *const *q, const joined_groups &p) { store_groups(q[0], p); },
        [](uint8_t *const *q, const uint8_t *const *p) {
            uint8_t *const luma = q[0] + !LumaFirst, *const chroma = q[0] + LumaFirst;
            luma[0] = p[0][0];
            luma[2] = p[0][1];
            chroma[0] = *p[1];
            chroma[2] = *p[2];
        });
}
static void any_join_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                            ptrdiff_t pairs, bool luma_first) {
    (luma_first ? join_groups<true> : join_groups<false>)(y, u, v, dst, pairs);
}

static void any_mean_of_lines(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t count) {
    move_line<2>(
        count, lines_in<1, 1>{{a, b}}, lines_out<1>{{dst}},
        [](const uint8_t *const *p) { return avg_u8(load(p[0]), load(p[1])); },
        [](uint8_t *const *q, u8v v) { store(q[0], v); },
        [](uint8_t *const *q, const uint8_t *const *p) {
            *q[0] = static_cast<uint8_t>((*p[0] + *p[1] + 1) >> 1);
        });
}
static void any_mean_of_blocks(const uint8_t *a, const uint8_t *b, ptrdiff_t step, uint8_t *dst,
                               ptrdiff_t dst_step, ptrdiff_t count, ptrdiff_t rows) {
    for (ptrdiff_t y = 0; y < rows; y++) {
        const uint8_t *const p = a + y * step, *const q = b + y * step;
        uint8_t *const to = dst + y * dst_step;
        if (moves_pointers && count >= bytes)
            move_steps<2>(
                count, lines_in<2, 2>{{p, q}}, lines_out<1>{{to}},
                [](const uint8_t *const *in) { return load_block_means(in[0], in[1]); },
                [](uint8_t *const *out, u8v v) { store(out[0], v); });
        else
            in_steps(
                count, [=](ptrdiff_t x) { store(to + x, load_block_means(p + 2 * x, q + 2 * x)); },
                [=](ptrdiff_t x) {
                    const int sum = p[2 * x] + p[2 * x + 1] + q[2 * x] + q[2 * x + 1];
                    to[x] = static_cast<uint8_t>((sum + 2) >> 2);
                });
    }
}

// What follows the last sample may lie behind the line.
static void any_every_second(const uint8_t *a, uint8_t *dst, ptrdiff_t count) {
    move_line<2>(
        count - 1, lines_in<2>{{a}}, lines_out<1>{{dst}},
        [](const uint8_t *const *p) { return load_split_natural(p[0]).even; },
        [](uint8_t *const *q, u8v v) { store(q[0], v); },
        [](uint8_t *const *q, const uint8_t *const *p) { *q[0] = *p[0]; });
    dst[count - 1] = a[2 * (count - 1)];
}
static void any_twice(const uint8_t *a, uint8_t *dst, ptrdiff_t count) {
    move_line<2>(
        count / 2, lines_in<1>{{a}}, lines_out<2>{{dst}},
        [](const uint8_t *const *p) { return natural_to_by8(load(p[0])); },
        [](uint8_t *const *q, u8v v) { store_zip8(q[0], v, v); },
        [](uint8_t *const *q, const uint8_t *const *p) { q[0][0] = q[0][1] = *p[0]; });
    if (count & 1) dst[count - 1] = a[count / 2];
}

}  // namespace simgp::SIMD_TARGET

#endif
