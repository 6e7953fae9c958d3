// Resize with a turn: against a resize and a turn of the peers, one after the other, and against our
// resize without a turn.
#include "simgp/resize_rot.h"

#include <libyuv.h>

#include <opencv2/imgproc.hpp>

#include "bench/picture.h"

namespace bench {
namespace {

using namespace libyuv;

bool is_quarter(int rot) { return rot == SIMGP_ROT_90L || rot == SIMGP_ROT_90R; }

// A kernel, which turns as `rot` says, over plane 0.
operation kernel_by_code(simgp_rsz_fn *kernel, int rot) {
    return [=](const simgp_img &s, const simgp_img &d) {
        int32_t step_x, step_y;
        simgp_rsz_get_step(s.width[0], s.height[0], d.width[0], d.height[0], rot, &step_x, &step_y);
        kernel(s.plane[0], s.stride[0], d.width[0], d.height[0], d.stride[0], d.plane[0], step_x,
               step_y);
    };
}

picture before_turn(const simgp_img &d, int rot) {
    return is_quarter(rot) ? picture(d.format, d.height[0], d.width[0])
                           : picture(d.format, d.width[0], d.height[0]);
}

// libyuv, by functions of one plane of bytes or of pairs.
template <class Turn>
peer libyuv_steps(bool pairs, int rot, Turn turn) {
    return {"libyuv, two passes", [=](const simgp_img &, const simgp_img &dst) -> operation {
                const picture m = before_turn(dst, rot);
                return [=](const simgp_img &s, const simgp_img &d) {
                    (pairs ? UVScale : [](auto... args) { return ScalePlane(args...), 0; })(
                        s.plane[0], s.stride[0], s.width[0], s.height[0], m.plane[0], m.stride[0],
                        m.width[0], m.height[0], kFilterBilinear);
                    turn(m, d);
                };
            }};
}
peer libyuv_bytes(int rot, RotationMode mode) {
    return libyuv_steps(false, rot, [=](const simgp_img &m, const simgp_img &d) {
        RotatePlane(m.plane[0], m.stride[0], d.plane[0], d.stride[0], m.width[0], m.height[0],
                    mode);
    });
}
peer libyuv_pairs(int rot, RotationMode mode) {
    return libyuv_steps(true, rot, [=](const simgp_img &m, const simgp_img &d) {
        RotatePlane_16(reinterpret_cast<const uint16_t *>(m.plane[0]), m.stride[0] / 2,
                       reinterpret_cast<uint16_t *>(d.plane[0]), d.stride[0] / 2, m.width[0],
                       m.height[0], mode);
    });
}
peer opencv_steps(int type, int rot, int code) {
    return {"opencv, two passes", [=](const simgp_img &, const simgp_img &dst) -> operation {
                cv::setNumThreads(1);
                const picture m = before_turn(dst, rot);
                return [=](const simgp_img &s, const simgp_img &d) {
                    const auto mat = [=](const simgp_img &p) {
                        return cv::Mat(p.height[0], p.width[0], type, p.plane[0],
                                       size_t(p.stride[0]));
                    };
                    cv::Mat between = mat(m), to = mat(d);
                    cv::resize(mat(s), between, between.size(), 0, 0, cv::INTER_LINEAR);
                    cv::rotate(between, to, code);
                };
            }};
}

}  // namespace

std::vector<comparison> resize_rot_comparisons() {
    struct {
        const char *name;
        int rot;
        RotationMode mode;
        int code;
    } const turns[] = {{"90l", SIMGP_ROT_90L, kRotate270, cv::ROTATE_90_COUNTERCLOCKWISE},
                       {"90r", SIMGP_ROT_90R, kRotate90, cv::ROTATE_90_CLOCKWISE},
                       {"180", SIMGP_ROT_180, kRotate180, cv::ROTATE_180}};
    struct {
        const char *name;
        int times, by;
    } const ratios[] = {{"2/3", 2, 3}, {"3/2", 3, 2}};

    std::vector<conversion> all;
    for (const bool pairs : {false, true})
        for (const auto &t : turns)
            for (const auto &q : ratios) {
                const int rot = t.rot, times = q.times, by = q.by;
                const int format = pairs ? SIMGP_FMT_RGB565 : SIMGP_FMT_YUV400;
                auto *const table = pairs ? simgp_tbl_fn_rsz_8b8b_rot : simgp_tbl_fn_rsz_8b_rot;
                conversion c{format, format, {2.0}};
                c.name =
                    std::string(pairs ? "rsz_8b8b_rot_" : "rsz_8b_rot_") + t.name + " " + q.name;
                c.ours = kernel_by_code(table[rot], rot);
                if (pairs)
                    c.peers = {libyuv_pairs(rot, t.mode), opencv_steps(CV_8UC2, rot, t.code)};
                else
                    c.peers = {libyuv_bytes(rot, t.mode), opencv_steps(CV_8UC1, rot, t.code)};
                if (pairs) c.tolerance = 0;  // the pairs are no colours
                c.sizes = {"320x240", "1920x1080", "3840x2160"};
                c.to_size = [=](const size &from) {
                    const size to = {from.width * times / by, from.height * times / by};
                    return is_quarter(rot) ? size{to.height, to.width} : to;
                };
                c.twin = {"without a turn",
                          [=](const simgp_img &, const simgp_img &dst) -> operation {
                              const picture plain = before_turn(dst, rot);
                              const operation resize = kernel_by_code(table[0], SIMGP_ROT_NONE);
                              return
                                  [=](const simgp_img &s, const simgp_img &) { resize(s, plain); };
                          },
                          0.8};
                all.push_back(std::move(c));
            }
    return compare_all(all);
}

}  // namespace bench
