// Packed YUV to RGB: the kernels. The rows belong to yuv2rgb.
#include "simgp/packed2rgb.h"

#include "simd/choose.h"
#include "simgp/walk.h"

using namespace simgp;

namespace {

void convert(const csc_args &a, yuv_layout layout, rgb_packing packing, int pixel_bytes) {
    yuv_to_rgb_row *const row = live_rows().yuv_to_rgb[size_t(layout)][size_t(packing)];
    walk_one_plane(a, src_lines(a, 0), 2, dst_lines(a, 0), pixel_bytes,
                   [=](const uint8_t *src, uint8_t *dst, ptrdiff_t width) {
                       row(src, nullptr, nullptr, dst, width);
                   });
}

}  // namespace

// clang-format off
#define KERNEL(from, to, pixel_bytes) SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, convert(args, yuv_layout::from, rgb_packing::to, pixel_bytes))
// clang-format on

KERNEL(yuyv, rgb565, 2)
KERNEL(yuyv, rgb888, 3)
KERNEL(uyvy, rgb565, 2)
KERNEL(uyvy, bgr565, 2)
KERNEL(uyvy, rgb888, 3)
KERNEL(uyvy, bgr888, 3)
KERNEL(uyvy, rgba8888, 4)
KERNEL(uyvy, bgra8888, 4)
KERNEL(uyvy, argb8888, 4)
#undef KERNEL
