// Inner loops between any two formats: with weights that are known at run time, one set of rows
// serves all matrices, and with orders of channels that are, a row serves several formats.
#ifndef ROWS_ANY_H
#define ROWS_ANY_H

#include "rows/yuv2rgb.h"

namespace simgp {

// YUV to RGB with 8 fractional bits (see simgp/csc_any.h). `luma` and all sums of chroma have at
// most one odd factor: luma is even, and so is one of green's two.
struct yuv_weights {
    int16_t luma, black, red, green_u, green_v, blue;

    // What vector rows compute with instead: factors, and what is added to the products
    // (simgp/vector/any.h). In small pictures, finding them would take as long as the pixels.
    struct {
        int16_t luma, red, green_u, green_v, blue1, blue2;
        int16_t luma_c, red_c, green_c, blue1_c, blue2_c;
    } parts;

    consteval yuv_weights(int of_luma, int of_black, int of_red, int of_green_u, int of_green_v,
                          int of_blue)
        : luma(int16_t(of_luma)),
          black(int16_t(of_black)),
          red(int16_t(of_red)),
          green_u(int16_t(of_green_u)),
          green_v(int16_t(of_green_v)),
          blue(int16_t(of_blue)),
          parts() {
        const int offset = of_black ? 3248 : 0, bias = offset + 64;
        const int of_blue1 = of_blue / 4 * 2, of_blue2 = of_blue - of_blue1;
        const auto word = [](int v) { return int16_t(v); };
        parts = {word(of_luma / 2),
                 red,
                 green_u,
                 green_v,
                 word(of_blue1 / 2),
                 word(of_blue2),
                 word(-of_luma / 2 * of_black - offset),
                 word(bias - 64 * of_red),
                 word(bias + 64 * (of_green_u + of_green_v)),
                 word(-64 * of_blue1),
                 word(bias - 64 * of_blue2)};
    }
};

// RGB to YUV with 8 fractional bits. The factors are in the order of a pixel's channels in memory,
// so they differ between RGB and BGR; of four bytes, alpha stands before or behind them.
struct rgb_weights {
    int16_t y[3], u[3], v[3];
    uint8_t black;
    bool alpha_first;
    bool mean;  // of the pixels that share chroma; else the first of them gives it
};

// How the pixels of a packing lie in memory, but for the order of their channels.
enum class pixel_kind : uint8_t {
    words,  // of 5, 6 and 5 bits; the first channel is that in the highest bits
    three,  // bytes
    four,   // bytes, alpha among them
    count
};
constexpr pixel_kind kind_of(rgb_packing packing) {
    return pixel_kind(pixels_of[size_t(packing)].size - 2);
}
constexpr bool is_blue_first(rgb_packing packing) {
    const pixel_bytes &at = pixels_of[size_t(packing)];
    return at.size == 2 ? at.b > at.r : at.b < at.r;
}
constexpr bool is_alpha_first(rgb_packing packing) { return pixels_of[size_t(packing)].a == 0; }

// The order of a pixel's channels.
struct rgb_order {
    bool blue_first, alpha_first;
};

// The matrix, and in which order there are chroma and channels, which yuv_to_rgb_rows take here.
struct yuv_to_rgb {
    yuv_weights weights;
    bool v_first;     // of byte pairs
    bool luma_first;  // of packed groups
    rgb_order pixels;
};

// Where the samples of a row lie, as far as rows differ by it.
enum class chroma_in : uint8_t {
    half,    // u and v: a sample for two pixels
    full,    // u and v: a sample per pixel
    pairs,   // u: pairs U V or V U, one for two pixels
    groups,  // y: YUYV or UYVY; a half group at the end has the V of the group before, or 128
    count
};
constexpr chroma_in chroma_in_of(yuv_layout layout) {
    switch (layout) {
        case yuv_layout::uyvy:
        case yuv_layout::yuyv:
            return chroma_in::groups;
        case yuv_layout::uv:
        case yuv_layout::vu:
            return chroma_in::pairs;
        case yuv_layout::full:
            return chroma_in::full;
        default:
            return chroma_in::half;
    }
}

// Rows of pixels, and where their samples go; from line to line, pointers move by their steps.
struct lines_to_yuv {
    const uint8_t *src;
    ptrdiff_t src_step;
    uint8_t *y;
    ptrdiff_t y_step;
    uint8_t *u;
    ptrdiff_t u_step;
    uint8_t *v;
    ptrdiff_t v_step;
    ptrdiff_t width, rows;  // at least one
    bool shared;            // a line of chroma for two rows, or the last one
};
// Converts them: luma, and the chroma of pixels 0, 2, 4, ..., (width + 1) / 2 samples, to u and v, or, if v
// is null, to u as pairs, or, if u is null, not at all. Where two rows share chroma, that of the first
// counts. With w.mean, chroma is that of the rounded means of pixels 0 and 1, 2 and 3, ... of all rows that
// share it, as far as there are. Scalar rows take any width, vector rows at least a vector, and an even
// number with chroma.
using any_to_yuv_rows = void(const rgb_weights &w, const lines_to_yuv &l);

// The chroma of `count` >= 1 pixels from planes of their channels.
using chroma_row = void(const rgb_weights &w, const uint8_t *const channels[3], uint8_t *u,
                        uint8_t *v, ptrdiff_t count);

// Takes `count` >= 1 pixels apart into planes of their channels. Those of words are widened by
// shifting alone.
using split_pixels_row = void(const uint8_t *src, uint8_t *const channels[3], ptrdiff_t count);

// What split_pixels_row reads.
enum class rgb_in : uint8_t { words, three, four, four_alpha_first, count };
constexpr rgb_in rgb_in_of(rgb_packing packing) {
    return is_alpha_first(packing) ? rgb_in::four_alpha_first : rgb_in(kind_of(packing));
}

// Writes pixels in another way: the first channel and the last one may change places, and do so where three
// bytes become three. Words lose the low bits of their channels; alpha is carried, or is 255.
struct repacking {
    bool exchange, from_alpha_first, to_alpha_first;
};
// Lines are so many bytes apart. Scalar rows take any width, vector rows at least a vector of pixels.
struct lines_to_repack {
    const uint8_t *src;
    ptrdiff_t src_step;
    uint8_t *dst;
    ptrdiff_t dst_step;
    ptrdiff_t width, count;  // pixels of a line, and lines, at least one
};
using repack_rows = void(const repacking &order, const lines_to_repack &l);

// Takes lines of packed 4:2:2 apart, bytes Y U Y V or U Y V Y: luma to y, chroma to u and v, or, if v is
// null, to u as pairs U V.
struct groups_split {
    const uint8_t *src;
    ptrdiff_t stride;
    uint8_t *y;
    ptrdiff_t y_stride;
    uint8_t *u;
    ptrdiff_t u_stride;
    uint8_t *v;
    ptrdiff_t v_stride;
    ptrdiff_t pairs, rows;  // pairs of pixels, and lines, at least one
    bool luma_first;
    bool shared;  // a line of chroma for two rows: that of the first,
    bool mean;    // or the rounded mean of both, as far as there are
};
using split_groups_rows = void(const groups_split &s);

// Puts `pairs` >= 1 pairs of pixels together.
using join_groups_row = void(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                             ptrdiff_t pairs, bool luma_first);

// `count` >= 1 samples from lines a and b: the mean of two, a[x] and b[x]. Rounded, halves up.
using mean_row = void(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t count);

// `rows` >= 1 rows of `count` >= 1 samples: the mean of four, a[2x] and a[2x + 1] and those of b, which
// may be the same line. From row to row a and b advance by `step`.
using mean_of_blocks_rows = void(const uint8_t *a, const uint8_t *b, ptrdiff_t step, uint8_t *dst,
                                 ptrdiff_t dst_step, ptrdiff_t count, ptrdiff_t rows);

// `count` >= 1 samples: every second of a, and every sample of a twice (the last may be once).
using resample_row = void(const uint8_t *a, uint8_t *dst, ptrdiff_t count);

struct any_rows {
    // By l.how; alone, and in pairs, as far as there are such pictures.
    yuv_to_rgb_rows *to_rgb[size_t(chroma_in::count)][size_t(pixel_kind::count)];
    yuv_to_rgb_rows *to_rgb_pair[size_t(chroma_in::count)][size_t(pixel_kind::count)];
    any_to_yuv_rows *to_yuv[size_t(pixel_kind::count)];
    chroma_row *chroma;
    split_pixels_row *split_pixels[size_t(rgb_in::count)];
    repack_rows *repack[size_t(pixel_kind::count)][size_t(pixel_kind::count)];
    split_groups_rows *split_groups;
    join_groups_row *join_groups;
    mean_row *mean_of_lines;
    mean_of_blocks_rows *mean_of_blocks;
    resample_row *every_second, *twice;
};

}  // namespace simgp

#endif
