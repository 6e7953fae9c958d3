/* The 64 x 32 tiled layout of NV12 pictures. */
#ifndef SIMGP_TILE_H
#define SIMGP_TILE_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* The layout ------------------------------------------------------------------------------------
 *
 * A tiled picture of W x H pixels has a plane of luma, W bytes x H rows, and a plane of chroma,
 * byte pairs U V, W bytes x H / 2 rows (rounded down). Of its descriptor, width[0] and height[0]
 * say W and H; the strides are not used.
 *
 * Each plane is cut into tiles of 64 bytes x 32 rows, and each tile lies in 2048 bytes, row after
 * row. Tiles of two tile rows lie together, in groups of four: with T0 T1 T2 ... the tiles of the
 * upper and B0 B1 B2 ... those of the lower row, memory holds
 *
 *   T0 T1 B0 B1   B2 B3 T2 T3   T4 T5 B4 B5   B6 B7 T6 T7   ...
 *
 * An odd number of tile columns leaves empty places in the last group. A last tile row without a
 * partner lies in plain order, T0 T1 T2 ..., in whole groups.
 *
 * So a plane of `rows` rows takes, with R = ceil(rows / 32) tile rows,
 *
 *   8192 ceil(W / 128) floor(R / 2) bytes, and 8192 ceil(W / 256) more if R is odd.
 *
 * W should be even; what an odd W does is said below. Bytes of a tile that lie outside the picture
 * are neither read nor written, except as said below of an odd W or H. */

/* Where byte x of row y lies, in bytes from the start of a tiled plane of `width` bytes x `height`
 * rows. For a chroma plane, width is W and height is H / 2. x lies in 0 ... width - 1 and y in
 * 0 ... height - 1, which is not checked; the plane must be smaller than 2 GiB. */
SIMGP_API int32_t simgp_get_tile_offset(int32_t width, int32_t height, int32_t x, int32_t y);

/* Planes --------------------------------------------------------------------------------------
 *
 * Strides are in bytes and may be negative. No pointer needs to be aligned. A width or height of 0
 * or less writes nothing. Source and destination must not share memory. Any number of calls may run
 * at once on separate destinations. */

/* Copies a tiled plane of `width` bytes x `height` rows, at src, to rows of `width` bytes,
 * dst_stride apart, at dst. */
SIMGP_API void simgp_csc_copy_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                              int32_t dst_stride, uint8_t *dst);

/* Takes a tiled plane of byte pairs, `width` bytes x `height` rows, at src, apart: bytes 0, 2, 4,
 * ... of a row go to dst_u, whose rows lie stride_u apart, bytes 1, 3, 5, ... to dst_v, stride_v
 * apart. An odd width gives one U more than V. */
SIMGP_API void simgp_csc_unpack_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                                int32_t stride_u, uint8_t *dst_u, int32_t stride_v,
                                                uint8_t *dst_v);

/* Whole pictures --------------------------------------------------------------------------------
 *
 * The parameters are explained at simgp_csc_fn (img.h). Of the widths and heights, entry 0 is read,
 * of the strides those of linear pictures; they may be negative. Any size works, of 0 or less
 * nothing is written. No pointer needs to be aligned. Source and destination must not share memory.
 * Any number of calls may run at once on separate destinations. */

/* To NV12: both planes as simgp_csc_copy_tiles_to_linear does, the second of W bytes x H / 2 rows.
 * An odd W or H leaves the last chroma byte of each row, or the last chroma row, unwritten. */
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_nv12;

/* To YUV420: luma the same way, chroma as simgp_csc_unpack_tiles_to_linear does, of W bytes x H / 2
 * rows. An odd W leaves the last V of each row unwritten, an odd H the last row of U and V. */
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_yuv420;

/* From YUV420. Of chroma, (W + 1) / 2 pairs x H / 2 rows are read and written: with an odd W, the V
 * of the last pair lies one byte beyond W, inside its tile. */
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_t64x32;

/* To RGB, W x H pixels, with the matrix of simgp_csc_nv12_to_rgb565 (yuv2rgb.h). Pixel (x, y) takes
 * the chroma pair in bytes x and x + 1 (x rounded down to even) of chroma row y / 2. With an odd H
 * the last row of pixels takes chroma row H / 2, below the picture but inside its tile. Where H / 2
 * is a multiple of 32, there is no such tile: the last chroma row is used again, or, with H = 1,
 * chroma 128. The destination's stride is rounded down to whole pixels. */
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_bgra8888;

SIMGP_END_DECLS

#endif
