// Bilinear resize of one plane, against what users of other libraries would call for it. libyuv is
// asked for its bilinear filter and for the mean over boxes, whichever is faster: they are what it
// offers that blends in both directions.
#include "simgp/resize.h"

#include <libyuv.h>
#include <stdlib.h>
#include <zimg.h>

#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include "bench/picture.h"

namespace bench {
namespace {

// A plane of a picture: what is resized of it.
simgp_img plane_of(const simgp_img &p, int k) {
    simgp_img one = p;
    one.plane[0] = p.plane[k];
    one.stride[0] = p.stride[k];
    one.width[0] = p.width[k];
    one.height[0] = p.height[k];
    return one;
}
peer peer_of(const std::string &name, int plane, const operation &resize) {
    const operation run = [=](const simgp_img &s, const simgp_img &d) {
        resize(plane_of(s, plane), plane_of(d, plane));
    };
    return {name, [=](const simgp_img &, const simgp_img &) { return run; }};
}

template <class Scale>
std::vector<peer> libyuv_peers(int plane, Scale *scale) {
    std::vector<peer> peers;
    for (auto [filter, name] : {std::pair(libyuv::kFilterBilinear, "libyuv bilinear"),
                                {libyuv::kFilterBox, "libyuv box"}})
        peers.push_back(
            peer_of(name, plane, [=, f = filter](const simgp_img &s, const simgp_img &d) {
                scale(s.plane[0], s.stride[0], s.width[0], s.height[0], d.plane[0], d.stride[0],
                      d.width[0], d.height[0], f);
            }));
    return peers;
}

peer opencv_peer(int plane, int type) {
    cv::setNumThreads(1);
    return peer_of("OpenCV", plane, [=](const simgp_img &s, const simgp_img &d) {
        const cv::Mat from(s.height[0], s.width[0], type, s.plane[0], size_t(s.stride[0]));
        cv::Mat to(d.height[0], d.width[0], type, d.plane[0], size_t(d.stride[0]));
        cv::resize(from, to, to.size(), 0, 0, cv::INTER_LINEAR);
    });
}

operation zimg_resize(const simgp_img &src, const simgp_img &dst) {
    const auto format_of = [](const simgp_img &p) {
        zimg_image_format f;
        zimg_image_format_default(&f, ZIMG_API_VERSION);
        f.width = unsigned(p.width[0]);
        f.height = unsigned(p.height[0]);
        f.pixel_type = ZIMG_PIXEL_BYTE;
        f.color_family = ZIMG_COLOR_GREY;
        return f;
    };
    zimg_graph_builder_params how;
    zimg_graph_builder_params_default(&how, ZIMG_API_VERSION);
    how.resample_filter = ZIMG_RESIZE_BILINEAR;
    how.cpu_type = ZIMG_CPU_AUTO_64B;
    const zimg_image_format from = format_of(src), to = format_of(dst);
    const std::shared_ptr<zimg_filter_graph> graph(zimg_filter_graph_build(&from, &to, &how),
                                                   zimg_filter_graph_free);
    size_t bytes = 0;
    if (!graph || zimg_filter_graph_get_tmp_size(graph.get(), &bytes) != ZIMG_ERROR_SUCCESS)
        fail("zimg makes no graph");
    const std::shared_ptr<void> scratch(aligned_alloc(64, (bytes + 63) & ~size_t(63)), free);
    return [=](const simgp_img &s, const simgp_img &d) {
        zimg_image_buffer_const in = {ZIMG_API_VERSION, {}};
        zimg_image_buffer out = {ZIMG_API_VERSION, {}};
        in.plane[0] = {s.plane[0], s.stride[0], ZIMG_BUFFER_MAX};
        out.plane[0] = {d.plane[0], d.stride[0], ZIMG_BUFFER_MAX};
        zimg_filter_graph_process(graph.get(), &in, &out, scratch.get(), nullptr, nullptr, nullptr,
                                  nullptr);
    };
}

struct factor {
    const char *name;
    std::vector<std::string> sizes;
    double goal_of_bytes;
    bool all_kinds;  // have a goal
};
const factor factors[] = {
    {"2/3",
     {"480x360 to 320x240", "1920x1080 to 1280x720", "2880x1620 to 1920x1080",
      "5760x3240 to 3840x2160"},
     5,
     true},
    {"3/2",
     {"320x240 to 480x360", "1280x720 to 1920x1080", "1920x1080 to 2880x1620",
      "3840x2160 to 5760x3240"},
     2.7,
     true},
    {"1/2", {"320x240 to 160x120", "1920x1080 to 960x540", "3840x2160 to 1920x1080"}, 0.8, false},
    {"1/4", {"320x240 to 80x60", "1920x1080 to 480x270", "3840x2160 to 960x540"}, 4, false},
    {"2", {"160x120 to 320x240", "960x540 to 1920x1080", "1920x1080 to 3840x2160"}, 1, false},
};

struct kind {
    const char *name;
    simgp_rsz_fn *resize;
    int format, plane;
    double goal;  // 0: that of bytes
    std::vector<std::vector<peer>> peers;
};

}  // namespace

// Byte pairs are the chroma of pictures of these sizes; times are per pair.
std::vector<comparison> resize_comparisons() {
    const kind kinds[] = {
        {"rsz_8b",
         simgp_rsz_8b,
         SIMGP_FMT_YUV400,
         0,
         0,
         {libyuv_peers(0, libyuv::ScalePlane), {opencv_peer(0, CV_8UC1), {"zimg", zimg_resize}}}},
        {"rsz_8b8b",
         simgp_rsz_8b8b,
         SIMGP_FMT_NV12,
         1,
         5,
         {libyuv_peers(1, libyuv::UVScale), {opencv_peer(1, CV_8UC2)}}},
        {"rsz_8b8b8b", simgp_rsz_8b8b8b, SIMGP_FMT_RGB888, 0, 3, {{opencv_peer(0, CV_8UC3)}}},
        {"rsz_8b8b8b8b",
         simgp_rsz_8b8b8b8b,
         SIMGP_FMT_RGBA8888,
         0,
         3,
         {libyuv_peers(0, libyuv::ARGBScale), {opencv_peer(0, CV_8UC4)}}},
        {"rsz_5b6b5b", simgp_rsz_5b6b5b, SIMGP_FMT_RGB565, 0, 5, {}},
    };
    std::vector<comparison> all;
    for (const kind &k : kinds)
        for (const factor &f : factors) {
            const double goal = k.goal == 0 ? f.goal_of_bytes : f.all_kinds ? k.goal : 0;
            conversion c{k.format, k.format, {goal, 0}};
            c.plane = k.plane;
            for (const std::vector<peer> &some : k.peers)
                c.peers.insert(c.peers.end(), some.begin(), some.end());
            c.name = std::string(k.name) + "_" + f.name;
            c.ours = [resize = k.resize, plane = k.plane](const simgp_img &src,
                                                          const simgp_img &dst) {
                const simgp_img s = plane_of(src, plane), d = plane_of(dst, plane);
                int32_t x, y;
                simgp_rsz_get_step(s.width[0], s.height[0], d.width[0], d.height[0], SIMGP_ROT_NONE,
                                   &x, &y);
                resize(s.plane[0], s.stride[0], d.width[0], d.height[0], d.stride[0], d.plane[0], x,
                       y);
            };
            c.how = resizing::interpolates;
            c.sizes = f.sizes;
            // Peers whose grids meet in the middle of the pictures are half a sample off, and more
            // where they shrink.
            c.tolerance = 16;
            c.against_swscale = k.plane == 0;  // which has no call for a plane of pairs
            all.push_back(compare(c));
        }
    return all;
}

}  // namespace bench
