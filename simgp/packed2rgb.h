/* Packed YUV 4:2:2 to RGB. */
#ifndef SIMGP_PACKED2RGB_H
#define SIMGP_PACKED2RGB_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* The matrix and the packings are those of the planar kernels (yuv2rgb.h): ITU-R BT.601, limited
 * range, 8 fractional bits; 32-bit outputs get alpha 255. Two pixels share the U and V of their
 * group of four bytes:
 *
 *   UYVY   U Y0 V Y1        128, 16, 128, 235 is a black and a white pixel
 *   YUYV   Y0 U Y1 V        81, 90, 81, 240 are two pure red pixels
 *
 * The parameters are explained at simgp_csc_fn (img.h); only entry 0 of each array is read.
 *
 *   source        src_planes[0], H lines of W pixels, 2 W bytes each, src_strides[0] bytes apart.
 *   destination   dst_planes[0], H lines of W pixels, dst_strides[0] bytes apart.
 *
 * W is src_widths[0], H is src_heights[0]; of 0 or less nothing is written. Of an odd W the last
 * pixel uses its own Y and the U of its half group, and the V of the group before (128 if there is
 * none): a V of its own would lie outside the 2 W bytes of the line. Nothing is read beyond these
 * bytes or written beyond the W pixels. No pointer or stride needs to be aligned; strides may be
 * negative. Source and destination must not share memory. Pure functions: any number of calls may
 * run at once on separate destinations. */
SIMGP_API simgp_csc_fn simgp_csc_yuyv_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuyv_to_rgb888;

SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_bgr888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_rgba8888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_bgra8888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_argb8888;

SIMGP_END_DECLS

#endif
