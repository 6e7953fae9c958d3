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
struct yuv_step : source<Layout> {
    using from = source<Layout>;
    using to = packer<Packing>;
    static constexpr int size = to::size, pixels = bytes;
    static constexpr bool is_full = Layout == yuv_layout::full;

    static auto load(const line_to_rgb &l, ptrdiff_t x) {
        return from::template load<to::order>(samples{l.y[0], l.u, l.v}, x);
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
    static void write(const line_to_rgb &l, ptrdiff_t x, const yuv_half &p) {
        apply(l.dst[0], x, p.y, terms(p));
    }
    // In this order, since the terms of even and odd pixels together would not fit 16 registers. A call
    // in the loop, which -O2 would make of so much, takes twice the time.
    [[gnu::always_inline]] static void write(const line_to_rgb &l, ptrdiff_t x, const yuv_full &p) {
        const auto even = Matrix::apply(Matrix::luma_even(p.y),
                                        Matrix::template chroma<from::pairs>(p.pairs_even));
        const auto odd =
            Matrix::apply(Matrix::luma_odd(p.y), Matrix::template chroma<from::pairs>(p.pairs_odd));
        to::store(l.dst[0] + x * size, even, odd);
    }
    // Half a vector of pixels of each of two rows.
    static void write_halves(const line_to_rgb &l, ptrdiff_t x, const yuv_half &p) {
        const chroma_terms c = terms(p);
        to::store(l.dst[0] + x * size, l.dst[1] + x * size,
                  Matrix::apply(Matrix::luma_even(p.y), c),
                  Matrix::apply(Matrix::luma_odd(p.y), c));
    }
};

// Two rows with the same chroma, whose terms are computed once.
template <class Step>
struct pair_step : Step {
    template <class Pixels>
    struct pixels_pair {
        Pixels first;
        pairs_v second_y;
    };

    static auto load(const line_to_rgb &l, ptrdiff_t x) {
        return pixels_pair<decltype(Step::load(l, x))>{Step::load(l, x),
                                                       load_luma<Step::to::order>(l.y[1], x)};
    }
    template <class Pixels>
    static void write(const line_to_rgb &l, ptrdiff_t x, const Pixels &p) {
        const auto terms = Step::terms(p.first);
        Step::apply(l.dst[0], x, p.first.y, terms);
        Step::apply(l.dst[1], x, p.second_y, terms);
    }
};

// The same of rows that are shorter than a vector, each in a half of it.
template <class Step>
struct halves_step {
    static constexpr int pixels = bytes / 2;
    static auto load(const line_to_rgb &l, ptrdiff_t x) {
        return Step::from::template load_halves<Step::to::order>(l, x);
    }
    static void write(const line_to_rgb &l, ptrdiff_t x, const yuv_half &p) {
        Step::write_halves(l, x, p);
    }
};

// Grey has no matrix: R = G = B = Y, and the bytes of a word are bits of Y, 4...2 and 7...3 in the
// low one, 7...3 and 7...5 in the high one.
template <rgb_packing Packing>
struct yuv_step<yuv_layout::grey, bt601, Packing> {
    static constexpr int size = 2, pixels = bytes;

    static u8v load(const line_to_rgb &l, ptrdiff_t x) {
        return arrange<pixel_order::by8>(SIMD_TARGET::load(l.y[0] + x));
    }
    static void write(const line_to_rgb &l, ptrdiff_t x, u8v y) {
        const auto bits = [](u16v v, uint8_t mask) { return bit_and(as_u8(v), set_u8(mask)); };
        const u16v w = as_u16(y);
        store_zip8(l.dst[0] + x * size, bit_or(bits(shl<3>(w), 0xE0), bits(shr<3>(w), 0x1F)),
                   bit_or(bits(w, 0xF8), bits(shr<5>(w), 0x07)));
    }
};

template <class Step>
static void rows_by_steps(const lines_to_rgb &lines) {
    const ptrdiff_t width = lines.width;
    for_each_line(lines, [&](const line_to_rgb &l) {
        whole_steps_ahead<Step::pixels>(
            width, [&](ptrdiff_t x) { return Step::load(l, x); },
            [&](ptrdiff_t x, const auto &pixels) { Step::write(l, x, pixels); });
    });
}
template <class Step>
static void pairs_by_steps(const lines_to_rgb &l) {
    if constexpr (pairs_in_halves && !Step::is_full)
        if (l.width < bytes) return rows_by_steps<halves_step<Step>>(l);
    rows_by_steps<pair_step<Step>>(l);
}

template <yuv_layout Layout, bool TwoRows, rgb_packing Packing, yuv_matrix Matrix>
static void fill_slot(yuv2rgb_rows &t) {
    using matrix = matrix_named<Matrix>;
    constexpr size_t m = size_t(Matrix), l = size_t(Layout), p = size_t(Packing);
    using step = yuv_step<Layout, matrix, Packing>;
    if constexpr (TwoRows)
        t.pair[m][l][p] = pairs_by_steps<step>;
    else
        t.row[m][l][p] = rows_by_steps<step>;
}

void fill_yuv2rgb(yuv2rgb_rows &t) {
#define FILL(name, from, to, rule)                                                       \
    fill_slot<formats::from.layout, serves_two_rows(formats::from), formats::to.packing, \
              matrix_of(yuv_rule::rule)>(t);
    SIMGP_YUV_TO_RGB_KERNELS(FILL)
    SIMGP_PACKED_TO_RGB_KERNELS(FILL)
#undef FILL
    t.halves = pairs_in_halves;
}

}  // namespace simgp::SIMD_TARGET

#endif
