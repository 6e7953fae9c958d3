// YUV to RGB: the scalar rows, which define the results, and the kernels.
#include "simgp/yuv2rgb.h"

#include <type_traits>

#include "simd/choose.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

// A matrix with S fractional bits; the rounding constant is a half.
//   R = (L (Y - 16) + KR Vc + half) >> S             Uc = U - 128, Vc = V - 128
//   G = (L (Y - 16) - KGU Uc - KGV Vc + half) >> S
//   B = (L (Y - 16) + KB Uc + half) >> S, each clamped to 0 ... 255
template <int L, int KR, int KGU, int KGV, int KB, int S>
struct matrix {
    static constexpr int clamp(int v) { return v < 0 ? 0 : v > 255 ? 255 : v; }
    static constexpr int red(int y, int, int v) {
        return clamp((L * (y - 16) + KR * (v - 128) + (1 << (S - 1))) >> S);
    }
    static constexpr int green(int y, int u, int v) {
        return clamp((L * (y - 16) - KGU * (u - 128) - KGV * (v - 128) + (1 << (S - 1))) >> S);
    }
    static constexpr int blue(int y, int u, int) {
        return clamp((L * (y - 16) + KB * (u - 128) + (1 << (S - 1))) >> S);
    }
};
using bt601 = matrix<298, 409, 100, 208, 516, 8>;      // ITU-R BT.601, limited range
using bt601_coarse = matrix<75, 102, 25, 52, 129, 6>;  // the same divided by 4, rounded

// Grey has no matrix.
struct grey_matrix {
    static constexpr int red(int y, int, int) { return y; }
    static constexpr int green(int y, int, int) { return y; }
    static constexpr int blue(int y, int, int) { return y; }
};

// Sources: the samples of pixel x of a row of `width` pixels.
struct samples {
    const uint8_t *y, *u, *v;
    ptrdiff_t width;
};
struct yuv {
    int y, u, v;
};
// Packed 4:2:2: byte y0 of a group is its first luma, the second lies two bytes on; then U and V.
// Of a group with a single pixel V lies outside the row: the group before lends its own.
yuv read_packed(const samples &s, ptrdiff_t x, int y0, int u, int v) {
    const uint8_t *group = s.y + (x >> 1) * 4;
    const bool whole = (x | 1) < s.width;
    return {group[y0 + 2 * (x & 1)], group[u], whole ? group[v] : x ? group[v - 4] : 128};
}
template <yuv_layout Layout>
yuv read(const samples &s, ptrdiff_t x) {
    const ptrdiff_t pair = x >> 1;
    switch (Layout) {
        case yuv_layout::grey:
            return {s.y[x], 128, 128};
        case yuv_layout::half:
            return {s.y[x], s.u[pair], s.v[pair]};
        case yuv_layout::full:
            return {s.y[x], s.u[x], s.v[x]};
        case yuv_layout::uv:
            return {s.y[x], s.u[2 * pair], s.u[2 * pair + 1]};
        case yuv_layout::vu:
            return {s.y[x], s.u[2 * pair + 1], s.u[2 * pair]};
        case yuv_layout::uyvy:
            return read_packed(s, x, 1, 0, 2);
        case yuv_layout::yuyv:
            return read_packed(s, x, 0, 1, 3);
        default:
            __builtin_unreachable();
    }
}

// Packers: pixel x of the row at dst.
constexpr bool is_565(rgb_packing p) {
    return p == rgb_packing::rgb565 || p == rgb_packing::bgr565;
}

