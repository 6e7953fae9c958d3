// Packed YUV to RGB: the kernels. The rows belong to yuv2rgb.
#include "simgp/packed2rgb.h"

#include "simgp/walk.h"

using namespace simgp;

#define DEFINE(name, from, to, rule)              \
    SIMGP_CSC_KERNEL(name, convert_planes_to_rgb( \
                               conversion_of<formats::from, formats::to, yuv_rule::rule>(), args))
SIMGP_PACKED_TO_RGB_KERNELS(DEFINE)
#undef DEFINE
