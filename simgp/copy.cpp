// Plane copy. The row is the memcpy() of the C library, which is as fast as libyuv's copies or
// faster, in cache and out of it.
#include "simgp/copy.h"

#include "simgp/kernel.h"

using namespace simgp;

static void copy(const plane_args &a, int sample_bytes) {
    copy_lines(a.src, a.dst, a.width * sample_bytes, a.height);
}

SIMGP_PLANE_KERNEL(simgp_cpy_8b, copy(args, 1))
SIMGP_PLANE_KERNEL(simgp_cpy_16b, copy(whole_words(args), 2))
SIMGP_PLANE_KERNEL(simgp_cpy_24b, copy(args, 3))
SIMGP_PLANE_KERNEL(simgp_cpy_32b, copy(args, 4))

int32_t simgp_cpy(const simgp_img *src, const simgp_img *dst) {
    if (src->format != dst->format) return SIMGP_ERR_PARAM;
    const format *const planes = planes_kept(src->format);
    if (!planes) return SIMGP_ERR_UNSUPPORTED;
    run_planes(*planes, *src, *dst, simgp_cpy_8b, simgp_cpy_16b);
    return SIMGP_OK;
}
