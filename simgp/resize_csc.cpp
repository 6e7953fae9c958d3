// Resize and conversion in one pass: strips of columns, whose lines of luma and chroma are resampled
// on the stack and converted from there.
#include "simgp/resize_csc.h"

#include "simgp/resample.h"
#include "simgp/tile_offset.h"
#include "simgp/walk.h"

namespace simgp {
namespace {

// The sizes of the grids. Luma and chroma lie on grids of their own.
struct grid {
    int32_t src_width, src_height, dst_width, dst_height;

    bool fits() const {
        return resize_spread(src_width, dst_width).fits &&
               resize_spread(src_height, dst_height).fits;
    }
};
struct grids {
    grid luma, chroma;

    bool fit() const { return luma.fits() && chroma.fits(); }
};
// Half of n >= 1, rounded up.
int32_t half(int32_t n) { return n / 2 + n % 2; }

// Of the tiled layout, only the size of luma is given.
template <const format &From>
grids grids_of(const int32_t *src_widths, const int32_t *src_heights, const int32_t *dst_widths,
               const int32_t *dst_heights) {
    const int32_t width = dst_widths[0], height = dst_heights[0];
    const grid luma{src_widths[0], src_heights[0], width, height};
    if constexpr (From.kind == format_kind::tiled) {
        const int32_t pairs = src_widths[0] / 2;
        return {luma, {pairs ? pairs : 1, half(src_heights[0]), half(width), half(height)}};
    } else {
        return {luma, {src_widths[1], src_heights[1], half(width), half(height)}};
    }
}

// The resampled lines of a strip as a source of lines, see walk.h: two are made at a time.
template <class Source>
class line_pairs {
  public:
    line_pairs(const resampling &r, const resize_strip &strip, const Source &source,
               ptrdiff_t height, uint8_t *ring, uint8_t *lines)
        : made_(r, strip, source, ring),
          height_(height),
          stride_(strip.columns * r.pixel_bytes),
          lines_(lines) {}

    const uint8_t *fetch(ptrdiff_t y) {
        if (y >= end_) {
            first_ = y;
            end_ = y + 1 < height_ ? y + 2 : y + 1;
            made_.make(first_, end_ - first_, lines_, stride_);
        }
        return lines_ + (y - first_) * stride_;
    }

  private:
    resampled_lines<Source> made_;
    ptrdiff_t height_, stride_, first_ = 0, end_ = 0;
    uint8_t *lines_;
};

// Where chroma comes in pairs, there is no third source.
struct no_lines {
    const uint8_t *fetch(ptrdiff_t) const { return nullptr; }
};

// A tiled plane of width bytes x height rows: the bytes of a row from `first` on, put together in
// `row`. It may have one row more than the plane: that of its tile, although it lies below the last
// row of the plane, the last row again where there is no such tile, and mid-grey where there is no
// row.
class tiled_rows {
  public:
    tiled_rows(const uint8_t *plane, ptrdiff_t width, ptrdiff_t height, ptrdiff_t first,
               ptrdiff_t count, uint8_t *row)
        : plane_(plane), width_(width), height_(height), first_(first), count_(count), row_(row) {}

    const uint8_t *fetch(ptrdiff_t y) const {
        if (y >= height_ && y % tile_height == 0) y = height_ - 1;
        if (y < 0) {
            memset(row_, 128, size_t(count_));
            return row_;
        }
        const auto bytes_at = [this, y](ptrdiff_t x) {
            return plane_ + tile_offset(width_, height_, x, y);
        };
        ptrdiff_t i = 0;
        const ptrdiff_t start = first_ % tile_width;
        if (start > 0) {
            i = count_ < tile_width - start ? count_ : tile_width - start;
            memcpy(row_, bytes_at(first_), size_t(i));
        }
        for (; i + tile_width <= count_; i += tile_width)
            memcpy(row_ + i, bytes_at(first_ + i), tile_width);
        if (i < count_) memcpy(row_ + i, bytes_at(first_ + i), size_t(count_ - i));
        return row_;
    }

