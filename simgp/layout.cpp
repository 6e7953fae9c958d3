// Conversions between layouts of YUV: the scalar rows, which define the results, and the kernels.
#include "simgp/layout.h"

#include "simd/choose.h"
#include "simgp/copy.h"
#include "simgp/planes.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

void pack(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t pairs) {
    for (ptrdiff_t i = 0; i < pairs; i++) {
        dst[2 * i] = a[i];
        dst[2 * i + 1] = b[i];
    }
}

void unpack(const uint8_t *src, uint8_t *a, uint8_t *b, ptrdiff_t pairs) {
    for (ptrdiff_t i = 0; i < pairs; i++) {
        a[i] = src[2 * i];
        b[i] = src[2 * i + 1];
    }
}

}  // namespace

void fill_layout(rows &t) {
    t.pack = pack;
    t.unpack = unpack;
}

}  // namespace scalar

namespace {

// The lines of a plane that is only read.
struct source_lines {
    const uint8_t *first;
    ptrdiff_t stride;

    source_lines(const uint8_t *plane, ptrdiff_t bytes) : first(plane), stride(bytes) {}
    source_lines(const plane_lines &p) : first(p.first), stride(p.stride) {}
    const uint8_t *line(ptrdiff_t y) const { return first + y * stride; }
};

// Rows without gaps in all three planes are one.
void join_rows(ptrdiff_t &pairs, ptrdiff_t &height, ptrdiff_t stride_a, ptrdiff_t stride_b,
               ptrdiff_t stride_pairs) {
    if (stride_a != pairs || stride_b != pairs || stride_pairs != 2 * pairs) return;
    pairs *= height;
    height = 1;
}

void pack_plane(const source_lines &a, const source_lines &b, const plane_lines &dst,
                ptrdiff_t pairs, ptrdiff_t height) {
    if (pairs < 1 || height < 1) return;
    join_rows(pairs, height, a.stride, b.stride, dst.stride);
    pack_row *const row = live_rows().pack;
    for (ptrdiff_t y = 0; y < height; y++) row(a.line(y), b.line(y), dst.line(y), pairs);
}

// `bytes` of a source row; the last of an odd number belongs to a.
void unpack_plane(const source_lines &src, const plane_lines &a, const plane_lines &b,
                  ptrdiff_t bytes, ptrdiff_t height) {
    if (bytes < 1 || height < 1) return;
    ptrdiff_t pairs = bytes / 2;
    if (bytes % 2 == 0) join_rows(pairs, height, a.stride, b.stride, src.stride);
    unpack_row *const row = live_rows().unpack;
    for (ptrdiff_t y = 0; y < height; y++) {
        if (pairs > 0) row(src.line(y), a.line(y), b.line(y), pairs);
        if (bytes % 2) a.line(y)[pairs] = src.line(y)[2 * pairs];
    }
}

// Source plane `from` to destination plane `to`.
void move(const csc_args &a, simgp_plane_fn *kernel, int from, int to) {
    kernel(a.src_planes[from], a.src_widths[from], a.src_heights[from], a.src_strides[from],
           a.dst_strides[to], a.dst_planes[to]);
}

// The three kinds of conversion. Luma is copied by all of them.
//
// Source plane 1 to destination plane d1, source plane 2 to d2.
void planes(const csc_args &a, simgp_plane_fn *chroma, int d1, int d2) {
    move(a, simgp_cpy_8b, 0, 0);
    move(a, chroma, 1, d1);
    move(a, chroma, 2, d2);
}

// Source planes `first` and `second` to the pairs of destination plane 1.
void pairs_from(const csc_args &a, int first, int second) {
    move(a, simgp_cpy_8b, 0, 0);
    pack_plane(src_lines(a, first), src_lines(a, second), dst_lines(a, 1), a.src_widths[1],
               a.src_heights[1]);
}

// The pairs of source plane 1 to destination planes `first` and `second`.
void pairs_to(const csc_args &a, int first, int second) {
    move(a, simgp_cpy_8b, 0, 0);
    unpack_plane(src_lines(a, 1), dst_lines(a, first), dst_lines(a, second),
                 2 * ptrdiff_t(a.src_widths[1]), a.src_heights[1]);
}

}  // namespace
}  // namespace simgp

using namespace simgp;

void simgp_csc_1x2_to_1x1(const void *src, int32_t width, int32_t height, int32_t src_stride,
                          int32_t dst_stride, void *dst) {
    copy_rows(static_cast<const uint8_t *>(src), 2 * ptrdiff_t(src_stride),
              static_cast<uint8_t *>(dst), dst_stride, width, height / 2);
}

void simgp_csc_1x1_to_1x2(const void *src, int32_t width, int32_t height, int32_t src_stride,
                          int32_t dst_stride, void *dst) {
    if (width < 1) return;
    const uint8_t *from = static_cast<const uint8_t *>(src);
    uint8_t *to = static_cast<uint8_t *>(dst);
    for (ptrdiff_t y = 0; y < height; y++)
        for (ptrdiff_t twice = 0; twice < 2; twice++)
            memcpy(to + (2 * y + twice) * dst_stride, from + y * src_stride, size_t(width));
}

void simgp_csc_8b8b_pck(const uint8_t *src_a, const uint8_t *src_b, int32_t width, int32_t height,
                        int32_t stride_a, int32_t stride_b, int32_t dst_stride, uint8_t *dst) {
    pack_plane({src_a, stride_a}, {src_b, stride_b}, {dst, dst_stride}, width, height);
}

void simgp_csc_8b8b_unpck(const uint8_t *src, int32_t width, int32_t height, int32_t src_stride,
                          int32_t stride_a, int32_t stride_b, uint8_t *dst_a, uint8_t *dst_b) {
    unpack_plane({src, src_stride}, {dst_a, stride_a}, {dst_b, stride_b}, width, height);
}

// clang-format off
#define KERNEL(from, to, ...) SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to, __VA_ARGS__)

KERNEL(yuv420,  yv12,    planes(args, simgp_cpy_8b, 2, 1))
KERNEL(yuv420,  yuv422n, planes(args, simgp_csc_1x1_to_1x2, 1, 2))
KERNEL(yuv420,  nv12,    pairs_from(args, 1, 2))
KERNEL(yuv420,  nv21,    pairs_from(args, 2, 1))
KERNEL(yuv422n, yuv420,  planes(args, simgp_csc_1x2_to_1x1, 1, 2))
KERNEL(yuv422n, yv12,    planes(args, simgp_csc_1x2_to_1x1, 2, 1))
KERNEL(yv16,    yuv420,  planes(args, simgp_csc_1x2_to_1x1, 2, 1))
KERNEL(yv16,    yv12,    planes(args, simgp_csc_1x2_to_1x1, 1, 2))
KERNEL(nv12,    yuv420,  pairs_to(args, 1, 2))
KERNEL(nv12,    yv12,    pairs_to(args, 2, 1))
KERNEL(nv21,    yuv420,  pairs_to(args, 2, 1))
KERNEL(nv21,    yv12,    pairs_to(args, 1, 2))
#undef KERNEL
// clang-format on
