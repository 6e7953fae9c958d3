// A test card that moves, drawn from formulas:
//
//   upper 5/8   eight colour bars: white, yellow, cyan, green, magenta, red, blue, black
//   next 1/8    a ramp of grey from black to white, where few bits show as steps
//   lower 1/4   every chroma at one luma: U rises to the right, V rises downwards
//   a white square with a black rim that wanders over the bars, one step a frame
#include <algorithm>
#include <charconv>
#include <cmath>

#include "tools/road.h"
#include "tools/source.h"

namespace tools {

namespace {

struct yuv {
    uint8_t y, u, v;
};

// Bar k in a colour: bits 2, 1 and 0 of 7 - k are green, red and blue of full scale.
yuv bar_of(int k, const colour &c) {
    const int lit = 7 - k, g = lit >> 2 & 1, r = lit >> 1 & 1, b = lit & 1;
    const double luma = c.red * r + (1 - c.red - c.blue) * g + c.blue * b;
    const auto level = [](double v) { return uint8_t(std::min(std::lround(v), 255l)); };
    const double chroma = c.full ? 127.5 : 112;
    return {level(c.full ? 255 * luma : 16 + 219 * luma),
            level(128 + chroma * (b - luma) / (1 - c.blue)),
            level(128 + chroma * (r - luma) / (1 - c.red))};
}

// Runs from 0 to `top` and back.
int back_and_forth(int64_t step, int top) {
    if (top <= 0) return 0;
    const int at = int(step % (2 * int64_t{top}));
    return at <= top ? at : 2 * top - at;
}

// Maps 0 ... count - 1 to low ... high.
uint8_t ramp(int at, int count, int low, int high) {
    return uint8_t(low + (count > 1 ? int64_t{high - low} * at / (count - 1) : 0));
}

// What is drawn in a colour.
struct palette {
    yuv bars[8];
    int black, white, low, high;  // of luma, of chroma

    explicit palette(const colour &c)
        : black(c.full ? 0 : 16),
          white(c.full ? 255 : 235),
          low(c.full ? 0 : 16),
          high(c.full ? 255 : 240) {
        for (int k = 0; k < 8; ++k) bars[k] = bar_of(k, c);
    }
};

yuv card(const palette &p, int x, int y, int width, int height, int64_t frame) {
    const int bars_end = height * 5 / 8, ramp_end = height * 6 / 8;
    if (y < bars_end) {
        const int side = std::max(bars_end / 4, 1), speed = std::max(width / 80, 1);
        const int left = back_and_forth(frame * speed, width - side);
        const int top = back_and_forth(frame * speed + bars_end / 3, bars_end - side);
        const int dx = x - left, dy = y - top;
        if (dx >= 0 && dx < side && dy >= 0 && dy < side) {
            const int rim = std::max(side / 10, 1);
            const bool inner = dx >= rim && dx < side - rim && dy >= rim && dy < side - rim;
            return inner ? p.bars[0] : p.bars[7];
        }
        return p.bars[int64_t{x} * 8 / width];
    }
    if (y < ramp_end) return {ramp(x, width, p.black, p.white), 128, 128};
    return {130, ramp(x, width, p.low, p.high),
            ramp(y - ramp_end, height - ramp_end, p.low, p.high)};
}

class test_card : public source {
  public:
    test_card(const std::string &spec, const pixel_format &format, const colour *drawn_in) {
        name_ = spec;
        std::string size = spec.substr(std::string("testcard:").size());
        if (const size_t at = size.find('@'); at != std::string::npos) {
            const std::string count = size.substr(at + 1);
            const char *end = count.data() + count.size();
            const auto result = std::from_chars(count.data(), end, frames_);
            if (result.ec != std::errc() || result.ptr != end || frames_ < 1)
                throw fault(spec, ": '", count, "' is not a number of frames");
            size.resize(at);
        }
        int width = 640, height = 480;
        if (!size.empty()) parse_size(size, spec, width, height);
        shape_ = {&format, width, height};
        // It is drawn in YUV; other formats are reached from 4:2:0 with the library.
        const bool drawn = !format.is_rgb() && !format.is_tiled();
        drawing_ = picture({drawn ? &format : &format_coded(SIMGP_FMT_YUV420), width, height});
        const colour &c = drawn_in ? *drawn_in : resolved({}, width, height);
        palette_ = palette(c);
        if (!drawn)
            road_ = std::make_unique<road>(drawing_.shape(), format, false, edits{}, c.code);
    }

    bool next(picture &to) override {
        if (frame_ == frames_) return false;
        for (int y = 0; y < drawing_.height(); ++y)
            for (int x = 0; x < drawing_.width(); ++x) draw(x, y);
        to = road_ ? road_->run(drawing_) : drawing_;
        ++frame_;
        return true;
    }
    double done() const override { return double(frame_) / double(frames_); }

  private:
    // Shared chroma samples are those of the top left pixel, as in the library's own conversions.
    void draw(int x, int y) {
        const yuv colour = card(palette_, x, y, drawing_.width(), drawing_.height(), frame_);
        const uint8_t value[3] = {colour.y, colour.u, colour.v};
        for (int c = 0; c < 3; ++c) {
            const channel &to = drawing_.format().channels[c];
            const int columns = (1 << to.x_shift) - 1, lines = (1 << to.y_shift) - 1;
            if (to.step && !(x & columns) && !(y & lines)) *drawing_.sample(c, x, y) = value[c];
        }
    }

    int64_t frame_ = 0, frames_ = 1;
    palette palette_{colours().front()};
    picture drawing_;
    std::unique_ptr<road> road_;
};

}  // namespace

std::unique_ptr<source> open_testcard(const std::string &spec, const pixel_format &format,
                                      const colour *drawn_in) {
    return std::make_unique<test_card>(spec, format, drawn_in);
}

}  // namespace tools
