// YUV to RGB rows: source x matrix x packer.
#ifndef SIMGP_VECTOR_YUV2RGB_H
#define SIMGP_VECTOR_YUV2RGB_H

#include "simgp/rows.h"
#include "simgp/vector/matrix.h"
#include "simgp/vector/packer.h"
#include "simgp/vector/source.h"
#include "simgp/vector/steps.h"

namespace simgp::SIMD_TARGET {

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
struct yuv_step : source<Layout> {
    using from = source<Layout>;
    using to = packer<Packing>;
    static constexpr int size = to::size;

    static auto load(const samples &s, ptrdiff_t x) { return from::template load<to::order>(s, x); }
    static void convert(uint8_t *dst, const yuv_half &p) {
        const chroma_terms c = Matrix::template chroma<from::pairs>(p.pairs);
        to::store(dst, Matrix::apply(Matrix::luma_even(p.y), c),
                  Matrix::apply(Matrix::luma_odd(p.y), c));
    }
    static void convert(uint8_t *dst, const yuv_full &p) {
        const chroma_terms even = Matrix::template chroma<from::pairs>(p.pairs_even);
        const chroma_terms odd = Matrix::template chroma<from::pairs>(p.pairs_odd);
        to::store(dst, Matrix::apply(Matrix::luma_even(p.y), even),
                  Matrix::apply(Matrix::luma_odd(p.y), odd));
    }
};

// Grey has no matrix: R = G = B = Y, and the bytes of a word are bits of Y, 4...2 and 7...3 in the
// low one, 7...3 and 7...5 in the high one.
template <rgb_packing Packing>
struct yuv_step<yuv_layout::grey, bt601, Packing> {
    static constexpr bool pixels_in_pairs = false;
    static constexpr int size = 2;

    static u8v load(const samples &s, ptrdiff_t x) {
        return natural_to_by8(SIMD_TARGET::load(s.y + x));
    }
    static void stage(staged &to, const samples &s, ptrdiff_t x, int count) {
        memcpy(to.y, s.y + x, size_t(count));
    }
    static void convert(uint8_t *dst, u8v y) {
        const auto bits = [](u16v v, uint8_t mask) { return bit_and(as_u8(v), set_u8(mask)); };
        const u16v w = as_u16(y);
        store_zip8(dst, bit_or(bits(shl<3>(w), 0xE0), bits(shr<3>(w), 0x1F)),
                   bit_or(bits(w, 0xF8), bits(shr<5>(w), 0x07)));
    }
};

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
void yuv_row(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst, ptrdiff_t width) {
    row_of_steps<yuv_step<Layout, Matrix, Packing>>({y, u, v}, dst, width);
}

void fill_yuv2rgb(rows &t) {
#define FILL(layout, packing)                                     \
    t.yuv_to_rgb_slot(yuv_layout::layout, rgb_packing::packing) = \
        yuv_row<yuv_layout::layout, bt601, rgb_packing::packing>;
    SIMGP_YUV_TO_RGB_ROWS(FILL)
#undef FILL
    t.vu_to_rgb565_coarse = yuv_row<yuv_layout::vu, bt601_coarse, rgb_packing::rgb565>;
}

}  // namespace simgp::SIMD_TARGET

#endif
