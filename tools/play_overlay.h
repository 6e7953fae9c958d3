// What the player writes over the picture.
#ifndef TOOLS_PLAY_OVERLAY_H
#define TOOLS_PLAY_OVERLAY_H

#include <string>
#include <vector>

#include "tools/colour.h"
#include "tools/picture.h"

namespace tools {

// "bt709 (by size), full (stream)": a colour, and where it was learned from.
std::string colour_text(const colour &c, const colour_note &said);

// "  1.23 ms what"
std::string time_text(double ms, const std::string &what);

// White lines on black, as an rgb888 picture; dots are squares of `scale` pixels.
picture text_box(const std::vector<std::string> &lines, int scale);

}  // namespace tools

#endif
