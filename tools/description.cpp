#include "tools/description.h"

#include "scmn/bits.h"

namespace tools {

namespace {

// Bits one after the other; behind the end, 0.
class bits {
  public:
    bits(const uint8_t *bytes, size_t size) {
        scmn_bsr_init(&reader_, const_cast<uint8_t *>(bytes), int32_t(size), nullptr);
    }
    bits(const bits &) = delete;

    uint32_t u(int n) {
        const uint32_t value = scmn_bsr_read(&reader_, n);
        ended_ |= reader_.bits < 0;
        return ended_ ? 0 : value;
    }
    bool flag() { return u(1) == 1; }
    bool ended() const { return ended_; }

  private:
    scmn_bsr_ctx reader_;
    bool ended_ = false;
};

std::string mpeg4_profile(uint32_t code) {
    const uint32_t level = code & 15;
    const auto named = [&](const char *name, const std::string &number) {
        return std::string(name) + ", level " + number;
    };
    if (code >= 0x01 && code <= 0x06) return named("Simple", std::to_string(level));
    if (code == 0x08) return named("Simple", "0");
    if (code == 0x09) return named("Simple", "0b");
    if (code >= 0xF0 && code <= 0xF5) return named("Advanced Simple", std::to_string(level));
    if (code == 0xF7) return named("Advanced Simple", "3b");
    return {};
}

}  // namespace

description mpeg4_description(const uint8_t *bytes, size_t size) {
    description d;
    if (size < 5) return d;
    if (bytes[3] == 0xB0) d.profile = mpeg4_profile(bytes[4]);
    if (bytes[3] < 0x20 || bytes[3] > 0x2F) return d;
    bits b(bytes + 4, size - 4);
    b.u(9);  // random access, kind of object
    uint32_t version = 1;
    if (b.flag()) {
        version = b.u(4);
        b.u(3);  // priority
    }
    if (b.u(4) == 15) b.u(16);  // aspect of pixels
    if (b.flag()) {             // control parameters
        b.u(3);
        if (b.flag())
            for (int n : {32, 32, 15}) b.u(n);  // the decoder's buffer
    }
    const uint32_t shape = b.u(2);
    if (shape == 3 && version != 1) b.u(4);
    b.u(1);
    const uint32_t ticks = b.u(16);
    b.u(1);
    if (b.flag()) {
        int width = 1;
        while (width < 16 && ticks > 1u << width) ++width;
        b.u(width);
    }
    if (shape != 0) return d;
    b.u(1);
    const uint32_t width = b.u(13);
    b.u(1);
    const uint32_t height = b.u(13);
    if (!b.ended()) d.width = int(width), d.height = int(height);
    return d;
}

description h263_description(const uint8_t *bytes, size_t size) {
    constexpr struct {
        int width, height;
    } sizes[] = {{0, 0}, {128, 96}, {176, 144}, {352, 288}, {704, 576}, {1408, 1152}};
    description d;
    bits b(bytes, size);
    b.u(32);
    b.u(3);  // start code, number; the first five bits of the picture's type
    uint32_t format = b.u(3);
    bool custom = false;
    if (format == 7) {
        if (b.u(3) != 1) return d;  // the size is that of a picture before
        format = b.u(3);
        custom = format == 6;
        b.u(15);  // the rest of the optional part
        b.u(9);   // and the mandatory one
        if (b.flag()) b.u(2);
    }
    if (custom) {
        b.u(4);
        d.width = int(b.u(9) + 1) * 4;
        b.u(1);
        d.height = int(b.u(9)) * 4;
    } else if (format < 6) {
        d.width = sizes[format].width;
        d.height = sizes[format].height;
    }
    if (b.ended()) d = {};
    return d;
}

std::string h264_profile(uint32_t profile, uint32_t constraints, uint32_t level) {
    const bool set1 = constraints & 0x40, set3 = constraints & 0x10;
    const char *name = nullptr;
    switch (profile) {
        case 66:
            name = set1 ? "Constrained Baseline" : "Baseline";
            break;
        case 77:
            name = "Main";
            break;
        case 88:
            name = "Extended";
            break;
        case 100:
            name = "High";
            break;
        case 110:
            name = set3 ? "High 10 Intra" : "High 10";
            break;
        case 122:
            name = set3 ? "High 4:2:2 Intra" : "High 4:2:2";
            break;
        case 244:
            name = set3 ? "High 4:4:4 Intra" : "High 4:4:4 Predictive";
            break;
        case 44:
            name = "CAVLC 4:4:4 Intra";
            break;
        default:
            break;
    }
    std::string text = name ? name : "profile " + std::to_string(profile);
    text += ", level ";
    if (level == 9 || (level == 11 && set3 && profile < 100)) return text.append("1b");
    text += std::to_string(level / 10);
    if (level % 10) text.append(".").append(std::to_string(level % 10));
    return text;
}

}  // namespace tools
