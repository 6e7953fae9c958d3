// The 64 x 32 tiled layout: the scalar rows, which define the results, and the kernels.
#include "simgp/tile.h"

#include <string.h>

#include "simd/choose.h"
#include "simgp/planes.h"
#include "simgp/tile_offset.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

void detile(const uint8_t *tile, uint8_t *dst, ptrdiff_t stride, ptrdiff_t rows) {
    for (ptrdiff_t r = 0; r < rows; r++) memcpy(dst + r * stride, tile + 64 * r, 64);
}

void entile(const uint8_t *src, ptrdiff_t stride, uint8_t *tile, ptrdiff_t rows) {
    for (ptrdiff_t r = 0; r < rows; r++) memcpy(tile + 64 * r, src + r * stride, 64);
}

void detile_unpack(const uint8_t *tile, uint8_t *a, ptrdiff_t stride_a, uint8_t *b,
                   ptrdiff_t stride_b, ptrdiff_t rows) {
    for (ptrdiff_t r = 0; r < rows; r++)
        for (ptrdiff_t i = 0; i < 32; i++) {
            a[r * stride_a + i] = tile[64 * r + 2 * i];
            b[r * stride_b + i] = tile[64 * r + 2 * i + 1];
        }
}

void entile_pack(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b, ptrdiff_t stride_b,
                 uint8_t *tile, ptrdiff_t rows) {
    for (ptrdiff_t r = 0; r < rows; r++)
        for (ptrdiff_t i = 0; i < 32; i++) {
            tile[64 * r + 2 * i] = a[r * stride_a + i];
            tile[64 * r + 2 * i + 1] = b[r * stride_b + i];
        }
}

template <rgb_packing Packing>
void to_rgb(const uint8_t *luma, const uint8_t *chroma, uint8_t *dst, ptrdiff_t stride,
            ptrdiff_t rows) {
    yuv_to_rgb_row_pair *const pair =
        rows_of(target::scalar).yuv_to_rgb_pair[size_t(yuv_layout::uv)][size_t(Packing)];
    for (ptrdiff_t r = 0; r < rows; r += 2) {
        const ptrdiff_t below = r + 1 < rows ? r + 1 : r;
        pair(luma + 64 * r, luma + 64 * below, chroma + 32 * r, nullptr, dst + r * stride,
             dst + below * stride, 64);
    }
}

}  // namespace

void fill_tile(rows &t) {
    t.detile = detile;
    t.entile = entile;
    t.detile_unpack = detile_unpack;
    t.entile_pack = entile_pack;
    t.tile_to_rgb565 = to_rgb<rgb_packing::rgb565>;
    t.tile_to_bgra8888 = to_rgb<rgb_packing::bgra8888>;
}

}  // namespace scalar

namespace {

// The part of a tile that lies in the plane: `width` <= 64 bytes x `rows` <= 32 rows, from byte x
// of row y on. Its rows lie 64 bytes apart, from `offset` in the tiled plane on.
struct block {
    ptrdiff_t x, y, width, rows, offset;

