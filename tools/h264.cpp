#include "tools/h264.h"

#include <algorithm>
#include <vector>

#include "scmn/bits.h"

namespace tools {

namespace {

// The syntax elements of a NAL unit, without its first byte and its emulation prevention bytes.
class syntax {
  public:
    syntax(const uint8_t *nal, size_t size) {
        int zeros = 0;
        for (size_t i = 1; i < size; i++) {
            if (zeros >= 2 && nal[i] <= 3) {
                if (nal[i] != 3) break;  // the next start code
                zeros = 0;
                continue;
            }
            bytes_.push_back(nal[i]);
            zeros = nal[i] == 0 ? zeros + 1 : 0;
        }
        scmn_bsr_init(&bits_, bytes_.data(), int32_t(bytes_.size()), nullptr);
    }
    syntax(const syntax &) = delete;

    // u(n), ue(v), se(v)
    uint32_t u(int n) {
        const uint32_t value = scmn_bsr_read(&bits_, n);
        if (bits_.bits < 0 || (value == 0xFFFFFFFF && n < 32)) bad_ = true;
        return value;
    }
    bool flag() { return u(1) == 1; }
    uint32_t ue() {
        const int zeros = scmn_bsr_clz_in_code(scmn_bsr_peek(&bits_, 32));
        if (zeros > 31) {
            bad_ = true;
            return 0;
        }
        scmn_bsr_skip(&bits_, zeros);
        return u(zeros + 1) - 1;
    }
    int32_t se() {
        const uint32_t code = ue();
        return code & 1 ? int32_t(code / 2 + 1) : -int32_t(code / 2);
    }
    // An element was missing or impossible.
    bool bad() const { return bad_; }
    void fail_if(bool impossible) { bad_ |= impossible; }

