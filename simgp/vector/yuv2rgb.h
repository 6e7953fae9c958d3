// YUV to RGB rows: source x matrix x packer.
#ifndef SIMGP_VECTOR_YUV2RGB_H
#define SIMGP_VECTOR_YUV2RGB_H

#include "rows/yuv2rgb.h"
#include "simgp/vector/matrix.h"
#include "simgp/vector/packer.h"
#include "simgp/vector/source.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
static void to_rgb_row(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                       ptrdiff_t width);
template <yuv_layout Layout, class Matrix, rgb_packing Packing>
static void to_rgb_row_pair(const uint8_t *y0, const uint8_t *y1, const uint8_t *u,
                            const uint8_t *v, uint8_t *dst0, uint8_t *dst1, ptrdiff_t width);

// Less than a vector goes through the stack, by the row for one, whose pixels have `size` bytes: a copy of
// this for every row would be a third of all their code.
template <class Source>
[[gnu::noinline]] static void part_through_stack(yuv_to_rgb_row *row, int size, const samples &in,
                                                 uint8_t *out, ptrdiff_t x, int count) {
    staged to;
    uint8_t pixels[bytes * 4];
    const samples s = Source::stage(to, in, x, count);
    row(s.y, s.u, s.v, pixels, bytes);
    copy_few(out + x * size, pixels, ptrdiff_t(size) * count);
}

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
struct yuv_step : source<Layout> {
    using from = source<Layout>;
    using to = packer<Packing>;
    static constexpr int size = to::size;

    static auto load(const samples &in, ptrdiff_t x) {
        return from::template load<to::order>(in, x);
    }
    static auto terms(const yuv_half &p) { return Matrix::template chroma<from::pairs>(p.pairs); }
    static auto terms(const yuv_full &p) {
        return chroma_terms_full{Matrix::template chroma<from::pairs>(p.pairs_even),
                                 Matrix::template chroma<from::pairs>(p.pairs_odd)};
    }
    static void apply(uint8_t *out, ptrdiff_t x, pairs_v y, const chroma_terms &c) {
        to::store(out + x * size, Matrix::apply(Matrix::luma_even(y), c),
                  Matrix::apply(Matrix::luma_odd(y), c));
    }
    static void apply(uint8_t *out, ptrdiff_t x, pairs_v y, const chroma_terms_full &c) {
        to::store(out + x * size, Matrix::apply(Matrix::luma_even(y), c.even),
                  Matrix::apply(Matrix::luma_odd(y), c.odd));
    }
    static void write(uint8_t *out, ptrdiff_t x, const yuv_half &p) {
        apply(out, x, p.y, terms(p));
    }
    // In this order, since the terms of even and odd pixels together would not fit 16 registers. A call
    // in the loop, which -O2 would make of so much, takes twice the time.
    [[gnu::always_inline]] static void write(uint8_t *out, ptrdiff_t x, const yuv_full &p) {
        const auto even = Matrix::apply(Matrix::luma_even(p.y),
                                        Matrix::template chroma<from::pairs>(p.pairs_even));
        const auto odd =
            Matrix::apply(Matrix::luma_odd(p.y), Matrix::template chroma<from::pairs>(p.pairs_odd));
        to::store(out + x * size, even, odd);
    }
    static void part(const samples &in, uint8_t *out, ptrdiff_t x, int count) {
        part_through_stack<from>(to_rgb_row<Layout, Matrix, Packing>, size, in, out, x, count);
    }
    static constexpr yuv_to_rgb_row_pair *row_pair = to_rgb_row_pair<Layout, Matrix, Packing>;
};

// Two rows with the same chroma, whose terms are computed once.
struct samples_pair {
    samples first;
    const uint8_t *second_y;
};
struct out_pair {
    uint8_t *first, *second;
};
template <class Source>
[[gnu::noinline]] static void part_through_stack(yuv_to_rgb_row_pair *rows, int size,
                                                 const samples_pair &in, const out_pair &out,
                                                 ptrdiff_t x, int count) {
    staged to;
    uint8_t second_y[bytes], pixels[2][bytes * 4];
    const samples s = Source::stage(to, in.first, x, count);
    stage_few(second_y, 1, in.second_y + x, count, 1);
    rows(s.y, second_y, s.u, s.v, pixels[0], pixels[1], bytes);
    copy_few(out.first + x * size, pixels[0], ptrdiff_t(size) * count);
    copy_few(out.second + x * size, pixels[1], ptrdiff_t(size) * count);
}
template <class Step>
struct pair_step : Step {
    template <class Pixels>
    struct pixels_pair {
        Pixels first;
        pairs_v second_y;
    };

