/* Luma dithering: the last step before a picture is reduced to 16-bit RGB. */
#ifndef SIMGP_DITHER_H
#define SIMGP_DITHER_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Copies a plane of 8-bit samples and nudges the copy by steps of 1 and 2, up or down, so that
 * smooth gradients do not turn into bands when the low bits are dropped afterwards. Where a nudge
 * goes depends on how the samples around compare, so the result is the same on every run.
 *
 *   src, dst                 first sample of the first row; no alignment is needed
 *   width, height            samples in a row, rows; of 0 or less nothing is written
 *   src_stride, dst_stride   bytes from one row to the next; may be negative
 *
 * The result is that of this procedure, which works in place and in this order:
 *
 *     copy the plane; if height < 3 or width < 5, that is all
 *     for y = 1, 2, ... height - 2, with above, cur, below the rows y - 1, y, y + 1 of the copy
 *         for x = 2, 4, ... up to and including width - 3
 *             p = cur[x - 1], q = cur[x]
 *             cur[x + 2] += p > q ? 2 : -2
 *             below[x] and below[x + 1] += above[x] > q ? 1 : -1
 *
 * with sums limited to 0 ... 255. So row 0 and columns 0 and 1 stay as they are, and the last
 * column too if the width is even. An 8 x 4 plane of 100 becomes
 *
 *     100 100 100 100 100 100 100 100
 *     100 100 100 100  98 100 102 100
 *     100 100  99  99 103 101  98 100
 *     100 100 101 101  99  99 100 100
 *
 * Reads the width x height samples of src, reads and writes those of dst, and nothing else. The two
 * must not share memory. Any number of calls may run at once on separate destinations. */
SIMGP_API simgp_plane_fn simgp_dit_8b;

/* Converts src to the format of dst like simgp_csc (see there), dithering the luma first.
 *
 *   YUV400                                      to RGB565
 *   YUV420, YV12, YUV422N, YUV422W, YUV444      to RGB565 and BGR565
 *   YUV420                                      to YUV420: dithers plane 0, copies planes 1 and 2,
 *                                               each with its own width[] and height[] of src
 *
 * Returns SIMGP_OK, or SIMGP_ERR_UNSUPPORTED for every other pair, two equal formats included, with
 * nothing written. To RGB, it calls the kernels below, whose notes hold; YV12 takes those of
 * YUV420, with the chroma planes exchanged. Source and destination must not share memory. */
SIMGP_API int32_t simgp_csc_dither(const simgp_img *src, const simgp_img *dst);

/* Dithering and conversion in one call, with the arguments of the plain kernels (yuv2rgb.h; they
 * are explained at simgp_csc_fn in img.h). Source and destination must not share memory.
 *
 * Nothing is allocated: dithered luma waits for its conversion in the last two rows of the
 * destination. With H = src_heights[0], W = src_widths[0] and D = dst_strides[0], the destination
 * must therefore have H * |D| bytes, those behind the last pixel included, and |D| must be at least
 * 2 W. Bytes of the last two rows that belong to no pixel may change; the padding of all other rows
 * stays. Nobody else may read or write the destination during the call. D may be odd or negative: a
 * picture from bottom to top has its H * |D| bytes from dst_planes[0] + (H - 1) * D on.
 *
 * Grey is dithered in full height. Of the others, the last 4 rows are not dithered: they are those
 * of the plain kernel, called for the last 4 luma rows and the chroma lines that belong to 4 rows,
 * while another call converts the H - 4 rows above. Both calls follow the plain kernel's rules for
 * odd heights, and src_heights[1] and [2] are read to find the last chroma lines. A picture of less
 * than 4 rows is converted without dithering. */
SIMGP_API simgp_csc_fn simgp_csc_yuv400_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgr565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_bgr565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_bgr565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_bgr565_dither;

SIMGP_END_DECLS

#endif
