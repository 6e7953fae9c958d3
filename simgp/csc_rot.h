/* Planar 4:2:2 to planar 4:2:0 and a quarter turn in one pass. */
#ifndef SIMGP_CSC_ROT_H
#define SIMGP_CSC_ROT_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Converts a picture of planar 4:2:2 to 4:2:0 and turns it as `rot` says. Luma is turned. Of
 * chroma, rows 0, 2, 4, ... are kept and turned.
 *
 *   src   the source: format, and of planes 0 to 2 width[], height[], stride[] and plane[] are read
 *   rot   SIMGP_ROT_NONE, SIMGP_ROT_90L or SIMGP_ROT_90R (img.h)
 *   dst   the destination: format, stride[] and plane[] are read
 *
 *   from       to         source plane 1 to    source plane 2 to
 *   YUV422N    YUV420     plane 1              plane 2
 *   YV16       YV12       plane 1              plane 2
 *   YUV422N    YV12       plane 2              plane 1
 *   YV16       YUV420     plane 2              plane 1
 *
 * Plane k of the destination has, without a turn, width[k] samples in a row; height[0] rows of luma
 * and height[k] / 2 of chroma, rounded down. With a quarter turn these are exchanged: height[0] or
 * height[k] / 2 samples in a row, width[k] rows. Nothing else is written; of an odd number of
 * chroma rows the last is not read.
 *
 * Returns SIMGP_OK; SIMGP_ERR_PARAM if both formats are the same; SIMGP_ERR_UNSUPPORTED for every
 * other pair, and then for every other code. All are decided before anything is written. Source and
 * destination must not share memory. Any number of calls may run at once on separate
 * destinations. */
SIMGP_API int32_t simgp_csc_rot(const simgp_img *src, int32_t rot, const simgp_img *dst);

/* One plane of 8-bit samples of which every second row is kept; the parameters are explained at
 * simgp_plane_fn (img.h): width and height are those of the source. Of W samples in H rows, sample
 * (x, 2k) of each kept row k = 0 ... H / 2 - 1 goes to
 *
 *   kernel     column           row
 *   _rot_90l   k                W - 1 - x    a quarter turn to the left
 *   _rot_90r   H / 2 - 1 - k    x            a quarter turn to the right
 *
 * with H / 2 rounded down. The rows between are not read. */
SIMGP_API simgp_plane_fn simgp_csc_1x2_to_1x1_rot_90l;
SIMGP_API simgp_plane_fn simgp_csc_1x2_to_1x1_rot_90r;

/* The chroma kernels by rotation code: simgp_csc_1x2_to_1x1 (layout.h), the two above, and NULL for
 * the codes from 3 to 5. Read-only. */
SIMGP_API extern simgp_plane_fn *const simgp_tbl_fn_csc_1x2_to_1x1_rot[6];

SIMGP_END_DECLS

#endif
