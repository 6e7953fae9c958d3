/* Colour conversion between any two formats, with a choice of matrices. */
#ifndef SIMGP_CSC_ANY_H
#define SIMGP_CSC_ANY_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Colours: what Y, U and V mean. Video of less than 720 lines is BT.601 as a rule, HD is BT.709,
 * UHD is BT.2020; JPEG and many phones use the full range of BT.601.
 *
 * In the limited range black is Y = 16 and white 235, and chroma lies in 16 ... 240. In the full
 * range black is 0 and white 255, and chroma lies in 0 ... 255. */
enum {
    SIMGP_COLOUR_BT601 = 0,       /* ITU-R BT.601, limited range, as everywhere in the library */
    SIMGP_COLOUR_BT601_FULL = 1,  /* ITU-R BT.601, full range */
    SIMGP_COLOUR_BT709 = 2,       /* ITU-R BT.709, limited range */
    SIMGP_COLOUR_BT709_FULL = 3,  /* ITU-R BT.709, full range */
    SIMGP_COLOUR_BT2020 = 4,      /* ITU-R BT.2020, non-constant luminance, limited range */
    SIMGP_COLOUR_BT2020_FULL = 5, /* ITU-R BT.2020, non-constant luminance, full range */

    /* May be added to each of them: chroma that has to shrink is averaged (see below). */
    SIMGP_CHROMA_MEAN = 256
};

/* Converts the picture src into the format of dst; the size is that of src, nothing is scaled. Any
 * of the formats of img.h becomes any other, and is copied to itself.
 *
 *   src      the source: format, width[0], height[0], and stride[] and plane[] of its planes
 *   dst      the destination: format, stride[] and plane[] are read; its planes must have room for
 *            a picture of the size of the source, its own width[] and height[] are not read
 *   colour   SIMGP_COLOUR_*, the same for both directions, or that + SIMGP_CHROMA_MEAN
 *
 * Returns SIMGP_OK after the conversion, SIMGP_ERR_PARAM, with nothing written, if a format or the
 * colour is unknown. A width or height of 0 or less writes nothing and is SIMGP_OK.
 *
 * With SIMGP_COLOUR_BT601 alone, the pairs that simgp_csc has give what it gives, to the byte: its
 * kernels are called, and their notes hold, also those about odd sizes and about what they read of
 * width[] and height[]. For all other pairs, and for these with another colour or with
 * SIMGP_CHROMA_MEAN, what follows holds.
 *
 * From YUV to RGB, with 8 fractional bits. >> rounds toward minus infinity, clamp limits to
 * 0 ... 255:
 *
 *   Uc = U - 128, Vc = V - 128
 *   Yc = 298 (Y - 16) in the limited ranges, 256 Y in the full ones
 *   R = clamp((Yc + KR Vc + 128) >> 8)
 *   G = clamp((Yc - KGU Uc - KGV Vc + 128) >> 8)
 *   B = clamp((Yc + KB Uc + 128) >> 8)
 *
 *               KR    KGU   KGV   KB
 *   BT601       409   100   208   516
 *   BT601_FULL  359   88    183   454
 *   BT709       459   55    136   541
 *   BT709_FULL  403   48    120   475
 *   BT2020      430   48    167   548
 *   BT2020_FULL 378   42    146   482
 *
 * From RGB to YUV, with black = 16 in the limited ranges, 0 in the full ones:
 *
 *   Y = ((YR R + YG G + YB B) >> 8) + black
 *   U = clamp(((UR R + UG G + UB B + 128) >> 8) + 128)
 *   V = clamp(((VR R + VG G + VB B + 128) >> 8) + 128)
 *
 *               YR   YG   YB    UR   UG   UB    VR   VG    VB
 *   BT601       66   129  25    -38  -74  112   112  -94   -18
 *   BT601_FULL  77   150  29    -43  -85  128   128  -107  -21
 *   BT709       47   157  16    -26  -86  112   112  -102  -10
 *   BT709_FULL  54   184  18    -29  -99  128   128  -116  -12
 *   BT2020      58   149  13    -31  -81  112   112  -103  -9
 *   BT2020_FULL 67   174  15    -36  -92  128   128  -118  -10
 *
 * Grey stays grey both ways. YUV becomes YUV and RGB becomes RGB without a matrix, so there the
 * colour makes no difference. Grey pictures (YUV400) have chroma 128 as a source and keep luma
 * alone as a destination. Channels of 16-bit words are widened by shifting alone, and lose their
 * low bits on the way back. Alpha is carried from 32-bit formats to 32-bit formats, and is 255
 * where it has no source.
 *
 * Chroma. Sample (x / 2, y / 2) in 4:2:0, (x / 2, y) in YUV422N, YV16, UYVY and YUYV, (x, y / 2) in
 * YUV422W belongs to pixel (x, y); sizes round up, and every last column and row gets its chroma.
 * A destination's sample stands for the pixels that it belongs to, one, two or four of them; at
 * borders those that the picture has.
 *
 * - Where samples of the source stand for more pixels, they are repeated.
 * - Where they stand for fewer, the top left pixel of those that a destination's sample stands for
 *   gives it.
 * - With SIMGP_CHROMA_MEAN, all of these pixels give it. From RGB, it is that of the pixel whose R,
 *   G and B are the means of theirs; from YUV, it is the mean of their samples. Each mean is
 *   rounded to nearest, halves upward: (sum + 1) >> 1 of two, (sum + 2) >> 2 of four. Where nothing
 *   is averaged, the flag makes no difference to these rules.
 *
 * Odd sizes. Lines of UYVY and YUYV have 2 W bytes. With an odd W, the last pixel takes the V of
 * the group before, or 128 if there is none, and as a destination its own V is not written. T64X32
 * is read as simgp_csc_t64x32_to_rgb565 reads it (tile.h): with an odd H, the last row takes chroma
 * row H / 2 where there is such a tile row, else the last one, or 128. It is written as
 * simgp_csc_yuv420_to_t64x32 writes it: (W + 1) / 2 pairs in H / 2 rows, rounded down, also by a
 * copy.
 *
 * Strides may be negative. Those of 16-bit and 32-bit RGB are rounded down to whole pixels, toward
 * minus infinity, but in destinations whose source is linear YUV, where they are taken as they are,
 * odd ones too. No pointer needs to be aligned. Only the visible samples are read and written.
 * Source and destination must not share memory. Any number of calls may run at once on separate
 * destinations. */
SIMGP_API int32_t simgp_csc_any(const simgp_img *src, const simgp_img *dst, int32_t colour);

SIMGP_END_DECLS

#endif
