// The vector layer over plain lanes: the meaning of every operation, one line each. The other
// headers of this folder offer the same vocabulary over an instruction set and are tested against
// this one.
//
// A vector has `bytes` bytes. Operations work on all lanes alike, except those that move bytes
// within blocks of 16 bytes, the unit that wide x86 registers are made of; blocks = bytes / 16.
//
// Order of pixels. What lies in blocks comes out of in-block shuffles in pieces. Kernels therefore
// bring their input into an order in which the stores at the end find whole vectors:
//   natural   byte i is pixel i
//   by8       block j holds granules j and blocks + j, each of 8 bytes
//   by4       block j holds granules j, blocks + j, 2 blocks + j, 3 blocks + j, each of 4 bytes
// With one block all three are the same.
#ifndef SIMD_LANES_H
#define SIMD_LANES_H

#include <stddef.h>
#include <stdint.h>
#include <string.h>

#include "simd/limits.h"

#ifndef SIMD_LANES_BYTES
#define SIMD_LANES_BYTES 32
#define SIMD_LANES_NAMESPACE lanes
#endif

namespace simgp::SIMD_LANES_NAMESPACE {

inline constexpr int bytes = SIMD_LANES_BYTES;
inline constexpr int blocks = bytes / 16;
inline constexpr bool moves_pointers = true;
// What bytes can be picked from: a block, or a vector of 64 bytes.
inline constexpr int window_bytes = bytes == 64 ? 64 : 16;
inline constexpr int windows = bytes / window_bytes;
inline constexpr bool pairs_in_halves = true;

template <typename T>
struct vec {
    using type = T;
    static constexpr int count = bytes / (int)sizeof(T);
    T lane[count];
};
using u8v = vec<uint8_t>;
using u16v = vec<uint16_t>;
using s16v = vec<int16_t>;

template <typename To, typename From>
inline To cast(From v) {
    static_assert(sizeof(To) == sizeof(From));
    To r;
    memcpy(&r, &v, sizeof r);
    return r;
}

// Result lane i = f(i).
template <typename V, typename F>
inline V make(F f) {
    V r;
    for (int i = 0; i < V::count; i++) r.lane[i] = static_cast<typename V::type>(f(i));
    return r;
}

inline int clamp_to(int low, int high, int x) { return x < low ? low : x > high ? high : x; }

// Reinterpretation of the same bytes; 16-bit lanes are little-endian.
inline u8v as_u8(u16v v) { return cast<u8v>(v); }
inline u16v as_u16(u8v v) { return cast<u16v>(v); }
inline u16v as_u16(s16v v) { return cast<u16v>(v); }
inline s16v as_s16(u16v v) { return cast<s16v>(v); }

// Memory, at any address.
inline u8v load(const uint8_t *p) {
    u8v r;
    memcpy(&r, p, bytes);
    return r;
}
inline void store(uint8_t *p, u8v v) { memcpy(p, &v, bytes); }
// Says that p has been moved by a constant to where the next load or store is.
template <class T>
inline void step_pointer(T *&) {}
// Says that n is needed from here on, and not in the loop before.
inline void keep_behind(ptrdiff_t &) {}
// bytes / 2 bytes from p and as many from q, in turn.
inline u8v load_zip(const uint8_t *p, const uint8_t *q) {
    return make<u8v>([&](int i) {
        const uint8_t *from = i & 1 ? q : p;
        return from[i / 2];
    });
}

inline u8v set_u8(uint8_t x) {
    return make<u8v>([&](int) { return x; });
}
inline u16v set_u16(uint16_t x) {
    return make<u16v>([&](int) { return x; });
}
// Bytes a and b in turn.
inline u8v set_pair(uint8_t a, uint8_t b) {
    return make<u8v>([&](int i) { return i & 1 ? b : a; });
}
// The four bytes of x, lowest first, over and over.
inline u8v set_u32(uint32_t x) {
    return make<u8v>([&](int i) { return x >> i % 4 * 8 & 255; });
}

// Block by block: block j from or to the 16 bytes at p + j step. Blocks that are stored must not
// overlap.
inline u8v load_blocks(const uint8_t *p, ptrdiff_t step) {
    return make<u8v>([&](int i) { return p[i / 16 * step + i % 16]; });
}
inline void store_blocks(uint8_t *p, ptrdiff_t step, u8v v) {
    for (int i = 0; i < bytes; i++) p[i / 16 * step + i % 16] = v.lane[i];
}

// Window j from the bytes at p + at[j].
inline u8v gather_windows(const uint8_t *p, const int32_t *at) {
    return make<u8v>([&](int i) { return p[at[i / window_bytes] + i % window_bytes]; });
}

// A store to an address that is a multiple of `bytes`, past the caches where the machine can do
// that; stream_end() orders a run of them before whatever is written next.
inline void store_stream(uint8_t *p, u8v v) { store(p, v); }
inline void stream_end() {}

// The smaller and the larger of each pair of bytes, their mean rounded up, and their distance.
inline u8v min_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] < b.lane[i] ? a.lane[i] : b.lane[i]; });
}
inline u8v max_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] > b.lane[i] ? a.lane[i] : b.lane[i]; });
}
inline u8v avg_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return (a.lane[i] + b.lane[i] + 1) >> 1; });
}
inline u8v absdiff_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) {
        const int d = a.lane[i] - b.lane[i];
        return d < 0 ? -d : d;
    });
}

