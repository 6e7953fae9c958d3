// The dispatcher of the colour conversions.
#include "simgp/csc.h"

#include "rows/conversions.h"
#include "simgp/dispatch.h"
#include "simgp/simgp.h"

namespace {

constexpr simgp::conversion conversions[] = {
    // clang-format off
    SIMGP_YUV_TO_RGB_KERNELS(SIMGP_CONVERSION)
    SIMGP_PACKED_TO_RGB_KERNELS(SIMGP_CONVERSION)
    SIMGP_RGB_TO_YUV_KERNELS(SIMGP_CONVERSION)
    SIMGP_RGB_TO_RGB565_KERNELS(SIMGP_CONVERSION)
    SIMGP_LAYOUT_KERNELS(SIMGP_CONVERSION)
    SIMGP_TILE_TO_RGB_KERNELS(SIMGP_CONVERSION)
    SIMGP_TILE_KERNELS(SIMGP_CONVERSION)
    // clang-format on
};

}  // namespace

int32_t simgp_csc(const simgp_img *src, const simgp_img *dst) {
    if (src->format == dst->format) return SIMGP_ERR_PARAM;
    return simgp::convert_by<conversions>(*src, *dst);
}
