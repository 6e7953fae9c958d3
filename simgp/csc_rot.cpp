// Planar 4:2:2 to planar 4:2:0 and a quarter turn in one pass.
#include "simgp/csc_rot.h"

#include "simgp/kernel.h"
#include "simgp/layout.h"
#include "simgp/rotate.h"
#include "simgp/turn.h"

using namespace simgp;

// Every second line.
static const_lines kept_lines(const plane_args &a) { return {a.src.first, 2 * a.src.stride}; }

SIMGP_PLANE_KERNEL(simgp_csc_1x2_to_1x1_rot_90l,
                   turn_left<sample_kind::bytes>(kept_lines(args), args.width, args.height / 2,
                                                 args.dst))
SIMGP_PLANE_KERNEL(simgp_csc_1x2_to_1x1_rot_90r,
                   turn_right<sample_kind::bytes>(kept_lines(args), args.width, args.height / 2,
                                                  args.dst))

simgp_plane_fn *const simgp_tbl_fn_csc_1x2_to_1x1_rot[6] = {
    simgp_csc_1x2_to_1x1,
    simgp_csc_1x2_to_1x1_rot_90l,
    simgp_csc_1x2_to_1x1_rot_90r,
    nullptr,
    nullptr,
    nullptr,
};

int32_t simgp_csc_rot(const simgp_img *src, int32_t rot, const simgp_img *dst) {
    if (src->format == dst->format) return SIMGP_ERR_PARAM;
    const bool from_yuv = src->format == SIMGP_FMT_YUV422N,
               to_yuv = dst->format == SIMGP_FMT_YUV420;
    if (!from_yuv && src->format != SIMGP_FMT_YV16) return SIMGP_ERR_UNSUPPORTED;
    if (!to_yuv && dst->format != SIMGP_FMT_YV12) return SIMGP_ERR_UNSUPPORTED;
    if (rot < SIMGP_ROT_NONE || rot > SIMGP_ROT_90R) return SIMGP_ERR_UNSUPPORTED;
    run_plane(simgp_tbl_fn_rot_8b[rot], *src, 0, *dst, 0);
    for (int k = 1; k <= 2; k++)
        run_plane(simgp_tbl_fn_csc_1x2_to_1x1_rot[rot], *src, k, *dst,
                  from_yuv == to_yuv ? k : 3 - k);
    return SIMGP_OK;
}
