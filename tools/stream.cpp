#include "tools/stream.h"

#include <string.h>

#include <algorithm>

#include "scmn/scmn.h"

namespace tools {

namespace {

constexpr size_t portion = 1 << 20;
// What is looked at behind a start code, at most: parameter sets have less than a kilobyte.
constexpr size_t look_ahead = 4096;

bool has_start_codes(int32_t media_type) {
    return media_type == SCMN_MT_H264 || media_type == SCMN_MT_MPEG4 || media_type == SCMN_MT_H263;
}

// The next 00 00 01 (H.263: 00 00 80 .. 83), or null.
const uint8_t *find_code(const uint8_t *from, const uint8_t *end, bool h263) {
    if (!h263) return static_cast<const uint8_t *>(memmem(from, size_t(end - from), "\0\0\1", 3));
    while (end - from >= 3) {
        const void *pair = memmem(from, size_t(end - from), "\0\0", 2);
        const uint8_t *code = static_cast<const uint8_t *>(pair);
        if (!code) return nullptr;
        while (end - code >= 3 && code[2] == 0) ++code;  // to the last two of a run
        if (end - code < 3) return nullptr;
        if ((code[2] & 0xFC) == 0x80) return code;
        from = code + 2;
    }
    return nullptr;
}

}  // namespace

const char *media_name(int32_t media_type) {
    switch (media_type) {
        case SCMN_MT_MPEG4:
            return "MPEG-4 part 2";
        case SCMN_MT_H263:
            return "H.263";
        case SCMN_MT_H264:
            return "H.264";
        case SCMN_MT_WMV1:
            return "Windows Media Video 7 (WMV1)";
        case SCMN_MT_WMV2:
            return "Windows Media Video 8 (WMV2)";
        case SCMN_MT_WMV3:
            return "Windows Media Video 9 (WMV3)";
        case SCMN_MT_DIV3:
            return "MS-MPEG4 version 3 (DIV3)";
        case SCMN_MT_PCM:
            return "PCM";
        case SCMN_MT_ALAW:
            return "A-law";
        case SCMN_MT_MULAW:
            return "mu-law";
        case SCMN_MT_MPEGAUDIO:
            return "MPEG audio layer 1 or 2";
        case SCMN_MT_MP3:
            return "MPEG audio layer 3";
        case SCMN_MT_AAC:
            return "AAC";
        case SCMN_MT_AC3:
            return "AC-3";
        case SCMN_MT_DTS:
            return "DTS";
        case SCMN_MT_AMRNB:
            return "AMR narrow-band";
        case SCMN_MT_AMRWB:
            return "AMR wide-band";
        case SCMN_MT_QCELP:
            return "QCELP";
        case SCMN_MT_WMA:
            return "Windows Media Audio 1 or 2";
        case SCMN_MT_WMAPRO:
            return "Windows Media Audio Professional";
        case SCMN_MT_WMALOSSLESS:
            return "Windows Media Audio Lossless";
        case SCMN_MT_EVRC:
            return "EVRC";
        default:
            return "unknown";
    }
}

coded_stream::coded_stream(input &in, int32_t media_type) : input_(in), media_type_(media_type) {
    if (media_type && !has_start_codes(media_type))
        throw fault(in.name(), ": ", media_name(media_type),
                    " has no start codes; only H.264, MPEG-4 and H.263 streams can be cut");
    read_more();
    if (window_.empty()) throw fault(in.name(), ": empty");
    if (media_type_) return;
    reject_containers();  // a container holds start codes too
    media_type_ = recognise();
    if (!media_type_) reject();
}

int32_t coded_stream::recognise() const {
    const uint8_t *p = window_.data(), *end = p + window_.size();
    bool any = false, vop = false, slice = false, not_h264 = false;
    for (const uint8_t *code = p; (code = find_code(code, end, false)) && end - code > 3;
         code += 3) {
        any = true;
        vop |= code[3] == 0xB6;
        not_h264 |= code[3] >= 0x80;  // forbidden_zero_bit
        const int type = code[3] & 31;
        slice |= type == 1 || type == 5 || type == 7;
    }
    if (vop) return SCMN_MT_MPEG4;
    if (slice && !not_h264) return SCMN_MT_H264;
    // A picture start code, and the two fixed bits of the picture type (Rec. ITU-T H.263, 5.1.3).
    const uint8_t *h263 = find_code(p, end, true);
    if (!any && h263 && end - h263 > 3 && (h263[3] & 3) == 2) return SCMN_MT_H263;
    return 0;
}

void coded_stream::reject_containers() const {
    const auto at = [&](size_t place, std::string_view text) {
        return window_.size() >= place + text.size() &&
               memcmp(window_.data() + place, text.data(), text.size()) == 0;
    };
    using namespace std::string_view_literals;
    const char *container = at(4, "ftyp")                      ? "an MP4 or QuickTime"
                            : at(0, "RIFF")                    ? "an AVI or WAV"
                            : at(0, "\x30\x26\xB2\x75"sv)      ? "an ASF (WMV)"
                            : at(0, "\x1A\x45\xDF\xA3"sv)      ? "a Matroska"
                            : at(0, "FLV")                     ? "an FLV"
                            : at(0, "OggS")                    ? "an Ogg"
                            : at(0, "\0\0\1\xBA"sv)            ? "an MPEG program stream"
                            : at(0, "\x47") && at(188, "\x47") ? "an MPEG transport stream"
                                                               : nullptr;
    if (!container) return;
    if (at(0, "\x30\x26\xB2\x75"sv))
        throw fault(
            input_.name(),
            ": an ASF (WMV) file; Windows Media video has no elementary streams that could be "
            "listed (--fourcc WMV2 names a codec by its tag)");
    const std::string file = input_.name() == "standard input" ? "FILE" : "'" + input_.name() + "'";
    throw fault(
        input_.name(), ": ", container,
        " file, not an elementary stream; its video comes through a pipe: ffmpeg -v error -i ",
        file, " -map 0:v:0 -c copy -f h264 - | simgp-probe - (MPEG-4: -f m4v, H.263: -f h263)");
}

// Says what the bytes look like instead.
void coded_stream::reject() const {
    // Lengths of NAL units, each leading to the next.
    size_t place = 0;
    int units = 0;
    while (place + 5 <= window_.size() && units < 8) {
        const uint8_t *p = window_.data() + place;
        const size_t length = size_t(p[0]) << 24 | size_t(p[1]) << 16 | size_t(p[2]) << 8 | p[3];
        if (length == 0 || p[4] >= 0x80) break;
        place += 4 + length, units++;
    }
    if (units >= 2 && (place == window_.size() || units == 8))
        throw fault(
            input_.name(),
            ": H.264 with lengths in place of start codes, as in MP4; take it out of its file with "
            "start codes: ffmpeg -i FILE.mp4 -c copy -an -f h264 OUT.h264");
    throw fault(input_.name(), ": no start codes of H.264, MPEG-4 or H.263 in the first ",
                window_.size(), " bytes");
}

// Drops what has been searched and reads a portion; false at the end.
bool coded_stream::read_more() {
    if (ended_) return false;
    const size_t done = at_ > 0 ? at_ - 1 : 0;  // a zero byte before a start code belongs to it
    window_.erase(window_.begin(), window_.begin() + ptrdiff_t(done));
    window_offset_ += done;
    at_ -= done;
    const size_t kept = window_.size();
    window_.resize(kept + portion);
    const size_t got = input_.read(window_.data() + kept, portion);
    window_.resize(kept + got);
    ended_ = got < portion;
    return true;
}

bool coded_stream::find(unit &u) {
    const bool h263 = media_type_ == SCMN_MT_H263;
    for (;;) {
        const uint8_t *begin = window_.data(), *end = begin + window_.size();
        const uint8_t *code = find_code(begin + at_, end, h263);
        if (code && (ended_ || size_t(end - code) >= look_ahead)) {
            at_ = size_t(code - begin) + 3;
            if (end - code < 4) return false;  // cut off
            // The first of four bytes 00 00 00 01 is part of the start code in H.264.
            const bool four = media_type_ == SCMN_MT_H264 && code > begin && code[-1] == 0;
            u = {window_offset_ + size_t(code - begin) - four, code,
                 std::min(size_t(end - code), look_ahead)};
            return true;
        }
        // The last two bytes may begin a start code.
        at_ = code ? size_t(code - begin)
                   : std::max(at_, window_.size() - std::min<size_t>(window_.size(), 2));
        if (!read_more()) return false;
    }
}

coded_stream::role coded_stream::role_of(const unit &u) {
    if (media_type_ == SCMN_MT_H263) {
        about_.add(h263_description(u.bytes, u.size));
        return role::picture;
    }
    if (media_type_ == SCMN_MT_H264) {
        const h264::role r = h264_.role_of(u.bytes + 3, u.size - 3);
        about_.add(h264_.about());
        if (r == h264::role::header) return role::header;
        // Behind a header every slice is one of a new picture.
        const int type = u.bytes[3] & 31;
        const bool first = !has_picture_ && (type == 1 || type == 2 || type == 5);
        return first || r == h264::role::slice ? role::picture : role::more;
    }
    switch (u.bytes[3]) {
        case 0xB6:
            return role::picture;
        case 0xB1:  // end of the sequence
        case 0xB7:
            return role::more;  // slice
        default:
            about_.add(mpeg4_description(u.bytes, u.size));
            return role::header;
    }
}

bool coded_stream::next(coded_picture &picture) {
    unit u;
    while (find(u)) {
        const role r = role_of(u);
        if (r == role::more) continue;
        const bool complete = has_picture_;
        if (complete) {
            picture = current_;
            picture.size = u.offset - current_.offset;
            started_ = has_picture_ = false;
        }
        if (!started_) {
            started_ = true;
            current_.offset = u.offset;
        }
        if (r == role::picture) {
            has_picture_ = true;
            // The slice that has been found decides in H.264, not what may follow.
            const size_t size = media_type_ == SCMN_MT_H264 ? 4 : u.size;
            current_.key = scmn_is_vkeyfrm(media_type_, u.bytes, int32_t(size));
        }
        if (complete) return true;
    }
    if (!has_picture_) return false;
    has_picture_ = false;
    picture = current_;
    picture.size = window_offset_ + window_.size() - current_.offset;
    return true;
}

}  // namespace tools
