// Any format to any format: the matrices, and the walks over rows and strips.
#include "simgp/csc_any.h"

#include "simgp/csc.h"
#include "simgp/tile_offset.h"
#include "simgp/walk.h"

namespace simgp {
namespace {

// The matrices, by colour (ITU-R BT.601, BT.709, BT.2020).
constexpr yuv_weights to_rgb_weights[] = {
    {298, 16, 409, 100, 208, 516}, {256, 0, 359, 88, 183, 454},  //
    {298, 16, 459, 55, 136, 541},  {256, 0, 403, 48, 120, 475},  //
    {298, 16, 430, 48, 167, 548},  {256, 0, 378, 42, 146, 482},
};
constexpr rgb_weights to_yuv_weights[] = {
    {{66, 129, 25}, {-38, -74, 112}, {112, -94, -18}, 16, false, false},
    {{77, 150, 29}, {-43, -85, 128}, {128, -107, -21}, 0, false, false},
    {{47, 157, 16}, {-26, -86, 112}, {112, -102, -10}, 16, false, false},
    {{54, 184, 18}, {-29, -99, 128}, {128, -116, -12}, 0, false, false},
    {{58, 149, 13}, {-31, -81, 112}, {112, -103, -9}, 16, false, false},
    {{67, 174, 15}, {-36, -92, 128}, {128, -118, -10}, 0, false, false},
};
constexpr bool luma_sums_are_even() {
    for (const rgb_weights &w : to_yuv_weights)
        if ((w.y[0] + w.y[1] + w.y[2]) % 2) return false;
    return true;
}
static_assert(luma_sums_are_even(), "vector rows count on it");
constexpr int32_t colours = int32_t(sizeof to_rgb_weights / sizeof *to_rgb_weights);

// One call: the formats, the planes, the size.
struct job {
    const format &from, &to;
    const simgp_img &src, &dst;
    int32_t colour;
    bool mean;
    ptrdiff_t width, height;
    const row_table &live;
    const any_rows &rows;
    const layout_rows &layout;

