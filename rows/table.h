// The table of rows: every inner loop of the library, by area. Scalar rows define the results; each
// instruction set has a table of its own, filled by its vector rows.
#ifndef ROWS_TABLE_H
#define ROWS_TABLE_H

#include "rows/any.h"
#include "rows/deblock.h"
#include "rows/dither.h"
#include "rows/keyframe.h"
#include "rows/layout.h"
#include "rows/mem.h"
#include "rows/resize.h"
#include "rows/rgb2yuv.h"
#include "rows/rotate.h"
#include "rows/tile.h"
#include "rows/yuv2rgb.h"

namespace simgp {

// A member for each area of the build's list (cmake/targets.cmake), under the area's name.
struct row_table {
    any_rows any;
    deblock_rows deblock;
    dither_rows dither;
    keyframe_rows keyframe;
    layout_rows layout;
    mem_rows mem;
    resize_rows resize;
    rgb2yuv_rows rgb2yuv;
    rotate_rows rotate;
    tile_rows tile;
    yuv2rgb_rows yuv2rgb;

    // The samples of a vector of bytes; 1 for scalar rows. Rows of less are those of `for_short`, whose
    // vectors are shorter; null: none are.
    ptrdiff_t vector;
    const row_table *for_short;
};

}  // namespace simgp

#endif
