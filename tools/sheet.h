// Contact sheets: labelled pictures in a grid.
#ifndef TOOLS_SHEET_H
#define TOOLS_SHEET_H

#include <string>
#include <vector>

#include "tools/picture.h"

namespace tools {

struct tile {
    picture image;  // rgb888
    std::string label;
};

// Makes a picture of any RGB format into a tile, shrunk by a whole number, as an average of the
// pixels that fall together, until it fits into max_width x max_height.
tile make_tile(const picture &p, const std::string &label, int max_width, int max_height);

// The grid as one rgb888 picture; `columns` 0 makes it about as wide as high.
picture lay_out(const std::vector<tile> &tiles, int columns);

}  // namespace tools

#endif
