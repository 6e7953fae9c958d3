// The 64 x 32 tiled layout: the scalar rows, which define the results, and the kernels.
#include "simgp/tile.h"

#include <string.h>

#include "rows/choose.h"
#include "simgp/blocks.h"
#include "simgp/kernel.h"
#include "simgp/pixel.h"
#include "simgp/tile_offset.h"

namespace simgp {
namespace scalar {
namespace {

void detile(const uint8_t *tile, uint8_t *dst, ptrdiff_t stride, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++)
        memcpy(dst + r * stride, tile + tile_width * r, tile_width);
}

void entile(const uint8_t *src, ptrdiff_t stride, uint8_t *tile, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++)
        memcpy(tile + tile_width * r, src + r * stride, tile_width);
}

void detile_unpack(const uint8_t *tile, uint8_t *a, ptrdiff_t stride_a, uint8_t *b,
                   ptrdiff_t stride_b, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++)
        for (ptrdiff_t i = 0; i < tile_width / 2; i++) {
            a[r * stride_a + i] = tile[tile_width * r + 2 * i];
            b[r * stride_b + i] = tile[tile_width * r + 2 * i + 1];
        }
}

void entile_pack(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b, ptrdiff_t stride_b,
                 uint8_t *tile, ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++)
        for (ptrdiff_t i = 0; i < tile_width / 2; i++) {
            tile[tile_width * r + 2 * i] = a[r * stride_a + i];
            tile[tile_width * r + 2 * i + 1] = b[r * stride_b + i];
        }
}

template <rgb_packing Packing>
void tile_to_rgb(const uint8_t *luma, const uint8_t *chroma, uint8_t *dst, ptrdiff_t stride,
                 ptrdiff_t height) {
    for (ptrdiff_t r = 0; r < height; r++)
        to_rgb_row<yuv_layout::uv, bt601, Packing>(luma + tile_width * r,
                                                   chroma + tile_width * (r / 2), nullptr,
                                                   dst + r * stride, tile_width);
}

}  // namespace

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

}  // namespace scalar

