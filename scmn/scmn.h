/* scmn: the small chores around a media pipeline, beside the pictures of simgp.
 *
 * What is here:
 *
 *   mem.h        32-byte aligned blocks, strided block copy, fast fills, log2, the build stamp
 *   bits.h       bit readers (most or least significant bit first) and a bit writer
 *   tags.h       FourCC and WAVE format tag -> media type
 *   irsz.h       a resizer for pictures that arrive in bands of lines
 *   keyframe.h   may playback start at this coded picture?
 *
 * A demultiplexer uses the last two like this. It has the tag of the video track as the container
 * stores it, first character in the lowest byte, and one packet after the other:
 *
 *     int32_t type = scmn_fcc2mt(SCMN_FOURCC('a', 'v', 'c', '1'));      SCMN_MT_H264
 *     ...
 *     if (scmn_is_vkeyfrm(type, packet, packet_size)) remember_seek_point(time);
 *
 * and a parser that wants to look into the packet lays a reader over it, which allocates nothing:
 *
 *     scmn_bsr_ctx bits;
 *     scmn_bsr_init(&bits, packet, packet_size, NULL);
 *     uint32_t profile = scmn_bsr_read(&bits, 8);
 *
 * What holds for every function:
 *
 * - The results are the same on every processor. Integers have 32 bits, pointers and the words that
 *   hold pointers are native.
 * - Nothing outside the buffers that are given is read or written, unless the function says so; no
 *   buffer needs padding or alignment.
 * - Nothing is allocated but by the aligned allocator and by scmn_irsz_create. No threads, no state
 *   that a caller can see, nothing to start up or shut down. All functions may run on any number of
 *   threads at once, on separate contexts and destinations.
 * - Failures are reported in the returned value and nowhere else. Arguments outside their range are
 *   not checked, unless the function says what it does with them; no pointer may be NULL, unless it
 *   says so.
 */
#ifndef SCMN_SCMN_H
#define SCMN_SCMN_H

#include "scmn/bits.h"
#include "scmn/irsz.h"
#include "scmn/keyframe.h"
#include "scmn/mem.h"
#include "scmn/tags.h"

#endif
