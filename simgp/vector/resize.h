// Bilinear resize: the loops over the steps of a strip. What lies between them and memory is chosen by
// templates, so everything that a loop calls must be inlined into it, and is told so: compilers give
// up where the same lambda goes into several loops.
#ifndef SIMGP_VECTOR_RESIZE_H
#define SIMGP_VECTOR_RESIZE_H

#include <string.h>

#include "rows/resize.h"
#include "simgp/vector/fetch.h"
#include "simgp/vector/resize_plan.h"

// Operations over plain lanes are loops: compilers take minutes over so many of them in one function.
#ifdef SIMD_LANES_H
#define SIMD_INLINE inline
#define SIMD_INLINED
#else
#define SIMD_INLINE [[gnu::always_inline]] inline
#define SIMD_INLINED __attribute__((always_inline))
#endif

namespace simgp::SIMD_TARGET {

// The pairs of a step, and their weights.
struct two_vectors {
    u8v first, second;
};

// Where the pairs come from
// -----------------------------------------------------------------------------------

template <int W>
struct from_windows {
    static constexpr bool natural = !in_order_when_narrow;
    const step_plan<W> *plan;

    explicit from_windows(const resize_strip &s)
        : plan(reinterpret_cast<const step_plan<W> *>(s.plan)) {}
    SIMD_INLINE u8v vector(const uint8_t *row, int32_t t, int v) const {
        const step_plan<W> &p = plan[t];
        if constexpr (W == 1) return pick(gather_windows(row, p.at[v][0]), load(p.index[v][0]));
        u8v pairs = set_u8(0);
        for (int w = 0; w < W; w++)
            pairs =
                bit_or(pairs, pick_or_zero(gather_windows(row, p.at[v][w]), load(p.index[v][w])));
        return pairs;
    }
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        return {vector(row, t, 0), vector(row, t, 1)};
    }
    SIMD_INLINE two_vectors weights(int32_t t) const {
        return {load(plan[t].weight[0]), load(plan[t].weight[1])};
    }
    // A step reaches over several lines of the cache where there are many windows, or large ones.
    SIMD_INLINE void fetch_ahead(const uint8_t *row, ptrdiff_t ahead, int32_t t) const {
        const step_plan<W> &p = plan[t];
        if constexpr (window_bytes > 16) {
            for (int v = 0; v < 2; v++)
                for (int w = 0; w < W; w++) fetch(row, ahead + p.at[v][w][0]);
        } else {
            fetch(row, ahead + p.at[0][0][0]);
            if constexpr (W > 1) fetch(row, ahead + p.at[1][0][0]);
            if constexpr (W > 2) {
                fetch(row, ahead + p.at[0][0][windows - 1]);
                fetch(row, ahead + p.at[1][0][windows - 1]);
            }
        }
    }
};

// One window holds the pairs of two groups.
struct from_shared_windows : from_windows<1> {
    using from_windows<1>::from_windows;
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        const u8v v = gather_windows(row, plan[t].at[0][0]);
        return {pick(v, load(plan[t].index[0][0])), pick(v, load(plan[t].index[1][0]))};
    }
    SIMD_INLINE void fetch_ahead(const uint8_t *row, ptrdiff_t ahead, int32_t t) const {
        fetch(row, ahead + plan[t].at[0][0][0]);
    }
};

// Pairs that lie in the row as they are: in the order of the groups, or in their own.
template <bool Natural>
struct from_row : from_windows<1> {
    static constexpr bool natural = Natural || !in_order_when_narrow;
    using from_windows<1>::from_windows;
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        const uint8_t *const p = row + plan[t].at[0][0][0];
        if constexpr (natural) return {load(p), load(p + bytes)};
        return {load_blocks(p, 32), load_blocks(p + 16, 32)};
    }
};

struct from_afar {
    static constexpr bool natural = !in_order_when_narrow;
    const far_plan *plan;

    explicit from_afar(const resize_strip &s) : plan(reinterpret_cast<const far_plan *>(s.plan)) {}
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        uint8_t b[2 * bytes];
        for (int i = 0; i < 2 * bytes; i++) b[i] = row[plan[t].at[i]];
        return {load(b), load(b + bytes)};
    }
    SIMD_INLINE two_vectors weights(int32_t t) const {
        return {load(plan[t].weight[0]), load(plan[t].weight[1])};
    }
    SIMD_INLINE void fetch_ahead(const uint8_t *, ptrdiff_t, int32_t) const {}
};

