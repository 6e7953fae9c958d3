// The last pixels of lines of an odd width.
//
// A vector row of an odd width ends with a pixel that fills no vector, and takes as long for it as for a
// vector or two. Walks leave it out of their rows, and have the last pixels of many lines made by the
// same row, side by side in a line of their own.
#ifndef SIMGP_COLUMN_H
#define SIMGP_COLUMN_H

#include "rows/choose.h"
#include "rows/formats.h"
#include "simgp/lines.h"

namespace simgp {

// As many pixels lie side by side, one vector of the widest.
inline constexpr ptrdiff_t column_pixels = 64;

// Whether a walk over lines of such a size leaves the last pixel of each to a column. Rows whose steps may
// begin at any pixel do one more at no cost, unless nothing else is left for their last step.
inline bool leaves_column(const row_table &rows, bool steps_of_pairs, ptrdiff_t width,
                          ptrdiff_t height) {
    const ptrdiff_t step = rows.short_below ? rows.short_below : 16;
    return height >= 8 && width > step && width % (steps_of_pairs ? 2 : step) == 1;
}

// Whether lines of a destination lie apart, so that the order in which they are written is not seen.
inline bool lie_apart(const lines &dst, ptrdiff_t bytes) {
    return dst.stride >= bytes || dst.stride <= -bytes;
}

// Copies `count` lines of 1 ... 4 bytes.
void copy_column(const const_lines &from, const lines &to, int bytes, ptrdiff_t count);

// Calls f(first, count) for blocks of a column of `height` pixels. The last one ends at the last pixel and
// may do some again.
template <class F>
void in_column_blocks(ptrdiff_t height, ptrdiff_t block, F f) {
    const ptrdiff_t count = height < block ? height : block;
    for (ptrdiff_t end = count;; end += count) {
        if (end > height) end = height;
        f(end - count, count);
        if (end == height) return;
    }
}

// YUV in planes, and pixels to be made of it: rows one by one, or in pairs that share chroma lines, of which
// the first row is alone if `lead` is 1.
struct planes_to_rgb {
    yuv_layout layout;
    bool two_rows;
    const_lines y, u, v;  // those that the layout does not use may be any
    lines dst;
    int pixel_bytes;
    ptrdiff_t width, height;
    int lead;
};
constexpr bool chroma_is_shared(yuv_layout layout) {
    return layout != yuv_layout::grey && layout != yuv_layout::full;
}

// The last pixels of rows or pairs of rows, at most column_pixels / 2 of them: each is the first of two,
// whose second has no meaning, as it takes a pair to have chroma of its own.
struct pixel_column {
    uint8_t y[2][2 * column_pixels], u[column_pixels], v[column_pixels], rgb[2][4 * column_pixels];
};
void gather_column(const planes_to_rgb &p, ptrdiff_t first, ptrdiff_t count, pixel_column &to);
void scatter_column(const pixel_column &c, const planes_to_rgb &p, ptrdiff_t first,
                    ptrdiff_t count);

// Converts the pixels at the first bytes of `height` lines by row(in, out, count).
template <class Row>
void convert_column(const const_lines &in, int in_bytes, const lines &out, int out_bytes,
                    ptrdiff_t height, Row row) {
    uint8_t from[column_pixels * 4], to[column_pixels * 4];
    in_column_blocks(height, column_pixels, [&](ptrdiff_t y, ptrdiff_t count) {
        copy_column(in.from(0, y), {from, in_bytes}, in_bytes, count);
        row(from, to, count);
        copy_column(const_lines{to, out_bytes}, out.from(0, y), out_bytes, count);
    });
}

}  // namespace simgp

#endif
