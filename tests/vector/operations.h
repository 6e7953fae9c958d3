// Every operation of the vector layer on bytes in memory. Included twice for a target, in the
// namespace of its layer and in that of the same operations over plain lanes, so no include guard.

struct operation {
    const char *name;
    int out_bytes;
    // `in` points behind the last of 8 vectors of input; writes out_bytes bytes.
    void (*run)(const uint8_t *in, uint8_t *out);
};

inline u8v u8(const uint8_t *in, int k) { return load(in - (k + 1) * bytes); }
inline u16v u16(const uint8_t *in, int k) { return as_u16(u8(in, k)); }
inline s16v s16(const uint8_t *in, int k) { return as_s16(u16(in, k)); }
template <typename V>
inline void put(uint8_t *out, V v) {
    memcpy(out, &v, sizeof v);
}

// An operation whose result is a vector, of the inputs a, b, c, d.
#define VECTOR(name, type, ...)                                                            \
    {                                                                                      \
        name, bytes, [](const uint8_t *in, uint8_t *out) {                                 \
            [[maybe_unused]] const auto a = type(in, 0), b = type(in, 1), c = type(in, 2); \
            put(out, __VA_ARGS__);                                                         \
        }                                                                                  \
    }
// Any other operation.
#define MEMORY(name, out_bytes, ...)                                          \
    {                                                                         \
        name, out_bytes, [](const uint8_t *in, uint8_t *out) { __VA_ARGS__; } \
    }

