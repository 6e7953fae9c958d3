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

// A conversion, as an argument: one walk serves them all.
struct yuv_to_rgb_conversion {
    const format &from, &to;
    yuv_rule rule;
};
template <const format &From, const format &To, yuv_rule Rule>
constexpr yuv_to_rgb_conversion conversion_of() {
    static_assert(is_needed(From.layout, serves_two_rows(From), To.packing, matrix_of(Rule)),
                  "rows/conversions.h has no kernel with such a row");
    return {From, To, Rule};
}

// Its rows: one of the two, as its chroma lines serve one row or two.
struct yuv_to_rgb_rows {
    yuv_to_rgb_row *one;
    yuv_to_rgb_row_pair *two;
};
inline yuv_to_rgb_rows rows_of(const yuv_to_rgb_conversion &c, const row_table &live) {
    const size_t m = size_t(matrix_of(c.rule)), l = size_t(c.from.layout), p = size_t(c.to.packing);
    return {live.yuv2rgb.row[m][l][p], live.yuv2rgb.pair[m][l][p]};
}

// 1 where the first chroma line serves one row alone, else 0 (see yuv_rule).
constexpr int lead_of(yuv_rule rule, ptrdiff_t width, ptrdiff_t height) {
    return rule == yuv_rule::first_line_alone && width & 3 ? int(height & 1) : 0;
}

// Converts rows from top to bottom, by a row for each of them or by one for pairs, where chroma lines serve
// two. Row y then takes chroma line (y + lead) >> 1.
template <class Luma, class U, class V>
void walk_rows(yuv_to_rgb_row *row, Luma &&luma, U &&u, V &&v, const lines &dst, ptrdiff_t width,
               ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        row(luma.fetch(y), u.fetch(y), v.fetch(y), dst.line(y), width);
}
template <class Luma, class U, class V>
void walk_rows(yuv_to_rgb_row_pair *rows, Luma &&luma, U &&u, V &&v, const lines &dst,
               ptrdiff_t width, ptrdiff_t height, int lead) {
    for (ptrdiff_t y = 0; y < height;) {
        const ptrdiff_t chroma = (y + lead) >> 1;
        // The row below, or the row again where it has its chroma line to itself.
        const ptrdiff_t below = y + 1 < height && (y + 1 + lead) >> 1 == chroma ? y + 1 : y;
        const uint8_t *const first = luma.fetch(y), *const second = luma.fetch(below);
        rows(first, second, u.fetch(chroma), v.fetch(chroma), dst.line(y), dst.line(below), width);
        y = below + 1;
    }
}

// Converts the picture of a kernel, its luma from wherever it comes.
template <class Luma>
void convert_to_rgb(const yuv_to_rgb_conversion &c, const csc_args &a, Luma &&luma) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1) return;
    const const_lines u = src_lines(a, plane_of_u(c.from)), v = src_lines(a, plane_of_v(c.from));
    const lines dst = dst_lines(a, 0);
    const yuv_to_rgb_rows rows = rows_of(c, live_rows(width));
    if (serves_two_rows(c.from))
        walk_rows(rows.two, luma, u, v, dst, width, height, lead_of(c.rule, width, height));
    else
        walk_rows(rows.one, luma, u, v, dst, width, height);
}

