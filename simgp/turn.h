// Turns and mirrors of planes. A quarter turn is a transposition with one of its sides upside down:
// the destination to the left, the source to the right.
//
// Kernels that make rows of their own turn them by the same parts: they fill a block of rows, of up
// to block_side columns and rows, and hand it to the row live_rows().rotate.transpose, or fill more
// of them and call transpose().
#ifndef SIMGP_TURN_H
#define SIMGP_TURN_H

#include "rows/choose.h"
#include "simgp/blocks.h"
#include "simgp/lines.h"

namespace simgp {

// From this size on, blocks of the source are asked for ahead: smaller planes lie in the second-level
// cache, where that costs more than it brings.
inline constexpr int64_t fetch_from = 1 << 19;

// Sample x of row y of src becomes sample y of row x of dst, for all columns x and rows y of the
// source. With even bytes the strides of src are those of the rows that are taken.
//
// Goes through the blocks of the destination row by row, from left to right: what is written of a
// page stays together, and reading is the side that can be asked for ahead. Where the plane allows
// it, a last block begins early, to have at least a quarter of a side, and of bytes a quarter, half
// or all of it: moving some samples again is quicker than an odd size.
template <sample_kind S>
void transpose(const const_lines &src, ptrdiff_t columns, ptrdiff_t rows, const lines &dst) {
    constexpr ptrdiff_t size = sample_size<S>, gap = sample_gap<S>, side = block_side<S>;
    const auto fill_up = [](ptrdiff_t &start, ptrdiff_t &count, ptrdiff_t end) {
        if (end < side) return;
        ptrdiff_t full = side / 4;
        if (S == sample_kind::words && full < count) full = count;
        while (full < count) full *= 2;
        start = end < start + full ? end - full : start;
        count = full;
    };
    transpose_block *const row = live_rows().rotate.transpose[size_t(S)];
    const bool fetch = int64_t(columns) * rows * gap >= fetch_from;
    for_each_block<side, side>(rows, columns, [&](const block &at) {
        ptrdiff_t x = at.y, y = at.x, width = at.height, height = at.width;
        fill_up(x, width, columns);
        fill_up(y, height, rows);
        row(src.line(y) + x * gap, src.stride, dst.line(x) + y * size, dst.stride, width, height,
            fetch && y + side < rows ? side * src.stride : 0);
    });
}

template <sample_kind S>
void turn_left(const const_lines &src, ptrdiff_t width, ptrdiff_t height, const lines &dst) {
    if (width < 1 || height < 1) return;
    transpose<S>(src, width, height, dst.upside_down(width));
}

template <sample_kind S>
void turn_right(const const_lines &src, ptrdiff_t width, ptrdiff_t height, const lines &dst) {
    if (width < 1 || height < 1) return;
    transpose<S>(src.upside_down(height), width, height, dst);
}

// Left to right. Lines without gaps are one where they lie the other way round in the destination,
// as in half turns.
template <sample_kind S>
void mirror(const const_lines &src, ptrdiff_t width, ptrdiff_t height, const lines &dst) {
    if (width < 1 || height < 1) return;
    reverse_row *const row = live_rows().rotate.reverse[size_t(S)];
    const ptrdiff_t line = width * sample_size<S>;
    if (src.stride == line && dst.stride == -line)
        return row(src.first, dst.line(height - 1), width * height);
    for (ptrdiff_t y = 0; y < height; y++) row(src.line(y), dst.line(y), width);
}

}  // namespace simgp

#endif
