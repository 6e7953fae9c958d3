// The vector layer over AVX2: two blocks of 16 bytes. The meaning of each operation stands in
// lanes.h.
#ifndef SIMD_AVX2_H
#define SIMD_AVX2_H

#include <immintrin.h>
#include <stddef.h>
#include <stdint.h>

#include "simd/limits.h"

namespace simgp::avx2 {

inline constexpr int bytes = 32;
inline constexpr int blocks = 2;
inline constexpr bool moves_pointers = false;
inline constexpr int window_bytes = 16;
inline constexpr int windows = bytes / window_bytes;
inline constexpr bool pairs_in_halves = true;

// One register type stands for all lanes.
using u8v = __m256i;
using u16v = __m256i;
using s16v = __m256i;
using pairs_v = u8v;
using pair_bytes = u16v;

inline u8v as_u8(u16v v) { return v; }
inline u16v as_u16(u8v v) { return v; }
inline s16v as_s16(u16v v) { return v; }

inline u8v load(const uint8_t *p) {
    return _mm256_loadu_si256(reinterpret_cast<const __m256i *>(p));
}
inline void store(uint8_t *p, u8v v) { _mm256_storeu_si256(reinterpret_cast<__m256i *>(p), v); }
inline u8v load_zip(const uint8_t *p, const uint8_t *q) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i *>(p));
    const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i *>(q));
    return _mm256_inserti128_si256(_mm256_castsi128_si256(_mm_unpacklo_epi8(a, b)),
                                   _mm_unpackhi_epi8(a, b), 1);
}
inline u8v load_halves(const uint8_t *p, const uint8_t *q) {
    const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i *>(p));
    const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i *>(q));
    return _mm256_inserti128_si256(_mm256_castsi128_si256(a), b, 1);
}
inline u8v load_pairs_twice(const uint8_t *p, const uint8_t *q) {
    const __m128i a = _mm_loadl_epi64(reinterpret_cast<const __m128i *>(p));
    const __m128i b = _mm_loadl_epi64(reinterpret_cast<const __m128i *>(q));
    return _mm256_broadcastsi128_si256(_mm_unpacklo_epi8(a, b));
}

inline u8v load_blocks(const uint8_t *p, ptrdiff_t step) { return load_halves(p, p + step); }
inline u8v gather_windows(const uint8_t *p, const int32_t *at) {
    return load_halves(p + at[0], p + at[1]);
}
inline void store_halves(uint8_t *p, uint8_t *q, u8v v) {
    _mm_storeu_si128(reinterpret_cast<__m128i *>(p), _mm256_castsi256_si128(v));
    _mm_storeu_si128(reinterpret_cast<__m128i *>(q), _mm256_extracti128_si256(v, 1));
}
inline void store_blocks(uint8_t *p, ptrdiff_t step, u8v v) { store_halves(p, p + step, v); }

inline u8v set_u8(uint8_t x) { return _mm256_set1_epi8(static_cast<char>(x)); }
inline u16v set_u16(uint16_t x) { return _mm256_set1_epi16(static_cast<int16_t>(x)); }
inline u8v set_pair(uint8_t a, uint8_t b) { return set_u16(uint16_t(b << 8 | a)); }
inline u8v set_u32(uint32_t x) { return _mm256_set1_epi32(static_cast<int>(x)); }

inline void store_stream(uint8_t *p, u8v v) {
    _mm256_stream_si256(reinterpret_cast<__m256i *>(p), v);
}
inline void stream_end() { _mm_sfence(); }

inline u8v min_u8(u8v a, u8v b) { return _mm256_min_epu8(a, b); }
inline u8v max_u8(u8v a, u8v b) { return _mm256_max_epu8(a, b); }
inline u8v avg_u8(u8v a, u8v b) { return _mm256_avg_epu8(a, b); }
// One of the two differences is 0.
inline u8v absdiff_u8(u8v a, u8v b) {
    return _mm256_or_si256(_mm256_subs_epu8(a, b), _mm256_subs_epu8(b, a));
}
inline int first_zero(u8v v) {
    const unsigned zero =
        static_cast<unsigned>(_mm256_movemask_epi8(_mm256_cmpeq_epi8(v, _mm256_setzero_si256())));
    return zero ? __builtin_ctz(zero) : bytes;
}

