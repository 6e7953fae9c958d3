/* Colour conversion by descriptor: one entry for every pair of formats. */
#ifndef SIMGP_CSC_H
#define SIMGP_CSC_H

#include "simgp/img.h"

SIMGP_BEGIN_DECLS

/* Converts the picture src into the format of dst; the size is that of src, nothing is scaled.
 *
 *   src   the source; only read
 *   dst   the destination: its stride[], plane[] and format are read, its width[] and height[] are
 * not
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
