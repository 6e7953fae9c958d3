#include "tools/rgb.h"

#include <utility>

#include "tools/fault.h"

namespace tools {

void rgb_row(const Picture &picture, int y, uint8_t *to) {
    const Format &format = picture.format();
    if (format.kind == Kind::rgb16) {
        const uint8_t *from = picture.row(0, y);
        const bool swapped = format.code == SIMGP_FMT_BGR565;
        for (int x = 0; x < picture.width(); ++x, to += 3) {
            const unsigned word = from[2 * x] | from[2 * x + 1] << 8;
            unsigned r = word >> 11, g = word >> 5 & 63, b = word & 31;
            if (swapped) std::swap(r, b);
            to[0] = uint8_t(r << 3 | r >> 2);
            to[1] = uint8_t(g << 2 | g >> 4);
            to[2] = uint8_t(b << 3 | b >> 2);
        }
        return;
    }
    if (format.kind != Kind::rgb) throw Fault(format.name, " is no RGB format");
    for (int x = 0; x < picture.width(); ++x)
        for (int c = 0; c < 3; ++c) *to++ = *picture.sample(c, x, y);
}

Picture to_rgb888(const Picture &picture) {
    Picture result({&format_coded(SIMGP_FMT_RGB888), picture.width(), picture.height()});
    for (int y = 0; y < picture.height(); ++y) rgb_row(picture, y, result.row(0, y));
    return result;
}

}  // namespace tools
