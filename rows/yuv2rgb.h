// Inner loops from YUV to RGB.
#ifndef ROWS_YUV2RGB_H
#define ROWS_YUV2RGB_H

#include "rows/conversions.h"

namespace simgp {

// Converts `width` >= 1 pixels of a row. Pointers that the layout does not use may be null. The row
// reads the samples of its pixels and writes the pixels, nothing else. dst may overlap y as far as
// the pixels up to and including x lie on samples up to and including x only.
using yuv_to_rgb_row = void(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                            ptrdiff_t width);

// The same for two rows with the same chroma, which may be one and the same row.
using yuv_to_rgb_row_pair = void(const uint8_t *y0, const uint8_t *y1, const uint8_t *u,
                                 const uint8_t *v, uint8_t *dst0, uint8_t *dst1, ptrdiff_t width);

// With the coefficients of 8 fractional bits, or the coarse ones of 6.
enum class yuv_matrix : uint8_t { fine, coarse, count };

// By matrix, layout and packing: single rows where a chroma line serves one row, pairs where it
// serves two; null where no kernel needs it. SIMGP_YUV_TO_RGB_KERNELS and
// SIMGP_PACKED_TO_RGB_KERNELS tell which are needed.
struct yuv2rgb_rows {
    yuv_to_rgb_row
        *row[size_t(yuv_matrix::count)][size_t(yuv_layout::count)][size_t(rgb_packing::count)];
    yuv_to_rgb_row_pair
        *pair[size_t(yuv_matrix::count)][size_t(yuv_layout::count)][size_t(rgb_packing::count)];
};

constexpr bool serves_two_rows(const format &yuv) { return yuv.y_shift[yuv.u < 0 ? 0 : yuv.u]; }
constexpr yuv_matrix matrix_of(yuv_rule rule) {
    return rule == yuv_rule::coarse ? yuv_matrix::coarse : yuv_matrix::fine;
}

}  // namespace simgp

#endif