  private:
    std::vector<uint8_t> bytes_;
    scmn_bsr_ctx bits_;
    bool bad_ = false;
};

void pass_scaling_list(syntax &s, int size) {
    int32_t last = 8, next = 8;
    for (int i = 0; i < size && !s.bad(); i++) {
        if (next != 0) next = (last + s.se()) & 255;
        if (next != 0) last = next;
    }
}

constexpr uint8_t profiles_with_chroma[] = {100, 110, 122, 244, 44,  83, 86,
                                            118, 128, 138, 139, 134, 135};

}  // namespace

void h264::read_sequence(const uint8_t *nal, size_t size) {
    syntax s(nal, size);
    sequence_parameters p;
    const uint32_t profile = s.u(8), constraints = s.u(8), level = s.u(8);
    uint32_t chroma = 1;
    const uint32_t id = s.ue();
    if (std::find(std::begin(profiles_with_chroma), std::end(profiles_with_chroma), profile) !=
        std::end(profiles_with_chroma)) {
        chroma = s.ue();
        if (chroma == 3) p.separate_planes = s.flag();
        s.ue();    // depth of luma
        s.ue();    // and chroma
        s.flag();  // lossless
        if (s.flag())
            for (int i = 0; i < (chroma == 3 ? 12 : 8); i++)
                if (s.flag()) pass_scaling_list(s, i < 6 ? 16 : 64);
    }
    p.frame_num_bits = s.ue() + 4;
    p.poc_type = s.ue();
    if (p.poc_type == 0) {
        p.poc_lsb_bits = s.ue() + 4;
    } else if (p.poc_type == 1) {
        p.delta_poc_is_zero = s.flag();
        s.se();
        s.se();
        const uint32_t cycle = s.ue();
        for (uint32_t i = 0; i < cycle && !s.bad(); i++) s.se();
    }
    s.ue();    // reference frames
    s.flag();  // gaps
    const uint64_t columns = uint64_t(s.ue()) + 1, rows = uint64_t(s.ue()) + 1;
    p.frames_only = s.flag();
    const int fields = p.frames_only ? 1 : 2;
    if (!p.frames_only) s.flag();  // blocks of fields
    s.flag();                      // direct prediction
    uint32_t crop[4] = {};         // left, right, top, bottom
    if (s.flag())
        for (uint32_t &c : crop) c = s.ue();
    s.fail_if(id > 31 || p.frame_num_bits > 16 || p.poc_lsb_bits > 16 || p.poc_type > 2);
    if (s.bad()) return;
    sequences_[id] = p;
    // Cropping is in samples of chroma, and in lines of both fields.
    const int across = chroma == 1 || chroma == 2 ? 2 : 1, down = (chroma == 1 ? 2 : 1) * fields;
    const int64_t width = int64_t(16 * columns) - across * (int64_t{crop[0]} + crop[1]);
    const int64_t height = int64_t(16 * rows) * fields - down * (int64_t{crop[2]} + crop[3]);
    description about;
    about.profile = h264_profile(profile, constraints, level);
    if (width > 0 && height > 0 && width <= 65536 && height <= 65536)
        about.width = int(width), about.height = int(height);
    about_.add(about);
}

void h264::read_picture(const uint8_t *nal, size_t size) {
    syntax s(nal, size);
    picture_parameters p;
    const uint32_t id = s.ue();
    p.sequence = s.ue();
    s.flag();  // entropy coding
    p.poc_delta_per_frame = s.flag();
    s.fail_if(id > 255 || p.sequence > 31);
    if (!s.bad()) pictures_[id] = p;
}

std::optional<h264::slice_header> h264::read_slice(const uint8_t *nal, size_t size) const {
    syntax s(nal, std::min<size_t>(size, 64));
    slice_header slice;
    slice.idr = (nal[0] & 31) == 5;
    slice.reference = nal[0] & 0x60;
    slice.first_block = s.ue();
    s.ue();  // kind of slice
    slice.parameters = s.ue();
    s.fail_if(slice.parameters > 255);
    if (s.bad()) return {};

    // Without the parameter sets, the rest cannot be read.
    const auto &picture = pictures_[slice.parameters];
    if (!picture || !sequences_[picture->sequence]) return slice;
    const sequence_parameters &sequence = *sequences_[picture->sequence];
    if (sequence.separate_planes) s.u(2);
    slice.frame_num = s.u(int(sequence.frame_num_bits));
    if (!sequence.frames_only) {
        slice.field = s.flag();
        if (slice.field) slice.bottom = s.flag();
    }
    if (slice.idr) slice.idr_id = s.ue();
    const bool bottom_delta = picture->poc_delta_per_frame && !slice.field;
    if (sequence.poc_type == 0) {
        slice.poc_lsb = s.u(int(sequence.poc_lsb_bits));
        if (bottom_delta) slice.poc_delta[2] = s.se();
    } else if (sequence.poc_type == 1 && !sequence.delta_poc_is_zero) {
        slice.poc_delta[0] = s.se();
        if (bottom_delta) slice.poc_delta[1] = s.se();
    }
    slice.complete = !s.bad();
    return slice;
}

h264::role h264::role_of(const uint8_t *nal, size_t size) {
    const int type = nal[0] & 31;
    if (type == 7) read_sequence(nal, size);
    if (type == 8) read_picture(nal, size);
    if ((type >= 6 && type <= 9) || (type >= 14 && type <= 18)) return role::header;
    if (type != 1 && type != 2 && type != 5) return role::more;

    const std::optional<slice_header> slice = read_slice(nal, size), last = last_;
    if (!slice) return last ? role::more : role::slice;
    last_ = slice;
    if (!last) return role::slice;
    const slice_header &a = *last, &b = *slice;
    bool other = a.idr != b.idr || a.parameters != b.parameters || (a.reference != b.reference);
    if (a.complete && b.complete)
        other |= a.frame_num != b.frame_num || a.field != b.field || a.bottom != b.bottom ||
                 a.idr_id != b.idr_id || a.poc_lsb != b.poc_lsb ||
                 !std::equal(a.poc_delta, a.poc_delta + 3, b.poc_delta);
    else
        other |= b.first_block == 0;
    return other ? role::slice : role::more;
}

}  // namespace tools