// What is done with a step: lines are made of it, it is kept, or both.
enum class use { made, kept, kept_and_made };

// Calls f(source, t, lane) for step t, whose first lane that is. Shared windows are worth a loop only
// where rows are kept, and what comes from many windows, or from afar, is only kept.
template <use Use, class F>
SIMD_INLINE void for_each_step(const resize_strip &s, F f) {
    const int32_t steps = s.steps, last = s.last;
    const auto run = [=](const auto &source, int32_t t, int32_t end) SIMD_INLINED {
        for (; t < end; t++) f(source, t, t * bytes < last ? t * bytes : last);
    };
    if (Use != use::made && s.windows == 1 && s.shared) {
        run(from_shared_windows(s), 0, steps);
    } else if (s.windows == 1) {
        const from_windows<1> any(s);
        const from_row<Use == use::made> row(s);
        int32_t t = 0;
        for (int32_t end = s.direct_from;; end = steps) {
            run(any, t, end);
            if (end == steps) break;
            run(row, end, s.direct_to);
            t = s.direct_to;
        }
    } else if (s.windows == 2) {
        run(from_windows<2>(s), 0, steps);
    } else if constexpr (Use == use::kept) {
        if (s.windows == 4)
            run(from_windows<4>(s), 0, steps);
        else
            run(from_afar(s), 0, steps);
    }
}

// What is made of them
// ---------------------------------------------------------------------------------------

// Bytes. The weights across are 8 times the phases, so that a blend A is 64 times a sample, at most
// 64 * 255, and all blends are multiples of 8. Down, A + fy (B - A) / 8 is exact then:
// mul_round(B - A, fy << 12) = (B - A) fy / 8.
struct byte_lanes {
    static constexpr int scale = 8;
    static constexpr int kept_vectors = 2;
    struct blend {
        s16v first, second;
    };
    struct phase {
        s16v f;
        explicit phase(int32_t fy) : f(as_s16(set_u16(uint16_t(fy << 12)))) {}
    };

    SIMD_INLINE static blend across(const two_vectors &pairs, const two_vectors &weights) {
        return {as_s16(dot_pairs(pairs.first, weights.first)),
                as_s16(dot_pairs(pairs.second, weights.second))};
    }
    SIMD_INLINE static void keep(uint8_t *to, const blend &b) {
        store(to, as_u8(as_u16(b.first)));
        store(to + bytes, as_u8(as_u16(b.second)));
    }
    SIMD_INLINE static blend kept(const uint8_t *p) {
        return {as_s16(as_u16(load(p))), as_s16(as_u16(load(p + bytes)))};
    }
    SIMD_INLINE static s16v between(s16v a, s16v b, const phase &down) {
        return as_s16(shr<6>(as_u16(add(a, mul_round(sub(b, a), down.f)))));
    }
    SIMD_INLINE static u8v down(const blend &a, const blend &b, const phase &down) {
        return narrow(between(a.first, b.first, down), between(a.second, b.second, down));
    }
};

// 565 words, whose pairs of bytes are those of the two low bytes, then of the two high ones. Lanes
// of the blends are
//   blue and red in turn, 8 times blue (at most 8 * 31) and 64 times red (8 times bits 3 ... 7)
//   green: 8 times bits 5 ... 7 of the low byte + 256 * 8 times bits 0 ... 2 of the high one, that is
//   256 times green, at most 256 * 63
struct word_lanes {
    static constexpr int scale = 1;
    static constexpr int kept_vectors = 3;
    struct blend {
        u16v first, second;
        s16v green;
    };
    struct phase {
        s16v green;
        u16v above, below;
        explicit phase(int32_t fy)
            : green(as_s16(set_u16(uint16_t(fy << 12)))),
              above(set_u16(uint16_t(8 - fy))),
              below(set_u16(uint16_t(fy))) {}
    };

