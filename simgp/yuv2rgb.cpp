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
}  // namespace simgp

using namespace simgp;

#define DEFINE(name, from, to, rule)                                                            \
    SIMGP_CSC_KERNEL(                                                                           \
        name, convert_to_rgb(conversion_of<formats::from, formats::to, yuv_rule::rule>(), args, \
                             src_lines(args, 0)))
SIMGP_YUV_TO_RGB_KERNELS(DEFINE)
#undef DEFINE
