// The vector layer over SSE4.1: one block of 16 bytes. The meaning of each operation stands in
// lanes.h.
#ifndef SIMD_SSE41_H
#define SIMD_SSE41_H

#include <smmintrin.h>
#include <stddef.h>
#include <stdint.h>
#include <string.h>

#include "simd/limits.h"

namespace simgp::sse41 {

inline constexpr int bytes = 16;
inline constexpr int blocks = 1;
inline constexpr bool moves_pointers = false;
inline constexpr int window_bytes = 16;
inline constexpr int windows = bytes / window_bytes;
inline constexpr bool pairs_in_halves = true;

// One register type stands for all lanes.
using u8v = __m128i;
using u16v = __m128i;
using s16v = __m128i;
using pairs_v = u8v;
using pair_bytes = u16v;

inline u8v as_u8(u16v v) { return v; }
inline u16v as_u16(u8v v) { return v; }
inline s16v as_s16(u16v v) { return v; }

inline u8v load(const uint8_t *p) { return _mm_loadu_si128(reinterpret_cast<const __m128i *>(p)); }
inline void store(uint8_t *p, u8v v) { _mm_storeu_si128(reinterpret_cast<__m128i *>(p), v); }
inline u8v load_zip(const uint8_t *p, const uint8_t *q) {
    return _mm_unpacklo_epi8(_mm_loadl_epi64(reinterpret_cast<const __m128i *>(p)),
                             _mm_loadl_epi64(reinterpret_cast<const __m128i *>(q)));
}
inline u8v load_halves(const uint8_t *p, const uint8_t *q) {
    return _mm_unpacklo_epi64(_mm_loadl_epi64(reinterpret_cast<const __m128i *>(p)),
                              _mm_loadl_epi64(reinterpret_cast<const __m128i *>(q)));
}
inline u8v load_pairs_twice(const uint8_t *p, const uint8_t *q) {
    int32_t a, b;
    memcpy(&a, p, sizeof a);
    memcpy(&b, q, sizeof b);
    const __m128i zip = _mm_unpacklo_epi8(_mm_cvtsi32_si128(a), _mm_cvtsi32_si128(b));
    return _mm_unpacklo_epi64(zip, zip);
}

inline u8v load_blocks(const uint8_t *p, ptrdiff_t) { return load(p); }
inline u8v gather_windows(const uint8_t *p, const int32_t *at) { return load(p + at[0]); }
inline void store_blocks(uint8_t *p, ptrdiff_t, u8v v) { store(p, v); }

inline u8v set_u8(uint8_t x) { return _mm_set1_epi8(static_cast<char>(x)); }
inline u16v set_u16(uint16_t x) { return _mm_set1_epi16(static_cast<int16_t>(x)); }
inline u8v set_pair(uint8_t a, uint8_t b) { return set_u16(uint16_t(b << 8 | a)); }
inline u8v set_u32(uint32_t x) { return _mm_set1_epi32(static_cast<int>(x)); }

inline void store_stream(uint8_t *p, u8v v) { _mm_stream_si128(reinterpret_cast<__m128i *>(p), v); }
inline void stream_end() { _mm_sfence(); }

inline u8v min_u8(u8v a, u8v b) { return _mm_min_epu8(a, b); }
inline u8v max_u8(u8v a, u8v b) { return _mm_max_epu8(a, b); }
inline u8v avg_u8(u8v a, u8v b) { return _mm_avg_epu8(a, b); }
// One of the two differences is 0.
inline u8v absdiff_u8(u8v a, u8v b) {
    return _mm_or_si128(_mm_subs_epu8(a, b), _mm_subs_epu8(b, a));
}
inline int first_zero(u8v v) {
    const unsigned zero =
        static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(v, _mm_setzero_si128())));
    return zero ? __builtin_ctz(zero) : bytes;
}

