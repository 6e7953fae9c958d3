// Luma dithering: the scalar row, which defines the result, the plane and the wrappers that convert
// what was dithered.
#include "simgp/dither.h"

#include <string.h>

#include "simgp/copy.h"
#include "simgp/dispatch.h"
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

void fill_dither(dither_rows &t) { t.dither = dither; }

}  // namespace scalar

namespace {

// Brings row y of the copy `to` to its final state; to be called for y = 0, 1, ... height - 1. Rows
// are copied when they are dithered for the first time, so three rows of the copy are in use at a
// time: y - 1, y and y + 1. Needs height >= 3 and width >= 5.
template <class Lines>
void finish_row(const const_lines &from, const Lines &to, ptrdiff_t width, ptrdiff_t height,
                ptrdiff_t y) {
    if (y == 0) {
        for (int k = 0; k < 2; k++) memcpy(to.line(k), from.line(k), size_t(width));
    } else if (y <= height - 2) {
        live_rows(width - 5).dither.dither(from.line(y + 1), to.line(y - 1), to.line(y),
                                           to.line(y + 1), width);
    }
}

bool is_dithered(ptrdiff_t width, ptrdiff_t height) { return height >= 3 && width >= 5; }

// The luma of a picture of `height` rows as a source of lines: each row is dithered when it is
// fetched.
//
// Four rows are kept at a time, in the last two rows of the destination, two in each. Of H >=
// `height` rows with stride D, |D| >= 2 W, and h = |D| / 2, luma row y lies
//   H - y = 1, 5, 9, ...   at byte (H - 1) D + h      3, 7, 11, ...   at (H - 2) D + h
//           2, 6, 10, ...  at (H - 1) D               4, 8, 12, ...   at (H - 2) D
// No output row before H - 2 touches them. Output row H - 2 falls on luma rows H - 4 and H - 3,
// which are not read any more: all dithering is over when luma row H - 2 is final. Output row H - 1
// falls on luma row H - 2, likewise over, and on its own luma: pixel x ends with byte 2 x + 1, and
// sample x + 1 lies at h + x + 1 > 2 x + 1, since x < W <= h. So a sample must be read before
// pixels at or beyond it are written, and that is all.
class dithered_luma {
  public:
    dithered_luma(const csc_args &a, ptrdiff_t height)
        : from_(src_lines(a, 0)),
          width_(a.src_widths[0]),
          height_(height),
          to_{dst_lines(a, 0), a.src_heights[0]} {}

    const uint8_t *fetch(ptrdiff_t y) {
        if (!is_dithered(width_, height_)) return from_.line(y);
        for (; final_ <= y; final_++) finish_row(from_, to_, width_, height_, final_);
        return to_.line(y);
    }

  private:
    struct kept_lines {
        lines dst;
        ptrdiff_t dst_height;

        uint8_t *line(ptrdiff_t y) const {
            const ptrdiff_t distance = dst_height - 1 - y;  // from the last row
            const ptrdiff_t step = dst.stride < 0 ? -dst.stride : dst.stride;
            return dst.line(dst_height - 1 - (distance >> 1 & 1)) + (distance & 1 ? 0 : step / 2);
        }
    };

    const_lines from_;
    ptrdiff_t width_, height_;
    kept_lines to_;
    ptrdiff_t final_ = 0;  // the rows before are
};

// GCC takes no addresses for constants where it looks for undefined behaviour.
template <const format &A, const format &B>
constexpr bool is_same_format = false;
template <const format &A>
constexpr bool is_same_format<A, A> = true;

// The rule of the conversion without dithering.
template <const format &From, const format &To>
constexpr yuv_rule rule_between() {
    yuv_rule found = yuv_rule::usual;
#define LOOK(name, from, to, rule)                                              \
    if (is_same_format<From, formats::from> && is_same_format<To, formats::to>) \
        found = yuv_rule::rule;
    SIMGP_YUV_TO_RGB_KERNELS(LOOK)
#undef LOOK
    return found;
}

// Grey is dithered in full height. Of other pictures the last 4 rows, the tail, are converted like a
// picture of their own, without dithering; so is what has less than 4 rows.
void dither_and_convert(const yuv_to_rgb_conversion &c, const csc_args &a) {
    if (a.src_widths[0] < 1) return;  // there are no last rows to point to
    if (c.from.u < 0) return convert_to_rgb(c, a, dithered_luma(a, a.src_heights[0]));

    constexpr int32_t tail = 4;
    if (a.src_heights[0] < tail) return convert_planes_to_rgb(c, a);

    const int32_t body = a.src_heights[0] - tail;
    csc_args top = a;
    top.src_heights = &body;
    convert_to_rgb(c, top, dithered_luma(a, body));

    const auto last_lines = [&](int plane, int32_t height) {
        return lines_of(a.src_planes[plane], a.src_strides[plane])
            .line(ptrdiff_t(a.src_heights[plane]) - height);
    };
    const int32_t tail_chroma = tail >> c.from.y_shift[1];
    uint8_t *const src_planes[] = {last_lines(0, tail), last_lines(1, tail_chroma),
                                   last_lines(2, tail_chroma)};
    uint8_t *const dst_planes[] = {dst_lines(a, 0).line(body)};
    csc_args bottom = a;
    bottom.src_planes = src_planes;
    bottom.src_heights = &tail;
    bottom.dst_planes = dst_planes;
    convert_planes_to_rgb(c, bottom);
}

#define DEFINE(name, source, target)                                                              \
    SIMGP_CSC_KERNEL(name, dither_and_convert(                                                    \
                               conversion_of<formats::source, formats::target,                    \
                                             rule_between<formats::source, formats::target>()>(), \
                               args))

// Offered by format alone, not by name.
#define YV12_KERNELS(X)                    \
    X(yv12_to_rgb565_dither, YV12, RGB565) \
    X(yv12_to_bgr565_dither, YV12, BGR565)
YV12_KERNELS(DEFINE)

constexpr conversion dithered_conversions[] = {
    // clang-format off
    SIMGP_DITHER_KERNELS(SIMGP_CONVERSION)
    YV12_KERNELS(SIMGP_CONVERSION)
    // clang-format on
};

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

SIMGP_DITHER_KERNELS(DEFINE)
#undef DEFINE

void simgp_dit_8b(const void *src, int32_t width, int32_t height, int32_t src_stride,
                  int32_t dst_stride, void *dst) {
    if (!is_dithered(width, height))
        return simgp_cpy_8b(src, width, height, src_stride, dst_stride, dst);
    const const_lines from = lines_of(src, src_stride);
    const lines to = lines_of(dst, dst_stride);
    for (ptrdiff_t y = 0; y < height; y++) finish_row(from, to, width, height, y);
}

int32_t simgp_csc_dither(const simgp_img *src, const simgp_img *dst) {
    if (src->format == SIMGP_FMT_YUV420 && dst->format == SIMGP_FMT_YUV420) {
        dither_planes(*src, *dst);
        return SIMGP_OK;
    }
    return convert_by<dithered_conversions>(*src, *dst);
}
