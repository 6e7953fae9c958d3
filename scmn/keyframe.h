/* Which coded pictures can be decoded on their own. */
#ifndef SCMN_KEYFRAME_H
#define SCMN_KEYFRAME_H

#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

/* Is a coded picture a key frame, where playback can start? Returns 1 if it is, and 0 for
 * everything else, nothing found to decide on included: unknown media type, size of 0 or less, no
 * start code, or a deciding byte beyond the end.
 *
 *   media_type   a video code of tags.h, or 111; every other number gives 0
 *   buf          the picture as it was coded, first byte first; no alignment is needed
 *   size         its size in bytes; of 0 or less buf may be NULL
 *
 * What decides, bytes in memory order:
 *
 *   SCMN_MT_H264    the first slice behind a start code 00 00 01 (ITU-T H.264 Annex B), by the low
 *                   five bits of the byte behind it: 5, a slice of an IDR picture, gives 1; 1, any
 *                   other slice, gives 0; parameter sets, SEI, delimiters and the rest are passed
 *                   over
 *   SCMN_MT_MPEG4   the first VOP start code 00 00 01 B6: the top two bits of the next byte are 00
 *                   (I-VOP)
 *   SCMN_MT_H263    the first picture start code 00 00 80 .. 83: the picture coding type in PTYPE,
 *   and 111         or in PLUSPTYPE where that is present, is intra (ITU-T H.263, 5.1)
 *   SCMN_MT_WMV1,   the top two bits of the first byte are 00
 *   SCMN_MT_DIV3
 *   SCMN_MT_WMV2    the top bit of the first byte is 0
 *   others          never a key frame, SCMN_MT_WMV3 included
 *
 * Only bytes of the buffer are read, from front to back up to the deciding one.
 *
 * What to know about real streams:
 *
 * - MP4 files (and Matroska) store H.264 with the length of each unit in front of it, in 1, 2 or 4
 *   bytes, instead of start codes. Write 00 00 00 01 over each 4-byte length first; without start
 *   codes the answer is 0, or a chance hit, since lengths of 256 to 511 look like a start code
 *   (00 00 01 xx).
 * - "Key frame" here is a picture after which nothing refers to anything before it. An H.264
 *   I-picture that is no IDR picture gives 0, the recovery points of open groups of pictures and of
 *   intra refresh too, although containers mark them as places to seek to. An MPEG-4 I-VOP gives 1
 *   even where B-VOPs behind it refer to the picture before.
 * - AVI files with packed B-frames carry two MPEG-4 pictures in one packet and later a placeholder,
 *   a few bytes long, that repeats the picture before it. The first picture of a packet decides,
 *   and the placeholder's answer is whatever coding type it repeats, not whether one can start
 *   there.
 * - The tags mp4v and DIV4 are not always what tags.h takes them for; see there.
 *
 * Pure function; any thread. The scan runs at the speed of memory: on a whole stream, call it once
 * for each picture, not once for each byte. */
SIMGP_API int32_t scmn_is_vkeyfrm(int32_t media_type, const uint8_t *buf, int32_t size);

SIMGP_END_DECLS

#endif
