// Any format to any format, in BT.709: the pairs in daily use. Of libyuv's ways from RGB, which know
// BT.601 alone, the speed counts; it averages chroma there and from packed YUV.
#include "simgp/csc_any.h"

#include <libyuv.h>

#include <opencv2/imgproc.hpp>

#include "bench/picture.h"

namespace bench {
namespace {

using namespace libyuv;

// OpenCV's names of channel orders are taken as they are: they say what moves.
peer opencv_peer(int from_channels, int to_channels, int code) {
    return {"opencv", [=](const simgp_img &, const simgp_img &) -> operation {
                cv::setNumThreads(1);
                return [=](const simgp_img &s, const simgp_img &d) {
                    const auto mat = [&s](int channels, const simgp_img &p) {
                        return cv::Mat(s.height[0], s.width[0], CV_MAKETYPE(CV_8U, channels),
                                       p.plane[0], size_t(p.stride[0]));
                    };
                    cv::Mat to = mat(to_channels, d);
                    cv::cvtColor(mat(from_channels, s), to, code);
                };
            }};
}

operation any_of(int32_t colour) {
    return [=](const simgp_img &s, const simgp_img &d) {
        if (simgp_csc_any(&s, &d, colour) != SIMGP_OK) fail("simgp_csc_any refuses");
    };
}

}  // namespace

std::vector<comparison> csc_any_comparisons() {
    const auto *yuv = &kYuvH709Constants, *yvu = &kYvuH709Constants;
    const operation nv12_to_bgra = of_planes<2, 1>(NV12ToARGBMatrix, yuv);
    const operation nv12_to_rgba = [=](const simgp_img &s, const simgp_img &d) {
        NV21ToARGBMatrix(s.plane[0], s.stride[0], s.plane[1], s.stride[1], d.plane[0], d.stride[0],
                         yvu, s.width[0], s.height[0]);
    };
    const operation nv12_to_rgb = [=](const simgp_img &s, const simgp_img &d) {
        NV21ToRGB24Matrix(s.plane[0], s.stride[0], s.plane[1], s.stride[1], d.plane[0], d.stride[0],
                          yvu, s.width[0], s.height[0]);
    };
    const operation i420_to_bgra = of_planes<3, 1>(I420ToARGBMatrix, yuv);
    const operation i420_to_rgba = exchange_src_chroma(of_planes<3, 1>(I420ToARGBMatrix, yvu));
    const operation i420_to_rgb = exchange_src_chroma(of_planes<3, 1>(I420ToRGB24Matrix, yvu));
    const operation i422_to_bgra = of_planes<3, 1>(I422ToARGBMatrix, yuv);
    const operation i422_to_rgba = exchange_src_chroma(of_planes<3, 1>(I422ToARGBMatrix, yvu));
    const operation i422_to_rgb = exchange_src_chroma(of_planes<3, 1>(I422ToRGB24Matrix, yvu));
    const auto via_i422 = [](const operation &on) {
        return libyuv_peer(of_planes<1, 3>(YUY2ToI422), SIMGP_FMT_YUV422N, on);
    };
    const goal rgb24{1.3}, rgb32{1.1}, capture{1.3}, packed{1.0, 0, 0.9}, of_bgr{1.2}, rgb{1.0};
    const goal mean_of_pixels{1.0, 0}, mean_of_samples{1.0, 0, 0.9};

    // clang-format off
    std::vector<conversion> all = {
        {SIMGP_FMT_NV12,     SIMGP_FMT_RGBA8888, rgb32, {libyuv_peer(nv12_to_rgba)}},
        {SIMGP_FMT_NV12,     SIMGP_FMT_BGRA8888, rgb32, {libyuv_peer(nv12_to_bgra)}},
        {SIMGP_FMT_NV12,     SIMGP_FMT_RGB888,   rgb24, {libyuv_peer(nv12_to_rgb)}},
        {SIMGP_FMT_YUV420,   SIMGP_FMT_RGBA8888, rgb32, {libyuv_peer(i420_to_rgba)}},
        {SIMGP_FMT_YUV420,   SIMGP_FMT_BGRA8888, rgb32, {libyuv_peer(i420_to_bgra)}},
        {SIMGP_FMT_YUV420,   SIMGP_FMT_RGB888,   rgb24, {libyuv_peer(i420_to_rgb)}},
        {SIMGP_FMT_YUYV,     SIMGP_FMT_RGBA8888, rgb32, {via_i422(i422_to_rgba)}},
        {SIMGP_FMT_YUYV,     SIMGP_FMT_BGRA8888, rgb32, {via_i422(i422_to_bgra)}},
        {SIMGP_FMT_YUYV,     SIMGP_FMT_RGB888,   rgb24, {via_i422(i422_to_rgb)}},

        {SIMGP_FMT_RGBA8888, SIMGP_FMT_NV12,     capture, {libyuv_peer(of_planes<1, 2>(ABGRToNV12))}},
        {SIMGP_FMT_RGBA8888, SIMGP_FMT_YUV420,   capture, {libyuv_peer(of_planes<1, 3>(ABGRToI420))}},
        {SIMGP_FMT_BGRA8888, SIMGP_FMT_NV12,     capture, {libyuv_peer(of_planes<1, 2>(ARGBToNV12))}},
        {SIMGP_FMT_BGRA8888, SIMGP_FMT_YUV420,   capture, {libyuv_peer(of_planes<1, 3>(ARGBToI420))}},

        {SIMGP_FMT_BGR888,   SIMGP_FMT_YUV420,   of_bgr, {libyuv_peer(of_planes<1, 3>(RGB24ToI420))}},
        {SIMGP_FMT_BGR888,   SIMGP_FMT_NV12,     of_bgr, {libyuv_peer(of_planes<1, 1>(RGB24ToARGB), SIMGP_FMT_BGRA8888, of_planes<1, 2>(ARGBToNV12))}},

        {SIMGP_FMT_YUYV,     SIMGP_FMT_NV12,     packed, {libyuv_peer(of_planes<1, 2>(YUY2ToNV12))}},
        {SIMGP_FMT_YUYV,     SIMGP_FMT_YUV420,   packed, {libyuv_peer(of_planes<1, 3>(YUY2ToI420))}},
        {SIMGP_FMT_UYVY,     SIMGP_FMT_NV12,     packed, {libyuv_peer(of_planes<1, 2>(UYVYToNV12))}},
        {SIMGP_FMT_UYVY,     SIMGP_FMT_YUV420,   packed, {libyuv_peer(of_planes<1, 3>(UYVYToI420))}},

        {SIMGP_FMT_RGBA8888, SIMGP_FMT_BGRA8888, rgb, {libyuv_peer(of_planes<1, 1>(ARGBToABGR)), opencv_peer(4, 4, cv::COLOR_RGBA2BGRA)}},
        {SIMGP_FMT_RGBA8888, SIMGP_FMT_RGB888,   rgb, {libyuv_peer(of_planes<1, 1>(ARGBToRGB24)), opencv_peer(4, 3, cv::COLOR_RGBA2RGB)}},
        {SIMGP_FMT_BGRA8888, SIMGP_FMT_RGB888,   rgb, {libyuv_peer(of_planes<1, 1>(ARGBToRAW)), opencv_peer(4, 3, cv::COLOR_BGRA2RGB)}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_RGBA8888, rgb, {libyuv_peer(of_planes<1, 1>(RGB24ToARGB)), opencv_peer(3, 4, cv::COLOR_RGB2RGBA)}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_BGRA8888, rgb, {libyuv_peer(of_planes<1, 1>(RAWToARGB)), opencv_peer(3, 4, cv::COLOR_RGB2BGRA)}},
        {SIMGP_FMT_RGB888,   SIMGP_FMT_BGR888,   rgb, {opencv_peer(3, 3, cv::COLOR_RGB2BGR)}},
        {SIMGP_FMT_BGR888,   SIMGP_FMT_RGBA8888, rgb, {libyuv_peer(of_planes<1, 1>(RAWToARGB)), opencv_peer(3, 4, cv::COLOR_BGR2RGBA)}},
    };
    // With averaged chroma, as the peers have it.
    const size_t first_mean = all.size();
    all.insert(all.end(), {
        {SIMGP_FMT_RGBA8888, SIMGP_FMT_NV12,     mean_of_pixels, {libyuv_peer(of_planes<1, 2>(ABGRToNV12))}},
        {SIMGP_FMT_BGR888,   SIMGP_FMT_YUV420,   mean_of_pixels, {libyuv_peer(of_planes<1, 3>(RGB24ToI420))}},
        {SIMGP_FMT_YUYV,     SIMGP_FMT_NV12,     mean_of_samples, {libyuv_peer(of_planes<1, 2>(YUY2ToNV12))}},
        {SIMGP_FMT_YUV444,   SIMGP_FMT_YUV420,   mean_of_samples, {libyuv_peer(of_planes<3, 3>(I444ToI420))}},
    });
    // clang-format on
    for (size_t i = 0; i < all.size(); i++) {
        conversion &c = all[i];
        const bool mean = i >= first_mean;
        c.colour = SIMGP_COLOUR_BT709;
        c.ours = any_of(c.colour | (mean ? SIMGP_CHROMA_MEAN : 0));
        c.name_prefix = mean ? "any_mean_" : "any_";
        if (c.from >= SIMGP_FMT_RGB565 && c.to < SIMGP_FMT_RGB565)
            c.tolerance = 0;  // another matrix
        else if (c.from < SIMGP_FMT_RGB565 && c.to >= SIMGP_FMT_RGB565)
            // libyuv's weights of chroma have 8 bits, 6 of them for fractions: blue has 2 U where it
            // should have 2.112, which in a corner of the painted picture is 7 of 255.
            c.tolerance = 8;
    }
    return compare_all(all);
}

}  // namespace bench
