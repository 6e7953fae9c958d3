/* Quarter turns, half turns and mirrors. */
#ifndef SIMGP_ROTATE_H
#define SIMGP_ROTATE_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Turns or mirrors a picture, plane by plane, without scaling or converting it.
 *
 *   src   the source: format, and of each plane width[], height[], stride[] and plane[] are read
 *   rot   the rotation code (img.h)
 *   dst   the destination: stride[] and plane[] of each plane are read, nothing else; after
 *         a quarter turn a plane has height[k] samples in each of width[k] rows, else it has the
 *         size of the source's
 *
 * Of a plane of W x H samples, sample (x, y), column x of row y, goes to
 *
 *   code              kernels    column       row
 *   SIMGP_ROT_NONE    (copy)     x            y
 *   SIMGP_ROT_90L     _90l       y            W - 1 - x
 *   SIMGP_ROT_90R     _90r       H - 1 - y    x
 *   SIMGP_ROT_180     _180       W - 1 - x    H - 1 - y
 *   SIMGP_ROT_HORI    _hori      W - 1 - x    y
 *   SIMGP_ROT_VERT    _vert      x            H - 1 - y
 *
 * Planes and their kernels:
 *
 *   format                                        planes     kernels from
 *   YUV400                                        0          simgp_tbl_fn_rot_8b
 *   NV12, NV21                                    0, 1       simgp_tbl_fn_rot_8b and _16b
 *   every other code from 1 to 99 but T64X32      0, 1, 2    simgp_tbl_fn_rot_8b
 *   RGB565, BGR565, every code from 200 to 299    0          simgp_tbl_fn_rot_16b
 *
 * The pairs of NV12 and NV21 move as a whole and keep their order. Planes are turned one by one:
 * of 4:2:2, a quarter turn makes chroma of full width and half height (a YUV422N picture becomes
 * one whose planes are those of YUV422W).
 *
 * Returns SIMGP_OK, or SIMGP_ERR_UNSUPPORTED for a code outside 0 to 5 and for every other format,
 * with nothing written. The destination's format is not looked at. A plane whose width or height is
 * 0 or less is left alone. Source and destination must not share memory: no picture can be turned
 * in place. Any number of calls may run at once on separate destinations. */
SIMGP_API int32_t simgp_rot(const simgp_img *src, int32_t rot, const simgp_img *dst);

/* One plane; the parameters are explained at simgp_plane_fn (img.h): width and height are those of
 * the source. Samples have 8 or 16 bits; odd strides of planes of 16 bits are taken for the next
 * lower even number. Reads and writes the samples and never what lies between the rows. */
SIMGP_API simgp_plane_fn simgp_rot_8b_90l;
SIMGP_API simgp_plane_fn simgp_rot_8b_90r;
SIMGP_API simgp_plane_fn simgp_rot_8b_180;
SIMGP_API simgp_plane_fn simgp_rot_8b_hori;
SIMGP_API simgp_plane_fn simgp_rot_8b_vert;
SIMGP_API simgp_plane_fn simgp_rot_16b_90l;
SIMGP_API simgp_plane_fn simgp_rot_16b_90r;
SIMGP_API simgp_plane_fn simgp_rot_16b_180;
SIMGP_API simgp_plane_fn simgp_rot_16b_hori;
SIMGP_API simgp_plane_fn simgp_rot_16b_vert;

/* The kernels by rotation code, simgp_cpy_8b and simgp_cpy_16b at 0. Read-only. */
SIMGP_API extern simgp_plane_fn *const simgp_tbl_fn_rot_8b[6];
SIMGP_API extern simgp_plane_fn *const simgp_tbl_fn_rot_16b[6];

SIMGP_END_DECLS

#endif