inline u8v bit_and(u8v a, u8v b) { return _mm256_and_si256(a, b); }
inline u8v bit_or(u8v a, u8v b) { return _mm256_or_si256(a, b); }
inline u8v bit_xor(u8v a, u8v b) { return _mm256_xor_si256(a, b); }
inline u8v bit_not(u8v a) { return _mm256_xor_si256(a, _mm256_set1_epi8(-1)); }
template <int N>
inline u16v shl(u16v a) {
    static_assert(limits::shift<N>);
    return _mm256_slli_epi16(a, N);
}
template <int N>
inline u16v shr(u16v a) {
    static_assert(limits::shift<N>);
    return _mm256_srli_epi16(a, N);
}
template <int N>
inline s16v sar(s16v a) {
    static_assert(limits::shift<N>);
    return _mm256_srai_epi16(a, N);
}
template <int M, int N>
inline u16v shr_pairs(u16v a) {
    static_assert(limits::shift<M> && limits::shift<N>);
    return _mm256_mulhi_epu16(a,
                              _mm256_set1_epi32(static_cast<int>(1u << (32 - N) | 1u << (16 - M))));
}

inline s16v add(s16v a, s16v b) { return _mm256_add_epi16(a, b); }
inline s16v add_sat(s16v a, s16v b) { return _mm256_adds_epi16(a, b); }
inline s16v sub(s16v a, s16v b) { return _mm256_sub_epi16(a, b); }
inline s16v sub_sat(s16v a, s16v b) { return _mm256_subs_epi16(a, b); }
inline s16v min_s16(s16v a, s16v b) { return _mm256_min_epi16(a, b); }
inline s16v max_s16(s16v a, s16v b) { return _mm256_max_epi16(a, b); }
inline u16v mul(u16v a, u16v b) { return _mm256_mullo_epi16(a, b); }
inline u16v avg_u16(u16v a, u16v b) { return _mm256_avg_epu16(a, b); }
inline u16v sub_sat_u16(u16v a, u16v b) { return _mm256_subs_epu16(a, b); }
// k v / 2 = (256 v)(128 k) >> 16.
using half_factor = __m256i;
inline half_factor set_half_factor(int k) { return set_u16(static_cast<uint16_t>(128 * k)); }
inline u16v half_product(u16v v, half_factor k) {
    return _mm256_mulhi_epu16(_mm256_slli_epi16(v, 8), k);
}
inline s16v mul_round(s16v a, s16v b) { return _mm256_mulhrs_epi16(a, b); }

inline u8v add_sat_u8(u8v a, u8v b) { return _mm256_adds_epu8(a, b); }
inline u8v sub_sat_u8(u8v a, u8v b) { return _mm256_subs_epu8(a, b); }

inline u8v add_u8(u8v a, u8v b) { return _mm256_add_epi8(a, b); }
inline u8v sub_u8(u8v a, u8v b) { return _mm256_sub_epi8(a, b); }
inline u8v half_u8(u8v a) {
    return _mm256_and_si256(_mm256_srli_epi16(a, 1), _mm256_set1_epi8(127));
}

// All bits of a lane that is true.
using mask16 = __m256i;
inline mask16 greater(s16v a, s16v b) { return _mm256_cmpgt_epi16(a, b); }
inline u8v select(mask16 m, u8v yes, u8v no) { return _mm256_blendv_epi8(no, yes, m); }

// With two bits for a lane; the carry into the lower one counts.
using chain_state = uint64_t;
inline chain_state chain_begin(bool s) { return !s; }
inline mask16 chain_before(mask16 a, mask16 b, chain_state &carry) {
    constexpr uint32_t odd = 0xCCCCCCCC;
    const uint32_t x = static_cast<uint32_t>(_mm256_movemask_epi8(a)) ^ odd;
    const uint32_t y = static_cast<uint32_t>(_mm256_movemask_epi8(b)) ^ odd;
    const uint64_t sum = static_cast<uint64_t>(x) + y + carry;
    carry = sum >> 32;
    // Bit 2i, inverted at even i, to all bits of lane i.
    const __m256i s =
        _mm256_shuffle_epi8(_mm256_set1_epi32(static_cast<int>(static_cast<uint32_t>(sum) ^ x ^ y)),
                            _mm256_setr_epi8(0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 1, 1, 1, 1, 1, 1,  //
                                             2, 2, 2, 2, 2, 2, 2, 2, 3, 3, 3, 3, 3, 3, 3, 3));
    const __m256i bit = _mm256_set1_epi64x(static_cast<int64_t>(0x4040101004040101));
    const __m256i odd_bit = _mm256_set1_epi64x(0x4040000004040000);
    return _mm256_cmpeq_epi8(_mm256_and_si256(s, bit), odd_bit);
}

