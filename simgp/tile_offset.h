// The address formula of the 64 x 32 tiled layout (drawn in tile.h).
#ifndef SIMGP_TILE_OFFSET_H
#define SIMGP_TILE_OFFSET_H

#include "rows/tile.h"

namespace simgp {

// Where byte x of row y of a tiled plane of width bytes x height rows lies, from its start.
static_assert(tile_width == 1 << 6 && tile_height == 1 << 5 && tile_bytes == 1 << 11);
inline ptrdiff_t tile_offset(ptrdiff_t width, ptrdiff_t height, ptrdiff_t x, ptrdiff_t y) {
    // The tile's place in its group: the column's parity, and the upper or the lower pair, which
    // change places from group to group.
    const ptrdiff_t place = (x >> 6 & 1) | ((x >> 7 ^ y >> 5) & 1) << 1;
    // The last tile row, if no other shares its groups, has four tile columns in each of them.
    const bool alone = y + 32 >= height && !((height - 1) & 32) && !(y & 32);
    const ptrdiff_t group = ((width + 127) >> 7) * (y >> 6) + (x >> (alone ? 8 : 7));
    return group << 13 | place << 11 | (y & 31) << 6 | (x & 63);
}

}  // namespace simgp

#endif