    static auto load(const samples_pair &in, ptrdiff_t x) {
        return pixels_pair<decltype(Step::load(in.first, x))>{
            Step::load(in.first, x), load_luma<Step::to::order>(in.second_y, x)};
    }
    template <class Pixels>
    static void write(const out_pair &out, ptrdiff_t x, const Pixels &p) {
        const auto terms = Step::terms(p.first);
        Step::apply(out.first, x, p.first.y, terms);
        Step::apply(out.second, x, p.second_y, terms);
    }
    static void part(const samples_pair &in, const out_pair &out, ptrdiff_t x, int count) {
        part_through_stack<typename Step::from>(Step::row_pair, Step::size, in, out, x, count);
    }
};

// Grey has no matrix: R = G = B = Y, and the bytes of a word are bits of Y, 4...2 and 7...3 in the
// low one, 7...3 and 7...5 in the high one.
template <rgb_packing Packing>
struct yuv_step<yuv_layout::grey, bt601, Packing> {
    static constexpr bool pixels_in_pairs = false;
    static constexpr int size = 2;

    static u8v load(const samples &in, ptrdiff_t x) {
        return arrange<pixel_order::by8>(SIMD_TARGET::load(in.y + x));
    }
    static samples stage(staged &to, const samples &in, ptrdiff_t x, int count) {
        stage_few(to.y, 1, in.y + x, count, 1);
        return {to.y, to.y, to.y};
    }
    static void write(uint8_t *out, ptrdiff_t x, u8v y) {
        const auto bits = [](u16v v, uint8_t mask) { return bit_and(as_u8(v), set_u8(mask)); };
        const u16v w = as_u16(y);
        store_zip8(out + x * size, bit_or(bits(shl<3>(w), 0xE0), bits(shr<3>(w), 0x1F)),
                   bit_or(bits(w, 0xF8), bits(shr<5>(w), 0x07)));
    }
    static void part(const samples &in, uint8_t *out, ptrdiff_t x, int count) {
        part_through_stack<yuv_step>(to_rgb_row<yuv_layout::grey, bt601, Packing>, size, in, out, x,
                                     count);
    }
};

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
static void to_rgb_row(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                       ptrdiff_t width) {
    row_of_steps<yuv_step<Layout, Matrix, Packing>>(samples{y, u, v}, dst, width);
}

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
static void to_rgb_row_pair(const uint8_t *y0, const uint8_t *y1, const uint8_t *u,
                            const uint8_t *v, uint8_t *dst0, uint8_t *dst1, ptrdiff_t width) {
    row_of_steps<pair_step<yuv_step<Layout, Matrix, Packing>>>(samples_pair{{y0, u, v}, y1},
                                                               out_pair{dst0, dst1}, width);
}

template <yuv_layout Layout, bool TwoRows, rgb_packing Packing, yuv_matrix Matrix>
static void fill_slot(yuv2rgb_rows &t) {
    using matrix = matrix_named<Matrix>;
    constexpr size_t m = size_t(Matrix), l = size_t(Layout), p = size_t(Packing);
    if constexpr (TwoRows)
        t.pair[m][l][p] = to_rgb_row_pair<Layout, matrix, Packing>;
    else
        t.row[m][l][p] = to_rgb_row<Layout, matrix, Packing>;
}

void fill_yuv2rgb(yuv2rgb_rows &t) {
#define FILL(name, from, to, rule)                                                       \
    fill_slot<formats::from.layout, serves_two_rows(formats::from), formats::to.packing, \
              matrix_of(yuv_rule::rule)>(t);
    SIMGP_YUV_TO_RGB_KERNELS(FILL)
    SIMGP_PACKED_TO_RGB_KERNELS(FILL)
#undef FILL
}

}  // namespace simgp::SIMD_TARGET

#endif