// The index of the first byte that is 0, `bytes` if there is none.
inline int first_zero(u8v v) {
    int i = 0;
    while (i < bytes && v.lane[i] != 0) i++;
    return i;
}

// Bits. Counts of shifts are 1 ... 15.
inline u8v bit_and(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] & b.lane[i]; });
}
inline u8v bit_or(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] | b.lane[i]; });
}
inline u8v bit_xor(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] ^ b.lane[i]; });
}
inline u8v bit_not(u8v a) {
    return make<u8v>([&](int i) { return ~a.lane[i]; });
}
inline u16v bit_and(u16v a, u16v b) {
    return make<u16v>([&](int i) { return a.lane[i] & b.lane[i]; });
}
inline u16v bit_or(u16v a, u16v b) {
    return make<u16v>([&](int i) { return a.lane[i] | b.lane[i]; });
}
template <int N>
inline u16v shl(u16v a) {
    static_assert(limits::shift<N>);
    return make<u16v>([&](int i) { return uint16_t(a.lane[i] << N); });
}
template <int N>
inline u16v shr(u16v a) {
    static_assert(limits::shift<N>);
    return make<u16v>([&](int i) { return a.lane[i] >> N; });
}
template <int N>
inline s16v sar(s16v a) {
    static_assert(limits::shift<N>);
    return make<s16v>([&](int i) { return a.lane[i] >> N; });
}
// Even lanes by M, odd ones by N.
template <int M, int N>
inline u16v shr_pairs(u16v a) {
    static_assert(limits::shift<M> && limits::shift<N>);
    return make<u16v>([&](int i) { return a.lane[i] >> (i & 1 ? N : M); });
}

// Signed 16-bit sums and differences, wrapping, and saturating.
inline s16v add(s16v a, s16v b) {
    return make<s16v>([&](int i) { return int16_t(a.lane[i] + b.lane[i]); });
}
inline s16v sub(s16v a, s16v b) {
    return make<s16v>([&](int i) { return int16_t(a.lane[i] - b.lane[i]); });
}
inline s16v add_sat(s16v a, s16v b) {
    return make<s16v>([&](int i) { return clamp_to(-32768, 32767, a.lane[i] + b.lane[i]); });
}
inline s16v sub_sat(s16v a, s16v b) {
    return make<s16v>([&](int i) { return clamp_to(-32768, 32767, a.lane[i] - b.lane[i]); });
}
// The smaller and the larger of signed lanes.
inline s16v min_s16(s16v a, s16v b) {
    return make<s16v>([&](int i) { return a.lane[i] < b.lane[i] ? a.lane[i] : b.lane[i]; });
}
inline s16v max_s16(s16v a, s16v b) {
    return make<s16v>([&](int i) { return a.lane[i] > b.lane[i] ? a.lane[i] : b.lane[i]; });
}
// The low 16 bits of the products, which are the same for signed lanes.
inline u16v mul(u16v a, u16v b) {
    return make<u16v>([&](int i) { return uint16_t(unsigned(a.lane[i]) * b.lane[i]); });
}
// Products of signed lanes as fractions of 2^15, rounded: (a b + 2^14) >> 15. Not both may be -32768.
inline s16v mul_round(s16v a, s16v b) {
    return make<s16v>([&](int i) { return (a.lane[i] * b.lane[i] + (1 << 14)) >> 15; });
}

// The mean of unsigned lanes, rounded up, and rounded down; half their difference, rounded down.
inline u16v avg_u16(u16v a, u16v b) {
    return make<u16v>([&](int i) { return (a.lane[i] + b.lane[i] + 1) >> 1; });
}
inline u16v mean_down_u16(u16v a, u16v b) {
    return make<u16v>([&](int i) { return (a.lane[i] + b.lane[i]) >> 1; });
}
inline s16v half_difference(u16v a, u16v b) {
    return make<s16v>([&](int i) { return (a.lane[i] - b.lane[i]) >> 1; });
}
// Differences of unsigned lanes, saturating.
inline u16v sub_sat_u16(u16v a, u16v b) {
    return make<u16v>([&](int i) { return clamp_to(0, 65535, a.lane[i] - b.lane[i]); });
}

// Sums and differences of bytes, saturating.
inline u8v add_sat_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return clamp_to(0, 255, a.lane[i] + b.lane[i]); });
}
inline u8v sub_sat_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return clamp_to(0, 255, a.lane[i] - b.lane[i]); });
}

// Sums and differences of bytes, wrapping, and bytes shifted right by one.
inline u8v add_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] + b.lane[i]; });
}
inline u8v sub_u8(u8v a, u8v b) {
    return make<u8v>([&](int i) { return a.lane[i] - b.lane[i]; });
}
inline u8v half_u8(u8v a) {
    return make<u8v>([&](int i) { return a.lane[i] >> 1; });
}

