/* Aligned memory, block copy, fills, integer logarithms, build stamp. */
#ifndef SCMN_MEM_H
#define SCMN_MEM_H

#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

/* Aligned blocks ----------------------------------------------------------------------------------
 *
 * Returns `size` bytes at an address that is a multiple of 32, or NULL if there is no memory. The
 * content is undefined. A size of 0 gives a block too, which must be released like any other.
 *
 * The block lies inside one of malloc() of size + 32 + sizeof(void *) bytes, whose address stands
 * in the pointer-sized word right below the returned one. A sum above 4 GiB - 1 gives NULL, on
 * 64-bit machines too, so that the answer does not depend on the machine.
 *
 * The fast pair is the same pair under a second name; either release function takes blocks of both,
 * on any thread. */
SIMGP_API void *scmn_malloc_align32(uint32_t size);
SIMGP_API void *scmn_malloc_fast_align32(uint32_t size);

/* Releases the block p of either function above; NULL is ignored. Nothing else may be passed. */
SIMGP_API void scmn_mfree_align32(void *p);
SIMGP_API void scmn_mfree_fast_align32(void *p);

/* Block copy --------------------------------------------------------------------------------------
 *
 * Copies `height` rows of `width` bytes. Consecutive rows begin dst_stride and src_stride bytes
 * apart; both may be negative, with dst and src then at the row that is copied first. A width or
 * height of 0 or less copies nothing. Only the width x height bytes are read and written, never
 * what lies between the rows. Source and destination rows must not overlap. */
SIMGP_API void scmn_blk_mcpy(void *dst, const void *src, int32_t dst_stride, int32_t src_stride,
                             int32_t width, int32_t height);

/* Fills -------------------------------------------------------------------------------------------
 *
 * Repeat the four bytes of `value`, lowest byte first, from dst on, in whole blocks:
 *
 *   function           bytes of whole blocks             tail
 *   scmn_mset_x128     128 x max(1, ceil(count / 128))   none: writes past count, to a whole block
 *   scmn_mset_x64      128 x floor(count / 128)          none: the last count % 128 bytes stay
 *   scmn_mset_x64a     64 x floor(count / 64)            the other count % 64 bytes
 *   scmn_mset_x32      32 x floor(count / 32)            none: the last count % 32 bytes stay
 *   scmn_mset_x32ax4   32 x floor(count / 32)            the other count % 32 bytes
 *
 * The bytes of a tail all get the low byte of `value`, so an exact fill of any count needs a value
 * of four equal bytes. `count` is in bytes; of 0 or less nothing is written, except that
 * scmn_mset_x128 always writes one block: there the destination must hold the whole blocks. Any
 * alignment of dst will do. Nothing else is written, nothing is read. */
SIMGP_API void scmn_mset_x128(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x64(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x64a(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x32(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x32ax4(void *dst, uint32_t value, int32_t count);

/* Clears whole blocks of 64 words (256 bytes): floor(count / 64) of them, where `count` is in
 * 32-bit words and should be a multiple of 64. The last count % 64 words stay; a count of 0 or less
 * clears nothing. Any alignment of dst will do. */
SIMGP_API void scmn_mclr_x64(void *dst, int32_t count);

/* Logarithms --------------------------------------------------------------------------------------
 *
 * Floor and ceiling of the base-2 logarithm of x: of 1 it is 0, of 5 it is 2 and 3, of 0xFFFFFFFF
 * it is 31 and 32. Both give -1 for 0. */
SIMGP_API int32_t scmn_floor_log2(uint32_t x);
SIMGP_API int32_t scmn_ceil_log2(uint32_t x);

/* Build stamp -------------------------------------------------------------------------------------
 *
 * Date and time of the build, as "Dec 27 2010 14:17:40\n" with a space before days of one digit, in
 * a static buffer of 64 bytes, ended by a 0, that every call writes anew with the same text, on any
 * thread; the caller does not release it and should not write to it. A build with
 * SOURCE_DATE_EPOCH in its environment has that moment, in UTC. */
SIMGP_API const char *scmn_version(void);

SIMGP_END_DECLS

#endif
