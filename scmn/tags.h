/* FourCC codes and WAVE format tags to media types. */
#ifndef SCMN_TAGS_H
#define SCMN_TAGS_H

#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

/* Media types: video from 100, audio from 300, DRM from 1100. */
enum {
    SCMN_MT_NONE = 0, /* scmn_fcc2mt recognised nothing */

    SCMN_MT_MPEG4 = 102,       /* MPEG-4 part 2 */
    SCMN_MT_H263 = 103,        /* ITU-T H.263 */
    SCMN_MT_H264 = 104,        /* ITU-T H.264 */
    SCMN_MT_WMV1 = 105,        /* Windows Media Video 7 */
    SCMN_MT_WMV2 = 106,        /* Windows Media Video 8 */
    SCMN_MT_WMV3 = 107,        /* Windows Media Video 9 */
    SCMN_MT_DIV3 = 110,        /* MS-MPEG4 version 3 */
    SCMN_MT_VID_UNKNOWN = 299, /* scmn_fcc2mt_vid recognised nothing */

    SCMN_MT_PCM = 300,         /* samples without a codec */
    SCMN_MT_ALAW = 301,        /* ITU-T G.711, A-law */
    SCMN_MT_MULAW = 302,       /* ITU-T G.711, mu-law */
    SCMN_MT_MPEGAUDIO = 304,   /* MPEG audio layers 1 and 2 */
    SCMN_MT_MP3 = 305,         /* MPEG audio layer 3 */
    SCMN_MT_AAC = 306,         /* MPEG-4 AAC */
    SCMN_MT_AC3 = 307,         /* AC-3 */
    SCMN_MT_DTS = 308,         /* DTS */
    SCMN_MT_AMRNB = 309,       /* AMR narrow-band */
    SCMN_MT_AMRWB = 310,       /* AMR wide-band */
    SCMN_MT_QCELP = 311,       /* QCELP speech */
    SCMN_MT_WMA = 312,         /* Windows Media Audio 1 and 2 */
    SCMN_MT_WMAPRO = 313,      /* Windows Media Audio, professional */
    SCMN_MT_WMALOSSLESS = 314, /* Windows Media Audio, lossless */
    SCMN_MT_EVRC = 321,        /* EVRC speech */
    SCMN_MT_AUD_UNKNOWN = 499, /* scmn_fcc2mt_aud recognised nothing */

    SCMN_MT_DRM = 1100,        /* content under the scheme that the FourCC DIVX signals */
    SCMN_MT_DRM_UNKNOWN = 1299 /* scmn_fcc2mt_drm recognised nothing */
};

/* The FourCC of four characters, as it is read from a file by a little-endian machine: the first
 * character is the lowest byte. SCMN_FOURCC('a', 'v', 'c', '1') is 0x31637661. */
#define SCMN_FOURCC(a, b, c, d)                                                            \
    ((uint32_t)(uint8_t)(a) | (uint32_t)(uint8_t)(b) << 8 | (uint32_t)(uint8_t)(c) << 16 | \
     (uint32_t)(uint8_t)(d) << 24)

/* The media type (SCMN_MT_*) of a tag: a FourCC as SCMN_FOURCC makes it, or the number of a WAVE
 * format (wFormatTag). Any 32-bit value may be given. Only the spellings listed are known; upper
 * and lower case are different.
 *
 * scmn_fcc2mt_aud, numbers of WAVE formats and FourCCs (the _ of aac_ is a space):
 *
 *   SCMN_MT_PCM           1
 *   SCMN_MT_ALAW          6
 *   SCMN_MT_MULAW         7
 *   SCMN_MT_MPEGAUDIO     0x50
 *   SCMN_MT_MP3           0x55
 *   SCMN_MT_AAC           0xFF aac_ mp4a
 *   SCMN_MT_AC3           0x2000
 *   SCMN_MT_DTS           0x2001
 *   SCMN_MT_AMRNB         samr
 *   SCMN_MT_AMRWB         sawb
 *   SCMN_MT_QCELP         sqcp dqcp
 *   SCMN_MT_WMA           0x160 0x161
 *   SCMN_MT_WMAPRO        0x162
 *   SCMN_MT_WMALOSSLESS   0x163
 *   SCMN_MT_EVRC          evrc
 *   SCMN_MT_AUD_UNKNOWN   everything else
 *
 * scmn_fcc2mt_vid:
 *
 *   SCMN_MT_MPEG4         DX50 dx50 DIVX divx XVID xvid DIV4 div4 FMP4 MP4V mp4v M4S2 m4s2
 *   SCMN_MT_H263          H263 h263 d263 s263
 *   SCMN_MT_H264          AVC1 avc1 avcC H264 h264 x264
 *   SCMN_MT_WMV1          WMV1 wmv1
 *   SCMN_MT_WMV2          WMV2 wmv2
 *   SCMN_MT_WMV3          WMV3 wmv3
 *   SCMN_MT_DIV3          DIV3 div3
 *   SCMN_MT_VID_UNKNOWN   everything else
 *
 * scmn_fcc2mt_drm:
 *
 *   SCMN_MT_DRM           DIVX divx
 *   SCMN_MT_DRM_UNKNOWN   everything else
 *
 * scmn_fcc2mt: what scmn_fcc2mt_aud knows, else what scmn_fcc2mt_vid knows, else what
 * scmn_fcc2mt_drm knows, else SCMN_MT_NONE. DIVX is SCMN_MT_MPEG4 here.
 *
 * Tags that mean something else in other places:
 *
 *   DIV4   in AVI files is most often MS-MPEG4 version 3 at a low motion setting, the codec of
 *          DIV3, not MPEG-4 part 2. Such a picture has no start codes, so scmn_is_vkeyfrm answers 0
 *          to all of them.
 *   mp4a   in MP4 files says that an MPEG-4 audio description follows; what it describes is AAC
 *          nearly always, but may be MP3 or others. The object type in the description ('esds')
 *          decides.
 *   mp4v   in MP4 files likewise: MPEG-4 part 2 nearly always, but MPEG-1, MPEG-2 and JPEG exist.
 *
 * A container that spells its tags differently has to be translated first: MP43 and MPG3 for DIV3,
 * say.
 *
 * Pure functions; any thread. */
SIMGP_API int32_t scmn_fcc2mt_aud(uint32_t tag);
SIMGP_API int32_t scmn_fcc2mt_vid(uint32_t tag);
SIMGP_API int32_t scmn_fcc2mt_drm(uint32_t tag);
SIMGP_API int32_t scmn_fcc2mt(uint32_t tag);

SIMGP_END_DECLS

#endif
