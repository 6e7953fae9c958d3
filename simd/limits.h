// What a vector layer refuses to compile, the same for every instruction set: a kernel that
// compiles for one of them compiles for all. Concepts and assertions only, no code.
#ifndef SIMD_LIMITS_H
#define SIMD_LIMITS_H

// Lanes of 16 and 32 bits are read from memory as they lie, and bytes are found in them by shifts.
static_assert(__BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__, "vector layers are little-endian");

namespace simgp::limits {

// Counts of shifts of 16-bit lanes, and of those that narrow them to bytes.
template <int N>
concept shift = 1 <= N &&N <= 15;
template <int N>
concept narrowing_shift = 1 <= N &&N <= 8;

// Factor of the second of two 16-bit lanes, which must fit signed lanes and is a shift elsewhere.
template <int B>
concept pair_factor = B >= 2 && B <= 1 << 14 && (B & (B - 1)) == 0;

// Bytes of a granule that is interleaved.
template <int N>
concept granule = N == 1 || N == 2 || N == 4 || N == 8;

// Factors of two bytes less 128, of one sign: at most 255 together, as 255 * 128 fits 16 bits.
template <int A, int B>
concept centred_pair = (A >= 0 && B >= 0 && A + B <= 255) || (A <= 0 && B <= 0 && A + B >= -255);

// Factor of a byte of which half the product is wanted: 511 * 255 / 2 and 511 * 128 fit 16 bits.
template <int K>
concept half_factor = 0 <= K &&K <= 511;

// Factors of three channels. The first and the last are a pair of signed bytes whose two products
// with bytes must have a sum that fits 16 bits, signed; the middle one is a byte and a sign.
template <int A, int B, int C>
concept channel_factors = -128 <= A &&A <= 127 && -128 <= C &&C <= 127 &&
                          -128 <= A + C &&A + C <= 127 && -255 <= B &&B <= 255;
// The same where the sum of all three products must fit 16 bits, unsigned.
template <int A, int B, int C>
concept channel_weights =
    channel_factors<A, B, C> && A >= 0 && B >= 0 && C >= 0 && A + B + C <= 256;

}  // namespace simgp::limits

#endif
