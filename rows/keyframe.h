// The inner loop of the search for start codes.
#ifndef ROWS_KEYFRAME_H
#define ROWS_KEYFRAME_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// The first x from 0 to count - 1 with p[x] = p[x + 1] = 0 and (p[x + 2] & mask) = code, else
// count. Reads p[0 .. count + 1].
using find_code_row = ptrdiff_t(const uint8_t *p, ptrdiff_t count, uint8_t mask, uint8_t code);

struct keyframe_rows {
    find_code_row *find_code;
};

}  // namespace simgp

#endif
