// The plan of a strip: where the samples that a step blends across lie in a row of the source.
//
// A lane is a byte of the destination's line; a step makes `bytes` of them from two vectors of byte
// pairs, P and Q of each lane. The first vector holds the pairs of lanes 0 ... 7 of each block of 16,
// the second those of lanes 8 ... 15, so that narrow() puts the lanes in order. The pairs of 8 lanes
// come from windows, 16 bytes of the row each, through a shuffle. Windows that would end behind the
// row begin earlier.
#ifndef SIMGP_VECTOR_RESIZE_PLAN_H
#define SIMGP_VECTOR_RESIZE_PLAN_H

#include <string.h>

#include "rows/resize.h"

namespace simgp::SIMD_TARGET {

// A step whose groups of 8 lanes take W windows each.
template <int W>
struct step_plan {
    alignas(bytes) uint8_t weight[2][bytes];  // of the first and of the second vector
    uint8_t index[2][W][bytes];
    int32_t at[2][W][blocks];  // where the windows begin
};
// Where windows do not help, pairs are taken byte by byte.
struct far_plan {
    alignas(bytes) uint8_t weight[2][bytes];
    int32_t at[2 * bytes];
};
static_assert(alignof(far_plan) <= resize_alignment);

// Pixels apart, at most, that lie `steps` columns apart.
inline int64_t cells_apart(const resize_strip &s, int steps) {
    return ((int64_t(s.step) * steps + (1 << 18) - 1) >> 18) << s.shift;
}
// Bytes from the first to the last that 8 lanes need. Of pixels of 3 bytes they touch 3, or 4; then
// they begin with the last byte of the first one, or end with the first byte of the last one.
template <int C>
int64_t window_bytes(const resize_strip &s) {
    const int64_t tap = int64_t(1) << s.shift;
    if constexpr (C == 3) {
        const int64_t three = 3 * (cells_apart(s, 2) + tap) + 2;
        const int64_t four = 3 * (cells_apart(s, 3) + tap) - 1;
        return four > three ? four : three;
    } else {
        return C * (cells_apart(s, 8 / C - 1) + tap) + C;
    }
}
// The same of 16 lanes, in whole pixels.
template <int C>
int64_t shared_window_bytes(const resize_strip &s) {
    const int64_t tap = int64_t(1) << s.shift;
    return C * (cells_apart(s, C == 3 ? 5 : 16 / C - 1) + tap) + C;
}

template <int C>
static void measure(resize_strip &s, int32_t kept_vectors) {
    const int64_t need = window_bytes<C>(s);
    s.windows = need <= 16 ? 1 : need <= 32 ? 2 : need <= 64 ? 4 : 0;
    // Many windows are more work than what is gained by not keeping rows.
    if (s.windows == 0 || s.windows == 4) s.keeps = true;
    s.shared = s.windows == 1 && shared_window_bytes<C>(s) <= 16;
    const size_t plan = s.windows == 1   ? sizeof(step_plan<1>)
                        : s.windows == 2 ? sizeof(step_plan<2>)
                        : s.windows == 4 ? sizeof(step_plan<4>)
                                         : sizeof(far_plan);
    s.plan_bytes = int32_t(plan);
    s.kept_bytes = kept_vectors * bytes;
    s.step_bytes = bytes;
}

// Steps follow each other; the last one ends at the last lane and may do some again.
inline int32_t begin_of_step(const resize_strip &s, int32_t step) {
    return step + 1 < s.steps ? step * bytes : s.last;
}

// Eight lanes are planned at once, in vectors of the compiler's, of which two are needed where they
// have 16 bytes: there is a plan for every strip, and of a small picture it is a good part of the
// work.
using plan_vector = int32_t __attribute__((vector_size(bytes < 32 ? 16 : 32)));
using unsigned_plan_vector = uint32_t __attribute__((vector_size(sizeof(plan_vector))));
using plan_pairs = uint16_t __attribute__((vector_size(sizeof(plan_vector) / 2)));
inline constexpr int plan_parts = 32 / sizeof(plan_vector);

// Bytes low[0], high[0], low[1], ... of numbers 0 ... 255.
[[gnu::always_inline]] inline plan_pairs pairs_of(const plan_vector &low, const plan_vector &high) {
    return __builtin_convertvector(low | high << 8, plan_pairs);
}
// Those of part h of eight.
[[gnu::always_inline]] inline void put_pairs(uint8_t *to, int h, const plan_pairs &pairs) {
    memcpy(to + h * int(sizeof pairs), &pairs, sizeof pairs);
}

// What a strip is made of: pixels of `size` bytes, and weights that are multiplied by `scale`.
struct plan_kind {
    int32_t size, scale;
};

// Pixel and channel of the lanes that follow one of channel k of its pixel, of C bytes.
struct following_lanes {
    alignas(32) int32_t pixel[10][8], channel[10][8];
    static constexpr int row(int C, int k) { return C * (C - 1) / 2 + k; }
    constexpr following_lanes() : pixel(), channel() {
        for (int C = 1; C <= 4; C++)
            for (int k = 0; k < C; k++)
                for (int i = 0; i < 8; i++) {
                    pixel[row(C, k)][i] = (k + i) / C;
                    channel[row(C, k)][i] = (k + i) % C;
                }
    }
};
static constexpr following_lanes following{};

// Eight lanes: the bytes of the row that they need, those of q behind those of p, and their phases.
struct eight_lanes {
    plan_vector p[plan_parts], apart[plan_parts], phase[plan_parts];
    int32_t first;  // the lowest of the bytes

