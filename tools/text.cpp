#include "tools/text.h"

#include <cctype>

namespace tools {

namespace {

struct Glyph {
    char character;
    const char *rows;  // seven rows of five dots
};

constexpr Glyph font[] = {
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
    for (const Glyph &glyph : font)
        if (std::string_view(glyph.rows).size() != 5 * text_height) return false;
    return true;
}());

}  // namespace

void draw_text(Picture &picture, int x, int y, std::string_view text, int scale) {
    for (char character : text) {
        for (const Glyph &glyph : font) {
            if (glyph.character != std::toupper(static_cast<unsigned char>(character))) continue;
            for (int row = 0; row < text_height * scale; ++row)
                for (int column = 0; column < 5 * scale; ++column) {
                    const int px = x + column, py = y + row;
                    if (glyph.rows[row / scale * 5 + column / scale] != '#') continue;
                    if (px < 0 || py < 0 || px >= picture.width() || py >= picture.height())
                        continue;
                    for (int c = 0; c < 3; ++c) *picture.sample(c, px, py) = 255;
                }
        }
        x += text_advance * scale;
    }
}

}  // namespace tools
