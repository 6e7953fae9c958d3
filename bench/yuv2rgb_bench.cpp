// Planar and semi-planar YUV to RGB.
#include <libyuv.h>

#include "bench/picture.h"

namespace bench {
namespace {

using namespace libyuv;

// A chroma line serves two lines: two calls with one line each, chroma strides being free.
operation lines_of_yuv422w(const operation &of_yuv444) {
    return [of_yuv444](const simgp_img &s, const simgp_img &d) {
        for (int y = 0; y < s.height[0]; y += 2) {
            const int count = y + 1 < s.height[0] ? 2 : 1;
            simgp_img t = lines(s, y, count);
            t.stride[1] = t.stride[2] = 0;
            of_yuv444(t, lines(d, y, count));
        }
    };
}

}  // namespace

std::vector<comparison> yuv2rgb_comparisons() {
    // With U and V exchanged, and a matrix that knows it, red and blue change places.
    const auto *yvu = &kYvuI601Constants;
    const operation bgra_to_565 = of_planes<1, 1>(ARGBToRGB565);
    const auto to_565 = [&](const operation &to_bgra) {
        return libyuv_peer(to_bgra, SIMGP_FMT_BGRA8888, bgra_to_565);
    };
    const goal rgb16{1.5}, rgb24{1.3}, rgb32{1.1}, grey_or_full{1.3};

    const operation i420_to_565 = of_planes<3, 1>(I420ToRGB565);
    const operation i420_to_b565 = exchange_src_chroma(of_planes<3, 1>(I420ToRGB565Matrix, yvu));
    const operation i420_to_raw = of_planes<3, 1>(I420ToRAW);
    const operation i444_to_argb = of_planes<3, 1>(I444ToARGB);
    const operation i444_to_abgr = of_planes<3, 1>(I444ToABGR);

    // clang-format off
    return compare_all({
        {SIMGP_FMT_YUV400,  SIMGP_FMT_RGB565,   grey_or_full, {to_565(of_planes<1, 1>(J400ToARGB))}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_RGB565,   rgb16, {libyuv_peer(i420_to_565)}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_BGR565,   rgb16, {libyuv_peer(i420_to_b565)}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_RGB888,   rgb24, {libyuv_peer(i420_to_raw)}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_BGR888,   rgb24, {libyuv_peer(of_planes<3, 1>(I420ToRGB24))}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_RGBA8888, rgb32, {libyuv_peer(of_planes<3, 1>(I420ToABGR))}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_BGRA8888, rgb32, {libyuv_peer(of_planes<3, 1>(I420ToARGB))}},
        {SIMGP_FMT_YUV420,  SIMGP_FMT_ARGB8888, rgb32, {libyuv_peer(of_planes<3, 1>(I420ToBGRA))}},
        {SIMGP_FMT_YV12,    SIMGP_FMT_RGB565,   rgb16, {libyuv_peer(exchange_src_chroma(i420_to_565))}},
        {SIMGP_FMT_YV12,    SIMGP_FMT_BGR565,   rgb16, {libyuv_peer(exchange_src_chroma(i420_to_b565))}},
        {SIMGP_FMT_YV12,    SIMGP_FMT_RGB888,   rgb24, {libyuv_peer(exchange_src_chroma(i420_to_raw))}},
        {SIMGP_FMT_YUV422N, SIMGP_FMT_RGB565,   rgb16, {libyuv_peer(of_planes<3, 1>(I422ToRGB565))}},
        {SIMGP_FMT_YUV422N, SIMGP_FMT_BGR565,   rgb16, {libyuv_peer(exchange_src_chroma(of_planes<3, 1>(I422ToRGB565Matrix, yvu)))}},
        {SIMGP_FMT_YUV422W, SIMGP_FMT_RGB565,   rgb16, {to_565(lines_of_yuv422w(i444_to_argb))}},
        {SIMGP_FMT_YUV422W, SIMGP_FMT_BGR565,   rgb16, {to_565(lines_of_yuv422w(i444_to_abgr))}},
        {SIMGP_FMT_YUV444,  SIMGP_FMT_RGB565,   grey_or_full, {to_565(i444_to_argb)}},
        {SIMGP_FMT_YUV444,  SIMGP_FMT_BGR565,   grey_or_full, {to_565(i444_to_abgr)}},
        {SIMGP_FMT_NV12,    SIMGP_FMT_RGB565,   rgb16, {libyuv_peer(of_planes<2, 1>(NV12ToRGB565))}},
        {SIMGP_FMT_NV12,    SIMGP_FMT_BGR565,   rgb16, {to_565(of_planes<2, 1>(NV12ToABGR))}},
        {SIMGP_FMT_NV12,    SIMGP_FMT_RGB888,   rgb24, {libyuv_peer(of_planes<2, 1>(NV12ToRAW))}},
        {SIMGP_FMT_NV21,    SIMGP_FMT_RGB565,   rgb16, {to_565(of_planes<2, 1>(NV21ToARGB))}},
        {SIMGP_FMT_NV21,    SIMGP_FMT_BGR565,   rgb16, {libyuv_peer(of_planes<2, 1>(NV12ToRGB565Matrix, yvu))}},
        {SIMGP_FMT_NV21,    SIMGP_FMT_RGB888,   rgb24, {libyuv_peer(of_planes<2, 1>(NV21ToRAW))}},
    });
    // clang-format on
}

}  // namespace bench
