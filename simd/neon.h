// The vector layer over NEON, on 32-bit and 64-bit ARM: one block of 16 bytes. The meaning of each
// operation stands in lanes.h.
#ifndef SIMD_NEON_H
#define SIMD_NEON_H

#include <arm_neon.h>
#include <stddef.h>
#include <stdint.h>
#include <string.h>

#include "simd/limits.h"

namespace simgp::neon {

inline constexpr int bytes = 16;
inline constexpr int blocks = 1;
inline constexpr bool moves_pointers = true;
inline constexpr int window_bytes = 16;
inline constexpr int windows = bytes / window_bytes;
// On 32-bit ARM, where the library is to be smallest, narrow pictures are left to columns.
inline constexpr bool pairs_in_halves = sizeof(void *) == 8;

using u8v = uint8x16_t;
using u16v = uint16x8_t;
using s16v = int16x8_t;

inline u8v as_u8(u16v v) { return vreinterpretq_u8_u16(v); }
inline u16v as_u16(u8v v) { return vreinterpretq_u16_u8(v); }
inline u16v as_u16(s16v v) { return vreinterpretq_u16_s16(v); }
inline s16v as_s16(u16v v) { return vreinterpretq_s16_u16(v); }

// Says that p has been moved to where the next load or store is. On 32-bit ARM, GCC would otherwise
// keep two pointers at a distance, as it does where instructions take offsets; those of vectors do
// not, but move their pointer for nothing.
template <class T>
[[gnu::always_inline]] inline void step_pointer([[maybe_unused]] T *&p) {
#if !defined __aarch64__ && !defined __clang__
    asm("" : "+r"(p));
#endif
}

// What is computed from n alone GCC would put into the loop before, where it finds room for it.
inline void keep_behind([[maybe_unused]] ptrdiff_t &n) {
#if !defined __aarch64__ && !defined __clang__
    asm volatile("" : "+r"(n));
#endif
}

inline u8v load(const uint8_t *p) { return vld1q_u8(p); }
inline void store(uint8_t *p, u8v v) { vst1q_u8(p, v); }
inline u8v load_zip(const uint8_t *p, const uint8_t *q) {
#ifdef __aarch64__
    const uint8x8_t none = vdup_n_u8(0);  // which the loads write
    return vzip1q_u8(vcombine_u8(vld1_u8(p), none), vcombine_u8(vld1_u8(q), none));
#else
    const uint8x8x2_t zip = vzip_u8(vld1_u8(p), vld1_u8(q));
    return vcombine_u8(zip.val[0], zip.val[1]);
#endif
}

inline u8v load_blocks(const uint8_t *p, ptrdiff_t) { return load(p); }
inline u8v gather_windows(const uint8_t *p, const int32_t *at) { return load(p + at[0]); }
inline void store_blocks(uint8_t *p, ptrdiff_t, u8v v) { store(p, v); }

inline u8v set_u8(uint8_t x) { return vdupq_n_u8(x); }
inline u16v set_u16(uint16_t x) { return vdupq_n_u16(x); }
inline u8v set_pair(uint8_t a, uint8_t b) { return as_u8(set_u16(uint16_t(b << 8 | a))); }
inline u8v set_u32(uint32_t x) { return vreinterpretq_u8_u32(vdupq_n_u32(x)); }

inline void store_stream(uint8_t *p, u8v v) { store(p, v); }
inline void stream_end() {}

inline u8v min_u8(u8v a, u8v b) { return vminq_u8(a, b); }
inline u8v max_u8(u8v a, u8v b) { return vmaxq_u8(a, b); }
inline u8v avg_u8(u8v a, u8v b) { return vrhaddq_u8(a, b); }
inline u8v absdiff_u8(u8v a, u8v b) { return vabdq_u8(a, b); }
inline int first_zero(u8v v) {
    // Four bits for each byte, in one 64-bit word.
    const uint8x8_t zero = vshrn_n_u16(as_u16(vceqq_u8(v, vdupq_n_u8(0))), 4);
    const uint64_t bits = vget_lane_u64(vreinterpret_u64_u8(zero), 0);
    return bits ? __builtin_ctzll(bits) / 4 : bytes;
}

inline u8v bit_and(u8v a, u8v b) { return vandq_u8(a, b); }
inline u8v bit_or(u8v a, u8v b) { return vorrq_u8(a, b); }
inline u8v bit_xor(u8v a, u8v b) { return veorq_u8(a, b); }
inline u8v bit_not(u8v a) { return vmvnq_u8(a); }
inline u16v bit_and(u16v a, u16v b) { return vandq_u16(a, b); }
inline u16v bit_or(u16v a, u16v b) { return vorrq_u16(a, b); }
template <int N>
inline u16v shl(u16v a) {
    static_assert(limits::shift<N>);
    return vshlq_n_u16(a, N);
}
template <int N>
inline u16v shr(u16v a) {
    static_assert(limits::shift<N>);
    return vshrq_n_u16(a, N);
}
template <int N>
inline s16v sar(s16v a) {
    static_assert(limits::shift<N>);
    return vshrq_n_s16(a, N);
}
template <int M, int N>
inline u16v shr_pairs(u16v a) {
    static_assert(limits::shift<M> && limits::shift<N>);
    return vshlq_u16(a, vreinterpretq_s16_u32(vdupq_n_u32(uint32_t(-N) << 16 | (-M & 0xFFFF))));
}

inline s16v add(s16v a, s16v b) { return vaddq_s16(a, b); }
inline s16v add_sat(s16v a, s16v b) { return vqaddq_s16(a, b); }
inline s16v sub(s16v a, s16v b) { return vsubq_s16(a, b); }
inline s16v sub_sat(s16v a, s16v b) { return vqsubq_s16(a, b); }
inline s16v min_s16(s16v a, s16v b) { return vminq_s16(a, b); }
inline s16v max_s16(s16v a, s16v b) { return vmaxq_s16(a, b); }
inline u16v mul(u16v a, u16v b) { return vmulq_u16(a, b); }
inline u16v avg_u16(u16v a, u16v b) { return vrhaddq_u16(a, b); }
inline u16v mean_down_u16(u16v a, u16v b) { return vhaddq_u16(a, b); }
inline s16v half_difference(u16v a, u16v b) { return as_s16(vhsubq_u16(a, b)); }
inline u16v sub_sat_u16(u16v a, u16v b) { return vqsubq_u16(a, b); }
inline s16v mul_round(s16v a, s16v b) { return vqrdmulhq_s16(a, b); }

inline u8v add_sat_u8(u8v a, u8v b) { return vqaddq_u8(a, b); }
inline u8v sub_sat_u8(u8v a, u8v b) { return vqsubq_u8(a, b); }

inline u8v add_u8(u8v a, u8v b) { return vaddq_u8(a, b); }
inline u8v sub_u8(u8v a, u8v b) { return vsubq_u8(a, b); }
inline u8v half_u8(u8v a) { return vshrq_n_u8(a, 1); }

// All bits of a lane that is true.
using mask16 = uint16x8_t;
inline mask16 greater(s16v a, s16v b) { return vcgtq_s16(a, b); }
inline u8v select(mask16 m, u8v yes, u8v no) { return vbslq_u8(as_u8(m), yes, no); }

// With eight bits for a lane, in the low 64-bit lane of a vector: nothing has to move to the
// general registers and back. The last lane of the chain has seven bits, so that the carry out of
// it is bit 63 of the sum.
using chain_state = uint64x2_t;
inline chain_state chain_begin(bool s) { return vdupq_n_u64(!s); }
inline mask16 chain_before(mask16 a, mask16 b, chain_state &carry) {
    const auto bits = [](mask16 m) {
        const uint8x8_t n = vmovn_u16(m);
        return vreinterpretq_u64_u8(vcombine_u8(n, n));
    };
    const uint64x2_t odd = vdupq_n_u64(0xFF00FF00FF00FF00);
    const uint64x2_t last = vdupq_n_u64(0x8000000000000000);
    const uint64x2_t x = vbicq_u64(veorq_u64(bits(a), odd), last);
    const uint64x2_t y = vbicq_u64(veorq_u64(bits(b), odd), last);
    const uint64x2_t sum = vaddq_u64(vaddq_u64(x, y), carry);
    carry = vshrq_n_u64(sum, 63);
    // Bit 0 of each byte xor (lane is even), to all bits of the lane.
    const uint8x8_t carries = vget_low_u8(vreinterpretq_u8_u64(veorq_u64(sum, veorq_u64(x, y))));
    const uint8x8_t s =
        vtst_u8(veor_u8(carries, vreinterpret_u8_u16(vdup_n_u16(0x00FF))), vdup_n_u8(1));
    return vreinterpretq_u16_s16(vmovl_s8(vreinterpret_s8_u8(s)));
}

inline u16v even(u8v v) { return vandq_u16(as_u16(v), vdupq_n_u16(255)); }
inline u16v odd(u8v v) { return vshrq_n_u16(as_u16(v), 8); }
inline u8v join(u16v even, u16v odd) { return as_u8(vsliq_n_u16(even, odd, 8)); }

inline u16v dot_pairs(u8v samples, u8v weights) {
    const u16v low = vmull_u8(vget_low_u8(samples), vget_low_u8(weights));
#ifdef __aarch64__
    return vpaddq_u16(low, vmull_high_u8(samples, weights));
#else
    const u16v high = vmull_u8(vget_high_u8(samples), vget_high_u8(weights));
    return vcombine_u16(vpadd_u16(vget_low_u16(low), vget_high_u16(low)),
                        vpadd_u16(vget_low_u16(high), vget_high_u16(high)));
#endif
}

template <int B>
inline u16v sum_pairs(u16v low, u16v high) {
    static_assert(limits::pair_factor<B>);
    const uint16x8x2_t v = vuzpq_u16(low, high);
    return vaddq_u16(v.val[0], vshlq_n_u16(v.val[1], __builtin_ctz(B)));
}

// Byte pairs lie apart in 64-bit registers, as loads of structures leave them and as products of
// bytes want them: such a product is one instruction of one cycle where that of 16-bit lanes often
// takes two, and no byte has to be widened before.
struct pairs_v {
    uint8x8_t even, odd;
};
using pair_bytes = uint8x8_t;
inline pairs_v load_pairs(const uint8_t *p) {
    const uint8x8x2_t v = vld2_u8(p);
    return {v.val[0], v.val[1]};
}
inline pairs_v load_pairs(const uint8_t *p, const uint8_t *q) { return {vld1_u8(p), vld1_u8(q)}; }
inline pairs_v load_pair_halves(const uint8_t *p, const uint8_t *q) {
    const uint8x8x2_t v = vuzp_u8(vld1_u8(p), vld1_u8(q));
    return {v.val[0], v.val[1]};
}
inline pairs_v load_pairs_twice(const uint8_t *p, const uint8_t *q) {
    uint32_t a, b;
    memcpy(&a, p, sizeof a);
    memcpy(&b, q, sizeof b);
    return {vreinterpret_u8_u32(vdup_n_u32(a)), vreinterpret_u8_u32(vdup_n_u32(b))};
}
inline pairs_v load_block_halves(const uint8_t *p) {
#ifdef __aarch64__
    return load_pairs(p, p + 8);
#else
    const u8v v = load(p);
    return {vget_low_u8(v), vget_high_u8(v)};
#endif
}
inline pairs_v pair_evens(pairs_v u, pairs_v v) { return {u.even, v.even}; }
inline pairs_v pair_odds(pairs_v u, pairs_v v) { return {u.odd, v.odd}; }
inline pair_bytes even(pairs_v v) { return v.even; }
inline pair_bytes odd(pairs_v v) { return v.odd; }
inline pair_bytes set_pair_bytes(int k) { return vdup_n_u8(static_cast<uint8_t>(k)); }
inline u16v mul(pair_bytes a, pair_bytes b) { return vmull_u8(a, b); }
inline u16v mul_add(u16v sum, pair_bytes a, pair_bytes b) { return vmlal_u8(sum, a, b); }
// floor(k v / 2) = (k >> 1) v + (k & 1) (v >> 1)
struct half_factor {
    uint8x8_t half, odd;
};
inline half_factor set_half_factor(int k) {
    return {vdup_n_u8(static_cast<uint8_t>(k >> 1)), vdup_n_u8(k & 1)};
}
inline u16v half_product(pair_bytes v, half_factor k) {
    return vmlal_u8(vmull_u8(v, k.half), vshr_n_u8(v, 1), k.odd);
}

template <int K>
inline u16v add_product(u16v sum, uint8x8_t x) {
    if constexpr (K > 0) return vmlal_u8(sum, x, vdup_n_u8(K));
    if constexpr (K < 0) return vmlsl_u8(sum, x, vdup_n_u8(-K));
    return sum;
}
// The offsets of 128 go into the constant, and the products are accumulated on it.
template <int A, int B, int C>
inline s16v pair_dot(pairs_v v) {
    static_assert(limits::centred_pair<A, B>);
    const u16v c = vdupq_n_u16(static_cast<uint16_t>(C - 128 * (A + B)));
    return as_s16(add_product<B>(add_product<A>(c, v.even), v.odd));
}
template <int K, int C>
inline s16v half_product(uint8x8_t v) {
    static_assert(limits::half_factor<K>);
    const u16v sum = add_product<K / 2>(vdupq_n_u16(static_cast<uint16_t>(C)), v);
    return as_s16(K & 1 ? vaddw_u8(sum, vshr_n_u8(v, 1)) : sum);
}
template <int K, int C>
inline s16v half_product_high(pairs_v v) {
    return half_product<K, C>(v.odd);
}
template <int K, int C>
inline s16v half_product_low(pairs_v v) {
    return half_product<K, C>(v.even);
}
inline s16v minus_128_shl8(uint8x8_t v) {
    return as_s16(veorq_u16(vshll_n_u8(v, 8), vdupq_n_u16(0x8000)));
}
inline s16v low_minus_128_shl8(pairs_v v) { return minus_128_shl8(v.even); }
inline s16v high_minus_128_shl8(pairs_v v) { return minus_128_shl8(v.odd); }

template <int N>
inline u8v narrow_join(s16v even, s16v odd) {
    static_assert(limits::narrowing_shift<N>);
    // Shifted left, 0 ... 65535, with the result in the high byte.
    return as_u8(vsriq_n_u16(vqshluq_n_s16(odd, 8 - N), vqshluq_n_s16(even, 8 - N), 8));
}

inline u16v widen_low(u8v v) { return vmovl_u8(vget_low_u8(v)); }
inline u16v widen_high(u8v v) { return vmovl_u8(vget_high_u8(v)); }
inline u8v narrow(s16v low, s16v high) { return vcombine_u8(vqmovun_s16(low), vqmovun_s16(high)); }
template <int N>
inline u8v narrow_shr(u16v low, u16v high) {
    static_assert(limits::narrowing_shift<N>);
    return vcombine_u8(vqshrn_n_u16(low, N), vqshrn_n_u16(high, N));
}
template <int N>
inline u8v narrow_sar(s16v low, s16v high) {
    static_assert(limits::narrowing_shift<N>);
    return vcombine_u8(vqshrun_n_s16(low, N), vqshrun_n_s16(high, N));
}

inline u8v mean_of_pairs(u8v a0, u8v b0, u8v a1, u8v b1) {
    return vcombine_u8(vrshrn_n_u16(vpadalq_u8(vpaddlq_u8(a0), b0), 2),
                       vrshrn_n_u16(vpadalq_u8(vpaddlq_u8(a1), b1), 2));
}

// 32-bit ARM interleaves whole vectors with one instruction; of a pair zip_low and zip_high of the
// same vectors the compiler makes one.
#ifdef __aarch64__
#define SIMD_ZIP(low_or_high, lane, a, b) vzip##low_or_high##q_##lane(a, b)
#else
#define SIMD_ZIP(low_or_high, lane, a, b) vzipq_##lane(a, b).val[low_or_high - 1]
#endif
template <int N>
inline u8v zip_low(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return SIMD_ZIP(1, u8, a, b);
    if constexpr (N == 2) return as_u8(SIMD_ZIP(1, u16, as_u16(a), as_u16(b)));
    if constexpr (N == 4)
        return vreinterpretq_u8_u32(
            SIMD_ZIP(1, u32, vreinterpretq_u32_u8(a), vreinterpretq_u32_u8(b)));
    if constexpr (N == 8) return vcombine_u8(vget_low_u8(a), vget_low_u8(b));
}
template <int N>
inline u8v zip_high(u8v a, u8v b) {
    static_assert(limits::granule<N>);
    if constexpr (N == 1) return SIMD_ZIP(2, u8, a, b);
    if constexpr (N == 2) return as_u8(SIMD_ZIP(2, u16, as_u16(a), as_u16(b)));
    if constexpr (N == 4)
        return vreinterpretq_u8_u32(
            SIMD_ZIP(2, u32, vreinterpretq_u32_u8(a), vreinterpretq_u32_u8(b)));
    if constexpr (N == 8) return vcombine_u8(vget_high_u8(a), vget_high_u8(b));
}
#undef SIMD_ZIP
inline u8v blend_u32(u8v a, u8v b) {
    return vbslq_u8(vreinterpretq_u8_u64(vdupq_n_u64(0xFFFFFFFF)), a, b);
}
inline u8v shuffle(u8v v, u8v index) {
#ifdef __aarch64__
    return vqtbl1q_u8(v, index);
#else
    const uint8x8x2_t table = {{vget_low_u8(v), vget_high_u8(v)}};
    return vcombine_u8(vtbl2_u8(table, vget_low_u8(index)), vtbl2_u8(table, vget_high_u8(index)));
#endif
}
inline u8v pick(u8v v, u8v index) { return shuffle(v, index); }
inline u8v pick_or_zero(u8v v, u8v index) { return shuffle(v, index); }
// Each half reversed, and the halves exchanged. On 32-bit ARM a half can be reversed into the other's place,
// but GCC would move it there.
inline u8v reverse_u8(u8v v) {
#if defined __aarch64__ || !defined __clang__
    const u8v halves = vrev64q_u8(v);
    return vextq_u8(halves, halves, 8);
#else
    return vcombine_u8(vrev64_u8(vget_high_u8(v)), vrev64_u8(vget_low_u8(v)));
#endif
}
inline u8v reverse_u16(u8v v) {
    const u8v halves = as_u8(vrev64q_u16(as_u16(v)));
    return vextq_u8(halves, halves, 8);
}

inline u16v pack565(s16v hi, s16v mid, s16v lo) {
    const u16v upper = vsriq_n_u16(vqshluq_n_s16(hi, 1), vqshluq_n_s16(mid, 1), 5);
    return vsriq_n_u16(upper, vqshluq_n_s16(lo, 1), 11);
}

// With one block, all orders of pixels are the same.
inline u8v natural_to_by8(u8v v) { return v; }
inline u8v natural_to_by4(u8v v) { return v; }
inline u8v by8_to_natural(u8v v) { return v; }
inline pairs_v natural_to_by8(pairs_v v) { return v; }
inline pairs_v natural_to_by4(pairs_v v) { return v; }

struct pair_u8 {
    u8v even, odd;
};
inline pair_u8 load_split(const uint8_t *p) {
    const uint8x16x2_t v = vld2q_u8(p);
    return {v.val[0], v.val[1]};
}
// All bits, or none.
using split_moves = u8v;
inline split_moves set_split_moves(bool exchange) { return set_u8(exchange ? 255 : 0); }
inline pair_u8 load_split(const uint8_t *p, split_moves exchange) {
    const pair_u8 v = load_split(p);
    return {vbslq_u8(exchange, v.odd, v.even), vbslq_u8(exchange, v.even, v.odd)};
}
// A loop for each order.
template <bool Exchange>
struct known_split_moves {};
template <class F>
[[gnu::always_inline]] inline void with_split_moves(bool exchange, F f) {
    if (exchange)
        f(known_split_moves<true>{});
    else
        f(known_split_moves<false>{});
}
template <bool Exchange>
inline pair_u8 load_split(const uint8_t *p, known_split_moves<Exchange>) {
    const pair_u8 v = load_split(p);
    return Exchange ? pair_u8{v.odd, v.even} : v;
}
inline pairs_v exchange_pairs(pairs_v v, split_moves exchange) {
    const uint8x8_t m = vget_low_u8(exchange);
    return {vbsl_u8(m, v.odd, v.even), vbsl_u8(m, v.even, v.odd)};
}
inline void store_split(uint8_t *p, uint8_t *q, u8v v) {
    vst1_u8(p, vmovn_u16(as_u16(v)));
    vst1_u8(q, vshrn_n_u16(as_u16(v), 8));
}
inline pair_u8 load_split_natural(const uint8_t *p) { return load_split(p); }
inline pair_u8 load_split_by4(const uint8_t *p) { return load_split(p); }
// GCC keeps structures in memory that are copied as parts of others: hence one register at a time.
struct luma_chroma {
    pairs_v y, pairs;
};
inline luma_chroma load_groups(const uint8_t *p) {
    const uint8x8x4_t v = vld4_u8(p);
    return {{v.val[0], v.val[2]}, {v.val[1], v.val[3]}};
}
inline luma_chroma load_groups_natural(const uint8_t *p) { return load_groups(p); }
inline luma_chroma load_groups_by4(const uint8_t *p) { return load_groups(p); }
inline luma_chroma exchanged(const luma_chroma &v) {
    return {{v.pairs.even, v.pairs.odd}, {v.y.even, v.y.odd}};
}

inline u16v sums_of_four(u8v a, u8v b) { return vpadalq_u8(vpaddlq_u8(a), b); }
inline u8v load_block_means(const uint8_t *a, const uint8_t *b) {
    return vcombine_u8(vrshrn_n_u16(sums_of_four(load(a), load(b)), 2),
                       vrshrn_n_u16(sums_of_four(load(a + bytes), load(b + bytes)), 2));
}

// Some compilers have macros for stores of several vectors, which take no braces: hence the names.
inline void store_zip8(uint8_t *p, u8v even, u8v odd) {
    const uint8x16x2_t v = {{even, odd}};
    vst2q_u8(p, v);
}
#ifdef __aarch64__
using joined_groups = pair_u8;
template <bool LumaFirst>
inline joined_groups gather_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v) {
    const u8v luma = load(y), chroma = load_zip(u, v);
    return LumaFirst ? joined_groups{luma, chroma} : joined_groups{chroma, luma};
}
inline void store_groups(uint8_t *p, const joined_groups &g) { store_zip8(p, g.even, g.odd); }
#else
using joined_groups = uint8x8x4_t;
template <bool LumaFirst>
inline joined_groups gather_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v) {
    const uint8x8x2_t luma = vld2_u8(y);
    const uint8x8_t first = vld1_u8(u), second = vld1_u8(v);
    if constexpr (LumaFirst) return {{luma.val[0], first, luma.val[1], second}};
    return {{first, luma.val[0], second, luma.val[1]}};
}
inline void store_groups(uint8_t *p, const joined_groups &g) { vst4_u8(p, g); }
#endif
inline void store_zip16(uint8_t *p, uint8_t *q, u16v even, u16v odd) {
    const uint16x8x2_t zip = vzipq_u16(even, odd);
    vst1q_u8(p, as_u8(zip.val[0]));
    vst1q_u8(q, as_u8(zip.val[1]));
}
inline void store_zip16(uint8_t *p, u16v even, u16v odd) { store_zip16(p, p + bytes, even, odd); }
inline void store_zip3(uint8_t *p, u8v a, u8v b, u8v c) {
    const uint8x16x3_t v = {{a, b, c}};
    vst3q_u8(p, v);
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, s16v a_even, s16v a_odd, s16v b_even, s16v b_odd,
                              s16v c_even, s16v c_odd, bool exchange = false) {
    const u8v a = narrow_join<A>(a_even, a_odd), c = narrow_join<C>(c_even, c_odd);
    store_zip3(p, exchange ? c : a, narrow_join<B>(b_even, b_odd), exchange ? a : c);
}
inline void store_zip4(uint8_t *p, u8v a, u8v b, u8v c, u8v d) {
    const uint8x16x4_t v = {{a, b, c, d}};
    vst4q_u8(p, v);
}
template <int A, int B, int C>
inline void store_narrow_zip3(uint8_t *p, uint8_t *q, s16v a_even, s16v a_odd, s16v b_even,
                              s16v b_odd, s16v c_even, s16v c_odd, bool exchange = false) {
    const u8v a = narrow_join<A>(a_even, a_odd), b = narrow_join<B>(b_even, b_odd),
              c = narrow_join<C>(c_even, c_odd), first = exchange ? c : a, last = exchange ? a : c;
    const uint8x8x3_t low = {{vget_low_u8(first), vget_low_u8(b), vget_low_u8(last)}};
    const uint8x8x3_t high = {{vget_high_u8(first), vget_high_u8(b), vget_high_u8(last)}};
    vst3_u8(p, low);
    vst3_u8(q, high);
}
inline void store_zip4(uint8_t *p, uint8_t *q, u8v a, u8v b, u8v c, u8v d) {
    const uint8x8x4_t low = {{vget_low_u8(a), vget_low_u8(b), vget_low_u8(c), vget_low_u8(d)}};
    const uint8x8x4_t high = {{vget_high_u8(a), vget_high_u8(b), vget_high_u8(c), vget_high_u8(d)}};
    vst4_u8(p, low);
    vst4_u8(q, high);
}

