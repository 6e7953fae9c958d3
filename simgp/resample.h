// The resampler: lines of a resized plane, made when they are wanted, from wherever the rows of the
// source come. The kernels that resize share it:
//
//     const resampling r(resize_kind::bytes1, step_x, step_y);
//     resample_plane(r, src, width, [&](auto &made, ptrdiff_t x, ptrdiff_t) {
//         made.make(0, height, dst.first + x * r.pixel_bytes, dst.stride);
//     });
#ifndef SIMGP_RESAMPLE_H
#define SIMGP_RESAMPLE_H

#include "rows/choose.h"
#include "simgp/kernel.h"
#include "simgp/resize.h"

namespace simgp {

// One axis of a resize: where the samples of the destination lie in the source.
struct resize_axis {
    uint32_t step;
    int32_t shift;

    // From a packed step.
    explicit resize_axis(int32_t packed) : step(uint32_t(packed >> 3)), shift(packed & 7) {}

    // Positions are 32-bit numbers.
    uint32_t at(ptrdiff_t i) const { return uint32_t(i) * step; }
    ptrdiff_t tap() const { return ptrdiff_t(1) << shift; }
    // Of a position: the neighbour before it, the phase, and the second neighbour, which is the first
    // again where it has no weight.
    ptrdiff_t cell_at(uint32_t at) const { return ptrdiff_t(int32_t(at) >> 18) * tap(); }
    static int32_t phase_at(uint32_t at) { return int32_t(at >> 15 & 7); }
    ptrdiff_t next_at(uint32_t at) const { return cell_at(at) + (phase_at(at) ? tap() : 0); }
    // The same of a sample.
    ptrdiff_t cell(ptrdiff_t i) const { return cell_at(at(i)); }
    int32_t phase(ptrdiff_t i) const { return phase_at(at(i)); }
    ptrdiff_t next(ptrdiff_t i) const { return next_at(at(i)); }
    // How far n samples reach, to the nearest sample that may be a neighbour.
    ptrdiff_t reach(ptrdiff_t n) const { return ptrdiff_t((at(n) + (1 << 17)) >> 18) * tap(); }
    // How much of the source the first n >= 1 samples need.
    ptrdiff_t extent(ptrdiff_t n) const { return next(n - 1) + 1; }
};

// The step of an axis that spreads `to` samples over `from`. Packed it is a number of 29 bits, with
// its sign, and positions are of 32: within 8192 units, and less than 1024 of them from a sample to
// the next.
struct resize_spread {
    bool fits = false;
    int32_t step = 0, shift = 0;

    resize_spread(int32_t from, int32_t to) {
        if (from < 1 || to < 1) return;
        while (shift < 4 && from / to > 2 << shift) shift++;
        const int32_t units = (from - 1) >> shift;
        if (units >= 1 << 13 || units / to >= 1 << 10) return;
        step = units * (1 << 18) / to;
        fits = true;
    }
    int32_t packed() const { return fits ? step * 8 | shift : 0; }
};

// Which part of the source's rows is handed over: from a column on, so many columns.
struct source_span {
    ptrdiff_t first, columns;
};

// Stack memory for plans and kept rows, as much as a kernel has for them.
inline constexpr ptrdiff_t resample_stack = 10752;
template <size_t Size>
struct resample_memory {
    static constexpr ptrdiff_t size = Size;
    alignas(resize_alignment) uint8_t bytes[Size];
};

// Memory that is handed out piece by piece. Without memory it only adds up what is asked for.
struct memory_pieces {
    uint8_t *memory;
    ptrdiff_t used = 0;

