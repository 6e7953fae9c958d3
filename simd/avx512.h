// The vector layer over AVX-512 (F, BW, DQ, VL, VBMI): four blocks of 16 bytes. The meaning of each
// operation stands in lanes.h.
#ifndef SIMD_AVX512_H
#define SIMD_AVX512_H

#include <immintrin.h>
#include <stddef.h>
#include <stdint.h>

#include "simd/limits.h"

namespace simgp::avx512 {

inline constexpr int bytes = 64;
inline constexpr int blocks = 4;
inline constexpr bool moves_pointers = false;
inline constexpr int window_bytes = bytes;
inline constexpr int windows = 1;
inline constexpr bool pairs_in_halves = true;

// One register type stands for all lanes.
using u8v = __m512i;
using u16v = __m512i;
using s16v = __m512i;
using pairs_v = u8v;
using pair_bytes = u16v;

inline u8v as_u8(u16v v) { return v; }
inline u16v as_u16(u8v v) { return v; }
inline s16v as_s16(u16v v) { return v; }

inline u8v load(const uint8_t *p) {
    return _mm512_loadu_si512(reinterpret_cast<const __m512i *>(p));
}
inline void store(uint8_t *p, u8v v) { _mm512_storeu_si512(reinterpret_cast<__m512i *>(p), v); }
inline u8v load_zip(const uint8_t *p, const uint8_t *q) {
    const auto widen = [](const uint8_t *from) {
        return _mm512_cvtepu8_epi16(_mm256_loadu_si256(reinterpret_cast<const __m256i *>(from)));
    };
    return _mm512_or_si512(widen(p), _mm512_slli_epi16(widen(q), 8));
}
inline u8v load_halves(const uint8_t *p, const uint8_t *q) {
    const __m256i a = _mm256_loadu_si256(reinterpret_cast<const __m256i *>(p));
    const __m256i b = _mm256_loadu_si256(reinterpret_cast<const __m256i *>(q));
    return _mm512_inserti64x4(_mm512_castsi256_si512(a), b, 1);
}
inline u8v load_pairs_twice(const uint8_t *p, const uint8_t *q) {
    const auto widen = [](const uint8_t *from) {
        return _mm256_cvtepu8_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i *>(from)));
    };
    return _mm512_broadcast_i64x4(_mm256_or_si256(widen(p), _mm256_slli_epi16(widen(q), 8)));
}

// Inserted from memory, a block needs no permutation: hence one after the other.
inline u8v load_blocks(const uint8_t *p, ptrdiff_t step) {
    const auto block = [=](int j) {
        return _mm_loadu_si128(reinterpret_cast<const __m128i *>(p + j * step));
    };
    __m512i v = _mm512_castsi128_si512(block(0));
    v = _mm512_inserti32x4(v, block(1), 1);
    v = _mm512_inserti32x4(v, block(2), 2);
    return _mm512_inserti32x4(v, block(3), 3);
}
// A byte permutation knows no blocks: the window is the vector.
inline u8v gather_windows(const uint8_t *p, const int32_t *at) { return load(p + at[0]); }
// Extracted to memory from the lower or the upper half, a block needs no permutation either.
inline void store_blocks(uint8_t *p, ptrdiff_t step, u8v v) {
    const auto put = [=](int j, __m128i block) {
        _mm_storeu_si128(reinterpret_cast<__m128i *>(p + j * step), block);
    };
    const __m256i low = _mm512_castsi512_si256(v), high = _mm512_extracti64x4_epi64(v, 1);
    put(0, _mm256_castsi256_si128(low));
    put(1, _mm256_extracti128_si256(low, 1));
    put(2, _mm256_castsi256_si128(high));
    put(3, _mm256_extracti128_si256(high, 1));
}

inline void store_halves(uint8_t *p, uint8_t *q, u8v v) {
    _mm256_storeu_si256(reinterpret_cast<__m256i *>(p), _mm512_castsi512_si256(v));
    _mm256_storeu_si256(reinterpret_cast<__m256i *>(q), _mm512_extracti64x4_epi64(v, 1));
}

