// Labels in pictures: a font of 5 x 7 dots.
#ifndef TOOLS_TEXT_H
#define TOOLS_TEXT_H

#include <string_view>

#include "tools/picture.h"

namespace tools {

constexpr int text_height = 7, text_advance = 6;

// Width in pixels of `text` at `scale`.
inline int text_width(std::string_view text, int scale) {
    return int(text.size()) * text_advance * scale;
}

// Writes `text` in white into an rgb888 picture, its top left corner at (x, y), every dot a square
// of `scale` pixels. Capitals, digits and a few signs; other characters leave a gap. What lies
// outside the picture is left out.
void draw_text(picture &p, int x, int y, std::string_view text, int scale);

}  // namespace tools

#endif