    uint8_t *take(ptrdiff_t size) {
        uint8_t *const piece = memory ? memory + used : nullptr;
        used += (size + resize_alignment - 1) & -ptrdiff_t(resize_alignment);
        return piece;
    }
};

// How wide strips are that `fits` says yes to: as many columns as suit all instruction sets, or an even
// number, or 1, which always fits.
template <class Fits>
ptrdiff_t columns_of_strips(ptrdiff_t width, Fits fits) {
    constexpr ptrdiff_t suits = 128;
    for (ptrdiff_t strips = 1;; strips++) {
        const ptrdiff_t least = (width + strips - 1) / strips;
        const ptrdiff_t unit = least > suits ? suits : 2;
        const ptrdiff_t columns = (least + unit - 1) & -unit;
        if (fits(columns < width ? columns : width)) return columns;
        if (least == 1) return 1;
    }
}

// What all strips of a resize share.
class resampling {
  public:
    // Where the step from a line to the next is short, most rows are wanted for several lines:
    // they are blended across once, and the two latest kept. The other way, two rows are blended at
    // once for each line, and a source must be able to hand over four rows at a time.
    resampling(resize_kind kind, int32_t step_x, int32_t step_y);

    const ptrdiff_t pixel_bytes;
    const resize_loops &loops;
    const resize_axis x, y;

    bool keeps() const { return strip_.keeps; }

    // The memory of a strip's plan, and of the two rows that are kept for its lines: multiples of
    // the alignment.
    ptrdiff_t plan_bytes(ptrdiff_t columns) const { return whole(columns, strip_.plan_bytes); }
    ptrdiff_t ring_bytes(ptrdiff_t columns) const {
        return keeps() ? 2 * whole(columns, strip_.kept_bytes) : 0;
    }
    // The width of strips whose plan and lines' rows fit the memory, of about the same width all, and
    // of at most `most` columns.
    ptrdiff_t strip_width(ptrdiff_t width, ptrdiff_t memory, ptrdiff_t most = PTRDIFF_MAX) const;
    // Calls f(x, columns) for each of them.
    template <class F>
    void for_each_strip(ptrdiff_t width, ptrdiff_t columns, F f) const {
        for (ptrdiff_t at = 0; at < width; at += columns)
            f(at, width - at < columns ? width - at : columns);
    }

    // Makes the plan of a strip, which lies in the memory given.
    resize_strip plan(ptrdiff_t at, ptrdiff_t columns, const source_span &span,
                      uint8_t *memory) const;

    // Whole rows, of a plane from which `width` columns are made.
    source_span whole_rows(ptrdiff_t width) const { return {0, x.extent(width)}; }
    // What columns at ... at + columns - 1 need of them.
    source_span part_of_rows(ptrdiff_t at, ptrdiff_t columns) const {
        const ptrdiff_t first = x.cell(at);
        return {first, x.next(at + columns - 1) + 1 - first};
    }
    // No part of so many columns is larger.
    ptrdiff_t most_of_rows(ptrdiff_t columns) const {
        return x.cell(columns - 1) + (columns > 1 ? 2 : 1) * x.tap() + 1;
    }

  private:
    static ptrdiff_t round_up(ptrdiff_t n, ptrdiff_t unit) { return (n + unit - 1) / unit * unit; }
    ptrdiff_t whole(ptrdiff_t columns, ptrdiff_t bytes) const {
        const ptrdiff_t steps = (columns * pixel_bytes + strip_.step_bytes - 1) / strip_.step_bytes;
        return round_up(steps * bytes, resize_alignment);
    }

    resize_strip strip_;
};

// The lines of a strip, from a source of lines (walk.h) whose rows begin where the plan says.
template <class Source>
class resampled_lines {
  public:
    // `ring` has ring_bytes(); it may be null where that is 0.
    resampled_lines(const resampling &r, const resize_strip &strip, Source source, uint8_t *ring)
        : r_(r),
          strip_(strip),
          source_(source),
          ahead_(ahead()),
          ring_{ring, ring ? ring + r.ring_bytes(strip.columns) / 2 : nullptr} {}

    // Makes lines first ... first + count - 1 of the destination, the first at dst. Calls come in
    // rising order.
    void make(ptrdiff_t first, ptrdiff_t count, uint8_t *dst, ptrdiff_t stride) {
        for (const ptrdiff_t end = first + count; first < end;) {
            const int made = make_some(first, end, dst, stride);
            first += made;
            dst += made * stride;
        }
    }

