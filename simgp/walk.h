// The walk over planes and rows that all conversion kernels share.
#ifndef SIMGP_WALK_H
#define SIMGP_WALK_H

#include "simgp/img.h"
#include "simgp/rows.h"

namespace simgp {

// The six arguments of a conversion kernel.
struct csc_args {
    uint8_t *const *src_planes;
    const int32_t *src_widths, *src_heights, *src_strides, *dst_strides;
    uint8_t *const *dst_planes;
};

// The lines of a plane; of one that is not there, null.
struct plane_lines {
    uint8_t *first;
    ptrdiff_t stride;

    uint8_t *line(ptrdiff_t y) const { return first ? first + y * stride : nullptr; }
};

inline plane_lines src_lines(const csc_args &a, int plane) {
    if (plane < 0) return {nullptr, 0};
    return {a.src_planes[plane], a.src_strides[plane]};
}
inline plane_lines dst_lines(const csc_args &a, int plane) {
    if (plane < 0) return {nullptr, 0};
    return {a.dst_planes[plane], a.dst_strides[plane]};
}

// Where a YUV format keeps its chroma: the layout of its rows, the planes of U and V (-1: none;
// pairs lie in the plane of U), and log2 of the rows that share a chroma line.
struct yuv_planes {
    yuv_layout layout;
    int8_t u, v;
    bool serves_two_rows;
};
inline constexpr yuv_planes planes_yuv400{yuv_layout::grey, -1, -1, false};
inline constexpr yuv_planes planes_yuv420{yuv_layout::half, 1, 2, true};
inline constexpr yuv_planes planes_yv12{yuv_layout::half, 2, 1, true};
inline constexpr yuv_planes planes_yuv422n{yuv_layout::half, 1, 2, false};
inline constexpr yuv_planes planes_yuv422w{yuv_layout::full, 1, 2, true};
inline constexpr yuv_planes planes_yuv444{yuv_layout::full, 1, 2, false};
inline constexpr yuv_planes planes_nv12{yuv_layout::uv, 1, -1, true};
inline constexpr yuv_planes planes_nv21{yuv_layout::vu, 1, -1, true};

// Four kernels let row 0 of an odd-height picture have the first chroma line to itself, unless the
// width is a multiple of 4: row y then takes line (y + 1) >> 1.
inline int first_line_alone(const csc_args &a) {
    return a.src_widths[0] & 3 ? a.src_heights[0] & 1 : 0;
}

// Calls `row` for every row from top to bottom, or `pair` for pairs of rows where chroma serves
// two. Row y then takes chroma line (y + lead) >> 1. `luma` gives the lines of luma in this order.
template <class Luma>
void walk_yuv_to_rgb(const csc_args &a, Luma &&luma, const yuv_planes &planes,
                     yuv_to_rgb_row *row) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1) return;
    const plane_lines u = src_lines(a, planes.u), v = src_lines(a, planes.v);
    const plane_lines out = dst_lines(a, 0);
    for (ptrdiff_t y = 0; y < height; y++)
        row(luma.line(y), u.line(y), v.line(y), out.line(y), width);
}
template <class Luma>
void walk_yuv_to_rgb(const csc_args &a, Luma &&luma, const yuv_planes &planes,
                     yuv_to_rgb_row_pair *pair, int lead) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1) return;
    const plane_lines u = src_lines(a, planes.u), v = src_lines(a, planes.v);
    const plane_lines out = dst_lines(a, 0);
    for (ptrdiff_t y = 0; y < height;) {
        const ptrdiff_t chroma = (y + lead) >> 1;
        // The row below, or the row again where it has its chroma line to itself.
        const ptrdiff_t below = y + 1 < height && (y + 1 + lead) >> 1 == chroma ? y + 1 : y;
        const uint8_t *const first = luma.line(y), *const second = luma.line(below);
        pair(first, second, u.line(chroma), v.line(chroma), out.line(y), out.line(below), width);
        y = below + 1;
    }
}

// The same with the rows of `live` that the formats need.
template <class Luma>
void walk_yuv_to_rgb(const csc_args &a, Luma &&luma, const yuv_planes &planes, const rows &live,
                     rgb_packing packing, int lead) {
    const size_t from = size_t(planes.layout), to = size_t(packing);
    if (planes.serves_two_rows)
        walk_yuv_to_rgb(a, luma, planes, live.yuv_to_rgb_pair[from][to], lead);
    else
        walk_yuv_to_rgb(a, luma, planes, live.yuv_to_rgb[from][to]);
}

// Calls row(in, out, width) for every row of a picture of one plane on either side, whose pixels
// have so many bytes. Lines of an even width that lie end to end are one long row.
template <class Row>
void walk_one_plane(const csc_args &a, const plane_lines &in, int in_bytes, const plane_lines &out,
                    int out_bytes, Row row) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1 || height < 1) return;
    if (width % 2 == 0 && in.stride == width * in_bytes && out.stride == width * out_bytes)
        return row(in.first, out.first, width * height);
    for (ptrdiff_t y = 0; y < height; y++) row(in.line(y), out.line(y), width);
}

}  // namespace simgp

// Heads the definition of an exported conversion kernel, whose body then finds the arguments in
// `args`.
#define SIMGP_CSC_KERNEL(name, ...)                                                              \
    void name(uint8_t *const *src_planes, const int32_t *src_widths, const int32_t *src_heights, \
              const int32_t *src_strides, const int32_t *dst_strides,                            \
              uint8_t *const *dst_planes) {                                                      \
        const simgp::csc_args args{src_planes,  src_widths,  src_heights,                        \
                                   src_strides, dst_strides, dst_planes};                        \
        __VA_ARGS__;                                                                             \
    }

#endif