    SIMD_INLINE static u16v blue_red(u8v pairs, u8v weights) {
        return dot_pairs(bit_and(pairs, set_u32(0xF8F81F1F)), weights);
    }
    SIMD_INLINE static u16v green(u8v pairs, u8v weights) {
        return dot_pairs(bit_and(pairs, set_u32(0x0707E0E0)), weights);
    }
    SIMD_INLINE static blend across(const two_vectors &pairs, const two_vectors &weights) {
        return {blue_red(pairs.first, weights.first), blue_red(pairs.second, weights.second),
                as_s16(sum_pairs<256>(green(pairs.first, weights.first),
                                      green(pairs.second, weights.second)))};
    }
    SIMD_INLINE static void keep(uint8_t *to, const blend &b) {
        store(to, as_u8(b.first));
        store(to + bytes, as_u8(b.second));
        store(to + 2 * bytes, as_u8(as_u16(b.green)));
    }
    SIMD_INLINE static blend kept(const uint8_t *p) {
        return {as_u16(load(p)), as_u16(load(p + bytes)), as_s16(as_u16(load(p + 2 * bytes)))};
    }
    // Blue has 64 parts now, red 512, at most 8 * 64 * 31.
    SIMD_INLINE static u16v between(u16v a, u16v b, const phase &down) {
        return shr_pairs<6, 9>(as_u16(add(as_s16(mul(a, down.above)), as_s16(mul(b, down.below)))));
    }
    SIMD_INLINE static u8v down(const blend &a, const blend &b, const phase &down) {
        const u16v outer =
            sum_pairs<2048>(between(a.first, b.first, down), between(a.second, b.second, down));
        const s16v inner = add(a.green, mul_round(sub(b.green, a.green), down.green));
        return bit_or(as_u8(outer), bit_and(as_u8(shr<3>(as_u16(inner))), as_u8(set_u16(0x07E0))));
    }
};

// The loops
// --------------------------------------------------------------------------------------------------

// What a strip needs whose rows are shorter than a window, or whose lines are shorter than a step: rows
// are read from copies, and lines are written to the stack first. The loops know nothing of it.
struct small_strip {
    resize_strip strip;
    uint8_t rows[4][window_bytes] = {}, lines[2][bytes];

    explicit small_strip(const resize_strip &s) : strip(s) { strip.small = false; }

    const uint8_t *row(int k, const uint8_t *p) {
        if (strip.row_bytes >= window_bytes || strip.windows == 0) return p;
        memcpy(rows[k], p, size_t(strip.row_bytes));
        return rows[k];
    }
    void write(int32_t count, uint8_t *dst, ptrdiff_t stride) const {
        const size_t size = size_t(strip.lanes < bytes ? strip.lanes : bytes);
        for (int32_t k = 0; k < count; k++) memcpy(dst + k * stride, lines[k], size);
    }
    // Calls make(dst, stride) for the lines, wherever they go.
    template <class Make>
    void make_lines(int32_t count, uint8_t *dst, ptrdiff_t stride, Make make) {
        if (strip.lanes >= bytes) return make(dst, stride);
        make(lines[0], ptrdiff_t(bytes));
        write(count, dst, stride);
    }
};
[[gnu::noinline]] static void small_across(const resize_strip &s, const uint8_t *row, uint8_t *kept,
                                           ptrdiff_t ahead, const resize_line *lines, int32_t count,
                                           uint8_t *dst, ptrdiff_t stride,
                                           resize_across_row *across) {
    small_strip small(s);
    const uint8_t *const from = small.row(0, row);
    small.make_lines(count, dst, stride, [&](uint8_t *to, ptrdiff_t step) {
        across(small.strip, from, kept, ahead, lines, count, to, step);
    });
}
[[gnu::noinline]] static void small_down(const resize_strip &s, const resize_line *lines,
                                         int32_t count, uint8_t *dst, ptrdiff_t stride,
                                         resize_down_row *down) {
    small_strip small(s);
    small.make_lines(count, dst, stride, [&](uint8_t *to, ptrdiff_t step) {
        down(small.strip, lines, count, to, step);
    });
}
[[gnu::noinline]] static void small_both(const resize_strip &s, const resize_line *lines,
                                         int32_t count, uint8_t *dst, ptrdiff_t stride,
                                         ptrdiff_t ahead, resize_both_row *both) {
    small_strip small(s);
    resize_line copies[2] = {};
    for (int32_t k = 0; k < count; k++)
        copies[k] = {small.row(2 * k, lines[k].above), small.row(2 * k + 1, lines[k].below),
                     lines[k].phase};
    small.make_lines(count, dst, stride, [&](uint8_t *to, ptrdiff_t step) {
        both(small.strip, copies, count, to, step, ahead);
    });
}