inline u8v bit_and(u8v a, u8v b) { return _mm_and_si128(a, b); }
inline u8v bit_or(u8v a, u8v b) { return _mm_or_si128(a, b); }
inline u8v bit_xor(u8v a, u8v b) { return _mm_xor_si128(a, b); }
inline u8v bit_not(u8v a) { return _mm_xor_si128(a, _mm_set1_epi8(-1)); }
template <int N>
inline u16v shl(u16v a) {
    static_assert(limits::shift<N>);
    return _mm_slli_epi16(a, N);
}
template <int N>
inline u16v shr(u16v a) {
    static_assert(limits::shift<N>);
    return _mm_srli_epi16(a, N);
}
template <int N>
inline s16v sar(s16v a) {
    static_assert(limits::shift<N>);
    return _mm_srai_epi16(a, N);
}
template <int M, int N>
inline u16v shr_pairs(u16v a) {
    static_assert(limits::shift<M> && limits::shift<N>);
    return _mm_mulhi_epu16(a, _mm_set1_epi32(static_cast<int>(1u << (32 - N) | 1u << (16 - M))));
}

inline s16v add(s16v a, s16v b) { return _mm_add_epi16(a, b); }
inline s16v add_sat(s16v a, s16v b) { return _mm_adds_epi16(a, b); }
inline s16v sub(s16v a, s16v b) { return _mm_sub_epi16(a, b); }
inline s16v sub_sat(s16v a, s16v b) { return _mm_subs_epi16(a, b); }
inline s16v min_s16(s16v a, s16v b) { return _mm_min_epi16(a, b); }
inline s16v max_s16(s16v a, s16v b) { return _mm_max_epi16(a, b); }
inline u16v mul(u16v a, u16v b) { return _mm_mullo_epi16(a, b); }
inline u16v avg_u16(u16v a, u16v b) { return _mm_avg_epu16(a, b); }
inline u16v sub_sat_u16(u16v a, u16v b) { return _mm_subs_epu16(a, b); }
// k v / 2 = (256 v)(128 k) >> 16.
using half_factor = __m128i;
inline half_factor set_half_factor(int k) { return set_u16(static_cast<uint16_t>(128 * k)); }
inline u16v half_product(u16v v, half_factor k) { return _mm_mulhi_epu16(_mm_slli_epi16(v, 8), k); }
inline s16v mul_round(s16v a, s16v b) { return _mm_mulhrs_epi16(a, b); }

inline u8v add_sat_u8(u8v a, u8v b) { return _mm_adds_epu8(a, b); }
inline u8v sub_sat_u8(u8v a, u8v b) { return _mm_subs_epu8(a, b); }

inline u8v add_u8(u8v a, u8v b) { return _mm_add_epi8(a, b); }
inline u8v sub_u8(u8v a, u8v b) { return _mm_sub_epi8(a, b); }
inline u8v half_u8(u8v a) { return _mm_and_si128(_mm_srli_epi16(a, 1), _mm_set1_epi8(127)); }

// All bits of a lane that is true.
using mask16 = __m128i;
inline mask16 greater(s16v a, s16v b) { return _mm_cmpgt_epi16(a, b); }
inline u8v select(mask16 m, u8v yes, u8v no) { return _mm_blendv_epi8(no, yes, m); }

// With two bits for a lane; the carry into the lower one counts.
using chain_state = uint32_t;
inline chain_state chain_begin(bool s) { return !s; }
inline mask16 chain_before(mask16 a, mask16 b, chain_state &carry) {
    constexpr uint32_t odd = 0xCCCC;
    const uint32_t x = static_cast<uint32_t>(_mm_movemask_epi8(a)) ^ odd;
    const uint32_t y = static_cast<uint32_t>(_mm_movemask_epi8(b)) ^ odd;
    const uint32_t sum = x + y + carry;
    carry = sum >> 16;
    // Bit 2i, inverted at even i, to all bits of lane i.
    const __m128i s = _mm_shuffle_epi8(_mm_cvtsi32_si128(static_cast<int>(sum ^ x ^ y)),
                                       _mm_setr_epi8(0, 0, 0, 0, 0, 0, 0, 0,  //
                                                     1, 1, 1, 1, 1, 1, 1, 1));
    const __m128i bit = _mm_set1_epi64x(static_cast<int64_t>(0x4040101004040101));
    const __m128i odd_bit = _mm_set1_epi64x(0x4040000004040000);
    return _mm_cmpeq_epi8(_mm_and_si128(s, bit), odd_bit);
}

inline u16v dot_pairs(u8v samples, u8v weights) { return _mm_maddubs_epi16(samples, weights); }

template <int B>
inline u16v sum_pairs(u16v low, u16v high) {
    static_assert(limits::pair_factor<B>);
    const __m128i factors = _mm_set1_epi32(B << 16 | 1);
    return _mm_packus_epi32(_mm_madd_epi16(low, factors), _mm_madd_epi16(high, factors));
}

