// YUV to RGB: the scalar rows, which define the results, and the kernels.
#include "simgp/yuv2rgb.h"

#include "simgp/pixel.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {

void for_each_row(const lines_to_rgb &l, bool pairs, yuv_row_fn *row) {
    for (ptrdiff_t k = 0; k < l.count; k++)
        for (int second = 0; second <= int(pairs); second++)
            row(l.how, l.y[second] + k * l.y_step, l.u + k * l.u_step, l.v + k * l.v_step,
                l.dst[second] + k * l.dst_step, l.width);
}

namespace {

template <yuv_layout Layout, bool TwoRows, rgb_packing Packing, class Matrix>
void fill_slot(yuv2rgb_rows &t, yuv_matrix matrix) {
    const size_t m = size_t(matrix), l = size_t(Layout), p = size_t(Packing);
    (TwoRows ? t.pair : t.row)[m][l][p] = [](const lines_to_rgb &lines) {
        for_each_row(lines, TwoRows,
                     [](const yuv_to_rgb *, const uint8_t *y, const uint8_t *u, const uint8_t *v,
                        uint8_t *dst, ptrdiff_t width) {
                         to_rgb_row<Layout, Matrix, Packing>(y, u, v, dst, width);
                     });
    };
}

template <const format &From, const format &To, yuv_rule Rule>
void fill_for(yuv2rgb_rows &t) {
    constexpr yuv_layout layout = From.layout;
    constexpr bool two_rows = serves_two_rows(From);
    if constexpr (layout == yuv_layout::grey)
        fill_slot<layout, two_rows, To.packing, grey_matrix>(t, yuv_matrix::fine);
    else if constexpr (Rule == yuv_rule::coarse)
        fill_slot<layout, two_rows, To.packing, bt601_coarse>(t, yuv_matrix::coarse);
    else
        fill_slot<layout, two_rows, To.packing, bt601>(t, yuv_matrix::fine);
}

}  // namespace

void fill_yuv2rgb(yuv2rgb_rows &t) {
#define FILL(name, from, to, rule) fill_for<formats::from, formats::to, yuv_rule::rule>(t);
    SIMGP_YUV_TO_RGB_KERNELS(FILL)
    SIMGP_PACKED_TO_RGB_KERNELS(FILL)
#undef FILL
}

}  // namespace scalar

namespace {

yuv_to_rgb_rows *rows_in(const row_table &t, const rgb_from_yuv &of) {
    if (of.how) {
        const size_t in = size_t(chroma_in_of(of.layout)), kind = size_t(kind_of(of.packing));
        return (of.two_rows ? t.any.to_rgb_pair : t.any.to_rgb)[in][kind];
    }
    const size_t m = size_t(of.matrix), l = size_t(of.layout), p = size_t(of.packing);
    return (of.two_rows ? t.yuv2rgb.pair : t.yuv2rgb.row)[m][l][p];
}

// Lines of a column, or pairs of them: side by side, they are one, of at least a vector.
void convert_column(const planes_to_rgb &p, const column &c, ptrdiff_t first, ptrdiff_t count) {
    pixel_column at;
    gather_column(p, c, first, count, at);
    const ptrdiff_t width = pitch_of(c) * count;
    const line_rows r(p.what, width);
    r.rows({{{at.y[0], at.y[1]}, at.u, at.v, {at.rgb[0], at.rgb[1]}},
            width < r.least ? r.least : width,
            1,
            0,
            0,
            0,
            0,
            p.what.how});
    scatter_column(at, p, c, first, count);
}

}  // namespace

line_rows::line_rows(const rgb_from_yuv &of, ptrdiff_t line_width) : what(of), width(line_width) {
    // Of a pair, each row may fill half a vector.
    const bool halves = of.two_rows && of.layout != yuv_layout::full && live_rows().yuv2rgb.halves;
    const row_table &live = live_rows(halves ? 2 * line_width : line_width);
    rows = rows_in(live, of);
    least = halves ? live.vector / 2 : live.vector;
}

// A column of one line, for each row.
void convert_rest(const line_rows &r, const line_to_rgb &l) {
    const column rest{r.whole(), r.width - r.whole()};
    for (int k = 0; k < (l.y[1] == l.y[0] ? 1 : 2); k++)
        convert_column({r.what, {l.y[k], 0}, {l.u, 0}, {l.v, 0}, {l.dst[k], 0}, r.width, 2, 0},
                       rest, 0, 1);
}

void convert_planes(const planes_to_rgb &p) {
    if (p.width < 1 || p.height < 1) return;
    const line_rows r(p.what, p.width);
    // What rows leave is made of many lines at once.
    column c{r.whole(), p.width - r.whole()};
    if (c.width == 0) c = column_of(r.least, chroma_is_shared(p.what.layout), p.width, p.height);
    if (c.width > 0 && !lie_apart(p.dst, p.width * p.what.pixel_bytes()))
        return walk_rows(r, p.y, p.u, p.v, p.dst, p.height, p.lead);

    const ptrdiff_t at_once = p.what.two_rows ? 2 : 1, units = (p.height - p.lead) / at_once;
    if (units > 0 && p.width > c.width) {
        // The second of two, or the row itself.
        const ptrdiff_t second = at_once - 1;
        const uint8_t *const y = p.y.line(p.lead);
        uint8_t *const dst = p.dst.line(p.lead);
        lines_to_rgb all{
            {{y, y + second * p.y.stride}, nullptr, nullptr, {dst, dst + second * p.dst.stride}},
            p.width - c.width,
            units,
            at_once * p.y.stride,
            0,
            0,
            at_once * p.dst.stride,
            p.what.how};
        if (has_chroma_planes(p.what.layout)) {
            all.u = p.u.line(p.lead), all.u_step = p.u.stride;
            all.v = p.v.line(p.lead), all.v_step = p.v.stride;
        }
        r.rows(all);
    }
    const auto alone = [&](ptrdiff_t row, ptrdiff_t chroma) {
        const uint8_t *const y = p.y.line(row);
        uint8_t *const dst = p.dst.line(row);
        convert_line(r, r.at({{y, y}, p.u.line(chroma), p.v.line(chroma), {dst, dst}}));
    };
    if (p.lead) alone(0, 0);
    if ((p.height - p.lead) % at_once) alone(p.height - 1, p.lead + units);
    if (c.width > 0)
        in_column_blocks(units, column_pixels / pitch_of(c), [&](ptrdiff_t first, ptrdiff_t count) {
            convert_column(p, c, first, count);
        });
}

void convert_planes_to_rgb(const yuv_to_rgb_conversion &c, const csc_args &a) {
    const format &from = c.from, &to = c.to;
    planes_to_rgb p{rows_of(c),
                    src_lines(a, 0),
                    src_lines(a, plane_of_u(from)),
                    src_lines(a, plane_of_v(from)),
                    dst_lines(a, 0),
                    a.src_widths[0],
                    a.src_heights[0],
                    lead_of(c.rule, a.src_widths[0], a.src_heights[0])};
    if (from.planes == 1 && p.width % 2 == 0 && p.height > 0 &&
        p.y.stride == p.width * from.bytes[0] && p.dst.stride == p.width * to.bytes[0]) {
        p.width *= p.height;
        p.height = 1;
    }
    convert_planes(p);
}

}  // namespace simgp

using namespace simgp;

#define DEFINE(name, from, to, rule)              \
    SIMGP_CSC_KERNEL(name, convert_planes_to_rgb( \
                               conversion_of<formats::from, formats::to, yuv_rule::rule>(), args))
SIMGP_YUV_TO_RGB_KERNELS(DEFINE)
#undef DEFINE
