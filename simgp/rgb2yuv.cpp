// RGB to YUV and to RGB565: the scalar rows, which define the results, and the kernels.
#include "simgp/rgb2yuv.h"

#include "simgp/pixel.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

// BT.601, limited range, with 8 fractional bits; luma is not rounded.
uint8_t luma(const rgb &p) { return uint8_t(((66 * p.r + 129 * p.g + 25 * p.b) >> 8) + 16); }
uint8_t chroma_u(const rgb &p) {
    return uint8_t(((-38 * p.r - 74 * p.g + 112 * p.b + 128) >> 8) + 128);
}
uint8_t chroma_v(const rgb &p) {
    return uint8_t(((112 * p.r - 94 * p.g - 18 * p.b + 128) >> 8) + 128);
}

template <rgb_packing Packing, yuv_layout Layout>
void yuv_row(const uint8_t *src, uint8_t *y, uint8_t *u, uint8_t *v, ptrdiff_t width) {
    for (ptrdiff_t x = 0; x < width; x++) y[x] = luma(read_rgb<Packing>(src, x));
    if (Layout == yuv_layout::grey) return;
    for (ptrdiff_t i = 0; i < width / 2; i++) {
        const rgb p = read_rgb<Packing>(src, 2 * i);
        if (Layout == yuv_layout::half) {
            u[i] = chroma_u(p);
            v[i] = chroma_v(p);
        } else {
            u[2 * i + (Layout == yuv_layout::vu)] = chroma_u(p);
            u[2 * i + (Layout == yuv_layout::uv)] = chroma_v(p);
        }
    }
}

template <rgb_packing Packing>
void rgb565_row(const uint8_t *src, uint8_t *dst, ptrdiff_t width) {
    for (ptrdiff_t x = 0; x < width; x++)
        write_rgb<rgb_packing::rgb565>(dst, x, read_rgb<Packing>(src, x));
}

template <rgb_packing Packing, yuv_layout Layout>
void fill_for(rgb2yuv_rows &t) {
    t.row[size_t(Packing)][size_t(Layout)] = yuv_row<Packing, Layout>;
    t.row[size_t(Packing)][size_t(yuv_layout::grey)] = yuv_row<Packing, yuv_layout::grey>;
}

}  // namespace

void fill_rgb2yuv(rgb2yuv_rows &t) {
#define FILL(name, from, to) fill_for<formats::from.packing, formats::to.layout>(t);
    SIMGP_RGB_TO_YUV_KERNELS(FILL)
#undef FILL
#define FILL(name, from, to) \
    t.to_rgb565[size_t(formats::from.packing)] = rgb565_row<formats::from.packing>;
    SIMGP_RGB_TO_RGB565_KERNELS(FILL)
#undef FILL
}

}  // namespace scalar

namespace {

// Even rows give luma and the chroma of their even pixels, if a row follows; the others luma.
void rgb_to_yuv(const csc_args &a, const format &from, const format &to) {
    const ptrdiff_t width = a.src_widths[0], height = a.src_heights[0];
    if (width < 1) return;
    const row_table &live = live_rows(width);
    const auto &to_layout = live.rgb2yuv.row[size_t(from.packing)];
    rgb_to_yuv_row *const with_chroma = to_layout[size_t(to.layout)];
    rgb_to_yuv_row *const luma_only = to_layout[size_t(yuv_layout::grey)];
    const int size = from.bytes[0];
    const const_lines in = whole_pixel_lines(src_lines(a, 0), size);
    const lines luma = dst_lines(a, 0), u = dst_lines(a, to.u), v = dst_lines(a, to.v);
    // The last pixel of an odd row has no chroma.
    column c = column_of(live.vector, true, width, height);
    if (!lie_apart(luma, width)) c = {};
    for (ptrdiff_t y = 0; y < height; y++) {
        const bool chroma = !(y & 1) && y + 1 < height;
        (chroma ? with_chroma : luma_only)(in.line(y), luma.line(y), u.line(y >> 1), v.line(y >> 1),
                                           width - c.width);
    }
    if (c.width == 0) return;
    convert_column(in, size, luma, 1, c, height,
                   [=](const uint8_t *src, uint8_t *y, ptrdiff_t count) {
                       luma_only(src, y, nullptr, nullptr, count);
                   });
}

void rgb_to_rgb565(const csc_args &a, const format &from, const format &to) {
    walk_one_plane(whole_pixel_lines(src_lines(a, 0), from.bytes[0]), from.bytes[0],
                   whole_pixel_lines(dst_lines(a, 0), to.bytes[0]), to.bytes[0], a.src_widths[0],
                   a.src_heights[0], [&](const row_table &live, const lines_to_repack &l) {
                       rgb_to_rgb_row *const row = live.rgb2yuv.to_rgb565[size_t(from.packing)];
                       for (ptrdiff_t y = 0; y < l.count; y++)
                           row(l.src + y * l.src_step, l.dst + y * l.dst_step, l.width);
                   });
}

}  // namespace
}  // namespace simgp

using namespace simgp;

#define DEFINE(name, from, to) SIMGP_CSC_KERNEL(name, rgb_to_yuv(args, formats::from, formats::to))
SIMGP_RGB_TO_YUV_KERNELS(DEFINE)
#undef DEFINE
#define DEFINE(name, from, to) \
    SIMGP_CSC_KERNEL(name, rgb_to_rgb565(args, formats::from, formats::to))
SIMGP_RGB_TO_RGB565_KERNELS(DEFINE)
#undef DEFINE
