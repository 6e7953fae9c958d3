// The dispatcher: every pair of codes answers as the table says, and reaches its kernel.
#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

struct pair {
    int from, to;
    simgp_csc_fn *kernel;
};

#define PAIR(from, to, kernel) \
    { SIMGP_FMT_##from, SIMGP_FMT_##to, simgp_csc_##kernel }
// clang-format off
const pair pairs[] = {
    PAIR(YUV400, RGB565, yuv400_to_rgb565),
    PAIR(YUV420, RGB565, yuv420_to_rgb565),
    PAIR(YUV420, BGR565, yuv420_to_bgr565),
    PAIR(YUV420, RGB888, yuv420_to_rgb888),
    PAIR(YUV420, BGR888, yuv420_to_bgr888),
    PAIR(YUV420, RGBA8888, yuv420_to_rgba8888),
    PAIR(YUV420, BGRA8888, yuv420_to_bgra8888),
    PAIR(YUV420, ARGB8888, yuv420_to_argb8888),
    PAIR(YUV422N, RGB565, yuv422n_to_rgb565),
    PAIR(YUV422N, BGR565, yuv422n_to_bgr565),
    PAIR(YUV444, RGB565, yuv444_to_rgb565),
    PAIR(YUV444, BGR565, yuv444_to_bgr565),
    PAIR(YV12, RGB565, yv12_to_rgb565),
    PAIR(YV12, BGR565, yv12_to_bgr565),
    PAIR(YV12, RGB888, yv12_to_rgb888),
    PAIR(NV12, RGB565, nv12_to_rgb565),
    PAIR(NV12, BGR565, nv12_to_bgr565),
    PAIR(NV12, RGB888, nv12_to_rgb888),
    PAIR(NV21, RGB565, nv21_to_rgb565),
    PAIR(NV21, BGR565, nv21_to_bgr565),
    PAIR(NV21, RGB888, nv21_to_rgb888),
    PAIR(YUV422W, RGB565, yuv422w_to_rgb565),
    PAIR(YUV422W, BGR565, yuv422w_to_bgr565),
    PAIR(YUYV, RGB565, yuyv_to_rgb565),
    PAIR(YUYV, RGB888, yuyv_to_rgb888),
    PAIR(UYVY, RGB565, uyvy_to_rgb565),
    PAIR(UYVY, BGR565, uyvy_to_bgr565),
    PAIR(UYVY, RGB888, uyvy_to_rgb888),
    PAIR(UYVY, BGR888, uyvy_to_bgr888),
    PAIR(UYVY, RGBA8888, uyvy_to_rgba8888),
    PAIR(UYVY, BGRA8888, uyvy_to_bgra8888),
    PAIR(UYVY, ARGB8888, uyvy_to_argb8888),
    PAIR(RGB888, YUV420, rgb888_to_yuv420),
    PAIR(RGB888, YV12, rgb888_to_yv12),
    PAIR(RGB888, NV12, rgb888_to_nv12),
    PAIR(RGB888, NV21, rgb888_to_nv21),
    PAIR(RGB888, RGB565, rgb888_to_rgb565),
    PAIR(BGR888, YUV420, bgr888_to_yuv420),
    PAIR(BGR888, YV12, bgr888_to_yv12),
    PAIR(RGB565, YUV420, rgb565_to_yuv420),
    PAIR(RGB565, YV12, rgb565_to_yv12),
    PAIR(RGB565, NV12, rgb565_to_nv12),
    PAIR(RGB565, NV21, rgb565_to_nv21),
    PAIR(RGBA8888, RGB565, rgba8888_to_rgb565),
    PAIR(YUV420, YUV422N, yuv420_to_yuv422n),
    PAIR(YUV420, YV12, yuv420_to_yv12),
    PAIR(YUV420, NV12, yuv420_to_nv12),
    PAIR(YUV420, NV21, yuv420_to_nv21),
    PAIR(YUV420, T64X32, yuv420_to_t64x32),
    PAIR(YUV422N, YUV420, yuv422n_to_yuv420),
    PAIR(YUV422N, YV12, yuv422n_to_yv12),
    PAIR(YV16, YV12, yv16_to_yv12),
    PAIR(YV16, YUV420, yv16_to_yuv420),
    PAIR(NV12, YUV420, nv12_to_yuv420),
    PAIR(NV12, YV12, nv12_to_yv12),
    PAIR(NV21, YUV420, nv21_to_yuv420),
    PAIR(NV21, YV12, nv21_to_yv12),
    PAIR(T64X32, RGB565, t64x32_to_rgb565),
    PAIR(T64X32, BGRA8888, t64x32_to_bgra8888),
    PAIR(T64X32, NV12, t64x32_to_nv12),
    PAIR(T64X32, YUV420, t64x32_to_yuv420),
};
// clang-format on

// All codes, and some that are none.
const int codes[] = {0,   1,   2,   3,   4,   5,   6,   7,         8,         9,        10,  11,
                     12,  99,  100, 101, 102, 200, 201, 202,       300,       400,      401, 402,
                     500, 501, 502, 503, -1,  -3,  256, 65536 + 1, INT32_MIN, INT32_MAX};

const pair *find(int from, int to) {
    for (const pair &p : pairs)
        if (p.from == from && p.to == to) return &p;
    return nullptr;
}

TEST(csc, pairs_that_convert_reach_their_kernel) {
    constexpr int width = 38, height = 6;
    rig::rng random(rig::seed());
    for (const pair &p : pairs) {
        SCOPED_TRACE(std::to_string(p.from) + " to " + std::to_string(p.to));
        const auto shapes = rig::shapes_of(p.to, width, height);
        rig::picture src(rig::shapes_of(p.from, width, height)), expected(shapes), got(shapes);
        src.fill(rig::content::random, random);
        expected.fill_pattern(1);
        got.fill_pattern(1);
        rig::call(p.kernel, src, expected);

        simgp_img from = src.img(p.from), to = got.img(p.to);
        for (int k = 0; k < 4; k++) to.width[k] = 3 - k, to.height[k] = -k;  // never read
        const simgp_img from_before = from, to_before = to;
        EXPECT_EQ(simgp_csc(&from, &to), SIMGP_OK);
        EXPECT_EQ(rig::difference(expected, got), "");
        EXPECT_EQ(got.stray_write(), "");
        EXPECT_EQ(memcmp(&from, &from_before, sizeof from), 0);
        EXPECT_EQ(memcmp(&to, &to_before, sizeof to), 0);
    }
}

// Everything else is refused, and nothing is touched: the planes have no bytes.
TEST(csc, all_other_pairs_are_refused) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    for (int k = 0; k < 4; k++) src.widths[k] = src.heights[k] = 64;
    for (int from : codes)
        for (int to : codes) {
            if (find(from, to)) continue;
            const simgp_img a = src.img(from), b = dst.img(to);
            EXPECT_EQ(simgp_csc(&a, &b), from == to ? SIMGP_ERR_PARAM : SIMGP_ERR_UNSUPPORTED)
                << from << " to " << to;
        }
    EXPECT_EQ(dst.stray_write(), "");
}

// The size is that of the source, and an empty one is no error.
TEST(csc, an_empty_picture_is_converted_to_nothing) {
    for (const pair &p : pairs) {
        rig::picture src(rig::shapes_of(p.from, 0, 0)), dst(rig::shapes_of(p.to, 0, 0));
        dst.fill_pattern(3);
        const simgp_img from = src.img(p.from), to = dst.img(p.to);
        EXPECT_EQ(simgp_csc(&from, &to), SIMGP_OK) << p.from << " to " << p.to;
        EXPECT_EQ(dst.stray_write(), "") << p.from << " to " << p.to;
    }
}

}  // namespace