    // The weights of p and q, 8 * scale together.
    [[gnu::always_inline]] void put_weights(uint8_t *to, int scale) const {
        for (int h = 0; h < plan_parts; h++)
            put_pairs(to, h,
                      __builtin_convertvector(8 * scale + phase[h] * (255 * scale), plan_pairs));
    }
};
// What it takes to plan them, held where stores to the plan cannot change it.
class lanes_in_turn {
  public:
    [[gnu::always_inline]] lanes_in_turn(const resize_strip &s, int32_t size)
        : C_(size),
          ahead_(8 / size),
          pitch_(size << s.shift),
          origin_(size * s.first),
          first_column_(s.x),
          last_column_(s.x + s.columns - 1),
          step_(s.step) {}

    [[gnu::always_inline]] void begin(int32_t lane) {
        column_ = first_column_ + lane / C_;
        k_ = lane % C_;
    }
    // Columns behind the last one stand for that.
    [[gnu::always_inline]] eight_lanes next() {
        eight_lanes l;
        const int row = following_lanes::row(C_, k_);
        for (int h = 0; h < plan_parts; h++) {
            plan_vector x, channel;
            memcpy(&x, following.pixel[row] + 8 / plan_parts * h, sizeof x);
            memcpy(&channel, following.channel[row] + 8 / plan_parts * h, sizeof channel);
            x += column_;
            const plan_vector inside = x < last_column_;
            x = (x & inside) | (last_column_ & ~inside);
            const plan_vector eighths = (plan_vector)((unsigned_plan_vector)x * step_) >> 15;
            l.phase[h] = eighths & 7;
            l.p[h] = (eighths >> 3) * pitch_ + (channel - origin_);
            l.apart[h] = (l.phase[h] != 0) & pitch_;
        }
        // That of the first lane, or channel 0 of the next pixel where that lies before it.
        l.first = byte(column_) + k_;
        if (k_ > 0) {
            const int32_t second = byte(column_ + 1);
            l.first = second < l.first ? second : l.first;
        }
        column_ += ahead_;
        if (C_ == 3 && (k_ += 2) >= 3) {
            k_ -= 3;
            column_++;
        }
        return l;
    }

  private:
    int32_t byte(int32_t x) const {
        x = x < last_column_ ? x : last_column_;
        return (int32_t(uint32_t(x) * step_) >> 18) * pitch_ - origin_;
    }

    const int32_t C_, ahead_, pitch_, origin_, first_column_, last_column_;
    const uint32_t step_;
    int32_t column_ = 0, k_ = 0;
};

inline constexpr uint8_t in_order[16] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15};