inline u8v set_u8(uint8_t x) { return _mm512_set1_epi8(static_cast<char>(x)); }
inline u16v set_u16(uint16_t x) { return _mm512_set1_epi16(static_cast<int16_t>(x)); }
inline u8v set_pair(uint8_t a, uint8_t b) { return set_u16(uint16_t(b << 8 | a)); }
inline u8v set_u32(uint32_t x) { return _mm512_set1_epi32(static_cast<int>(x)); }

inline void store_stream(uint8_t *p, u8v v) {
    _mm512_stream_si512(reinterpret_cast<__m512i *>(p), v);
}
inline void stream_end() { _mm_sfence(); }

inline u8v min_u8(u8v a, u8v b) { return _mm512_min_epu8(a, b); }
inline u8v max_u8(u8v a, u8v b) { return _mm512_max_epu8(a, b); }
inline u8v avg_u8(u8v a, u8v b) { return _mm512_avg_epu8(a, b); }
// One of the two differences is 0.
inline u8v absdiff_u8(u8v a, u8v b) {
    return _mm512_or_si512(_mm512_subs_epu8(a, b), _mm512_subs_epu8(b, a));
}
inline int first_zero(u8v v) {
    const uint64_t zero = _mm512_testn_epi8_mask(v, v);
    return zero ? __builtin_ctzll(zero) : bytes;
}

inline u8v bit_and(u8v a, u8v b) { return _mm512_and_si512(a, b); }
inline u8v bit_or(u8v a, u8v b) { return _mm512_or_si512(a, b); }
inline u8v bit_xor(u8v a, u8v b) { return _mm512_xor_si512(a, b); }
// Of an exclusive or with ones GCC 12 makes a ternary operation whose first operand is whatever its
// destination held: each round of a loop then waits for the one before.
inline u8v bit_not(u8v a) { return _mm512_ternarylogic_epi32(a, a, a, 0x55); }
template <int N>
inline u16v shl(u16v a) {
    static_assert(limits::shift<N>);
    return _mm512_slli_epi16(a, N);
}
template <int N>
inline u16v shr(u16v a) {
    static_assert(limits::shift<N>);
    return _mm512_srli_epi16(a, N);
}
template <int N>
inline s16v sar(s16v a) {
    static_assert(limits::shift<N>);
    return _mm512_srai_epi16(a, N);
}
template <int M, int N>
inline u16v shr_pairs(u16v a) {
    static_assert(limits::shift<M> && limits::shift<N>);
    return _mm512_mulhi_epu16(a,
                              _mm512_set1_epi32(static_cast<int>(1u << (32 - N) | 1u << (16 - M))));
}

inline s16v add(s16v a, s16v b) { return _mm512_add_epi16(a, b); }
inline s16v add_sat(s16v a, s16v b) { return _mm512_adds_epi16(a, b); }
inline s16v sub(s16v a, s16v b) { return _mm512_sub_epi16(a, b); }
inline s16v sub_sat(s16v a, s16v b) { return _mm512_subs_epi16(a, b); }
inline s16v min_s16(s16v a, s16v b) { return _mm512_min_epi16(a, b); }
inline s16v max_s16(s16v a, s16v b) { return _mm512_max_epi16(a, b); }
inline u16v mul(u16v a, u16v b) { return _mm512_mullo_epi16(a, b); }
inline u16v avg_u16(u16v a, u16v b) { return _mm512_avg_epu16(a, b); }
inline u16v sub_sat_u16(u16v a, u16v b) { return _mm512_subs_epu16(a, b); }
// k v / 2 = (256 v)(128 k) >> 16.
using half_factor = __m512i;
inline half_factor set_half_factor(int k) { return set_u16(static_cast<uint16_t>(128 * k)); }
inline u16v half_product(u16v v, half_factor k) {
    return _mm512_mulhi_epu16(_mm512_slli_epi16(v, 8), k);
}
inline s16v mul_round(s16v a, s16v b) { return _mm512_mulhrs_epi16(a, b); }

inline u8v add_sat_u8(u8v a, u8v b) { return _mm512_adds_epu8(a, b); }
inline u8v sub_sat_u8(u8v a, u8v b) { return _mm512_subs_epu8(a, b); }

inline u8v add_u8(u8v a, u8v b) { return _mm512_add_epi8(a, b); }
inline u8v sub_u8(u8v a, u8v b) { return _mm512_sub_epi8(a, b); }
inline u8v half_u8(u8v a) {
    return _mm512_and_si512(_mm512_srli_epi16(a, 1), _mm512_set1_epi8(127));
}

