#include "tools/rgb.h"

#include <utility>

#include "tools/fault.h"

namespace tools {

void rgb_line(const picture &p, int y, uint8_t *to) {
    const pixel_format &format = p.format();
    if (format.is_rgb16()) {
        const uint8_t *from = p.line(0, y);
        const bool swapped = format.code == SIMGP_FMT_BGR565;
        for (int x = 0; x < p.width(); ++x, to += 3) {
            const unsigned word = from[2 * x] | from[2 * x + 1] << 8;
            unsigned r = word >> 11, g = word >> 5 & 63, b = word & 31;
            if (swapped) std::swap(r, b);
            to[0] = uint8_t(r << 3 | r >> 2);
            to[1] = uint8_t(g << 2 | g >> 4);
            to[2] = uint8_t(b << 3 | b >> 2);
        }
        return;
    }
    if (!format.is_rgb()) throw fault(format.name, " is no RGB format");
    for (int x = 0; x < p.width(); ++x)
        for (int c = 0; c < 3; ++c) *to++ = *p.sample(c, x, y);
}

picture to_rgb888(const picture &p) {
    picture result({&format_coded(SIMGP_FMT_RGB888), p.width(), p.height()});
    for (int y = 0; y < p.height(); ++y) rgb_line(p, y, result.line(0, y));
    return result;
}

}  // namespace tools
