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
 * These pairs have a kernel, named simgp_csc_FROM_to_TO, whose notes hold:
 *
 *   from       to
 *   YUV400     RGB565
 *   YUV420     RGB565 BGR565 RGB888 BGR888 RGBA8888 BGRA8888 ARGB8888 YUV422N YV12 NV12 NV21 T64X32
 *   YUV422N    RGB565 BGR565 YUV420 YV12
 *   YUV422W    RGB565 BGR565
 *   YUV444     RGB565 BGR565
 *   YV12       RGB565 BGR565 RGB888
 *   YV16       YV12 YUV420
 *   NV12       RGB565 BGR565 RGB888 YUV420 YV12
 *   NV21       RGB565 BGR565 RGB888 YUV420 YV12
 *   T64X32     RGB565 BGRA8888 NV12 YUV420
 *   UYVY       RGB565 BGR565 RGB888 BGR888 RGBA8888 BGRA8888 ARGB8888
 *   YUYV       RGB565 RGB888
 *   RGB565     YUV420 YV12 NV12 NV21
 *   RGB888     YUV420 YV12 NV12 NV21 RGB565
 *   BGR888     YUV420 YV12
 *   RGBA8888   RGB565
 *
 * From the YUV formats to RGB see yuv2rgb.h, from UYVY and YUYV packed2rgb.h, from and to T64X32
 * tile.h, among the others layout.h, from RGB rgb2yuv.h.
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
