// YUV to RGB: every kernel on every target against the scalar rows.
#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

struct kernel {
    const char *name;
    simgp_csc_fn *run;
    int from, to;
};

#define KERNEL(name, from, to) \
    { #name, simgp_csc_##name, SIMGP_FMT_##from, SIMGP_FMT_##to }
const kernel kernels[] = {
    KERNEL(yuv400_to_rgb565, YUV400, RGB565),     KERNEL(yuv420_to_rgb565, YUV420, RGB565),
    KERNEL(yuv420_to_bgr565, YUV420, BGR565),     KERNEL(yuv420_to_rgb888, YUV420, RGB888),
    KERNEL(yuv420_to_bgr888, YUV420, BGR888),     KERNEL(yuv420_to_rgba8888, YUV420, RGBA8888),
    KERNEL(yuv420_to_bgra8888, YUV420, BGRA8888), KERNEL(yuv420_to_argb8888, YUV420, ARGB8888),
    KERNEL(yv12_to_rgb565, YV12, RGB565),         KERNEL(yv12_to_bgr565, YV12, BGR565),
    KERNEL(yv12_to_rgb888, YV12, RGB888),         KERNEL(yuv422n_to_rgb565, YUV422N, RGB565),
    KERNEL(yuv422n_to_bgr565, YUV422N, BGR565),   KERNEL(yuv422w_to_rgb565, YUV422W, RGB565),
    KERNEL(yuv422w_to_bgr565, YUV422W, BGR565),   KERNEL(yuv444_to_rgb565, YUV444, RGB565),
    KERNEL(yuv444_to_bgr565, YUV444, BGR565),     KERNEL(nv12_to_rgb565, NV12, RGB565),
    KERNEL(nv12_to_bgr565, NV12, BGR565),         KERNEL(nv12_to_rgb888, NV12, RGB888),
    KERNEL(nv21_to_rgb565, NV21, RGB565),         KERNEL(nv21_to_bgr565, NV21, BGR565),
    KERNEL(nv21_to_rgb888, NV21, RGB888),
};

TEST(yuv2rgb, vector_rows_equal_scalar_rows) {
    for (const kernel &k : kernels) rig::check_csc(k.name, k.run, k.from, k.to);
}

}  // namespace