    // Lines of pixels advance by whole pixels, but from linear YUV, as in the kernels.
    const_lines in(int plane) const {
        return whole_pixel_lines(const_lines{src.plane[plane], src.stride[plane]},
                                 from.kind == format_kind::rgb ? from.bytes[0] : 1);
    }
    lines out(int plane) const {
        const bool whole = to.kind == format_kind::rgb &&
                           (from.kind == format_kind::rgb || from.kind == format_kind::tiled);
        return whole_pixel_lines(lines{dst.plane[plane], dst.stride[plane]},
                                 whole ? to.bytes[0] : 1);
    }
};

// Two rows of a picture (or its last one, or one alone), and of these as many columns as a strip on
// the stack has, or all. Strips begin and end with whole tiles.
constexpr ptrdiff_t strip_width = 256;
static_assert(strip_width % tile_width == 0);
struct strip_rows {
    ptrdiff_t x, y, width, rows;
    ptrdiff_t pairs() const { return (width + 1) / 2; }
};
template <class F>
void for_each_band(const job &j, ptrdiff_t width, ptrdiff_t rows, F f) {
    for (ptrdiff_t y = 0; y < j.height; y += rows)
        for (ptrdiff_t x = 0; x < j.width; x += width)
            f(strip_rows{x, y, j.width - x < width ? j.width - x : width,
                         j.height - y < rows ? j.height - y : rows});
}

constexpr bool is_rgb(const format &f) { return f.kind == format_kind::rgb; }
constexpr bool has_pairs(const format &f) {
    return f.layout == yuv_layout::uv || f.layout == yuv_layout::vu;
}

// How many pixels share a chroma sample across and down: shifts of 0 or 1. Grey has the chroma of
// 4:2:0.
struct sharing {
    bool across, down;
};
constexpr sharing sharing_of(const format &f) {
    if (f.kind == format_kind::packed) return {true, false};
    if (f.u < 0) return {true, true};
    return {f.x_shift[f.u] > 0, f.y_shift[f.u] > 0};
}

// The samples of a band in planes, of rows 0 and 1; chroma that is shared down has line 0 alone.
struct planar_band {
    const uint8_t *y[2], *u[2], *v[2];
};
// Room for them.
struct yuv_strip {
    uint8_t y[2][strip_width], u[2][strip_width], v[2][strip_width];
};

// Sets the chroma of a band to where it stands in planes of its own.
template <class Band, class Plane>
void point_to_chroma(const format &f, const strip_rows &b, Band &to, Plane plane) {
    const sharing shared = sharing_of(f);
    for (ptrdiff_t r = 0; r < (shared.down ? 1 : b.rows); r++) {
        const ptrdiff_t line = (b.y + r) >> shared.down, x = b.x >> shared.across;
        to.u[r] = plane(f.u).line(line) + x;
        to.v[r] = plane(f.v).line(line) + x;
    }
}

// YUV sources
// -----------------------------------------------------------------------------------------------

// Takes chroma pairs apart.
void split_pairs(const job &j, bool v_first, const uint8_t *src, uint8_t *u, uint8_t *v,
                 ptrdiff_t pairs) {
    j.layout.unpack(src, 0, v_first ? v : u, 0, v_first ? u : v, 0, pairs, 1);
}

void read_groups(const job &j, const strip_rows &b, yuv_strip &s) {
    const bool luma_first = j.from.layout == yuv_layout::yuyv;
    const const_lines in = j.in(0).from(2 * b.x, b.y);
    const ptrdiff_t whole = b.width / 2;
    if (whole)
        j.rows.split_groups({in.first, in.stride, s.y[0], strip_width, s.u[0], strip_width, s.v[0],
                             strip_width, whole, b.rows, luma_first, false, false});
    if (!(b.width & 1)) return;
    for (ptrdiff_t r = 0; r < b.rows; r++) {
        // The V of a half group would lie behind the line.
        const uint8_t *const group = in.line(r) + 4 * whole;
        s.y[r][2 * whole] = group[!luma_first];
        s.u[r][whole] = group[luma_first];
        s.v[r][whole] = b.x + whole ? group[luma_first - 2] : 128;
    }
}

// Copies `width` bytes from byte x of a row of a tiled plane on; x is that of a tile.
void copy_from_tiles(const uint8_t *plane, ptrdiff_t plane_width, ptrdiff_t plane_height,
                     ptrdiff_t x, ptrdiff_t y, uint8_t *dst, ptrdiff_t width) {
    for (ptrdiff_t i = 0; i < width; i += tile_width)
        memcpy(dst + i, plane + tile_offset(plane_width, plane_height, x + i, y),
               size_t(width - i < tile_width ? width - i : tile_width));
}
void copy_to_tiles(const uint8_t *src, uint8_t *plane, ptrdiff_t plane_width,
                   ptrdiff_t plane_height, ptrdiff_t x, ptrdiff_t y, ptrdiff_t width) {
    for (ptrdiff_t i = 0; i < width; i += tile_width)
        memcpy(plane + tile_offset(plane_width, plane_height, x + i, y), src + i,
               size_t(width - i < tile_width ? width - i : tile_width));
}

void read_tiles(const job &j, const strip_rows &b, yuv_strip &s) {
    for (ptrdiff_t r = 0; r < b.rows; r++)
        copy_from_tiles(j.src.plane[0], j.width, j.height, b.x, b.y + r, s.y[r], b.width);
    // The last row of an odd height may ask for a row of chroma that has no tile.
    const ptrdiff_t height = j.height >> 1, tile_rows = (height + tile_height - 1) / tile_height;
    const ptrdiff_t row = b.y / 2 / tile_height < tile_rows ? b.y / 2 : height - 1;
    if (row < 0) {
        memset(s.u[0], 128, size_t(b.pairs()));
        memset(s.v[0], 128, size_t(b.pairs()));
        return;
    }
    uint8_t pairs[strip_width];
    copy_from_tiles(j.src.plane[1], j.width, height, b.x, row, pairs, 2 * b.pairs());
    split_pairs(j, false, pairs, s.u[0], s.v[0], b.pairs());
}

// The samples of a band: where they lie in the source, or in the strip.
planar_band read_band(const job &j, const strip_rows &b, yuv_strip &s) {
    planar_band p{{s.y[0], s.y[1]}, {s.u[0], s.u[1]}, {s.v[0], s.v[1]}};
    if (j.from.kind == format_kind::packed) {
        read_groups(j, b, s);
        return p;
    }
    if (j.from.kind == format_kind::tiled) {
        read_tiles(j, b, s);
        return p;
    }
    for (ptrdiff_t r = 0; r < b.rows; r++) p.y[r] = j.in(0).line(b.y + r) + b.x;
    if (j.from.u < 0) {
        memset(s.u[0], 128, size_t(b.pairs()));
        p.v[0] = s.u[0];
    } else if (has_pairs(j.from)) {
        split_pairs(j, j.from.layout == yuv_layout::vu, j.in(1).line(b.y >> 1) + b.x, s.u[0],
                    s.v[0], b.pairs());
    } else {
        point_to_chroma(j.from, b, p, [&j](int plane) { return j.in(plane); });
    }
    return p;
}

// YUV destinations
// ------------------------------------------------------------------------------------------

// The means of blocks of four in `rows` lines of a and of b, which may be the same, of `width` pixels
// each. In both, lines are `step` bytes apart.
void means_of_blocks(const job &j, const uint8_t *a, const uint8_t *b, ptrdiff_t step,
                     const lines &dst, ptrdiff_t width, ptrdiff_t rows) {
    const ptrdiff_t whole = width / 2, last = width - 1;
    if (whole) j.rows.mean_of_blocks(a, b, step, dst.first, dst.stride, whole, rows);
    if (width & 1)
        for (ptrdiff_t y = 0; y < rows; y++)
            dst.line(y)[whole] = uint8_t((a[y * step + last] + b[y * step + last] + 1) >> 1);
}

// A line of chroma of the destination, for `width` pixels, from one or two lines (b may be null) of
// the source. Averages the lines if there are two, and drops or repeats or averages samples. The
// result lies in the source or in `room`.
const uint8_t *chroma_line(const job &j, bool from_across, bool to_across, const uint8_t *a,
                           const uint8_t *b, uint8_t *room, ptrdiff_t width) {
    const ptrdiff_t count = (width + to_across) >> to_across;
    if (from_across == to_across) {
        if (!b) return a;
        j.rows.mean_of_lines(a, b, room, count);
    } else if (from_across) {
        for (ptrdiff_t x = 0; x < width; x += strip_width) {
            const ptrdiff_t pixels = width - x < strip_width ? width - x : strip_width;
            uint8_t means[strip_width / 2];
            if (b) j.rows.mean_of_lines(a + x / 2, b + x / 2, means, (pixels + 1) / 2);
            j.rows.twice(b ? means : a + x / 2, room + x, pixels);
        }
    } else if (!j.mean) {
        j.rows.every_second(a, room, count);
    } else {
        means_of_blocks(j, a, b ? b : a, 0, lines{room, 0}, width, 1);
    }
    return room;
}

// Whether a sample of the destination stands for more pixels than one of the source.
bool averages(const job &j) {
    const sharing from = is_rgb(j.from) ? sharing{false, false} : sharing_of(j.from);
    const sharing to = sharing_of(j.to);
    return j.mean && j.to.u >= 0 && ((to.across && !from.across) || (to.down && !from.down));
}

void copy_line(const uint8_t *src, uint8_t *dst, ptrdiff_t width) {
    if (src != dst) memcpy(dst, src, size_t(width));
}

// Where the samples of a band belong in the destination, as far as it has planes for them; else in
// the strip, from where finish_band brings them to their places.
struct target_band {
    uint8_t *y[2], *u[2], *v[2];
};
target_band place_band(const job &j, const strip_rows &b, yuv_strip &s) {
    target_band t{{s.y[0], s.y[1]}, {s.u[0], s.u[1]}, {s.v[0], s.v[1]}};
    if (j.to.kind != format_kind::planar) return t;
    for (ptrdiff_t r = 0; r < b.rows; r++) t.y[r] = j.out(0).line(b.y + r) + b.x;
    if (j.to.u < 0 || has_pairs(j.to)) return t;
    point_to_chroma(j.to, b, t, [&j](int plane) { return j.out(plane); });
    return t;
}

void write_groups(const job &j, const strip_rows &b, const planar_band &p) {
    const bool luma_first = j.to.layout == yuv_layout::yuyv;
    for (ptrdiff_t r = 0; r < b.rows; r++) {
        uint8_t *const dst = j.out(0).line(b.y + r) + 2 * b.x;
        const ptrdiff_t whole = b.width / 2;
        if (whole) j.rows.join_groups(p.y[r], p.u[r], p.v[r], dst, whole, luma_first);
        if (!(b.width & 1)) continue;
        uint8_t *const group = dst + 4 * whole;
        group[!luma_first] = p.y[r][2 * whole];
        group[luma_first] = p.u[r][whole];
    }
}

void write_pairs(const job &j, const planar_band &p, uint8_t *dst, ptrdiff_t pairs) {
    const bool v_first = j.to.layout == yuv_layout::vu;
    j.layout.pack(v_first ? p.v[0] : p.u[0], 0, v_first ? p.u[0] : p.v[0], 0, dst, 0, pairs, 1);
}

// Brings the samples of a band, which are as many as the destination has, from where they are to
// their places.
void finish_band(const job &j, const strip_rows &b, const planar_band &p, const target_band &t) {
    if (j.to.kind == format_kind::packed) return write_groups(j, b, p);
    if (j.to.kind == format_kind::tiled) {
        for (ptrdiff_t r = 0; r < b.rows; r++)
            copy_to_tiles(p.y[r], j.dst.plane[0], j.width, j.height, b.x, b.y + r, b.width);
        if (b.rows < 2) return;
        uint8_t pairs[strip_width];
        write_pairs(j, p, pairs, b.pairs());
        copy_to_tiles(pairs, j.dst.plane[1], j.width, j.height >> 1, b.x, b.y >> 1, 2 * b.pairs());
        return;
    }
    for (ptrdiff_t r = 0; r < b.rows; r++) copy_line(p.y[r], t.y[r], b.width);
    if (j.to.u < 0) return;
    if (has_pairs(j.to)) return write_pairs(j, p, j.out(1).line(b.y >> 1) + b.x, b.pairs());
    const sharing shared = sharing_of(j.to);
    const ptrdiff_t count = (b.width + shared.across) >> shared.across;
    for (ptrdiff_t r = 0; r < (shared.down ? 1 : b.rows); r++) {
        copy_line(p.u[r], t.u[r], count);
        copy_line(p.v[r], t.v[r], count);
    }
}

// From packed 4:2:2 to the chroma of every second row, or the mean of two, straight to its place: to
// planes, or to pairs U V.
bool has_way_from_groups(const job &j) {
    return j.from.kind == format_kind::packed && j.to.kind == format_kind::planar &&
           (j.to.layout == yuv_layout::uv || j.to.layout == yuv_layout::half) &&
           sharing_of(j.to).down;
}
void groups_to_420(const job &j) {
    const bool luma_first = j.from.layout == yuv_layout::yuyv, pairs = has_pairs(j.to);
    const const_lines in = j.in(0);
    const lines luma = j.out(0), of_u = j.out(j.to.u), of_v = j.out(j.to.v);
    const ptrdiff_t whole = j.width & ~ptrdiff_t(1);
    if (whole)
        j.rows.split_groups({in.first, in.stride, luma.first, luma.stride, of_u.first, of_u.stride,
                             pairs ? nullptr : of_v.first, of_v.stride, whole / 2, j.height,
                             luma_first, true, j.mean});
    if (whole == j.width) return;
    for (ptrdiff_t y = 0; y < j.height; y++) {
        const uint8_t *const last = in.line(y) + 2 * whole;
        luma.line(y)[whole] = last[!luma_first];
        if (y & 1) continue;
        const uint8_t *const below = j.mean && y + 1 < j.height ? last + in.stride : last;
        const auto mean = [&](int at) { return uint8_t((last[at] + below[at] + 1) >> 1); };
        const ptrdiff_t at = pairs ? whole : whole / 2;
        of_u.line(y >> 1)[at] = mean(luma_first);
        of_v.line(y >> 1)[at + pairs] = whole ? mean(luma_first - 2) : 128;
    }
}

// From planes to planes: each by itself, whole lines of it.
bool has_planes_alone(const format &f) {
    return f.kind == format_kind::planar && f.u >= 0 && !has_pairs(f);
}
void planes_to_planes(const job &j) {
    copy_lines(j.in(0), j.out(0), j.width, j.height);
    const sharing from = sharing_of(j.from), to = sharing_of(j.to);
    const bool across = j.mean && to.across && !from.across, down = j.mean && to.down && !from.down;
    const ptrdiff_t count = (j.width + to.across) >> to.across;
    const auto plane = [&](const const_lines &in, const lines &out) {
        ptrdiff_t y = 0;  // with means of blocks, a last line may remain
        const ptrdiff_t rows = down ? j.height >> 1 : (j.height + to.down) >> to.down;
        if (across && rows && (to.down || !from.down)) {
            means_of_blocks(j, in.first, in.line(down), in.stride * (1 + down), out, j.width, rows);
            y = rows << to.down;
        }
        for (; y < j.height; y += 1 + to.down) {
            uint8_t *const dst = out.line(y >> to.down);
            copy_line(
                chroma_line(j, from.across, to.across, in.line(y >> from.down),
                            down && y + 1 < j.height ? in.line(y + 1) : nullptr, dst, j.width),
                dst, count);
        }
    };
    plane(j.in(j.from.u), j.out(j.to.u));
    plane(j.in(j.from.v), j.out(j.to.v));
}

void yuv_to_yuv(const job &j) {
    if (has_way_from_groups(j)) return groups_to_420(j);
    if (has_planes_alone(j.from) && has_planes_alone(j.to)) return planes_to_planes(j);
    const sharing from = sharing_of(j.from), to = sharing_of(j.to);
    for_each_band(j, strip_width, 2, [&](const strip_rows &b) {
        yuv_strip read, resampled;
        planar_band p = read_band(j, b, read);
        const target_band t = place_band(j, b, resampled);
        if (j.to.u >= 0) {
            const bool two = j.mean && to.down && !from.down && b.rows == 2;
            planar_band q = p;
            for (int r = 0; r < (to.down ? 1 : b.rows); r++) {
                const int line = from.down ? 0 : r;
                q.u[r] = chroma_line(j, from.across, to.across, p.u[line], two ? p.u[1] : nullptr,
                                     t.u[r], b.width);
                q.v[r] = chroma_line(j, from.across, to.across, p.v[line], two ? p.v[1] : nullptr,
                                     t.v[r], b.width);
            }
            p = q;
        }
        finish_band(j, b, p, t);
    });
}

// YUV to RGB
// ------------------------------------------------------------------------------------------------

chroma_in chroma_in_of(const format &f) {
    if (f.kind == format_kind::packed) return chroma_in::groups;
    if (has_pairs(f) && f.kind == format_kind::planar) return chroma_in::pairs;
    return f.layout == yuv_layout::full ? chroma_in::full : chroma_in::half;
}

// Rows with the weights that they take.
struct rows_to_any {
    const yuv_to_rgb &how;
    any_to_rgb_row *row;
    any_to_rgb_row_pair *row_pair;

