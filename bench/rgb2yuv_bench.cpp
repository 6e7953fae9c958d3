// RGB to YUV, which the peers do with averaged chroma, and to RGB565.
#include <libyuv.h>

#include <opencv2/imgproc.hpp>

#include "bench/picture.h"

namespace bench {
namespace {

// OpenCV's names are the other way round: its BGR565 has blue in the low bits.
peer opencv_peer(int channels, int code) {
    return {"opencv", [=](const simgp_img &, const simgp_img &) -> operation {
                cv::setNumThreads(1);
                return [=](const simgp_img &s, const simgp_img &d) {
                    const auto mat = [&s](int type, const simgp_img &p) {
                        return cv::Mat(s.height[0], s.width[0], type, p.plane[0],
                                       size_t(p.stride[0]));
                    };
                    cv::Mat to = mat(CV_8UC2, d);
                    cv::cvtColor(mat(CV_MAKETYPE(CV_8U, channels), s), to, code);
                };
            }};
}

}  // namespace

using namespace libyuv;

std::vector<comparison> rgb2yuv_comparisons() {
    const operation raw_to_i420 = of_planes<1, 3>(RAWToI420);
    const operation rgb24_to_i420 = of_planes<1, 3>(RGB24ToI420);
    const operation rgb565_to_i420 = of_planes<1, 3>(RGB565ToI420);
    const operation raw_to_argb = of_planes<1, 1>(RAWToARGB);
    const operation rgb565_to_argb = of_planes<1, 1>(RGB565ToARGB);
    const operation argb_to_nv12 = of_planes<1, 2>(ARGBToNV12);
    const operation argb_to_nv21 = of_planes<1, 2>(ARGBToNV21);
    const operation argb_to_565 = of_planes<1, 1>(ARGBToRGB565);
    const auto via_argb = [](const operation &to_argb, const operation &on) {
        return libyuv_peer(to_argb, SIMGP_FMT_BGRA8888, on);
    };
    const goal yuv{1.2}, rgb565{1.2};

    // clang-format off
    return compare_all({
        {SIMGP_FMT_RGB888,   SIMGP_FMT_YUV420, yuv, {libyuv_peer(raw_to_i420)}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_YV12,   yuv, {libyuv_peer(exchange_dst_chroma(raw_to_i420))}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_NV12,   yuv, {via_argb(raw_to_argb, argb_to_nv12)}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_NV21,   yuv, {via_argb(raw_to_argb, argb_to_nv21)}},
        {SIMGP_FMT_BGR888,   SIMGP_FMT_YUV420, yuv, {libyuv_peer(rgb24_to_i420)}},
        {SIMGP_FMT_BGR888,   SIMGP_FMT_YV12,   yuv, {libyuv_peer(exchange_dst_chroma(rgb24_to_i420))}},
        {SIMGP_FMT_RGB565,   SIMGP_FMT_YUV420, yuv, {libyuv_peer(rgb565_to_i420)}},
        {SIMGP_FMT_RGB565,   SIMGP_FMT_YV12,   yuv, {libyuv_peer(exchange_dst_chroma(rgb565_to_i420))}},
        {SIMGP_FMT_RGB565,   SIMGP_FMT_NV12,   yuv, {via_argb(rgb565_to_argb, argb_to_nv12)}},
        {SIMGP_FMT_RGB565,   SIMGP_FMT_NV21,   yuv, {via_argb(rgb565_to_argb, argb_to_nv21)}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_RGB565, rgb565, {via_argb(raw_to_argb, argb_to_565), opencv_peer(3, cv::COLOR_RGB2BGR565)}},
        {SIMGP_FMT_RGBA8888, SIMGP_FMT_RGB565, rgb565, {via_argb(of_planes<1, 1>(ABGRToARGB), argb_to_565), opencv_peer(4, cv::COLOR_RGBA2BGR565)}},
    });
    // clang-format on
}

}  // namespace bench
