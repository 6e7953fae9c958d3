// The table of rows: every inner loop of the library, with its signature written once.
//
// Scalar rows define the results; each instruction set has a table of its own in which its vector
// rows have taken the place of the scalar ones. simd/choose.h tells which table is in use.
#ifndef SIMGP_ROWS_H
#define SIMGP_ROWS_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// How the samples of one row of pixels lie in memory.
enum class yuv_layout : uint8_t {
    grey,  // y: a sample per pixel; no chroma
    half,  // y; u, v: a sample for two pixels
    full,  // y; u, v: a sample per pixel
    uv,    // y; u: pairs U V, one for two pixels
    vu,    // y; u: pairs V U, one for two pixels
    uyvy,  // y: bytes U Y V Y for two pixels
    yuyv,  // y: bytes Y U Y V for two pixels; of a half group at the end, U is taken, and V of
           // the group before, or 128 where there is none
    count
};

// How a pixel is stored.
enum class rgb_packing : uint8_t {
    rgb565,
    bgr565,
    rgb888,
    bgr888,
    rgba8888,
    bgra8888,
    argb8888,
    count
};

// Converts `width` >= 1 pixels of a row. Pointers that the layout does not use may be null. The row
// reads the samples of its pixels and writes the pixels, nothing else. dst may overlap y as far as
// the pixels up to and with x lie on samples up to and with x only.
using yuv_to_rgb_row = void(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                            ptrdiff_t width);

// The same for two rows with the same chroma, which may be one and the same row.
using yuv_to_rgb_row_pair = void(const uint8_t *y0, const uint8_t *y1, const uint8_t *u,
                                 const uint8_t *v, uint8_t *dst0, uint8_t *dst1, ptrdiff_t width);

// Converts `width` >= 1 pixels of a row: a luma sample for each, and for the layouts half, uv and
// vu the chroma of every second pixel, the first, third and so on, width / 2 in all. u takes the
// pairs of uv and vu; pointers that the layout does not use may be null. Nothing may overlap.
using rgb_to_yuv_row = void(const uint8_t *src, uint8_t *y, uint8_t *u, uint8_t *v,
                            ptrdiff_t width);

// Repacks `width` >= 1 pixels of a row, which may not overlap.
using rgb_to_rgb_row = void(const uint8_t *src, uint8_t *dst, ptrdiff_t width);

// Interleaves and takes apart `pairs` >= 1 byte pairs: byte 2i is byte i of a, the next
// byte i of b.
using pack_row = void(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t pairs);
using unpack_row = void(const uint8_t *src, uint8_t *a, uint8_t *b, ptrdiff_t pairs);

// Moves the first `rows` rows, 1 to 32, of a tile, 64 bytes each and 64 bytes apart, from or to
// linear rows. Tiled chroma is taken apart into, or interleaved from, rows of 32 bytes.
using detile_rows = void(const uint8_t *tile, uint8_t *dst, ptrdiff_t stride, ptrdiff_t rows);
using entile_rows = void(const uint8_t *src, ptrdiff_t stride, uint8_t *tile, ptrdiff_t rows);
using detile_unpack_rows = void(const uint8_t *tile, uint8_t *a, ptrdiff_t stride_a, uint8_t *b,
                                ptrdiff_t stride_b, ptrdiff_t rows);
using entile_pack_rows = void(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b,
                              ptrdiff_t stride_b, uint8_t *tile, ptrdiff_t rows);

// Converts `rows` rows of 64 pixels: row r from row r of the luma tile and row r / 2 of the chroma
// tile, byte pairs U V.
using tile_to_rgb_rows = void(const uint8_t *luma, const uint8_t *chroma, uint8_t *dst,
                              ptrdiff_t stride, ptrdiff_t rows);

// Repeats the four bytes of value, lowest first, over `size` bytes, a multiple of 32.
using fill_row = void(uint8_t *dst, uint32_t value, size_t size);

// The first x from 0 to count - 1 with p[x] = p[x + 1] = 0 and (p[x + 2] & mask) = code, else
// count. Reads p[0 .. count + 1].
using find_code_row = ptrdiff_t(const uint8_t *p, ptrdiff_t count, uint8_t mask, uint8_t code);