inline u8v join_high(u16v a, u16v b) { return as_u8(vsriq_n_u16(b, a, 8)); }
inline void store_high(uint8_t *p, u16v a) { vst1_u8(p, vshrn_n_u16(a, 8)); }

// A vector for each channel.
using rgb_v = uint8x16x3_t;
inline rgb_v load_565(const uint8_t *p) {
    const uint8x16x2_t v = vld2q_u8(p);
    const u8v low = v.val[0], high = v.val[1];
    const u8v mid = vsriq_n_u8(vshlq_n_u8(high, 5), low, 3);
    return {
        {vandq_u8(high, vdupq_n_u8(0xF8)), vandq_u8(mid, vdupq_n_u8(0xFC)), vshlq_n_u8(low, 3)}};
}
inline rgb_v load_888(const uint8_t *p) { return vld3q_u8(p); }
template <int First>
inline rgb_v load_8888(const uint8_t *p) {
    const uint8x16x4_t v = vld4q_u8(p);
    return {{v.val[First], v.val[First + 1], v.val[First + 2]}};
}

// Dot products of the low and of the high half, by factors that are the same in all lanes. 64-bit
// ARM multiplies high halves where they lie.
inline u16v dot_low(rgb_v v, u8v a, u8v b, u8v c) {
    const u16v sum = vmull_u8(vget_low_u8(v.val[0]), vget_low_u8(a));
    return vmlal_u8(vmlal_u8(sum, vget_low_u8(v.val[1]), vget_low_u8(b)), vget_low_u8(v.val[2]),
                    vget_low_u8(c));
}
inline u16v dot_upper(rgb_v v, u8v a, u8v b, u8v c) {
#ifdef __aarch64__
    return vmlal_high_u8(vmlal_high_u8(vmull_high_u8(v.val[0], a), v.val[1], b), v.val[2], c);
#else
    const u16v sum = vmull_u8(vget_high_u8(v.val[0]), vget_low_u8(a));
    return vmlal_u8(vmlal_u8(sum, vget_high_u8(v.val[1]), vget_low_u8(b)), vget_high_u8(v.val[2]),
                    vget_low_u8(c));
#endif
}
template <int A, int B, int C, int D>
inline u8v dot_high(rgb_v v) {
    static_assert(limits::channel_weights<A, B, C>);
    const u8v a = vdupq_n_u8(A), b = vdupq_n_u8(B), c = vdupq_n_u8(C);
    const u16v d = vdupq_n_u16(D << 8);
    return vcombine_u8(vaddhn_u16(dot_low(v, a, b, c), d), vaddhn_u16(dot_upper(v, a, b, c), d));
}
template <int A, int B, int C, int D>
inline u16v even_dot(rgb_v v) {
    static_assert(limits::channel_factors<A, B, C>);
    const auto evens = [](u8v c) { return vmovn_u16(as_u16(c)); };
    u16v sum = vdupq_n_u16(static_cast<uint16_t>(D));
    sum = add_product<A>(sum, evens(v.val[0]));
    sum = add_product<B>(sum, evens(v.val[1]));
    return add_product<C>(sum, evens(v.val[2]));
}
// The same with factors that are known at run time, each in all bytes, and an offset of high bytes.
struct channel_weights {
    u8v a, b, c;
    u16v d;
};
inline u8v set_factor(int k) { return vdupq_n_u8(static_cast<uint8_t>(k)); }
inline channel_weights set_channel_weights(int a, int b, int c, int d) {
    return {set_factor(a), set_factor(b), set_factor(c),
            vdupq_n_u16(static_cast<uint16_t>(d << 8))};
}
inline u8v dot_high(rgb_v v, const channel_weights &w) {
    return vcombine_u8(vaddhn_u16(dot_low(v, w.a, w.b, w.c), w.d),
                       vaddhn_u16(dot_upper(v, w.a, w.b, w.c), w.d));
}

