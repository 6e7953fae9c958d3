#include "scmn/keyframe.h"

#include "rows/choose.h"
#include "scmn/tags.h"

namespace simgp::scalar {

ptrdiff_t find_code(const uint8_t *p, ptrdiff_t count, uint8_t mask, uint8_t code) {
    ptrdiff_t x = 0;
    while (x < count && (p[x] | p[x + 1] | ((p[x + 2] & mask) ^ code)) != 0) x++;
    return x;
}

void fill_keyframe(keyframe_rows &t) { t.find_code = find_code; }

}  // namespace simgp::scalar

namespace {

// The start codes 00 00 01 in buf at which `after` bytes follow the 01, in order.
struct start_codes {
    const uint8_t *buf;
    ptrdiff_t count;  // offsets that a start code can have
    ptrdiff_t k;

    start_codes(const uint8_t *data, ptrdiff_t size, int after)
        : buf(data), count(size - after - 2), k(-1) {}

    // The next start code, which is then buf[k .. k + 2].
    bool next() {
        if (++k >= count) return false;
        k += simgp::live_rows().keyframe.find_code(buf + k, count - k, 0xFF, 0x01);
        return k < count;
    }
};

// Rec. ITU-T H.264, 7.3.1: the low five bits of the byte behind the start code are nal_unit_type.
bool h264_key(const uint8_t *buf, ptrdiff_t size) {
    for (start_codes codes(buf, size, 1); codes.next();) {
        const int nal_unit_type = buf[codes.k + 3] & 0x1F;
        if (nal_unit_type == 5) return true;   // a slice of an IDR picture
        if (nal_unit_type == 1) return false;  // a slice of another picture
    }
    return false;
}

// ISO/IEC 14496-2, 6.2.5: vop_coding_type is two bits behind vop_start_code, 0 for I.
bool mpeg4_key(const uint8_t *buf, ptrdiff_t size) {
    for (start_codes codes(buf, size, 2); codes.next();)
        if (buf[codes.k + 3] == 0xB6) return buf[codes.k + 4] >> 6 == 0;
    return false;
}

// Rec. ITU-T H.263, 5.1: start code of 22 bits, temporal reference of 8 bits, PTYPE.
bool h263_key(const uint8_t *buf, ptrdiff_t size) {
    const ptrdiff_t count = size - 6;
    if (count <= 0) return false;
    const ptrdiff_t k = simgp::live_rows().keyframe.find_code(buf, count, 0xFC, 0x80);
    if (k == count) return false;
    const uint8_t *b = buf + k;
    const int source_format = b[4] >> 2 & 7;
    if (source_format != 7) return (b[4] & 0x02) == 0;
    // PLUSPTYPE: update of the optional part (UFEP), that part if UFEP is 1, picture type code.
    const int ufep = (b[4] & 3) << 1 | b[5] >> 7;
    if (ufep != 1) return (b[5] & 0x70) == 0;
    return k + 7 < size && (b[7] & 0x1C) == 0;
}

constexpr int32_t media_type_h263_too = 111;  // no tag leads to it

}  // namespace

int32_t scmn_is_vkeyfrm(int32_t media_type, const uint8_t *buf, int32_t size) {
    if (size <= 0) return 0;
    switch (media_type) {
        case SCMN_MT_H264:
            return h264_key(buf, size);
        case SCMN_MT_MPEG4:
            return mpeg4_key(buf, size);
        case SCMN_MT_H263:
        case media_type_h263_too:
            return h263_key(buf, size);
        case SCMN_MT_WMV1:
        case SCMN_MT_DIV3:
            return buf[0] < 0x40;
        case SCMN_MT_WMV2:
            return buf[0] < 0x80;
        default:
            return 0;
    }
}