using mask16 = __mmask32;
inline mask16 greater(s16v a, s16v b) { return _mm512_cmpgt_epi16_mask(a, b); }
inline u8v select(mask16 m, u8v yes, u8v no) { return _mm512_mask_blend_epi16(m, no, yes); }

// With one bit for a lane.
using chain_state = uint64_t;
inline chain_state chain_begin(bool s) { return !s; }
inline mask16 chain_before(mask16 a, mask16 b, chain_state &carry) {
    constexpr uint32_t odd = 0xAAAAAAAA;
    const uint32_t x = a ^ odd, y = b ^ odd;
    const uint64_t sum = static_cast<uint64_t>(x) + y + carry;
    carry = sum >> 32;
    return static_cast<uint32_t>(sum) ^ x ^ y ^ ~odd;
}

inline u16v dot_pairs(u8v samples, u8v weights) { return _mm512_maddubs_epi16(samples, weights); }

template <int B>
inline u16v sum_pairs(u16v low, u16v high) {
    static_assert(limits::pair_factor<B>);
    const __m512i factors = _mm512_set1_epi32(B << 16 | 1);
    return _mm512_packus_epi32(_mm512_madd_epi16(low, factors), _mm512_madd_epi16(high, factors));
}

// The multiply-add of unsigned by signed bytes does both products: constants by samples less 128.
template <int A, int B, int C>
inline s16v pair_dot(u8v v) {
    static_assert(limits::centred_pair<A, B>);
    constexpr bool negative = A < 0 || B < 0;
    constexpr int a = negative ? -A : A, b = negative ? -B : B;
    const __m512i centred = _mm512_xor_si512(v, _mm512_set1_epi8(-128));
    const __m512i dot =
        _mm512_maddubs_epi16(_mm512_set1_epi16(static_cast<int16_t>(b << 8 | a)), centred);
    const __m512i c = _mm512_set1_epi16(static_cast<int16_t>(C));
    return negative ? _mm512_sub_epi16(c, dot) : _mm512_add_epi16(dot, c);
}
// K v / 2 = (256 v)(128 K) >> 16.
template <int K, int C>
inline s16v half_product_high(u8v v) {
    static_assert(limits::half_factor<K>);
    return _mm512_add_epi16(
        _mm512_mulhi_epu16(_mm512_and_si512(v, set_u16(0xFF00)), set_u16(128 * K)),
        set_u16(static_cast<uint16_t>(C)));
}
template <int K, int C>
inline s16v half_product_low(u8v v) {
    static_assert(limits::half_factor<K>);
    return _mm512_add_epi16(_mm512_mulhi_epu16(_mm512_slli_epi16(v, 8), set_u16(128 * K)),
                            set_u16(static_cast<uint16_t>(C)));
}
inline s16v low_minus_128_shl8(u8v v) {
    return _mm512_slli_epi16(_mm512_xor_si512(v, _mm512_set1_epi8(-128)), 8);
}
inline s16v high_minus_128_shl8(u8v v) {
    return _mm512_xor_si512(_mm512_and_si512(v, _mm512_set1_epi16(static_cast<int16_t>(0xFF00))),
                            _mm512_set1_epi16(-32768));
}

inline u16v even(u8v v) { return _mm512_and_si512(v, _mm512_set1_epi16(255)); }
inline u16v odd(u8v v) { return _mm512_srli_epi16(v, 8); }
inline u8v join(u16v even, u16v odd) { return _mm512_or_si512(even, _mm512_slli_epi16(odd, 8)); }
template <int N>
inline u8v narrow_join(s16v even, s16v odd) {
    static_assert(limits::narrowing_shift<N>);
    const __m512i halves =
        _mm512_packus_epi16(_mm512_srai_epi16(even, N), _mm512_srai_epi16(odd, N));
    return _mm512_shuffle_epi8(halves, _mm512_broadcast_i32x4(_mm_setr_epi8(
                                           0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15)));
}

inline u16v widen_low(u8v v) { return _mm512_unpacklo_epi8(v, _mm512_setzero_si512()); }
inline u16v widen_high(u8v v) { return _mm512_unpackhi_epi8(v, _mm512_setzero_si512()); }
inline u8v narrow(s16v low, s16v high) { return _mm512_packus_epi16(low, high); }

