// Pictures for the eye: 8 bits of R, G, B a pixel.
#ifndef TOOLS_RGB_H
#define TOOLS_RGB_H

#include "tools/picture.h"

namespace tools {

// Line y of a picture of any RGB format as R, G, B bytes. Channels of 5 and 6 bits are widened by
// repeating their top bits below, so that 0 stays 0 and full stays 255.
void rgb_line(const picture &p, int y, uint8_t *to);
// The whole picture as rgb888.
picture to_rgb888(const picture &p);

}  // namespace tools

#endif