// The multiply-add of unsigned by signed bytes does both products: constants by samples less 128.
template <int A, int B, int C>
inline s16v pair_dot(u8v v) {
    static_assert(limits::centred_pair<A, B>);
    constexpr bool negative = A < 0 || B < 0;
    constexpr int a = negative ? -A : A, b = negative ? -B : B;
    const __m128i centred = _mm_xor_si128(v, _mm_set1_epi8(-128));
    const __m128i dot =
        _mm_maddubs_epi16(_mm_set1_epi16(static_cast<int16_t>(b << 8 | a)), centred);
    const __m128i c = _mm_set1_epi16(static_cast<int16_t>(C));
    return negative ? _mm_sub_epi16(c, dot) : _mm_add_epi16(dot, c);
}
// K v / 2 = (256 v)(128 K) >> 16.
template <int K, int C>
inline s16v half_product_high(u8v v) {
    static_assert(limits::half_factor<K>);
    return _mm_add_epi16(_mm_mulhi_epu16(_mm_and_si128(v, set_u16(0xFF00)), set_u16(128 * K)),
                         set_u16(static_cast<uint16_t>(C)));
}
template <int K, int C>
inline s16v half_product_low(u8v v) {
    static_assert(limits::half_factor<K>);
    return _mm_add_epi16(_mm_mulhi_epu16(_mm_slli_epi16(v, 8), set_u16(128 * K)),
                         set_u16(static_cast<uint16_t>(C)));
}
inline s16v low_minus_128_shl8(u8v v) {
    return _mm_slli_epi16(_mm_xor_si128(v, _mm_set1_epi8(-128)), 8);
}
inline s16v high_minus_128_shl8(u8v v) {
    return _mm_xor_si128(_mm_and_si128(v, _mm_set1_epi16(static_cast<int16_t>(0xFF00))),
                         _mm_set1_epi16(-32768));
}

inline u16v even(u8v v) { return _mm_and_si128(v, _mm_set1_epi16(255)); }
inline u16v odd(u8v v) { return _mm_srli_epi16(v, 8); }
inline u8v join(u16v even, u16v odd) { return _mm_or_si128(even, _mm_slli_epi16(odd, 8)); }
template <int N>
inline u8v narrow_join(s16v even, s16v odd) {
    static_assert(limits::narrowing_shift<N>);
    const __m128i halves = _mm_packus_epi16(_mm_srai_epi16(even, N), _mm_srai_epi16(odd, N));
    return _mm_shuffle_epi8(halves,
                            _mm_setr_epi8(0, 8, 1, 9, 2, 10, 3, 11, 4, 12, 5, 13, 6, 14, 7, 15));
}

inline u16v widen_low(u8v v) { return _mm_unpacklo_epi8(v, _mm_setzero_si128()); }
inline u16v widen_high(u8v v) { return _mm_unpackhi_epi8(v, _mm_setzero_si128()); }
inline u8v narrow(s16v low, s16v high) { return _mm_packus_epi16(low, high); }

template <int N>
inline u8v zip_low(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return _mm_unpacklo_epi8(a, b);
    if constexpr (N == 2) return _mm_unpacklo_epi16(a, b);
    if constexpr (N == 4) return _mm_unpacklo_epi32(a, b);
    if constexpr (N == 8) return _mm_unpacklo_epi64(a, b);
}
template <int N>
inline u8v zip_high(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return _mm_unpackhi_epi8(a, b);
    if constexpr (N == 2) return _mm_unpackhi_epi16(a, b);
    if constexpr (N == 4) return _mm_unpackhi_epi32(a, b);
    if constexpr (N == 8) return _mm_unpackhi_epi64(a, b);
}
inline u8v blend_u32(u8v a, u8v b) { return _mm_blend_epi16(a, b, 0xCC); }
inline u8v shuffle(u8v v, u8v index) { return _mm_shuffle_epi8(v, index); }
inline u8v pick(u8v v, u8v index) { return shuffle(v, index); }
inline u8v pick_or_zero(u8v v, u8v index) { return shuffle(v, index); }
inline u8v reverse_u8(u8v v) {
    return shuffle(v, _mm_setr_epi8(15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0));
}
inline u8v reverse_u16(u8v v) {
    return shuffle(v, _mm_setr_epi8(14, 15, 12, 13, 10, 11, 8, 9, 6, 7, 4, 5, 2, 3, 0, 1));
}