  private:
    const uint8_t *plane_;
    ptrdiff_t width_, height_, first_, count_;
    uint8_t *row_;
};

// What one strip needs of memory for luma or chroma: a plan, and for each plane what is kept and two
// lines.
struct plane_memory {
    uint8_t *plan, *ring[2], *lines[2];

    plane_memory(memory_pieces &from, const resampling &r, ptrdiff_t columns, int planes)
        : plan(from.take(r.plan_bytes(columns))), ring(), lines() {
        for (int k = 0; k < planes; k++) {
            ring[k] = from.take(r.ring_bytes(columns));
            lines[k] = from.take(2 * columns * r.pixel_bytes);
        }
    }
};

// Columns of luma and the columns of chroma that serve them: luma.x is even, unless there is but one
// column.
struct span {
    ptrdiff_t x, columns;

    span chroma() const { return {x / 2, (columns + 1) / 2}; }
};

// The columns, resampled and converted. Rows of tiles have to be put together, one at a time.
template <const format &From>
class fused {
    static constexpr bool tiled = From.kind == format_kind::tiled;
    static constexpr int chroma_planes = From.u == From.v ? 1 : 2;
    static constexpr ptrdiff_t memory_size = 10240;

  public:
    fused(const grids &sizes, uint8_t *const *planes, const int32_t *strides, const lines &dst)
        : width_(sizes.luma.dst_width),
          height_(sizes.luma.dst_height),
          src_width_(sizes.luma.src_width),
          src_height_(sizes.luma.src_height),
          chroma_height_(sizes.chroma.dst_height),
          luma_(resampling_of(resize_kind::bytes1, sizes.luma)),
          chroma_(resampling_of(chroma_planes == 1 ? resize_kind::bytes2 : resize_kind::bytes1,
                                sizes.chroma)),
          planes_(planes),
          strides_(strides),
          dst_(dst) {}

    void run() const {
        const ptrdiff_t columns = columns_of_strips(width_, [this](ptrdiff_t n) {
            memory_pieces wanted{nullptr};
            const memory all(wanted, *this, {0, n});
            return wanted.used <= memory_size;
        });
        resample_memory<memory_size> room;
        for (ptrdiff_t x = 0; x < width_; x += columns)
            convert({x, width_ - x < columns ? width_ - x : columns}, {room.bytes});
    }

  private:
    // The whole of it.
    struct memory {
        plane_memory luma, chroma;
        uint8_t *row;

        memory(memory_pieces &from, const fused &f, const span &at)
            : luma(from, f.luma_, at.columns, 1),
              chroma(from, f.chroma_, at.chroma().columns, chroma_planes),
              row(tiled ? from.take(f.most_bytes(at.columns)) : nullptr) {}
    };
    // Of a row of tiles, for so many columns.
    ptrdiff_t most_bytes(ptrdiff_t columns) const {
        const ptrdiff_t y = luma_.most_of_rows(columns);
        const ptrdiff_t pairs = 2 * chroma_.most_of_rows((columns + 1) / 2);
        return y > pairs ? y : pairs;
    }

    static resampling resampling_of(resize_kind kind, const grid &g) {
        return {kind, resize_spread(g.src_width, g.dst_width).packed(),
                resize_spread(g.src_height, g.dst_height).packed(), tiled};
    }

    // The lines of a plane as the strip wants them.
    source_span span_of(const resampling &r, const span &at, ptrdiff_t width) const {
        return tiled ? r.part_of_rows(at.x, at.columns) : r.whole_rows(width);
    }
    auto rows_of(int plane, const source_span &part, uint8_t *row) const {
        if constexpr (tiled)
            return tiled_rows(planes_[plane], src_width_, plane ? src_height_ / 2 : src_height_,
                              (plane ? 2 : 1) * part.first, (plane ? 2 : 1) * part.columns, row);
        else
            return const_lines{planes_[plane], strides_[plane]};
    }