// Truths, one for each 16-bit lane. select takes both bytes of a lane from `yes` or from `no`.
struct mask16 {
    using type = bool;
    static constexpr int count = bytes / 2;
    bool lane[count];
};
inline mask16 greater(s16v a, s16v b) {
    return make<mask16>([&](int i) { return a.lane[i] > b.lane[i]; });
}
inline u8v select(mask16 m, u8v yes, u8v no) {
    return make<u8v>([&](int i) { return (m.lane[i / 2] ? yes : no).lane[i]; });
}

// A chain of decisions from lane to lane: s(i) = a(i) or (b(i) and not s(i - 1)), where a implies
// b. chain_before gives s(i - 1) for lane i; the state, which chain_begin makes of s(-1), carries
// the last decision to the next call.
//
// The machines settle all lanes with one addition. In terms of t(i) = s(i) xor (i is odd), lane i
// hands t on where b and not a; elsewhere it sets t (a at even i, not b at odd i) or clears it.
// That is the carry chain of an adder: lanes propagate, generate or kill, and t(i - 1) is the carry
// into lane i. Of the two summands' bits at a lane, both must be set to generate, none to kill, one
// to propagate: at even lanes these are the bits of a and b, at odd lanes those of not a and not b,
// and which of them stands in which summand is the same. With odd = the bits of the odd lanes,
//   x = a xor odd, y = b xor odd, carries = (x + y + carry in) xor x xor y
// and s(i - 1) = carry into lane i xor (i is even). A lane may have several equal
// bits; the carry into the lowest is the one.
using chain_state = bool;
inline chain_state chain_begin(bool s) { return s; }
inline mask16 chain_before(mask16 a, mask16 b, chain_state &s) {
    return make<mask16>([&](int i) {
        const bool before = s;
        s = a.lane[i] || (b.lane[i] && !before);
        return before;
    });
}

// Lane i = samples[2i] weights[2i] + samples[2i + 1] weights[2i + 1]. Weights are 0 ... 127, and
// those of a pair at most 128 together: the sums are at most 128 * 255 = 32640 and fit signed lanes.
inline u16v dot_pairs(u8v samples, u8v weights) {
    return make<u16v>([&](int i) {
        return samples.lane[2 * i] * weights.lane[2 * i] +
               samples.lane[2 * i + 1] * weights.lane[2 * i + 1];
    });
}

// Within blocks: even lane + B odd lane of each pair of lanes: the lower four of a block from `low`,
// the upper four from `high`. Lanes are at most 32767, and the sums at most 65535; B is a power of
// two, at most 2^14.
template <int B>
inline u16v sum_pairs(u16v low, u16v high) {
    static_assert(limits::pair_factor<B>);
    return make<u16v>([&](int i) {
        const u16v &from = i % 8 < 4 ? low : high;
        const int at = i / 8 * 8 + i % 4 * 2;
        return from.lane[at] + B * from.lane[at + 1];
    });
}

// Byte pairs: lane i of even and odd is byte 2i and 2i + 1.
inline u16v even(u8v v) {
    return make<u16v>([&](int i) { return v.lane[2 * i]; });
}
inline u16v odd(u8v v) {
    return make<u16v>([&](int i) { return v.lane[2 * i + 1]; });
}
// Byte 2i from the low byte of even lane i, byte 2i + 1 from that of odd; the high bytes must be 0.
inline u8v join(u16v even, u16v odd) {
    return make<u8v>([&](int i) { return (i & 1 ? odd : even).lane[i / 2]; });
}
// Byte pairs that are only taken apart, and one byte of each pair: a layer may have them in what form
// it likes. Loads from `bytes` bytes, or from bytes / 2 at p, the even ones, and as many at q.
using pairs_v = u8v;
using pair_bytes = u16v;
inline pairs_v load_pairs(const uint8_t *p) { return load(p); }
inline pairs_v load_pairs(const uint8_t *p, const uint8_t *q) { return load_zip(p, q); }
// From bytes / 2 bytes at p, and then as many at q.
inline pairs_v load_pair_halves(const uint8_t *p, const uint8_t *q) {
    return make<u8v>([&](int i) { return i < bytes / 2 ? p[i] : q[i - bytes / 2]; });
}
// From bytes / 4 bytes at p, the even ones, and as many at q; all of them twice.
inline pairs_v load_pairs_twice(const uint8_t *p, const uint8_t *q) {
    return make<u8v>([&](int i) {
        const uint8_t *from = i & 1 ? q : p;
        return from[i % (bytes / 2) / 2];
    });
}
// Within blocks: the lower 8 bytes as the even ones, the upper 8 as the odd ones.
inline pairs_v load_block_halves(const uint8_t *p) {
    return make<u8v>([&](int i) { return p[i / 16 * 16 + i % 2 * 8 + i % 16 / 2]; });
}
// The even bytes of u and v as pairs, and the odd ones.
inline pairs_v pair_evens(pairs_v u, pairs_v v) {
    return make<u8v>([&](int i) { return (i & 1 ? v : u).lane[i / 2 * 2]; });
}
inline pairs_v pair_odds(pairs_v u, pairs_v v) {
    return make<u8v>([&](int i) { return (i & 1 ? v : u).lane[i / 2 * 2 + 1]; });
}
// Factors of 0 ... 255 that are known at run time, and products; their low 16 bits, unsigned.
inline pair_bytes set_pair_bytes(int k) { return set_u16(static_cast<uint16_t>(k)); }
// Such a product and a sum, which wraps.
inline u16v mul_add(u16v sum, pair_bytes a, pair_bytes b) {
    return make<u16v>([&](int i) { return uint16_t(sum.lane[i] + a.lane[i] * b.lane[i]); });
}
// floor(k v / 2), with a factor that is known at run time; k is 0 ... 511.
struct half_factor {
    int k;
};
inline half_factor set_half_factor(int k) { return {k}; }
inline u16v half_product(pair_bytes v, half_factor k) {
    return make<u16v>([&](int i) { return k.k * v.lane[i] >> 1; });
}

