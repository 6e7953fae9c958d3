// YUV to RGB: the scalar rows, which define the results, and the kernels.
#include "simgp/yuv2rgb.h"

#include "simgp/pixel.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

template <yuv_layout Layout, bool TwoRows, rgb_packing Packing, class Matrix>
void fill_slot(yuv2rgb_rows &t, yuv_matrix matrix) {
    const size_t m = size_t(matrix), l = size_t(Layout), p = size_t(Packing);
    if constexpr (TwoRows)
        t.pair[m][l][p] = to_rgb_row_pair<Layout, Matrix, Packing>;
    else
        t.row[m][l][p] = to_rgb_row<Layout, Matrix, Packing>;
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

void convert_planes_to_rgb(const yuv_to_rgb_conversion &c, const csc_args &a) {
    const format &from = c.from, &to = c.to;
    planes_to_rgb p{from.layout,
                    serves_two_rows(from),
                    src_lines(a, 0),
                    src_lines(a, plane_of_u(from)),
                    src_lines(a, plane_of_v(from)),
                    dst_lines(a, 0),
                    to.bytes[0],
                    a.src_widths[0],
                    a.src_heights[0],
                    lead_of(c.rule, a.src_widths[0], a.src_heights[0])};
    if (from.planes == 1 && p.width % 2 == 0 && p.height > 0 &&
        p.y.stride == p.width * from.bytes[0] && p.dst.stride == p.width * p.pixel_bytes) {
        p.width *= p.height;
        p.height = 1;
    }
    // The shortest vectors have 16 bytes.
    convert_planes(p, 16, [&](const row_table &live) { return rows_of(c, live); });
}

}  // namespace simgp

using namespace simgp;

#define DEFINE(name, from, to, rule)              \
    SIMGP_CSC_KERNEL(name, convert_planes_to_rgb( \
                               conversion_of<formats::from, formats::to, yuv_rule::rule>(), args))
SIMGP_YUV_TO_RGB_KERNELS(DEFINE)
#undef DEFINE
