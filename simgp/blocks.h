// The walk over a plane in blocks of cache size.
#ifndef SIMGP_BLOCKS_H
#define SIMGP_BLOCKS_H

#include <stddef.h>

namespace simgp {

// The part of a block that lies in the plane: at most as wide and as high as the blocks are.
struct block {
    ptrdiff_t x, y, width, height;
};

// Calls f(block) for all blocks of Width x Height that a plane of width x height touches, row by row of
// blocks, from left to right.
template <ptrdiff_t Width, ptrdiff_t Height, class F>
void for_each_block(ptrdiff_t width, ptrdiff_t height, F f) {
    for (ptrdiff_t y = 0; y < height; y += Height)
        for (ptrdiff_t x = 0; x < width; x += Width)
            f(block{x, y, width - x < Width ? width - x : Width,
                    height - y < Height ? height - y : Height});
}

}  // namespace simgp

#endif
