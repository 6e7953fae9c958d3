// Luma dithering: the scalar row, which defines the result, the plane and the wrappers that convert
// what was dithered.
#include "simgp/dither.h"

#include <string.h>

#include "simd/choose.h"
#include "simgp/copy.h"
#include "simgp/walk.h"

namespace simgp {
namespace scalar {
namespace {

uint8_t nudge(uint8_t sample, int by) {
    const int v = sample + by;
    return uint8_t(v < 0 ? 0 : v > 255 ? 255 : v);
}

void dither(const uint8_t *src, const uint8_t *above, uint8_t *cur, uint8_t *below,
            ptrdiff_t width) {
    memcpy(below, src, size_t(width));
    for (ptrdiff_t x = 2; x <= width - 3; x += 2) {
        const uint8_t p = cur[x - 1], q = cur[x];
        cur[x + 2] = nudge(cur[x + 2], p > q ? 2 : -2);
        const int down = above[x] > q ? 1 : -1;
        below[x] = nudge(below[x], down);
        below[x + 1] = nudge(below[x + 1], down);
    }
}

}  // namespace

void fill_dither(rows &t) { t.dither = dither; }

}  // namespace scalar

namespace {

// Brings row y of the copy `to` to its final state; to be called for y = 0, 1, ... height - 1. Rows
// are copied when they are dithered for the first time, so three rows of the copy are in use at a
// time: y - 1, y and y + 1. Needs height >= 3 and width >= 5.
template <class Lines>
void finish_row(const plane_lines &from, const Lines &to, ptrdiff_t width, ptrdiff_t height,
                ptrdiff_t y) {
    if (y == 0) {
        for (int k = 0; k < 2; k++) memcpy(to.line(k), from.line(k), size_t(width));
    } else if (y <= height - 2) {
        live_rows().dither(from.line(y + 1), to.line(y - 1), to.line(y), to.line(y + 1), width);
    }
}

bool is_dithered(ptrdiff_t width, ptrdiff_t height) { return height >= 3 && width >= 5; }

// The luma of a picture of `rows` rows, dithered row by row, as the conversion asks for it.
//
// Four rows are kept at a time, in the last two rows of the destination, two in each. Of H >=
// `rows` rows with stride D, |D| >= 2 W, and h = |D| / 2, luma row y lies
//   H - y = 1, 5, 9, ...   at byte (H - 1) D + h      3, 7, 11, ...   at (H - 2) D + h
//           2, 6, 10, ...  at (H - 1) D               4, 8, 12, ...   at (H - 2) D
// No output row before H - 2 touches them. Output row H - 2 falls on luma rows H - 4 and H - 3,
// which are not read any more: all dithering is over when luma row H - 2 is final. Output row H - 1
// falls on luma row H - 2, likewise over, and on its own luma: pixel x ends with byte 2 x + 1, and
// sample x + 1 lies at h + x + 1 > 2 x + 1, since x < W <= h. So a sample must be read before
// pixels at or beyond it are written, and that is all.
class dithered_luma {
  public:
    dithered_luma(const csc_args &a, ptrdiff_t rows)
        : from_(src_lines(a, 0)),
          width_(a.src_widths[0]),
          rows_(rows),
          dst_(dst_lines(a, 0)),
          dst_height_(a.src_heights[0]) {}

    // Row y, after those before it; row y - 1 is still there.
    uint8_t *line(ptrdiff_t y) {
        if (!is_dithered(width_, rows_)) return from_.line(y);
        for (; final_ <= y; final_++) finish_row(from_, kept{*this}, width_, rows_, final_);
        return kept{*this}.line(y);
    }

  private:
    struct kept {
        const dithered_luma &luma;
        uint8_t *line(ptrdiff_t y) const {
            const ptrdiff_t distance = luma.dst_height_ - 1 - y;  // from the last row
            const ptrdiff_t step = luma.dst_.stride < 0 ? -luma.dst_.stride : luma.dst_.stride;
            return luma.dst_.line(luma.dst_height_ - 1 - (distance >> 1 & 1)) +
                   (distance & 1 ? 0 : step / 2);
        }
    };

