// Packed YUV to RGB. libyuv goes directly to one format only; to the others by way of it, or of
// planes.
#include <libyuv.h>

#include "bench/picture.h"

namespace bench {

using namespace libyuv;

std::vector<comparison> packed2rgb_comparisons() {
    const operation uyvy_to_argb = of_planes<1, 1>(UYVYToARGB);
    const operation uyvy_to_i422 = of_planes<1, 3>(UYVYToI422);
    const operation yuyv_to_argb = of_planes<1, 1>(YUY2ToARGB);
    const operation yuyv_to_i422 = of_planes<1, 3>(YUY2ToI422);

    const operation i422_to_565 = of_planes<3, 1>(I422ToRGB565);
    const operation i422_to_b565 =
        exchange_src_chroma(of_planes<3, 1>(I422ToRGB565Matrix, &kYvuI601Constants));

    const auto via_argb = [](const operation &to_argb, const operation &on) {
        return libyuv_peer(to_argb, SIMGP_FMT_BGRA8888, on);
    };
    const auto via_i422 = [](const operation &to_i422, const operation &on) {
        return libyuv_peer(to_i422, SIMGP_FMT_YUV422N, on);
    };
    const operation argb_to_565 = of_planes<1, 1>(ARGBToRGB565);
    const operation argb_to_raw = of_planes<1, 1>(ARGBToRAW);
    const goal rgb16{1.5}, rgb24{1.3}, rgb32{1.1};

    // clang-format off
    return compare_all({
        {SIMGP_FMT_UYVY, SIMGP_FMT_RGB565,   rgb16, {via_argb(uyvy_to_argb, argb_to_565), via_i422(uyvy_to_i422, i422_to_565)}},
        {SIMGP_FMT_UYVY, SIMGP_FMT_BGR565,   rgb16, {via_i422(uyvy_to_i422, i422_to_b565)}},
        {SIMGP_FMT_UYVY, SIMGP_FMT_RGB888,   rgb24, {via_argb(uyvy_to_argb, argb_to_raw), via_i422(uyvy_to_i422, of_planes<3, 1>(I422ToRAW))}},
        {SIMGP_FMT_UYVY, SIMGP_FMT_BGR888,   rgb24, {via_argb(uyvy_to_argb, of_planes<1, 1>(ARGBToRGB24)), via_i422(uyvy_to_i422, of_planes<3, 1>(I422ToRGB24))}},
        {SIMGP_FMT_UYVY, SIMGP_FMT_RGBA8888, rgb32, {via_argb(uyvy_to_argb, of_planes<1, 1>(ARGBToABGR)), via_i422(uyvy_to_i422, of_planes<3, 1>(I422ToABGR))}},
        {SIMGP_FMT_UYVY, SIMGP_FMT_BGRA8888, rgb32, {libyuv_peer(uyvy_to_argb)}},
        {SIMGP_FMT_UYVY, SIMGP_FMT_ARGB8888, rgb32, {via_argb(uyvy_to_argb, of_planes<1, 1>(ARGBToBGRA)), via_i422(uyvy_to_i422, of_planes<3, 1>(I422ToBGRA))}},
        {SIMGP_FMT_YUYV, SIMGP_FMT_RGB565,   rgb16, {via_argb(yuyv_to_argb, argb_to_565), via_i422(yuyv_to_i422, i422_to_565)}},
        {SIMGP_FMT_YUYV, SIMGP_FMT_RGB888,   rgb24, {via_argb(yuyv_to_argb, argb_to_raw), via_i422(yuyv_to_i422, of_planes<3, 1>(I422ToRAW))}},
    });
    // clang-format on
}

}  // namespace bench
