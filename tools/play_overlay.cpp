#include "tools/play_overlay.h"

#include <stdio.h>

#include <algorithm>

#include "tools/text.h"

namespace tools {

std::string colour_text(const colour &c, const colour_note &said) {
    return std::string(c.matrix) + (said.matrix.empty() ? " (by size) " : " (stream) ") +
           (c.full ? "full" : "limited") + (said.range.empty() ? " (not said)" : " (stream)");
}

std::string time_text(double ms, const std::string &what) {
    char number[32];
    snprintf(number, sizeof number, "%7.2f ms ", ms);
    return number + what;
}

picture text_box(const std::vector<std::string> &lines, int scale) {
    constexpr int border = 2, leading = 2;
    int width = 1;
    for (const std::string &line : lines) width = std::max(width, text_width(line, scale));
    const int advance = (text_height + leading) * scale;
    picture box({&format_coded(SIMGP_FMT_RGB888), width + 2 * border * scale,
                 int(lines.size()) * advance + (2 * border - leading) * scale});
    for (size_t k = 0; k < lines.size(); ++k)
        draw_text(box, border * scale, border * scale + int(k) * advance, lines[k], scale);
    return box;
}

}  // namespace tools