// What was made narrow: from two halves of a step, or else from groups in turn.
SIMD_INLINE u8v in_order_of_lanes(bool halves, u8v v) { return halves ? by8_to_natural(v) : v; }

// Writes N lines between two rows.
template <class Pixel, int N>
struct lines_between {
    using phase = typename Pixel::phase;
    phase first, second;
    uint8_t *const to0, *const to1;
    const ptrdiff_t ahead;

    lines_between(const resize_line *lines, uint8_t *dst, ptrdiff_t stride)
        : first(lines[0].phase),
          second(lines[N - 1].phase),
          to0(dst),
          to1(dst + (N - 1) * stride),
          ahead(N * stride) {}

    template <class Blend>
    SIMD_INLINE void write(const Blend &a, const Blend &b, int32_t lane) const {
        fetch_for_write(to0 + lane, ahead);
        store(to0 + lane, in_order_of_lanes(!in_order_when_narrow, Pixel::down(a, b, first)));
        if constexpr (N > 1) {
            fetch_for_write(to1 + lane, ahead);
            store(to1 + lane, in_order_of_lanes(!in_order_when_narrow, Pixel::down(a, b, second)));
        }
    }
};

template <class Pixel, int N>
static void lines_down(const resize_strip &s, const resize_line *lines, uint8_t *dst,
                       ptrdiff_t stride) {
    const uint8_t *const above = lines[0].above, *const below = lines[0].below;
    const lines_between<Pixel, N> made(lines, dst, stride);
    const auto step = [=](int32_t t, int32_t lane) SIMD_INLINED {
        const ptrdiff_t at = ptrdiff_t(t) * Pixel::kept_vectors * bytes;
        made.write(Pixel::kept(above + at), Pixel::kept(below + at), lane);
    };
    const int32_t whole = s.steps - 1;
    for (int32_t t = 0; t < whole; t++) step(t, t * bytes);
    step(whole, s.last);
}
template <class Pixel>
static void down(const resize_strip &s, const resize_line *lines, int32_t count, uint8_t *dst,
                 ptrdiff_t stride) {
    if (s.small) return small_down(s, lines, count, dst, stride, down<Pixel>);
    if (count == 1) return lines_down<Pixel, 1>(s, lines, dst, stride);
    lines_down<Pixel, 2>(s, lines, dst, stride);
}

template <class Pixel>
static void row_across(const resize_strip &s, const uint8_t *row, uint8_t *kept, ptrdiff_t ahead) {
    for_each_step<use::kept>(s, [=](const auto &source, int32_t t, int32_t) SIMD_INLINED {
        source.fetch_ahead(row, ahead, t);
        Pixel::keep(kept + t * Pixel::kept_vectors * bytes,
                    Pixel::across(source.pairs(row, t), source.weights(t)));
    });
}
template <class Pixel, int N>
static void across_and_down(const resize_strip &s, const uint8_t *row, uint8_t *kept,
                            ptrdiff_t ahead, const resize_line *lines, uint8_t *dst,
                            ptrdiff_t stride) {
    const uint8_t *const above = lines[0].above;
    const lines_between<Pixel, N> made(lines, dst, stride);
    for_each_step<use::kept_and_made>(
        s, [=](const auto &source, int32_t t, int32_t lane) SIMD_INLINED {
            const ptrdiff_t at = ptrdiff_t(t) * Pixel::kept_vectors * bytes;
            source.fetch_ahead(row, ahead, t);
            const auto b = Pixel::across(source.pairs(row, t), source.weights(t));
            const auto a = Pixel::kept(above + at);
            Pixel::keep(kept + at, b);
            made.write(a, b, lane);
        });
}
template <class Pixel>
static void across(const resize_strip &s, const uint8_t *row, uint8_t *kept, ptrdiff_t ahead,
                   const resize_line *lines, int32_t count, uint8_t *dst, ptrdiff_t stride) {
    if (s.small) return small_across(s, row, kept, ahead, lines, count, dst, stride, across<Pixel>);
    const bool rare = s.windows == 0 || s.windows == 4;
    if (count == 0 || rare) {
        row_across<Pixel>(s, row, kept, ahead);
        if (count > 0) down<Pixel>(s, lines, count, dst, stride);
    } else if (count == 1) {
        across_and_down<Pixel, 1>(s, row, kept, ahead, lines, dst, stride);
    } else {
        across_and_down<Pixel, 2>(s, row, kept, ahead, lines, dst, stride);
    }
}

