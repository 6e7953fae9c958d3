/* Planar and semi-planar YUV to RGB. */
#ifndef SIMGP_YUV2RGB_H
#define SIMGP_YUV2RGB_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* All kernels here but two (grey, and NV21 to RGB565) compute ITU-R BT.601, limited range, with 8
 * fractional bits. With Yc = 298 (Y - 16), Uc = U - 128, Vc = V - 128:
 *
 *   R = clamp((Yc + 409 Vc + 128) >> 8)
 *   G = clamp((Yc - 100 Uc - 208 Vc + 128) >> 8)
 *   B = clamp((Yc + 516 Uc + 128) >> 8)
 *
 * where >> rounds toward minus infinity and clamp limits to 0 ... 255. 16-bit outputs drop the low
 * bits of each channel; 32-bit outputs get alpha 255. Y = 81, U = 90, V = 240 becomes pure red.
 *
 * Chroma is repeated, never interpolated: pixel (x, y) takes sample
 *
 *   YUV420, YV12, NV12, NV21   (x / 2, y / 2)
 *   YUV422N                    (x / 2, y)
 *   YUV422W                    (x, y / 2)
 *   YUV444                     (x, y)
 *
 * so an odd W uses chroma sample W / 2 for its last column, and an odd H chroma line H / 2 for its
 * last row (but see below).
 *
 * The parameters of all kernels are explained at simgp_csc_fn (img.h). Of the widths and heights
 * only entry 0 is read: the picture is W x H pixels. Any W and H work; of 0 or less nothing is
 * written.
 *
 *   source        as drawn at the format's code (img.h); src_planes[k] with src_strides[k]. Chroma
 *                 lines are found by their stride alone.
 *   destination   dst_planes[0], H lines of W pixels, dst_strides[0] bytes apart.
 *
 * Read are the W x H luma samples and the chroma samples that belong to them, written are the W x H
 * pixels: nothing beyond column W - 1, no padding. No pointer or stride needs to be aligned;
 * strides may be negative.
 *
 * Source and destination must not share memory, except that simgp_csc_yuv400_to_rgb565 also works
 * where the luma of a line lies in the same line of the output, at its end or behind it (line y:
 * luma at dst line y + W or above). Pure functions: any number of calls may run at once on separate
 * destinations. */

/* Grey: no matrix, R = G = B = Y. */
SIMGP_API simgp_csc_fn simgp_csc_yuv400_to_rgb565;

/* Where W is not a multiple of 4 and H is odd, the four kernels to RGB565, RGBA8888, BGRA8888 and
 * ARGB8888 give the first chroma line to row 0 alone, and every later one to two rows: row y takes
 * line (y + 1) / 2. */
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgr888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgba8888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgra8888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_argb8888;

/* As the YUV420 kernels, the one to RGB565 with its rule for odd heights included, with the chroma
 * planes (and their strides) exchanged. */
SIMGP_API simgp_csc_fn simgp_csc_yv12_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yv12_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_yv12_to_rgb888;

/* Each row of pixels has a chroma line of its own, of W / 2 samples rounded up. */
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_bgr565;

/* Chroma lines of W samples, each for two rows of pixels. */
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_bgr565;

/* A U and a V sample for each pixel. */
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_bgr565;

/* Pairs U V in plane 1, of which W / 2 rounded up are read in a line. */
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_rgb888;

/* Pairs V U in plane 1. The one kernel with coarser coefficients, 6 fractional bits:
 *
 *   R = clamp((75 (Y - 16) + 102 Vc + 32) >> 6)
 *   G = clamp((75 (Y - 16) - 25 Uc - 52 Vc + 32) >> 6)
 *   B = clamp((75 (Y - 16) + 129 Uc + 32) >> 6)
 *
 * so its colours differ by a step here and there from those of all the others. */
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_rgb565;

/* Pairs V U in plane 1, with the matrix of all the others. */
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_rgb888;

SIMGP_END_DECLS

#endif
