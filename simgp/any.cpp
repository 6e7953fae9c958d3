// Rows between any two formats, by weights that are known at run time: the scalar ones, which define the
// results.
#include "rows/any.h"

#include "simgp/pixel.h"

namespace simgp {
namespace scalar {
namespace {

int clamp(int v) { return v < 0 ? 0 : v > 255 ? 255 : v; }

// The bytes of a pixel of some kind.
constexpr int size_of(pixel_kind kind) { return int(kind) + 2; }

void write_pixel(pixel_kind kind, const rgb_order &order, uint8_t *p, const rgb &c) {
    const int first = order.blue_first ? c.b : c.r, last = order.blue_first ? c.r : c.b;
    if (kind == pixel_kind::words) {
        const int word = first >> 3 << 11 | c.g >> 2 << 5 | last >> 3;
        p[0] = uint8_t(word);
        p[1] = uint8_t(word >> 8);
        return;
    }
    if (kind == pixel_kind::four) {
        p[order.alpha_first ? 0 : 3] = 255;
        p += order.alpha_first;
    }
    p[0] = uint8_t(first);
    p[1] = uint8_t(c.g);
    p[2] = uint8_t(last);
}

rgb from_yuv(const yuv_weights &w, const yuv &p) {
    const int luma = w.luma * (p.y - w.black), u = p.u - 128, v = p.v - 128;
    return {clamp((luma + w.red * v + 128) >> 8),
            clamp((luma - w.green_u * u - w.green_v * v + 128) >> 8),
            clamp((luma + w.blue * u + 128) >> 8)};
}

template <chroma_in Layout>
yuv read_any(const yuv_to_rgb &how, const yuv_samples &s, ptrdiff_t x) {
    if constexpr (Layout == chroma_in::half) return read_yuv<yuv_layout::half>(s, x);
    if constexpr (Layout == chroma_in::full) return read_yuv<yuv_layout::full>(s, x);
    if constexpr (Layout == chroma_in::pairs)
        return how.v_first ? read_yuv<yuv_layout::vu>(s, x) : read_yuv<yuv_layout::uv>(s, x);
    if constexpr (Layout == chroma_in::groups)
        return how.luma_first ? read_yuv<yuv_layout::yuyv>(s, x) : read_yuv<yuv_layout::uyvy>(s, x);
}

template <chroma_in Layout, pixel_kind Kind>
void any_to_rgb(const yuv_to_rgb *how, const uint8_t *y, const uint8_t *u, const uint8_t *v,
                uint8_t *dst, ptrdiff_t width) {
    const yuv_samples s{y, u, v, width};
    for (ptrdiff_t x = 0; x < width; x++)
        write_pixel(Kind, how->pixels, dst + size_of(Kind) * x,
                    from_yuv(how->weights, read_any<Layout>(*how, s, x)));
}

// The channels of a pixel in the order of memory.
struct channels {
    int c[3];
};
template <rgb_in In>
channels read_channels(const uint8_t *src, ptrdiff_t x) {
    constexpr rgb_packing packing = In == rgb_in::words   ? rgb_packing::rgb565
                                    : In == rgb_in::three ? rgb_packing::rgb888
                                    : In == rgb_in::four  ? rgb_packing::rgba8888
                                                          : rgb_packing::argb8888;
    const rgb p = read_rgb<packing>(src, x);
    return {{p.r, p.g, p.b}};
}
int dot(const int16_t (&w)[3], const channels &p) {
    return w[0] * p.c[0] + w[1] * p.c[1] + w[2] * p.c[2];
}
uint8_t luma_of(const rgb_weights &w, const channels &p) {
    return uint8_t((dot(w.y, p) >> 8) + w.black);
}
uint8_t chroma_of(const int16_t (&w)[3], const channels &p) {
    return uint8_t(clamp(((dot(w, p) + 128) >> 8) + 128));
}

// Of a row, and of the one that shares its chroma, if that is not null.
template <pixel_kind Kind>
void any_to_yuv_row(const rgb_weights &w, const uint8_t *src0, const uint8_t *src1, uint8_t *y0,
                    uint8_t *y1, uint8_t *u, uint8_t *v, ptrdiff_t width) {
    const auto pixel = [&w](const uint8_t *src, ptrdiff_t x) {
        return read_channels<rgb_in(Kind)>(src + w.alpha_first, x);
    };
    // Of a pixel and those beside and below it; at borders some of them twice, which changes no mean.
    const auto mean = [&](ptrdiff_t x) {
        const ptrdiff_t right = x + 1 < width ? x + 1 : x;
        const uint8_t *const below = src1 ? src1 : src0;
        const channels a = pixel(src0, x), b = pixel(src0, right), c = pixel(below, x),
                       d = pixel(below, right);
        channels m{};
        for (int k = 0; k < 3; k++) m.c[k] = (a.c[k] + b.c[k] + c.c[k] + d.c[k] + 2) >> 2;
        return m;
    };
    for (ptrdiff_t x = 0; x < width; x++) {
        y0[x] = luma_of(w, pixel(src0, x));
        if (src1) y1[x] = luma_of(w, pixel(src1, x));
        if (!u || x & 1) continue;
        const channels p = w.mean ? mean(x) : pixel(src0, x);
        u[v ? x / 2 : x] = chroma_of(w.u, p);
        (v ? v[x / 2] : u[x + 1]) = chroma_of(w.v, p);
    }
}

template <pixel_kind Kind>
void any_to_yuv(const rgb_weights &w, const lines_to_yuv &l) {
    for (ptrdiff_t row = 0, at = 0; row < l.rows; row += 1 + l.shared, at++) {
        const bool two = l.shared && row + 1 < l.rows;
        const uint8_t *const src = l.src + row * l.src_step;
        uint8_t *const y = l.y + row * l.y_step;
        any_to_yuv_row<Kind>(w, src, two ? src + l.src_step : nullptr, y,
                             two ? y + l.y_step : nullptr, l.u ? l.u + at * l.u_step : nullptr,
                             l.v ? l.v + at * l.v_step : nullptr, l.width);
    }
}

void chroma(const rgb_weights &w, const uint8_t *const of[3], uint8_t *u, uint8_t *v,
            ptrdiff_t count) {
    for (ptrdiff_t x = 0; x < count; x++) {
        const channels p{{of[0][x], of[1][x], of[2][x]}};
        u[x] = chroma_of(w.u, p);
        v[x] = chroma_of(w.v, p);
    }
}

template <rgb_in In>
void split_pixels(const uint8_t *src, uint8_t *const of[3], ptrdiff_t count) {
    for (ptrdiff_t x = 0; x < count; x++) {
        const channels p = read_channels<In>(src, x);
        for (int k = 0; k < 3; k++) of[k][x] = uint8_t(p.c[k]);
    }
}

// Channels stand in the order of memory here: r for the first, b for the last.
template <pixel_kind From, pixel_kind To>
void repack_row(const repacking &order, const uint8_t *src, uint8_t *dst, ptrdiff_t count) {
    for (ptrdiff_t x = 0; x < count; x++) {
        const uint8_t *const p = src + size_of(From) * x;
        const bool skip = From == pixel_kind::four && order.from_alpha_first;
        const channels c = From == pixel_kind::words
                               ? read_channels<rgb_in::words>(p, 0)
                               : channels{{p[skip], p[skip + 1], p[skip + 2]}};
        uint8_t *const q = dst + size_of(To) * x;
        write_pixel(To, {order.exchange, order.to_alpha_first}, q, {c.c[0], c.c[1], c.c[2]});
        if (From == pixel_kind::four && To == pixel_kind::four)
            q[order.to_alpha_first ? 0 : 3] = p[order.from_alpha_first ? 0 : 3];
    }
}
template <pixel_kind From, pixel_kind To>
void repack(const repacking &order, const lines_to_repack &l) {
    for (ptrdiff_t y = 0; y < l.count; y++)
        repack_row<From, To>(order, l.src + y * l.src_step, l.dst + y * l.dst_step, l.width);
}

void split_groups(const groups_split &s) {
    const int luma = s.luma_first ? 0 : 1, of_u = s.luma_first ? 1 : 0;
    for (ptrdiff_t row = 0; row < s.rows; row++) {
        const uint8_t *const src = s.src + row * s.stride;
        for (ptrdiff_t x = 0; x < 2 * s.pairs; x++) s.y[row * s.y_stride + x] = src[2 * x + luma];
        if (s.shared && row & 1) continue;
        // The mean of a line and itself is the line.
        const bool both = s.shared && s.mean && row + 1 < s.rows;
        const uint8_t *const other = both ? src + s.stride : src;
        const ptrdiff_t line = s.shared ? row / 2 : row;
        for (ptrdiff_t i = 0; i < s.pairs; i++) {
            const auto sample = [=](ptrdiff_t at) {
                return uint8_t((src[at] + other[at] + 1) >> 1);
            };
            uint8_t *const u = s.u + line * s.u_stride + (s.v ? i : 2 * i);
            u[0] = sample(4 * i + of_u);
            (s.v ? s.v[line * s.v_stride + i] : u[1]) = sample(4 * i + of_u + 2);
        }
    }
}
void join_groups(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
                 ptrdiff_t pairs, bool luma_first) {
    const int luma = luma_first ? 0 : 1, of_u = luma_first ? 1 : 0;
    for (ptrdiff_t i = 0; i < pairs; i++) {
        dst[4 * i + luma] = y[2 * i];
        dst[4 * i + luma + 2] = y[2 * i + 1];
        dst[4 * i + of_u] = u[i];
        dst[4 * i + of_u + 2] = v[i];
    }
}

void mean_of_lines(const uint8_t *a, const uint8_t *b, uint8_t *dst, ptrdiff_t count) {
    for (ptrdiff_t x = 0; x < count; x++) dst[x] = uint8_t((a[x] + b[x] + 1) >> 1);
}
void mean_of_blocks(const uint8_t *a, const uint8_t *b, ptrdiff_t step, uint8_t *dst,
                    ptrdiff_t dst_step, ptrdiff_t count, ptrdiff_t rows) {
    for (ptrdiff_t y = 0; y < rows; y++) {
        const uint8_t *const p = a + y * step, *const q = b + y * step;
        for (ptrdiff_t x = 0; x < count; x++)
            dst[y * dst_step + x] =
                uint8_t((p[2 * x] + p[2 * x + 1] + q[2 * x] + q[2 * x + 1] + 2) >> 2);
    }
}
void every_second(const uint8_t *a, uint8_t *dst, ptrdiff_t count) {
    for (ptrdiff_t x = 0; x < count; x++) dst[x] = a[2 * x];
}
void twice(const uint8_t *a, uint8_t *dst, ptrdiff_t count) {
    for (ptrdiff_t x = 0; x < count; x++) dst[x] = a[x / 2];
}

template <chroma_in Layout, pixel_kind Kind>
void fill_to_rgb(any_rows &t) {
    const size_t l = size_t(Layout), k = size_t(Kind);
    t.to_rgb[l][k] = [](const lines_to_rgb &lines) {
        for_each_row(lines, false, any_to_rgb<Layout, Kind>);
    };
    t.to_rgb_pair[l][k] = [](const lines_to_rgb &lines) {
        for_each_row(lines, true, any_to_rgb<Layout, Kind>);
    };
}
template <chroma_in Layout>
void fill_from_yuv(any_rows &t) {
    fill_to_rgb<Layout, pixel_kind::words>(t);
    fill_to_rgb<Layout, pixel_kind::three>(t);
    fill_to_rgb<Layout, pixel_kind::four>(t);
}
template <pixel_kind From>
void fill_from_rgb(any_rows &t) {
    t.to_yuv[size_t(From)] = any_to_yuv<From>;
    t.split_pixels[size_t(From)] = split_pixels<rgb_in(From)>;
    repack_rows **const to = t.repack[size_t(From)];
    to[size_t(pixel_kind::words)] = repack<From, pixel_kind::words>;
    to[size_t(pixel_kind::three)] = repack<From, pixel_kind::three>;
    to[size_t(pixel_kind::four)] = repack<From, pixel_kind::four>;
}

}  // namespace

void fill_any(any_rows &t) {
    fill_from_yuv<chroma_in::half>(t);
    fill_from_yuv<chroma_in::full>(t);
    fill_from_yuv<chroma_in::pairs>(t);
    fill_from_yuv<chroma_in::groups>(t);
    fill_from_rgb<pixel_kind::words>(t);
    fill_from_rgb<pixel_kind::three>(t);
    fill_from_rgb<pixel_kind::four>(t);
    t.split_pixels[size_t(rgb_in::four_alpha_first)] = split_pixels<rgb_in::four_alpha_first>;
    t.chroma = chroma;
    t.split_groups = split_groups;
    t.join_groups = join_groups;
    t.mean_of_lines = mean_of_lines;
    t.mean_of_blocks = mean_of_blocks;
    t.every_second = every_second;
    t.twice = twice;
}

}  // namespace scalar
}  // namespace simgp
