// Turns and mirrors: the scalar rows, which define the results, and the kernels.
#include "simgp/rotate.h"

#include "simgp/copy.h"
#include "simgp/kernel.h"
#include "simgp/turn.h"

namespace simgp {
namespace scalar {
namespace {

template <sample_kind S>
void transpose(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
               ptrdiff_t columns, ptrdiff_t rows, ptrdiff_t) {
    for (ptrdiff_t x = 0; x < columns; x++)
        for (ptrdiff_t y = 0; y < rows; y++)
            memcpy(dst + x * dst_stride + y * sample_size<S>,
                   src + y * src_stride + x * sample_gap<S>, size_t(sample_size<S>));
}

template <sample_kind S>
void reverse(const uint8_t *src, uint8_t *dst, ptrdiff_t count) {
    constexpr ptrdiff_t size = sample_size<S>;
    for (ptrdiff_t i = 0; i < count; i++)
        memcpy(dst + i * size, src + (count - 1 - i) * size, size_t(size));
}

}  // namespace

void fill_rotate(rotate_rows &t) {
    t.transpose[size_t(sample_kind::bytes)] = transpose<sample_kind::bytes>;
    t.transpose[size_t(sample_kind::words)] = transpose<sample_kind::words>;
    t.transpose[size_t(sample_kind::even_bytes)] = transpose<sample_kind::even_bytes>;
    t.reverse[size_t(sample_kind::bytes)] = reverse<sample_kind::bytes>;
    t.reverse[size_t(sample_kind::words)] = reverse<sample_kind::words>;
}

}  // namespace scalar

namespace {

template <sample_kind S>
void turn_left(const plane_args &a) {
    turn_left<S>(a.src, a.width, a.height, a.dst);
}
template <sample_kind S>
void turn_right(const plane_args &a) {
    turn_right<S>(a.src, a.width, a.height, a.dst);
}
// Of an empty plane there is no last line to point to.
template <sample_kind S>
void half_turn(const plane_args &a) {
    if (a.width < 1) return;
    mirror<S>(a.src, a.width, a.height, a.dst.upside_down(a.height));
}
template <sample_kind S>
void mirror_across(const plane_args &a) {
    mirror<S>(a.src, a.width, a.height, a.dst);
}
template <sample_kind S>
void mirror_down(const plane_args &a) {
    if (a.width < 1) return;
    copy_lines(a.src, a.dst.upside_down(a.height), a.width * sample_size<S>, a.height);
}

}  // namespace
}  // namespace simgp

using namespace simgp;

SIMGP_PLANE_KERNEL(simgp_rot_8b_90l, turn_left<sample_kind::bytes>(args))
SIMGP_PLANE_KERNEL(simgp_rot_8b_90r, turn_right<sample_kind::bytes>(args))
SIMGP_PLANE_KERNEL(simgp_rot_8b_180, half_turn<sample_kind::bytes>(args))
SIMGP_PLANE_KERNEL(simgp_rot_8b_hori, mirror_across<sample_kind::bytes>(args))
SIMGP_PLANE_KERNEL(simgp_rot_8b_vert, mirror_down<sample_kind::bytes>(args))

SIMGP_PLANE_KERNEL(simgp_rot_16b_90l, turn_left<sample_kind::words>(whole_words(args)))
SIMGP_PLANE_KERNEL(simgp_rot_16b_90r, turn_right<sample_kind::words>(whole_words(args)))
SIMGP_PLANE_KERNEL(simgp_rot_16b_180, half_turn<sample_kind::words>(whole_words(args)))
SIMGP_PLANE_KERNEL(simgp_rot_16b_hori, mirror_across<sample_kind::words>(whole_words(args)))
SIMGP_PLANE_KERNEL(simgp_rot_16b_vert, mirror_down<sample_kind::words>(whole_words(args)))

simgp_plane_fn *const simgp_tbl_fn_rot_8b[6] = {
    simgp_cpy_8b,     simgp_rot_8b_90l,  simgp_rot_8b_90r,
    simgp_rot_8b_180, simgp_rot_8b_hori, simgp_rot_8b_vert,
};
simgp_plane_fn *const simgp_tbl_fn_rot_16b[6] = {
    simgp_cpy_16b,     simgp_rot_16b_90l,  simgp_rot_16b_90r,
    simgp_rot_16b_180, simgp_rot_16b_hori, simgp_rot_16b_vert,
};

int32_t simgp_rot(const simgp_img *src, int32_t rot, const simgp_img *dst) {
    if (rot < SIMGP_ROT_NONE || rot > SIMGP_ROT_VERT) return SIMGP_ERR_UNSUPPORTED;
    const format *const planes = planes_kept(src->format);
    if (!planes) return SIMGP_ERR_UNSUPPORTED;
    run_planes(*planes, *src, *dst, simgp_tbl_fn_rot_8b[rot], simgp_tbl_fn_rot_16b[rot]);
    return SIMGP_OK;
}
