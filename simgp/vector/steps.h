// A row as a sequence of vector steps, right to the last pixel.
#ifndef SIMGP_VECTOR_STEPS_H
#define SIMGP_VECTOR_STEPS_H

#include <string.h>

#include "simgp/vector/source.h"

namespace simgp::SIMD_TARGET {

// A Step converts `bytes` pixels:
//   size                          bytes of a pixel that it stores
//   pixels_in_pairs               whether a step must begin at an even pixel
//   load(samples, x)              reads the samples of pixels x ... x + bytes - 1
//   convert(dst, loaded)          stores the pixels at dst
//   stage(staged, samples, x, n)  copies the samples of n pixels from x on
//
// Less than a vector goes through the stack.
template <class Step>
inline void partial_step(const samples &s, uint8_t *dst, ptrdiff_t x, int count) {
    staged in;
    uint8_t out[bytes * Step::size];
    Step::stage(in, s, x, count);
    Step::convert(out, Step::load(in.all(), 0));
    memcpy(dst + x * Step::size, out, size_t(count) * Step::size);
}

// Converts `width` >= 1 pixels. Reads their samples and writes the pixels, nothing else.
//
// A row of at least a vector takes whole steps. The last one ends at the last pixel and may do some
// pixels again. Samples are loaded one step ahead of the stores, which hides the loads' latency and
// keeps the row right where output lies over samples: whatever was stored by then lies before the
// pixels that a load is for. Where steps begin at even pixels, the last pixel of an odd row stands
// alone.
template <class Step>
inline void row_of_steps(const samples &s, uint8_t *dst, ptrdiff_t width) {
    const ptrdiff_t whole = Step::pixels_in_pairs ? width & ~ptrdiff_t(1) : width;
    if (whole < bytes) return partial_step<Step>(s, dst, 0, int(width));
    ptrdiff_t x = 0;
    auto pixels = Step::load(s, 0);
    for (;;) {
        const ptrdiff_t next = x + 2 * bytes <= whole ? x + bytes : whole - bytes;
        const auto ahead = Step::load(s, next);
        Step::convert(dst + x * Step::size, pixels);
        if (next == x) break;
        x = next;
        pixels = ahead;
    }
    if (whole < width) partial_step<Step>(s, dst, whole, 1);
}

}  // namespace simgp::SIMD_TARGET

#endif
