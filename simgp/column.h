// Columns of pixels that fill no vector, laid side by side.
//
// A vector row takes as long for the last pixel of an odd width as for a vector or two. Walks leave that
// pixel out of their rows, and have those of many lines made by one row, in a line of their own. Narrow
// pictures are such columns as a whole.
#ifndef SIMGP_COLUMN_H
#define SIMGP_COLUMN_H

#include "rows/choose.h"
#include "rows/formats.h"
#include "simgp/lines.h"

namespace simgp {

// Columns x ... x + width - 1 of a picture; of width 0: none.
struct column {
    ptrdiff_t x = 0, width = 0;
    ptrdiff_t end() const { return x + width; }
};

// As many pixels lie side by side at most.
inline constexpr ptrdiff_t column_pixels = 128;

// The column that a walk over a picture leaves out of its rows: the last pixel. Steps that may begin at any
// pixel do one more at no cost, unless nothing else is left for the last of them.
inline column column_of(ptrdiff_t vector, bool steps_of_pairs, ptrdiff_t width, ptrdiff_t height) {
    if (vector <= 1 || height < 4 || width < vector || (width & 1) == 0) return {};
    if (!steps_of_pairs && width % vector != 1) return {};
    return {width - 1, 1};
}

// Calls f(first, count) for blocks of `height` lines, at most `block` each and about the same number. No line
// is done twice: the first time may have written over its samples.
template <class F>
void in_column_blocks(ptrdiff_t height, ptrdiff_t block, F f) {
    for (ptrdiff_t y = 0, left = (height + block - 1) / block; left > 0; left--) {
        const ptrdiff_t count = (height - y) / left;
        f(y, count);
        y += count;
    }
}

// Which rows make pixels of YUV: of one line each, or of two that share a line of chroma; those of
// rows/yuv2rgb.h by matrix, or, if `how` is not null, those of rows/any.h.
struct rgb_from_yuv {
    yuv_layout layout;
    bool two_rows;
    rgb_packing packing;
    yuv_matrix matrix;
    const yuv_to_rgb *how;
    int pixel_bytes() const { return pixels_of[size_t(packing)].size; }
};
// Planes of YUV, and pixels to be made of them. Of pairs of rows, the first row is alone if `lead` is 1.
struct planes_to_rgb {
    rgb_from_yuv what;
    const_lines y, u, v;  // those that the layout does not use may be any
    lines dst;
    ptrdiff_t width, height;
    int lead;
};
constexpr bool chroma_is_shared(yuv_layout layout) {
    return layout != yuv_layout::grey && layout != yuv_layout::full;
}
constexpr bool is_packed(yuv_layout layout) {
    return layout == yuv_layout::uyvy || layout == yuv_layout::yuyv;
}
constexpr bool has_chroma_planes(yuv_layout layout) {
    return layout != yuv_layout::grey && !is_packed(layout);
}

// A column of rows or of pairs of rows, `pitch` pixels from one to the next: an even number, as it takes a
// pair to have chroma of its own. What is between them has no meaning.
struct pixel_column {
    uint8_t y[2][2 * column_pixels], u[column_pixels], v[column_pixels], rgb[2][4 * column_pixels];
};
inline ptrdiff_t pitch_of(const column &c) { return (c.width + 1) & ~ptrdiff_t(1); }
void gather_column(const planes_to_rgb &p, const column &c, ptrdiff_t first, ptrdiff_t count,
                   pixel_column &to);
void scatter_column(const pixel_column &from, const planes_to_rgb &p, const column &c,
                    ptrdiff_t first, ptrdiff_t count);

// Converts a column of pixels by row(in, out, count), where they have so many bytes.
template <class Row>
void convert_column(const const_lines &in, int in_bytes, const lines &out, int out_bytes,
                    const column &c, ptrdiff_t height, Row row) {
    uint8_t from[column_pixels * 4], to[column_pixels * 4];
    const ptrdiff_t in_line = in_bytes * c.width, out_line = out_bytes * c.width;
    in_column_blocks(height, column_pixels / c.width, [&](ptrdiff_t y, ptrdiff_t count) {
        copy_lines(in.from(in_bytes * c.x, y), {from, in_line}, in_line, count);
        row(from, to, c.width * count);
        copy_lines(const_lines{to, out_line}, out.from(out_bytes * c.x, y), out_line, count);
    });
}

}  // namespace simgp

#endif