// Half as many pixels. Factors of their sum are signed; of samples less 128 the products are signed as
// well, and the offset makes up for these.
struct half_rgb_v {
    uint8x8_t c[3];
};
inline half_rgb_v even_pixels(const rgb_v &v) {
    const auto evens = [](u8v c) { return vmovn_u16(as_u16(c)); };
    return {{evens(v.val[0]), evens(v.val[1]), evens(v.val[2])}};
}
inline half_rgb_v block_means(const rgb_v &a, const rgb_v &b) {
    const auto means = [&](int k) { return vrshrn_n_u16(sums_of_four(a.val[k], b.val[k]), 2); };
    return {{means(0), means(1), means(2)}};
}
struct channel_factors {
    int8x8_t a, b, c;
    s16v offset;
};
inline channel_factors set_channel_factors(int a, int b, int c) {
    const auto all = [](int k) { return vdup_n_s8(static_cast<int8_t>(k)); };
    return {all(a), all(b), all(c), vdupq_n_s16(static_cast<int16_t>(128 * (a + b + c)))};
}
// The sum without the offset: at most 32640 in size, as that of bytes is that fits 16 bits.
inline s16v centred_dot(const half_rgb_v &v, const channel_factors &f) {
    const auto centred = [](uint8x8_t c) { return vreinterpret_s8_u8(veor_u8(c, vdup_n_u8(128))); };
    const s16v first = vmull_s8(centred(v.c[0]), f.a);
    return vmlal_s8(vmlal_s8(first, centred(v.c[1]), f.b), centred(v.c[2]), f.c);
}
inline s16v even_dot(const half_rgb_v &v, const channel_factors &f) {
    return vaddq_s16(centred_dot(v, f), f.offset);
}
inline u8v dots_high(const half_rgb_v &v, const channel_factors &f, const channel_factors &g,
                     s16v c) {
    const auto rest = [&](const channel_factors &k) {
        return as_u16(sub_sat(vsubq_s16(c, k.offset), centred_dot(v, k)));
    };
    return join_high(rest(f), rest(g));
}