// A (low byte - 128) + B (high byte - 128) + C of each byte pair, kept to 16 bits. A and B have the
// same sign, and A + B is at most 255 in size.
template <int A, int B, int C>
inline s16v pair_dot(pairs_v v) {
    static_assert(limits::centred_pair<A, B>);
    return make<s16v>([&](int i) {
        return int16_t(A * (v.lane[2 * i] - 128) + B * (v.lane[2 * i + 1] - 128) + C);
    });
}
// floor(K high byte / 2) + C of each byte pair, kept to 16 bits; K is 0 ... 511. And the same of
// the low byte.
template <int K, int C>
inline s16v half_product_high(pairs_v v) {
    static_assert(limits::half_factor<K>);
    return make<s16v>([&](int i) { return int16_t((K * v.lane[2 * i + 1] >> 1) + C); });
}
template <int K, int C>
inline s16v half_product_low(pairs_v v) {
    static_assert(limits::half_factor<K>);
    return make<s16v>([&](int i) { return int16_t((K * v.lane[2 * i] >> 1) + C); });
}
// 256 (low byte - 128) of each byte pair.
inline s16v low_minus_128_shl8(pairs_v v) {
    return make<s16v>([&](int i) { return 256 * (v.lane[2 * i] - 128); });
}

// The same of the high byte.
inline s16v high_minus_128_shl8(pairs_v v) {
    return make<s16v>([&](int i) { return 256 * (v.lane[2 * i + 1] - 128); });
}

// Byte 2i = clamp(even lane i >> N), byte 2i + 1 = clamp(odd lane i >> N), to 0 ... 255; N is
// 1 ... 8.
template <int N>
inline u8v narrow_join(s16v even, s16v odd) {
    static_assert(limits::narrowing_shift<N>);
    return make<u8v>(
        [&](int i) { return clamp_to(0, 255, (i & 1 ? odd : even).lane[i / 2] >> N); });
}

// Within blocks: lanes from the lower or the upper 8 bytes of a block, and back, clamped to
// 0 ... 255: the lower 8 bytes of a block from `low`, the upper ones from `high`.
inline u16v widen_low(u8v v) {
    return make<u16v>([&](int i) { return v.lane[i / 8 * 16 + i % 8]; });
}
inline u16v widen_high(u8v v) {
    return make<u16v>([&](int i) { return v.lane[i / 8 * 16 + 8 + i % 8]; });
}
inline u8v narrow(s16v low, s16v high) {
    return make<u8v>([&](int i) {
        const int block = i / 16, byte = i % 16;
        return clamp_to(0, 255, (byte < 8 ? low : high).lane[block * 8 + byte % 8]);
    });
}
// The same of lanes shifted right by N, unsigned ones and signed ones.
template <int N>
inline u8v narrow_shr(u16v low, u16v high) {
    static_assert(limits::narrowing_shift<N>);
    return narrow(as_s16(shr<N>(low)), as_s16(shr<N>(high)));
}
template <int N>
inline u8v narrow_sar(s16v low, s16v high) {
    static_assert(limits::narrowing_shift<N>);
    return narrow(sar<N>(low), sar<N>(high));
}

// Within blocks: the means of two neighbouring bytes of a and the two of b at the same place, with
// halves rounded up: the lower 8 bytes of a block from a0 and b0, the upper ones from a1 and b1.
inline u8v mean_of_pairs(u8v a0, u8v b0, u8v a1, u8v b1) {
    return make<u8v>([&](int i) {
        const int at = i / 16 * 16 + i % 8 * 2;
        const u8v &a = i % 16 < 8 ? a0 : a1, &b = i % 16 < 8 ? b0 : b1;
        return (a.lane[at] + a.lane[at + 1] + b.lane[at] + b.lane[at + 1] + 2) >> 2;
    });
}

