// Inner loops between layouts of YUV, and the copy.
#ifndef ROWS_LAYOUT_H
#define ROWS_LAYOUT_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// Interleaves and takes apart `pairs` >= 1 byte pairs in each of `height` lines, which are so many bytes
// apart: byte 2i is byte i of a, the next byte i of b.
using pack_rows = void(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b, ptrdiff_t stride_b,
                       uint8_t *dst, ptrdiff_t dst_stride, ptrdiff_t pairs, ptrdiff_t height);
using unpack_rows = void(const uint8_t *src, ptrdiff_t src_stride, uint8_t *a, ptrdiff_t stride_a,
                         uint8_t *b, ptrdiff_t stride_b, ptrdiff_t pairs, ptrdiff_t height);

// Copies `height` lines of `size` >= 1 bytes, which must not overlap.
using copy_rows = void(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
                       ptrdiff_t size, ptrdiff_t height);

struct layout_rows {
    pack_rows *pack;
    unpack_rows *unpack;
    copy_rows *copy;
};

}  // namespace simgp

#endif
