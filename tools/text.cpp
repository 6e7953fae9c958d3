#include "tools/text.h"

#include <ctype.h>

namespace tools {

namespace {

struct glyph {
    char character;
    const char *dots;  // seven rows of five
};

constexpr glyph font[] = {
    {'0', " ### #   ##  ### # ###  ##   # ### "}, {'1', "  #   ##    #    #    #    #   ### "},
    {'2', " ### #   #    #   #   #   #   #####"}, {'3', "#####   #   #     #     ##   # ### "},
    {'4', "   #   ##  # # #  # #####   #    # "}, {'5', "######    ####     #    ##   # ### "},
    {'6', "  ##  #   #    #### #   ##   # ### "}, {'7', "#####    #   #   #   #    #    #   "},
    {'8', " ### #   ##   # ### #   ##   # ### "}, {'9', " ### #   ##   # ####    #   #  ##  "},
    {'A', " ### #   ##   #######   ##   ##   #"}, {'B', "#### #   ##   ##### #   ##   ##### "},
    {'C', " ### #   ##    #    #    #   # ### "}, {'D', "###  #  # #   ##   ##   ##  # ###  "},
    {'E', "######    #    #### #    #    #####"}, {'F', "######    #    #### #    #    #    "},
    {'G', " ### #   ##    # ####   ##   # ####"}, {'H', "#   ##   ##   #######   ##   ##   #"},
    {'I', " ###   #    #    #    #    #   ### "}, {'J', "  ###   #    #    #    # #  #  ##  "},
    {'K', "#   ##  # # #  ##   # #  #  # #   #"}, {'L', "#    #    #    #    #    #    #####"},
    {'M', "#   ### ### # ## # ##   ##   ##   #"}, {'N', "#   ##   ###  ## # ##  ###   ##   #"},
    {'O', " ### #   ##   ##   ##   ##   # ### "}, {'P', "#### #   ##   ##### #    #    #    "},
    {'Q', " ### #   ##   ##   ## # ##  #  ## #"}, {'R', "#### #   ##   ##### # #  #  # #   #"},
    {'S', " #####    #     ###     #    ##### "}, {'T', "#####  #    #    #    #    #    #  "},
    {'U', "#   ##   ##   ##   ##   ##   # ### "}, {'V', "#   ##   ##   ##   ##   # # #   #  "},
    {'W', "#   ##   ##   ## # ## # ## # # # # "}, {'X', "#   ##   # # #   #   # # #   ##   #"},
    {'Y', "#   ##   # # #   #    #    #    #  "}, {'Z', "#####    #   #   #   #   #    #####"},
    {'-', "               #####               "}, {'>', "#     #     #     #   #   #   #    "},
    {':', "       #              #            "}, {'.', "                         ##   ##   "},
    {'/', "         #   #   #   #   #         "}, {'(', "   #   #   #    #    #     #     # "},
    {')', " #     #     #    #    #   #   #   "}, {'%', "##   ##  #   #   #   #   #  ##   ##"},
    {'+', "       #    #  #####  #    #       "}, {'_', "                              #####"},
};

static_assert([] {
    for (const glyph &g : font)
        if (std::string_view(g.dots).size() != 5 * text_height) return false;
    return true;
}());

}  // namespace

void draw_text(picture &p, int x, int y, std::string_view text, int scale) {
    for (char character : text) {
        for (const glyph &g : font) {
            if (g.character != toupper(static_cast<unsigned char>(character))) continue;
            for (int row = 0; row < text_height * scale; ++row)
                for (int column = 0; column < 5 * scale; ++column) {
                    const int px = x + column, py = y + row;
                    if (g.dots[row / scale * 5 + column / scale] != '#') continue;
                    if (px < 0 || py < 0 || px >= p.width() || py >= p.height()) continue;
                    for (int c = 0; c < 3; ++c) *p.sample(c, px, py) = 255;
                }
        }
        x += text_advance * scale;
    }
}

}  // namespace tools
