// Packed YUV to RGB: the kernels. The rows belong to yuv2rgb.
#include "simgp/packed2rgb.h"

#include "simd/choose.h"
#include "simgp/walk.h"

using namespace simgp;

// clang-format off
#define KERNEL(from, to) SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, walk_yuv_to_rgb(args, src_lines(args, 0), planes_##from, live_rows(), rgb_packing::to, 0))
// clang-format on

KERNEL(yuyv, rgb565)
KERNEL(yuyv, rgb888)
KERNEL(uyvy, rgb565)
KERNEL(uyvy, bgr565)
KERNEL(uyvy, rgb888)
KERNEL(uyvy, bgr888)
KERNEL(uyvy, rgba8888)
KERNEL(uyvy, bgra8888)
KERNEL(uyvy, argb8888)
