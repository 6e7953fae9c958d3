// Resize and conversion in one pass: the lines of luma and chroma of a strip of columns are resampled
// on the stack, and converted from there.
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

// The resampled lines of a strip as a source of lines, see walk.h: one or two are made at a time, in a
// ring of three, so that the one that was asked for last stays.
inline constexpr ptrdiff_t lines_in_ring = 3;
template <class Source>
class line_ring {
  public:
    line_ring(const resampling &r, const resize_strip &strip, const Source &source,
              ptrdiff_t height, uint8_t *kept, uint8_t *lines)
        : made_(r, strip, source, kept),
          height_(height),
          stride_(strip.columns * r.pixel_bytes),
          lines_(lines) {}

    const uint8_t *fetch(ptrdiff_t y) {
        uint8_t *const line = lines_ + y % lines_in_ring * stride_;
        const bool wraps = y % lines_in_ring == lines_in_ring - 1;
        if (y >= end_)
            end_ = y + made_.make_some(y, height_, line,
                                       wraps ? (1 - lines_in_ring) * stride_ : stride_);
        return line;
    }

  private:
    resampled_lines<Source> made_;
    ptrdiff_t height_, stride_, end_ = 0;
    uint8_t *lines_;
};

// Where chroma comes in pairs, there is no third source.
struct no_lines {
    const uint8_t *fetch(ptrdiff_t) const { return nullptr; }
};

// A plane of tiles, `width` bytes x `height` rows, that is wanted from byte `first`, a multiple of
// tile_width, to byte `end` of its rows, up to row `rows` - 1. There may be one row more than the
// plane has: that of its tile, although it lies below the last row of the plane, the last row again
// where there is no such tile, and mid-grey where there is no row.
struct tiled_part {
    const uint8_t *plane;
    ptrdiff_t width, height, first, end, rows;

    const uint8_t *at(ptrdiff_t x, ptrdiff_t y) const {
        return plane + tile_offset(width, height, x, y);
    }
};

// From this size on, tiles are asked for ahead. Of 1920 x 1080 it costs as much as it brings.
constexpr int64_t tiles_fetched_from = 1 << 22;

// Its rows in one piece, as a source of lines: bands of rows that lie in the same tiles are put
// together at once, and the latest of them stay.
class untiled_rows {
  public:
    // Rows that are asked for one at a time; or four of them, which span at most five rows (of a
    // plane that is not decimated), or lie apart.
    enum class access { single, near, far };
    static constexpr int max_bands = 4;
    static constexpr int rows_of(access a) {
        return a == access::single ? 2 : a == access::near ? 6 : 4;
    }

    // `memory` has rows_of(a) rows.
    untiled_rows(const tiled_part &part, access a, uint8_t *memory, ptrdiff_t stride)
        : part_(part),
          band_(a == access::far ? 1 : 2),
          bands_(rows_of(a) / band_),
          memory_(memory),
          stride_(stride),
          fetch_(int64_t(part.width) * part.height >= tiles_fetched_from),
          detile_(live_rows().tile.detile) {}

    [[gnu::noinline]] const uint8_t *fetch(ptrdiff_t y) {
        if (y >= part_.height && y % tile_height == 0) y = part_.height - 1;
        const ptrdiff_t band = y < 0 ? 0 : y / band_ * band_;
        int at = 0;
        while (at < bands_ && held_[at] != band) at++;
        if (at == bands_) {
            at = next_;
            next_ = next_ + 1 < bands_ ? next_ + 1 : 0;
            held_[at] = band;
            if (y < 0)
                memset(line(at), 128, size_t(part_.end - part_.first));
            else
                put_together(line(at), band);
        }
        return line(at) + (y < 0 ? 0 : y - band) * stride_;
    }

  private:
    uint8_t *line(int band) const { return memory_ + band * band_ * stride_; }

    // Of a large plane, the rows after next are asked for: they are two lines of the cache of each
    // tile, and the processor does not foresee so many.
    void put_together(uint8_t *to, ptrdiff_t y) const {
        const ptrdiff_t rows = part_.rows - y < band_ ? part_.rows - y : band_;
        ptrdiff_t x = part_.first;
        for (; x + tile_width <= part_.end; x += tile_width, to += tile_width) {
            const uint8_t *const from = part_.at(x, y);
            for (int k = 0; fetch_ && k < band_; k++)
                __builtin_prefetch(reinterpret_cast<const void *>(
                    reinterpret_cast<uintptr_t>(from) + uintptr_t((2 * band_ + k) * tile_width)));
            detile_(from, to, stride_, rows);
        }
        if (x < part_.end)
            copy_lines({part_.at(x, y), tile_width}, {to, stride_}, part_.end - x, rows);
    }

    tiled_part part_;
    int band_, bands_;
    uint8_t *memory_;
    ptrdiff_t stride_;
    bool fetch_;
    detile_rows *detile_;
    ptrdiff_t held_[max_bands] = {-1, -1, -1, -1};
    int next_ = 0;
};

// The memory of a strip for luma or chroma: a plan, and for each plane what is kept and some lines.
struct plane_memory {
    uint8_t *plan, *ring[2], *lines[2];

    [[gnu::noinline]] plane_memory(memory_pieces &from, const resampling &r, ptrdiff_t columns,
                                   int planes)
        : plan(from.take(r.plan_bytes(columns))), ring(), lines() {
        for (int k = 0; k < planes; k++) {
            ring[k] = from.take(r.ring_bytes(columns));
            lines[k] = from.take(lines_in_ring * columns * r.pixel_bytes);
        }
    }
};

