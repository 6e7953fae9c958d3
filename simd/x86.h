// What the x86 layers have in common: sums of products, said in their own vocabulary. Included at the end
// of each.
//
// Besides the vocabulary, a layer gives
//   load_halves(p, q)    bytes / 2 bytes at p, then as many at q
//   add_pairs(a, b)      16-bit lanes: the sums of two neighbours each, of a and of b, block by block
//   pack_bytes(a, b)     signed 16-bit lanes to bytes, block by block
//   even_dwords(a, b)    dwords 0 and 2 of each block of a, then of b; odd_dwords 1 and 3
//   unpack_order(v)      what two steps of packing leave, put in order: granule k of block j belongs to
//                        vector k
#ifndef SIMD_X86_H
#define SIMD_X86_H

namespace simgp::SIMD_TARGET {

template <class T>
inline void step_pointer(T *&) {}
inline void keep_behind(ptrdiff_t &) {}

// Byte pairs are best left in vectors.
inline pairs_v load_pairs(const uint8_t *p) { return load(p); }
inline pairs_v load_pairs(const uint8_t *p, const uint8_t *q) { return load_zip(p, q); }
inline pairs_v load_pair_halves(const uint8_t *p, const uint8_t *q) { return load_halves(p, q); }
inline u8v zip_halves(u8v v) { return zip_low<1>(v, zip_high<8>(v, v)); }
inline pairs_v load_block_halves(const uint8_t *p) { return zip_halves(load(p)); }
// What takes pairs apart has the even bytes' places first.
inline pairs_v exchange_pairs(pairs_v v, split_moves moves) {
    return shuffle(v, zip_halves(moves));
}
inline pairs_v pair_evens(pairs_v u, pairs_v v) { return join(even(u), even(v)); }
inline pairs_v pair_odds(pairs_v u, pairs_v v) { return join(odd(u), odd(v)); }
inline pair_bytes set_pair_bytes(int k) { return set_u16(static_cast<uint16_t>(k)); }
inline u16v mul_add(u16v sum, pair_bytes a, pair_bytes b) { return add(sum, mul(a, b)); }

// The mean that is rounded up, less one where the sum is odd; and (a - b + 2^16) / 2.
inline u16v mean_down_u16(u16v a, u16v b) {
    return sub(avg_u16(a, b), bit_and(bit_xor(a, b), set_u16(1)));
}
inline s16v half_difference(u16v a, u16v b) {
    return bit_xor(avg_u16(a, bit_not(b)), set_u16(0x8000));
}

template <int N>
inline u8v narrow_shr(u16v low, u16v high) {
    static_assert(limits::narrowing_shift<N>);
    return narrow(shr<N>(low), shr<N>(high));
}
template <int N>
inline u8v narrow_sar(s16v low, s16v high) {
    static_assert(limits::narrowing_shift<N>);
    return narrow(sar<N>(low), sar<N>(high));
}
struct luma_chroma {
    pairs_v y, pairs;
};
inline luma_chroma groups_of(const pair_u8 &v) { return {v.even, v.odd}; }
inline luma_chroma load_groups(const uint8_t *p) { return groups_of(load_split(p)); }
inline luma_chroma load_groups_natural(const uint8_t *p) {
    return groups_of(load_split_natural(p));
}
inline luma_chroma load_groups_by4(const uint8_t *p) { return groups_of(load_split_by4(p)); }
inline luma_chroma exchanged(const luma_chroma &v) { return {v.pairs, v.y}; }

using joined_groups = pair_u8;
template <bool LumaFirst>
inline joined_groups gather_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v) {
    const u8v luma = natural_to_by8(load(y)), chroma = natural_to_by8(load_zip(u, v));
    return LumaFirst ? joined_groups{luma, chroma} : joined_groups{chroma, luma};
}
inline void store_groups(uint8_t *p, const joined_groups &g) { store_zip8(p, g.even, g.odd); }

