// The walks over planes and rows that conversion kernels share.
//
// A *source of lines* has fetch(y), which gives line y. It is asked in rising order, and what it gave
// last stays valid when it is asked again. The lines of a plane are such a source, and so is whatever
// makes its lines when they are wanted, as dithering does.
#ifndef SIMGP_WALK_H
#define SIMGP_WALK_H

#include "rows/choose.h"
#include "simgp/column.h"
#include "simgp/kernel.h"

namespace simgp {

// Rows do not look at the planes that their layout does not use.
constexpr int plane_of_u(const format &f) { return f.u < 0 ? 0 : f.u; }
constexpr int plane_of_v(const format &f) { return f.v < 0 ? 0 : f.v; }

// Whether some kernel needs a row, so that the tables have it.
constexpr bool is_needed(yuv_layout layout, bool two_rows, rgb_packing packing, yuv_matrix matrix) {
    bool found = false;
#define LOOK(name, from, to, rule)                                                           \
    found |= formats::from.layout == layout && serves_two_rows(formats::from) == two_rows && \
             formats::to.packing == packing && matrix_of(yuv_rule::rule) == matrix;
    SIMGP_YUV_TO_RGB_KERNELS(LOOK)
    SIMGP_PACKED_TO_RGB_KERNELS(LOOK)
#undef LOOK
    return found;
}

template <const format &From, const format &To, yuv_rule Rule>
constexpr bool has_yuv_to_rgb_row = is_needed(From.layout, serves_two_rows(From), To.packing,
                                              matrix_of(Rule));

// The row, or the row for a pair of rows, from YUV to RGB.
template <const format &From, const format &To, yuv_rule Rule>
auto *yuv_to_rgb_row_of(const row_table &live) {
    static_assert(has_yuv_to_rgb_row<From, To, Rule>,
                  "rows/conversions.h has no kernel with such a row");
    const size_t m = size_t(matrix_of(Rule)), l = size_t(From.layout), p = size_t(To.packing);
    if constexpr (serves_two_rows(From))
        return live.yuv2rgb.pair[m][l][p];
    else
        return live.yuv2rgb.row[m][l][p];
}

// 1 where the first chroma line serves one row alone, else 0 (see yuv_rule).
constexpr int lead_of(yuv_rule rule, ptrdiff_t width, ptrdiff_t height) {
    return rule == yuv_rule::first_line_alone && width & 3 ? int(height & 1) : 0;
}

// Converts rows of `width` pixels from top to bottom, each with chroma lines of its own.
template <class Row, class Luma, class U, class V>
void walk_rows(Row row, Luma &&luma, U &&u, V &&v, const lines &dst, ptrdiff_t width,
               ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        row(luma.fetch(y), u.fetch(y), v.fetch(y), dst.line(y), width);
}

// The same in pairs, whose rows share chroma lines: row y takes line (y + lead) >> 1. Pairs leave out
// the last `left_out` pixels; a row that has its chroma line to itself does not.
template <class RowPair, class Luma, class U, class V>
void walk_row_pairs(RowPair row, Luma &&luma, U &&u, V &&v, const lines &dst, ptrdiff_t width,
                    ptrdiff_t height, int lead, ptrdiff_t left_out = 0) {
    for (ptrdiff_t y = 0; y < height;) {
        const ptrdiff_t chroma = (y + lead) >> 1;
        // The row below, or the row again where it has its chroma line to itself.
        const ptrdiff_t below = y + 1 < height && (y + 1 + lead) >> 1 == chroma ? y + 1 : y;
        const uint8_t *const first = luma.fetch(y), *const second = luma.fetch(below);
        row(first, second, u.fetch(chroma), v.fetch(chroma), dst.line(y), dst.line(below),
            below == y ? width : width - left_out);
        y = below + 1;
    }
}

// Columns x ... x + width - 1 of a picture of `height` rows, as a walk sees them: the sources' lines
// begin at column x, those of the destination at column 0.
struct walk_span {
    ptrdiff_t x, width, height;
};

// Converts a span, its lines from whatever sources there are.
template <const format &From, const format &To, yuv_rule Rule, class Luma, class U, class V>
void walk_yuv_to_rgb(Luma &&luma, U &&u, V &&v, const lines &dst, const walk_span &span, int lead) {
    auto *const row = yuv_to_rgb_row_of<From, To, Rule>(live_rows(span.width));
    if (span.width < 1) return;
    const lines from_x{dst.first + span.x * To.bytes[0], dst.stride};
    if constexpr (serves_two_rows(From))
        walk_row_pairs(row, luma, u, v, from_x, span.width, span.height, lead);
    else
        walk_rows(row, luma, u, v, from_x, span.width, span.height);
}

// The same for the whole picture of a kernel, its luma from wherever it comes.
template <const format &From, const format &To, yuv_rule Rule, class Luma>
void convert_to_rgb(const csc_args &a, Luma &&luma) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    walk_yuv_to_rgb<From, To, Rule>(luma, src_lines(a, plane_of_u(From)),
                                    src_lines(a, plane_of_v(From)), dst_lines(a, 0),
                                    {0, width, height}, lead_of(Rule, width, height));
}