namespace {

// Calls f(block, offset) for the tiles of a plane of width bytes x height rows: the part of the tile
// that lies in the plane, and where its rows, 64 bytes apart, begin in the tiled plane.
template <class F>
void for_each_tile(ptrdiff_t width, ptrdiff_t height, F f) {
    for_each_block<tile_width, tile_height>(
        width, height, [&](const block &b) { f(b, tile_offset(width, height, b.x, b.y)); });
}
bool is_whole(const block &b) { return b.width == tile_width; }

void copy_to_linear(const uint8_t *src, ptrdiff_t width, ptrdiff_t height, const lines &dst) {
    const tile_rows &table = live_rows().tile;
    for_each_tile(width, height, [&](const block &b, ptrdiff_t offset) {
        const lines to = dst.from(b.x, b.y);
        if (is_whole(b)) return table.detile(src + offset, to.first, to.stride, b.height);
        copy_lines({src + offset, tile_width}, to, b.width, b.height);
    });
}

void copy_from_linear(const const_lines &src, ptrdiff_t width, ptrdiff_t height, uint8_t *dst) {
    const tile_rows &table = live_rows().tile;
    for_each_tile(width, height, [&](const block &b, ptrdiff_t offset) {
        const const_lines from = src.from(b.x, b.y);
        if (is_whole(b)) return table.entile(from.first, from.stride, dst + offset, b.height);
        copy_lines(from, {dst + offset, tile_width}, b.width, b.height);
    });
}

void unpack_to_linear(const uint8_t *src, ptrdiff_t width, ptrdiff_t height, const lines &u,
                      const lines &v) {
    const row_table &table = live_rows();
    for_each_tile(width, height, [&](const block &b, ptrdiff_t offset) {
        const uint8_t *const tile = src + offset;
        const lines to_u = u.from(b.x / 2, b.y), to_v = v.from(b.x / 2, b.y);
        if (is_whole(b))
            return table.tile.detile_unpack(tile, to_u.first, u.stride, to_v.first, v.stride,
                                            b.height);
        const ptrdiff_t pairs = b.width / 2;
        if (pairs > 0)
            table.layout.unpack(tile, tile_width, to_u.first, u.stride, to_v.first, v.stride, pairs,
                                b.height);
        if (b.width & 1)
            copy_lines({tile + 2 * pairs, tile_width}, to_u.from(pairs, 0), 1, b.height);
    });
}

void pack_from_linear(const const_lines &u, const const_lines &v, ptrdiff_t width, ptrdiff_t height,
                      uint8_t *dst) {
    const row_table &table = live_rows();
    for_each_tile(width, height, [&](const block &b, ptrdiff_t offset) {
        const const_lines from_u = u.from(b.x / 2, b.y), from_v = v.from(b.x / 2, b.y);
        uint8_t *const tile = dst + offset;
        if (is_whole(b))
            return table.tile.entile_pack(from_u.first, u.stride, from_v.first, v.stride, tile,
                                          b.height);
        table.layout.pack(from_u.first, u.stride, from_v.first, v.stride, tile, tile_width,
                          (b.width + 1) / 2, b.height);
    });
}

// Chroma of a picture that has none.
struct mid_grey {
    uint8_t pairs[tile_width];
    constexpr mid_grey() : pairs() {
        for (uint8_t &b : pairs) b = 128;
    }
};
constexpr mid_grey no_chroma;

// The part of a tile goes through whole tiles on the stack, some rows at a time.
template <ptrdiff_t PixelBytes>
void part_to_rgb(tile_to_rgb_rows *to_rgb_rows, const uint8_t *luma, const uint8_t *chroma,
                 const lines &out, const block &b) {
    constexpr ptrdiff_t step = 8, stride = tile_width * PixelBytes;
    uint8_t y[step * tile_width] = {}, pairs[step / 2 * tile_width] = {}, pixels[step * stride];
    for (ptrdiff_t r = 0; r < b.height; r += step) {
        const ptrdiff_t height = b.height - r < step ? b.height - r : step;
        copy_lines({luma + tile_width * r, tile_width}, {y, tile_width}, b.width, height);
        copy_lines({chroma + tile_width * (r / 2), tile_width}, {pairs, tile_width},
                   (b.width + 1) & ~1, (height + 1) / 2);
        to_rgb_rows(y, pairs, pixels, stride, height);
        copy_lines({pixels, stride}, out.from(0, r), b.width * PixelBytes, height);
    }
}

template <const format &To>
void tiles_to_rgb(const csc_args &a) {
    constexpr ptrdiff_t pixel_bytes = To.bytes[0];
    tile_to_rgb_rows *const to_rgb_rows = live_rows().tile.to_rgb[size_t(To.packing)];
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    const ptrdiff_t chroma_height = height >> 1;
    const ptrdiff_t chroma_tile_rows = (chroma_height + tile_height - 1) / tile_height;
    const lines dst = whole_pixel_lines(dst_lines(a, 0), To.bytes[0]);
    for_each_tile(width, height, [&](const block &b, ptrdiff_t offset) {
        const uint8_t *const luma = a.src_planes[0] + offset;
        // The last row of an odd height may ask for a row of chroma that has no tile.
        const ptrdiff_t line =
            b.y / 2 / tile_height < chroma_tile_rows ? b.y / 2 : chroma_height - 1;
        const uint8_t *const chroma =
            line < 0 ? no_chroma.pairs
                     : a.src_planes[1] + tile_offset(width, chroma_height, b.x, line);
        const lines out = dst.from(b.x * pixel_bytes, b.y);
        if (is_whole(b)) return to_rgb_rows(luma, chroma, out.first, out.stride, b.height);
        part_to_rgb<pixel_bytes>(to_rgb_rows, luma, chroma, out, b);
    });
}

// Between tiles and linear planes of 4:2:0. Chroma has as many bytes a row as luma, and half the
// rows, rounded down.
template <const format &From, const format &To>
void between_tiles(const csc_args &a) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if constexpr (From.kind == format_kind::tiled) {
        copy_to_linear(a.src_planes[0], width, height, dst_lines(a, 0));
        if constexpr (To.u == To.v)
            copy_to_linear(a.src_planes[1], width, height >> 1, dst_lines(a, To.u));
        else
            unpack_to_linear(a.src_planes[1], width, height >> 1, dst_lines(a, To.u),
                             dst_lines(a, To.v));
    } else {
        copy_from_linear(src_lines(a, 0), width, height, a.dst_planes[0]);
        static_assert(From.u != From.v);
        pack_from_linear(src_lines(a, From.u), src_lines(a, From.v), width, height >> 1,
                         a.dst_planes[To.u]);
    }
}

}  // namespace
}  // namespace simgp

using namespace simgp;

int32_t simgp_get_tile_offset(int32_t width, int32_t height, int32_t x, int32_t y) {
    return int32_t(tile_offset(width, height, x, y));
}

void simgp_csc_copy_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                    int32_t dst_stride, uint8_t *dst) {
    copy_to_linear(src, width, height, {dst, dst_stride});
}

void simgp_csc_unpack_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                      int32_t stride_u, uint8_t *dst_u, int32_t stride_v,
                                      uint8_t *dst_v) {
    unpack_to_linear(src, width, height, {dst_u, stride_u}, {dst_v, stride_v});
}

#define DEFINE(name, from, to) SIMGP_CSC_KERNEL(name, tiles_to_rgb<formats::to>(args))
SIMGP_TILE_TO_RGB_KERNELS(DEFINE)
#undef DEFINE
#define DEFINE(name, from, to) \
    SIMGP_CSC_KERNEL(name, between_tiles<formats::from, formats::to>(args))
SIMGP_TILE_KERNELS(DEFINE)
#undef DEFINE