// The part of a step in block j of vector v. Returns whether its pairs lie in the row as they are.
template <int W>
[[gnu::always_inline]] inline bool plan_block(const eight_lanes &l, int32_t limit, bool shared,
                                              step_plan<W> &p, int v, int j) {
    plan_pairs moved = {};
    for (int w = 0; w < W; w++) {
        const int32_t from = l.first + 16 * w;
        const int32_t base = shared && v ? p.at[0][0][j] : from < limit ? from : limit;
        p.at[v][w][j] = base;
        for (int h = 0; h < plan_parts; h++) {
            plan_vector low = l.p[h] - base, high = low + l.apart[h];
            if constexpr (W > 1) {
                const plan_vector in_low = ((l.p[h] - from) & ~15) == 0;
                const plan_vector in_high = ((l.p[h] + l.apart[h] - from) & ~15) == 0;
                low = (low & in_low) | (0x80 & ~in_low);
                high = (high & in_high) | (0x80 & ~in_high);
            }
            const plan_pairs index = pairs_of(low, high);
            put_pairs(p.index[v][w] + 16 * j, h, index);
            if constexpr (W == 1) {
                plan_pairs as_they_are;
                memcpy(&as_they_are, in_order + 16 / plan_parts * h, sizeof as_they_are);
                moved |= index ^ as_they_are;
            }
        }
    }
    uint64_t any[sizeof moved / 8];
    memcpy(any, &moved, sizeof moved);
    return W == 1 && (any[0] | any[sizeof moved / 8 - 1]) == 0;
}

// A run of steps whose pairs lie in the row as they are, and end to end, is noted down: these need
// no windows. Where nothing is kept, they are done in the order of the lanes, and so are their
// weights.
template <int W>
static void plan_windows(resize_strip &s, plan_kind kind) {
    step_plan<W> *const plan = reinterpret_cast<step_plan<W> *>(s.plan);
    const int32_t limit = s.row_bytes > 16 ? s.row_bytes - 16 : 0;
    const bool shared = s.shared;
    lanes_in_turn lanes(s, kind.size);
    s.direct_from = s.direct_to = 0;
    for (int32_t t = 0; t < s.steps; t++) {
        step_plan<W> &p = plan[t];
        bool direct = W == 1;
        lanes.begin(begin_of_step(s, t));
#pragma GCC unroll 1
        for (int k = 0; k < 2 * blocks; k++) {
            const eight_lanes l = lanes.next();
            l.put_weights(p.weight[k & 1] + 8 * (k & ~1), kind.scale);
            direct &= plan_block(l, limit, shared, p, k & 1, k / 2);
        }
        for (int j = 0; direct && j < blocks; j++)
            for (int v = 0; v < 2; v++) direct = p.at[v][0][j] == p.at[0][0][0] + 32 * j + 16 * v;
        if (!direct) continue;
        if (s.direct_to == s.direct_from) s.direct_from = s.direct_to = t;
        if (s.direct_to == t) s.direct_to = t + 1;
    }
    for (int32_t t = s.direct_from; t < s.direct_to && !s.keeps; t++) {
        uint8_t natural[2 * bytes];
        for (int k = 0; k < 2 * blocks; k++)
            memcpy(natural + 16 * k, plan[t].weight[k & 1] + 16 * (k / 2), 16);
        memcpy(plan[t].weight, natural, sizeof natural);
    }
}

static void plan_far(resize_strip &s, plan_kind kind) {
    far_plan *const plan = reinterpret_cast<far_plan *>(s.plan);
    lanes_in_turn lanes(s, kind.size);
    s.direct_from = s.direct_to = 0;
    for (int32_t t = 0; t < s.steps; t++) {
        lanes.begin(begin_of_step(s, t));
#pragma GCC unroll 1
        for (int k = 0; k < 2 * blocks; k++) {
            const int v = k & 1, j = k / 2;
            const eight_lanes l = lanes.next();
            l.put_weights(plan[t].weight[v] + 16 * j, kind.scale);
            int32_t *const at = plan[t].at + v * bytes + 16 * j;
            int32_t p[8], apart[8];
            memcpy(p, l.p, sizeof p);
            memcpy(apart, l.apart, sizeof apart);
            for (int i = 0; i < 8; i++) {
                at[2 * i] = p[i];
                at[2 * i + 1] = p[i] + apart[i];
            }
        }
    }
}

[[gnu::noinline]] static void make_plan_of(resize_strip &s, plan_kind kind) {
    s.lanes = s.columns * kind.size;
    s.steps = (s.lanes + bytes - 1) / bytes;
    s.last = s.lanes < bytes ? 0 : s.lanes - bytes;
    switch (s.windows) {
        case 1:
            return plan_windows<1>(s, kind);
        case 2:
            return plan_windows<2>(s, kind);
        case 4:
            return plan_windows<4>(s, kind);
        default:
            return plan_far(s, kind);
    }
}
template <int C, int Scale>
static void make_plan(resize_strip &s) {
    make_plan_of(s, {C, Scale});
}

}  // namespace simgp::SIMD_TARGET

#endif
