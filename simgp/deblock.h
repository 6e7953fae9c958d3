/* Deblocking of pictures that were coded in blocks of 8 x 8. */
#ifndef SIMGP_DEBLOCK_H
#define SIMGP_DEBLOCK_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* The filter is that of Rec. ITU-T H.263, Annex J, along all edges between blocks of 8 x 8 samples:
 * small steps, which coding leaves behind, are smoothed, large ones are kept. Across an edge lie
 * the samples A B | C D. With the strength s:
 *
 *     d  = (A - 4 B + 4 C - D) >> 3, rounded toward minus infinity
 *     t  = max(0, |d| - max(0, 2 (|d| - s)))
 *     d1 = t with the sign of d
 *     d2 = (A - D) >> 2, limited to -(t >> 1) ... t >> 1
 *
 *     A' = A - d2    B' = B + d1    C' = C - d1    D' = D + d2
 *
 * where B' and C' are limited to 0 ... 255; A' and D' never leave that range. With s = 4, 100 100 |
 * 112 112 becomes 102 104 | 108 110, and 50 50 | 150 150 stays. With s = 0 or below nothing
 * changes, and from 160 on, which |d| never exceeds, all strengths do the same.
 *
 * Edges lie before line 8 k and before column 8 k, for k = 1 ... (height >> 3) - 1 and k = 1 ...
 * (width >> 3) - 1: not at the border, nor at or behind the last whole block. The horizontal edges
 * are filtered first, from top to bottom over the whole width, then the vertical ones, from left to
 * right over the whole height.
 *
 *   plane           first sample of the first line of a plane of 8-bit samples; changed in place
 *   strength        any; simgp_dbf8x8 takes what is more than 12 for 12
 *   stride          bytes from one line to the next; may be negative
 *   width, height   samples in a line, lines; of planes without an inner edge nothing is changed
 *
 * Samples that are not next to an edge keep their values, and nothing outside the plane's lines is
 * read or written. Lines must not overlap. No pointer needs to be aligned. Any number of calls may
 * run at once on separate planes. */

/* Both kinds of edges of a plane. */
SIMGP_API void simgp_dbf8x8(uint8_t *plane, int16_t strength, int32_t stride, int32_t width,
                            int32_t height);

/* The horizontal edges alone, and the vertical edges alone. */
SIMGP_API void simgp_dbf8x8_h263_hor(uint8_t *plane, int16_t strength, int32_t stride,
                                     int32_t width, int32_t height);
SIMGP_API void simgp_dbf8x8_h263_ver(uint8_t *plane, int16_t strength, int32_t stride,
                                     int32_t width, int32_t height);

/* Both kinds of edges of the planes 0, 1 and 2 of a picture, as far as they are not NULL, each with
 * its width[], height[] and stride[]. The format is not read: all of them are taken for planes of
 * 8-bit samples.
 *
 * Returns SIMGP_OK, or SIMGP_ERR_PARAM, with nothing changed, if the strength is not 0 to 15. */
SIMGP_API int32_t simgp_dbf8x8_yuv(const simgp_img *img, int16_t strength);

SIMGP_END_DECLS

#endif
