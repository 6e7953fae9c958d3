// Resize and a turn in one pass.
#include "simgp/resize_rot.h"

#include "simgp/resample.h"
#include "simgp/rotate.h"
#include "simgp/turn.h"

namespace simgp {
namespace {

// What is turned: bytes or words.
struct turned_samples {
    sample_kind kind;
    resize_kind resized_as;
    ptrdiff_t size, block_side;
};
template <sample_kind S>
constexpr turned_samples samples_of = {
    S, S == sample_kind::words ? resize_kind::bytes2 : resize_kind::bytes1, sample_size<S>,
    block_side<S>};

resize_args whole_samples(const resize_args &a, int size) {
    resize_args b = a;
    b.src = whole_pixel_lines(a.src, size);
    b.dst = whole_pixel_lines(a.dst, size);
    return b;
}

// The resized lines of some columns lie in a block on the stack.
struct line_block {
    memory_pieces memory;
    uint8_t *plan, *ring;
    ptrdiff_t stride;
    uint8_t *first;

    line_block(const memory_pieces &from, const resampling &r, ptrdiff_t columns, ptrdiff_t lines)
        : memory(from),
          plan(memory.take(r.plan_bytes(columns))),
          ring(memory.take(r.ring_bytes(columns))),
          stride((columns * r.pixel_bytes + resize_alignment - 1) & -ptrdiff_t(resize_alignment)),
          first(memory.take(lines * stride)) {}
};

constexpr ptrdiff_t block_memory = 10752;

// Calls f(x, columns, block, made) for the columns of a resized plane of `width` columns. `block` has
// room for so many of their lines, and made.make() makes them.
template <class F>
void for_each_block_of_lines(const resampling &r, const const_lines &src, ptrdiff_t width,
                             ptrdiff_t lines, F f) {
    resample_memory<block_memory> memory;
    const ptrdiff_t most = columns_of_strips(width, [&](ptrdiff_t n) {
        return line_block({nullptr}, r, n, lines).memory.used <= block_memory;
    });
    for (ptrdiff_t x = 0; x < width; x += most) {
        const ptrdiff_t columns = width - x < most ? width - x : most;
        const line_block block({memory.bytes}, r, columns, lines);
        const resize_strip strip = r.plan(x, columns, r.whole_rows(width), block.plan);
        f(x, columns, block, resampled_lines(r, strip, src, block.ring));
    }
}

// Lines are transposed `band` at a time. For a turn to the right they lie upside down in the block.
// Of large planes the lines of the destination are asked for meanwhile, some whenever lines have been
// made: they lie far apart, and no processor foresees them.
void quarter_turn(const turned_samples &of, bool right, const resize_args &args) {
    constexpr ptrdiff_t band = 32;
    const ptrdiff_t size = of.size, side = of.block_side;
    const ptrdiff_t width = args.height, height = args.width;  // before the turn
    if (width < 1 || height < 1) return;
    const resize_args a = whole_samples(args, int(size));
    const lines dst = right ? a.dst : a.dst.upside_down(width);
    transpose_block *const transpose = live_rows(band).rotate.transpose[size_t(of.kind)];
    const resampling r(of.resized_as, a.step_x, a.step_y);
    const bool fetch = int64_t(width) * height * size >= fetch_from;
    for_each_block_of_lines(
        r, a.src, width, band,
        [&](ptrdiff_t x, ptrdiff_t columns, const line_block &block, auto &&made) {
            for (ptrdiff_t y = 0; y < height; y += band) {
                const ptrdiff_t rows = height - y < band ? height - y : band;
                const lines in{block.first, block.stride};
                const lines to = right ? in.upside_down(rows) : in;
                const ptrdiff_t column = right ? height - y - rows : y;
                uintptr_t ahead = reinterpret_cast<uintptr_t>(dst.line(x) + column * size);
                const ptrdiff_t each = (columns + rows - 1) / rows;
                for (ptrdiff_t k = 0; k < rows;) {
                    const int count = made.make_some(y + k, y + rows, to.line(k), to.stride);
                    k += count;
                    if (!fetch) continue;
                    for (ptrdiff_t i = 0; i < count * each; i++, ahead += uintptr_t(dst.stride))
                        __builtin_prefetch(reinterpret_cast<const void *>(ahead), 1);
                }
                for (ptrdiff_t i = 0; i < columns; i += side)
                    transpose(in.first + i * size, in.stride, dst.line(x + i) + column * size,
                              dst.stride, columns - i < side ? columns - i : side, rows, 0);
            }
        });
}

void half_turn(const turned_samples &of, const resize_args &args) {
    constexpr ptrdiff_t band = 2;
    const ptrdiff_t size = of.size;
    if (args.width < 1 || args.height < 1) return;
    const resize_args a = whole_samples(args, int(size));
    const lines dst = a.dst.upside_down(a.height);
    reverse_row *const reverse = live_rows().rotate.reverse[size_t(of.kind)];
    const resampling r(of.resized_as, a.step_x, a.step_y);
    for_each_block_of_lines(
        r, a.src, a.width, band,
        [&](ptrdiff_t x, ptrdiff_t columns, const line_block &block, auto &&made) {
            const ptrdiff_t column = a.width - x - columns;
            for (ptrdiff_t y = 0; y < a.height;) {
                const int rows = made.make_some(y, a.height, block.first, block.stride);
                for (ptrdiff_t k = 0; k < rows; k++, y++)
                    reverse(block.first + k * block.stride, dst.line(y) + column * size, columns);
            }
        });
}

}  // namespace
}  // namespace simgp

