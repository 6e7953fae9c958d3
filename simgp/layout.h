/* Conversions between layouts of YUV: the samples stay as they are and move. */
#ifndef SIMGP_LAYOUT_H
#define SIMGP_LAYOUT_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Whole pictures ----------------------------------------------------------------------------------
 *
 * The parameters are explained at simgp_csc_fn (img.h). Luma is copied: src_heights[0] rows of
 * src_widths[0] samples. Chroma moves by the kernel that the table names, with the widths, heights
 * and strides of the source's chroma planes and the strides of the destination's:
 *
 *   from      to        chroma
 *   YUV420    YV12      copied (simgp_cpy_8b), planes exchanged
 *   YUV420    YUV422N   rows doubled (simgp_csc_1x1_to_1x2)
 *   YUV420    NV12      interleaved, U first (simgp_csc_8b8b_pck, with the size of source plane 1)
 *   YUV420    NV21      the same, V first
 *   YUV422N   YUV420    every second row (simgp_csc_1x2_to_1x1)
 *   YUV422N   YV12      the same, planes exchanged
 *   YV16      YUV420    every second row, planes exchanged
 *   YV16      YV12      every second row
 *   NV12      YUV420    taken apart (simgp_csc_8b8b_unpck)
 *   NV12      YV12      the same
 *   NV21      YUV420    the same
 *   NV21      YV12      the same
 *
 * Nothing is averaged or interpolated: 4:2:2 to 4:2:0 keeps chroma rows 0, 2, 4, ..., 4:2:0 to
 * 4:2:2 gives rows 2y and 2y + 1 the samples of row y. A picture of odd height H has (H + 1) / 2
 * chroma rows in 4:2:0. From 4:2:2, only the first H / 2 of them are written. To 4:2:2, H + 1
 * chroma rows are written: the destination must have room for twice the source's chroma rows.
 *
 * Any size works, of 0 or less nothing is written. No pointer or stride needs to be aligned;
 * strides may be negative. Only visible samples are read and written. Source and destination must
 * not share memory. Any number of calls may run at once on separate destinations. */
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_yuv422n;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_nv21;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_yv16_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_yv16_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_yv12;

/* Planes ------------------------------------------------------------------------------------------
 *
 * Strides are in bytes and may be negative; each belongs to the plane of its name. No pointer needs
 * to be aligned. A width or height of 0 or less does nothing. Only the named bytes are read and
 * written. Sources and destinations must not overlap. Any number of calls may run at once on
 * separate destinations. The parameters of simgp_plane_fn are explained in img.h. */

/* Keeps every second row: source rows 0, 2, 4, ... of `width` bytes become rows 0, 1, 2, ... of the
 * destination. `height` counts source rows; height / 2 rows are written, so the last one of an odd
 * number is dropped. */
SIMGP_API simgp_plane_fn simgp_csc_1x2_to_1x1;

/* Doubles the rows: source row y, of `width` bytes, becomes rows 2y and 2y + 1. `height` counts
 * source rows; 2 * height rows are written. */
SIMGP_API simgp_plane_fn simgp_csc_1x1_to_1x2;

/* Interleaves two planes of `width` x `height` bytes: byte 2x of destination row y is byte x of
 * that row of src_a, byte 2x + 1 that of src_b.
 *
 *   stride_a, stride_b   of src_a and src_b
 *   dst_stride           of dst, which takes 2 * width bytes in a row */
SIMGP_API void simgp_csc_8b8b_pck(const uint8_t *src_a, const uint8_t *src_b, int32_t width,
                                  int32_t height, int32_t stride_a, int32_t stride_b,
                                  int32_t dst_stride, uint8_t *dst);

/* Takes a plane of byte pairs apart: of each of the `height` rows, bytes 0, 2, 4, ... go to the
 * same row of dst_a and bytes 1, 3, 5, ... to that of dst_b. `width` counts source bytes, two for
 * each pair; the last one of an odd number goes to dst_a.
 *
 *   src_stride           of src
 *   stride_a, stride_b   of dst_a and dst_b */
SIMGP_API void simgp_csc_8b8b_unpck(const uint8_t *src, int32_t width, int32_t height,
                                    int32_t src_stride, int32_t stride_a, int32_t stride_b,
                                    uint8_t *dst_a, uint8_t *dst_b);

SIMGP_END_DECLS

#endif