// Within blocks: granules of N bytes of the lower, or of the upper, halves of a's and b's block in
// turn; N is 1, 2, 4 or 8.
template <int N>
inline u8v zip_half(u8v a, u8v b, int half) {
    static_assert(limits::granule<N>);
    return make<u8v>([&](int i) {
        const int block = i / 16, granule = i % 16 / N;
        return (granule & 1 ? b : a).lane[block * 16 + half * 8 + granule / 2 * N + i % N];
    });
}
template <int N>
inline u8v zip_low(u8v a, u8v b) {
    return zip_half<N>(a, b, 0);
}
template <int N>
inline u8v zip_high(u8v a, u8v b) {
    return zip_half<N>(a, b, 1);
}
// Lanes of 32 bits: the even ones from a, the odd ones from b.
inline u8v blend_u32(u8v a, u8v b) {
    return make<u8v>([&](int i) { return (i / 4 & 1 ? b : a).lane[i]; });
}
// Within blocks: byte i is byte index[i] of the same block of v, 0 ... 15, or 0 where the index is
// 128 ... 255.
inline u8v shuffle(u8v v, u8v index) {
    return make<u8v>(
        [&](int i) { return index.lane[i] < 128 ? v.lane[i / 16 * 16 + index.lane[i] % 16] : 0; });
}
// The same within windows, of indexes below window_bytes; and with any index from 128 on for a 0.
inline u8v pick(u8v v, u8v index) {
    return make<u8v>([&](int i) {
        return v.lane[i / window_bytes * window_bytes + index.lane[i] % window_bytes];
    });
}
inline u8v pick_or_zero(u8v v, u8v index) {
    const u8v picked = pick(v, index);
    return make<u8v>([&](int i) { return index.lane[i] < 128 ? picked.lane[i] : 0; });
}
// Across the whole vector: its bytes, or its byte pairs, last to first.
inline u8v reverse_u8(u8v v) {
    return make<u8v>([&](int i) { return v.lane[bytes - 1 - i]; });
}
inline u8v reverse_u16(u8v v) {
    return make<u8v>([&](int i) { return v.lane[(bytes - 1 - i) ^ 1]; });
}

// The 565 word of three channels with 7 fractional bits, high to low; negative channels count as 0.
inline u16v pack565(s16v hi, s16v mid, s16v lo) {
    return make<u16v>([&](int i) {
        auto channel = [&](s16v v) { return v.lane[i] < 0 ? 0 : v.lane[i]; };
        return channel(hi) >> 10 << 11 | channel(mid) >> 9 << 5 | channel(lo) >> 10;
    });
}

// Changes of the order of pixels. From natural order: part k of block j, a granule of Granule bytes,
// is granule k blocks + j of v.
template <int Granule>
inline u8v natural_to(u8v v) {
    static_assert(limits::granule<Granule>);
    return make<u8v>([&](int i) {
        const int block = i / 16, part = i % 16 / Granule;
        return v.lane[(part * blocks + block) * Granule + i % Granule];
    });
}
inline u8v natural_to_by8(u8v v) { return natural_to<8>(v); }
inline u8v natural_to_by4(u8v v) { return natural_to<4>(v); }
inline u8v by8_to_natural(u8v v) {
    return make<u8v>([&](int i) {
        const int granule = i / 8;
        return v.lane[granule % blocks * 16 + granule / blocks * 8 + i % 8];
    });
}

// Twice `bytes` bytes of memory, split: bytes 2i and 2i + 1 are byte i of even and of odd.
// load_split gives by8 order, the others that of their names.
struct pair_u8 {
    u8v even, odd;
};
inline pair_u8 load_split_natural(const uint8_t *p) {
    return {make<u8v>([&](int i) { return p[2 * i]; }),
            make<u8v>([&](int i) { return p[2 * i + 1]; })};
}
inline pair_u8 load_split(const uint8_t *p) {
    const pair_u8 v = load_split_natural(p);
    return {natural_to_by8(v.even), natural_to_by8(v.odd)};
}
// load_split, or the same with even and odd exchanged.
using split_moves = bool;
inline split_moves set_split_moves(bool exchange) { return exchange; }
inline pair_u8 load_split(const uint8_t *p, split_moves exchange) {
    const pair_u8 v = load_split(p);
    return exchange ? pair_u8{v.odd, v.even} : v;
}
inline pair_u8 load_split_by4(const uint8_t *p) {
    const pair_u8 v = load_split_natural(p);
    return {natural_to_by4(v.even), natural_to_by4(v.odd)};
}
// Calls f(moves) with those moves, or what means the same.
template <class F>
inline void with_split_moves(bool exchange, F f) {
    f(set_split_moves(exchange));
}
// Byte pairs, or the same with even and odd exchanged.
inline pairs_v exchange_pairs(pairs_v v, split_moves exchange) {
    return exchange ? make<u8v>([&](int i) { return v.lane[i ^ 1]; }) : v;
}
// The rounded means of blocks of four in two lines of twice `bytes` bytes, (sum + 2) >> 2.
inline u8v load_block_means(const uint8_t *a, const uint8_t *b) {
    return make<u8v>(
        [&](int i) { return (a[2 * i] + a[2 * i + 1] + b[2 * i] + b[2 * i + 1] + 2) >> 2; });
}
// The even bytes of v at p, the odd ones at q.
inline void store_split(uint8_t *p, uint8_t *q, u8v v) {
    for (int i = 0; i < bytes / 2; i++) {
        p[i] = v.lane[2 * i];
        q[i] = v.lane[2 * i + 1];
    }
}

