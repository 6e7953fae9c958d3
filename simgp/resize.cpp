// Bilinear resize: the scalar rows, which define the results, and the kernels.
#include "simgp/resize.h"

#include <string.h>

#include "simgp/copy.h"
#include "simgp/resample.h"

namespace simgp {
namespace scalar {
namespace {

// The channels of a pixel in memory.
template <resize_kind Kind>
struct pixel {
    static constexpr int size = resized_pixel_bytes[size_t(Kind)], channels = size;

    static int read(const uint8_t *p, int channel) { return p[channel]; }
    static void write(uint8_t *p, const int (&c)[channels]) {
        for (int k = 0; k < channels; k++) p[k] = uint8_t(c[k]);
    }
};
template <>
struct pixel<resize_kind::word565> {
    static constexpr int size = 2, channels = 3;

    static int read(const uint8_t *p, int channel) {
        const int word = p[0] | p[1] << 8;
        return channel == 0 ? word & 31 : channel == 1 ? word >> 5 & 63 : word >> 11;
    }
    static void write(uint8_t *p, const int (&c)[channels]) {
        const int word = c[0] | c[1] << 5 | c[2] << 11;
        p[0] = uint8_t(word);
        p[1] = uint8_t(word >> 8);
    }
};

// Column i of a strip: the two neighbours in a row of the source, as they count from its begin.
struct column {
    ptrdiff_t left, right;
    int phase;

    column(const resize_strip &s, ptrdiff_t i) {
        const uint32_t at = uint32_t(s.x + (s.mirrored ? s.columns - 1 - i : i)) * s.step;
        left = ptrdiff_t(int32_t(at) >> 18) * (1 << s.shift) - s.first;
        phase = int(at >> 15 & 7);
        right = phase ? left + (1 << s.shift) : left;
    }
};

// 8 times the channel between two pixels of a row.
template <class Pixel>
int blend_across(const uint8_t *row, const column &c, int channel) {
    return (8 - c.phase) * Pixel::read(row + c.left * Pixel::size, channel) +
           c.phase * Pixel::read(row + c.right * Pixel::size, channel);
}
int blend_down(int above, int below, int phase) {
    return ((8 - phase) * above + phase * below) >> 6;
}

// A step is a pixel; there is nothing to plan.
template <class Pixel>
void measure(resize_strip &s) {
    s.step_bytes = Pixel::size;
    s.plan_bytes = 0;
    s.kept_bytes = 2 * Pixel::channels;
}
void plan(resize_strip &) {}

// Kept are 16 bits for each channel.
template <class Pixel>
void down(const resize_strip &s, const resize_line *lines, int32_t count, uint8_t *dst,
          ptrdiff_t stride) {
    const auto kept = [](const uint8_t *row, ptrdiff_t at) {
        uint16_t blend;
        memcpy(&blend, row + 2 * at, 2);
        return int(blend);
    };
    for (const resize_line *l = lines; l < lines + count; l++, dst += stride)
        for (ptrdiff_t i = 0; i < s.columns; i++) {
            int c[Pixel::channels];
            for (int k = 0; k < Pixel::channels; k++) {
                const ptrdiff_t at = Pixel::channels * i + k;
                c[k] = blend_down(kept(l->above, at), kept(l->below, at), l->phase);
            }
            Pixel::write(dst + i * Pixel::size, c);
        }
}

template <class Pixel>
void across(const resize_strip &s, const uint8_t *row, uint8_t *kept, ptrdiff_t,
            const resize_line *lines, int32_t count, uint8_t *dst, ptrdiff_t stride) {
    for (ptrdiff_t i = 0; i < s.columns; i++)
        for (int k = 0; k < Pixel::channels; k++, kept += 2) {
            const uint16_t blend = uint16_t(blend_across<Pixel>(row, column(s, i), k));
            memcpy(kept, &blend, 2);
        }
    down<Pixel>(s, lines, count, dst, stride);
}

template <class Pixel>
void both(const resize_strip &s, const resize_line *lines, int32_t count, uint8_t *dst,
          ptrdiff_t stride, ptrdiff_t) {
    for (const resize_line *l = lines; l < lines + count; l++, dst += stride)
        for (ptrdiff_t i = 0; i < s.columns; i++) {
            const column at(s, i);
            int c[Pixel::channels];
            for (int k = 0; k < Pixel::channels; k++)
                c[k] = blend_down(blend_across<Pixel>(l->above, at, k),
                                  blend_across<Pixel>(l->below, at, k), l->phase);
            Pixel::write(dst + i * Pixel::size, c);
        }
}

template <resize_kind Kind>
void fill(resize_rows &t) {
    using p = pixel<Kind>;
    t.of[size_t(Kind)] = {measure<p>, plan, across<p>, down<p>, both<p>};
}

}  // namespace

void fill_resize(resize_rows &t) {
    fill<resize_kind::bytes1>(t);
    fill<resize_kind::bytes2>(t);
    fill<resize_kind::bytes3>(t);
    fill<resize_kind::bytes4>(t);
    fill<resize_kind::word565>(t);
}

}  // namespace scalar

namespace {

void resize(resize_kind kind, const resize_args &a) {
    if (a.width < 1 || a.height < 1) return;
    const resampling r(kind, a.step_x, a.step_y);
    const int unit = int(r.pixel_bytes);
    const const_lines src = whole_pixel_lines(a.src, unit);
    const lines dst = whole_pixel_lines(a.dst, unit);
    resample_plane(r, src, a.width, [&](auto &made, ptrdiff_t x, ptrdiff_t, uint8_t *) {
        made.make(0, a.height, dst.first + x * unit, dst.stride);
    });
}

// The planes that are resized; null: the format has no rule. A code without a name has 32 bits.
constexpr int32_t unnamed_32_bits = 503;
const format *planes_resized(int32_t code) {
    if (code == unnamed_32_bits) return &formats::ARGB8888;
    if (code >= 0 && code <= 99) return planes_kept(code);
    const format *const known = find_format(code);
    return known && known->kind == format_kind::rgb ? known : nullptr;
}

simgp_rsz_fn *kernel_of(const format &f, int plane) {
    switch (f.bytes[plane]) {
        case 1:
            return simgp_rsz_8b;
        case 2:
            return f.kind == format_kind::rgb ? simgp_rsz_5b6b5b : simgp_rsz_8b8b;
        case 3:
            return simgp_rsz_8b8b8b;
        default:
            return simgp_rsz_8b8b8b8b;
    }
}

void copy_plane(const format &f, const simgp_img &src, const simgp_img &dst, int k) {
    const bool words = f.kind == format_kind::rgb && f.bytes[k] == 2;
    const int unit = words ? 2 : 1;
    copy_lines(whole_pixel_lines(lines_of(src.plane[k], src.stride[k]), unit),
               whole_pixel_lines(lines_of(dst.plane[k], dst.stride[k]), unit),
               ptrdiff_t(src.width[k]) * f.bytes[k], src.height[k]);
}

}  // namespace
}  // namespace simgp

