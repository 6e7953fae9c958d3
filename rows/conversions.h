// The conversion kernels: the lists from which their definitions, the entries of the dispatcher and
// the rows that they need are made. A name here is where an exported kernel is defined: the file
// named at its list says what the kernels of the list do.
#ifndef ROWS_CONVERSIONS_H
#define ROWS_CONVERSIONS_H

#include "rows/formats.h"

namespace simgp {

// What distinguishes kernels from YUV to RGB besides their formats.
//
// Where chroma lines serve two rows, row y takes line y >> 1. Some kernels let row 0 of a picture of
// odd height have the first chroma line to itself, unless the width is a multiple of 4: row y then
// takes line (y + 1) >> 1.
enum class yuv_rule : uint8_t { usual, first_line_alone, coarse };

}  // namespace simgp

// clang-format off

// X(name, from, to, rule); simgp/yuv2rgb.cpp
#define SIMGP_YUV_TO_RGB_KERNELS(X) \
    X(simgp_csc_yuv400_to_rgb565,   YUV400,  RGB565,   usual) \
    X(simgp_csc_yuv420_to_rgb565,   YUV420,  RGB565,   first_line_alone) \
    X(simgp_csc_yuv420_to_bgr565,   YUV420,  BGR565,   usual) \
    X(simgp_csc_yuv420_to_rgb888,   YUV420,  RGB888,   usual) \
    X(simgp_csc_yuv420_to_bgr888,   YUV420,  BGR888,   usual) \
    X(simgp_csc_yuv420_to_rgba8888, YUV420,  RGBA8888, first_line_alone) \
    X(simgp_csc_yuv420_to_bgra8888, YUV420,  BGRA8888, first_line_alone) \
    X(simgp_csc_yuv420_to_argb8888, YUV420,  ARGB8888, first_line_alone) \
    X(simgp_csc_yv12_to_rgb565,     YV12,    RGB565,   first_line_alone) \
    X(simgp_csc_yv12_to_bgr565,     YV12,    BGR565,   usual) \
    X(simgp_csc_yv12_to_rgb888,     YV12,    RGB888,   usual) \
    X(simgp_csc_yuv422n_to_rgb565,  YUV422N, RGB565,   usual) \
    X(simgp_csc_yuv422n_to_bgr565,  YUV422N, BGR565,   usual) \
    X(simgp_csc_yuv422w_to_rgb565,  YUV422W, RGB565,   usual) \
    X(simgp_csc_yuv422w_to_bgr565,  YUV422W, BGR565,   usual) \
    X(simgp_csc_yuv444_to_rgb565,   YUV444,  RGB565,   usual) \
    X(simgp_csc_yuv444_to_bgr565,   YUV444,  BGR565,   usual) \
    X(simgp_csc_nv12_to_rgb565,     NV12,    RGB565,   usual) \
    X(simgp_csc_nv12_to_bgr565,     NV12,    BGR565,   usual) \
    X(simgp_csc_nv12_to_rgb888,     NV12,    RGB888,   usual) \
    X(simgp_csc_nv21_to_rgb565,     NV21,    RGB565,   coarse) \
    X(simgp_csc_nv21_to_bgr565,     NV21,    BGR565,   usual) \
    X(simgp_csc_nv21_to_rgb888,     NV21,    RGB888,   usual)

// X(name, from, to, rule); simgp/packed2rgb.cpp
#define SIMGP_PACKED_TO_RGB_KERNELS(X) \
    X(simgp_csc_uyvy_to_rgb565,     UYVY,    RGB565,   usual) \
    X(simgp_csc_uyvy_to_bgr565,     UYVY,    BGR565,   usual) \
    X(simgp_csc_uyvy_to_rgb888,     UYVY,    RGB888,   usual) \
    X(simgp_csc_uyvy_to_bgr888,     UYVY,    BGR888,   usual) \
    X(simgp_csc_uyvy_to_rgba8888,   UYVY,    RGBA8888, usual) \
    X(simgp_csc_uyvy_to_bgra8888,   UYVY,    BGRA8888, usual) \
    X(simgp_csc_uyvy_to_argb8888,   UYVY,    ARGB8888, usual) \
    X(simgp_csc_yuyv_to_rgb565,     YUYV,    RGB565,   usual) \
    X(simgp_csc_yuyv_to_rgb888,     YUYV,    RGB888,   usual)