inline u16v dot_pairs(u8v samples, u8v weights) { return _mm256_maddubs_epi16(samples, weights); }

template <int B>
inline u16v sum_pairs(u16v low, u16v high) {
    static_assert(limits::pair_factor<B>);
    const __m256i factors = _mm256_set1_epi32(B << 16 | 1);
    return _mm256_packus_epi32(_mm256_madd_epi16(low, factors), _mm256_madd_epi16(high, factors));
}

// The multiply-add of unsigned by signed bytes does both products: constants by samples less 128.
template <int A, int B, int C>
inline s16v pair_dot(u8v v) {
    static_assert(limits::centred_pair<A, B>);
    constexpr bool negative = A < 0 || B < 0;
    constexpr int a = negative ? -A : A, b = negative ? -B : B;
    const __m256i centred = _mm256_xor_si256(v, _mm256_set1_epi8(-128));
    const __m256i dot =
        _mm256_maddubs_epi16(_mm256_set1_epi16(static_cast<int16_t>(b << 8 | a)), centred);
    const __m256i c = _mm256_set1_epi16(static_cast<int16_t>(C));
    return negative ? _mm256_sub_epi16(c, dot) : _mm256_add_epi16(dot, c);
}
// K v / 2 = (256 v)(128 K) >> 16.
template <int K, int C>
inline s16v half_product_high(u8v v) {
    static_assert(limits::half_factor<K>);
    return _mm256_add_epi16(
        _mm256_mulhi_epu16(_mm256_and_si256(v, set_u16(0xFF00)), set_u16(128 * K)),
        set_u16(static_cast<uint16_t>(C)));
}
template <int K, int C>
inline s16v half_product_low(u8v v) {
    static_assert(limits::half_factor<K>);
    return _mm256_add_epi16(_mm256_mulhi_epu16(_mm256_slli_epi16(v, 8), set_u16(128 * K)),
                            set_u16(static_cast<uint16_t>(C)));
}
inline s16v low_minus_128_shl8(u8v v) {
    return _mm256_slli_epi16(_mm256_xor_si256(v, _mm256_set1_epi8(-128)), 8);
}
inline s16v high_minus_128_shl8(u8v v) {
    return _mm256_xor_si256(_mm256_and_si256(v, _mm256_set1_epi16(static_cast<int16_t>(0xFF00))),
                            _mm256_set1_epi16(-32768));
}

inline u16v even(u8v v) { return _mm256_and_si256(v, _mm256_set1_epi16(255)); }
inline u16v odd(u8v v) { return _mm256_srli_epi16(v, 8); }
inline u8v join(u16v even, u16v odd) { return _mm256_or_si256(even, _mm256_slli_epi16(odd, 8)); }
template <int N>
inline u8v narrow_join(s16v even, s16v odd) {
    static_assert(limits::narrowing_shift<N>);
    const __m256i halves =
        _mm256_packus_epi16(_mm256_srai_epi16(even, N), _mm256_srai_epi16(odd, N));
    return _mm256_shuffle_epi8(
        halves, _mm256_setr_epi8(0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15,  //
                                 0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15));
}

inline u16v widen_low(u8v v) { return _mm256_unpacklo_epi8(v, _mm256_setzero_si256()); }
inline u16v widen_high(u8v v) { return _mm256_unpackhi_epi8(v, _mm256_setzero_si256()); }
inline u8v narrow(s16v low, s16v high) { return _mm256_packus_epi16(low, high); }

