// Inner loops between layouts of YUV, and the copy.
#ifndef ROWS_LAYOUT_H
#define ROWS_LAYOUT_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// Interleaves and takes apart `pairs` >= 1 byte pairs: byte 2i is byte i of a, the next
// byte i of b.
using pack_row = void(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t pairs);
using unpack_row = void(const uint8_t *src, uint8_t *a, uint8_t *b, ptrdiff_t pairs);

// Copies `height` lines of `size` >= 1 bytes, so many bytes apart, which must not overlap.
using copy_rows = void(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
                       ptrdiff_t size, ptrdiff_t height);

struct layout_rows {
    pack_row *pack;
    unpack_row *unpack;
    copy_rows *copy;
};

}  // namespace simgp

#endif
