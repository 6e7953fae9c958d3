// Tiles and linear rows, and tiles to RGB.
#ifndef SIMGP_VECTOR_TILE_H
#define SIMGP_VECTOR_TILE_H

#include "rows/tile.h"
#include "simgp/vector/fetch.h"
#include "simgp/vector/matrix.h"
#include "simgp/vector/packer.h"

namespace simgp::SIMD_TARGET {

static_assert(tile_width % bytes == 0);

// The linear rows beside a tile are too many streams for the processor to foresee. Copies are held
// up by that once they leave the caches, so they ask for the bytes beside the second tile to come.
inline void fetch_ahead(const uint8_t *p) { fetch(p, 2 * tile_width); }

static void detile(const uint8_t *tile, uint8_t *dst, ptrdiff_t stride, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++) {
        fetch_ahead(dst + r * stride);
        for (ptrdiff_t x = 0; x < tile_width; x += bytes)
            store(dst + r * stride + x, load(tile + tile_width * r + x));
    }
}

static void entile(const uint8_t *src, ptrdiff_t stride, uint8_t *tile, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++) {
        fetch_ahead(src + r * stride);
        for (ptrdiff_t x = 0; x < tile_width; x += bytes)
            store(tile + tile_width * r + x, load(src + r * stride + x));
    }
}

static void detile_unpack(const uint8_t *tile, uint8_t *a, ptrdiff_t stride_a, uint8_t *b,
                          ptrdiff_t stride_b, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++) {
        const uint8_t *const from = tile + tile_width * r;
        fetch_ahead(a + r * stride_a);
        fetch_ahead(b + r * stride_b);
        if constexpr (bytes == tile_width) {
            store_split(a + r * stride_a, b + r * stride_b, load(from));
        } else {
            for (ptrdiff_t i = 0; i < tile_width / 2; i += bytes) {
                const pair_u8 v = load_split_natural(from + 2 * i);
                store(a + r * stride_a + i, v.even);
                store(b + r * stride_b + i, v.odd);
            }
        }
    }
}

static void entile_pack(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b, ptrdiff_t stride_b,
                        uint8_t *tile, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++) {
        fetch_ahead(a + r * stride_a);
        fetch_ahead(b + r * stride_b);
        for (ptrdiff_t x = 0; x < tile_width; x += bytes)
            store(tile + tile_width * r + x,
                  load_zip(a + r * stride_a + x / 2, b + r * stride_b + x / 2));
    }
}

// Two rows at a time share their chroma.
template <rgb_packing Packing>
static void tile_to_rgb(const uint8_t *luma, const uint8_t *chroma, uint8_t *dst, ptrdiff_t stride,
                        ptrdiff_t height) {
    using to = packer<Packing>;
    for (ptrdiff_t r = 0; r < height; r += 2)
        for (ptrdiff_t x = 0; x < tile_width; x += bytes) {
            const pairs_v pairs = arrange<to::order>(load_pairs(chroma + tile_width * (r / 2) + x));
            const chroma_terms c = bt601::chroma<pair_order::uv>(pairs);
            const auto write_row = [&](ptrdiff_t row) {
                const pairs_v y = arrange<to::order>(load_pairs(luma + tile_width * row + x));
                to::store(dst + row * stride + x * to::size, bt601::apply(bt601::luma_even(y), c),
                          bt601::apply(bt601::luma_odd(y), c));
            };
            write_row(r);
            if (r + 1 < height) write_row(r + 1);
        }
}

void fill_tile(tile_rows &t) {
    t.detile = detile;
    t.entile = entile;
    t.detile_unpack = detile_unpack;
    t.entile_pack = entile_pack;
#define FILL(name, from, to) \
    t.to_rgb[size_t(formats::to.packing)] = tile_to_rgb<formats::to.packing>;
    SIMGP_TILE_TO_RGB_KERNELS(FILL)
#undef FILL
}

}  // namespace simgp::SIMD_TARGET

#endif