template <int N>
inline u8v zip_low(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return _mm512_unpacklo_epi8(a, b);
    if constexpr (N == 2) return _mm512_unpacklo_epi16(a, b);
    if constexpr (N == 4) return _mm512_unpacklo_epi32(a, b);
    if constexpr (N == 8) return _mm512_unpacklo_epi64(a, b);
}
template <int N>
inline u8v zip_high(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return _mm512_unpackhi_epi8(a, b);
    if constexpr (N == 2) return _mm512_unpackhi_epi16(a, b);
    if constexpr (N == 4) return _mm512_unpackhi_epi32(a, b);
    if constexpr (N == 8) return _mm512_unpackhi_epi64(a, b);
}
inline u8v blend_u32(u8v a, u8v b) { return _mm512_mask_blend_epi32(0xAAAA, a, b); }
inline u8v shuffle(u8v v, u8v index) { return _mm512_shuffle_epi8(v, index); }
inline u8v pick(u8v v, u8v index) { return _mm512_permutexvar_epi8(index, v); }
inline u8v pick_or_zero(u8v v, u8v index) {
    return _mm512_maskz_permutexvar_epi8(_mm512_testn_epi8_mask(index, set_u8(0x80)), index, v);
}
struct reverse_index {
    alignas(64) uint8_t u8[64], u16[64];
    constexpr reverse_index() : u8(), u16() {
        for (int i = 0; i < 64; i++) {
            u8[i] = static_cast<uint8_t>(63 - i);
            u16[i] = static_cast<uint8_t>((63 - i) ^ 1);
        }
    }
};
inline constexpr reverse_index reverse_order;
inline u8v reverse_u8(u8v v) { return _mm512_permutexvar_epi8(load(reverse_order.u8), v); }
inline u8v reverse_u16(u8v v) { return _mm512_permutexvar_epi8(load(reverse_order.u16), v); }

inline u16v pack565(s16v hi, s16v mid, s16v lo) {
    constexpr int select = 0xCA;  // first ? second : third, bit by bit
    const __m512i zero = _mm512_setzero_si512();
    hi = _mm512_max_epi16(hi, zero);
    mid = _mm512_srli_epi16(_mm512_max_epi16(mid, zero), 4);
    lo = _mm512_srli_epi16(_mm512_max_epi16(lo, zero), 10);
    const __m512i upper = _mm512_ternarylogic_epi32(_mm512_set1_epi16(static_cast<int16_t>(0xF800)),
                                                    _mm512_add_epi16(hi, hi), mid, select);
    return _mm512_ternarylogic_epi32(_mm512_set1_epi16(static_cast<int16_t>(0xFFE0)), upper, lo,
                                     select);
}

inline u8v natural_to_by8(u8v v) {
    return _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 4, 1, 5, 2, 6, 3, 7), v);
}
inline u8v natural_to_by4(u8v v) {
    return _mm512_permutexvar_epi32(
        _mm512_setr_epi32(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15), v);
}
inline u8v by8_to_natural(u8v v) {
    return _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), v);
}

