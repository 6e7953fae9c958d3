// RGB to YUV rows: unpacker x matrix x writer; and RGB to RGB565 rows.
//
// The matrix fits 16-bit lanes. Luma's sum, 66 R + 129 G + 25 B, is at most 56100, unsigned. Those
// of chroma lie in -28560 ... 28560, signed; an offset of 32768 turns the final + 128 after the
// shift into a part of the sum, and the high byte of a lane is the sample.
#ifndef SIMGP_VECTOR_RGB2YUV_H
#define SIMGP_VECTOR_RGB2YUV_H

#include <string.h>

#include "rows/rgb2yuv.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

template <rgb_packing Packing>
struct unpacker {
    static constexpr pixel_bytes at = pixels_of[size_t(Packing)];
    static constexpr int size = at.size;
    static constexpr bool blue_first = size == 2 ? at.b > at.r : at.b < at.r;
    static_assert(size == 2 || (size == 3 && at.g == 1));
    static rgb_v load(const uint8_t *p) { return size == 2 ? load_565(p) : load_888(p); }
};

// BT.601, limited range, of pixels whose first channel is red, or blue.
template <bool BLUE_FIRST>
struct rgb_matrix {
    static constexpr int chroma_offset = 128 + 32768;

    static u8v luma(rgb_v p) {
        return BLUE_FIRST ? dot_high<25, 129, 66, 16>(p) : dot_high<66, 129, 25, 16>(p);
    }
    static u16v u(rgb_v p) {
        return BLUE_FIRST ? even_dot<112, -74, -38, chroma_offset>(p)
                          : even_dot<-38, -74, 112, chroma_offset>(p);
    }
    static u16v v(rgb_v p) {
        return BLUE_FIRST ? even_dot<-18, -94, 112, chroma_offset>(p)
                          : even_dot<112, -94, -18, chroma_offset>(p);
    }
};

// The planes that a row writes; one that is not there is null.
struct yuv_row_out {
    uint8_t *y, *u, *v;
};

// Less than a vector goes through the stack, by the row itself. A pixel has `size` bytes, and the
// chroma of two `chroma_size` in u (0: there is none); with one of them, v has the other.
struct yuv_row_sizes {
    int size, chroma_size;
};
[[gnu::noinline]] static void part_to_yuv(rgb_to_yuv_row *row, yuv_row_sizes of, const uint8_t *in,
                                          const yuv_row_out &out, ptrdiff_t x, int count) {
    uint8_t pixels[bytes * 3], y[bytes], u[bytes], v[bytes];
    stage_few(pixels, of.size, in + of.size * x, count, of.size);
    row(pixels, y, u, v, bytes);
    copy_few(out.y + x, y, count);
    const int chroma = count / 2;
    // A part behind whole steps is the last pixel, which has none.
    if (of.chroma_size == 0 || chroma == 0) return;
    copy_few(out.u, u, ptrdiff_t(of.chroma_size) * chroma);
    if (of.chroma_size == 1) copy_few(out.v, v, chroma);
}

// Chroma goes to plane u in samples or pairs of `chroma_size` bytes, and to plane v where there are
// samples.
template <rgb_packing Packing, yuv_layout Layout>
static void to_yuv_row(const uint8_t *src, uint8_t *y, uint8_t *u, uint8_t *v, ptrdiff_t width) {
    using from = unpacker<Packing>;
    using matrix = rgb_matrix<from::blue_first>;
    constexpr bool grey = Layout == yuv_layout::grey, planar = Layout == yuv_layout::half;
    constexpr int chroma_size = planar ? 1 : 2;
    const auto part = [&](ptrdiff_t x, int count) {
        part_to_yuv(to_yuv_row<Packing, Layout>, {from::size, grey ? 0 : chroma_size}, src,
                    {y, u, v}, x, count);
    };
    const ptrdiff_t whole = grey ? width : width & ~ptrdiff_t(1);
    if (whole < bytes) return part(0, int(width));
    const auto load = [](const uint8_t *const *p) { return from::load(p[0]); };
    if constexpr (grey)
        move_steps<2>(width, lines_in<from::size>{{src}}, lines_out<1>{{y}}, load,
                      [](uint8_t *const *q, const rgb_v &p) { store(q[0], matrix::luma(p)); });
    else
        move_steps<1, bytes / 2>(whole / 2, lines_in<2 * from::size>{{src}},
                                 lines_out<2, chroma_size, chroma_size>{{y, u, planar ? v : u}},
                                 load, [](uint8_t *const *q, const rgb_v &p) {
                                     store(q[0], matrix::luma(p));
                                     const u16v of_u = matrix::u(p), of_v = matrix::v(p);
                                     if constexpr (planar) {
                                         store_high(q[1], of_u);
                                         store_high(q[2], of_v);
                                     } else {
                                         constexpr bool uv = Layout == yuv_layout::uv;
                                         store(q[1],
                                               uv ? join_high(of_u, of_v) : join_high(of_v, of_u));
                                     }
                                 });
    if (whole < width) part(whole, 1);
}

[[gnu::noinline]] static void part_to_rgb565(rgb_to_rgb_row *row, int size, const uint8_t *in,
                                             uint8_t *out, int count) {
    uint8_t pixels[bytes * 4], words[2 * bytes];
    stage_few(pixels, size, in, count, size);
    row(pixels, words, bytes);
    copy_few(out, words, 2 * ptrdiff_t(count));
}

template <rgb_packing Packing>
static void to_rgb565_row(const uint8_t *src, uint8_t *dst, ptrdiff_t width) {
    constexpr pixel_bytes at = pixels_of[size_t(Packing)];
    static_assert(at.size >= 3 && at.r == 0 && at.g == 1 && at.b == 2);
    if (width < bytes) return part_to_rgb565(to_rgb565_row<Packing>, at.size, src, dst, int(width));
    move_steps(
        width, lines_in<at.size>{{src}}, lines_out<2>{{dst}},
        [](const uint8_t *const *p) { return p[0]; },
        [](uint8_t *const *q, const uint8_t *p) {
            if constexpr (at.size == 4)
                repack_8888_to_565(q[0], p);
            else
                repack_888_to_565(q[0], p);
        });
}

template <rgb_packing Packing, yuv_layout Layout>
static void fill_slots(rgb2yuv_rows &t) {
    t.row[size_t(Packing)][size_t(Layout)] = to_yuv_row<Packing, Layout>;
    t.row[size_t(Packing)][size_t(yuv_layout::grey)] = to_yuv_row<Packing, yuv_layout::grey>;
}

void fill_rgb2yuv(rgb2yuv_rows &t) {
#define FILL(name, from, to) fill_slots<formats::from.packing, formats::to.layout>(t);
    SIMGP_RGB_TO_YUV_KERNELS(FILL)
#undef FILL
#define FILL(name, from, to) \
    t.to_rgb565[size_t(formats::from.packing)] = to_rgb565_row<formats::from.packing>;
    SIMGP_RGB_TO_RGB565_KERNELS(FILL)
#undef FILL
}

}  // namespace simgp::SIMD_TARGET

#endif
