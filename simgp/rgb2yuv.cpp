// RGB to YUV and to RGB565: the scalar rows, which define the results, and the kernels.
#include "simgp/rgb2yuv.h"

#include "simd/choose.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

// Unpackers: pixel x of a row. The low bits that a 565 word lacks are 0.
struct rgb {
    int r, g, b;
};
template <rgb_packing Packing>
rgb read(const uint8_t *src, ptrdiff_t x) {
    switch (Packing) {
        case rgb_packing::rgb565: {
            const int word = src[2 * x] | src[2 * x + 1] << 8;
            return {word >> 8 & 0xF8, word >> 3 & 0xFC, word << 3 & 0xF8};
        }
        case rgb_packing::rgb888:
            return {src[3 * x], src[3 * x + 1], src[3 * x + 2]};
        case rgb_packing::bgr888:
            return {src[3 * x + 2], src[3 * x + 1], src[3 * x]};
        case rgb_packing::rgba8888:
            return {src[4 * x], src[4 * x + 1], src[4 * x + 2]};
        default:
            __builtin_unreachable();
    }
}

// BT.601, limited range, with 8 fractional bits; luma is not rounded.
uint8_t luma(const rgb &p) { return uint8_t(((66 * p.r + 129 * p.g + 25 * p.b) >> 8) + 16); }
uint8_t chroma_u(const rgb &p) {
    return uint8_t(((-38 * p.r - 74 * p.g + 112 * p.b + 128) >> 8) + 128);
}
uint8_t chroma_v(const rgb &p) {
    return uint8_t(((112 * p.r - 94 * p.g - 18 * p.b + 128) >> 8) + 128);
}

template <rgb_packing Packing, yuv_layout Layout>
void yuv_row(const uint8_t *src, uint8_t *y, uint8_t *u, uint8_t *v, ptrdiff_t width) {
    for (ptrdiff_t x = 0; x < width; x++) y[x] = luma(read<Packing>(src, x));
    if (Layout == yuv_layout::grey) return;
    for (ptrdiff_t i = 0; i < width / 2; i++) {
        const rgb p = read<Packing>(src, 2 * i);
        if (Layout == yuv_layout::half) {
            u[i] = chroma_u(p);
            v[i] = chroma_v(p);
        } else {
            u[2 * i + (Layout == yuv_layout::vu)] = chroma_u(p);
            u[2 * i + (Layout == yuv_layout::uv)] = chroma_v(p);
        }
    }
}

template <rgb_packing Packing>
void rgb565_row(const uint8_t *src, uint8_t *dst, ptrdiff_t width) {
    for (ptrdiff_t x = 0; x < width; x++) {
        const rgb p = read<Packing>(src, x);
        const int word = p.r >> 3 << 11 | p.g >> 2 << 5 | p.b >> 3;
        dst[2 * x] = uint8_t(word);
        dst[2 * x + 1] = uint8_t(word >> 8);
    }
}

}  // namespace

void fill_rgb2yuv(rows &t) {
#define FILL(packing, layout)                                     \
    t.rgb_to_yuv_slot(rgb_packing::packing, yuv_layout::layout) = \
        yuv_row<rgb_packing::packing, yuv_layout::layout>;
    SIMGP_RGB_TO_YUV_ROWS(FILL)
#undef FILL
#define FILL(packing) \
    t.rgb_to_rgb565[size_t(rgb_packing::packing)] = rgb565_row<rgb_packing::packing>;
    SIMGP_RGB_TO_RGB565_ROWS(FILL)
#undef FILL
}

}  // namespace scalar

namespace {

// Lines of 16-bit and 32-bit pixels advance by whole pixels: strides are rounded down.
plane_lines whole_pixel_lines(plane_lines lines, rgb_packing packing) {
    const bool words = packing == rgb_packing::rgb565, quads = packing == rgb_packing::rgba8888;
    lines.stride &= words ? ~ptrdiff_t(1) : quads ? ~ptrdiff_t(3) : ~ptrdiff_t(0);
    return lines;
}

// Even rows give luma and the chroma of their even pixels, if a row follows; the others luma.
void convert_to_yuv(const csc_args &a, rgb_packing packing, const yuv_planes &planes) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1) return;
    const auto &to_layout = live_rows().rgb_to_yuv[size_t(packing)];
    rgb_to_yuv_row *const with_chroma = to_layout[size_t(planes.layout)];
    rgb_to_yuv_row *const luma_only = to_layout[size_t(yuv_layout::grey)];
    const plane_lines in = whole_pixel_lines(src_lines(a, 0), packing);
    const plane_lines luma = dst_lines(a, 0), u = dst_lines(a, planes.u),
                      v = dst_lines(a, planes.v);
    for (ptrdiff_t y = 0; y < height; y++) {
        const bool chroma = !(y & 1) && y + 1 < height;
        (chroma ? with_chroma : luma_only)(in.line(y), luma.line(y), u.line(y >> 1), v.line(y >> 1),
                                           width);
    }
}

void convert_to_rgb565(const csc_args &a, rgb_packing packing, int pixel_bytes) {
    walk_one_plane(a, whole_pixel_lines(src_lines(a, 0), packing), pixel_bytes,
                   whole_pixel_lines(dst_lines(a, 0), rgb_packing::rgb565), 2,
                   live_rows().rgb_to_rgb565[size_t(packing)]);
}

}  // namespace
}  // namespace simgp

using namespace simgp;

// clang-format off
#define KERNEL(from, to)    SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, convert_to_yuv(args, rgb_packing::from, planes_##to))
#define RGB565_KERNEL(from, pixel_bytes) SIMGP_CSC_KERNEL(simgp_csc_##from##_to_rgb565, convert_to_rgb565(args, rgb_packing::from, pixel_bytes))

KERNEL(rgb888, yuv420)
KERNEL(rgb888, yv12)
KERNEL(rgb888, nv12)
KERNEL(rgb888, nv21)
KERNEL(bgr888, yuv420)
KERNEL(bgr888, yv12)
KERNEL(rgb565, yuv420)
KERNEL(rgb565, yv12)
KERNEL(rgb565, nv12)
KERNEL(rgb565, nv21)
RGB565_KERNEL(rgb888, 3)
RGB565_KERNEL(rgba8888, 4)
#undef KERNEL
#undef RGB565_KERNEL
// clang-format on