    plane_lines from_;
    ptrdiff_t width_, rows_;
    plane_lines dst_;
    ptrdiff_t dst_height_;
    ptrdiff_t final_ = 0;  // the rows before are
};

// How a kernel gives chroma lines to rows, see first_line_alone.
enum class odd_heights { as_usual, first_line_alone };

template <class Luma>
void convert(const csc_args &a, Luma &&luma, const yuv_planes &planes, rgb_packing packing,
             odd_heights rule) {
    walk_yuv_to_rgb(a, luma, planes, live_rows(), packing,
                    rule == odd_heights::first_line_alone ? first_line_alone(a) : 0);
}

// In full height.
void dither_whole(const csc_args &a, const yuv_planes &planes, rgb_packing packing) {
    convert(a, dithered_luma(a, a.src_heights[0]), planes, packing, odd_heights::as_usual);
}

// The last 4 rows, the tail, are converted like a picture of their own, without dithering; so is
// what has less than 4 rows.
void dither_body(const csc_args &a, const yuv_planes &planes, rgb_packing packing,
                 odd_heights rule) {
    constexpr int32_t tail = 4;
    if (a.src_heights[0] < tail) return convert(a, src_lines(a, 0), planes, packing, rule);

    const int32_t body = a.src_heights[0] - tail;
    csc_args top = a;
    top.src_heights = &body;
    convert(top, dithered_luma(a, body), planes, packing, rule);

    const auto last_lines = [&](int plane, int32_t lines) {
        return src_lines(a, plane).line(ptrdiff_t(a.src_heights[plane]) - lines);
    };
    const int32_t tail_chroma = planes.serves_two_rows ? tail / 2 : tail;
    uint8_t *const src_planes[] = {last_lines(0, tail), last_lines(1, tail_chroma),
                                   last_lines(2, tail_chroma)};
    uint8_t *const dst_planes[] = {dst_lines(a, 0).line(body)};
    csc_args bottom = a;
    bottom.src_planes = src_planes;
    bottom.src_heights = &tail;
    bottom.dst_planes = dst_planes;
    convert(bottom, src_lines(bottom, 0), planes, packing, rule);
}

// YV12 by way of a YUV420 kernel: planes and strides of U and V change places.
void exchange_chroma(const csc_args &a, simgp_csc_fn *kernel) {
    uint8_t *const planes[] = {a.src_planes[0], a.src_planes[2], a.src_planes[1]};
    const int32_t strides[] = {a.src_strides[0], a.src_strides[2], a.src_strides[1]};
    kernel(planes, a.src_widths, a.src_heights, strides, a.dst_strides, a.dst_planes);
}
SIMGP_CSC_KERNEL(yv12_to_rgb565_dither, exchange_chroma(args, simgp_csc_yuv420_to_rgb565_dither))
SIMGP_CSC_KERNEL(yv12_to_bgr565_dither, exchange_chroma(args, simgp_csc_yuv420_to_bgr565_dither))

struct pair {
    int16_t from, to;
    simgp_csc_fn *kernel;
};

// clang-format off
constexpr pair dithered_pairs[] = {
    {SIMGP_FMT_YUV400,  SIMGP_FMT_RGB565, simgp_csc_yuv400_to_rgb565_dither},
    {SIMGP_FMT_YUV420,  SIMGP_FMT_RGB565, simgp_csc_yuv420_to_rgb565_dither},
    {SIMGP_FMT_YUV420,  SIMGP_FMT_BGR565, simgp_csc_yuv420_to_bgr565_dither},
    {SIMGP_FMT_YUV422N, SIMGP_FMT_RGB565, simgp_csc_yuv422n_to_rgb565_dither},
    {SIMGP_FMT_YUV422N, SIMGP_FMT_BGR565, simgp_csc_yuv422n_to_bgr565_dither},
    {SIMGP_FMT_YUV422W, SIMGP_FMT_RGB565, simgp_csc_yuv422w_to_rgb565_dither},
    {SIMGP_FMT_YUV422W, SIMGP_FMT_BGR565, simgp_csc_yuv422w_to_bgr565_dither},
    {SIMGP_FMT_YUV444,  SIMGP_FMT_RGB565, simgp_csc_yuv444_to_rgb565_dither},
    {SIMGP_FMT_YUV444,  SIMGP_FMT_BGR565, simgp_csc_yuv444_to_bgr565_dither},
    {SIMGP_FMT_YV12,    SIMGP_FMT_RGB565, yv12_to_rgb565_dither},
    {SIMGP_FMT_YV12,    SIMGP_FMT_BGR565, yv12_to_bgr565_dither},
};
// clang-format on

// YUV420 to YUV420.
void dither_planes(const simgp_img &src, const simgp_img &dst) {
    for (int k = 0; k < 3; k++) {
        simgp_plane_fn *const copy = k == 0 ? simgp_dit_8b : simgp_cpy_8b;
        copy(src.plane[k], src.width[k], src.height[k], src.stride[k], dst.stride[k], dst.plane[k]);
    }
}

}  // namespace
}  // namespace simgp

using namespace simgp;

void simgp_dit_8b(const void *src, int32_t width, int32_t height, int32_t src_stride,
                  int32_t dst_stride, void *dst) {
    if (!is_dithered(width, height))
        return simgp_cpy_8b(src, width, height, src_stride, dst_stride, dst);
    const plane_lines from{static_cast<uint8_t *>(const_cast<void *>(src)), src_stride};
    const plane_lines to{static_cast<uint8_t *>(dst), dst_stride};
    for (ptrdiff_t y = 0; y < height; y++) finish_row(from, to, width, height, y);
}

// clang-format off
#define KERNEL(from, to, rule) \
    SIMGP_CSC_KERNEL(simgp_csc_##from##_to_##to##_dither, dither_body(args, planes_##from, rgb_packing::to, odd_heights::rule))

SIMGP_CSC_KERNEL(simgp_csc_yuv400_to_rgb565_dither, dither_whole(args, planes_yuv400, rgb_packing::rgb565))
KERNEL(yuv420, rgb565, first_line_alone)
KERNEL(yuv420, bgr565, as_usual)
KERNEL(yuv422n, rgb565, as_usual)
KERNEL(yuv422n, bgr565, as_usual)
KERNEL(yuv422w, rgb565, as_usual)
KERNEL(yuv422w, bgr565, as_usual)
KERNEL(yuv444, rgb565, as_usual)
KERNEL(yuv444, bgr565, as_usual)
#undef KERNEL
// clang-format on

int32_t simgp_csc_dither(const simgp_img *src, const simgp_img *dst) {
    if (src->format == SIMGP_FMT_YUV420 && dst->format == SIMGP_FMT_YUV420) {
        dither_planes(*src, *dst);
        return SIMGP_OK;
    }
    for (const pair &p : dithered_pairs) {
        if (p.from != src->format || p.to != dst->format) continue;
        p.kernel(src->plane, src->width, src->height, src->stride, dst->stride, dst->plane);
        return SIMGP_OK;
    }
    return SIMGP_ERR_UNSUPPORTED;
}
