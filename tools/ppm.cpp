// Portable pixmaps and graymaps: P6 and P5 of 8 bits, one picture a file. Grey comes as R = G = B.
#include <ctype.h>
#include <string.h>

#include "tools/raw.h"
#include "tools/rgb.h"
#include "tools/sink.h"
#include "tools/source.h"

namespace tools {

namespace {

class ppm_source : public source {
  public:
    explicit ppm_source(std::unique_ptr<input> in) : input_(std::move(in)) {
        name_ = input_->name();
        char magic[2];
        input_->read(magic, 2);
        const int64_t width = number(), height = number(), most = number();
        if (most != 255)
            input_->fail(-1, input_->offset(), "PPM with values up to ", most,
                         "; only those up to 255 are supported");
        check_size(width, height, name_ + ": byte 2: PPM header");
        shape_ = {&format_coded(SIMGP_FMT_RGB888), int(width), int(height)};
        grey_ = magic[1] == '5';
    }

    bool next(picture &to) override {
        if (delivered_) return false;
        delivered_ = true;
        if (!grey_) {
            read_frame(*input_, to, 0);
            return true;
        }
        std::vector<uint8_t> line(size_t(to.width()));
        for (int y = 0; y < to.height(); ++y) {
            if (input_->read(line.data(), line.size()) != line.size())
                input_->fail(-1, input_->offset(), "the input ends within the picture");
            for (int x = 0; x < to.width(); ++x) memset(to.line(0, y) + 3 * x, line[size_t(x)], 3);
        }
        return true;
    }
    double done() const override { return delivered_; }

  private:
    // Numbers stand between white space and comments; one byte of it is taken behind each.
    int64_t number() {
        char byte = 0;
        const auto take = [&] {
            if (input_->read(&byte, 1) != 1)
                input_->fail(-1, input_->offset(), "the PPM header has no end");
        };
        do {
            take();
            while (byte == '#') {
                while (byte != '\n') take();
                take();
            }
        } while (isspace(static_cast<unsigned char>(byte)));
        int64_t value = 0;
        for (; isdigit(static_cast<unsigned char>(byte)); take())
            if ((value = 10 * value + byte - '0') > 1 << 24) break;
        if (!isspace(static_cast<unsigned char>(byte)))
            input_->fail(-1, input_->offset() - 1, "not a number in the PPM header");
        return value;
    }

    std::unique_ptr<input> input_;
    bool grey_ = false, delivered_ = false;
};

}  // namespace

std::unique_ptr<source> open_ppm(std::unique_ptr<input> in) {
    return std::make_unique<ppm_source>(std::move(in));
}

void write_ppm(output &out, const picture &p) {
    out.write("P6\n" + std::to_string(p.width()) + " " + std::to_string(p.height()) + "\n255\n");
    std::vector<uint8_t> line(size_t(p.width()) * 3);
    for (int y = 0; y < p.height(); ++y) {
        rgb_line(p, y, line.data());
        out.write(line.data(), line.size());
    }
}

}  // namespace tools
