// Plane copy. Lines without gaps are one, and that and long lines are left to the memcpy() of the C library,
// which is as fast as libyuv's copies or faster, in cache and out of it. Calls of it for short lines are not.
#include "simgp/copy.h"

#include "rows/choose.h"
#include "simgp/kernel.h"

namespace simgp {

void copy_lines(const const_lines &src, const lines &dst, ptrdiff_t width, ptrdiff_t height) {
    constexpr ptrdiff_t long_line = 2048;
    if (width < 1 || height < 1) return;
    if (height == 1 || (src.stride == width && dst.stride == width)) {
        memcpy(dst.first, src.first, size_t(width * height));
        return;
    }
    if (width < long_line)
        return live_rows(width).layout.copy(src.first, src.stride, dst.first, dst.stride, width,
                                            height);
    for (ptrdiff_t y = 0; y < height; y++) memcpy(dst.line(y), src.line(y), size_t(width));
}

}  // namespace simgp

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
