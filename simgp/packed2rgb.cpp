// Packed YUV to RGB: the kernels. The rows belong to yuv2rgb.
#include "simgp/packed2rgb.h"

#include "simd/choose.h"
#include "simgp/walk.h"

using namespace simgp;

namespace {

void convert(const csc_args &a, const yuv_planes &planes, rgb_packing packing) {
    walk_yuv_to_rgb(a, planes, live_rows().yuv_to_rgb[size_t(planes.layout)][size_t(packing)]);
}

}  // namespace

#define KERNEL(from, to) \
    SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, convert(args, planes_##from, rgb_packing::to))

KERNEL(yuyv, rgb565)
KERNEL(yuyv, rgb888)
KERNEL(uyvy, rgb565)
KERNEL(uyvy, bgr565)
KERNEL(uyvy, rgb888)
KERNEL(uyvy, bgr888)
KERNEL(uyvy, rgba8888)
KERNEL(uyvy, bgra8888)
KERNEL(uyvy, argb8888)
