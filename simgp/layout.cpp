// Conversions between layouts of YUV: the scalar rows, which define the results, and the kernels.
#include "simgp/layout.h"

#include "rows/choose.h"
#include "rows/conversions.h"
#include "simgp/copy.h"
#include "simgp/kernel.h"

namespace simgp {
namespace scalar {
namespace {

void pack(const uint8_t *a, ptrdiff_t stride_a, const uint8_t *b, ptrdiff_t stride_b, uint8_t *dst,
          ptrdiff_t dst_stride, ptrdiff_t pairs, ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        for (ptrdiff_t i = 0; i < pairs; i++) {
            dst[y * dst_stride + 2 * i] = a[y * stride_a + i];
            dst[y * dst_stride + 2 * i + 1] = b[y * stride_b + i];
        }
}

void unpack(const uint8_t *src, ptrdiff_t src_stride, uint8_t *a, ptrdiff_t stride_a, uint8_t *b,
            ptrdiff_t stride_b, ptrdiff_t pairs, ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        for (ptrdiff_t i = 0; i < pairs; i++) {
            a[y * stride_a + i] = src[y * src_stride + 2 * i];
            b[y * stride_b + i] = src[y * src_stride + 2 * i + 1];
        }
}

void copy(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
          ptrdiff_t size, ptrdiff_t height) {
    for (ptrdiff_t y = 0; y < height; y++)
        memcpy(dst + y * dst_stride, src + y * src_stride, size_t(size));
}

}  // namespace

void fill_layout(layout_rows &t) {
    t.pack = pack;
    t.unpack = unpack;
    t.copy = copy;
}

}  // namespace scalar

namespace {

// Rows without gaps in all three planes are one.
void join_rows(ptrdiff_t &pairs, ptrdiff_t &height, ptrdiff_t stride_a, ptrdiff_t stride_b,
               ptrdiff_t stride_pairs) {
    if (stride_a != pairs || stride_b != pairs || stride_pairs != 2 * pairs) return;
    pairs *= height;
    height = 1;
}

void pack_plane(const const_lines &a, const const_lines &b, const lines &dst, ptrdiff_t pairs,
                ptrdiff_t height) {
    if (pairs < 1 || height < 1) return;
    join_rows(pairs, height, a.stride, b.stride, dst.stride);
    live_rows(2 * pairs).layout.pack(a.first, a.stride, b.first, b.stride, dst.first, dst.stride,
                                     pairs, height);
}

// `bytes` of a source row; the last of an odd number belongs to a.
void unpack_plane(const const_lines &src, const lines &a, const lines &b, ptrdiff_t bytes,
                  ptrdiff_t height) {
    if (bytes < 1 || height < 1) return;
    ptrdiff_t pairs = bytes / 2;
    if (bytes % 2 && height > 1 && !lie_apart(a, pairs + 1)) {
        for (ptrdiff_t y = 0; y < height; y++)
            unpack_plane(src.from(0, y), a.from(0, y), b.from(0, y), bytes, 1);
        return;
    }
    if (bytes % 2 == 0) join_rows(pairs, height, a.stride, b.stride, src.stride);
    if (pairs > 0)
        live_rows(2 * pairs).layout.unpack(src.first, src.stride, a.first, a.stride, b.first,
                                           b.stride, pairs, height);
    if (bytes % 2) copy_lines(src.from(2 * pairs, 0), a.from(pairs, 0), 1, height);
}

void keep_every_second_row(const plane_args &a) {
    copy_lines({a.src.first, 2 * a.src.stride}, a.dst, a.width, a.height / 2);
}

void repeat_rows(const plane_args &a) {
    if (a.width < 1) return;
    for (ptrdiff_t y = 0; y < a.height; y++)
        for (ptrdiff_t twice = 0; twice < 2; twice++)
            memcpy(a.dst.line(2 * y + twice), a.src.line(y), size_t(a.width));
}

// Luma is copied. Chroma is moved between planes, or pairs and planes, the heights of which may
// differ by a factor of two.
template <const format &From, const format &To>
void between_layouts(const csc_args &a) {
    const auto move = [&](simgp_plane_fn *kernel, int from, int to) {
        kernel(a.src_planes[from], a.src_widths[from], a.src_heights[from], a.src_strides[from],
               a.dst_strides[to], a.dst_planes[to]);
    };
    move(simgp_cpy_8b, 0, 0);
    constexpr bool from_pairs = From.u == From.v, to_pairs = To.u == To.v;
    constexpr int from_shift = From.y_shift[1], to_shift = To.y_shift[1];
    if constexpr (from_pairs) {
        static_assert(!to_pairs && from_shift == to_shift);
        constexpr bool u_first = From.layout == yuv_layout::uv;
        unpack_plane(src_lines(a, From.u), dst_lines(a, u_first ? To.u : To.v),
                     dst_lines(a, u_first ? To.v : To.u), 2 * ptrdiff_t(a.src_widths[From.u]),
                     a.src_heights[From.u]);
    } else if constexpr (to_pairs) {
        static_assert(from_shift == to_shift);
        constexpr bool u_first = To.layout == yuv_layout::uv;
        pack_plane(src_lines(a, u_first ? From.u : From.v), src_lines(a, u_first ? From.v : From.u),
                   dst_lines(a, To.u), a.src_widths[1], a.src_heights[1]);
    } else {
        simgp_plane_fn *const chroma = from_shift < to_shift   ? simgp_csc_1x2_to_1x1
                                       : from_shift > to_shift ? simgp_csc_1x1_to_1x2
                                                               : simgp_cpy_8b;
        move(chroma, 1, From.u == 1 ? To.u : To.v);
        move(chroma, 2, From.u == 2 ? To.u : To.v);
    }
}

}  // namespace
}  // namespace simgp

using namespace simgp;

SIMGP_PLANE_KERNEL(simgp_csc_1x2_to_1x1, keep_every_second_row(args))
SIMGP_PLANE_KERNEL(simgp_csc_1x1_to_1x2, repeat_rows(args))

void simgp_csc_8b8b_pck(const uint8_t *src_a, const uint8_t *src_b, int32_t width, int32_t height,
                        int32_t stride_a, int32_t stride_b, int32_t dst_stride, uint8_t *dst) {
    pack_plane({src_a, stride_a}, {src_b, stride_b}, {dst, dst_stride}, width, height);
}

void simgp_csc_8b8b_unpck(const uint8_t *src, int32_t width, int32_t height, int32_t src_stride,
                          int32_t stride_a, int32_t stride_b, uint8_t *dst_a, uint8_t *dst_b) {
    unpack_plane({src, src_stride}, {dst_a, stride_a}, {dst_b, stride_b}, width, height);
}

#define DEFINE(name, from, to) \
    SIMGP_CSC_KERNEL(name, between_layouts<formats::from, formats::to>(args))
SIMGP_LAYOUT_KERNELS(DEFINE)
#undef DEFINE
