/* RGB to YUV 4:2:0, and 24-bit and 32-bit RGB to RGB565. */
#ifndef SIMGP_RGB2YUV_H
#define SIMGP_RGB2YUV_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* ITU-R BT.601, limited range, with 8 fractional bits; >> rounds toward minus infinity:
 *
 *   Y = ((66 R + 129 G + 25 B) >> 8) + 16                 16 ... 235; not rounded
 *   U = ((-38 R - 74 G + 112 B + 128) >> 8) + 128         16 ... 240
 *   V = ((112 R - 94 G - 18 B + 128) >> 8) + 128          16 ... 240
 *
 * Every pixel gives luma. Chroma is never averaged: the top left pixel of each block of 2 x 2 gives
 * it. Pure red becomes Y = 81, U = 90, V = 240. Channels of an RGB565 word are widened by shifting
 * alone, so its white is 248, 252, 248: Y = 231, U = 127, V = 127.
 *
 * The parameters are explained at simgp_csc_fn (img.h); of the widths and heights only entry 0 is
 * read.
 *
 *   source        src_planes[0], H lines of W pixels. 24-bit lines lie src_strides[0] bytes apart;
 *                 RGB565 lines that many rounded down to an even number; RGBA8888 lines that many
 *                 rounded down to a multiple of 4. Alpha is dropped.
 *   destination   as drawn at the format's code (img.h); dst_planes[k] with dst_strides[k]. H lines
 *                 of W luma samples, and H / 2 lines of W / 2 chroma samples or pairs, both rounded
 *                 DOWN: the last column of an odd W and the last row of an odd H give luma only,
 *                 and the chroma column or line that the format has room for stays as it was.
 *
 * W is src_widths[0], H is src_heights[0]; of 0 or less nothing is written. Read are the W x H
 * pixels, written the samples named above: nothing beyond, no padding. No pointer needs to be
 * aligned. Strides may be negative, rounded toward minus infinity where they are rounded. Strides
 * shorter than a line are taken as they are: lines that overlap in a destination are written from
 * top to bottom. Source and destination must not share memory, nor must the destination's planes.
 * Pure functions: any number of calls may run at once on separate destinations. */
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_nv21;

SIMGP_API simgp_csc_fn simgp_csc_bgr888_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_bgr888_to_yv12;

SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_nv21;

/* The word (R >> 3) << 11 | (G >> 2) << 5 | B >> 3 of each pixel, low byte first: the low bits of
 * the channels are dropped. The source is the same, with the same rules; the destination is
 * dst_planes[0], H lines of W words, dst_strides[0] bytes apart, rounded down to an even number. */
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_rgba8888_to_rgb565;

SIMGP_END_DECLS

#endif