using namespace simgp;

const uint8_t simgp_tbl_rsz_weight[256] = SIMGP_RESIZE_WEIGHTS;

SIMGP_RESIZE_KERNEL(simgp_rsz_8b, resize(resize_kind::bytes1, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b8b, resize(resize_kind::bytes2, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b8b8b, resize(resize_kind::bytes3, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b8b8b8b, resize(resize_kind::bytes4, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_5b6b5b, resize(resize_kind::word565, args))

void simgp_rsz_get_step(int32_t src_width, int32_t src_height, int32_t dst_width,
                        int32_t dst_height, int32_t mode, int32_t *step_x, int32_t *step_y) {
    const bool turned = is_quarter_turn(mode);
    *step_x = resize_spread(src_width, turned ? dst_height : dst_width).packed();
    *step_y = resize_spread(src_height, turned ? dst_width : dst_height).packed();
}

int32_t simgp_rsz(const simgp_img *src, const simgp_img *dst) {
    if (src->format != dst->format) return SIMGP_ERR_PARAM;
    const format *const f = planes_resized(src->format);
    if (!f) return SIMGP_ERR_UNSUPPORTED;
    if (src->width[0] == dst->width[0] && src->height[0] == dst->height[0]) {
        for (int k = 0; k < f->planes; k++) copy_plane(*f, *src, *dst, k);
        return SIMGP_OK;
    }
    for (int k = 0; k < f->planes; k++)
        if (!plane_fits(*src, *dst, k)) return SIMGP_ERR_PARAM;
    for (int k = 0; k < f->planes; k++) resize_plane(kernel_of(*f, k), *src, *dst, k);
    return SIMGP_OK;
}