// The pair of products fits 16 bits; the sum with the third wraps.
template <int A, int B, int C>
inline u16v dot(u8v ac, u16v b) {
    return add(dot_pairs(ac, set_pair(static_cast<uint8_t>(A), static_cast<uint8_t>(C))),
               mul(b, set_u16(static_cast<uint16_t>(B))));
}
template <int A, int B, int C, int D>
inline u8v dot_high(rgb_v v) {
    static_assert(limits::channel_weights<A, B, C>);
    return add_u8(join_high(dot<A, B, C>(v.ac_even, v.b_even), dot<A, B, C>(v.ac_odd, v.b_odd)),
                  set_u8(D));
}
template <int A, int B, int C, int D>
inline u16v even_dot(rgb_v v) {
    static_assert(limits::channel_factors<A, B, C>);
    return add(dot<A, B, C>(v.ac_even, v.b_even), set_u16(static_cast<uint16_t>(D)));
}

inline u8v mean_of_pairs(u8v a0, u8v b0, u8v a1, u8v b1) {
    const u8v one = set_u8(1);
    const auto sums = [&](u8v a, u8v b) {
        return sar<2>(add(add(dot_pairs(a, one), dot_pairs(b, one)), set_u16(2)));
    };
    return narrow(sums(a0, b0), sums(a1, b1));
}

// The same with factors that are known at run time.
struct channel_factors {
    u8v ac;
    u16v b;
};
inline channel_factors set_channel_factors(int a, int b, int c) {
    return {set_pair(static_cast<uint8_t>(a), static_cast<uint8_t>(c)),
            set_u16(static_cast<uint16_t>(b))};
}
inline u16v dot(u8v ac, u16v b, const channel_factors &f) {
    return add(dot_pairs(ac, f.ac), mul(b, f.b));
}
struct channel_weights {
    channel_factors factors;
    u8v d;
};
inline channel_weights set_channel_weights(int a, int b, int c, int d) {
    return {set_channel_factors(a, b, c), set_u8(static_cast<uint8_t>(d))};
}
inline u8v dot_high(rgb_v v, const channel_weights &w) {
    const auto high = [&](u8v ac, u16v b) { return dot(ac, b, w.factors); };
    return add_u8(join_high(high(v.ac_even, v.b_even), high(v.ac_odd, v.b_odd)), w.d);
}
using half_rgb_v = rgb_v;
inline half_rgb_v even_pixels(const rgb_v &v) { return v; }
inline s16v even_dot(rgb_v v, const channel_factors &f) { return dot(v.ac_even, v.b_even, f); }

// Sums of neighbours, and the rounded quarters of what is at most 32767, (v + 2) >> 2.
inline u16v sums_of_pairs(u8v v) { return dot_pairs(v, set_u8(1)); }
inline u16v quarter(u16v v) { return mul_round(v, set_u16(8192)); }

inline u8v load_block_means(const uint8_t *a, const uint8_t *b) {
    const auto means = [&](int at) {
        return quarter(add(sums_of_pairs(load(a + at)), sums_of_pairs(load(b + at))));
    };
    return by8_to_natural(narrow(means(0), means(bytes)));
}

// The mean of means is one too high where both it and one of the others were rounded up.
inline u8v mean_of_four(u8v a, u8v b, u8v c, u8v d) {
    const u8v p = avg_u8(a, b), q = avg_u8(c, d);
    const u8v excess = bit_and(bit_or(bit_xor(a, b), bit_xor(c, d)), bit_xor(p, q));
    return sub_u8(avg_u8(p, q), bit_and(excess, set_u8(1)));
}
inline rgb_v block_means(const rgb_v &p, const rgb_v &q) {
    const u8v ac = mean_of_four(p.ac_even, p.ac_odd, q.ac_even, q.ac_odd);
    const u16v b = quarter(add(add(p.b_even, p.b_odd), add(q.b_even, q.b_odd)));
    return {ac, b, ac, b};
}
inline u8v dots_high(const half_rgb_v &v, const channel_factors &f, const channel_factors &g,
                     s16v c) {
    return join_high(sub_sat(c, even_dot(v, f)), sub_sat(c, even_dot(v, g)));
}

struct channels_v {
    u8v c[3];
};
inline channels_v channels_of(rgb_v v) {
    return {join(even(v.ac_even), v.ac_odd), join(v.b_even, v.b_odd),
            join_high(v.ac_even, v.ac_odd)};
}

