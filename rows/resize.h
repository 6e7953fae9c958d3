// The inner loops of the bilinear resampler.
//
// A *strip* is a run of columns of the destination. Its plan, made once, says where the samples of
// its columns lie in a row of the source; the loops then follow it row after row. With positions and
// phases as simgp/resize.h defines them, P, Q the two neighbours across of the upper row and R, S
// those of the lower one, a channel is
//
//     A = (8 - fx) P + fx Q,  B = (8 - fx) R + fx S      across, 0 ... 8 * 255
//     ((8 - fy) A + fy B) >> 6                           down
//
// which is the sum of the four products, as nothing is lost between. A neighbour of weight 0 is not
// read.
#ifndef ROWS_RESIZE_H
#define ROWS_RESIZE_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// What a pixel is: 1 to 4 bytes, each a channel, or a 565 word.
enum class resize_kind : uint8_t { bytes1, bytes2, bytes3, bytes4, word565, count };
inline constexpr int resized_pixel_bytes[size_t(resize_kind::count)] = {1, 2, 3, 4, 2};

// Memory of plans and of kept rows begins at multiples of this.
inline constexpr int resize_alignment = 64;

// Filled in from the top, by whom the comments name.
struct resize_strip {
    // Whoever wants a strip.
    uint32_t step;      // from a column to the next: 18 fractional bits, in units of 2^shift pixels
    int32_t shift;      // 0 ... 4
    bool keeps;         // for `across` and `down`; else for `both`. `measure` may choose the first
    int32_t x;          // the first column of the destination
    int32_t columns;    // at least 1
    int32_t first;      // the column of the source at which the rows begin that are handed over
    int32_t row_bytes;  // and so many bytes of them, at least 1, may be read
    uint8_t *plan;      // plan_bytes for each step

    // `measure`. The destination is made in steps.
    int32_t step_bytes;  // bytes of the destination; the last step may have less
    int32_t plan_bytes;  // of the plan; may be 0
    int32_t kept_bytes;  // of a kept row

    // The rows' own, by `measure` and `plan`.
    int32_t windows;
    bool shared, small;
    int32_t lanes, steps, last;
    int32_t direct_from, direct_to;
};

// Looks at step, shift and keeps only; may set keeps.
using resize_measure_row = void(resize_strip &s);

// Makes the plan.
using resize_plan_row = void(resize_strip &s);

// A line of the destination between two rows. Where the phase, 0 ... 7, is 0, the one below counts for
// nothing and is any row that may be read: the one above, or the next line's.
struct resize_line {
    const uint8_t *above, *below;
    int32_t phase;
};

// Blends a row of the source across and keeps the result for `down`. Then writes `count` lines, 0 to
// 2, as `down` does, for which it is the lower row. A row that will be wanted soon lies `ahead` bytes
// further: a hint, which may lead out of the plane.
using resize_across_row = void(const resize_strip &s, const uint8_t *row, uint8_t *kept,
                               ptrdiff_t ahead, const resize_line *lines, int32_t count,
                               uint8_t *dst, ptrdiff_t stride);

// Writes `count` lines, 1 or 2, of the strip at dst and dst + stride, from kept rows. Both lines lie
// between the same rows.
using resize_down_row = void(const resize_strip &s, const resize_line *lines, int32_t count,
                             uint8_t *dst, ptrdiff_t stride);

// The same from rows of the source, any two for each line; it is less work where what lies below the
// first of two lines lies above the second. `ahead` is a hint as above.
using resize_both_row = void(const resize_strip &s, const resize_line *lines, int32_t count,
                             uint8_t *dst, ptrdiff_t stride, ptrdiff_t ahead);

// The loops for one kind of pixel. They belong together: plans and kept rows are their own affair.
struct resize_loops {
    resize_measure_row *measure;
    resize_plan_row *plan;
    resize_across_row *across;
    resize_down_row *down;
    resize_both_row *both;
};

struct resize_rows {
    resize_loops of[size_t(resize_kind::count)];
};

}  // namespace simgp

#endif