using namespace simgp;

SIMGP_RESIZE_KERNEL(simgp_rsz_8b_rot_90l, quarter_turn(samples_of<sample_kind::bytes>, false, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b_rot_90r, quarter_turn(samples_of<sample_kind::bytes>, true, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b_rot_180, half_turn(samples_of<sample_kind::bytes>, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b8b_rot_90l,
                    quarter_turn(samples_of<sample_kind::words>, false, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b8b_rot_90r,
                    quarter_turn(samples_of<sample_kind::words>, true, args))
SIMGP_RESIZE_KERNEL(simgp_rsz_8b8b_rot_180, half_turn(samples_of<sample_kind::words>, args))

simgp_rsz_fn *const simgp_tbl_fn_rsz_8b_rot[6] = {
    simgp_rsz_8b, simgp_rsz_8b_rot_90l, simgp_rsz_8b_rot_90r, simgp_rsz_8b_rot_180, nullptr,
    nullptr,
};
simgp_rsz_fn *const simgp_tbl_fn_rsz_8b8b_rot[6] = {
    simgp_rsz_8b8b, simgp_rsz_8b8b_rot_90l, simgp_rsz_8b8b_rot_90r, simgp_rsz_8b8b_rot_180, nullptr,
    nullptr,
};

// Of the source's even rows, the even bytes: as many columns as the destination has rows.
void simgp_rsz_8b_rot_90r_quarter(const void *src_plane, int32_t src_stride, int32_t dst_width,
                                  int32_t dst_height, int32_t dst_stride, void *dst_plane) {
    turn_right<sample_kind::even_bytes>(lines_of(src_plane, 2 * ptrdiff_t(src_stride)), dst_height,
                                        dst_width, lines_of(dst_plane, dst_stride));
}

int32_t simgp_rsz_rot(const simgp_img *src, int32_t rot, const simgp_img *dst) {
    if (src->format != dst->format) return SIMGP_ERR_PARAM;
    if (rot < SIMGP_ROT_NONE || rot > SIMGP_ROT_VERT) return SIMGP_ERR_UNSUPPORTED;
    const bool quarter = is_quarter_turn(rot);
    if (src->width[0] == (quarter ? dst->height : dst->width)[0] &&
        src->height[0] == (quarter ? dst->width : dst->height)[0])
        return simgp_rot(src, rot, dst);

    const format *const planes = src->format > 99 ? nullptr : planes_kept(src->format);
    simgp_rsz_fn *const of_bytes = simgp_tbl_fn_rsz_8b_rot[rot];
    simgp_rsz_fn *const of_pairs = simgp_tbl_fn_rsz_8b8b_rot[rot];
    if (!planes || !of_bytes || !of_pairs) return SIMGP_ERR_UNSUPPORTED;
    for (int k = 0; k < planes->planes; k++)
        if (!plane_fits(*src, *dst, k, rot)) return SIMGP_ERR_PARAM;
    for (int k = 0; k < planes->planes; k++)
        resize_plane(planes->bytes[k] == 2 ? of_pairs : of_bytes, *src, *dst, k, rot);
    return SIMGP_OK;
}