// Groups of four bytes, which begin with luma: its pairs and those of chroma, in the same orders; and
// those of groups that begin with chroma.
struct luma_chroma {
    pairs_v y, pairs;
};
inline luma_chroma load_groups(const uint8_t *p) {
    const pair_u8 v = load_split(p);
    return {v.even, v.odd};
}
inline luma_chroma load_groups_natural(const uint8_t *p) {
    const pair_u8 v = load_split_natural(p);
    return {v.even, v.odd};
}
inline luma_chroma load_groups_by4(const uint8_t *p) {
    const pair_u8 v = load_split_by4(p);
    return {v.even, v.odd};
}
inline luma_chroma exchanged(const luma_chroma &v) { return {v.pairs, v.y}; }

// Stores of 2, 3 and 4 vectors: the bytes of two vectors in by8 order, in turn; the words of the
// even and the odd pixels in by8 order, in turn; the bytes of three vectors in natural order, in
// turn; the bytes of four vectors in by4 order, in turn.
inline void store_zip8(uint8_t *p, u8v even, u8v odd) {
    const u8v a = by8_to_natural(even), b = by8_to_natural(odd);
    for (int i = 0; i < bytes; i++) {
        p[2 * i] = a.lane[i];
        p[2 * i + 1] = b.lane[i];
    }
}
inline void store_zip16(uint8_t *p, u16v even, u16v odd) {
    store_zip8(p, join(bit_and(even, set_u16(255)), bit_and(odd, set_u16(255))),
               join(shr<8>(even), shr<8>(odd)));
}
inline void store_zip3(uint8_t *p, u8v a, u8v b, u8v c) {
    for (int i = 0; i < bytes; i++) {
        p[3 * i] = a.lane[i];
        p[3 * i + 1] = b.lane[i];
        p[3 * i + 2] = c.lane[i];
    }
}
// store_zip3 of three pairs, each through narrow_join with its own shift; a and c may change places
// behind that.
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, s16v a_even, s16v a_odd, s16v b_even, s16v b_odd,
                              s16v c_even, s16v c_odd, bool exchange = false) {
    const u8v a = narrow_join<A>(a_even, a_odd), c = narrow_join<C>(c_even, c_odd);
    store_zip3(p, exchange ? c : a, narrow_join<B>(b_even, b_odd), exchange ? a : c);
}
inline void store_zip4(uint8_t *p, u8v a, u8v b, u8v c, u8v d) {
    const u8v v[4] = {a, b, c, d};
    for (int i = 0; i < bytes; i++) {
        const int granule = i / 4;
        const int from = granule % blocks * 16 + granule / blocks * 4 + i % 4;
        for (int k = 0; k < 4; k++) p[4 * i + k] = v[k].lane[from];
    }
}

// The same, the first half of what is stored at p and the second at q.
inline void store_zip16(uint8_t *p, uint8_t *q, u16v even, u16v odd) {
    uint8_t all[2 * bytes];
    store_zip16(all, even, odd);
    memcpy(p, all, bytes);
    memcpy(q, all + bytes, bytes);
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, uint8_t *q, s16v a_even, s16v a_odd, s16v b_even,
                              s16v b_odd, s16v c_even, s16v c_odd, bool exchange = false) {
    uint8_t all[3 * bytes];
    store_narrow_zip3<A, B, C>(all, a_even, a_odd, b_even, b_odd, c_even, c_odd, exchange);
    memcpy(p, all, 3 * bytes / 2);
    memcpy(q, all + 3 * bytes / 2, 3 * bytes / 2);
}
inline void store_zip4(uint8_t *p, uint8_t *q, u8v a, u8v b, u8v c, u8v d) {
    uint8_t all[4 * bytes];
    store_zip4(all, a, b, c, d);
    memcpy(p, all, 2 * bytes);
    memcpy(q, all + 2 * bytes, 2 * bytes);
}
// Groups of four bytes, luma first or chroma first: from `bytes` bytes of luma at y and half as many at
// u and at v, to twice `bytes` bytes.
struct joined_groups {
    u8v even, odd;
};
template <bool LumaFirst>
inline joined_groups gather_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v) {
    const u8v luma = load(y), chroma = load_zip(u, v);
    return LumaFirst ? joined_groups{luma, chroma} : joined_groups{chroma, luma};
}
inline void store_groups(uint8_t *p, const joined_groups &g) {
    store_zip8(p, natural_to_by8(g.even), natural_to_by8(g.odd));
}

// High bytes of 16-bit lanes: those of a and b in turn; those of a alone, bytes / 2, to memory.
inline u8v join_high(u16v a, u16v b) { return join(shr<8>(a), shr<8>(b)); }
inline void store_high(uint8_t *p, u16v a) {
    for (int i = 0; i < bytes / 2; i++) p[i] = static_cast<uint8_t>(a.lane[i] >> 8);
}