template <int N>
inline u8v zip_low(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return _mm256_unpacklo_epi8(a, b);
    if constexpr (N == 2) return _mm256_unpacklo_epi16(a, b);
    if constexpr (N == 4) return _mm256_unpacklo_epi32(a, b);
    if constexpr (N == 8) return _mm256_unpacklo_epi64(a, b);
}
template <int N>
inline u8v zip_high(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return _mm256_unpackhi_epi8(a, b);
    if constexpr (N == 2) return _mm256_unpackhi_epi16(a, b);
    if constexpr (N == 4) return _mm256_unpackhi_epi32(a, b);
    if constexpr (N == 8) return _mm256_unpackhi_epi64(a, b);
}
inline u8v blend_u32(u8v a, u8v b) { return _mm256_blend_epi32(a, b, 0xAA); }
inline u8v shuffle(u8v v, u8v index) { return _mm256_shuffle_epi8(v, index); }
inline u8v pick(u8v v, u8v index) { return shuffle(v, index); }
inline u8v pick_or_zero(u8v v, u8v index) { return shuffle(v, index); }
// Each block reversed, then the blocks exchanged.
inline u8v reverse_blocks(u8v v, __m128i order) {
    return _mm256_permute4x64_epi64(shuffle(v, _mm256_broadcastsi128_si256(order)), 0x4E);
}
inline u8v reverse_u8(u8v v) {
    return reverse_blocks(v, _mm_setr_epi8(15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0));
}
inline u8v reverse_u16(u8v v) {
    return reverse_blocks(v, _mm_setr_epi8(14, 15, 12, 13, 10, 11, 8, 9, 6, 7, 4, 5, 2, 3, 0, 1));
}

inline u16v pack565(s16v hi, s16v mid, s16v lo) {
    const __m256i zero = _mm256_setzero_si256();
    hi = _mm256_and_si256(_mm256_max_epi16(hi, zero), _mm256_set1_epi16(0x7C00));
    mid = _mm256_and_si256(_mm256_srli_epi16(_mm256_max_epi16(mid, zero), 4),
                           _mm256_set1_epi16(0x07E0));
    lo = _mm256_srli_epi16(_mm256_max_epi16(lo, zero), 10);
    return _mm256_or_si256(_mm256_or_si256(_mm256_add_epi16(hi, hi), mid), lo);
}

inline u8v natural_to_by8(u8v v) { return _mm256_permute4x64_epi64(v, 0xD8); }
inline u8v natural_to_by4(u8v v) {
    return _mm256_permutevar8x32_epi32(v, _mm256_setr_epi32(0, 2, 4, 6, 1, 3, 5, 7));
}
inline u8v by8_to_natural(u8v v) { return _mm256_permute4x64_epi64(v, 0xD8); }

struct pair_u8 {
    u8v even, odd;
};
// In-block: the even bytes of each block go to its lower half, the odd ones to its upper half; then
// halves of two vectors meet. What is loaded where decides the order.
using split_moves = __m256i;
inline split_moves set_split_moves(bool exchange) {
    const __m256i split = _mm256_broadcastsi128_si256(
        _mm_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15));
    return _mm256_xor_si256(split, set_u8(exchange));
}
inline pair_u8 split_blocks(__m256i a, __m256i b, split_moves order = set_split_moves(false)) {
    a = _mm256_shuffle_epi8(a, order);
    b = _mm256_shuffle_epi8(b, order);
    return {_mm256_unpacklo_epi64(a, b), _mm256_unpackhi_epi64(a, b)};
}
inline pair_u8 load_split(const uint8_t *p, split_moves order) {
    return split_blocks(load(p), load(p + bytes), order);
}
inline pair_u8 load_split(const uint8_t *p) { return load_split(p, set_split_moves(false)); }
inline pair_u8 load_split_natural(const uint8_t *p) {
    return split_blocks(load_blocks(p, 32), load_blocks(p + 16, 32));
}
inline pair_u8 load_split_by4(const uint8_t *p) {
    return split_blocks(_mm256_permute4x64_epi64(load(p), 0xD8),
                        _mm256_permute4x64_epi64(load(p + bytes), 0xD8));
}
inline void store_split(uint8_t *p, uint8_t *q, u8v v) {
    v = _mm256_shuffle_epi8(
        v, _mm256_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15,  //
                            0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15));
    store_halves(p, q, _mm256_permute4x64_epi64(v, 0xD8));
}

