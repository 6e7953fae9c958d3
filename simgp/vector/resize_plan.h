// The plan of a strip: where the samples that a step blends across lie in a row of the source.
//
// A lane is a byte of the destination's line; a step makes `bytes` of them from two vectors of byte
// pairs, P and Q of each lane. They are picked from windows of the row, each of which holds the pairs
// of a group of lanes, window_bytes / 2. The vectors take the groups in turn: of blocks, the first one
// holds the pairs of lanes 0 ... 7 of each 16, the second those of lanes 8 ... 15, and narrow() puts
// the lanes in order; of windows that are vectors, each holds half of the step. Windows that would
// end behind the row begin earlier.
#ifndef SIMGP_VECTOR_RESIZE_PLAN_H
#define SIMGP_VECTOR_RESIZE_PLAN_H

#include <string.h>

#include "rows/resize.h"

namespace simgp::SIMD_TARGET {

inline constexpr int group_lanes = window_bytes / 2;
// Narrowed, the lanes of a step are in order.
inline constexpr bool in_order_when_narrow = windows == blocks;

// Of a step, the lanes that are planned at once: eight, from lane 8 k on. Their pairs lie in vector v,
// from byte `at` on, which is in window j.
struct pairs_place {
    int v, j, at;
    explicit pairs_place(int k)
        : v(8 * k / group_lanes % 2),
          j(8 * k / group_lanes / 2),
          at(j * window_bytes + 16 * k % window_bytes) {}
};

// A step whose groups of lanes take W windows each.
template <int W>
struct step_plan {
    alignas(bytes) uint8_t weight[2][bytes];  // of the first and of the second vector
    uint8_t index[2][W][bytes];
    int32_t at[2][W][windows];  // where the windows begin
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
// Bytes from the first to the last that a group needs. Of pixels of 3 bytes 8 lanes touch 3, or 4;
// then they begin with the last byte of the first one, or end with the first byte of the last one. Of
// 32 lanes it is the same, as there are two more than whole pixels again.
template <int C>
int64_t group_bytes(const resize_strip &s) {
    const int64_t tap = int64_t(1) << s.shift;
    if constexpr (C == 3) {
        static_assert(group_lanes % 3 == 2);
        const int64_t fewer = 3 * (cells_apart(s, group_lanes / 3) + tap) + 2;
        const int64_t more = 3 * (cells_apart(s, group_lanes / 3 + 1) + tap) - 1;
        return more > fewer ? more : fewer;
    } else {
        return C * (cells_apart(s, group_lanes / C - 1) + tap) + C;
    }
}
// The same of two groups, in whole pixels.
template <int C>
int64_t two_groups_bytes(const resize_strip &s) {
    constexpr int lanes = 2 * group_lanes;
    const int64_t tap = int64_t(1) << s.shift;
    return C * (cells_apart(s, C == 3 ? lanes / 3 : lanes / C - 1) + tap) + C;
}

template <int C>
static void measure(resize_strip &s, int32_t kept_vectors) {
    const int64_t need = group_bytes<C>(s);
    s.windows = 0;
    for (int n = 4; n > 0; n /= 2)
        if (need <= n * window_bytes) s.windows = n;
    // Many windows are more work than what is gained by not keeping rows.
    if (s.windows == 0 || s.windows == 4) s.keeps = true;
    s.shared = s.windows == 1 && two_groups_bytes<C>(s) <= window_bytes;
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

struct bytes_in_order {
    uint8_t at[window_bytes];
    constexpr bytes_in_order() : at() {
        for (int i = 0; i < window_bytes; i++) at[i] = uint8_t(i);
    }
};
static constexpr bytes_in_order in_order{};

// Eight lanes of a group whose first byte is `first`. Returns whether their pairs lie in the row as
// they are.
template <int W>
[[gnu::always_inline]] inline bool plan_eight(const eight_lanes &l, int32_t first, int32_t limit,
                                              bool shared, step_plan<W> &p, const pairs_place &to) {
    plan_pairs moved = {};
    for (int w = 0; w < W; w++) {
        const int32_t from = first + window_bytes * w;
        const int32_t base = shared && to.v ? p.at[0][0][to.j] : from < limit ? from : limit;
        p.at[to.v][w][to.j] = base;
        for (int h = 0; h < plan_parts; h++) {
            plan_vector low = l.p[h] - base, high = low + l.apart[h];
            if constexpr (W > 1) {
                constexpr int32_t beyond = -window_bytes;
                const plan_vector in_low = ((l.p[h] - from) & beyond) == 0;
                const plan_vector in_high = ((l.p[h] + l.apart[h] - from) & beyond) == 0;
                low = (low & in_low) | (0x80 & ~in_low);
                high = (high & in_high) | (0x80 & ~in_high);
            }
            const plan_pairs index = pairs_of(low, high);
            put_pairs(p.index[to.v][w] + to.at, h, index);
            if constexpr (W == 1) {
                plan_pairs as_they_are;
                memcpy(&as_they_are, in_order.at + to.at % window_bytes + 16 / plan_parts * h,
                       sizeof as_they_are);
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
    const int32_t limit = s.row_bytes > window_bytes ? s.row_bytes - window_bytes : 0;
    const bool shared = s.shared;
    lanes_in_turn lanes(s, kind.size);
    s.direct_from = s.direct_to = 0;
    for (int32_t t = 0; t < s.steps; t++) {
        step_plan<W> &p = plan[t];
        bool direct = W == 1;
        lanes.begin(begin_of_step(s, t));
        int32_t first = 0;
#pragma GCC unroll 1
        for (int k = 0; k < 2 * blocks; k++) {
            const eight_lanes l = lanes.next();
            const pairs_place to(k);
            if (8 * k % group_lanes == 0) first = l.first;
            l.put_weights(p.weight[to.v] + to.at, kind.scale);
            direct &= plan_eight(l, first, limit, shared, p, to);
        }
        for (int j = 0; direct && j < windows; j++)
            for (int v = 0; v < 2; v++)
                direct = p.at[v][0][j] == p.at[0][0][0] + window_bytes * (2 * j + v);
        if (!direct) continue;
        if (s.direct_to == s.direct_from) s.direct_from = s.direct_to = t;
        if (s.direct_to == t) s.direct_to = t + 1;
    }
    if (!in_order_when_narrow || s.keeps) return;
    for (int32_t t = s.direct_from; t < s.direct_to; t++) {
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
            const pairs_place to(k);
            const eight_lanes l = lanes.next();
            l.put_weights(plan[t].weight[to.v] + to.at, kind.scale);
            int32_t *const at = plan[t].at + to.v * bytes + to.at;
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
    s.small = s.lanes < bytes || (s.windows > 0 && s.row_bytes < window_bytes);
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
