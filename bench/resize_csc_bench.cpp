// Resize and conversion in one pass: against swscale's one pass, against the peers' resize of the
// planes and conversion, one after the other, and against our own.
#include "simgp/resize_csc.h"

#include <libyuv.h>

#include <opencv2/imgproc.hpp>

#include "bench/picture.h"
#include "simgp/csc.h"
#include "simgp/resize.h"

namespace bench {
namespace {

using namespace libyuv;

void expect_ok(int32_t result) {
    if (result != SIMGP_OK) fail("refused");
}

// Two passes of others: resize() makes a YUV420 picture of the destination's size.
peer two_passes(const char *name, const operation_maker &resize) {
    return {name, [=](const simgp_img &src, const simgp_img &dst) -> operation {
                const picture m(SIMGP_FMT_YUV420, dst.width[0], dst.height[0]);
                const operation scale = resize(src, m);
                const operation convert = of_planes<3, 1>(I420ToRGB565);
                return [=](const simgp_img &s, const simgp_img &d) {
                    scale(s, m);
                    convert(m, d);
                };
            }};
}

void scale_by_libyuv(const simgp_img &s, const simgp_img &d) {
    I420Scale(s.plane[0], s.stride[0], s.plane[1], s.stride[1], s.plane[2], s.stride[2], s.width[0],
              s.height[0], d.plane[0], d.stride[0], d.plane[1], d.stride[1], d.plane[2],
              d.stride[2], d.width[0], d.height[0], kFilterBilinear);
}
void scale_by_opencv(const simgp_img &s, const simgp_img &d) {
    for (int k = 0; k < 3; k++) {
        const cv::Mat from(s.height[k], s.width[k], CV_8UC1, s.plane[k], size_t(s.stride[k]));
        cv::Mat to(d.height[k], d.width[k], CV_8UC1, d.plane[k], size_t(d.stride[k]));
        cv::resize(from, to, to.size(), 0, 0, cv::INTER_LINEAR);
    }
}
operation_maker always(operation f) {
    return [=](const simgp_img &, const simgp_img &) { return f; };
}

// libyuv knows other tiles than ours, of 16 x 32 bytes: the work is the same, the picture is not.
operation tiles_first(const simgp_img &src, const operation &then) {
    const picture m(SIMGP_FMT_YUV420, src.width[0], src.height[0]);
    const operation detile = of_planes<2, 3>(MM21ToI420);
    return [=](const simgp_img &s, const simgp_img &d) {
        detile(s, m);
        then(m, d);
    };
}

}  // namespace

std::vector<comparison> resize_csc_comparisons() {
    const operation ours = [](const simgp_img &s, const simgp_img &d) {
        expect_ok(simgp_rsz_csc(&s, &d));
    };
    const int from = SIMGP_FMT_YUV420, tiles = SIMGP_FMT_T64X32, to = SIMGP_FMT_RGB565;

    conversion two{from, to, {2.0}, {}, "rsz_csc_yuv420_to_rgb565", ours};
    two.how = resizing::interpolates;
    two.tolerance = 8;  // the grids of the peers meet in the middle of the pictures
    two.sizes = {"320x240 to 214x160",     "320x240 to 480x360",     "1920x1080 to 1280x720",
                 "1920x1080 to 2880x1620", "3840x2160 to 2560x1440", "3840x2160 to 5760x3240"};
    two.peers = {two_passes("libyuv, two passes", always(scale_by_libyuv)),
                 two_passes("opencv and libyuv",
                            [](const simgp_img &, const simgp_img &) -> operation {
                                cv::setNumThreads(1);
                                return scale_by_opencv;
                            }),
                 two_passes("swscale and libyuv",
                            swscale_peer(from, from, 0, resizing::interpolates)[0].make)};
    two.twin = {"two passes",
                [](const simgp_img &, const simgp_img &dst) -> operation {
                    const picture m(SIMGP_FMT_YUV420, dst.width[0], dst.height[0]);
                    return [=](const simgp_img &s, const simgp_img &d) {
                        expect_ok(simgp_rsz(&s, &m));
                        expect_ok(simgp_csc(&m, &d));
                    };
                },
                0.9};

    conversion one = two;
    one.name += " in one pass";
    one.goals.peer = 6.0;
    one.peers.clear();  // but for swscale

    conversion tiled = two;
    tiled.from = tiles;
    tiled.name = "rsz_csc_t64x32_to_rgb565";
    tiled.tolerance = 0;
    tiled.peers = {
        {"libyuv, three passes", [](const simgp_img &s, const simgp_img &d) -> operation {
             const operation rest = two_passes("", always(scale_by_libyuv)).make(s, d);
             return tiles_first(s, rest);
         }}};
    tiled.twin = {"three passes",
                  [](const simgp_img &src, const simgp_img &dst) -> operation {
                      const picture flat(SIMGP_FMT_YUV420, src.width[0], src.height[0]);
                      const picture m(SIMGP_FMT_YUV420, dst.width[0], dst.height[0]);
                      return [=](const simgp_img &s, const simgp_img &d) {
                          expect_ok(simgp_csc(&s, &flat));
                          expect_ok(simgp_rsz(&flat, &m));
                          expect_ok(simgp_csc(&m, &d));
                      };
                  },
                  0.9};
    return compare_all({two, one, tiled});
}

}  // namespace bench
