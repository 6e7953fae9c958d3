// The inner loop of dithering.
#ifndef ROWS_DITHER_H
#define ROWS_DITHER_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// Dithers row `cur` of a plane, between its rows above and below, and makes `below` of the row that
// lies there in the source. `width` >= 5 samples a row; `src` shares no memory with the others.
using dither_row = void(const uint8_t *src, const uint8_t *above, uint8_t *cur, uint8_t *below,
                        ptrdiff_t width);

struct dither_rows {
    dither_row *dither;
};

}  // namespace simgp

#endif