    bool whole() const { return width == 64; }
};

template <class F>
void for_each_tile(ptrdiff_t width, ptrdiff_t height, F f) {
    for (ptrdiff_t y = 0; y < height; y += 32)
        for (ptrdiff_t x = 0; x < width; x += 64)
            f(block{x, y, width - x < 64 ? width - x : 64, height - y < 32 ? height - y : 32,
                    tile_offset(width, height, x, y)});
}

void copy_to_linear(const uint8_t *src, ptrdiff_t width, ptrdiff_t height, ptrdiff_t stride,
                    uint8_t *dst) {
    const rows &table = live_rows();
    for_each_tile(width, height, [&](const block &b) {
        const uint8_t *const tile = src + b.offset;
        uint8_t *const to = dst + b.y * stride + b.x;
        if (b.whole()) return table.detile(tile, to, stride, b.rows);
        copy_rows(tile, 64, to, stride, b.width, b.rows);
    });
}

void copy_from_linear(const uint8_t *src, ptrdiff_t stride, ptrdiff_t width, ptrdiff_t height,
                      uint8_t *dst) {
    const rows &table = live_rows();
    for_each_tile(width, height, [&](const block &b) {
        const uint8_t *const from = src + b.y * stride + b.x;
        uint8_t *const tile = dst + b.offset;
        if (b.whole()) return table.entile(from, stride, tile, b.rows);
        copy_rows(from, stride, tile, 64, b.width, b.rows);
    });
}

void unpack_to_linear(const uint8_t *src, ptrdiff_t width, ptrdiff_t height, const plane_lines &u,
                      const plane_lines &v) {
    const rows &table = live_rows();
    for_each_tile(width, height, [&](const block &b) {
        const uint8_t *const tile = src + b.offset;
        const plane_lines to_u{u.line(b.y) + b.x / 2, u.stride};
        const plane_lines to_v{v.line(b.y) + b.x / 2, v.stride};
        if (b.whole())
            return table.detile_unpack(tile, to_u.first, u.stride, to_v.first, v.stride, b.rows);
        const ptrdiff_t pairs = b.width / 2;
        for (ptrdiff_t r = 0; r < b.rows; r++) {
            if (pairs > 0) table.unpack(tile + 64 * r, to_u.line(r), to_v.line(r), pairs);
            if (b.width & 1) to_u.line(r)[pairs] = tile[64 * r + 2 * pairs];
        }
    });
}

void pack_from_linear(const plane_lines &u, const plane_lines &v, ptrdiff_t width, ptrdiff_t height,
                      uint8_t *dst) {
    const rows &table = live_rows();
    for_each_tile(width, height, [&](const block &b) {
        const plane_lines from_u{u.line(b.y) + b.x / 2, u.stride};
        const plane_lines from_v{v.line(b.y) + b.x / 2, v.stride};
        uint8_t *const tile = dst + b.offset;
        if (b.whole())
            return table.entile_pack(from_u.first, u.stride, from_v.first, v.stride, tile, b.rows);
        for (ptrdiff_t r = 0; r < b.rows; r++)
            table.pack(from_u.line(r), from_v.line(r), tile + 64 * r, (b.width + 1) / 2);
    });
}

// Chroma of a picture that has none.
struct mid_grey {
    uint8_t pairs[64];
    constexpr mid_grey() : pairs() {
        for (uint8_t &b : pairs) b = 128;
    }
};
constexpr mid_grey no_chroma;

// The part of a tile goes through whole tiles on the stack, some rows at a time.
void convert_part(tile_to_rgb_rows *convert, const uint8_t *luma, const uint8_t *chroma,
                  const plane_lines &out, const block &b, ptrdiff_t pixel_bytes) {
    constexpr ptrdiff_t step = 8;
    uint8_t y[step * 64] = {}, pairs[step / 2 * 64] = {}, pixels[step * 64 * 4];
    for (ptrdiff_t r = 0; r < b.rows; r += step) {
        const ptrdiff_t rows = b.rows - r < step ? b.rows - r : step;
        copy_rows(luma + 64 * r, 64, y, 64, b.width, rows);
        copy_rows(chroma + 32 * r, 64, pairs, 64, (b.width + 1) & ~1, (rows + 1) / 2);
        convert(y, pairs, pixels, 64 * pixel_bytes, rows);
        copy_rows(pixels, 64 * pixel_bytes, out.line(b.y + r) + b.x * pixel_bytes, out.stride,
                  b.width * pixel_bytes, rows);
    }
}

void convert(const csc_args &a, tile_to_rgb_rows *convert_whole, ptrdiff_t pixel_bytes) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    const ptrdiff_t chroma_rows = height >> 1, chroma_tile_rows = (chroma_rows + 31) >> 5;
    const plane_lines out{a.dst_planes[0], a.dst_strides[0] & -pixel_bytes};
    for_each_tile(width, height, [&](const block &b) {
        const uint8_t *const luma = a.src_planes[0] + b.offset;
        // The last row of an odd height may ask for a row of chroma that has no tile.
        const ptrdiff_t line = b.y >> 6 < chroma_tile_rows ? b.y >> 1 : chroma_rows - 1;
        const uint8_t *const chroma =
            line < 0 ? no_chroma.pairs
                     : a.src_planes[1] + tile_offset(width, chroma_rows, b.x, line);
        if (!b.whole()) return convert_part(convert_whole, luma, chroma, out, b, pixel_bytes);
        convert_whole(luma, chroma, out.line(b.y) + b.x * pixel_bytes, out.stride, b.rows);
    });
}

}  // namespace
}  // namespace simgp

using namespace simgp;

int32_t simgp_get_tile_offset(int32_t width, int32_t height, int32_t x, int32_t y) {
    return int32_t(tile_offset(width, height, x, y));
}

void simgp_csc_copy_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                    int32_t dst_stride, uint8_t *dst) {
    copy_to_linear(src, width, height, dst_stride, dst);
}

void simgp_csc_unpack_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                      int32_t stride_u, uint8_t *dst_u, int32_t stride_v,
                                      uint8_t *dst_v) {
    unpack_to_linear(src, width, height, {dst_u, stride_u}, {dst_v, stride_v});
}

SIMGP_CSC_KERNEL(simgp_csc_t64x32_to_nv12, {
    const int32_t width = args.src_widths[0], height = args.src_heights[0];
    copy_to_linear(args.src_planes[0], width, height, args.dst_strides[0], args.dst_planes[0]);
    copy_to_linear(args.src_planes[1], width, height >> 1, args.dst_strides[1], args.dst_planes[1]);
})

SIMGP_CSC_KERNEL(simgp_csc_t64x32_to_yuv420, {
    const int32_t width = args.src_widths[0], height = args.src_heights[0];
    copy_to_linear(args.src_planes[0], width, height, args.dst_strides[0], args.dst_planes[0]);
    unpack_to_linear(args.src_planes[1], width, height >> 1, dst_lines(args, 1),
                     dst_lines(args, 2));
})

SIMGP_CSC_KERNEL(simgp_csc_yuv420_to_t64x32, {
    const int32_t width = args.src_widths[0], height = args.src_heights[0];
    copy_from_linear(args.src_planes[0], args.src_strides[0], width, height, args.dst_planes[0]);
    pack_from_linear(src_lines(args, 1), src_lines(args, 2), width, height >> 1,
                     args.dst_planes[1]);
})

SIMGP_CSC_KERNEL(simgp_csc_t64x32_to_rgb565, convert(args, live_rows().tile_to_rgb565, 2))
SIMGP_CSC_KERNEL(simgp_csc_t64x32_to_bgra8888, convert(args, live_rows().tile_to_bgra8888, 4))
