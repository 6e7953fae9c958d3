// Plane copy. The row is the memcpy() of the C library, which is as fast as libyuv's copies or
// faster, in cache and out of it.
#include "simgp/copy.h"

#include "simgp/planes.h"

using namespace simgp;

// Heads a copy kernel. Strides count in units of `unit` bytes, a power of two.
#define COPY_KERNEL(name, sample_bytes, unit)                                     \
    void name(const void *src, int32_t width, int32_t height, int32_t src_stride, \
              int32_t dst_stride, void *dst) {                                    \
        copy_rows(static_cast<const uint8_t *>(src), src_stride & -(unit),        \
                  static_cast<uint8_t *>(dst), dst_stride & -(unit),              \
                  ptrdiff_t(width) * (sample_bytes), height);                     \
    }

COPY_KERNEL(simgp_cpy_8b, 1, 1)
COPY_KERNEL(simgp_cpy_16b, 2, 2)
COPY_KERNEL(simgp_cpy_24b, 3, 1)
COPY_KERNEL(simgp_cpy_32b, 4, 1)

int32_t simgp_cpy(const simgp_img *src, const simgp_img *dst) {
    if (src->format != dst->format) return SIMGP_ERR_PARAM;
    const sample_planes planes = yuv_and_565_planes(src->format);
    if (planes.count == 0) return SIMGP_ERR_UNSUPPORTED;
    for (int k = 0; k < planes.count; k++) {
        simgp_plane_fn *const copy = planes.bytes[k] == 2 ? simgp_cpy_16b : simgp_cpy_8b;
        copy(src->plane[k], src->width[k], src->height[k], src->stride[k], dst->stride[k],
             dst->plane[k]);
    }
    return SIMGP_OK;
}
