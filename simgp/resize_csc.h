/* Bilinear resize and conversion to RGB565 in one pass. */
#ifndef SIMGP_RESIZE_CSC_H
#define SIMGP_RESIZE_CSC_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Resizes a picture of 4:2:0 to the size of the destination's descriptor and converts it to RGB565.
 *
 *   src   format and plane[] are read; of YUV420 also stride[], and width[] and height[] of planes
 *         0 and 1, plane 2 having the size of plane 1; of T64X32 also width[0] and height[0]
 *   dst   format, RGB565, width[0], height[0], stride[0] and plane[0] are read
 *
 * Luma and chroma are resized as simgp_rsz does (resize.h), from the size of their planes to W x H
 * samples of luma and ceil(W / 2) x ceil(H / 2) of chroma; pixel (x, y) takes chroma sample
 * (x / 2, y / 2), and the matrix of the other conversions (yuv2rgb.h). So this is what a resize of
 * the planes and a conversion give, without the picture between them. The exceptions are odd
 * heights, where some of the conversions give the first row a chroma line of its own, and pictures
 * that keep their size, which are resampled here as well.
 *
 * Of T64X32, chroma is resized from width[0] / 2 pairs in a row, at least one, and from
 * ceil(height[0] / 2) rows. If height[0] is odd, the last of these is not in the plane: it is the
 * row that its tile has all the same; where there is no such tile the row above again, and mid-grey
 * if there is none.
 *
 * Returns SIMGP_OK; SIMGP_ERR_PARAM if both formats are the same; SIMGP_ERR_UNSUPPORTED for every
 * other pair; SIMGP_ERR_PARAM if a width or height that is read is below 1 or larger than the steps
 * can hold (simgp_rsz_get_step, resize.h). A call that fails has written nothing. Source and
 * destination must not share memory. Any number of calls may run at once on separate
 * destinations. */
SIMGP_API int32_t simgp_rsz_csc(const simgp_img *src, const simgp_img *dst);

/* The arrays are those of the two descriptors, entry k for plane k; the entries that are read are
 * those named above.
 *
 *   src_planes, src_widths    plane[] and width[] of the source
 *   src_heights               height[] of the source
 *   src_strides               stride[] of the source
 *   dst_widths, dst_heights   width[] and height[] of the destination
 *   dst_strides, dst_planes   stride[] and plane[] of the destination
 *
 * Sizes are not checked, and a destination of 0 x 0 pixels or less writes
 * nothing. The destination's stride is rounded down to an even number. Planes need no alignment. */
typedef void simgp_rsz_csc_fn(uint8_t *const *src_planes, const int32_t *src_widths,
                              const int32_t *src_heights, const int32_t *src_strides,
                              const int32_t *dst_widths, const int32_t *dst_heights,
                              const int32_t *dst_strides, uint8_t *const *dst_planes);

SIMGP_API simgp_rsz_csc_fn simgp_rsz_csc_yuv420_to_rgb565;
SIMGP_API simgp_rsz_csc_fn simgp_rsz_csc_t64x32_to_rgb565;

SIMGP_END_DECLS

#endif