inline u16v pack565(s16v hi, s16v mid, s16v lo) {
    const __m128i zero = _mm_setzero_si128();
    hi = _mm_and_si128(_mm_max_epi16(hi, zero), _mm_set1_epi16(0x7C00));
    mid = _mm_and_si128(_mm_srli_epi16(_mm_max_epi16(mid, zero), 4), _mm_set1_epi16(0x07E0));
    lo = _mm_srli_epi16(_mm_max_epi16(lo, zero), 10);
    return _mm_or_si128(_mm_or_si128(_mm_add_epi16(hi, hi), mid), lo);
}

// With one block, all orders of pixels are the same.
inline u8v natural_to_by8(u8v v) { return v; }
inline u8v natural_to_by4(u8v v) { return v; }
inline u8v by8_to_natural(u8v v) { return v; }

struct pair_u8 {
    u8v even, odd;
};
using split_moves = __m128i;
inline split_moves set_split_moves(bool exchange) {
    const __m128i split = _mm_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15);
    return _mm_xor_si128(split, set_u8(exchange));
}
inline pair_u8 load_split(const uint8_t *p, split_moves order) {
    const __m128i a = _mm_shuffle_epi8(load(p), order),
                  b = _mm_shuffle_epi8(load(p + bytes), order);
    return {_mm_unpacklo_epi64(a, b), _mm_unpackhi_epi64(a, b)};
}
inline pair_u8 load_split(const uint8_t *p) { return load_split(p, set_split_moves(false)); }
inline void store_split(uint8_t *p, uint8_t *q, u8v v) {
    v = _mm_shuffle_epi8(v, _mm_setr_epi8(0, 2, 4, 6, 8, 10, 12, 14, 1, 3, 5, 7, 9, 11, 13, 15));
    _mm_storel_epi64(reinterpret_cast<__m128i *>(p), v);
    _mm_storel_epi64(reinterpret_cast<__m128i *>(q), _mm_srli_si128(v, 8));
}
inline pair_u8 load_split_natural(const uint8_t *p) { return load_split(p); }
inline pair_u8 load_split_by4(const uint8_t *p) { return load_split(p); }

inline void store_zip8(uint8_t *p, u8v even, u8v odd) {
    store(p, _mm_unpacklo_epi8(even, odd));
    store(p + bytes, _mm_unpackhi_epi8(even, odd));
}
inline void store_zip16(uint8_t *p, uint8_t *q, u16v even, u16v odd) {
    store(p, _mm_unpacklo_epi16(even, odd));
    store(q, _mm_unpackhi_epi16(even, odd));
}
inline void store_zip16(uint8_t *p, u16v even, u16v odd) { store_zip16(p, p + bytes, even, odd); }

// Each vector is shuffled once, so that its bytes stand where any of the three outputs wants them,
// and each output blended from the three. A byte i of a block goes to place 3i + k of the 48 output
// bytes, k = 0, 1, 2 for a, b, c; place modulo 16 differs for all 16 bytes of a block.
inline void store_zip3(uint8_t *p, u8v a, u8v b, u8v c) {
    a = _mm_shuffle_epi8(a, _mm_setr_epi8(0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15, 10, 5));
    b = _mm_shuffle_epi8(b, _mm_setr_epi8(5, 0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15, 10));
    c = _mm_shuffle_epi8(c, _mm_setr_epi8(10, 5, 0, 11, 6, 1, 12, 7, 2, 13, 8, 3, 14, 9, 4, 15));
    const __m128i m1 = _mm_setr_epi8(0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0);
    const __m128i m2 = _mm_setr_epi8(0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0, 0, -1, 0);
    const auto blend = [&](__m128i x, __m128i y, __m128i z) {  // places 0, 1, 2 modulo 3
        return _mm_blendv_epi8(_mm_blendv_epi8(x, y, m1), z, m2);
    };
    store(p, blend(a, b, c));
    store(p + bytes, blend(b, c, a));
    store(p + 2 * bytes, blend(c, a, b));
}