// `bytes` pixels of three channels, in the order of memory; how they are held is the header's own
// business. Words of 5, 6 and 5 bits are widened by shifting alone, and the first channel is the
// one in the highest bits.
struct rgb_v {
    u8v c[3];
};
inline rgb_v load_565(const uint8_t *p) {
    const auto word = [&](int i) { return p[2 * i] | p[2 * i + 1] << 8; };
    return {make<u8v>([&](int i) { return word(i) >> 8 & 0xF8; }),
            make<u8v>([&](int i) { return word(i) >> 3 & 0xFC; }),
            make<u8v>([&](int i) { return word(i) << 3 & 0xF8; })};
}
inline rgb_v load_888(const uint8_t *p) {
    const auto channel = [&](int k) { return make<u8v>([&](int i) { return p[3 * i + k]; }); };
    return {channel(0), channel(1), channel(2)};
}

// The same of pixels of four bytes, of which byte First, 0 or 1, is the first channel.
template <int First>
inline rgb_v load_8888(const uint8_t *p) {
    const auto channel = [&](int k) {
        return make<u8v>([&](int i) { return p[4 * i + First + k]; });
    };
    return {channel(0), channel(1), channel(2)};
}
// The channels in natural order.
struct channels_v {
    u8v c[3];
};
inline channels_v channels_of(rgb_v v) { return {{v.c[0], v.c[1], v.c[2]}}; }

// ((A c0 + B c1 + C c2) >> 8) + D of each pixel, kept to 8 bits. A, B, C >= 0, their sum is at
// most 256, A + C <= 127, and B <= 255.
template <int A, int B, int C, int D>
inline u8v dot_high(rgb_v v) {
    static_assert(limits::channel_weights<A, B, C>);
    return make<u8v>([&](int i) {
        return ((A * v.c[0].lane[i] + B * v.c[1].lane[i] + C * v.c[2].lane[i]) >> 8) + D;
    });
}
// A c0 + B c1 + C c2 + D of the even pixels, kept to 16 bits. A, C and their sum lie in
// -128 ... 127, B in -255 ... 255.
template <int A, int B, int C, int D>
inline u16v even_dot(rgb_v v) {
    static_assert(limits::channel_factors<A, B, C>);
    return make<u16v>([&](int i) {
        return A * v.c[0].lane[2 * i] + B * v.c[1].lane[2 * i] + C * v.c[2].lane[2 * i] + D;
    });
}
// The same with factors that are known at run time, in the limits of the other two: weights of 0 or more
// and an offset, and factors in -128 ... 127.
struct channel_factors {
    int a, b, c;
};
inline channel_factors set_channel_factors(int a, int b, int c) { return {a, b, c}; }
struct channel_weights {
    int a, b, c, d;
};
inline channel_weights set_channel_weights(int a, int b, int c, int d) { return {a, b, c, d}; }
inline u8v dot_high(rgb_v v, const channel_weights &w) {
    return make<u8v>([&](int i) {
        return ((w.a * v.c[0].lane[i] + w.b * v.c[1].lane[i] + w.c * v.c[2].lane[i]) >> 8) + w.d;
    });
}
// Half as many pixels: the even ones, or means of blocks.
using half_rgb_v = rgb_v;
inline half_rgb_v even_pixels(rgb_v v) { return v; }
inline s16v even_dot(half_rgb_v v, const channel_factors &f) {
    return make<s16v>([&](int i) {
        return f.a * v.c[0].lane[2 * i] + f.b * v.c[1].lane[2 * i] + f.c * v.c[2].lane[2 * i];
    });
}
// The rounded means of blocks of four: of pixels 2i and 2i + 1 of a and of b.
inline half_rgb_v block_means(rgb_v a, rgb_v b) {
    const auto means = [&](int k) {
        return make<u8v>([&](int i) {
            const uint8_t *const p = &a.c[k].lane[i & ~1], *const q = &b.c[k].lane[i & ~1];
            return (p[0] + p[1] + q[0] + q[1] + 2) >> 2;
        });
    };
    return {means(0), means(1), means(2)};
}
// The high bytes of c - (f0 c0 + f1 c1 + f2 c2), saturated to 16 bits, signed, with two sets of factors
// in turn.
inline u8v dots_high(half_rgb_v v, const channel_factors &f, const channel_factors &g, s16v c) {
    return join_high(as_u16(sub_sat(c, even_dot(v, f))), as_u16(sub_sat(c, even_dot(v, g))));
}
// Words of 5, 6 and 5 bits from three channels in by8 order, the first in the highest bits; the low
// bits of each are dropped.
inline void store_565(uint8_t *p, u8v a, u8v b, u8v c) {
    a = by8_to_natural(a), b = by8_to_natural(b), c = by8_to_natural(c);
    for (int i = 0; i < bytes; i++) {
        const int word = a.lane[i] >> 3 << 11 | b.lane[i] >> 2 << 5 | c.lane[i] >> 3;
        p[2 * i] = static_cast<uint8_t>(word);
        p[2 * i + 1] = static_cast<uint8_t>(word >> 8);
    }
}
// `bytes` pixels of 3 or 4 bytes at q become words of 5, 6 and 5 bits at p, the first channel in
// the highest bits; the low bits of each channel are dropped, and so is the fourth byte.
template <int Size>
inline void repack_to_565(uint8_t *p, const uint8_t *q) {
    for (int i = 0; i < bytes; i++, p += 2, q += Size) {
        const int word = q[0] >> 3 << 11 | q[1] >> 2 << 5 | q[2] >> 3;
        p[0] = static_cast<uint8_t>(word);
        p[1] = static_cast<uint8_t>(word >> 8);
    }
}
inline void repack_888_to_565(uint8_t *p, const uint8_t *q) { repack_to_565<3>(p, q); }
inline void repack_8888_to_565(uint8_t *p, const uint8_t *q) { repack_to_565<4>(p, q); }