    void one(const uint8_t *y, const uint8_t *u, const uint8_t *v, uint8_t *dst,
             ptrdiff_t width) const {
        row(how, y, u, v, dst, width);
    }
    void two(const uint8_t *y0, const uint8_t *y1, const uint8_t *u, const uint8_t *v,
             uint8_t *dst0, uint8_t *dst1, ptrdiff_t width) const {
        row_pair(how, y0, y1, u, v, dst0, dst1, width);
    }
};

void yuv_to_rgb_pictures(const job &j) {
    const yuv_to_rgb how{to_rgb_weights[j.colour], j.from.layout == yuv_layout::vu,
                         j.from.layout == yuv_layout::yuyv, is_blue_first(j.to.packing),
                         is_alpha_first(j.to.packing)};
    const size_t in = size_t(chroma_in_of(j.from)), kind = size_t(kind_of(j.to.packing));
    const auto rows_in = [&](const row_table &t) {
        return rows_to_any{how, t.any.to_rgb[in][kind], t.any.to_rgb_pair[in][kind]};
    };
    const lines out = j.out(0);
    if (j.from.kind != format_kind::tiled && j.from.u >= 0) {
        // Rows read what lies in linear planes, whole lines of it.
        const planes_to_rgb p{
            j.from.layout, sharing_of(j.from).down, j.in(0), j.in(j.from.u), j.in(j.from.v),
            out,           j.to.bytes[0],           j.width, j.height,       0};
        // A row makes vectors of the weights first, which takes as long as half of the widest one.
        return convert_planes(p, live_rows().vector > 32 ? 32 : 16, rows_in);
    }
    const rows_to_any rows = rows_in(j.live);
    for_each_band(j, strip_width, 2, [&](const strip_rows &b) {
        yuv_strip strip;
        const planar_band p = read_band(j, b, strip);
        uint8_t *const dst = out.line(b.y) + b.x * j.to.bytes[0];
        if (b.rows == 2)
            rows.two(p.y[0], p.y[1], p.u[0], p.v[0], dst, dst + out.stride, b.width);
        else
            rows.one(p.y[0], p.u[0], p.v[0], dst, b.width);
    });
}

// RGB
// ------------------------------------------------------------------------------------------------

// Planes of the channels of a strip, in the order of memory.
struct rgb_strip {
    uint8_t c[3][strip_width];
};
void split_pixels(const job &j, const uint8_t *src, rgb_strip &s, ptrdiff_t width) {
    uint8_t *const channels[] = {s.c[0], s.c[1], s.c[2]};
    j.rows.split_pixels[size_t(rgb_in_of(j.from.packing))](src, channels, width);
}

template <class T>
void exchange(T &a, T &b) {
    const T was_a = a;
    a = b;
    b = was_a;
}
rgb_weights in_memory_order(rgb_weights w, rgb_packing packing) {
    w.alpha_first = is_alpha_first(packing);
    if (!is_blue_first(packing)) return w;
    exchange(w.y[0], w.y[2]);
    exchange(w.u[0], w.u[2]);
    exchange(w.v[0], w.v[2]);
    return w;
}

// The chroma of each pixel of a line, or of the mean of it and the one below, if b is not null.
void chroma_of_pixels(const job &j, const rgb_weights &w, const uint8_t *a, const uint8_t *b,
                      uint8_t *u, uint8_t *v, ptrdiff_t width) {
    rgb_strip of_a, of_b, means;
    const uint8_t *channels[3];
    split_pixels(j, a, of_a, width);
    if (b) split_pixels(j, b, of_b, width);
    for (int k = 0; k < 3; k++) {
        if (b) j.rows.mean_of_lines(of_a.c[k], of_b.c[k], means.c[k], width);
        channels[k] = b ? means.c[k] : of_a.c[k];
    }
    j.rows.chroma(w, channels, u, v, width);
}

// The last pixels of lines, or of pairs of them, each as the first of two, whose second has no meaning.
void convert_rgb_column(const job &j, const rgb_weights &w, any_to_yuv_row *row, int chroma_bytes,
                        ptrdiff_t at_once) {
    const ptrdiff_t last = j.width - 1;
    const int size = j.from.bytes[0];
    uint8_t pixels[2][4 * column_pixels] = {}, y[2][column_pixels], u[column_pixels],
                          v[column_pixels];
    in_column_blocks(j.height / at_once, column_pixels / 2, [&](ptrdiff_t first, ptrdiff_t count) {
        for (ptrdiff_t r = 0; r < at_once; r++)
            copy_lines(j.in(0).from(size * last, at_once * first + r, at_once),
                       {pixels[r], 2 * size}, size, count);
        row(w, pixels[0], at_once == 2 ? pixels[1] : nullptr, y[0], y[1],
            chroma_bytes ? u : nullptr, chroma_bytes == 1 ? v : nullptr, 2 * count);
        for (ptrdiff_t r = 0; r < at_once; r++)
            copy_lines(const_lines{y[r], 2}, j.out(0).from(last, at_once * first + r, at_once), 1,
                       count);
        if (!chroma_bytes) return;
        const ptrdiff_t x = chroma_bytes * (last / 2);
        copy_lines(const_lines{u, chroma_bytes}, j.out(j.to.u).from(x, first), chroma_bytes, count);
        if (chroma_bytes == 1)
            copy_lines(const_lines{v, 1}, j.out(j.to.v).from(x, first), 1, count);
    });
}

void rgb_to_yuv_pictures(const job &j) {
    rgb_weights w = in_memory_order(to_yuv_weights[j.colour], j.from.packing);
    w.mean = averages(j);
    any_to_yuv_row *const row = j.rows.to_yuv[size_t(kind_of(j.from.packing))];
    const sharing to = sharing_of(j.to);
    // Rows give the chroma of every second pixel, or of two.
    const bool by_rows = j.to.u >= 0 && to.across;
    const ptrdiff_t rows_at_once = to.down ? 2 : 1;
    if (j.to.u < 0 || (by_rows && j.to.kind == format_kind::planar)) {
        // Straight to their places, whole lines of them.
        const bool pairs = by_rows && has_pairs(j.to), planes = by_rows && !pairs;
        if (pairs && j.to.layout == yuv_layout::vu)
            for (int k = 0; k < 3; k++) exchange(w.u[k], w.v[k]);
        const int of_u = by_rows ? j.to.u : 0, of_v = by_rows ? j.to.v : 0;
        const const_lines in = j.in(0);
        const lines luma = j.out(0), u = j.out(of_u), v = j.out(of_v);
        const ptrdiff_t chroma_bytes = !by_rows ? 0 : pairs ? 2 : 1;
        const ptrdiff_t chroma_line = chroma_bytes * ((j.width + 1) / 2);
        // Means would take the second of two.
        const bool column = !w.mean && column_of(j.live, by_rows, 0, j.width, j.height).width > 0 &&
                            lie_apart(luma, j.width) && lie_apart(u, chroma_line) &&
                            lie_apart(v, chroma_line);
        for (ptrdiff_t y = 0; y < j.height; y += rows_at_once) {
            const bool two = to.down && y + 1 < j.height;
            const ptrdiff_t line = y >> to.down;
            // The column has no row that is alone in its pair.
            row(w, in.line(y), two ? in.line(y + 1) : nullptr, luma.line(y),
                two ? luma.line(y + 1) : nullptr, by_rows ? u.line(line) : nullptr,
                planes ? v.line(line) : nullptr,
                column && (two || !to.down) ? j.width - 1 : j.width);
        }
        if (column) convert_rgb_column(j, w, row, int(chroma_bytes), rows_at_once);
        return;
    }
    for_each_band(j, strip_width, 2, [&](const strip_rows &b) {
        yuv_strip strip;
        const target_band t = place_band(j, b, strip);
        const auto line = [&](ptrdiff_t r) -> const uint8_t * {
            return j.in(0).line(b.y + r) + b.x * j.from.bytes[0];
        };
        for (ptrdiff_t r = 0; r < b.rows; r += rows_at_once) {
            const uint8_t *const below = to.down && b.rows == 2 ? line(1) : nullptr;
            row(w, line(r), below, t.y[r], t.y[1], by_rows ? t.u[r] : nullptr, t.v[r], b.width);
            if (by_rows) continue;
            chroma_of_pixels(j, w, line(r), w.mean ? below : nullptr, t.u[r], t.v[r], b.width);
        }
        finish_band(j, b, {{t.y[0], t.y[1]}, {t.u[0], t.u[1]}, {t.v[0], t.v[1]}}, t);
    });
}

void rgb_to_rgb(const job &j) {
    const repacking order{is_blue_first(j.from.packing) != is_blue_first(j.to.packing),
                          is_alpha_first(j.from.packing), is_alpha_first(j.to.packing)};
    repack_row *const row =
        j.rows.repack[size_t(kind_of(j.from.packing))][size_t(kind_of(j.to.packing))];
    walk_one_plane(
        j.live, j.in(0), j.from.bytes[0], j.out(0), j.to.bytes[0], j.width, j.height,
        [&](const uint8_t *src, uint8_t *dst, ptrdiff_t count) { row(order, src, dst, count); });
}

// Equal formats.
void copy_picture(const job &j) {
    if (j.from.kind == format_kind::tiled) return yuv_to_yuv(j);
    for (int k = 0; k < j.from.planes; k++) {
        const ptrdiff_t width = (j.width + j.from.x_shift[k]) >> j.from.x_shift[k];
        const ptrdiff_t height = (j.height + j.from.y_shift[k]) >> j.from.y_shift[k];
        copy_lines(j.in(k), j.out(k), width * j.from.bytes[k], height);
    }
}

}  // namespace
}  // namespace simgp