// N lines. Chained: what lies below the first lies above the second. All that is loaded is loaded
// before the stores: compilers would load it again.
template <class Pixel, int N, bool Chained>
static void lines_at_once(const resize_strip &s, const resize_line *lines, uint8_t *dst,
                          ptrdiff_t stride, ptrdiff_t ahead) {
    using phase = typename Pixel::phase;
    const resize_line &l0 = lines[0], &l1 = lines[N - 1];
    const uint8_t *const above0 = l0.above, *const below0 = l0.below;
    const uint8_t *const above1 = l1.above, *const below1 = l1.below;
    const phase first(l0.phase), second(l1.phase);
    uint8_t *const to0 = dst, *const to1 = dst + (N - 1) * stride;
    for_each_step<use::made>(s, [=](const auto &source, int32_t t, int32_t lane) SIMD_INLINED {
        const auto ordered = [&](u8v v)
                                 SIMD_INLINED { return in_order_of_lanes(source.natural, v); };
        const two_vectors weights = source.weights(t);
        const auto blend = [&](const uint8_t *row) SIMD_INLINED {
            source.fetch_ahead(row, ahead, t);
            return Pixel::across(source.pairs(row, t), weights);
        };
        const auto a = blend(above0), b = blend(below0);
        const u8v made = ordered(Pixel::down(a, b, first));
        if constexpr (N == 1) {
            store(to0 + lane, made);
        } else {
            u8v next;
            if constexpr (Chained) {
                next = ordered(Pixel::down(b, blend(below1), second));
            } else {
                const auto c = blend(above1);
                next = ordered(Pixel::down(c, blend(below1), second));
            }
            store(to0 + lane, made);
            store(to1 + lane, next);
        }
    });
}
template <class Pixel>
static void both(const resize_strip &s, const resize_line *lines, int32_t count, uint8_t *dst,
                 ptrdiff_t stride, ptrdiff_t ahead) {
    if (s.small) return small_both(s, lines, count, dst, stride, ahead, both<Pixel>);
    if (count == 1) return lines_at_once<Pixel, 1, false>(s, lines, dst, stride, ahead);
    if (lines[0].below == lines[1].above)
        return lines_at_once<Pixel, 2, true>(s, lines, dst, stride, ahead);
    lines_at_once<Pixel, 2, false>(s, lines, dst, stride, ahead);
}

template <int C, class Pixel>
static void measure_kind(resize_strip &s) {
    measure<C>(s, Pixel::kept_vectors);
}

template <resize_kind Kind, class Pixel>
static void fill_kind(resize_rows &t) {
    constexpr int size = resized_pixel_bytes[size_t(Kind)];
    t.of[size_t(Kind)] = {measure_kind<size, Pixel>, make_plan<size, Pixel::scale>, across<Pixel>,
                          down<Pixel>, both<Pixel>};
}
void fill_resize(resize_rows &t) {
    fill_kind<resize_kind::bytes1, byte_lanes>(t);
    fill_kind<resize_kind::bytes2, byte_lanes>(t);
    fill_kind<resize_kind::bytes3, byte_lanes>(t);
    fill_kind<resize_kind::bytes4, byte_lanes>(t);
    fill_kind<resize_kind::word565, word_lanes>(t);
}

}  // namespace simgp::SIMD_TARGET

#undef SIMD_INLINE
#undef SIMD_INLINED

#endif
