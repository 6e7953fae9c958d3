// The inner loops of the deblocking filter.
#ifndef ROWS_DEBLOCK_H
#define ROWS_DEBLOCK_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// Strengths of the rows are 1 ... 160. All below 1 change nothing, for t = max(0, 2 strength - |d|)
// where |d| is above the strength. All from 160 on do the same, t = |d|, for d is at most
// (255 + 4 * 255) >> 3 = 159 and at least -(255 + 4 * 255) >> 3 = -160.
inline constexpr int deblock_least_strength = 1, deblock_full_strength = 160;

// Filters across the edge between the lines b and c, of `width` >= 1 samples each. The line a lies
// before b, the line d behind c.
using deblock_line_edge = void(uint8_t *a, uint8_t *b, uint8_t *c, uint8_t *d, ptrdiff_t width,
                               int strength);

// In `lines` lines, 1 to 8, filters across the edges before columns 8, 16, ... 8 edges; edges >= 1.
// p is column 0 of the first line. Reads columns 2 ... 8 edges + 5 and writes them, most of them
// with what they were.
using deblock_column_edges = void(uint8_t *p, ptrdiff_t stride, ptrdiff_t edges, ptrdiff_t lines,
                                  int strength);

struct deblock_rows {
    deblock_line_edge *line_edge;
    deblock_column_edges *column_edges;
};

}  // namespace simgp

#endif
