// Contact sheets: labelled pictures in a grid.
#pragma once

#include <string>
#include <vector>

#include "tools/picture.h"

namespace tools {

struct Tile {
    Picture picture;  // rgb888
    std::string label;
};

/// Makes a picture of any RGB format into a tile, shrunk by a whole number, as an average of the
/// pixels that fall together, until it fits into max_width x max_height.
Tile make_tile(const Picture &picture, const std::string &label, int max_width, int max_height);

/// The grid as one rgb888 picture; `columns` 0 makes it about as wide as high.
Picture lay_out(const std::vector<Tile> &tiles, int columns);

}  // namespace tools
