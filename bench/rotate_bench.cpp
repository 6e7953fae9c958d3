// Turns and mirrors of planes. Besides the usual sizes, some whose lines lie powers of two apart.
#include "simgp/rotate.h"

#include <libyuv.h>

#include <opencv2/imgproc.hpp>

#include "bench/picture.h"
#include "simgp/csc_rot.h"
#include "simgp/resize_rot.h"

namespace bench {
namespace {

using namespace libyuv;

// OpenCV as a peer, f(from, to) on its matrices.
template <class F>
peer opencv_peer(int type, F f) {
    return {"opencv", [=](const simgp_img &, const simgp_img &) -> operation {
                cv::setNumThreads(1);
                return [=](const simgp_img &s, const simgp_img &d) {
                    const auto mat = [=](const simgp_img &p) {
                        return cv::Mat(p.height[0], p.width[0], type, p.plane[0],
                                       size_t(p.stride[0]));
                    };
                    cv::Mat to = mat(d);
                    f(mat(s), to);
                };
            }};
}
peer opencv_rotate(int type, int code) {
    return opencv_peer(type, [=](const cv::Mat &from, cv::Mat &to) { cv::rotate(from, to, code); });
}
peer opencv_flip(int type, int code) {
    return opencv_peer(type, [=](const cv::Mat &from, cv::Mat &to) { cv::flip(from, to, code); });
}

operation kernel_of_bytes(simgp_plane_fn *kernel) {
    return [=](const simgp_img &s, const simgp_img &d) {
        kernel(s.plane[0], s.width[0], s.height[0], s.stride[0], d.stride[0], d.plane[0]);
    };
}

// libyuv's functions of one plane of bytes; `rows` of each are taken.
template <class Function>
peer libyuv_plane(Function *f, int rows = 1) {
    return libyuv_peer([=](const simgp_img &s, const simgp_img &d) {
        f(s.plane[0], rows * s.stride[0], d.plane[0], d.stride[0], s.width[0], s.height[0] / rows);
    });
}
// Words are turned by a function of its own, in C, or split, turned and interleaved.
peer libyuv_words(RotationMode mode) {
    return libyuv_peer([=](const simgp_img &s, const simgp_img &d) {
        RotatePlane_16(reinterpret_cast<const uint16_t *>(s.plane[0]), s.stride[0] / 2,
                       reinterpret_cast<uint16_t *>(d.plane[0]), d.stride[0] / 2, s.width[0],
                       s.height[0], mode);
    });
}
peer libyuv_split_words(RotationMode mode) {
    return {"libyuv via planes", [=](const simgp_img &, const simgp_img &d) -> operation {
                const picture a(SIMGP_FMT_YUV400, d.width[0], d.height[0]);
                const picture b(SIMGP_FMT_YUV400, d.width[0], d.height[0]);
                return [=](const simgp_img &src, const simgp_img &dst) {
                    SplitRotateUV(src.plane[0], src.stride[0], a.plane[0], a.stride[0], b.plane[0],
                                  b.stride[0], src.width[0], src.height[0], mode);
                    MergeUVPlane(a.plane[0], a.stride[0], b.plane[0], b.stride[0], dst.plane[0],
                                 dst.stride[0], dst.width[0], dst.height[0]);
                };
            }};
}
// The even bytes of even rows, then the turn.
peer libyuv_quarter_size() {
    return {"libyuv via pairs", [](const simgp_img &s, const simgp_img &) -> operation {
                const picture even(SIMGP_FMT_YUV400, s.width[0] / 2, s.height[0] / 2);
                const picture odd(SIMGP_FMT_YUV400, s.width[0] / 2, 1);
                return [=](const simgp_img &src, const simgp_img &dst) {
                    SplitUVPlane(src.plane[0], 2 * src.stride[0], even.plane[0], even.stride[0],
                                 odd.plane[0], 0, even.width[0], even.height[0]);
                    RotatePlane90(even.plane[0], even.stride[0], dst.plane[0], dst.stride[0],
                                  even.width[0], even.height[0]);
                };
            }};
}

// libyuv's copies and mirrors of rows turn a source of negative height upside down.
template <class Function>
peer upside_down(Function *f, int size) {
    return libyuv_peer([=](const simgp_img &s, const simgp_img &d) {
        f(s.plane[0], s.stride[0], d.plane[0], d.stride[0], s.width[0] * size, -s.height[0]);
    });
}

}  // namespace

std::vector<comparison> rotate_comparisons() {
    const goal turn{2.0, 4, 0}, turn_words{5.0, 4, 0}, reverse{1.5, 0, 0.9}, move{1.0, 0, 0.9};
    const int words = SIMGP_FMT_RGB565, bytes = SIMGP_FMT_YUV400;
    const int u8 = CV_8UC1, u16 = CV_16UC1;
    const int left = cv::ROTATE_90_COUNTERCLOCKWISE, right = cv::ROTATE_90_CLOCKWISE;
    std::vector<conversion> all;
    const auto add = [&](const char *name, int format, simgp_plane_fn *kernel, const goal &goals,
                         std::vector<peer> peers) -> conversion & {
        conversion c{format, format, goals, std::move(peers), name, kernel_of_bytes(kernel)};
        c.tolerance = 1e-6;
        c.sizes = {"320x240", "1920x1080", "3840x2160", "1918x1078",
                   "512x256", "2048x1024", "4096x2048"};
        all.push_back(std::move(c));
        return all.back();
    };
    const auto add_turn = [&](auto... args) -> conversion & {
        conversion &c = add(args...);
        c.to_size = [](const size &from) { return size{from.height, from.width}; };
        return c;
    };
    const auto halve_rows = [](conversion &c) {
        c.to_size = [](const size &from) { return size{from.height / 2, from.width}; };
        c.part_read = 0.5;
    };
    using peers = std::vector<peer>;

    add_turn("rot_8b_90l", bytes, simgp_rot_8b_90l, turn,
             peers{libyuv_plane(RotatePlane270), opencv_rotate(u8, left)});
    add_turn("rot_8b_90r", bytes, simgp_rot_8b_90r, turn,
             peers{libyuv_plane(RotatePlane90), opencv_rotate(u8, right)});
    add_turn(
        "rot_16b_90l", words, simgp_rot_16b_90l, turn_words,
        peers{libyuv_words(kRotate270), libyuv_split_words(kRotate270), opencv_rotate(u16, left)});
    add_turn(
        "rot_16b_90r", words, simgp_rot_16b_90r, turn_words,
        peers{libyuv_words(kRotate90), libyuv_split_words(kRotate90), opencv_rotate(u16, right)});
    halve_rows(add("1x2_to_1x1_rot_90l", bytes, simgp_csc_1x2_to_1x1_rot_90l, turn,
                   {libyuv_plane(RotatePlane270, 2)}));
    halve_rows(add("1x2_to_1x1_rot_90r", bytes, simgp_csc_1x2_to_1x1_rot_90r, turn,
                   {libyuv_plane(RotatePlane90, 2)}));
    conversion whole{SIMGP_FMT_YUV422N, SIMGP_FMT_YUV420, turn};
    whole.name = "csc_rot_yuv422n_to_yuv420_90l";
    whole.ours = [](const simgp_img &s, const simgp_img &d) {
        if (simgp_csc_rot(&s, SIMGP_ROT_90L, &d) != SIMGP_OK) fail("csc_rot refuses");
    };
    whole.peers = {libyuv_peer([](const simgp_img &s, const simgp_img &d) {
        for (int k = 0, rows = 1; k < 3; k++, rows = 2)
            RotatePlane270(s.plane[k], rows * s.stride[k], d.plane[k], d.stride[k], s.width[k],
                           s.height[k] / rows);
    })};
    whole.tolerance = 1e-6;
    whole.against_swscale = false;
    whole.to_size = [](const size &from) { return size{from.height, from.width}; };
    whole.sizes = {"320x240", "1920x1080", "3840x2160", "1918x1078"};
    all.push_back(std::move(whole));

    conversion &quarter = add(
        "rsz_8b_rot_90r_quarter", bytes, nullptr, turn,
        {libyuv_quarter_size(),
         opencv_peer(u8, [half = std::make_shared<cv::Mat>()](const cv::Mat &from, cv::Mat &to) {
             cv::resize(from, *half, {to.rows, to.cols}, 0, 0, cv::INTER_NEAREST);
             cv::rotate(*half, to, cv::ROTATE_90_CLOCKWISE);
         })});
    quarter.ours = [](const simgp_img &s, const simgp_img &d) {
        simgp_rsz_8b_rot_90r_quarter(s.plane[0], s.stride[0], d.width[0], d.height[0], d.stride[0],
                                     d.plane[0]);
    };
    quarter.to_size = [](const size &from) { return size{from.height / 2, from.width / 2}; };
    quarter.part_read = 0.5;

    add("rot_8b_180", bytes, simgp_rot_8b_180, reverse,
        {libyuv_plane(RotatePlane180), opencv_flip(u8, -1)});
    add("rot_8b_hori", bytes, simgp_rot_8b_hori, reverse,
        {libyuv_plane(MirrorPlane), opencv_flip(u8, 1)});
    add("rot_8b_vert", bytes, simgp_rot_8b_vert, move,
        {upside_down(CopyPlane, 1), opencv_flip(u8, 0)});
    add("rot_16b_180", words, simgp_rot_16b_180, move,
        {upside_down(MirrorUVPlane, 1), opencv_flip(u16, -1)});
    add("rot_16b_hori", words, simgp_rot_16b_hori, move,
        {libyuv_plane(MirrorUVPlane), opencv_flip(u16, 1)});
    add("rot_16b_vert", words, simgp_rot_16b_vert, move,
        {upside_down(CopyPlane, 2), opencv_flip(u16, 0)});
    return compare_all(all);
}

}  // namespace bench