// clang-format off
static const operation operations[] = {
    VECTOR("as_u8", u16, as_u8(a)),
    VECTOR("as_u16", s16, as_u16(a)),
    MEMORY("load", bytes, store(out, load(in - bytes))),
    MEMORY("load, store, anywhere", bytes + 1, { out[0] = 0; store(out + 1, load(in - bytes - 3)); }),
    MEMORY("load_zip, first", bytes, put(out, load_zip(in - bytes / 2, in - 3 * bytes))),
    MEMORY("load_zip, second", bytes, put(out, load_zip(in - 3 * bytes - 1, in - bytes / 2))),
    MEMORY("load_split", 2 * bytes, const pair_u8 v = load_split(in - 2 * bytes); put(out, v.even); put(out + bytes, v.odd)),
    MEMORY("load_split, in order", 2 * bytes, const pair_u8 v = load_split(in - 2 * bytes, set_split_moves(false)); put(out, v.even); put(out + bytes, v.odd)),
    MEMORY("load_split, exchanged", 2 * bytes, const pair_u8 v = load_split(in - 2 * bytes, set_split_moves(true)); put(out, v.even); put(out + bytes, v.odd)),
    MEMORY("with_split_moves", 2 * bytes, with_split_moves(false, [&](const auto &moves) { const pair_u8 v = load_split(in - 2 * bytes, moves); put(out, v.even); put(out + bytes, v.odd); })),
    MEMORY("with_split_moves, exchanged", 2 * bytes, with_split_moves(true, [&](const auto &moves) { const pair_u8 v = load_split(in - 2 * bytes, moves); put(out, v.even); put(out + bytes, v.odd); })),
    MEMORY("store_split", bytes, store_split(out, out + bytes / 2, u8(in, 0))),
    MEMORY("store_split, anywhere", bytes + 1, { out[bytes / 2] = 0; store_split(out + bytes / 2 + 1, out, u8(in, 0)); }),
    MEMORY("load_split_natural", 2 * bytes, const pair_u8 v = load_split_natural(in - 2 * bytes); put(out, v.even); put(out + bytes, v.odd)),
    MEMORY("load_split_by4", 2 * bytes, const pair_u8 v = load_split_by4(in - 2 * bytes); put(out, v.even); put(out + bytes, v.odd)),
    MEMORY("load_block_means", bytes, put(out, load_block_means(in - 2 * bytes, in - 5 * bytes))),
    MEMORY("load_blocks", bytes, put(out, load_blocks(in - 16 - (blocks - 1) * 23, 23))),
    MEMORY("load_blocks, upwards", bytes, put(out, load_blocks(in - 16, -bytes - 1))),
    MEMORY("gather_windows", bytes, int32_t at[windows];
           for (int j = 0; j < windows; j++) at[j] = -window_bytes - 1 - in[-j - 1] % (7 * 16);
           put(out, gather_windows(in, at))),
    MEMORY("store_blocks", 24 * blocks - 8,
           for (int i = 0; i < 24 * blocks - 8; i++) out[i] = 0;
           store_blocks(out, 24, u8(in, 0))),
    MEMORY("store_blocks, upwards", 17 * blocks - 1,
           for (int i = 0; i < 17 * blocks - 1; i++) out[i] = 0;
           store_blocks(out + 17 * (blocks - 1), -17, u8(in, 0))),
    MEMORY("set_u8", bytes, put(out, set_u8(in[-1]))),
    MEMORY("set_u16", bytes, put(out, set_u16(uint16_t(in[-1] << 8 | in[-2])))),
    MEMORY("set_pair", bytes, put(out, set_pair(in[-1], in[-2]))),
    MEMORY("set_u32", bytes, put(out, set_u32(uint32_t(in[-1]) << 24 | in[-2] << 16 | in[-3] << 8 | in[-4]))),
    MEMORY("store_stream", 2 * bytes, store_stream(out + bytes, u8(in, 0)); store_stream(out, u8(in, 1)); stream_end()),

    VECTOR("min_u8", u8, min_u8(a, b)),
    VECTOR("max_u8", u8, max_u8(a, b)),
    VECTOR("avg_u8", u8, avg_u8(a, b)),
    VECTOR("absdiff_u8", u8, absdiff_u8(a, b)),
    MEMORY("first_zero", 1, *out = uint8_t(first_zero(u8(in, 0)))),
    MEMORY("first_zero, none", 1, *out = uint8_t(first_zero(bit_or(u8(in, 0), set_u8(1))))),
    MEMORY("first_zero, anywhere", 1,
           uint8_t v[bytes]; store(v, bit_or(u8(in, 0), set_u8(1)));
           v[in[-bytes - 1] % bytes] = v[in[-bytes - 2] % bytes] = 0; *out = uint8_t(first_zero(load(v)))),

    VECTOR("bit_and u8", u8, bit_and(a, b)),
    VECTOR("bit_or u8", u8, bit_or(a, b)),
    VECTOR("bit_xor u8", u8, bit_xor(a, b)),
    VECTOR("bit_not", u8, bit_not(a)),
    VECTOR("bit_and u16", u16, bit_and(a, b)),
    VECTOR("bit_or u16", u16, bit_or(a, b)),
    VECTOR("shl 1", u16, shl<1>(a)),
    VECTOR("shl 11", u16, shl<11>(a)),
    VECTOR("shr 1", u16, shr<1>(a)),
    VECTOR("shr 13", u16, shr<13>(a)),
    VECTOR("sar 1", s16, sar<1>(a)),
    VECTOR("sar 15", s16, sar<15>(a)),
    VECTOR("shr_pairs", u16, shr_pairs<6, 9>(a)),
    VECTOR("shr_pairs, widest", u16, shr_pairs<15, 1>(a)),

    VECTOR("add", s16, add(a, b)),
    VECTOR("add_sat", s16, add_sat(a, b)),
    VECTOR("sub", s16, sub(a, b)),
    VECTOR("min_s16", s16, min_s16(a, b)),
    VECTOR("max_s16", s16, max_s16(a, b)),
    VECTOR("sub_sat", s16, sub_sat(a, b)),
    VECTOR("mul", u16, mul(a, b)),
    VECTOR("avg_u16", u16, avg_u16(a, b)),
    VECTOR("mean_down_u16", u16, mean_down_u16(a, b)),
    VECTOR("half_difference", u16, half_difference(a, b)),
    VECTOR("sub_sat_u16", u16, sub_sat_u16(a, b)),
    MEMORY("load_block_halves, mul_add", bytes, const pairs_v v = load_block_halves(in - bytes); put(out, mul_add(mul(even(v), set_pair_bytes(in[-bytes])), odd(v), set_pair_bytes(255)))),
    MEMORY("exchange_pairs", bytes, put(out, pair_dot<100, 7, 0>(exchange_pairs(load_pairs(in - bytes), set_split_moves(true))))),
    MEMORY("exchange_pairs, in order", bytes, put(out, pair_dot<100, 7, 0>(exchange_pairs(load_pairs(in - bytes), set_split_moves(false))))),
    MEMORY("load_pairs, mul", bytes, put(out, mul(odd(load_pairs(in - bytes / 2, in - 3 * bytes)), set_pair_bytes(in[-bytes])))),
    MEMORY("load_pair_halves", bytes, put(out, pair_dot<100, 7, 0>(load_pair_halves(in - bytes / 2, in - 3 * bytes - 1)))),
    MEMORY("load_pair_halves, upwards", bytes, put(out, pair_dot<100, 7, 0>(load_pair_halves(in - 3 * bytes - 1, in - bytes / 2)))),
    MEMORY("load_pairs_twice", bytes, put(out, pair_dot<100, 7, 0>(load_pairs_twice(in - bytes / 4, in - bytes - 1)))),
    MEMORY("load_pairs_twice, upwards", bytes, put(out, pair_dot<100, 7, 0>(load_pairs_twice(in - bytes - 1, in - bytes / 4)))),
    MEMORY("pair_evens", bytes, put(out, pair_dot<100, 7, 0>(pair_evens(load_pairs(in - bytes), load_pairs(in - 2 * bytes))))),
    MEMORY("pair_odds", bytes, put(out, pair_dot<100, 7, 0>(pair_odds(load_pairs(in - bytes), load_pairs(in - 2 * bytes))))),
    MEMORY("load_groups, exchanged", 2 * bytes, const luma_chroma v = exchanged(load_groups(in - 2 * bytes)); put(out, pair_dot<100, 7, 0>(v.y)); put(out + bytes, pair_dot<100, 7, 0>(v.pairs))),
    MEMORY("load_groups_natural", 2 * bytes, const luma_chroma v = load_groups_natural(in - 2 * bytes); put(out, pair_dot<100, 7, 0>(v.y)); put(out + bytes, pair_dot<100, 7, 0>(v.pairs))),
    MEMORY("load_groups_by4", 2 * bytes, const luma_chroma v = load_groups_by4(in - 2 * bytes); put(out, pair_dot<100, 7, 0>(v.y)); put(out + bytes, pair_dot<100, 7, 0>(v.pairs))),
    MEMORY("half_product", bytes, put(out, half_product(even(load_pairs(in - bytes)), set_half_factor(409)))),
    MEMORY("half_product, widest", bytes, put(out, half_product(odd(load_pairs(in - bytes)), set_half_factor(511)))),
    MEMORY("half_product, even", bytes, put(out, half_product(odd(load_pairs(in - bytes)), set_half_factor(274)))),
    VECTOR("mul_round", s16, mul_round(a, as_s16(bit_or(as_u16(b), set_u16(1))))),
    VECTOR("add_sat_u8", u8, add_sat_u8(a, b)),
    VECTOR("sub_sat_u8", u8, sub_sat_u8(a, b)),
    VECTOR("add_u8", u8, add_u8(a, b)),
    VECTOR("sub_u8", u8, sub_u8(a, b)),
    VECTOR("half_u8", u8, half_u8(a)),
    VECTOR("greater, select", u8, select(greater(as_s16(as_u16(a)), as_s16(as_u16(b))), c, b)),
    MEMORY("greater, equal lanes", bytes, put(out, select(greater(s16(in, 0), s16(in, 0)), u8(in, 1), u8(in, 2)))),
    MEMORY("chain_before", 4 * bytes, chain_state state = chain_begin(in[-1] & 1);
           for (int k = 0; k < 4; k++) {
               const s16v v = s16(in, k);  // decided anew at one lane in four
               const mask16 set = greater(v, as_s16(set_u16(24576))), keep = greater(v, as_s16(set_u16(57344)));
               put(out + k * bytes, select(chain_before(set, keep, state), set_u8(255), set_u8(0)));
           }),
    VECTOR("dot_pairs, mixed", u8, dot_pairs(a, bit_and(b, set_u8(63)))),
    VECTOR("dot_pairs, widest", u8, dot_pairs(a, bit_and(b, set_u8(64)))),
    VECTOR("dot_pairs, apart", u8, dot_pairs(a, bit_and(b, set_pair(127, 1)))),
    VECTOR("sum_pairs", u16, sum_pairs<256>(shr_pairs<9, 8>(a), shr_pairs<9, 8>(b))),
    VECTOR("sum_pairs, twice", u16, sum_pairs<2>(shr_pairs<2, 2>(a), shr_pairs<1, 2>(b))),
    MEMORY("pair_dot luma even", bytes, put(out, pair_dot<149, 0, 13440>(load_pairs(in - bytes)))),
    MEMORY("pair_dot luma odd", bytes, put(out, pair_dot<0, 150, 13552>(load_pairs(in - bytes)))),
    MEMORY("pair_dot negative", bytes, put(out, pair_dot<-50, -104, 3312>(load_pairs(in - bytes)))),
    MEMORY("pair_dot widest", bytes, put(out, pair_dot<127, 128, 0>(load_pairs(in - bytes)))),
    MEMORY("pair_dot widest, negative", bytes, put(out, pair_dot<-255, 0, -1>(load_pairs(in - bytes)))),
    MEMORY("half_product_high", bytes, put(out, half_product_high<409, -22864>(load_pairs(in - bytes)))),
    MEMORY("half_product_high, widest", bytes, put(out, half_product_high<511, -32768>(load_pairs(in - bytes)))),
    MEMORY("half_product_low", bytes, put(out, half_product_low<409, -22864>(load_pairs(in - bytes)))),
    MEMORY("half_product_low, small", bytes, put(out, half_product_low<1, 3>(load_pairs(in - bytes)))),
    MEMORY("low_minus_128_shl8", bytes, put(out, low_minus_128_shl8(load_pairs(in - bytes)))),
    MEMORY("high_minus_128_shl8", bytes, put(out, high_minus_128_shl8(load_pairs(in - bytes)))),

    VECTOR("even", u8, even(a)),
    VECTOR("odd", u8, odd(a)),
    VECTOR("join", u8, join(even(a), odd(b))),
    VECTOR("narrow_join 7", s16, narrow_join<7>(a, b)),
    VECTOR("narrow_join 1", s16, narrow_join<1>(a, b)),
    VECTOR("pack565", s16, pack565(a, b, c)),
    VECTOR("widen_low", u8, widen_low(a)),
    VECTOR("widen_high", u8, widen_high(a)),
    VECTOR("narrow", s16, narrow(a, b)),
    VECTOR("narrow, near the limits", s16, narrow(sar<6>(a), sar<7>(b))),
    VECTOR("narrow_shr 6", u16, narrow_shr<6>(a, b)),
    VECTOR("narrow_sar 6", s16, narrow_sar<6>(a, b)),

    VECTOR("mean_of_pairs", u8, mean_of_pairs(a, b, c, u8(in, 3))),
    VECTOR("zip_low 1", u8, zip_low<1>(a, b)),
    VECTOR("zip_high 1", u8, zip_high<1>(a, b)),
    VECTOR("zip_low 2", u8, zip_low<2>(a, b)),
    VECTOR("zip_high 2", u8, zip_high<2>(a, b)),
    VECTOR("zip_low 4", u8, zip_low<4>(a, b)),
    VECTOR("zip_high 4", u8, zip_high<4>(a, b)),
    VECTOR("zip_low 8", u8, zip_low<8>(a, b)),
    VECTOR("zip_high 8", u8, zip_high<8>(a, b)),
    VECTOR("blend_u32", u8, blend_u32(a, b)),
    VECTOR("pick", u8, pick(a, bit_and(b, set_u8(window_bytes - 1)))),
    VECTOR("pick_or_zero", u8, pick_or_zero(a, bit_and(b, set_u8(0x80 | (window_bytes - 1))))),
    VECTOR("pick_or_zero, zeros of any index", u8, pick_or_zero(a, bit_or(b, set_u8(0x80)))),
    VECTOR("shuffle", u8, shuffle(a, bit_and(b, set_u8(15)))),
    VECTOR("shuffle, zeros", u8, shuffle(a, bit_and(b, set_u8(0x8F)))),
    VECTOR("shuffle, zeros of any index", u8, shuffle(a, bit_or(b, set_u8(0x80)))),
    VECTOR("reverse_u8", u8, reverse_u8(a)),
    VECTOR("reverse_u16", u8, reverse_u16(a)),

    VECTOR("natural_to_by8", u8, natural_to_by8(a)),
    VECTOR("natural_to_by4", u8, natural_to_by4(a)),
    VECTOR("by8_to_natural", u8, by8_to_natural(a)),
    VECTOR("join_high", u16, join_high(a, b)),
    MEMORY("store_high", bytes / 2, store_high(out, u16(in, 0))),
    MEMORY("load_565, dot_high", bytes, put(out, dot_high<66, 129, 25, 16>(load_565(in - 2 * bytes)))),
    MEMORY("load_888, dot_high", bytes, put(out, dot_high<25, 129, 66, 16>(load_888(in - 3 * bytes)))),
    MEMORY("load_888, dot_high, widest", bytes, put(out, dot_high<1, 129, 126, 255>(load_888(in - 3 * bytes)))),
    MEMORY("load_888, even_dot, negative", bytes, put(out, even_dot<0, -255, 127, 0>(load_888(in - 3 * bytes)))),
    MEMORY("load_8888, dot_high", bytes, put(out, dot_high(load_8888<0>(in - 4 * bytes), set_channel_weights(77, 150, 29, 0)))),
    MEMORY("load_888, dot_high, factors", bytes, put(out, dot_high(load_888(in - 3 * bytes), set_channel_weights(1, 129, 126, 255)))),
    MEMORY("load_8888, even_dot", bytes, put(out, even_dot(even_pixels(load_8888<1>(in - 4 * bytes)), set_channel_factors(43, 85, -128)))),
    MEMORY("load_565, even_dot, factors", bytes, put(out, even_dot(even_pixels(load_565(in - 2 * bytes)), set_channel_factors(-128, 127, 127)))),
    MEMORY("load_565, channels_of", 3 * bytes, const channels_v v = channels_of(load_565(in - 2 * bytes)); for (int k = 0; k < 3; k++) put(out + k * bytes, v.c[k])),
    MEMORY("load_888, channels_of", 3 * bytes, const channels_v v = channels_of(load_888(in - 3 * bytes)); for (int k = 0; k < 3; k++) put(out + k * bytes, v.c[k])),
    MEMORY("load_8888, channels_of", 3 * bytes, const channels_v v = channels_of(load_8888<1>(in - 4 * bytes)); for (int k = 0; k < 3; k++) put(out + k * bytes, v.c[k])),
    MEMORY("block_means of load_888", 3 * bytes,
           const half_rgb_v v = block_means(load_888(in - 3 * bytes), load_888(in - 6 * bytes));
           put(out, even_dot(v, set_channel_factors(1, 0, 0))); put(out + bytes, even_dot(v, set_channel_factors(0, 1, 0)));
           put(out + 2 * bytes, even_dot(v, set_channel_factors(0, 0, 1)))),
    MEMORY("block_means of load_565", bytes, put(out, even_dot(block_means(load_565(in - 2 * bytes), load_565(in - 4 * bytes)), set_channel_factors(-128, 121, 127)))),
    MEMORY("load_888, dots_high", bytes, put(out, dots_high(even_pixels(load_888(in - 3 * bytes)), set_channel_factors(43, 85, -128), set_channel_factors(-128, 107, 21), as_s16(set_u16(128))))),
    MEMORY("store_565", 2 * bytes, store_565(out, u8(in, 0), u8(in, 1), u8(in, 2))),
    MEMORY("repack_888_to_565", 2 * bytes, repack_888_to_565(out, in - 3 * bytes)),
    MEMORY("repack_8888_to_565", 2 * bytes, repack_8888_to_565(out, in - 4 * bytes)),
    MEMORY("repack_888_to_8888", 4 * bytes, with_widen_moves(false, false, [&](const auto &m) { repack_888_to_8888(out, in - 3 * bytes, m); })),
    MEMORY("repack_888_to_8888, exchanged", 4 * bytes, with_widen_moves(true, true, [&](const auto &m) { repack_888_to_8888(out, in - 3 * bytes, m); })),
    MEMORY("repack_8888_to_888", 3 * bytes, with_narrow_moves(false, true, [&](const auto &m) { repack_8888_to_888(out, in - 4 * bytes, m); })),
    MEMORY("repack_8888_to_888, exchanged", 3 * bytes, with_narrow_moves(true, false, [&](const auto &m) { repack_8888_to_888(out, in - 4 * bytes, m); })),
    MEMORY("exchange_888", 3 * bytes, exchange_888(out, in - 3 * bytes)),
    MEMORY("load_quads, dot_high", bytes, with_load_quads(false, [&](const auto &load) { put(out, dot_high(load(in - 4 * bytes), set_quad_weights(false, 77, 150, 29, 0))); })),
    MEMORY("load_quads, dot_high, widest", bytes, with_load_quads(true, [&](const auto &load) { put(out, dot_high(load(in - 4 * bytes), set_quad_weights(true, 1, 254, 1, 200))); })),
    MEMORY("load_quads, dot_high, offset", bytes, with_load_quads(true, [&](const auto &load) { put(out, dot_high(load(in - 4 * bytes), set_quad_weights(true, 47, 157, 16, 16))); })),
    MEMORY("even_quads, dots_high", bytes, with_load_quads(false, [&](const auto &load) { put(out, dots_high(even_quads(load(in - 4 * bytes)), set_quad_factors(false, 43, 85, -128), set_quad_factors(false, -128, 107, 21), as_s16(set_u16(128)))); })),
    MEMORY("even_quads, dots_high, alpha first", bytes, with_load_quads(true, [&](const auto &load) { put(out, dots_high(even_quads(load(in - 4 * bytes)), set_quad_factors(true, 21, 107, -128), set_quad_factors(true, -128, 85, 43), as_s16(set_u16(128)))); })),
    MEMORY("block_means of quads", 2 * bytes,
           const auto channels = [&](bool skips_first, int p, int q, int r, int s, int t, int u, uint8_t *to) {
               with_load_quads(skips_first, [&](const auto &load) {
                   const half_quads_v v = block_means(load(in - 4 * bytes), load(in - 8 * bytes));
                   put(to, dots_high(v, set_quad_factors(skips_first, p, q, r), set_quad_factors(skips_first, s, t, u), as_s16(set_u16(0))));
               });
           };
           channels(false, 127, 0, 0, 0, 127, 0, out); channels(true, 0, 127, 0, 0, 0, 127, out + bytes)),
    MEMORY("load_565, even_dot", bytes, put(out, even_dot<112, -94, -18, 32896>(load_565(in - 2 * bytes)))),
    MEMORY("load_888, even_dot", bytes, put(out, even_dot<-128, 255, 127, 1>(load_888(in - 3 * bytes)))),
    MEMORY("store_zip8", 2 * bytes, store_zip8(out, u8(in, 0), u8(in, 1))),
    MEMORY("gather_groups, luma first", 2 * bytes, store_groups(out, gather_groups<true>(in - bytes, in - 2 * bytes - 3, in - 3 * bytes))),
    MEMORY("gather_groups, chroma first", 2 * bytes, store_groups(out, gather_groups<false>(in - 3 * bytes, in - bytes / 2, in - 2 * bytes))),
    MEMORY("store_zip16", 2 * bytes, store_zip16(out, u16(in, 0), u16(in, 1))),
    MEMORY("store_zip16, halves", 2 * bytes + 1, { out[bytes] = 0; store_zip16(out + bytes + 1, out, u16(in, 0), u16(in, 1)); }),
    MEMORY("store_zip3", 3 * bytes, store_zip3(out, u8(in, 0), u8(in, 1), u8(in, 2))),
    MEMORY("store_narrow_zip3", 3 * bytes, store_narrow_zip3<7, 6, 5>(out, s16(in, 0), s16(in, 1), s16(in, 2), s16(in, 3), s16(in, 4), s16(in, 5))),
    MEMORY("store_narrow_zip3, exchanged", 3 * bytes, store_narrow_zip3<7, 6, 5>(out, s16(in, 0), s16(in, 1), s16(in, 2), s16(in, 3), s16(in, 4), s16(in, 5), true)),
    MEMORY("store_narrow_zip3, halves", 3 * bytes + 1, { out[3 * bytes / 2] = 0; store_narrow_zip3<7, 6, 5>(out + 3 * bytes / 2 + 1, out, s16(in, 0), s16(in, 1), s16(in, 2), s16(in, 3), s16(in, 4), s16(in, 5)); }),
    MEMORY("store_narrow_zip3, halves, exchanged", 3 * bytes, store_narrow_zip3<7, 6, 5>(out, out + 3 * bytes / 2, s16(in, 0), s16(in, 1), s16(in, 2), s16(in, 3), s16(in, 4), s16(in, 5), true)),
    MEMORY("store_zip4, halves", 4 * bytes + 1, { out[2 * bytes] = 0; store_zip4(out + 2 * bytes + 1, out, u8(in, 0), u8(in, 1), u8(in, 2), u8(in, 3)); }),
    MEMORY("store_zip4", 4 * bytes, store_zip4(out, u8(in, 0), u8(in, 1), u8(in, 2), u8(in, 3))),
};
// clang-format on

#undef VECTOR
#undef MEMORY
