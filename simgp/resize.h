/* Bilinear resize. */
#ifndef SIMGP_RESIZE_H
#define SIMGP_RESIZE_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* The filter -------------------------------------------------------------------------------------
 *
 * Destination sample (i, j), column i of row j, lies at column i * step_x and row j * step_y of the
 * source. Positions have 18 fractional bits; the upper three of them are the phase, in eighths. The
 * positions of n destination samples are spread over a source extent of N by
 *
 *     shift = 0 for N / n below 3, else ceil(log2(N / n)) - 1, at most 4    (N / n rounded down)
 *     step  = (((N - 1) >> shift) << 18) / n, rounded down
 *
 * For reductions to a third and less, the source is looked at in units of 2^shift samples (rows):
 * only every second, fourth, eighth or sixteenth takes part. With ax = i * step_x, ay = j * step_y:
 *
 *     x = (ax >> 18) << shift_x,  fx = (ax >> 15) & 7,  d = 1 << shift_x
 *     y = (ay >> 18) << shift_y,  fy = (ay >> 15) & 7,  e = 1 << shift_y
 *
 *     result = ((8 - fx) (8 - fy) P(x, y)      + fx (8 - fy) P(x + d, y)
 *             + (8 - fx) fy       P(x, y + e)  + fx fy       P(x + d, y + e)) >> 6
 *
 * for each channel, without rounding. The grids of source and destination meet at the top left
 * corner. A neighbour whose weight is 0 is not read; nothing outside the plane ever is.
 *
 * Of 2 samples P, Q, 8 are made as ((8 - k) P + k Q) >> 3, k = 0 ... 7. A plane that is resized to
 * its own size is no copy: 4 samples are taken at 0, 0.75, 1.5 and 2.25.
 */

/* The weights, in 64ths: 4 bytes for each pair of phases, from byte 32 fx + 4 fy on: of P(x, y),
 * P(x + d, y), P(x, y + e) and P(x + d, y + e). Read-only. */
SIMGP_API extern const uint8_t simgp_tbl_rsz_weight[256];

/* The steps of a plane, as the kernels take them: (step << 3) | shift.
 *
 *   src_width, src_height    samples in a row and rows of the source plane
 *   dst_width, dst_height    of the destination plane
 *   mode                     a rotation code (img.h): the quarter turns spread the source's width
 *                            over dst_height and its height over dst_width
 *   step_x, step_y           the two steps are stored here; along the source's rows and columns
 *
 * An extent that is below 1, or a source extent beyond what the arithmetic holds (8192 samples with
 * shift 0, 16384 with 1, 32768 with 2, 65536 with 3, 131072 with 4), gives a step of 0. */
SIMGP_API void simgp_rsz_get_step(int32_t src_width, int32_t src_height, int32_t dst_width,
                                  int32_t dst_height, int32_t mode, int32_t *step_x,
                                  int32_t *step_y);

/* Resizes a picture to the size of the destination's descriptor, plane by plane.
 *
 *   src, dst   format, and of each plane width[], height[], stride[] and plane[] are read
 *
 *   format                                        planes     kernels
 *   YUV400                                        0          simgp_rsz_8b
 *   NV12, NV21                                    0, 1       simgp_rsz_8b, simgp_rsz_8b8b
 *   every other code from 1 to 99 but T64X32      0, 1, 2    simgp_rsz_8b
 *   RGB565, BGR565                                0          simgp_rsz_5b6b5b
 *   RGB888, BGR888                                0          simgp_rsz_8b8b8b
 *   RGBA8888, BGRA8888, ARGB8888, code 503        0          simgp_rsz_8b8b8b8b
 *
 * Each plane is resized from its own size to its own size. If plane 0 keeps its size, all planes
 * are copied instead, with the source's sizes.
 *
 * Returns SIMGP_OK; SIMGP_ERR_PARAM if the formats differ; SIMGP_ERR_UNSUPPORTED for every other
 * format; SIMGP_ERR_PARAM, unless the picture is copied, if a width or height of a plane is below 1
 * or larger than the steps can hold (simgp_rsz_get_step). A call that fails has written nothing.
 * Source and destination must not share memory. Any number of calls may run at once on separate
 * destinations. */
SIMGP_API int32_t simgp_rsz(const simgp_img *src, const simgp_img *dst);

/* A resize of one plane.
 *
 *   src_plane                first byte of the first row of the source; only read
 *   src_stride, dst_stride   bytes from one row to the next; may be negative
 *   dst_width, dst_height    samples in a row and rows of the destination; of 0 or less nothing is
 *                            written
 *   dst_plane                first byte of the first row of the destination
 *   step_x, step_y           the steps, packed: those of simgp_rsz_get_step for the two sizes
 *
 * Reads what the steps lead to and writes the samples, nothing else. No pointer needs to be
 * aligned. Source and destination must not share memory. Any number of calls may run at once on
 * separate destinations. */
typedef void simgp_rsz_fn(const void *src_plane, int32_t src_stride, int32_t dst_width,
                          int32_t dst_height, int32_t dst_stride, void *dst_plane, int32_t step_x,
                          int32_t step_y);

/* Samples of 1 byte; of 2, 3 and 4 bytes, each byte a channel; 16-bit words (low byte first) with
 * channels of 5, 6 and 5 bits, each interpolated on its own. Strides of the samples of 2 and of 4
 * bytes are rounded down to whole samples. */
SIMGP_API simgp_rsz_fn simgp_rsz_8b;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b8b;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b8b8b;
SIMGP_API simgp_rsz_fn simgp_rsz_5b6b5b;

SIMGP_END_DECLS

#endif