// Pairs a, b of 8 pixels give two thirds of 16 output bytes, and c the others. c is packed only:
// the shuffle takes its even pixels from the lower half of the block, its odd ones from the upper.
struct zip3_index {
    alignas(16) uint8_t ab[3][16], c[3][16];
    explicit constexpr zip3_index(bool exchange) : ab(), c() {
        for (int k = 0; k < 3; k++)
            for (int i = 0; i < 16; i++) {
                const int q = 16 * k + i % 16, pixel = q / 3,
                          channel = exchange ? 2 - q % 3 : q % 3;
                const bool is_c = channel == 2;
                ab[k][i] = static_cast<uint8_t>(is_c ? 255 : 2 * (pixel - 4 * k) + channel);
                c[k][i] = static_cast<uint8_t>(is_c ? 8 * (pixel & 1) + pixel / 2 : 255);
            }
    }
};
inline constexpr zip3_index zip3[2] = {zip3_index(false), zip3_index(true)};
// Stores what is given the three parts.
template <int A, int B, int C, class Put>
inline void narrow_zip3(s16v a_even, s16v a_odd, s16v b_even, s16v b_odd, s16v c_even, s16v c_odd,
                        bool exchange, Put put) {
    static_assert(limits::narrowing_shift<C>);
    const zip3_index &index = zip3[exchange];
    const __m128i a = narrow_join<A>(a_even, a_odd), b = narrow_join<B>(b_even, b_odd);
    const __m128i c = _mm_packus_epi16(_mm_srai_epi16(c_even, C), _mm_srai_epi16(c_odd, C));
    const __m128i ab_lo = _mm_unpacklo_epi8(a, b), ab_hi = _mm_unpackhi_epi8(a, b);
    const __m128i ab_mid = _mm_alignr_epi8(ab_hi, ab_lo, 8);
    const auto part = [&](__m128i ab, int k) {
        return _mm_or_si128(_mm_shuffle_epi8(ab, load(index.ab[k])),
                            _mm_shuffle_epi8(c, load(index.c[k])));
    };
    put(part(ab_lo, 0), part(ab_mid, 1), part(ab_hi, 2));
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, s16v a_even, s16v a_odd, s16v b_even, s16v b_odd,
                              s16v c_even, s16v c_odd, bool exchange = false) {
    narrow_zip3<A, B, C>(a_even, a_odd, b_even, b_odd, c_even, c_odd, exchange,
                         [&](__m128i first, __m128i mid, __m128i last) {
                             store(p, first);
                             store(p + 16, mid);
                             store(p + 32, last);
                         });
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, uint8_t *q, s16v a_even, s16v a_odd, s16v b_even,
                              s16v b_odd, s16v c_even, s16v c_odd, bool exchange = false) {
    narrow_zip3<A, B, C>(a_even, a_odd, b_even, b_odd, c_even, c_odd, exchange,
                         [&](__m128i first, __m128i mid, __m128i last) {
                             store(p, first);
                             _mm_storel_epi64(reinterpret_cast<__m128i *>(p + 16), mid);
                             _mm_storel_epi64(reinterpret_cast<__m128i *>(q),
                                              _mm_srli_si128(mid, 8));
                             store(q + 8, last);
                         });
}
inline void store_zip4(uint8_t *p, uint8_t *q, u8v a, u8v b, u8v c, u8v d) {
    const __m128i ab_lo = _mm_unpacklo_epi8(a, b), ab_hi = _mm_unpackhi_epi8(a, b);
    const __m128i cd_lo = _mm_unpacklo_epi8(c, d), cd_hi = _mm_unpackhi_epi8(c, d);
    store(p, _mm_unpacklo_epi16(ab_lo, cd_lo));
    store(p + bytes, _mm_unpackhi_epi16(ab_lo, cd_lo));
    store(q, _mm_unpacklo_epi16(ab_hi, cd_hi));
    store(q + bytes, _mm_unpackhi_epi16(ab_hi, cd_hi));
}
inline void store_zip4(uint8_t *p, u8v a, u8v b, u8v c, u8v d) {
    store_zip4(p, p + 2 * bytes, a, b, c, d);
}

inline u8v join_high(u16v a, u16v b) {
    return _mm_or_si128(_mm_srli_epi16(a, 8),
                        _mm_and_si128(b, _mm_set1_epi16(static_cast<int16_t>(0xFF00))));
}
inline void store_high(uint8_t *p, u16v a) {
    const __m128i v = _mm_srli_epi16(a, 8);
    _mm_storel_epi64(reinterpret_cast<__m128i *>(p), _mm_packus_epi16(v, v));
}

