// Inner loops over tiles.
#ifndef ROWS_TILE_H
#define ROWS_TILE_H

#include "rows/conversions.h"

namespace simgp {

// A tile has 32 rows of 64 bytes, one behind the other.
inline constexpr ptrdiff_t tile_width = 64, tile_height = 32, tile_bytes = tile_width * tile_height;

// Moves the first `height` rows, 1 to 32, of a tile from or to linear rows. Tiled chroma is taken
// apart into, or interleaved from, rows of 32 bytes.
using detile_rows = void(const uint8_t *tile, uint8_t *dst, ptrdiff_t stride, ptrdiff_t height);
using entile_rows = void(const uint8_t *src, ptrdiff_t stride, uint8_t *tile, ptrdiff_t height);
using detile_unpack_rows = void(const uint8_t *tile, uint8_t *a, ptrdiff_t stride_a, uint8_t *b,
                                ptrdiff_t stride_b, ptrdiff_t height);
using entile_pack_rows = void(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b,
                              ptrdiff_t stride_b, uint8_t *tile, ptrdiff_t height);

// Converts `height` rows of 64 pixels: row r from row r of the luma tile and row r / 2 of the
// chroma tile, byte pairs U V.
using tile_to_rgb_rows = void(const uint8_t *luma, const uint8_t *chroma, uint8_t *dst,
                              ptrdiff_t stride, ptrdiff_t height);

struct tile_rows {
    detile_rows *detile;
    entile_rows *entile;
    detile_unpack_rows *detile_unpack;
    entile_pack_rows *entile_pack;
    tile_to_rgb_rows *to_rgb[size_t(rgb_packing::count)];  // SIMGP_TILE_TO_RGB_KERNELS
};

}  // namespace simgp

#endif
