// The dithering row. Its decisions hang together in a chain, which the layer settles for a whole
// vector at once (see chain_before in simd/lanes.h); all else is lane by lane.
//
// Column x = 2, 4, ... of a row decides s(x) = p > q, where p = cur[x - 1] is final and q = cur[x]
// has just been nudged by the decision before it, to min(q + 2, 255) or max(q - 2, 0). So
//   s(x) = a or (b and not s(x - 2)), a = p > min(q + 2, 255), b = p > max(q - 2, 0), a implies b.
#ifndef SIMGP_VECTOR_DITHER_H
#define SIMGP_VECTOR_DITHER_H

#include "rows/dither.h"

namespace simgp::SIMD_TARGET {

// One column, for the ends of a row and for short rows.
struct dither_columns {
    const uint8_t *src, *above;
    uint8_t *cur, *below;

    static uint8_t nudge(int sample, bool up, int by) {
        const int v = up ? sample + by : sample - by;
        return static_cast<uint8_t>(v < 0 ? 0 : v > 255 ? 255 : v);
    }
    bool decision(ptrdiff_t x) const { return cur[x - 1] > cur[x]; }
    void nudge_cur(ptrdiff_t x) const { cur[x] = nudge(cur[x], decision(x - 2), 2); }
    void make_below(ptrdiff_t x) const {
        const bool up = above[x] > cur[x];
        below[x] = nudge(src[x], up, 1);
        below[x + 1] = nudge(src[x + 1], up, 1);
    }

    // Columns x ... x + bytes - 1. `pairs` are p and q of each decision: cur from x - 1 on, before
    // it is nudged.
    void vector(ptrdiff_t x, u8v pairs, chain_state &chain) const {
        const u8v two = as_u8(set_u16(2 << 8)), one = set_u8(1);
        const u8v up = add_sat_u8(pairs, two), down = sub_sat_u8(pairs, two);
        const s16v p = as_s16(even(pairs));
        const mask16 before =
            chain_before(greater(p, as_s16(odd(up))), greater(p, as_s16(odd(down))), chain);
        const u8v nudged = select(before, up, down);
        const mask16 raise = greater(as_s16(odd(load(above + x - 1))), as_s16(odd(nudged)));
        store(cur + x - 1, nudged);
        const u8v from = load(src + x);
        store(below + x, select(raise, add_sat_u8(from, one), sub_sat_u8(from, one)));
    }
};

// The first column, 2, takes no nudge, and the last one that does makes nothing below; between them
// all columns do the same. Whole vectors of those are followed by one that ends at the last of them
// and may do some again: its samples are loaded before the first store.
static void dither(const uint8_t *src, const uint8_t *above, uint8_t *cur, uint8_t *below,
                   ptrdiff_t width) {
    const dither_columns c{src, above, cur, below};
    const ptrdiff_t last = 2 + ((width - 3) & ~ptrdiff_t(1));
    below[0] = src[0];
    below[1] = src[1];
    for (ptrdiff_t x = last; x < width; x++) below[x] = src[x];
    c.make_below(2);
    ptrdiff_t x = 4;
    if (last - x >= bytes) {
        const u8v pairs_at_end = load(cur + last - bytes - 1);
        chain_state chain = chain_begin(c.decision(2));
        for (; x + bytes <= last; x += bytes) c.vector(x, load(cur + x - 1), chain);
        if (x < last) {
            x = last - bytes;
            chain = chain_begin(c.decision(x - 2));
            c.vector(x, pairs_at_end, chain);
            x = last;
        }
    }
    for (; x < last; x += 2) {
        c.nudge_cur(x);
        c.make_below(x);
    }
    c.nudge_cur(last);
}

void fill_dither(dither_rows &t) { t.dither = dither; }

}  // namespace simgp::SIMD_TARGET

#endif
