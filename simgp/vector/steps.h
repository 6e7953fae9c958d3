// Rows as sequences of vector steps, right to the last pixel.
#ifndef SIMGP_VECTOR_STEPS_H
#define SIMGP_VECTOR_STEPS_H

#include <stddef.h>
#include <string.h>

namespace simgp::SIMD_TARGET {

// Less than a vector
// ------------------------------------------------------------------------------------------------
//
// It goes through the stack. What a vector is loaded from there should have been stored by one: the
// processor would have to wait until several stores have reached the cache. Hence the last sample of
// an odd row, the commonest part of all, is staged by whole vectors.

// Copies `count` bytes, a few.
[[gnu::noinline, maybe_unused]] static void copy_few(uint8_t *to, const uint8_t *from,
                                                     ptrdiff_t count) {
    const auto move = [&](ptrdiff_t n) __attribute__((always_inline)) {
        memcpy(to, from, size_t(n));
        to += n;
        from += n;
    };
    for (; count >= 16; count -= 16) move(16);
    if (count & 8) move(8);
    if (count & 4) move(4);
    if (count & 2) move(2);
    if (count & 1) move(1);
}

// Puts `count` >= 1 samples of `size` bytes, 1 to 4, where `vectors` vectors will be read. What is
// behind them has no meaning.
[[gnu::noinline, maybe_unused]] static void stage_few(uint8_t *to, int vectors, const uint8_t *from,
                                                      int count, int size) {
    u8v first = set_u8(0);
    if (count == 1) {
        uint32_t sample = 0;
        for (int k = 0; k < size; k++) sample |= uint32_t(from[k]) << 8 * k;
        first = set_u32(sample);
    }
    int i = 0;
    do store(to + i * bytes, first);
    while (++i < vectors);
    if (count > 1) copy_few(to, from, ptrdiff_t(size) * count);
}

// Steps
// ------------------------------------------------------------------------------------------------

// The same as row_of_steps below, by functions.
template <bool PixelsInPairs, class Load, class Write, class Part>
inline void row_of_steps(ptrdiff_t width, Load load, Write write, Part part) {
    const ptrdiff_t whole = PixelsInPairs ? width & ~ptrdiff_t(1) : width;
    if (whole < bytes) return part(0, int(width));
    ptrdiff_t x = 0;
    auto pixels = load(0);
    for (;;) {
        const ptrdiff_t next = x + 2 * bytes <= whole ? x + bytes : whole - bytes;
        const auto ahead = load(next);
        write(x, pixels);
        if (next == x) break;
        x = next;
        pixels = ahead;
    }
    if (whole < width) part(whole, 1);
}

// A Step converts `bytes` pixels at a time:
//   pixels_in_pairs         whether a step must begin at an even pixel
//   load(in, x)             the samples of pixels x ... x + bytes - 1
//   write(out, x, those)    computes the pixels and stores them at their places
//   part(in, out, x, n)     converts n <= bytes pixels from x on and touches nothing else
// In and Out are whatever the Step reads and writes: a few pointers.
//
// Converts `width` >= 1 pixels. Reads their samples and writes the pixels, nothing else.
//
// A row of at least a vector takes whole steps. The last one ends at the last pixel and may do some
// pixels again. Samples are loaded one step ahead of the stores, which hides the loads' latency and
// keeps the row right where output lies over samples: whatever was stored by then lies before the
// pixels that a load is for. Where steps begin at even pixels, the last pixel of an odd row stands
// alone.
template <class Step, class In, class Out>
inline void row_of_steps(const In &in, const Out &out, ptrdiff_t width) {
    row_of_steps<Step::pixels_in_pairs>(
        width, [&](ptrdiff_t x) { return Step::load(in, x); },
        [&](ptrdiff_t x, const auto &pixels) { Step::write(out, x, pixels); },
        [&](ptrdiff_t x, int count) { Step::part(in, out, x, count); });
}

// Samples in steps of `Step`: vector(x) does so many of them from x on, one(x) one. The last step
// ends at the last sample and may do some again.
template <int Step = bytes, class Vector, class One>
inline void in_steps(ptrdiff_t count, Vector vector, One one) {
    if (count < Step) {
        for (ptrdiff_t x = 0; x < count; x++) one(x);
        return;
    }
    for (ptrdiff_t x = 0; x + Step < count; x += Step) vector(x);
    vector(count - Step);
}

// Moves `pairs` >= 1 pairs in steps of a vector: whole(i) does `bytes` of them from pair i on,
// half(i) half as many, one(i) one. The last step ends at the last pair and may do some again.
template <class Whole, class Half, class One>
inline void in_pair_steps(ptrdiff_t pairs, Whole whole, Half half, One one) {
    if (pairs < bytes / 2) {
        for (ptrdiff_t i = 0; i < pairs; i++) one(i);
        return;
    }
    if (pairs < bytes) {
        if (pairs > bytes / 2) half(0);
        return half(pairs - bytes / 2);
    }
    ptrdiff_t i = 0;
    for (; i + 2 * bytes <= pairs; i += 2 * bytes) {
        whole(i);
        whole(i + bytes);
    }
    if (i + bytes <= pairs) {
        whole(i);
        i += bytes;
    }
    if (i < pairs) whole(pairs - bytes);
}

}  // namespace simgp::SIMD_TARGET

#endif
