// Dithering. swscale dithers 16-bit output of itself.
#include "simgp/dither.h"

#include <libyuv.h>

#include "bench/picture.h"
#include "simgp/yuv2rgb.h"

namespace bench {

using namespace libyuv;

std::vector<comparison> dither_comparisons() {
    const uint8_t *pattern = nullptr;  // libyuv's own
    const operation argb_to_565 = of_planes<1, 1>(ARGBToRGB565Dither, pattern);
    const auto via_argb = [&](const operation &to_argb) {
        return libyuv_peer(to_argb, SIMGP_FMT_BGRA8888, argb_to_565);
    };
    const operation plane = [](const simgp_img &s, const simgp_img &d) {
        simgp_dit_8b(s.plane[0], s.width[0], s.height[0], s.stride[0], d.stride[0], d.plane[0]);
    };
    const operation picture = [](const simgp_img &s, const simgp_img &d) {
        if (simgp_csc_dither(&s, &d) != SIMGP_OK) fail("simgp_csc_dither does not know the pair");
    };
    const operation i420_to_565 = of_planes<3, 1>(I420ToRGB565Dither, pattern);
    const goal as_fast{1.0, 0};

    // clang-format off
    std::vector<conversion> all = {
        {SIMGP_FMT_YUV400,  SIMGP_FMT_YUV400, {0, 8},  {}, "dit_8b", plane},
        {SIMGP_FMT_YUV400,  SIMGP_FMT_RGB565, as_fast, {via_argb(of_planes<1, 1>(J400ToARGB))}, "yuv400_to_rgb565_dither", picture},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_RGB565, as_fast, {libyuv_peer(i420_to_565)}, "yuv420_to_rgb565_dither", picture},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_BGR565, as_fast, {via_argb(of_planes<3, 1>(I420ToABGR))}, "yuv420_to_bgr565_dither", picture},
        {SIMGP_FMT_YV12,    SIMGP_FMT_RGB565, as_fast, {libyuv_peer(exchange_src_chroma(i420_to_565))}, "yv12_to_rgb565_dither", picture},
        {SIMGP_FMT_YUV422N, SIMGP_FMT_RGB565, as_fast, {via_argb(of_planes<3, 1>(I422ToARGB))}, "yuv422n_to_rgb565_dither", picture},
        {SIMGP_FMT_YUV422W, SIMGP_FMT_RGB565, as_fast, {}, "yuv422w_to_rgb565_dither", picture},
        {SIMGP_FMT_YUV444,  SIMGP_FMT_RGB565, as_fast, {via_argb(of_planes<3, 1>(I444ToARGB))}, "yuv444_to_rgb565_dither", picture},
    };
    // clang-format on
    // Dithers move pixels about, and libyuv's lifts the mean by half a step of 5 bits.
    for (conversion &c : all) c.tolerance = 8;

    // How dithered grey is converted in the end: from the second half of each line to all of it.
    conversion in_place{SIMGP_FMT_RGB565, SIMGP_FMT_RGB565, {0}, {}, "yuv400_to_rgb565 in place"};
    in_place.ours = [](const simgp_img &p, const simgp_img &) {
        uint8_t *const luma[] = {p.plane[0] + p.width[0]};
        simgp_csc_yuv400_to_rgb565(luma, p.width, p.height, p.stride, p.stride, p.plane);
    };
    in_place.in_place = true;
    all.push_back(in_place);
    return compare_all(all);
}

}  // namespace bench
