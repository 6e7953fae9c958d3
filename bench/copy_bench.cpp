// Plane copies.
#include "simgp/copy.h"

#include <libyuv.h>

#include "bench/picture.h"

namespace bench {

std::vector<comparison> copy_comparisons() {
    const auto copy = [](int format, const char *name, simgp_plane_fn *kernel, int size) {
        const operation ours = [=](const simgp_img &s, const simgp_img &d) {
            kernel(s.plane[0], s.width[0], s.height[0], s.stride[0], d.stride[0], d.plane[0]);
        };
        const operation theirs = [=](const simgp_img &s, const simgp_img &d) {
            libyuv::CopyPlane(s.plane[0], s.stride[0], d.plane[0], d.stride[0], s.width[0] * size,
                              s.height[0]);
        };
        return conversion{format, format, {1.0, 0, 0.9}, {libyuv_peer(theirs)}, name, ours};
    };
    return compare_all({
        copy(SIMGP_FMT_YUV400, "cpy_8b", simgp_cpy_8b, 1),
        copy(SIMGP_FMT_RGB565, "cpy_16b", simgp_cpy_16b, 2),
        copy(SIMGP_FMT_RGB888, "cpy_24b", simgp_cpy_24b, 3),
        copy(SIMGP_FMT_RGBA8888, "cpy_32b", simgp_cpy_32b, 4),
    });
}

}  // namespace bench