// Words of the even and of the odd pixels: channels 0 and 2 as a pair of bytes for the
// multiply-add, and channel 1 alone.
struct rgb_v {
    __m128i ac_even, b_even, ac_odd, b_odd;
};

inline rgb_v load_565(const uint8_t *p) {
    const __m128i v0 = load(p), v1 = load(p + bytes), low = _mm_set1_epi32(0xFFFF);
    const __m128i even = _mm_packus_epi32(_mm_and_si128(v0, low), _mm_and_si128(v1, low));
    const __m128i odd = _mm_packus_epi32(_mm_srli_epi32(v0, 16), _mm_srli_epi32(v1, 16));
    const auto ac = [](__m128i v) {
        return _mm_or_si128(_mm_and_si128(_mm_srli_epi16(v, 8), _mm_set1_epi16(0xF8)),
                            _mm_slli_epi16(v, 11));
    };
    const auto b = [](__m128i v) {
        return _mm_and_si128(_mm_srli_epi16(v, 3), _mm_set1_epi16(0xFC));
    };
    return {ac(even), b(even), ac(odd), b(odd)};
}

// Puts the bytes of four pixels, the first of which is at place `first` of a block, in order: words
// ac of pixels 0 and 2, of 1 and 3, words b likewise.
inline __m128i channel_order(int first, int size = 3) {
    const auto at = [=](int pixel, int channel) {
        return static_cast<char>(first + size * pixel + channel);
    };
    return _mm_setr_epi8(at(0, 0), at(0, 2), at(2, 0), at(2, 2), at(1, 0), at(1, 2), at(3, 0),
                         at(3, 2), at(0, 1), -1, at(2, 1), -1, at(1, 1), -1, at(3, 1), -1);
}
// Four times four pixels, transposed in units of two words.
inline rgb_v transpose_channels(__m128i v0, __m128i v1, __m128i v2, __m128i v3) {
    const __m128i ac01 = _mm_unpacklo_epi32(v0, v1), ac23 = _mm_unpacklo_epi32(v2, v3);
    const __m128i b01 = _mm_unpackhi_epi32(v0, v1), b23 = _mm_unpackhi_epi32(v2, v3);
    return {_mm_unpacklo_epi64(ac01, ac23), _mm_unpacklo_epi64(b01, b23),
            _mm_unpackhi_epi64(ac01, ac23), _mm_unpackhi_epi64(b01, b23)};
}
// Every load takes 16 bytes; the last begins early, to end with the pixels.
inline rgb_v load_888(const uint8_t *p) {
    const auto four = [&](ptrdiff_t at, __m128i order) {
        return _mm_shuffle_epi8(load(p + at), order);
    };
    const __m128i order = channel_order(0);
    return transpose_channels(four(0, order), four(12, order), four(24, order),
                              four(32, channel_order(4)));
}
template <int First>
inline rgb_v load_8888(const uint8_t *p) {
    const auto four = [&](ptrdiff_t at) {
        return _mm_shuffle_epi8(load(p + at), channel_order(First, 4));
    };
    return transpose_channels(four(0), four(16), four(32), four(48));
}

// Four bytes of a pixel, in a 32-bit lane, become a 565 word with two multiply-adds: the channels
// lose their low bits, 32 c0 + c1 and c2 are made from bytes, and 64 times the first plus the
// second is 8 times the word.
inline __m128i words_565(__m128i v) {
    v = _mm_and_si128(v, _mm_set1_epi32(0x00F8FCF8));
    v = _mm_maddubs_epi16(v, _mm_set1_epi32(1 << 16 | 1 << 8 | 32));
    return _mm_srli_epi32(_mm_madd_epi16(v, _mm_set1_epi32(1 << 16 | 64)), 3);
}
// Four pixels each of a, b, c and d.
inline void store_565(uint8_t *p, __m128i a, __m128i b, __m128i c, __m128i d) {
    store(p, _mm_packus_epi32(words_565(a), words_565(b)));
    store(p + bytes, _mm_packus_epi32(words_565(c), words_565(d)));
}
inline void repack_8888_to_565(uint8_t *p, const uint8_t *q) {
    store_565(p, load(q), load(q + 16), load(q + 32), load(q + 48));
}
inline void repack_888_to_565(uint8_t *p, const uint8_t *q) {
    const auto four = [&](int at, int first) {
        const auto z = [=](int i) { return static_cast<char>(first + i); };
        return _mm_shuffle_epi8(
            load(q + at), _mm_setr_epi8(z(0), z(1), z(2), -1, z(3), z(4), z(5), -1, z(6), z(7),
                                        z(8), -1, z(9), z(10), z(11), -1));
    };
    store_565(p, four(0, 0), four(12, 0), four(24, 0), four(32, 4));
}

