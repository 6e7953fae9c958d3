// The inner loop of fills.
#ifndef ROWS_MEM_H
#define ROWS_MEM_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// Repeats the four bytes of value, lowest first, over `size` bytes, a multiple of 32.
using fill_row = void(uint8_t *dst, uint32_t value, size_t size);

struct mem_rows {
    fill_row *fill;
    // For processors whose string stores are fast, where the choice puts it in the place of `fill`;
    // null where there is none.
    fill_row *fill_with_strings;
};

}  // namespace simgp

#endif
