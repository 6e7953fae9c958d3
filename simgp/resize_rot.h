/* Resize and a turn in one pass. */
#ifndef SIMGP_RESIZE_ROT_H
#define SIMGP_RESIZE_ROT_H

#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

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