// Converts a picture of planes: rows.one(y, u, v, dst, width) one row, rows.two(y0, y1, u, v, dst0,
// dst1, width) two.
template <class Rows>
void convert_planes(const row_table &live, const Rows &rows, const planes_to_rgb &p) {
    if (p.width < 1) return;
    const ptrdiff_t left_out = leaves_column(live, chroma_is_shared(p.layout), p.width, p.height) &&
                               lie_apart(p.dst, p.width * p.pixel_bytes);
    const auto one = [&](auto... a) __attribute__((always_inline)) { rows.one(a...); };
    const auto two = [&](auto... a) __attribute__((always_inline)) { rows.two(a...); };
    if (p.two_rows)
        walk_row_pairs(two, p.y, p.u, p.v, p.dst, p.width, p.height, p.lead, left_out);
    else
        walk_rows(one, p.y, p.u, p.v, p.dst, p.width - left_out, p.height);
    if (!left_out) return;
    pixel_column c{};
    in_column_blocks(p.two_rows ? (p.height - p.lead) / 2 : p.height, column_pixels / 2,
                     [&](ptrdiff_t first, ptrdiff_t count) {
                         gather_column(p, first, count, c);
                         if (p.two_rows)
                             two(c.y[0], c.y[1], c.u, c.v, c.rgb[0], c.rgb[1], 2 * count);
                         else
                             one(c.y[0], c.u, c.v, c.rgb[0], 2 * count);
                         scatter_column(c, p, first, count);
                     });
}

// The same by the rows of fixed weights: the kernels between two formats. Of one plane, lines of an even
// width that lie end to end are one long row.
void convert_planes_to_rgb(const csc_args &a, const format &from, const format &to, yuv_rule rule);
template <const format &From, const format &To, yuv_rule Rule>
void planes_kernel(const csc_args &a) {
    static_assert(has_yuv_to_rgb_row<From, To, Rule>);
    convert_planes_to_rgb(a, From, To, Rule);
}

// Converts a picture of one plane on either side, whose pixels have so many bytes, by row(in, out,
// width). Lines that lie end to end are one long row.
template <class Row>
void walk_one_plane(const row_table &live, const const_lines &in, int in_bytes, const lines &out,
                    int out_bytes, ptrdiff_t width, ptrdiff_t height, Row row) {
    if (width < 1 || height < 1) return;
    if (in.stride == width * in_bytes && out.stride == width * out_bytes)
        return row(in.first, out.first, width * height);
    const bool column =
        leaves_column(live, false, width, height) && lie_apart(out, width * out_bytes);
    const ptrdiff_t whole = width - column;
    for (ptrdiff_t y = 0; y < height; y++) row(in.line(y), out.line(y), whole);
    if (column)
        convert_column(in.from(in_bytes * whole, 0), in_bytes, out.from(out_bytes * whole, 0),
                       out_bytes, height, row);
}

}  // namespace simgp

#endif