    // Makes line `first` and, where that goes well together and it lies before `end`, the next.
    // Returns how many.
    int make_some(ptrdiff_t first, ptrdiff_t end, uint8_t *dst, ptrdiff_t stride) {
        return r_.keeps() ? make_from_kept(first, end, dst, stride)
                          : make_from_rows(first, end, dst, stride);
    }

  private:
    // A next line of the same two rows comes along.
    int make_from_kept(ptrdiff_t line, ptrdiff_t end, uint8_t *dst, ptrdiff_t stride) {
        const resize_axis &y = r_.y;
        const uint32_t at = y.at(line), then = at + y.step;
        const ptrdiff_t row = y.cell_at(at);
        const bool pair = line + 1 < end && y.cell_at(then) == row && y.phase_at(then);
        const ptrdiff_t below = y.next_at(pair ? then : at);
        const int count = pair ? 2 : 1, a = keep(row), c = below == row ? a : 1 - a;
        const resize_line two[2] = {{ring_[a], ring_[c], y.phase_at(at)},
                                    {ring_[a], ring_[c], y.phase_at(then)}};
        if (held_[c] == below)
            r_.loops.down(strip_, two, count, dst, stride);
        else
            blend(below, c, two, count, dst, stride);
        return count;
    }
    // Where the row is kept, from now on if it was not, in the place of the earlier one: rows come in
    // rising order.
    int keep(ptrdiff_t row) {
        for (int at = 0; at < 2; at++)
            if (held_[at] == row) return at;
        const int at = held_[0] <= held_[1] ? 0 : 1;
        blend(row, at, nullptr, 0, nullptr, 0);
        return at;
    }
    // Keeps a row, and makes the lines above it.
    void blend(ptrdiff_t row, int at, const resize_line *above, int count, uint8_t *dst,
               ptrdiff_t stride) {
        r_.loops.across(strip_, source_.fetch(row), ring_[at], ahead_, above, count, dst, stride);
        held_[at] = row;
    }

    // Of two lines that have a row in common the last of the one is the first of the other. A line of
    // phase 0 takes any row as its second, and so the next line's first.
    bool shares_row(uint32_t at) const {
        const resize_axis &y = r_.y;
        return y.phase_at(at) == 0 || y.next_at(at) == y.cell_at(at + y.step);
    }
    // A line is made alone if the next one shares its row with the one after it, not with this one.
    int make_from_rows(ptrdiff_t line, ptrdiff_t end, uint8_t *dst, ptrdiff_t stride) {
        const resize_axis &y = r_.y;
        const uint32_t at = y.at(line), then = at + y.step;
        const bool shares = shares_row(at);
        const bool pair = line + 1 < end && (shares || line + 2 >= end || !shares_row(then));
        const uint8_t *const above = source_.fetch(y.cell_at(at));
        const uint8_t *const below =
            source_.fetch(pair && shares ? y.cell_at(then) : y.next_at(at));
        resize_line two[2] = {{above, below, y.phase_at(at)}, {}};
        if (pair)
            two[1] = {shares ? below : source_.fetch(y.cell_at(then)),
                      source_.fetch(y.next_at(then)), y.phase_at(then)};
        const int count = pair ? 2 : 1;
        r_.loops.both(strip_, two, count, dst, stride, ahead_);
        return count;
    }

    // Rows of a plane lie where they can be asked for before they are needed: by the next two lines,
    // or, where rows are kept, some more.
    ptrdiff_t ahead() const {
        if constexpr (requires { source_.stride; }) {
            const ptrdiff_t reach = r_.y.reach(2), least = r_.keeps() ? 3 : 0;
            return ptrdiff_t(size_t(reach > least ? reach : least) * size_t(source_.stride));
        } else {
            return 0;
        }
    }

