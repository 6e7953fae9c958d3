/* Bilinear resize and a turn in one pass. */
#ifndef SIMGP_RESIZE_ROT_H
#define SIMGP_RESIZE_ROT_H

#include "simgp/resize.h"

SIMGP_BEGIN_DECLS

/* Resizes a YUV picture and turns it: the result is that of simgp_rsz (resize.h) to the size before
 * the turn, turned as simgp_rot (rotate.h) does.
 *
 *   src   format, and of each plane width[], height[], stride[] and plane[] are read
 *   rot   the rotation code (img.h)
 *   dst   the same; its sizes are those after the turn
 *
 *   format                                        planes     kernels from
 *   YUV400                                        0          simgp_tbl_fn_rsz_8b_rot
 *   NV12, NV21                                    0, 1       simgp_tbl_fn_rsz_8b_rot and _8b8b_rot
 *   every other code from 1 to 99 but T64X32      0, 1, 2    simgp_tbl_fn_rsz_8b_rot
 *
 * If plane 0 keeps its size (for the quarter turns: its width is the destination's height and the
 * other way round), this is simgp_rot, with all its formats and codes.
 *
 * Returns, in this order: SIMGP_ERR_PARAM if the formats differ; SIMGP_ERR_UNSUPPORTED for a code
 * outside 0 to 5; what simgp_rot does, if plane 0 keeps its size; SIMGP_ERR_UNSUPPORTED for every
 * other format, and for SIMGP_ROT_HORI and SIMGP_ROT_VERT; SIMGP_ERR_PARAM if a width or height of a
 * plane is below 1 or larger than the steps can hold (simgp_rsz_get_step); SIMGP_OK. A call that
 * fails has written nothing. Source and destination must not share memory. Any number of calls may
 * run at once on separate destinations. */
SIMGP_API int32_t simgp_rsz_rot(const simgp_img *src, int32_t rot, const simgp_img *dst);

/* One plane; the parameters are explained at simgp_rsz_fn (resize.h). The sizes are those of the
 * turned plane; the steps are those of simgp_rsz_get_step with the rotation code as its mode, along
 * the rows and columns of the source. Strides of pairs are rounded down to even numbers. */
SIMGP_API simgp_rsz_fn simgp_rsz_8b_rot_90l;
SIMGP_API simgp_rsz_fn simgp_rsz_8b_rot_90r;
SIMGP_API simgp_rsz_fn simgp_rsz_8b_rot_180;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b_rot_90l;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b_rot_90r;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b_rot_180;

/* The kernels by rotation code, simgp_rsz_8b and simgp_rsz_8b8b at 0, NULL for the mirrors.
 * Read-only. */
SIMGP_API extern simgp_rsz_fn *const simgp_tbl_fn_rsz_8b_rot[6];
SIMGP_API extern simgp_rsz_fn *const simgp_tbl_fn_rsz_8b8b_rot[6];

/* Halves a plane of 8-bit samples in both directions, without a filter, and turns it to the right:
 * the quickest way to a thumbnail of a picture that was taken upright. The destination's column
 * dst_width - 1 - c, row r is the source's column 2 r, row 2 c.
 *
 *   src_plane                first byte of the first row of the source: 2 dst_width rows of
 *                            2 dst_height bytes, beyond which nothing is read
 *   src_stride, dst_stride   bytes from one row to the next; may be negative
 *   dst_width, dst_height    samples in a row and rows of the destination; of 0 or less nothing is
 *                            written
 *   dst_plane                first byte of the first row of the destination
 *
 * Source and destination must not share memory. */
SIMGP_API void simgp_rsz_8b_rot_90r_quarter(const void *src_plane, int32_t src_stride,
                                            int32_t dst_width, int32_t dst_height,
                                            int32_t dst_stride, void *dst_plane);

SIMGP_END_DECLS

#endif
