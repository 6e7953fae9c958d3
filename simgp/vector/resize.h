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
    static constexpr bool natural = false;
    const step_plan<W> *plan;

    explicit from_windows(const resize_strip &s)
        : plan(reinterpret_cast<const step_plan<W> *>(s.plan)) {}
    SIMD_INLINE u8v vector(const uint8_t *row, int32_t t, int v) const {
        const step_plan<W> &p = plan[t];
        u8v pairs = shuffle(gather_blocks(row, p.at[v][0]), load(p.index[v][0]));
        for (int w = 1; w < W; w++)
            pairs = bit_or(pairs, shuffle(gather_blocks(row, p.at[v][w]), load(p.index[v][w])));
        return pairs;
    }
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        return {vector(row, t, 0), vector(row, t, 1)};
    }
    SIMD_INLINE two_vectors weights(int32_t t) const {
        return {load(plan[t].weight[0]), load(plan[t].weight[1])};
    }
    // A step with many windows reaches over several lines of the cache.
    SIMD_INLINE void fetch_ahead(const uint8_t *row, ptrdiff_t ahead, int32_t t) const {
        const step_plan<W> &p = plan[t];
        fetch(row, ahead + p.at[0][0][0]);
        if constexpr (W > 1) fetch(row, ahead + p.at[1][0][0]);
        if constexpr (W > 2) {
            fetch(row, ahead + p.at[0][0][blocks - 1]);
            fetch(row, ahead + p.at[1][0][blocks - 1]);
        }
    }
};

// One window holds the pairs of 16 lanes.
struct from_shared_windows : from_windows<1> {
    using from_windows<1>::from_windows;
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        const u8v v = gather_blocks(row, plan[t].at[0][0]);
        return {shuffle(v, load(plan[t].index[0][0])), shuffle(v, load(plan[t].index[1][0]))};
    }
};

// Pairs that lie in the row as they are: in the order of the windows, or in their own.
template <bool Natural>
struct from_row : from_windows<1> {
    static constexpr bool natural = Natural;
    using from_windows<1>::from_windows;
    SIMD_INLINE two_vectors pairs(const uint8_t *row, int32_t t) const {
        const uint8_t *const p = row + plan[t].at[0][0][0];
        if constexpr (Natural) return {load(p), load(p + bytes)};
        return {load_blocks(p, 32), load_blocks(p + 16, 32)};
    }
};