struct pair_u8 {
    u8v even, odd;
};
// Each vector is permuted once, so that the parts of the results that it holds stand where these
// want them, and the parts of two vectors put together.
using split_moves = __m512i;
inline split_moves set_split_moves(bool exchange) {
    const __m512i split =
        _mm512_broadcast_i32x4(_mm_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15));
    return _mm512_xor_si512(split, set_u8(exchange));
}
inline pair_u8 load_split(const uint8_t *p, split_moves order) {
    const __m512i a = _mm512_shuffle_epi8(load(p), order);
    const __m512i b = _mm512_shuffle_epi8(load(p + bytes), order);
    return {_mm512_unpacklo_epi64(a, b), _mm512_unpackhi_epi64(a, b)};
}
inline pair_u8 load_split(const uint8_t *p) { return load_split(p, set_split_moves(false)); }
struct split_index {
    alignas(64) uint8_t natural[64], by4[64];
    constexpr split_index() : natural(), by4() {
        for (int i = 0; i < 32; i++) {
            natural[i] = static_cast<uint8_t>(2 * i);
            natural[32 + i] = static_cast<uint8_t>(2 * i + 1);
            // Granule g of a vector's 32 even bytes goes to block g % 4, and so do the odd ones.
            const int granule = i / 4, at = 16 * (granule % 4) + 4 * (granule / 4) + i % 4;
            by4[at] = static_cast<uint8_t>(2 * i);
            by4[at + 8] = static_cast<uint8_t>(2 * i + 1);
        }
    }
};
inline constexpr split_index split_order;
inline pair_u8 load_split_natural(const uint8_t *p) {
    const __m512i order = load(split_order.natural);
    const __m512i a = _mm512_permutexvar_epi8(order, load(p));
    const __m512i b = _mm512_permutexvar_epi8(order, load(p + bytes));
    return {_mm512_shuffle_i64x2(a, b, 0x44), _mm512_shuffle_i64x2(a, b, 0xEE)};
}
inline pair_u8 load_split_by4(const uint8_t *p) {
    const __m512i order = load(split_order.by4);
    const __m512i a = _mm512_permutexvar_epi8(order, load(p));
    const __m512i b = _mm512_permutexvar_epi8(order, load(p + bytes));
    return {_mm512_unpacklo_epi64(a, b), _mm512_unpackhi_epi64(a, b)};
}
inline void store_split(uint8_t *p, uint8_t *q, u8v v) {
    store_halves(p, q, _mm512_permutexvar_epi8(load(split_order.natural), v));
}

inline void store_zip8(uint8_t *p, u8v even, u8v odd) {
    store(p, _mm512_unpacklo_epi8(even, odd));
    store(p + bytes, _mm512_unpackhi_epi8(even, odd));
}
inline void store_zip16(uint8_t *p, uint8_t *q, u16v even, u16v odd) {
    store(p, _mm512_unpacklo_epi16(even, odd));
    store(q, _mm512_unpackhi_epi16(even, odd));
}
inline void store_zip16(uint8_t *p, u16v even, u16v odd) { store_zip16(p, p + bytes, even, odd); }

// Byte q of the 192 is byte q / 3 of a, b or c, as q modulo 3 is 0, 1 or 2: one index vector for
// each output serves all three inputs.
// Of packed vectors, whose blocks hold 8 even pixels and 8 odd ones, it is the byte of pixel q / 3.
struct zip3_index {
    alignas(64) uint8_t natural[3 * 64], packed[3 * 64];
    constexpr zip3_index() : natural(), packed() {
        for (int q = 0; q < 3 * 64; q++) {
            const int pixel = q / 3;
            natural[q] = static_cast<uint8_t>(pixel);
            packed[q] = static_cast<uint8_t>(pixel / 16 * 16 + pixel % 2 * 8 + pixel % 16 / 2);
        }
    }
};
inline constexpr zip3_index zip3;
// Stores what is given the three parts.
template <class Put>
inline void zip3_parts(u8v a, u8v b, u8v c, const uint8_t *places, Put put) {
    constexpr __mmask64 every_third = 0x9249249249249249;  // bits 0, 3, ... 63
    constexpr __mmask64 second[3] = {every_third << 1, every_third, every_third >> 1};
    constexpr __mmask64 third[3] = {every_third << 2, every_third << 1, every_third};
    const auto part = [&](int k) __attribute__((always_inline)) {
        const __m512i index = load(places + 64 * k);
        __m512i v = _mm512_permutexvar_epi8(index, a);
        v = _mm512_mask_permutexvar_epi8(v, second[k], index, b);
        v = _mm512_mask_permutexvar_epi8(v, third[k], index, c);
        put(k, v);
    };
    part(0);
    part(1);
    part(2);
}
inline void store_zip3(uint8_t *p, u8v a, u8v b, u8v c, const uint8_t *places = zip3.natural) {
    zip3_parts(a, b, c, places, [&](int k, __m512i v) { store(p + bytes * k, v); });
}

