// The dispatch table of the colour conversions.
#include "simgp/csc.h"

#include "simgp/simgp.h"

namespace {

struct conversion {
    int16_t from, to;
    simgp_csc_fn *kernel;
};

// clang-format off
constexpr conversion conversions[] = {
    {SIMGP_FMT_YUV400,   SIMGP_FMT_RGB565,   simgp_csc_yuv400_to_rgb565},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_RGB565,   simgp_csc_yuv420_to_rgb565},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_BGR565,   simgp_csc_yuv420_to_bgr565},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_RGB888,   simgp_csc_yuv420_to_rgb888},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_BGR888,   simgp_csc_yuv420_to_bgr888},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_RGBA8888, simgp_csc_yuv420_to_rgba8888},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_BGRA8888, simgp_csc_yuv420_to_bgra8888},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_ARGB8888, simgp_csc_yuv420_to_argb8888},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_YUV422N,  simgp_csc_yuv420_to_yuv422n},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_YV12,     simgp_csc_yuv420_to_yv12},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_NV12,     simgp_csc_yuv420_to_nv12},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_NV21,     simgp_csc_yuv420_to_nv21},
    {SIMGP_FMT_YUV420,   SIMGP_FMT_T64X32,   simgp_csc_yuv420_to_t64x32},
    {SIMGP_FMT_YUV422N,  SIMGP_FMT_RGB565,   simgp_csc_yuv422n_to_rgb565},
    {SIMGP_FMT_YUV422N,  SIMGP_FMT_BGR565,   simgp_csc_yuv422n_to_bgr565},
    {SIMGP_FMT_YUV422N,  SIMGP_FMT_YUV420,   simgp_csc_yuv422n_to_yuv420},
    {SIMGP_FMT_YUV422N,  SIMGP_FMT_YV12,     simgp_csc_yuv422n_to_yv12},
    {SIMGP_FMT_YUV444,   SIMGP_FMT_RGB565,   simgp_csc_yuv444_to_rgb565},
    {SIMGP_FMT_YUV444,   SIMGP_FMT_BGR565,   simgp_csc_yuv444_to_bgr565},
    {SIMGP_FMT_YV12,     SIMGP_FMT_RGB565,   simgp_csc_yv12_to_rgb565},
    {SIMGP_FMT_YV12,     SIMGP_FMT_BGR565,   simgp_csc_yv12_to_bgr565},
    {SIMGP_FMT_YV12,     SIMGP_FMT_RGB888,   simgp_csc_yv12_to_rgb888},
    {SIMGP_FMT_YV16,     SIMGP_FMT_YV12,     simgp_csc_yv16_to_yv12},
    {SIMGP_FMT_YV16,     SIMGP_FMT_YUV420,   simgp_csc_yv16_to_yuv420},
    {SIMGP_FMT_NV12,     SIMGP_FMT_RGB565,   simgp_csc_nv12_to_rgb565},
    {SIMGP_FMT_NV12,     SIMGP_FMT_BGR565,   simgp_csc_nv12_to_bgr565},
    {SIMGP_FMT_NV12,     SIMGP_FMT_RGB888,   simgp_csc_nv12_to_rgb888},
    {SIMGP_FMT_NV12,     SIMGP_FMT_YUV420,   simgp_csc_nv12_to_yuv420},
    {SIMGP_FMT_NV12,     SIMGP_FMT_YV12,     simgp_csc_nv12_to_yv12},
    {SIMGP_FMT_NV21,     SIMGP_FMT_RGB565,   simgp_csc_nv21_to_rgb565},
    {SIMGP_FMT_NV21,     SIMGP_FMT_BGR565,   simgp_csc_nv21_to_bgr565},
    {SIMGP_FMT_NV21,     SIMGP_FMT_RGB888,   simgp_csc_nv21_to_rgb888},
    {SIMGP_FMT_NV21,     SIMGP_FMT_YUV420,   simgp_csc_nv21_to_yuv420},
    {SIMGP_FMT_NV21,     SIMGP_FMT_YV12,     simgp_csc_nv21_to_yv12},
    {SIMGP_FMT_YUV422W,  SIMGP_FMT_RGB565,   simgp_csc_yuv422w_to_rgb565},
    {SIMGP_FMT_YUV422W,  SIMGP_FMT_BGR565,   simgp_csc_yuv422w_to_bgr565},
    {SIMGP_FMT_T64X32,   SIMGP_FMT_RGB565,   simgp_csc_t64x32_to_rgb565},
    {SIMGP_FMT_T64X32,   SIMGP_FMT_BGRA8888, simgp_csc_t64x32_to_bgra8888},
    {SIMGP_FMT_T64X32,   SIMGP_FMT_NV12,     simgp_csc_t64x32_to_nv12},
    {SIMGP_FMT_T64X32,   SIMGP_FMT_YUV420,   simgp_csc_t64x32_to_yuv420},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_RGB565,   simgp_csc_uyvy_to_rgb565},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_BGR565,   simgp_csc_uyvy_to_bgr565},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_RGB888,   simgp_csc_uyvy_to_rgb888},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_BGR888,   simgp_csc_uyvy_to_bgr888},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_RGBA8888, simgp_csc_uyvy_to_rgba8888},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_BGRA8888, simgp_csc_uyvy_to_bgra8888},
    {SIMGP_FMT_UYVY,     SIMGP_FMT_ARGB8888, simgp_csc_uyvy_to_argb8888},
    {SIMGP_FMT_YUYV,     SIMGP_FMT_RGB565,   simgp_csc_yuyv_to_rgb565},
    {SIMGP_FMT_YUYV,     SIMGP_FMT_RGB888,   simgp_csc_yuyv_to_rgb888},
    {SIMGP_FMT_RGB565,   SIMGP_FMT_YUV420,   simgp_csc_rgb565_to_yuv420},
    {SIMGP_FMT_RGB565,   SIMGP_FMT_YV12,     simgp_csc_rgb565_to_yv12},
    {SIMGP_FMT_RGB565,   SIMGP_FMT_NV12,     simgp_csc_rgb565_to_nv12},
    {SIMGP_FMT_RGB565,   SIMGP_FMT_NV21,     simgp_csc_rgb565_to_nv21},
    {SIMGP_FMT_RGB888,   SIMGP_FMT_YUV420,   simgp_csc_rgb888_to_yuv420},
    {SIMGP_FMT_RGB888,   SIMGP_FMT_YV12,     simgp_csc_rgb888_to_yv12},
    {SIMGP_FMT_RGB888,   SIMGP_FMT_NV12,     simgp_csc_rgb888_to_nv12},
    {SIMGP_FMT_RGB888,   SIMGP_FMT_NV21,     simgp_csc_rgb888_to_nv21},
    {SIMGP_FMT_RGB888,   SIMGP_FMT_RGB565,   simgp_csc_rgb888_to_rgb565},
    {SIMGP_FMT_BGR888,   SIMGP_FMT_YUV420,   simgp_csc_bgr888_to_yuv420},
    {SIMGP_FMT_BGR888,   SIMGP_FMT_YV12,     simgp_csc_bgr888_to_yv12},
    {SIMGP_FMT_RGBA8888, SIMGP_FMT_RGB565,   simgp_csc_rgba8888_to_rgb565},
};
// clang-format on

}  // namespace

int32_t simgp_csc(const simgp_img *src, const simgp_img *dst) {
    if (src->format == dst->format) return SIMGP_ERR_PARAM;
    for (const conversion &c : conversions) {
        if (c.from != src->format || c.to != dst->format) continue;
        c.kernel(src->plane, src->width, src->height, src->stride, dst->stride, dst->plane);
        return SIMGP_OK;
    }
    return SIMGP_ERR_UNSUPPORTED;
}