    const resampling &r_;
    const resize_strip &strip_;
    Source source_;
    const ptrdiff_t ahead_;
    uint8_t *ring_[2];
    ptrdiff_t held_[2] = {-1, -1};
};

inline bool is_quarter_turn(int32_t rot) { return rot == SIMGP_ROT_90L || rot == SIMGP_ROT_90R; }

// Whether plane k of src can be resized to that of dst, which a quarter turn then exchanges the sides
// of.
inline bool plane_fits(const simgp_img &src, const simgp_img &dst, int k,
                       int32_t rot = SIMGP_ROT_NONE) {
    const bool quarter = is_quarter_turn(rot);
    return resize_spread(src.width[k], quarter ? dst.height[k] : dst.width[k]).fits &&
           resize_spread(src.height[k], quarter ? dst.width[k] : dst.height[k]).fits;
}

// Resizes it, by the kernel that turns it as `rot` says.
inline void resize_plane(simgp_rsz_fn *kernel, const simgp_img &src, const simgp_img &dst, int k,
                         int32_t rot = SIMGP_ROT_NONE) {
    int32_t step_x, step_y;
    simgp_rsz_get_step(src.width[k], src.height[k], dst.width[k], dst.height[k], rot, &step_x,
                       &step_y);
    kernel(src.plane[k], src.stride[k], dst.width[k], dst.height[k], dst.stride[k], dst.plane[k],
           step_x, step_y);
}

// Calls write(made, x, columns) for all strips of a plane of `width` columns: what is made are the
// lines of the strip from column x on. No strip has more than `most` columns. The source is one of
// whole rows.
template <size_t Memory = resample_stack, class Source, class Write>
void resample_plane(const resampling &r, const Source &src, ptrdiff_t width, Write write,
                    ptrdiff_t most = PTRDIFF_MAX) {
    resample_memory<Memory> memory;
    const ptrdiff_t columns = r.strip_width(width, memory.size, most);
    r.for_each_strip(width, columns, [&](ptrdiff_t x, ptrdiff_t n) {
        const resize_strip strip = r.plan(x, n, r.whole_rows(width), memory.bytes);
        resampled_lines made(r, strip, src, memory.bytes + r.plan_bytes(n));
        write(made, x, n);
    });
}

// The arguments of a kernel that resizes a plane.
struct resize_args {
    const_lines src;
    ptrdiff_t width, height;  // of the destination
    lines dst;
    int32_t step_x, step_y;
};

}  // namespace simgp

// Heads the definition of such a kernel, whose body finds the arguments in `args`.
#define SIMGP_RESIZE_KERNEL(name, ...)                                                          \
    void name(const void *src_plane, int32_t src_stride, int32_t dst_width, int32_t dst_height, \
              int32_t dst_stride, void *dst_plane, int32_t step_x, int32_t step_y) {            \
        const simgp::resize_args args{                                                          \
            simgp::lines_of(src_plane, src_stride), dst_width, dst_height,                      \
            simgp::lines_of(dst_plane, dst_stride), step_x,    step_y};                         \
        __VA_ARGS__;                                                                            \
    }

// The weights in 64ths, four for each pair of phases; simgp/resize.h says which.
// clang-format off
#define SIMGP_RESIZE_WEIGHTS \
    {SIMGP_RESIZE_WEIGHTS_OF(0), SIMGP_RESIZE_WEIGHTS_OF(1), SIMGP_RESIZE_WEIGHTS_OF(2), \
     SIMGP_RESIZE_WEIGHTS_OF(3), SIMGP_RESIZE_WEIGHTS_OF(4), SIMGP_RESIZE_WEIGHTS_OF(5), \
     SIMGP_RESIZE_WEIGHTS_OF(6), SIMGP_RESIZE_WEIGHTS_OF(7)}
#define SIMGP_RESIZE_WEIGHTS_OF(fx) \
    SIMGP_RESIZE_WEIGHT(fx, 0), SIMGP_RESIZE_WEIGHT(fx, 1), SIMGP_RESIZE_WEIGHT(fx, 2), \
    SIMGP_RESIZE_WEIGHT(fx, 3), SIMGP_RESIZE_WEIGHT(fx, 4), SIMGP_RESIZE_WEIGHT(fx, 5), \
    SIMGP_RESIZE_WEIGHT(fx, 6), SIMGP_RESIZE_WEIGHT(fx, 7)
#define SIMGP_RESIZE_WEIGHT(fx, fy) \
    (8 - (fx)) * (8 - (fy)), (fx) * (8 - (fy)), (8 - (fx)) * (fy), (fx) * (fy)
// clang-format on

#endif