struct channels_v {
    u8v c[3];
};
inline channels_v channels_of(rgb_v v) { return {{v.val[0], v.val[1], v.val[2]}}; }

inline void store_565(uint8_t *p, u8v a, u8v b, u8v c) {
    const u8v low = vsriq_n_u8(vshlq_n_u8(b, 3), c, 3);
    const uint8x16x2_t v = {{low, vsriq_n_u8(a, b, 5)}};
    vst2q_u8(p, v);
}
inline void repack_888_to_565(uint8_t *p, const uint8_t *q) {
    const uint8x16x3_t v = vld3q_u8(q);
    store_565(p, v.val[0], v.val[1], v.val[2]);
}
inline void repack_8888_to_565(uint8_t *p, const uint8_t *q) {
    const uint8x16x4_t v = vld4q_u8(q);
    store_565(p, v.val[0], v.val[1], v.val[2]);
}

// Loads and stores of structures have the order in their registers: a loop for each.
template <bool Exchange, bool AlphaFirst>
struct channel_moves {};
template <class F>
[[gnu::always_inline]] inline void with_moves(bool exchange, bool alpha_first, F f) {
    if (exchange && alpha_first) return f(channel_moves<true, true>{});
    if (exchange) return f(channel_moves<true, false>{});
    if (alpha_first) return f(channel_moves<false, true>{});
    f(channel_moves<false, false>{});
}
template <class F>
[[gnu::always_inline]] inline void with_widen_moves(bool exchange, bool to_alpha_first, F f) {
    with_moves(exchange, to_alpha_first, f);
}
template <bool Exchange, bool AlphaFirst>
inline void repack_888_to_8888(uint8_t *p, const uint8_t *q, channel_moves<Exchange, AlphaFirst>) {
    const uint8x16x3_t v = vld3q_u8(q);
    const u8v first = v.val[Exchange ? 2 : 0], last = v.val[Exchange ? 0 : 2], a = set_u8(255);
    if constexpr (AlphaFirst)
        store_zip4(p, a, first, v.val[1], last);
    else
        store_zip4(p, first, v.val[1], last, a);
}
template <class F>
[[gnu::always_inline]] inline void with_narrow_moves(bool exchange, bool from_alpha_first, F f) {
    with_moves(exchange, from_alpha_first, f);
}
template <bool Exchange, bool AlphaFirst>
inline void repack_8888_to_888(uint8_t *p, const uint8_t *q, channel_moves<Exchange, AlphaFirst>) {
    constexpr int first = AlphaFirst + (Exchange ? 2 : 0), last = AlphaFirst + (Exchange ? 0 : 2);
#if defined __aarch64__ || defined __clang__
    const uint8x16x4_t v = vld4q_u8(q);
    store_zip3(p, v.val[first], v.val[AlphaFirst + 1], v.val[last]);
#else
    // GCC moves parts of four vectors through the stack.
    for (int k = 0; k < 2; k++) {
        const uint8x8x4_t v = vld4_u8(q + 32 * k);
        const uint8x8x3_t to = {{v.val[first], v.val[AlphaFirst + 1], v.val[last]}};
        vst3_u8(p + 24 * k, to);
    }
#endif
}

inline void exchange_888(uint8_t *p, const uint8_t *q) {
    const uint8x16x3_t v = vld3q_u8(q);
    const uint8x16x3_t exchanged = {{v.val[2], v.val[1], v.val[0]}};
    vst3q_u8(p, exchanged);
}

// A loop for each of the two kinds: the byte without a weight is left where it is.
using quads_v = rgb_v;
template <class F>
[[gnu::always_inline]] inline void with_load_quads(bool skips_first, F f) {
    if (skips_first)
        f([](const uint8_t *p) { return load_8888<1>(p); });
    else
        f([](const uint8_t *p) { return load_8888<0>(p); });
}
using quad_weights = channel_weights;
inline quad_weights set_quad_weights(bool, int a, int b, int c, int d) {
    return set_channel_weights(a, b, c, d);
}
using quad_factors = channel_factors;
inline quad_factors set_quad_factors(bool, int a, int b, int c) {
    return set_channel_factors(a, b, c);
}
using half_quads_v = half_rgb_v;
inline half_quads_v even_quads(const quads_v &v) { return even_pixels(v); }

}  // namespace simgp::neon

#endif