// X(name, from, to); simgp/rgb2yuv.cpp
#define SIMGP_RGB_TO_YUV_KERNELS(X) \
    X(simgp_csc_rgb565_to_yuv420,   RGB565,  YUV420) \
    X(simgp_csc_rgb565_to_yv12,     RGB565,  YV12) \
    X(simgp_csc_rgb565_to_nv12,     RGB565,  NV12) \
    X(simgp_csc_rgb565_to_nv21,     RGB565,  NV21) \
    X(simgp_csc_rgb888_to_yuv420,   RGB888,  YUV420) \
    X(simgp_csc_rgb888_to_yv12,     RGB888,  YV12) \
    X(simgp_csc_rgb888_to_nv12,     RGB888,  NV12) \
    X(simgp_csc_rgb888_to_nv21,     RGB888,  NV21) \
    X(simgp_csc_bgr888_to_yuv420,   BGR888,  YUV420) \
    X(simgp_csc_bgr888_to_yv12,     BGR888,  YV12)

// X(name, from, to); simgp/rgb2yuv.cpp
#define SIMGP_RGB_TO_RGB565_KERNELS(X) \
    X(simgp_csc_rgb888_to_rgb565,   RGB888,   RGB565) \
    X(simgp_csc_rgba8888_to_rgb565, RGBA8888, RGB565)

// X(name, from, to); simgp/layout.cpp
#define SIMGP_LAYOUT_KERNELS(X) \
    X(simgp_csc_yuv420_to_yv12,     YUV420,  YV12) \
    X(simgp_csc_yuv420_to_yuv422n,  YUV420,  YUV422N) \
    X(simgp_csc_yuv420_to_nv12,     YUV420,  NV12) \
    X(simgp_csc_yuv420_to_nv21,     YUV420,  NV21) \
    X(simgp_csc_yuv422n_to_yuv420,  YUV422N, YUV420) \
    X(simgp_csc_yuv422n_to_yv12,    YUV422N, YV12) \
    X(simgp_csc_yv16_to_yuv420,     YV16,    YUV420) \
    X(simgp_csc_yv16_to_yv12,       YV16,    YV12) \
    X(simgp_csc_nv12_to_yuv420,     NV12,    YUV420) \
    X(simgp_csc_nv12_to_yv12,       NV12,    YV12) \
    X(simgp_csc_nv21_to_yuv420,     NV21,    YUV420) \
    X(simgp_csc_nv21_to_yv12,       NV21,    YV12)

// X(name, from, to); simgp/tile.cpp
#define SIMGP_TILE_TO_RGB_KERNELS(X) \
    X(simgp_csc_t64x32_to_rgb565,   T64X32,  RGB565) \
    X(simgp_csc_t64x32_to_bgra8888, T64X32,  BGRA8888)

// X(name, from, to); simgp/tile.cpp
#define SIMGP_TILE_KERNELS(X) \
    X(simgp_csc_t64x32_to_nv12,     T64X32,  NV12) \
    X(simgp_csc_t64x32_to_yuv420,   T64X32,  YUV420) \
    X(simgp_csc_yuv420_to_t64x32,   YUV420,  T64X32)

// X(name, from, to), by way of the rows of the plain conversion; simgp/dither.cpp
#define SIMGP_DITHER_KERNELS(X) \
    X(simgp_csc_yuv400_to_rgb565_dither,  YUV400,  RGB565) \
    X(simgp_csc_yuv420_to_rgb565_dither,  YUV420,  RGB565) \
    X(simgp_csc_yuv420_to_bgr565_dither,  YUV420,  BGR565) \
    X(simgp_csc_yuv422n_to_rgb565_dither, YUV422N, RGB565) \
    X(simgp_csc_yuv422n_to_bgr565_dither, YUV422N, BGR565) \
    X(simgp_csc_yuv422w_to_rgb565_dither, YUV422W, RGB565) \
    X(simgp_csc_yuv422w_to_bgr565_dither, YUV422W, BGR565) \
    X(simgp_csc_yuv444_to_rgb565_dither,  YUV444,  RGB565) \
    X(simgp_csc_yuv444_to_bgr565_dither,  YUV444,  BGR565)
// clang-format on

#endif