inline void store_zip8(uint8_t *p, u8v even, u8v odd) {
    store(p, _mm256_unpacklo_epi8(even, odd));
    store(p + bytes, _mm256_unpackhi_epi8(even, odd));
}
inline void store_zip16(uint8_t *p, uint8_t *q, u16v even, u16v odd) {
    store(p, _mm256_unpacklo_epi16(even, odd));
    store(q, _mm256_unpackhi_epi16(even, odd));
}
inline void store_zip16(uint8_t *p, u16v even, u16v odd) { store_zip16(p, p + bytes, even, odd); }

// Each vector is shuffled once, so that its bytes stand where any of the three outputs wants them,
// and each output blended from the three. A byte i of a block goes to place 3i + k of the 48 output
// bytes, k = 0, 1, 2 for a, b, c; place modulo 16 differs for all 16 bytes of a block.
inline void store_zip3(uint8_t *p, u8v a, u8v b, u8v c) {
    const auto twice = [](__m128i v) { return _mm256_broadcastsi128_si256(v); };
    a = _mm256_shuffle_epi8(
        a, twice(_mm_setr_epi8(0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15, 10, 5)));
    b = _mm256_shuffle_epi8(
        b, twice(_mm_setr_epi8(5, 0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15, 10)));
    c = _mm256_shuffle_epi8(
        c, twice(_mm_setr_epi8(10, 5, 0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15)));
    const __m256i m1 = twice(_mm_setr_epi8(0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0));
    const __m256i m2 = twice(_mm_setr_epi8(0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0));
    const auto blend = [&](__m256i x, __m256i y, __m256i z) {  // places 0, 1, 2 modulo 3
        return _mm256_blendv_epi8(_mm256_blendv_epi8(x, y, m1), z, m2);
    };
    const __m256i first = blend(a, b, c), second = blend(b, c, a), third = blend(c, a, b);
    store(p, _mm256_permute2x128_si256(first, second, 0x20));
    store(p + bytes, _mm256_blend_epi32(third, first, 0xF0));
    store(p + 2 * bytes, _mm256_permute2x128_si256(second, third, 0x31));
}

// Pairs a, b of 8 pixels give two thirds of 16 output bytes, and c the others. c is packed only:
// the shuffle takes its even pixels from the lower half of the block, its odd ones from the upper.
struct zip3_index {
    alignas(32) uint8_t ab[3][32], c[3][32];
    explicit constexpr zip3_index(bool exchange) : ab(), c() {
        for (int k = 0; k < 3; k++)
            for (int i = 0; i < 32; i++) {
                const int q = 16 * k + i % 16, pixel = q / 3,
                          channel = exchange ? 2 - q % 3 : q % 3;
                const bool is_c = channel == 2;
                ab[k][i] = static_cast<uint8_t>(is_c ? 255 : 2 * (pixel - 4 * k) + channel);
                c[k][i] = static_cast<uint8_t>(is_c ? 8 * (pixel & 1) + pixel / 2 : 255);
            }
    }
};
inline constexpr zip3_index zip3[2] = {zip3_index(false), zip3_index(true)};
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, uint8_t *q, s16v a_even, s16v a_odd, s16v b_even,
                              s16v b_odd, s16v c_even, s16v c_odd, bool exchange = false) {
    static_assert(limits::narrowing_shift<C>);
    const zip3_index &index = zip3[exchange];
    const __m256i a = narrow_join<A>(a_even, a_odd), b = narrow_join<B>(b_even, b_odd);
    const __m256i c =
        _mm256_packus_epi16(_mm256_srai_epi16(c_even, C), _mm256_srai_epi16(c_odd, C));
    const __m256i ab_lo = _mm256_unpacklo_epi8(a, b), ab_hi = _mm256_unpackhi_epi8(a, b);
    const __m256i ab_mid = _mm256_alignr_epi8(ab_hi, ab_lo, 8);
    const auto part = [&](__m256i ab, int k) {
        return _mm256_or_si256(_mm256_shuffle_epi8(ab, load(index.ab[k])),
                               _mm256_shuffle_epi8(c, load(index.c[k])));
    };
    store_halves(p, q, part(ab_lo, 0));
    store_halves(p + 16, q + 16, part(ab_mid, 1));
    store_halves(p + 32, q + 32, part(ab_hi, 2));
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, s16v a_even, s16v a_odd, s16v b_even, s16v b_odd,
                              s16v c_even, s16v c_odd, bool exchange = false) {
    store_narrow_zip3<A, B, C>(p, p + 48, a_even, a_odd, b_even, b_odd, c_even, c_odd, exchange);
}
inline void store_zip4(uint8_t *p, uint8_t *q, u8v a, u8v b, u8v c, u8v d) {
    const __m256i ab_lo = _mm256_unpacklo_epi8(a, b), ab_hi = _mm256_unpackhi_epi8(a, b);
    const __m256i cd_lo = _mm256_unpacklo_epi8(c, d), cd_hi = _mm256_unpackhi_epi8(c, d);
    store(p, _mm256_unpacklo_epi16(ab_lo, cd_lo));
    store(p + bytes, _mm256_unpackhi_epi16(ab_lo, cd_lo));
    store(q, _mm256_unpacklo_epi16(ab_hi, cd_hi));
    store(q + bytes, _mm256_unpackhi_epi16(ab_hi, cd_hi));
}
inline void store_zip4(uint8_t *p, u8v a, u8v b, u8v c, u8v d) {
    store_zip4(p, p + 2 * bytes, a, b, c, d);
}