// Bits of bytes, by shifts of words: those that come from the neighbour are dropped.
inline void store_565(uint8_t *p, u8v a, u8v b, u8v c) {
    const auto bits = [](u16v v, uint8_t mask) { return bit_and(as_u8(v), set_u8(mask)); };
    const u8v high = bit_or(bit_and(a, set_u8(0xF8)), bits(shr<5>(as_u16(b)), 0x07));
    const u8v low = bit_or(bits(shl<3>(as_u16(b)), 0xE0), bits(shr<3>(as_u16(c)), 0x1F));
    store_zip8(p, low, high);
}

// A shuffle is the same code for all orders.
template <class F>
[[gnu::always_inline]] inline void with_split_moves(bool swap, F f) {
    f(set_split_moves(swap));
}
template <class F>
[[gnu::always_inline]] inline void with_widen_moves(bool swap, bool to_alpha_first, F f) {
    f(set_widen_moves(swap, to_alpha_first));
}
template <class F>
[[gnu::always_inline]] inline void with_narrow_moves(bool swap, bool from_alpha_first, F f) {
    f(set_narrow_moves(swap, from_alpha_first));
}

// Pixels of four bytes, a vector's worth of each quarter of what is read.
struct quads_v {
    u8v v[4];
};
inline quads_v load_quads(const uint8_t *p) {
    return {{load(p), load(p + bytes), load(p + 2 * bytes), load(p + 3 * bytes)}};
}
template <class F>
[[gnu::always_inline]] inline void with_load_quads(bool, F f) {
    f([](const uint8_t *p) { return load_quads(p); });
}
inline u8v set_quad(bool skips_first, int a, int b, int c) {
    const auto byte = [](int k) { return uint32_t(static_cast<uint8_t>(k)); };
    const uint32_t all = byte(a) | byte(b) << 8 | byte(c) << 16;
    return set_u32(skips_first ? all << 8 : all);
}
// The multiply-add takes weights of bytes and samples less 128; `offset` makes up for these, after
// the shift, as the weights' sum is even.
struct quad_weights {
    u8v weights, offset;
};
inline quad_weights set_quad_weights(bool skips_first, int a, int b, int c, int d) {
    return {set_quad(skips_first, a, b, c), set_u8(static_cast<uint8_t>((a + b + c) / 2 + d))};
}
inline u8v dot_high(const quads_v &v, const quad_weights &w) {
    const auto products = [&](u8v x) { return dot_pairs(w.weights, bit_xor(x, set_u8(128))); };
    const auto half = [&](u8v x, u8v y) { return sar<8>(add_pairs(products(x), products(y))); };
    return add_u8(unpack_order(pack_bytes(half(v.v[0], v.v[1]), half(v.v[2], v.v[3]))), w.offset);
}
using quad_factors = u8v;
inline quad_factors set_quad_factors(bool skips_first, int a, int b, int c) {
    return set_quad(skips_first, a, b, c);
}
// Pixels of each block of two vectors: 0 and 2 of a block of the first, then of the second.
struct half_quads_v {
    u8v low, high;
};
inline half_quads_v even_quads(const quads_v &v) {
    return {even_dwords(v.v[0], v.v[1]), even_dwords(v.v[2], v.v[3])};
}
inline half_quads_v block_means(const quads_v &a, const quads_v &b) {
    const auto means = [&](int k) {
        return mean_of_four(even_dwords(a.v[k], a.v[k + 1]), odd_dwords(a.v[k], a.v[k + 1]),
                            even_dwords(b.v[k], b.v[k + 1]), odd_dwords(b.v[k], b.v[k + 1]));
    };
    return {means(0), means(2)};
}
inline u8v dots_high(const half_quads_v &v, const quad_factors &f, const quad_factors &g, s16v c) {
    const auto dot = [&](u8v k) {
        return sub_sat(c, add_pairs(dot_pairs(v.low, k), dot_pairs(v.high, k)));
    };
    return unpack_order(join_high(dot(f), dot(g)));
}

}  // namespace simgp::SIMD_TARGET

#endif