// Columns of luma, and those of chroma that serve them. x is even, unless there is but one column.
struct span {
    ptrdiff_t x, columns;

    span chroma() const { return {x / 2, (columns + 1) / 2}; }
};

// The columns, resampled and converted.
template <const format &From>
class fused {
    static constexpr bool tiled = From.kind == format_kind::tiled;
    static constexpr int chroma_planes = From.u == From.v ? 1 : 2;
    // With the frames of rows, some of which keep ten vector registers for Windows, less than 16 KiB.
    static constexpr ptrdiff_t memory_size = 10112;
    // Whose rows convert it.
    static constexpr const format &like = tiled ? formats::NV12 : From;

  public:
    fused(const grids &sizes, uint8_t *const *planes, const int32_t *strides, const lines &dst)
        : sizes_(sizes),
          luma_(resampling_of(resize_kind::bytes1, sizes.luma)),
          chroma_(resampling_of(chroma_planes == 1 ? resize_kind::bytes2 : resize_kind::bytes1,
                                sizes.chroma)),
          planes_(planes),
          strides_(strides),
          dst_(dst) {}

    void run() const {
        const ptrdiff_t width = sizes_.luma.dst_width;
        const ptrdiff_t columns = columns_of_strips(width, [this](ptrdiff_t n) {
            memory_pieces wanted{nullptr};
            const memory all(wanted, *this, {0, n});
            return wanted.used <= memory_size;
        });
        resample_memory<memory_size> room;
        for (ptrdiff_t x = 0; x < width; x += columns)
            convert({x, width - x < columns ? width - x : columns}, {room.bytes});
    }

  private:
    static resampling resampling_of(resize_kind kind, const grid &g) {
        return {kind, resize_spread(g.src_width, g.dst_width).packed(),
                resize_spread(g.src_height, g.dst_height).packed()};
    }

    // The whole of it.
    struct memory {
        plane_memory luma, chroma;
        uint8_t *luma_rows, *chroma_rows;

        memory(memory_pieces &from, const fused &f, const span &at)
            : luma(from, f.luma_, at.columns, 1),
              chroma(from, f.chroma_, at.chroma().columns, chroma_planes),
              luma_rows(rows(from, f.luma_, at)),
              chroma_rows(rows(from, f.chroma_, at.chroma())) {}

      private:
        static uint8_t *rows(memory_pieces &from, const resampling &r, const span &at) {
            if (!tiled) return nullptr;
            return from.take(untiled_rows::rows_of(access_of(r)) * row_stride(r, at.columns));
        }
    };

    // Rows of tiles that are put together: how they are asked for, and the room for one.
    static untiled_rows::access access_of(const resampling &r) {
        using access = untiled_rows::access;
        return r.keeps() ? access::single : r.y.shift == 0 ? access::near : access::far;
    }
    static ptrdiff_t row_stride(const resampling &r, ptrdiff_t columns) {
        const ptrdiff_t most = r.most_of_rows(columns) * r.pixel_bytes + tile_width - 1;
        return (most + tile_width - 1) & -tile_width;
    }
    // Which columns of the source a span needs: of tiles, from the begin of one.
    source_span span_of(const resampling &r, const span &at, const grid &g) const {
        if (!tiled) return r.whole_rows(g.dst_width);
        const source_span part = r.part_of_rows(at.x, at.columns);
        const ptrdiff_t first = part.first & -(tile_width / r.pixel_bytes);
        return {first, part.first + part.columns - first};
    }
    auto rows_of(int plane, const resampling &r, const span &at, const grid &g,
                 uint8_t *room) const {
        if constexpr (tiled) {
            const source_span part = span_of(r, at, g);
            const ptrdiff_t first = part.first * r.pixel_bytes;
            return untiled_rows({planes_[plane], sizes_.luma.src_width,
                                 plane ? sizes_.luma.src_height / 2 : sizes_.luma.src_height, first,
                                 first + part.columns * r.pixel_bytes, r.y.extent(g.dst_height)},
                                access_of(r), room, row_stride(r, at.columns));
        } else {
            return const_lines{planes_[plane], strides_[plane]};
        }
    }

    void convert(const span &at, memory_pieces pieces) const {
        const memory m(pieces, *this, at);
        const grid &of_luma = sizes_.luma, &of_chroma = sizes_.chroma;
        const span pairs = at.chroma();
        const resize_strip luma =
            luma_.plan(at.x, at.columns, span_of(luma_, at, of_luma), m.luma.plan);
        const resize_strip chroma =
            chroma_.plan(pairs.x, pairs.columns, span_of(chroma_, pairs, of_chroma), m.chroma.plan);

        line_ring y(luma_, luma, rows_of(0, luma_, at, of_luma, m.luma_rows), of_luma.dst_height,
                    m.luma.ring[0], m.luma.lines[0]);
        const auto plane = [&](int which, int k) {
            return line_ring(chroma_, chroma,
                             rows_of(which, chroma_, pairs, of_chroma, m.chroma_rows),
                             of_chroma.dst_height, m.chroma.ring[k], m.chroma.lines[k]);
        };
        const auto walk = [&](auto &&u, auto &&v) {
            const auto how = conversion_of<like, formats::RGB565, yuv_rule::usual>();
            walk_rows(line_rows(simgp::rows_of(how), at.columns), y, u, v, dst_.from(2 * at.x, 0),
                      of_luma.dst_height, 0);
        };
        if constexpr (chroma_planes == 1)
            walk(plane(From.u, 0), no_lines());
        else
            walk(plane(From.u, 0), plane(From.v, 1));
    }

    grids sizes_;
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