    void convert(const span &at, memory_pieces pieces) const {
        const memory m(pieces, *this, at);
        const span chroma_at = at.chroma();
        const source_span of_luma = span_of(luma_, at, width_),
                          of_chroma = span_of(chroma_, chroma_at, (width_ + 1) / 2);
        const resize_strip luma = luma_.plan(at.x, at.columns, of_luma, m.luma.plan);
        const resize_strip chroma =
            chroma_.plan(chroma_at.x, chroma_at.columns, of_chroma, m.chroma.plan);

        line_pairs y(luma_, luma, rows_of(0, of_luma, m.row), height_, m.luma.ring[0],
                     m.luma.lines[0]);
        const auto of_plane = [&](int plane, int k) {
            return line_pairs(chroma_, chroma, rows_of(plane, of_chroma, m.row), chroma_height_,
                              m.chroma.ring[k], m.chroma.lines[k]);
        };
        const auto walk = [&](auto &&u, auto &&v) {
            walk_yuv_to_rgb<like_, formats::RGB565, yuv_rule::usual>(
                y, u, v, dst_, {at.x, at.columns, height_}, 0);
        };
        if constexpr (chroma_planes == 1)
            walk(of_plane(From.u, 0), no_lines());
        else
            walk(of_plane(From.u, 0), of_plane(From.v, 1));
    }

    // Whose rows convert it.
    static constexpr const format &like_ = tiled ? formats::NV12 : From;

    ptrdiff_t width_, height_, src_width_, src_height_, chroma_height_;
    resampling luma_, chroma_;
    uint8_t *const *planes_;
    const int32_t *strides_;
    lines dst_;
};

template <const format &From>
void resize_and_convert(uint8_t *const *src_planes, const int32_t *src_widths,
                        const int32_t *src_heights, const int32_t *src_strides,
                        const int32_t *dst_widths, const int32_t *dst_heights,
                        const int32_t *dst_strides, uint8_t *const *dst_planes) {
    if (dst_widths[0] < 1 || dst_heights[0] < 1) return;
    const fused<From> all(grids_of<From>(src_widths, src_heights, dst_widths, dst_heights),
                          src_planes, src_strides,
                          whole_pixel_lines(lines{dst_planes[0], dst_strides[0]}, 2));
    all.run();
}

}  // namespace
}  // namespace simgp

using namespace simgp;

#define KERNEL(name, from)                                                                       \
    void name(uint8_t *const *src_planes, const int32_t *src_widths, const int32_t *src_heights, \
              const int32_t *src_strides, const int32_t *dst_widths, const int32_t *dst_heights, \
              const int32_t *dst_strides, uint8_t *const *dst_planes) {                          \
        resize_and_convert<formats::from>(src_planes, src_widths, src_heights, src_strides,      \
                                          dst_widths, dst_heights, dst_strides, dst_planes);     \
    }
KERNEL(simgp_rsz_csc_yuv420_to_rgb565, YUV420)
KERNEL(simgp_rsz_csc_t64x32_to_rgb565, T64X32)
#undef KERNEL

int32_t simgp_rsz_csc(const simgp_img *src, const simgp_img *dst) {
    if (src->format == dst->format) return SIMGP_ERR_PARAM;
    const bool tiled = src->format == SIMGP_FMT_T64X32;
    if ((!tiled && src->format != SIMGP_FMT_YUV420) || dst->format != SIMGP_FMT_RGB565)
        return SIMGP_ERR_UNSUPPORTED;
    const grids sizes =
        (tiled ? grids_of<formats::T64X32> : grids_of<formats::YUV420>)(src->width, src->height,
                                                                        dst->width, dst->height);
    if (!sizes.fit()) return SIMGP_ERR_PARAM;
    (tiled ? simgp_rsz_csc_t64x32_to_rgb565 : simgp_rsz_csc_yuv420_to_rgb565)(
        src->plane, src->width, src->height, src->stride, dst->width, dst->height, dst->stride,
        dst->plane);
    return SIMGP_OK;
}
