#include "scmn/tags.h"

static constexpr uint32_t tag(const char (&name)[5]) {
    return SCMN_FOURCC(name[0], name[1], name[2], name[3]);
}

int32_t scmn_fcc2mt_aud(uint32_t x) {
    switch (x) {
        case 0x01:
            return SCMN_MT_PCM;
        case 0x06:
            return SCMN_MT_ALAW;
        case 0x07:
            return SCMN_MT_MULAW;
        case 0x50:
            return SCMN_MT_MPEGAUDIO;
        case 0x55:
            return SCMN_MT_MP3;
        case 0xFF:
        case tag("aac "):
        case tag("mp4a"):
            return SCMN_MT_AAC;
        case 0x2000:
            return SCMN_MT_AC3;
        case 0x2001:
            return SCMN_MT_DTS;
        case tag("samr"):
            return SCMN_MT_AMRNB;
        case tag("sawb"):
            return SCMN_MT_AMRWB;
        case tag("sqcp"):
        case tag("dqcp"):
            return SCMN_MT_QCELP;
        case 0x160:
        case 0x161:
            return SCMN_MT_WMA;
        case 0x162:
            return SCMN_MT_WMAPRO;
        case 0x163:
            return SCMN_MT_WMALOSSLESS;
        case tag("evrc"):
            return SCMN_MT_EVRC;
        default:
            return SCMN_MT_AUD_UNKNOWN;
    }
}

int32_t scmn_fcc2mt_vid(uint32_t x) {
    switch (x) {
        case tag("DX50"):
        case tag("dx50"):
        case tag("DIVX"):
        case tag("divx"):
        case tag("XVID"):
        case tag("xvid"):
        case tag("DIV4"):
        case tag("div4"):
        case tag("FMP4"):
        case tag("MP4V"):
        case tag("mp4v"):
        case tag("M4S2"):
        case tag("m4s2"):
            return SCMN_MT_MPEG4;
        case tag("H263"):
        case tag("h263"):
        case tag("d263"):
        case tag("s263"):
            return SCMN_MT_H263;
        case tag("AVC1"):
        case tag("avc1"):
        case tag("avcC"):
        case tag("H264"):
        case tag("h264"):
        case tag("x264"):
            return SCMN_MT_H264;
        case tag("WMV1"):
        case tag("wmv1"):
            return SCMN_MT_WMV1;
        case tag("WMV2"):
        case tag("wmv2"):
            return SCMN_MT_WMV2;
        case tag("WMV3"):
        case tag("wmv3"):
            return SCMN_MT_WMV3;
        case tag("DIV3"):
        case tag("div3"):
            return SCMN_MT_DIV3;
        default:
            return SCMN_MT_VID_UNKNOWN;
    }
}

int32_t scmn_fcc2mt_drm(uint32_t x) {
    switch (x) {
        case tag("DIVX"):
        case tag("divx"):
            return SCMN_MT_DRM;
        default:
            return SCMN_MT_DRM_UNKNOWN;
    }
}

int32_t scmn_fcc2mt(uint32_t x) {
    if (const int32_t audio = scmn_fcc2mt_aud(x); audio != SCMN_MT_AUD_UNKNOWN) return audio;
    if (const int32_t video = scmn_fcc2mt_vid(x); video != SCMN_MT_VID_UNKNOWN) return video;
    const int32_t drm = scmn_fcc2mt_drm(x);
    return drm == SCMN_MT_DRM_UNKNOWN ? SCMN_MT_NONE : drm;
}
