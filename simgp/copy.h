/* Plane copy. */
#ifndef SIMGP_COPY_H
#define SIMGP_COPY_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Copies a picture into another of the same format, plane by plane; nothing is scaled or converted.
 *
 *   src   the source: format, and of each plane width[], height[], stride[] and plane[] are read
 *   dst   the destination: format, stride[] and plane[] are read; its planes must have room for the
 *         source's width[] and height[], its own are not read
 *
 *   format                                        planes           kernel
 *   YUV400                                        0                simgp_cpy_8b
 *   NV12, NV21                                    0, 1             simgp_cpy_8b, simgp_cpy_16b
 *   every other code from 1 to 99 but T64X32      0, 1, 2          simgp_cpy_8b
 *   RGB565, BGR565, every code from 200 to 299    0                simgp_cpy_16b
 *
 * Returns SIMGP_OK after the copy, SIMGP_ERR_PARAM if the formats differ, SIMGP_ERR_UNSUPPORTED for
 * every other format, the tiled, packed, 24-bit and 32-bit ones among them. Both are decided from
 * the formats alone, before anything is written. A plane whose width or height is 0 or less is left
 * alone. Reads and writes the samples and nothing between the lines. Source and destination must
 * not overlap. Any number of calls may run at once on separate destinations. */
SIMGP_API int32_t simgp_cpy(const simgp_img *src, const simgp_img *dst);

/* One plane of `height` rows of `width` samples of 1, 2, 3 or 4 bytes, in the order in which they
 * lie; the parameters are explained at simgp_plane_fn (img.h). Strides are in bytes and may be
 * negative; simgp_cpy_16b takes an odd stride for the next lower even number.
 *
 * Reads and writes the samples and never what lies between the rows; planes without gaps are copied
 * as one block. A width or height of 0 or less copies nothing. Source and destination must not
 * overlap. Any number of calls may run at once on separate destinations. */
SIMGP_API simgp_plane_fn simgp_cpy_8b;
SIMGP_API simgp_plane_fn simgp_cpy_16b;
SIMGP_API simgp_plane_fn simgp_cpy_24b;
SIMGP_API simgp_plane_fn simgp_cpy_32b;

SIMGP_END_DECLS

#endif