// Which byte of a pixel of three goes to each byte of one of four; 128: none.
inline uint32_t widen_from(bool exchange, bool alpha_first) {
    const uint32_t channels = exchange ? 0x000102 : 0x020100;
    return alpha_first ? channels << 8 | 0x80 : channels | 0x80u << 24;
}
struct widen_moves {
    __m128i all, last, alpha;  // the last four pixels are those at byte 4 of a load
};
inline widen_moves set_widen_moves(bool exchange, bool to_alpha_first) {
    const __m128i pixels = _mm_setr_epi8(0, 0, 0, 0, 3, 3, 3, 3, 6, 6, 6, 6, 9, 9, 9, 9);
    const __m128i all = _mm_add_epi8(pixels, set_u32(widen_from(exchange, to_alpha_first)));
    return {all, _mm_add_epi8(all, _mm_set1_epi8(4)), set_u32(to_alpha_first ? 255 : 255u << 24)};
}
inline void repack_888_to_8888(uint8_t *p, const uint8_t *q, const widen_moves &m) {
    const auto four = [&](int k, int at, __m128i moves) {
        store(p + 16 * k, _mm_or_si128(_mm_shuffle_epi8(load(q + at), moves), m.alpha));
    };
    four(0, 0, m.all);
    four(1, 12, m.all);
    four(2, 24, m.all);
    four(3, 32, m.last);
}
using narrow_moves = __m128i;
inline narrow_moves set_narrow_moves(bool exchange, bool from_alpha_first) {
    const __m128i channels =
        exchange ? _mm_setr_epi8(2, 1, 0, 6, 5, 4, 10, 9, 8, 14, 13, 12, -128, -128, -128, -128)
                 : _mm_setr_epi8(0, 1, 2, 4, 5, 6, 8, 9, 10, 12, 13, 14, -128, -128, -128, -128);
    return _mm_add_epi8(channels, set_u8(from_alpha_first));
}
// The four bytes of a block behind those of its pixels are 0.
inline void repack_8888_to_888(uint8_t *p, const uint8_t *q, const narrow_moves &m) {
    const auto four = [&](int k) { return _mm_shuffle_epi8(load(q + 16 * k), m); };
    const __m128i a = four(0), b = four(1), c = four(2), d = four(3);
    store(p, _mm_or_si128(a, _mm_slli_si128(b, 12)));
    store(p + 16, _mm_or_si128(_mm_srli_si128(b, 4), _mm_slli_si128(c, 8)));
    store(p + 32, _mm_or_si128(_mm_srli_si128(c, 8), _mm_slli_si128(d, 4)));
}

// Three loads of 16 bytes hold what 16 bytes of the result are made of, but for one or two; those
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
            return _mm_shuffle_epi8(load(q + 15 * k + at), load(index));
        };
        store(p + 16 * k, _mm_or_si128(part(0, exchange.first[k]), part(2, exchange.second[k])));
    };
    third(0);
    third(1);
    third(2);
}

// For x86.h.
inline s16v add_pairs(s16v a, s16v b) {
    const __m128i one = _mm_set1_epi16(1);
    return _mm_packs_epi32(_mm_madd_epi16(a, one), _mm_madd_epi16(b, one));
}
inline u8v pack_bytes(s16v a, s16v b) { return _mm_packs_epi16(a, b); }
inline u8v even_dwords(u8v a, u8v b) {
    return _mm_castps_si128(_mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), 0x88));
}
inline u8v odd_dwords(u8v a, u8v b) {
    return _mm_castps_si128(_mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), 0xDD));
}
inline u8v unpack_order(u8v v) { return v; }

}  // namespace simgp::sse41

#include "simd/x86.h"

#endif