inline u8v join_high(u16v a, u16v b) {
    return _mm256_or_si256(_mm256_srli_epi16(a, 8),
                           _mm256_and_si256(b, _mm256_set1_epi16(static_cast<int16_t>(0xFF00))));
}
inline void store_high(uint8_t *p, u16v a) {
    const __m256i v = _mm256_srli_epi16(a, 8);
    _mm_storeu_si128(reinterpret_cast<__m128i *>(p),
                     _mm_packus_epi16(_mm256_castsi256_si128(v), _mm256_extracti128_si256(v, 1)));
}

// Words of the even and of the odd pixels: channels 0 and 2 as a pair of bytes for the
// multiply-add, and channel 1 alone.
struct rgb_v {
    __m256i ac_even, b_even, ac_odd, b_odd;
};

inline rgb_v load_565(const uint8_t *p) {
    const __m256i v0 = load_blocks(p, 32), v1 = load_blocks(p + 16, 32),
                  low = _mm256_set1_epi32(0xFFFF);
    const __m256i even = _mm256_packus_epi32(_mm256_and_si256(v0, low), _mm256_and_si256(v1, low));
    const __m256i odd = _mm256_packus_epi32(_mm256_srli_epi32(v0, 16), _mm256_srli_epi32(v1, 16));
    const auto ac = [](__m256i v) {
        return _mm256_or_si256(_mm256_and_si256(_mm256_srli_epi16(v, 8), _mm256_set1_epi16(0xF8)),
                               _mm256_slli_epi16(v, 11));
    };
    const auto b = [](__m256i v) {
        return _mm256_and_si256(_mm256_srli_epi16(v, 3), _mm256_set1_epi16(0xFC));
    };
    return {ac(even), b(even), ac(odd), b(odd)};
}

// Puts the bytes of four pixels, the first of which is at place `first` of a block, in order: words
// ac of pixels 0 and 2, of 1 and 3, words b likewise.
inline __m256i channel_order(int first, int size = 3) {
    const auto at = [=](int pixel, int channel) {
        return static_cast<char>(first + size * pixel + channel);
    };
    return _mm256_broadcastsi128_si256(
        _mm_setr_epi8(at(0, 0), at(0, 2), at(2, 0), at(2, 2), at(1, 0), at(1, 2), at(3, 0),
                      at(3, 2), at(0, 1), -1, at(2, 1), -1, at(1, 1), -1, at(3, 1), -1));
}
// Four times four pixels in each block, transposed in units of two words.
inline rgb_v transpose_channels(__m256i v0, __m256i v1, __m256i v2, __m256i v3) {
    const __m256i ac01 = _mm256_unpacklo_epi32(v0, v1), ac23 = _mm256_unpacklo_epi32(v2, v3);
    const __m256i b01 = _mm256_unpackhi_epi32(v0, v1), b23 = _mm256_unpackhi_epi32(v2, v3);
    return {_mm256_unpacklo_epi64(ac01, ac23), _mm256_unpacklo_epi64(b01, b23),
            _mm256_unpackhi_epi64(ac01, ac23), _mm256_unpackhi_epi64(b01, b23)};
}
// Every load takes 16 bytes a block; the last begins early, to end with the pixels.
inline rgb_v load_888(const uint8_t *p) {
    const auto four = [&](ptrdiff_t at, __m256i order) {
        return _mm256_shuffle_epi8(load_blocks(p + at, 48), order);
    };
    const __m256i order = channel_order(0);
    return transpose_channels(four(0, order), four(12, order), four(24, order),
                              four(32, channel_order(4)));
}
template <int First>
inline rgb_v load_8888(const uint8_t *p) {
    const auto four = [&](ptrdiff_t at) {
        return _mm256_shuffle_epi8(load_blocks(p + at, 64), channel_order(First, 4));
    };
    return transpose_channels(four(0), four(16), four(32), four(48));
}