template <int N>
inline __m512i pack(s16v even, s16v odd) {
    static_assert(limits::narrowing_shift<N>);
    return _mm512_packus_epi16(_mm512_srai_epi16(even, N), _mm512_srai_epi16(odd, N));
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, s16v a_even, s16v a_odd, s16v b_even, s16v b_odd,
                              s16v c_even, s16v c_odd, bool exchange = false) {
    const __m512i a = pack<A>(a_even, a_odd), c = pack<C>(c_even, c_odd);
    store_zip3(p, exchange ? c : a, pack<B>(b_even, b_odd), exchange ? a : c, zip3.packed);
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, uint8_t *q, s16v a_even, s16v a_odd, s16v b_even,
                              s16v b_odd, s16v c_even, s16v c_odd, bool exchange = false) {
    const __m512i a = pack<A>(a_even, a_odd), c = pack<C>(c_even, c_odd);
    zip3_parts(exchange ? c : a, pack<B>(b_even, b_odd), exchange ? a : c, zip3.packed,
               [&](int k, __m512i v) {
                   if (k == 0) store(p, v);
                   if (k == 1) store_halves(p + bytes, q, v);
                   if (k == 2) store(q + bytes / 2, v);
               });
}
inline void store_zip4(uint8_t *p, uint8_t *q, u8v a, u8v b, u8v c, u8v d) {
    const __m512i ab_lo = _mm512_unpacklo_epi8(a, b), ab_hi = _mm512_unpackhi_epi8(a, b);
    const __m512i cd_lo = _mm512_unpacklo_epi8(c, d), cd_hi = _mm512_unpackhi_epi8(c, d);
    store(p, _mm512_unpacklo_epi16(ab_lo, cd_lo));
    store(p + bytes, _mm512_unpackhi_epi16(ab_lo, cd_lo));
    store(q, _mm512_unpacklo_epi16(ab_hi, cd_hi));
    store(q + bytes, _mm512_unpackhi_epi16(ab_hi, cd_hi));
}
inline void store_zip4(uint8_t *p, u8v a, u8v b, u8v c, u8v d) {
    store_zip4(p, p + 2 * bytes, a, b, c, d);
}

inline u8v join_high(u16v a, u16v b) {
    constexpr int select = 0xCA;  // first ? second : third, bit by bit
    return _mm512_ternarylogic_epi32(_mm512_set1_epi16(255), _mm512_srli_epi16(a, 8), b, select);
}
inline void store_high(uint8_t *p, u16v a) {
    _mm256_storeu_si256(reinterpret_cast<__m256i *>(p),
                        _mm512_cvtepi16_epi8(_mm512_srli_epi16(a, 8)));
}

// Words of the even and of the odd pixels: channels 0 and 2 as a pair of bytes for the
// multiply-add, and channel 1 alone.
struct rgb_v {
    __m512i ac_even, b_even, ac_odd, b_odd;
};

inline rgb_v load_565(const uint8_t *p) {
    constexpr int and_or = 0xEA;  // (first & second) | third, bit by bit
    const __m512i v0 = load(p), v1 = load(p + bytes), low = _mm512_set1_epi32(0xFFFF);
    const __m512i even =
        by8_to_natural(_mm512_packus_epi32(_mm512_and_si512(v0, low), _mm512_and_si512(v1, low)));
    const __m512i odd =
        by8_to_natural(_mm512_packus_epi32(_mm512_srli_epi32(v0, 16), _mm512_srli_epi32(v1, 16)));
    const auto ac = [](__m512i v) {
        return _mm512_ternarylogic_epi32(_mm512_srli_epi16(v, 8), _mm512_set1_epi16(0xF8),
                                         _mm512_slli_epi16(v, 11), and_or);
    };
    const auto b = [](__m512i v) {
        return _mm512_and_si512(_mm512_srli_epi16(v, 3), _mm512_set1_epi16(0xFC));
    };
    return {ac(even), b(even), ac(odd), b(odd)};
}

// Where the bytes of 16 pixels go, the first of which is at place First of a vector: a block each
// for words ac of the even and of the odd pixels and for words b.
template <int First, int Size = 3>
struct channel_order {
    alignas(64) uint8_t lane[64];
    constexpr channel_order() : lane() {
        for (int i = 0; i < 16; i++) {
            const int pixel = First + Size * i, word = 16 * (i & 1) + (i & ~1);
            lane[word] = static_cast<uint8_t>(pixel);
            lane[word + 1] = static_cast<uint8_t>(pixel + 2);
            lane[word + 32] = static_cast<uint8_t>(pixel + 1);
        }
    }
};
template <int First, int Size = 3>
inline constexpr channel_order<First, Size> channels;