template <rgb_packing Packing>
void write(uint8_t *dst, ptrdiff_t x, int r, int g, int b) {
    if constexpr (is_565(Packing)) {
        if (Packing == rgb_packing::bgr565) {
            const int t = r;
            r = b, b = t;
        }
        const int word = (r & 0xF8) << 8 | (g & 0xFC) << 3 | b >> 3;
        dst[2 * x] = uint8_t(word);
        dst[2 * x + 1] = uint8_t(word >> 8);
    } else {
        const auto put = [&](int size, int k0, int k1, int k2, int k3) {
            const int k[4] = {k0, k1, k2, k3};
            for (int i = 0; i < size; i++) dst[size * x + i] = uint8_t(k[i]);
        };
        switch (Packing) {
            case rgb_packing::rgb888:
                return put(3, r, g, b, 0);
            case rgb_packing::bgr888:
                return put(3, b, g, r, 0);
            case rgb_packing::rgba8888:
                return put(4, r, g, b, 255);
            case rgb_packing::bgra8888:
                return put(4, b, g, r, 255);
            case rgb_packing::argb8888:
                return put(4, 255, r, g, b);
            default:
                __builtin_unreachable();
        }
    }
}

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
void row(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst, ptrdiff_t width) {
    const samples s{y, u, v, width};
    for (ptrdiff_t x = 0; x < width; x++) {
        const yuv p = read<Layout>(s, x);
        write<Packing>(dst, x, Matrix::red(p.y, p.u, p.v), Matrix::green(p.y, p.u, p.v),
                       Matrix::blue(p.y, p.u, p.v));
    }
}

template <yuv_layout Layout, class Matrix, rgb_packing Packing>
void row_pair(const uint8_t *y0, const uint8_t *y1, const uint8_t *u, const uint8_t *v,
              uint8_t *dst0, uint8_t *dst1, ptrdiff_t width) {
    row<Layout, Matrix, Packing>(y0, u, v, dst0, width);
    row<Layout, Matrix, Packing>(y1, u, v, dst1, width);
}

template <yuv_layout Layout, rgb_packing Packing>
constexpr yuv_to_rgb_row *row_of =
    row<Layout, std::conditional_t<Layout == yuv_layout::grey, grey_matrix, bt601>, Packing>;

}  // namespace

void fill_yuv2rgb(rows &t) {
#define FILL(layout, packing)                                     \
    t.yuv_to_rgb_slot(yuv_layout::layout, rgb_packing::packing) = \
        row_of<yuv_layout::layout, rgb_packing::packing>;
    SIMGP_YUV_TO_RGB_ROWS(FILL)
#undef FILL
#define FILL(layout, packing)                                          \
    t.yuv_to_rgb_pair_slot(yuv_layout::layout, rgb_packing::packing) = \
        row_pair<yuv_layout::layout, bt601, rgb_packing::packing>;
    SIMGP_YUV_TO_RGB_PAIRS(FILL)
#undef FILL
    t.vu_to_rgb565_coarse_pair = row_pair<yuv_layout::vu, bt601_coarse, rgb_packing::rgb565>;
}

}  // namespace scalar

namespace {

void convert(const csc_args &a, const yuv_planes &planes, rgb_packing packing, int lead = 0) {
    walk_yuv_to_rgb(a, src_lines(a, 0), planes, live_rows(), packing, lead);
}

}  // namespace
}  // namespace simgp

using namespace simgp;

// clang-format off
#define KERNEL(from, to)      SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, convert(args, planes_##from, rgb_packing::to))
#define LEAD_KERNEL(from, to) SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, convert(args, planes_##from, rgb_packing::to, first_line_alone(args)))

KERNEL(yuv400, rgb565)
LEAD_KERNEL(yuv420, rgb565)
KERNEL(yuv420, bgr565)
KERNEL(yuv420, rgb888)
KERNEL(yuv420, bgr888)
LEAD_KERNEL(yuv420, rgba8888)
LEAD_KERNEL(yuv420, bgra8888)
LEAD_KERNEL(yuv420, argb8888)
LEAD_KERNEL(yv12, rgb565)
KERNEL(yv12, bgr565)
KERNEL(yv12, rgb888)
KERNEL(yuv422n, rgb565)
KERNEL(yuv422n, bgr565)
KERNEL(yuv422w, rgb565)
KERNEL(yuv422w, bgr565)
KERNEL(yuv444, rgb565)
KERNEL(yuv444, bgr565)
KERNEL(nv12, rgb565)
KERNEL(nv12, bgr565)
KERNEL(nv12, rgb888)
KERNEL(nv21, bgr565)
KERNEL(nv21, rgb888)
SIMGP_CSC_KERNEL(simgp_csc_nv21_to_rgb565, walk_yuv_to_rgb(args, src_lines(args, 0), planes_nv21, live_rows().vu_to_rgb565_coarse_pair, 0))
#undef KERNEL
#undef LEAD_KERNEL
// clang-format on