// Four bytes of a pixel, in a 32-bit lane, become a 565 word with two multiply-adds: the channels
// lose their low bits, 32 c0 + c1 and c2 are made from bytes, and 64 times the first plus the
// second is 8 times the word.
inline __m256i words_565(__m256i v) {
    v = _mm256_and_si256(v, _mm256_set1_epi32(0x00F8FCF8));
    v = _mm256_maddubs_epi16(v, _mm256_set1_epi32(1 << 16 | 1 << 8 | 32));
    return _mm256_srli_epi32(_mm256_madd_epi16(v, _mm256_set1_epi32(1 << 16 | 64)), 3);
}
// Eight pixels each of a, b, c and d: four of the first block and four of the second; those of a
// and b, and of c and d, follow each other.
inline void store_565(uint8_t *p, __m256i a, __m256i b, __m256i c, __m256i d) {
    store(p, _mm256_packus_epi32(words_565(a), words_565(b)));
    store(p + bytes, _mm256_packus_epi32(words_565(c), words_565(d)));
}
inline void repack_8888_to_565(uint8_t *p, const uint8_t *q) {
    store_565(p, load_blocks(q, 32), load_blocks(q + 16, 32), load_blocks(q + 64, 32),
              load_blocks(q + 80, 32));
}
inline void repack_888_to_565(uint8_t *p, const uint8_t *q) {
    // The last block begins early, to end with the pixels.
    const auto order = [](int first) {
        const auto z = [=](int i) { return static_cast<char>(first + i); };
        return _mm_setr_epi8(z(0), z(1), z(2), -1, z(3), z(4), z(5), -1, z(6), z(7), z(8), -1, z(9),
                             z(10), z(11), -1);
    };
    const __m256i all = _mm256_broadcastsi128_si256(order(0)),
                  last = _mm256_inserti128_si256(all, order(4), 1);
    const auto eight = [](const uint8_t *from, ptrdiff_t step, __m256i o) {
        return _mm256_shuffle_epi8(load_blocks(from, step), o);
    };
    store_565(p, eight(q, 24, all), eight(q + 12, 24, all), eight(q + 48, 24, all),
              eight(q + 60, 20, last));
}