// Sixteen pixels of a vector.
inline __m512i order_channels(const uint8_t *order, const uint8_t *p) {
    constexpr __mmask64 channels_only = 0x55555555FFFFFFFF;  // zeros the high bytes of words b
    return _mm512_maskz_permutexvar_epi8(channels_only, load(order), load(p));
}
// Four times 16 pixels, transposed in blocks.
inline rgb_v transpose_channels(__m512i v0, __m512i v1, __m512i v2, __m512i v3) {
    const __m512i ac01 = _mm512_shuffle_i32x4(v0, v1, 0x44),
                  ac23 = _mm512_shuffle_i32x4(v2, v3, 0x44);
    const __m512i b01 = _mm512_shuffle_i32x4(v0, v1, 0xEE),
                  b23 = _mm512_shuffle_i32x4(v2, v3, 0xEE);
    return {_mm512_shuffle_i32x4(ac01, ac23, 0x88), _mm512_shuffle_i32x4(b01, b23, 0x88),
            _mm512_shuffle_i32x4(ac01, ac23, 0xDD), _mm512_shuffle_i32x4(b01, b23, 0xDD)};
}
// Every load takes 64 bytes; the last begins early, to end with the pixels.
inline rgb_v load_888(const uint8_t *p) {
    const uint8_t *order = channels<0>.lane, *last_order = channels<16>.lane;
    return transpose_channels(order_channels(order, p), order_channels(order, p + 48),
                              order_channels(order, p + 96), order_channels(last_order, p + 128));
}
template <int First>
inline rgb_v load_8888(const uint8_t *p) {
    const uint8_t *order = channels<First, 4>.lane;
    return transpose_channels(order_channels(order, p), order_channels(order, p + 64),
                              order_channels(order, p + 128), order_channels(order, p + 192));
}

// Four bytes of a pixel, in a 32-bit lane, become a 565 word with two multiply-adds: the channels
// lose their low bits, 32 c0 + c1 and c2 are made from bytes, and 64 times the first plus the
// second is 8 times the word.
inline __m512i words_565(__m512i v) {
    v = _mm512_and_si512(v, _mm512_set1_epi32(0x00F8FCF8));
    v = _mm512_maddubs_epi16(v, _mm512_set1_epi32(1 << 16 | 1 << 8 | 32));
    return _mm512_srli_epi32(_mm512_madd_epi16(v, _mm512_set1_epi32(1 << 16 | 64)), 3);
}
inline void store_565(uint8_t *p, __m512i a, __m512i b) {
    store(p, by8_to_natural(_mm512_packus_epi32(words_565(a), words_565(b))));
}
inline void repack_8888_to_565(uint8_t *p, const uint8_t *q) {
    store_565(p, load(q), load(q + 64));
    store_565(p + bytes, load(q + 128), load(q + 192));
}
// Where the bytes of 16 pixels go that begin at place First of a vector.
template <int First>
struct spread_order {
    alignas(64) uint8_t lane[64];
    constexpr spread_order() : lane() {
        for (int i = 0; i < 64; i++)
            lane[i] = static_cast<uint8_t>((First + i / 4 * 3 + i % 4) & 63);
    }
};
template <int First>
inline constexpr spread_order<First> spread;
inline void repack_888_to_565(uint8_t *p, const uint8_t *q) {
    const auto sixteen = [&](int at, const uint8_t *order) {
        return _mm512_permutexvar_epi8(load(order), load(q + at));
    };
    const uint8_t *order = spread<0>.lane, *last_order = spread<16>.lane;
    store_565(p, sixteen(0, order), sixteen(48, order));
    store_565(p + bytes, sixteen(96, order), sixteen(128, last_order));
}

// Where the bytes of pixels of four come from, but for the byte within the pixel of three; and
// where the bytes of pixels of three come from, within a vector, plain and with the first channel
// and the last exchanged.
struct repack_index {
    alignas(64) uint8_t widen[64], narrow[2][3 * 64];
    constexpr repack_index() : widen(), narrow() {
        for (int i = 0; i < 64; i++) widen[i] = static_cast<uint8_t>(i / 4 * 3);
        for (int i = 0; i < 3 * 64; i++)
            for (int k = 0; k < 2; k++)
                narrow[k][i] = static_cast<uint8_t>((i / 3 * 4 + (k ? 2 - i % 3 : i % 3)) & 63);
    }
};
inline constexpr repack_index repack_order;