struct from_afar {
    static constexpr bool natural = false;
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
        const from_windows<1> windows(s);
        const from_row<Use == use::made> row(s);
        int32_t t = 0;
        for (int32_t end = s.direct_from;; end = steps) {
            run(windows, t, end);
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

// A row that is shorter than a window is read from a copy.
[[gnu::noinline]] static void copy_short_row(uint8_t (&copy)[16], const uint8_t *row,
                                             int32_t count) {
    memset(copy, 0, sizeof copy);
    memcpy(copy, row, size_t(count));
}
struct readable_row {
    uint8_t copy[16];
    const uint8_t *row;

    SIMD_INLINE readable_row(const resize_strip &s, const uint8_t *p) : row(p) {
        if (s.row_bytes >= 16 || s.windows == 0) return;
        copy_short_row(copy, p, s.row_bytes);
        row = copy;
    }
};

// Where a line is stored: a strip of less than a step goes through the stack.
class written_line {
  public:
    SIMD_INLINE written_line(const resize_strip &s, uint8_t *dst)
        : dst_(dst), part_(s.lanes < bytes ? s.lanes : 0), to(part_ ? copy_ : dst) {}
    SIMD_INLINE ~written_line() {
        if (part_) memcpy(dst_, copy_, size_t(part_));
    }

  private:
    uint8_t copy_[bytes];
    uint8_t *const dst_;
    const int32_t part_;

  public:
    uint8_t *const to;
};

// Writes N lines between two rows.
template <class Pixel, int N>
struct lines_between {
    using phase = typename Pixel::phase;
    phase first, second;
    uint8_t *const to0, *const to1;
    const ptrdiff_t ahead;

    lines_between(const resize_line *lines, const written_line &line0, const written_line &line1,
                  ptrdiff_t stride)
        : first(lines[0].phase),
          second(lines[N - 1].phase),
          to0(line0.to),
          to1(line1.to),
          ahead(N * stride) {}

    template <class Blend>
    SIMD_INLINE void write(const Blend &a, const Blend &b, int32_t lane) const {
        fetch_for_write(to0 + lane, ahead);
        store(to0 + lane, Pixel::down(a, b, first));
        if constexpr (N > 1) {
            fetch_for_write(to1 + lane, ahead);
            store(to1 + lane, Pixel::down(a, b, second));
        }
    }
};

template <class Pixel, int N>
static void lines_down(const resize_strip &s, const resize_line *lines, uint8_t *dst,
                       ptrdiff_t stride) {
    const uint8_t *const above = lines[0].above, *const below = lines[0].below;
    const written_line line0(s, dst), line1(s, dst + (N - 1) * stride);
    const lines_between<Pixel, N> made(lines, line0, line1, stride);
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
    if (count == 1) return lines_down<Pixel, 1>(s, lines, dst, stride);
    lines_down<Pixel, 2>(s, lines, dst, stride);
}

template <class Pixel>
static void row_across(const resize_strip &s, const uint8_t *row, uint8_t *kept, ptrdiff_t ahead) {
    const readable_row from(s, row);
    const uint8_t *const p = from.row;
    for_each_step<use::kept>(s, [=](const auto &source, int32_t t, int32_t) SIMD_INLINED {
        source.fetch_ahead(row, ahead, t);
        Pixel::keep(kept + t * Pixel::kept_vectors * bytes,
                    Pixel::across(source.pairs(p, t), source.weights(t)));
    });
}
template <class Pixel, int N>
static void across_and_down(const resize_strip &s, const uint8_t *row, uint8_t *kept,
                            ptrdiff_t ahead, const resize_line *lines, uint8_t *dst,
                            ptrdiff_t stride) {
    const readable_row from(s, row);
    const uint8_t *const p = from.row, *const above = lines[0].above;
    const written_line line0(s, dst), line1(s, dst + (N - 1) * stride);
    const lines_between<Pixel, N> made(lines, line0, line1, stride);
    for_each_step<use::kept_and_made>(
        s, [=](const auto &source, int32_t t, int32_t lane) SIMD_INLINED {
            const ptrdiff_t at = ptrdiff_t(t) * Pixel::kept_vectors * bytes;
            source.fetch_ahead(row, ahead, t);
            const auto b = Pixel::across(source.pairs(p, t), source.weights(t));
            const auto a = Pixel::kept(above + at);
            Pixel::keep(kept + at, b);
            made.write(a, b, lane);
        });
}
template <class Pixel>
static void across(const resize_strip &s, const uint8_t *row, uint8_t *kept, ptrdiff_t ahead,
                   const resize_line *lines, int32_t count, uint8_t *dst, ptrdiff_t stride) {
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
    const readable_row r0(s, l0.above), r1(s, l0.below), r2(s, l1.above), r3(s, l1.below);
    const uint8_t *const above0 = r0.row, *const below0 = r1.row;
    const uint8_t *const above1 = r2.row, *const below1 = r3.row;
    const phase first(l0.phase), second(l1.phase);
    const written_line line0(s, dst), line1(s, dst + (N - 1) * stride);
    uint8_t *const to0 = line0.to, *const to1 = line1.to;
    for_each_step<use::made>(s, [=](const auto &source, int32_t t, int32_t lane) SIMD_INLINED {
        const auto ordered = [&](u8v v)
                                 SIMD_INLINED { return source.natural ? by8_to_natural(v) : v; };
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
