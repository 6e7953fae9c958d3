// Plane copy. The row is the memcpy() of the C library, which is as fast as libyuv's copies or
// faster, in cache and out of it.
#include "simgp/copy.h"

#include "simgp/kernel.h"

using namespace simgp;

static void copy(const plane_args &a, int sample_bytes) {
    copy_lines(a.src, a.dst, a.width * sample_bytes, a.height);
}

// Lines of 16-bit samples advance by whole samples, those of the others by bytes.
static void copy_words(const plane_args &a) {
    copy({whole_pixel_lines(a.src, 2), a.width, a.height, whole_pixel_lines(a.dst, 2)}, 2);
}

SIMGP_PLANE_KERNEL(simgp_cpy_8b, copy(args, 1))
SIMGP_PLANE_KERNEL(simgp_cpy_16b, copy_words(args))
SIMGP_PLANE_KERNEL(simgp_cpy_24b, copy(args, 3))
SIMGP_PLANE_KERNEL(simgp_cpy_32b, copy(args, 4))

int32_t simgp_cpy(const simgp_img *src, const simgp_img *dst) {
    if (src->format != dst->format) return SIMGP_ERR_PARAM;
    const format *const planes = planes_kept(src->format);
    if (!planes) return SIMGP_ERR_UNSUPPORTED;
    for (int k = 0; k < planes->planes; k++) {
        simgp_plane_fn *const copy_plane = planes->bytes[k] == 2 ? simgp_cpy_16b : simgp_cpy_8b;
        copy_plane(src->plane[k], src->width[k], src->height[k], src->stride[k], dst->stride[k],
                   dst->plane[k]);
    }
    return SIMGP_OK;
}