// Dithers row `cur` of a plane, between its rows above and below, and makes `below` of the row that
// lies there in the source. `width` >= 5 samples a row; `src` shares no memory with the others.
using dither_row = void(const uint8_t *src, const uint8_t *above, uint8_t *cur, uint8_t *below,
                        ptrdiff_t width);

struct rows {
    // yuv2rgb: null where no kernel needs the row.
    yuv_to_rgb_row *yuv_to_rgb[size_t(yuv_layout::count)][size_t(rgb_packing::count)];
    yuv_to_rgb_row_pair *yuv_to_rgb_pair[size_t(yuv_layout::count)][size_t(rgb_packing::count)];
    yuv_to_rgb_row_pair *vu_to_rgb565_coarse_pair;  // with the coefficients of 6 fractional bits

    dither_row *dither;  // dither
    pack_row *pack;      // layout
    unpack_row *unpack;  // layout

    // tile
    detile_rows *detile;
    entile_rows *entile;
    detile_unpack_rows *detile_unpack;
    entile_pack_rows *entile_pack;
    tile_to_rgb_rows *tile_to_rgb565, *tile_to_bgra8888;

    fill_row *fill;            // mem
    find_code_row *find_code;  // keyframe

    yuv_to_rgb_row *&yuv_to_rgb_slot(yuv_layout layout, rgb_packing packing) {
        return yuv_to_rgb[size_t(layout)][size_t(packing)];
    }
    yuv_to_rgb_row_pair *&yuv_to_rgb_pair_slot(yuv_layout layout, rgb_packing packing) {
        return yuv_to_rgb_pair[size_t(layout)][size_t(packing)];
    }

    // rgb2yuv: null where the library has no such conversion.
    rgb_to_yuv_row *rgb_to_yuv[size_t(rgb_packing::count)][size_t(yuv_layout::count)];
    rgb_to_rgb_row *rgb_to_rgb565[size_t(rgb_packing::count)];

    rgb_to_yuv_row *&rgb_to_yuv_slot(rgb_packing packing, yuv_layout layout) {
        return rgb_to_yuv[size_t(packing)][size_t(layout)];
    }
};

}  // namespace simgp

// The rows from YUV to RGB that kernels need: X(layout, packing). Scalar and vector tables are
// filled from these lists. Formats whose chroma serves two rows take pairs of rows.
// clang-format off
#define SIMGP_YUV_TO_RGB_ROWS(X)                                                            \
    X(grey, rgb565)                                                                         \
    X(half, rgb565) X(half, bgr565)                                                         \
    X(full, rgb565) X(full, bgr565)                                                         \
    X(uyvy, rgb565) X(uyvy, bgr565) X(uyvy, rgb888) X(uyvy, bgr888)                         \
    X(uyvy, rgba8888) X(uyvy, bgra8888) X(uyvy, argb8888)                                   \
    X(yuyv, rgb565) X(yuyv, rgb888)
#define SIMGP_YUV_TO_RGB_PAIRS(X)                                                           \
    X(half, rgb565) X(half, bgr565) X(half, rgb888) X(half, bgr888)                         \
    X(half, rgba8888) X(half, bgra8888) X(half, argb8888)                                   \
    X(full, rgb565) X(full, bgr565)                                                         \
    X(uv, rgb565) X(uv, bgr565) X(uv, rgb888) X(uv, bgra8888)                               \
    X(vu, bgr565) X(vu, rgb888)

// The rows from RGB to YUV, X(packing, layout), and to RGB565, X(packing).
#define SIMGP_RGB_TO_YUV_ROWS(X)                                                            \
    X(rgb888, grey) X(rgb888, half) X(rgb888, uv) X(rgb888, vu)                             \
    X(bgr888, grey) X(bgr888, half)                                                         \
    X(rgb565, grey) X(rgb565, half) X(rgb565, uv) X(rgb565, vu)
#define SIMGP_RGB_TO_RGB565_ROWS(X) X(rgb888) X(rgba8888)
// clang-format on

#endif
