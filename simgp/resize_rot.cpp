// Resize and a turn in one pass.
#include "simgp/resize_rot.h"

#include "simgp/turn.h"

using namespace simgp;

// Of the source's even rows, the even bytes: as many columns as the destination has rows.
void simgp_rsz_8b_rot_90r_quarter(const void *src_plane, int32_t src_stride, int32_t dst_width,
                                  int32_t dst_height, int32_t dst_stride, void *dst_plane) {
    turn_right<samples::even_bytes>(lines_of(src_plane, 2 * ptrdiff_t(src_stride)), dst_height,
                                    dst_width, lines_of(dst_plane, dst_stride));
}