struct widen_moves {
    __m512i all, last;  // the last sixteen pixels are those at byte 16 of a load
    __mmask64 channels;
};
inline widen_moves set_widen_moves(bool exchange, bool to_alpha_first) {
    const uint32_t from = exchange ? 0x000102 : 0x020100;
    const __m512i all =
        _mm512_add_epi8(load(repack_order.widen), set_u32(to_alpha_first ? from << 8 : from));
    return {all, _mm512_add_epi8(all, set_u8(16)),
            to_alpha_first ? 0xEEEEEEEEEEEEEEEE : 0x7777777777777777};
}
inline void repack_888_to_8888(uint8_t *p, const uint8_t *q, const widen_moves &m) {
    const auto sixteen = [&](int k, int at, __m512i moves) {
        store(p + bytes * k,
              _mm512_mask_permutexvar_epi8(_mm512_set1_epi8(-1), m.channels, moves, load(q + at)));
    };
    sixteen(0, 0, m.all);
    sixteen(1, 48, m.all);
    sixteen(2, 96, m.all);
    sixteen(3, 128, m.last);
}
struct narrow_moves {
    __m512i part[3];
};
inline narrow_moves set_narrow_moves(bool exchange, bool from_alpha_first) {
    const __m512i skip = set_u8(from_alpha_first);
    const auto part = [&](int k) {
        return _mm512_add_epi8(load(repack_order.narrow[exchange] + bytes * k), skip);
    };
    return {{part(0), part(1), part(2)}};
}
// Sixteen pixels are 48 bytes: each output takes its first bytes from one vector and the others
// from the next.
inline void repack_8888_to_888(uint8_t *p, const uint8_t *q, const narrow_moves &m) {
    const auto part = [&](int k, __m512i first, __m512i second, __mmask64 of_second) {
        store(p + bytes * k, _mm512_mask_permutexvar_epi8(_mm512_permutexvar_epi8(m.part[k], first),
                                                          of_second, m.part[k], second));
    };
    const __m512i b = load(q + 64), c = load(q + 128);
    part(0, load(q), b, 0xFFFF000000000000);
    part(1, b, c, 0xFFFFFFFF00000000);
    part(2, c, load(q + 192), 0xFFFFFFFFFFFF0000);
}

// Three loads of 64 bytes hold what 64 bytes of the result are made of, but for one or two; those
// lie in loads from two bytes on.
struct exchange_index {
    alignas(64) uint8_t first[3][64], second[3][64];
    constexpr exchange_index() : first(), second() {
        for (int k = 0; k < 3; k++)
            for (int i = 0; i < 64; i++) {
                const int to = 64 * k + i, from = to / 3 * 3 + 2 - to % 3 - (64 - 1) * k;
                first[k][i] = static_cast<uint8_t>(from < 64 ? from : 128);
                second[k][i] = static_cast<uint8_t>(from < 64 ? 128 : from - 2);
            }
    }
};
inline constexpr exchange_index exchange;
inline void exchange_888(uint8_t *p, const uint8_t *q) {
    const auto third = [&](int k) __attribute__((always_inline)) {
        const __m512i second = load(exchange.second[k]);
        const __m512i v = _mm512_permutexvar_epi8(load(exchange.first[k]), load(q + 63 * k));
        store(p + bytes * k,
              _mm512_mask_permutexvar_epi8(v, _mm512_cmplt_epu8_mask(second, set_u8(128)), second,
                                           load(q + 63 * k + 2)));
    };
    third(0);
    third(1);
    third(2);
}

// For x86.h.
inline s16v add_pairs(s16v a, s16v b) {
    const __m512i one = _mm512_set1_epi16(1);
    return _mm512_packs_epi32(_mm512_madd_epi16(a, one), _mm512_madd_epi16(b, one));
}
inline u8v pack_bytes(s16v a, s16v b) { return _mm512_packs_epi16(a, b); }
inline u8v even_dwords(u8v a, u8v b) {
    return _mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), 0x88));
}
inline u8v odd_dwords(u8v a, u8v b) {
    return _mm512_castps_si512(
        _mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), 0xDD));
}
inline u8v unpack_order(u8v v) {
    return _mm512_permutexvar_epi32(
        _mm512_setr_epi32(0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15), v);
}

}  // namespace simgp::avx512

#include "simd/x86.h"

#endif
