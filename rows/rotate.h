// Inner loops of turns and mirrors.
#ifndef ROWS_ROTATE_H
#define ROWS_ROTATE_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// What is moved: bytes, words of two bytes, or bytes 0, 2, 4, ... of rows, which close up.
enum class sample_kind : uint8_t { bytes, words, even_bytes, count };

// The bytes of a sample, and from one to the next in the source.
template <sample_kind S>
inline constexpr ptrdiff_t sample_size = S == sample_kind::words ? 2 : 1;
template <sample_kind S>
inline constexpr ptrdiff_t sample_gap = S == sample_kind::bytes ? 1 : 2;

// The largest block has this many columns, and as many rows: a cache line of samples.
template <sample_kind S>
inline constexpr ptrdiff_t block_side = 64 / sample_size<S>;

// Transposes a block: sample x of row y of src becomes sample y of row x of dst. There are 1 to
// block_side columns x, and as many rows y. Strides may be negative; src and dst share no memory.
// `next` is the way in bytes to the block that follows in src, for which the processor may ask
// already, or 0. It is a hint and may lead behind the plane.
using transpose_block = void(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst,
                             ptrdiff_t dst_stride, ptrdiff_t columns, ptrdiff_t rows,
                             ptrdiff_t next);

// Copies `count` >= 1 samples, the last one first.
using reverse_row = void(const uint8_t *src, uint8_t *dst, ptrdiff_t count);

struct rotate_rows {
    transpose_block *transpose[size_t(sample_kind::count)];
    reverse_row *reverse[size_t(sample_kind::words) + 1];  // not of even bytes
};

}  // namespace simgp

#endif