// Which byte of a pixel of three goes to each byte of one of four; 128: none.
inline uint32_t widen_from(bool exchange, bool alpha_first) {
    const uint32_t channels = exchange ? 0x000102 : 0x020100;
    return alpha_first ? channels << 8 | 0x80 : channels | 0x80u << 24;
}
struct widen_moves {
    __m256i all, last, alpha;  // the last four pixels are those at byte 4 of a load
};
inline widen_moves set_widen_moves(bool exchange, bool to_alpha_first) {
    const __m256i pixels =
        _mm256_broadcastsi128_si256(_mm_setr_epi8(0, 0, 0, 0, 3, 3, 3, 3, 6, 6, 6, 6, 9, 9, 9, 9));
    const __m256i all = _mm256_add_epi8(pixels, set_u32(widen_from(exchange, to_alpha_first)));
    return {all,
            _mm256_add_epi8(all, _mm256_setr_epi64x(0, 0, 0x0404040404040404, 0x0404040404040404)),
            set_u32(to_alpha_first ? 255 : 255u << 24)};
}
inline void repack_888_to_8888(uint8_t *p, const uint8_t *q, const widen_moves &m) {
    const auto eight = [&](int k, ptrdiff_t step, __m256i moves) {
        store(p + bytes * k,
              _mm256_or_si256(_mm256_shuffle_epi8(load_blocks(q + 24 * k, step), moves), m.alpha));
    };
    eight(0, 12, m.all);
    eight(1, 12, m.all);
    eight(2, 12, m.all);
    eight(3, 8, m.last);
}
using narrow_moves = __m256i;
inline narrow_moves set_narrow_moves(bool exchange, bool from_alpha_first) {
    const __m128i channels =
        exchange ? _mm_setr_epi8(2, 1, 0, 6, 5, 4, 10, 9, 8, 14, 13, 12, -128, -128, -128, -128)
                 : _mm_setr_epi8(0, 1, 2, 4, 5, 6, 8, 9, 10, 12, 13, 14, -128, -128, -128, -128);
    return _mm256_add_epi8(_mm256_broadcastsi128_si256(channels), set_u8(from_alpha_first));
}
// Eight pixels are six dwords, 0 ... 2 of the first block and 0 ... 2 of the second. Of each eight,
// they are moved to where the outputs want them.
inline void repack_8888_to_888(uint8_t *p, const uint8_t *q, const narrow_moves &m) {
    const auto eight = [&](int k, __m256i places) {
        return _mm256_permutevar8x32_epi32(_mm256_shuffle_epi8(load(q + bytes * k), m), places);
    };
    const __m256i a = eight(0, _mm256_setr_epi32(0, 1, 2, 4, 5, 6, 0, 0)),
                  b = eight(1, _mm256_setr_epi32(2, 4, 5, 6, 0, 0, 0, 1)),
                  c = eight(2, _mm256_setr_epi32(5, 6, 0, 0, 0, 1, 2, 4)),
                  d = eight(3, _mm256_setr_epi32(0, 0, 0, 1, 2, 4, 5, 6));
    store(p, _mm256_blend_epi32(a, b, 0xC0));
    store(p + bytes, _mm256_blend_epi32(b, c, 0xF0));
    store(p + 2 * bytes, _mm256_blend_epi32(c, d, 0xFC));
}

// Two blocks, of 48 bytes each: three loads of 16 bytes hold what 16 bytes of the result are made of, but for one or two; those
// lie in loads from two bytes on.
struct exchange_index {
    alignas(16) uint8_t first[3][16], second[3][16];
    constexpr exchange_index() : first(), second() {
        for (int k = 0; k < 3; k++)
            for (int i = 0; i < 16; i++) {
                const int to = 16 * k + i, from = to / 3 * 3 + 2 - to % 3 - (16 - 1) * k;
                first[k][i] = static_cast<uint8_t>(from < 16 ? from : 128);
                second[k][i] = static_cast<uint8_t>(from < 16 ? 128 : from - 2);
            }
    }
};
inline constexpr exchange_index exchange;
inline void exchange_888(uint8_t *p, const uint8_t *q) {
    const auto third = [&](int k) __attribute__((always_inline)) {
        const auto part = [&](int at, const uint8_t *index) __attribute__((always_inline)) {
            return _mm256_shuffle_epi8(load_blocks(q + 15 * k + at, 48),
                                       _mm256_broadcastsi128_si256(_mm_load_si128(
                                           reinterpret_cast<const __m128i *>(index))));
        };
        store_blocks(p + 16 * k, 48,
                     _mm256_or_si256(part(0, exchange.first[k]), part(2, exchange.second[k])));
    };
    third(0);
    third(1);
    third(2);
}

// For x86.h.
inline s16v add_pairs(s16v a, s16v b) {
    const __m256i one = _mm256_set1_epi16(1);
    return _mm256_packs_epi32(_mm256_madd_epi16(a, one), _mm256_madd_epi16(b, one));
}
inline u8v pack_bytes(s16v a, s16v b) { return _mm256_packs_epi16(a, b); }
inline u8v even_dwords(u8v a, u8v b) {
    return _mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), 0x88));
}
inline u8v odd_dwords(u8v a, u8v b) {
    return _mm256_castps_si256(
        _mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), 0xDD));
}
inline u8v unpack_order(u8v v) {
    return _mm256_permutevar8x32_epi32(v, _mm256_setr_epi32(0, 4, 1, 5, 2, 6, 3, 7));
}

}  // namespace simgp::avx2

#include "simd/x86.h"

#endif