// Converts the first `width` pixels of rows, but all of those that have a chroma line to themselves.
template <class Rows>
[[gnu::always_inline]] inline void walk_planes(const planes_to_rgb &p, const Rows &rows,
                                               ptrdiff_t width) {
    const const_lines y = p.y, u = p.u, v = p.v;
    const lines dst = p.dst;
    const ptrdiff_t units = p.two_rows ? (p.height - p.lead) / 2 : p.height;
    // Offsets are added up: in small pictures, products for every line would be seen.
    ptrdiff_t at_y = p.lead * y.stride, at_u = p.lead * u.stride, at_v = p.lead * v.stride,
              at_dst = p.lead * dst.stride;
    if (width > 0 && p.two_rows) {
        for (ptrdiff_t k = units; k > 0; k--) {
            const uint8_t *const luma = y.first + at_y;
            uint8_t *const out = dst.first + at_dst;
            rows.two(luma, luma + y.stride, u.first + at_u, v.first + at_v, out, out + dst.stride,
                     width);
            at_y += 2 * y.stride;
            at_u += u.stride;
            at_v += v.stride;
            at_dst += 2 * dst.stride;
        }
    } else if (width > 0 && !has_chroma_planes(p.layout)) {
        for (ptrdiff_t k = units; k > 0; k--) {
            rows.one(y.first + at_y, nullptr, nullptr, dst.first + at_dst, width);
            at_y += y.stride;
            at_dst += dst.stride;
        }
    } else if (width > 0) {
        for (ptrdiff_t k = units; k > 0; k--) {
            rows.one(y.first + at_y, u.first + at_u, v.first + at_v, dst.first + at_dst, width);
            at_y += y.stride;
            at_u += u.stride;
            at_v += v.stride;
            at_dst += dst.stride;
        }
    }
    if (!p.two_rows || p.height < 1) return;
    const auto alone = [&](ptrdiff_t row, ptrdiff_t chroma) {
        rows.two(y.line(row), y.line(row), u.line(chroma), v.line(chroma), dst.line(row),
                 dst.line(row), p.width);
    };
    if (p.lead) alone(0, 0);
    if ((p.height - p.lead) % 2) alone(p.height - 1, p.lead + units);
}

// Converts a column of a picture of planes, but for rows that have a chroma line to themselves.
// rows_of(table) gives rows.one(y, u, v, dst, width) for one row and
// rows.two(y0, y1, u, v, dst0, dst1, width) for two.
template <class RowsOf>
void convert_column(const planes_to_rgb &p, const column &c, const RowsOf &rows_of) {
    const ptrdiff_t block = column_pixels / pitch_of(c);
    const ptrdiff_t units = p.two_rows ? (p.height - p.lead) / 2 : p.height;
    pixel_column at;
    in_column_blocks(units, block, [&](ptrdiff_t first, ptrdiff_t count) {
        const auto rows = rows_of(live_rows(pitch_of(c) * count));
        gather_column(p, c, first, count, at);
        if (p.two_rows)
            rows.two(at.y[0], at.y[1], at.u, at.v, at.rgb[0], at.rgb[1], pitch_of(c) * count);
        else
            rows.one(at.y[0], at.u, at.v, at.rgb[0], pitch_of(c) * count);
        scatter_column(at, p, c, first, count);
    });
}
// Converts a picture of planes. One that is narrower than `narrow` is a column.
template <class RowsOf>
void convert_planes(const planes_to_rgb &p, ptrdiff_t narrow, const RowsOf &rows_of) {
    if (p.width < 1) return;
    const row_table &live = live_rows(p.width);
    const auto rows = rows_of(live);
    column c = column_of(live, chroma_is_shared(p.layout), narrow, p.width, p.height);
    if (!lie_apart(p.dst, p.width * p.pixel_bytes)) c = {};
    walk_planes(p, rows, p.width - c.width);
    if (c.width > 0) convert_column(p, c, rows_of);
}

// The same for the picture of a kernel. Of one plane, lines of an even width that lie end to end are one
// long row.
void convert_planes_to_rgb(const yuv_to_rgb_conversion &c, const csc_args &a);

// Converts a picture of one plane on either side, whose pixels have so many bytes, by row(in, out,
// width). Lines that lie end to end are one long row.
template <class Row>
void walk_one_plane(const row_table &live, const const_lines &in, int in_bytes, const lines &out,
                    int out_bytes, ptrdiff_t width, ptrdiff_t height, Row row) {
    if (width < 1 || height < 1) return;
    if (in.stride == width * in_bytes && out.stride == width * out_bytes)
        return row(in.first, out.first, width * height);
    column c = column_of(live, false, 0, width, height);
    if (!lie_apart(out, width * out_bytes)) c = {};
    for (ptrdiff_t y = 0; y < height; y++) row(in.line(y), out.line(y), width - c.width);
    if (c.width > 0) convert_column(in, in_bytes, out, out_bytes, c, height, row);
}

}  // namespace simgp

#endif