using namespace simgp;

int32_t simgp_csc_any(const simgp_img *src, const simgp_img *dst, int32_t colour) {
    const format *const from = find_format(src->format), *const to = find_format(dst->format);
    const bool mean = colour & SIMGP_CHROMA_MEAN;
    const int32_t matrix = colour & ~SIMGP_CHROMA_MEAN;
    if (!from || !to || matrix < 0 || matrix >= colours) return SIMGP_ERR_PARAM;
    const ptrdiff_t width = src->width[0], height = src->height[0];
    if (width < 1 || height < 1) return SIMGP_OK;
    if (colour == SIMGP_COLOUR_BT601 && simgp_csc(src, dst) == SIMGP_OK) return SIMGP_OK;

    // From YUV to YUV it is rows of chroma that are the shortest.
    const row_table &live = live_rows(is_rgb(*from) || is_rgb(*to) ? width : (width + 1) / 2);
    const job j{*from, *to, *src, *dst, matrix, mean, width, height, live, live.any, live.layout};
    if (from == to)
        copy_picture(j);
    else if (is_rgb(*from))
        is_rgb(*to) ? rgb_to_rgb(j) : rgb_to_yuv_pictures(j);
    else
        is_rgb(*to) ? yuv_to_rgb_pictures(j) : yuv_to_yuv(j);
    return SIMGP_OK;
}