// `bytes` pixels of three bytes at q become pixels of four at p, and the other way round. The first
// channel and the last may change places; alpha stands before or behind them, becomes 255, and is
// dropped. With the moves that the order takes, f(moves) is called once; their type may depend on
// the order.
struct channel_moves {
    bool exchange, alpha_first;
    int from(int channel) const { return exchange ? 2 - channel : channel; }
};
template <class F>
inline void with_widen_moves(bool exchange, bool to_alpha_first, F f) {
    f(channel_moves{exchange, to_alpha_first});
}
inline void repack_888_to_8888(uint8_t *p, const uint8_t *q, const channel_moves &m) {
    for (int i = 0; i < bytes; i++) {
        p[4 * i + (m.alpha_first ? 0 : 3)] = 255;
        for (int k = 0; k < 3; k++) p[4 * i + k + m.alpha_first] = q[3 * i + m.from(k)];
    }
}
template <class F>
inline void with_narrow_moves(bool exchange, bool from_alpha_first, F f) {
    f(channel_moves{exchange, from_alpha_first});
}
inline void repack_8888_to_888(uint8_t *p, const uint8_t *q, const channel_moves &m) {
    for (int i = 0; i < bytes; i++)
        for (int k = 0; k < 3; k++) p[3 * i + k] = q[4 * i + m.from(k) + m.alpha_first];
}

// Pixels of three bytes, the first and the last of which change places.
inline void exchange_888(uint8_t *p, const uint8_t *q) {
    for (int i = 0; i < 3 * bytes; i++) p[i] = q[i / 3 * 3 + 2 - i % 3];
}

// Calls f(load), where load(p) loads `bytes` pixels of four bytes at p, of which one has no weight,
// the first or the last.
struct quads_v {
    const uint8_t *p;
};
template <class F>
inline void with_load_quads(bool, F f) {
    f([](const uint8_t *p) { return quads_v{p}; });
}
struct quad_factors {
    int a, b, c, d;
    bool skips_first;
    int of(const uint8_t *pixel) const {
        pixel += skips_first;
        return a * pixel[0] + b * pixel[1] + c * pixel[2];
    }
};
// ((a c0 + b c1 + c c2) >> 8) + d of each pixel, kept to 8 bits. The weights are 0 or more, those of
// two neighbours in memory, from the first byte on, at most 255 together, and the sum of all is even
// and at most 256.
using quad_weights = quad_factors;
inline quad_weights set_quad_weights(bool skips_first, int a, int b, int c, int d) {
    return {a, b, c, d, skips_first};
}
inline u8v dot_high(quads_v v, const quad_weights &w) {
    return make<u8v>([&](int i) { return (w.of(v.p + 4 * i) >> 8) + w.d; });
}
// Half as many pixels: the even ones, or the rounded means of blocks of four, pixels 2i and 2i + 1 of a and
// of b.
struct half_quads_v {
    uint8_t pixel[bytes / 2][4];
};
inline half_quads_v even_quads(quads_v v) {
    half_quads_v r;
    for (int i = 0; i < bytes / 2; i++) memcpy(r.pixel[i], v.p + 8 * i, 4);
    return r;
}
inline half_quads_v block_means(quads_v a, quads_v b) {
    half_quads_v r;
    for (int i = 0; i < bytes / 2; i++)
        for (int k = 0; k < 4; k++) {
            const uint8_t *const p = a.p + 8 * i + k, *const q = b.p + 8 * i + k;
            r.pixel[i][k] = static_cast<uint8_t>((p[0] + p[4] + q[0] + q[4] + 2) >> 2);
        }
    return r;
}
// The high bytes of c - (f0 c0 + f1 c1 + f2 c2), saturated to 16 bits, signed, with two sets of factors
// in turn. Factors lie in -128 ... 127; the sum and that of two neighbours in memory, from the first
// byte on, fit 16 bits, signed.
inline quad_factors set_quad_factors(bool skips_first, int a, int b, int c) {
    return {a, b, c, 0, skips_first};
}
inline u8v dots_high(const half_quads_v &v, const quad_factors &f, const quad_factors &g, s16v c) {
    return make<u8v>([&](int i) {
        const int dot = (i & 1 ? g : f).of(v.pixel[i / 2]);
        return clamp_to(-32768, 32767, c.lane[i / 2] - dot) >> 8;
    });
}

}  // namespace simgp::SIMD_LANES_NAMESPACE

#endif
