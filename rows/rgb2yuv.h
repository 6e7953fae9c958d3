// Inner loops from RGB to YUV and to RGB565.
#ifndef ROWS_RGB2YUV_H
#define ROWS_RGB2YUV_H

#include "rows/conversions.h"

namespace simgp {

// Converts `width` >= 1 pixels of a row: a luma sample for each, and for the layouts half, uv and
// vu the chroma of every second pixel, the first, third and so on, width / 2 in all. u takes the
// pairs of uv and vu; pointers that the layout does not use may be null. Nothing may overlap.
using rgb_to_yuv_row = void(const uint8_t *src, uint8_t *y, uint8_t *u, uint8_t *v,
                            ptrdiff_t width);

// Repacks `width` >= 1 pixels of a row, which may not overlap.
using rgb_to_rgb_row = void(const uint8_t *src, uint8_t *dst, ptrdiff_t width);

// Null where no kernel needs the row: SIMGP_RGB_TO_YUV_KERNELS, each of which needs grey too, and
// SIMGP_RGB_TO_RGB565_KERNELS tell.
struct rgb2yuv_rows {
    rgb_to_yuv_row *row[size_t(rgb_packing::count)][size_t(yuv_layout::count)];
    rgb_to_rgb_row *to_rgb565[size_t(rgb_packing::count)];
};

}  // namespace simgp

#endif
