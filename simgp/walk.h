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

// 1 where the first chroma line serves one row alone, else 0 (see yuv_rule).
constexpr int lead_of(yuv_rule rule, ptrdiff_t width, ptrdiff_t height) {
    return rule == yuv_rule::first_line_alone && width & 3 ? int(height & 1) : 0;
}

inline rgb_from_yuv rows_of(const yuv_to_rgb_conversion &c) {
    return {c.from.layout, serves_two_rows(c.from), c.to.packing, matrix_of(c.rule), nullptr};
}

// Rows for lines of `width` pixels.
struct line_rows {
    rgb_from_yuv what;
    yuv_to_rgb_rows *rows;
    ptrdiff_t least, width;  // pixels that the rows take at least, and pixels of a line

    line_rows(const rgb_from_yuv &of, ptrdiff_t line_width);
    // Lines at a time, with the pixels that rows take of them.
    lines_to_rgb at(const line_to_rgb &l) const { return {l, whole(), 1, 0, 0, 0, 0, what.how}; }
    // The pixels of a line that rows take; what is left is less than a vector.
    ptrdiff_t whole() const {
        const bool pairs = least > 1 && chroma_is_shared(what.layout);
        const ptrdiff_t even = pairs ? width & ~ptrdiff_t(1) : width;
        return even < least ? 0 : even;
    }
};

// Converts a line, or a pair of them, of any width; l is r.at(...).
void convert_rest(const line_rows &r, const line_to_rgb &l);
inline void convert_line(const line_rows &r, const lines_to_rgb &l) {
    if (l.width > 0) r.rows(l);
    if (l.width < r.width) convert_rest(r, l);
}

// Converts rows from top to bottom, one by one or in pairs. Row y of pairs takes chroma line
// (y + lead) >> 1.
template <class Luma, class U, class V>
void walk_rows(const line_rows &rows, Luma &&luma, U &&u, V &&v, const lines &dst, ptrdiff_t height,
               int lead) {
    const bool two = rows.what.two_rows;
    // The pointers are stored one by one, as the row reads them: it would wait for copies of them.
    lines_to_rgb l = rows.at({});
    for (ptrdiff_t y = 0; y < height;) {
        const ptrdiff_t chroma = two ? (y + lead) >> 1 : y;
        // The row below, or the row again where it has its chroma line to itself.
        const bool pair = two && y + 1 < height && (y + 1 + lead) >> 1 == chroma;
        const ptrdiff_t below = y + int(pair);
        l.y[0] = luma.fetch(y);
        l.y[1] = luma.fetch(below);
        l.u = u.fetch(chroma);
        l.v = v.fetch(chroma);
        l.dst[0] = dst.line(y);
        l.dst[1] = dst.line(below);
        convert_line(rows, l);
        y = below + 1;
    }
}

// Converts the picture of a kernel, its luma from wherever it comes.
template <class Luma>
void convert_to_rgb(const yuv_to_rgb_conversion &c, const csc_args &a, Luma &&luma) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1) return;
    walk_rows(line_rows(rows_of(c), width), luma, src_lines(a, plane_of_u(c.from)),
              src_lines(a, plane_of_v(c.from)), dst_lines(a, 0), height,
              lead_of(c.rule, width, height));
}

// Converts a picture of planes.
void convert_planes(const planes_to_rgb &p);

// The same for the picture of a kernel. Of one plane, lines of an even width that lie end to end are one
// long row.
void convert_planes_to_rgb(const yuv_to_rgb_conversion &c, const csc_args &a);

// Converts a picture of one plane on either side, whose pixels have so many bytes. rows(table, lines) does
// lines of at least a vector of pixels. Lines that lie end to end are one long row; what rows leave of others
// is made of many lines at once.
template <class Rows>
void walk_one_plane(const const_lines &in, int in_bytes, const lines &out, int out_bytes,
                    ptrdiff_t width, ptrdiff_t height, const Rows &rows) {
    if (width < 1 || height < 1) return;
    if (in.stride == width * in_bytes && out.stride == width * out_bytes)
        width *= height, height = 1;
    const row_table &live = live_rows(width);
    const column c =
        width < live.vector ? column{0, width} : column_of(live.vector, false, width, height);
    const ptrdiff_t at_once = lie_apart(out, width * out_bytes) ? height : 1;
    for (ptrdiff_t y = 0; y < height; y += at_once) {
        if (c.width < width)
            rows(live, {in.line(y), in.stride, out.line(y), out.stride, width - c.width, at_once});
        if (c.width > 0)
            convert_column(
                in.from(0, y), in_bytes, out.from(0, y), out_bytes, c, at_once,
                [&](const uint8_t *src, uint8_t *dst, ptrdiff_t pixels) {
                    const row_table &wide = live_rows(pixels);
                    rows(wide, {src, 0, dst, 0, pixels < wide.vector ? wide.vector : pixels, 1});
                });
    }
}

}  // namespace simgp

#endif
