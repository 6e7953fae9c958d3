// Deblocking: the scalar rows, which define the result, and the walk over the edges of a plane. The
// filter is that of Rec. ITU-T H.263, Annex J.
#include "simgp/deblock.h"

#include "rows/choose.h"
#include "simgp/lines.h"

namespace simgp {
namespace scalar {
namespace {

int clamp(int low, int high, int x) { return x < low ? low : x > high ? high : x; }

// The four samples across an edge.
void filter(uint8_t &a, uint8_t &b, uint8_t &c, uint8_t &d, int strength) {
    const int A = a, B = b, C = c, D = d;
    const int step = (A - 4 * B + 4 * C - D) >> 3;  // -160 ... 159
    const int size = step < 0 ? -step : step;
    const int over = size > strength ? 2 * (size - strength) : 0;
    const int t = size > over ? size - over : 0;
    const int d1 = step < 0 ? -t : t;
    const int d2 = clamp(-(t >> 1), t >> 1, (A - D) >> 2);
    // d2 leads A and D towards each other, by a quarter of their distance at most.
    a = uint8_t(A - d2);
    b = uint8_t(clamp(0, 255, B + d1));
    c = uint8_t(clamp(0, 255, C - d1));
    d = uint8_t(D + d2);
}

void line_edge(uint8_t *a, uint8_t *b, uint8_t *c, uint8_t *d, ptrdiff_t width, int strength) {
    for (ptrdiff_t x = 0; x < width; x++) filter(a[x], b[x], c[x], d[x], strength);
}

void column_edges(uint8_t *p, ptrdiff_t stride, ptrdiff_t edges, ptrdiff_t lines, int strength) {
    for (ptrdiff_t y = 0; y < lines; y++)
        for (ptrdiff_t k = 1; k <= edges; k++) {
            uint8_t *const c = p + y * stride + 8 * k;
            filter(c[-2], c[-1], c[0], c[1], strength);
        }
}

}  // namespace

void fill_deblock(deblock_rows &t) {
    t.line_edge = line_edge;
    t.column_edges = column_edges;
}

}  // namespace scalar

namespace {

struct deblock_args {
    lines plane;
    ptrdiff_t width, height;
    int strength;
};

enum class edges { horizontal, vertical, both };

// The whole filter in one pass over memory, with the result of two.
//
// Horizontal edge k, before line 8 k, reads and writes lines 8 k - 2 ... 8 k + 1 and no others. So
// once edge k is filtered, in rising order, no horizontal edge to come reads or writes a line above
// 8 k + 6: the eight lines 8 k - 8 ... 8 k - 1, which edges k - 1 and k touch, are what the first
// pass makes of them, and what happens to them is not seen by the rest of it. Vertical edges lie in
// single lines, so those of these eight may follow at once, while the lines are in the cache.
void deblock(const deblock_args &a, edges which) {
    if (a.width < 1 || a.strength < deblock_least_strength) return;
    const int strength = a.strength < deblock_full_strength ? a.strength : deblock_full_strength;
    const deblock_rows &live = live_rows().deblock;

    const ptrdiff_t bands = a.height >> 3;
    const ptrdiff_t columns = which == edges::horizontal ? 0 : (a.width >> 3) - 1;
    const auto filter_lines = [&](ptrdiff_t from, ptrdiff_t to) {
        for (ptrdiff_t y = from; y < to && columns > 0; y += 8)
            live.column_edges(a.plane.line(y), a.plane.stride, columns, to - y < 8 ? to - y : 8,
                              strength);
    };

    ptrdiff_t filtered = 0;  // lines whose vertical edges are
    for (ptrdiff_t y = 8; y < 8 * bands && which != edges::vertical; y += 8) {
        live.line_edge(a.plane.line(y - 2), a.plane.line(y - 1), a.plane.line(y),
                       a.plane.line(y + 1), a.width, strength);
        filter_lines(filtered, y);
        filtered = y;
    }
    filter_lines(filtered, a.height);
}

int at_most(int limit, int strength) { return strength < limit ? strength : limit; }

}  // namespace
}  // namespace simgp

using namespace simgp;

// Defines an exported kernel: which edges it filters, and with what strength.
#define DEBLOCK_KERNEL(name, which, used_strength)                                               \
    void name(uint8_t *plane, int16_t strength, int32_t stride, int32_t width, int32_t height) { \
        deblock({{plane, stride}, width, height, used_strength}, which);                         \
    }
DEBLOCK_KERNEL(simgp_dbf8x8, edges::both, at_most(12, strength))
DEBLOCK_KERNEL(simgp_dbf8x8_h263_hor, edges::horizontal, strength)
DEBLOCK_KERNEL(simgp_dbf8x8_h263_ver, edges::vertical, strength)
#undef DEBLOCK_KERNEL

int32_t simgp_dbf8x8_yuv(const simgp_img *img, int16_t strength) {
    if (strength < 0 || strength > 15) return SIMGP_ERR_PARAM;
    for (int k = 0; k < 3; k++) {
        const lines plane{img->plane[k], img->stride[k]};
        if (plane.first) deblock({plane, img->width[k], img->height[k], strength}, edges::both);
    }
    return SIMGP_OK;
}
