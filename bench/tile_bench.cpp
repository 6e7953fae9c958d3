// The 64 x 32 tiled layout. No peer knows it: libyuv's own tiles, of 16 x 32 bytes, are the
// nearest, and the picture that comes out is not ours.
#include <libyuv.h>

#include "bench/picture.h"

namespace bench {

using namespace libyuv;

std::vector<comparison> tile_comparisons() {
    const goal move{1.0, 0, 0.9}, none{0, 0};
    std::vector<conversion> all = {
        {SIMGP_FMT_T64X32, SIMGP_FMT_NV12, move, {libyuv_peer(of_planes<2, 2>(MM21ToNV12))}},
        {SIMGP_FMT_T64X32, SIMGP_FMT_YUV420, move, {libyuv_peer(of_planes<2, 3>(MM21ToI420))}},
        {SIMGP_FMT_YUV420, SIMGP_FMT_T64X32, move},
        {SIMGP_FMT_T64X32, SIMGP_FMT_RGB565, none},
        {SIMGP_FMT_T64X32, SIMGP_FMT_BGRA8888, none},
    };
    for (conversion &c : all) c.tolerance = 0;
    // Held against the same from a linear picture; to 32 bits that is from YUV420.
    all[3].twin_from = SIMGP_FMT_NV12;
    all[4].twin_from = SIMGP_FMT_YUV420;
    return compare_all(all);
}

}  // namespace bench
