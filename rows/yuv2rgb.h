// Inner loops from YUV to RGB.
#ifndef ROWS_YUV2RGB_H
#define ROWS_YUV2RGB_H

#include "rows/conversions.h"

namespace simgp {

// Where a row lies, or a pair of rows that share a line of chroma. The two of a pair may be one and the
// same; a row alone is both.
struct line_to_rgb {
    const uint8_t *y[2], *u, *v;
    uint8_t *dst[2];
};
// Rows or pairs. From each of them to the next, pointers move by their steps.
struct yuv_to_rgb;
struct lines_to_rgb : line_to_rgb {
    ptrdiff_t width, count = 1;  // pixels of a row, and rows or pairs, at least one
    ptrdiff_t y_step = 0, u_step = 0, v_step = 0, dst_step = 0;
    const yuv_to_rgb *how = nullptr;  // what rows of rows/any.h ask for
};

// Converts them, all in one call: in small pictures, calls and the constants of a loop are seen. Scalar rows
// take any width. Vector rows take at least a vector of pixels, or half of one (see yuv2rgb_rows), and an even
// number where two pixels share chroma; convert_line in simgp/walk.h sees to the others. Pointers that the
// layout does not use may be null, if their steps are 0. Reads the samples of the pixels and writes the
// pixels, nothing else. dst[k] may overlap y[k] as far as the pixels up to and including x lie on samples up
// to and including x only.
using yuv_to_rgb_rows = void(const lines_to_rgb &l);

// With the coefficients of 8 fractional bits, or the coarse ones of 6.
enum class yuv_matrix : uint8_t { fine, coarse, count };

// By matrix, layout and packing: single rows where a chroma line serves one row, pairs where it
// serves two; null where no kernel needs it. SIMGP_YUV_TO_RGB_KERNELS and
// SIMGP_PACKED_TO_RGB_KERNELS tell which are needed.
struct yuv2rgb_rows {
    yuv_to_rgb_rows
        *row[size_t(yuv_matrix::count)][size_t(yuv_layout::count)][size_t(rgb_packing::count)];
    yuv_to_rgb_rows
        *pair[size_t(yuv_matrix::count)][size_t(yuv_layout::count)][size_t(rgb_packing::count)];
    // Whether pairs, here and in rows/any.h, need but half a vector of pixels where two pixels share chroma.
    bool halves;
};

constexpr bool serves_two_rows(const format &yuv) { return yuv.y_shift[yuv.u < 0 ? 0 : yuv.u]; }
constexpr yuv_matrix matrix_of(yuv_rule rule) {
    return rule == yuv_rule::coarse ? yuv_matrix::coarse : yuv_matrix::fine;
}

}  // namespace simgp

#endif
