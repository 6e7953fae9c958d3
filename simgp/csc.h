/* Colour conversion by descriptor: one function for every pair of formats. */
#ifndef SIMGP_CSC_H
#define SIMGP_CSC_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Converts the picture src into the format of dst; the size is that of src, nothing is scaled.
 *
 *   src   the source: format, and what the kernel reads of width[], height[], stride[] and plane[]
 *   dst   the destination: format, stride[] and plane[] are read; its planes must have room for
 *         what the kernel writes, its own width[] and height[] are not read
 *
 * A pair of formats has a conversion if there is a kernel simgp_csc_FROM_to_TO, whose notes hold:
 * from the YUV formats to RGB in yuv2rgb.h, from UYVY and YUYV in packed2rgb.h, from and to T64X32
 * in tile.h, between the other YUV formats in layout.h, from RGB in rgb2yuv.h.
 *
 * Returns SIMGP_OK after the conversion, SIMGP_ERR_PARAM if both formats are the same (copying is
 * not conversion), SIMGP_ERR_UNSUPPORTED if there is no kernel for the pair. Both are decided from
 * the formats alone, before anything is written. Sizes, strides and pointers are trusted.
 *
 * Reads the visible samples of the source planes and writes the visible pixels of the destination
 * planes, nothing else: padding at the ends of lines is neither read nor written. Source and
 * destination must not share memory. Calls on separate destinations may run on any number of
 * threads at once. */
SIMGP_API int32_t simgp_csc(const simgp_img *src, const simgp_img *dst);

SIMGP_END_DECLS

#endif
