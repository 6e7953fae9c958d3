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

// Pixel and channel of the lanes that follow one of channel k of its pixel.
template <int C>
struct following {
    int32_t pixel[C][8], channel[C][8];
    constexpr following() : pixel(), channel() {
        for (int k = 0; k < C; k++)
            for (int i = 0; i < 8; i++) {
                pixel[k][i] = (k + i) / C;
                channel[k][i] = (k + i) % C;
            }
    }
};

// Eight lanes: the bytes of the row that they need, and their phases.
template <int C>
struct eight_lanes {
    static constexpr following<C> after{};
    int32_t p[8], q[8], phase[8];
    int32_t first;  // the lowest of them

    [[gnu::always_inline]] eight_lanes(const resize_strip &s, int32_t lane) {
        const int32_t last_column = s.x + s.columns - 1;
        if (lane >= s.lanes) lane = s.lanes - 1;
        const int32_t column = s.x + lane / C, k = lane % C, tap = C << s.shift;
        const int32_t origin = C * s.first;
        for (int i = 0; i < 8; i++) {
            int32_t x = column + after.pixel[k][i];
            x = x < last_column ? x : last_column;
            const int32_t eighths = int32_t(uint32_t(x) * s.step) >> 15;
            phase[i] = eighths & 7;
            p[i] = ((eighths >> 3) << s.shift) * C + after.channel[k][i] - origin;
            q[i] = p[i] + (phase[i] ? tap : 0);
        }
        // That of the first lane, or channel 0 of the next pixel where that lies before it.
        first = p[0];
        if (C > 1 && k > 0 && p[C - k] < first) first = p[C - k];
    }
};

// Bytes low[0], high[0], low[1], ...
[[gnu::always_inline]] inline void put_pairs(uint8_t *to, const int32_t *low, const int32_t *high) {
    uint16_t pair[8];
    for (int i = 0; i < 8; i++) pair[i] = uint16_t((low[i] & 255) | high[i] << 8);
    memcpy(to, pair, sizeof pair);
}

// The part of a step in block j of vector v. Returns whether its pairs lie in the row as they are.
template <int C, int Scale, int W>
[[gnu::always_inline]] inline bool plan_block(const resize_strip &s, step_plan<W> &p, int v, int j,
                                              int32_t lane) {
    const eight_lanes<C> l(s, lane);
    const int32_t limit = s.row_bytes > 16 ? s.row_bytes - 16 : 0;
    int32_t low[8], high[8];
    for (int i = 0; i < 8; i++) {
        low[i] = Scale * (8 - l.phase[i]);
        high[i] = Scale * l.phase[i];
    }
    put_pairs(p.weight[v] + 16 * j, low, high);
    int32_t other = 0;
    for (int w = 0; w < W; w++) {
        const int32_t from = l.first + 16 * w;
        const int32_t base = s.shared && v ? p.at[0][0][j] : from < limit ? from : limit;
        p.at[v][w][j] = base;
        for (int i = 0; i < 8; i++) {
            low[i] = l.p[i] - base;
            high[i] = l.q[i] - base;
            if constexpr (W == 1) {
                other |= (low[i] ^ 2 * i) | (high[i] ^ (2 * i + 1));
            } else {
                low[i] = ((l.p[i] - from) & ~15) == 0 ? low[i] : 0x80;
                high[i] = ((l.q[i] - from) & ~15) == 0 ? high[i] : 0x80;
            }
        }
        put_pairs(p.index[v][w] + 16 * j, low, high);
    }
    return other == 0;
}

// A run of steps whose pairs lie in the row as they are, and end to end, is noted down: these need
// no windows. Where nothing is kept, they are done in the order of the lanes, and so are their
// weights.
template <int C, int Scale, int W>
static void plan_windows(resize_strip &s) {
    step_plan<W> *const plan = reinterpret_cast<step_plan<W> *>(s.plan);
    s.direct_from = s.direct_to = 0;
    for (int32_t t = 0; t < s.steps; t++) {
        step_plan<W> &p = plan[t];
        bool direct = W == 1;
        for (int j = 0; j < blocks; j++)
            for (int v = 0; v < 2; v++)
                direct &= plan_block<C, Scale>(s, p, v, j, begin_of_step(s, t) + 16 * j + 8 * v);
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

template <int C, int Scale>
static void plan_far(resize_strip &s) {
    far_plan *const plan = reinterpret_cast<far_plan *>(s.plan);
    s.direct_from = s.direct_to = 0;
    for (int32_t t = 0; t < s.steps; t++)
        for (int v = 0; v < 2; v++)
            for (int j = 0; j < blocks; j++) {
                const eight_lanes<C> l(s, begin_of_step(s, t) + 16 * j + 8 * v);
                for (int i = 0; i < 8; i++) {
                    const int k = 16 * j + 2 * i;
                    plan[t].weight[v][k] = uint8_t(Scale * (8 - l.phase[i]));
                    plan[t].weight[v][k + 1] = uint8_t(Scale * l.phase[i]);
                    plan[t].at[v * bytes + k] = l.p[i];
                    plan[t].at[v * bytes + k + 1] = l.q[i];
                }
            }
}

// Weights are multiplied by Scale.
template <int C, int Scale>
static void make_plan(resize_strip &s) {
    s.lanes = s.columns * C;
    s.steps = (s.lanes + bytes - 1) / bytes;
    s.last = s.lanes < bytes ? 0 : s.lanes - bytes;
    switch (s.windows) {
        case 1:
            return plan_windows<C, Scale, 1>(s);
        case 2:
            return plan_windows<C, Scale, 2>(s);
        case 4:
            return plan_windows<C, Scale, 4>(s);
        default:
            return plan_far<C, Scale>(s);
    }
}

}  // namespace simgp::SIMD_TARGET

#endif
