// Layout conversions: every kernel at every size on every target, against where the samples belong.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

// Where a picture keeps sample x of chroma row y; `v`: of V, else of U.
uint8_t *chroma(int format, const rig::picture &p, bool v, int x, int y) {
    switch (format) {
        case SIMGP_FMT_NV12:
            return p.row(1, y) + 2 * x + (v ? 1 : 0);
        case SIMGP_FMT_NV21:
            return p.row(1, y) + 2 * x + (v ? 0 : 1);
        case SIMGP_FMT_YV12:
        case SIMGP_FMT_YV16:
            return p.row(v ? 1 : 2, y) + x;
        default:
            return p.row(v ? 2 : 1, y) + x;
    }
}

bool full_height(int format) { return format == SIMGP_FMT_YUV422N || format == SIMGP_FMT_YV16; }

struct kernel {
    const char *name;
    simgp_csc_fn *run;
    int from, to;
};
#define KERNEL(name, from, to) \
    { #name, simgp_csc_##name, SIMGP_FMT_##from, SIMGP_FMT_##to }
const kernel kernels[] = {
    KERNEL(yuv420_to_yv12, YUV420, YV12),       KERNEL(yuv420_to_yuv422n, YUV420, YUV422N),
    KERNEL(yuv420_to_nv12, YUV420, NV12),       KERNEL(yuv420_to_nv21, YUV420, NV21),
    KERNEL(yuv422n_to_yuv420, YUV422N, YUV420), KERNEL(yuv422n_to_yv12, YUV422N, YV12),
    KERNEL(yv16_to_yuv420, YV16, YUV420),       KERNEL(yv16_to_yv12, YV16, YV12),
    KERNEL(nv12_to_yuv420, NV12, YUV420),       KERNEL(nv12_to_yv12, NV12, YV12),
    KERNEL(nv21_to_yuv420, NV21, YUV420),       KERNEL(nv21_to_yv12, NV21, YV12),
};

TEST(layout, every_kernel_at_every_size_on_every_target) {
    for (const kernel &k : kernels)
        rig::check_jobs(k.name, {.max_width = 2 * 130}, [&](int w, int h) {
            const bool halved = full_height(k.from), doubled = full_height(k.to);
            const int chroma_rows = halved ? h / 2 : doubled ? (h + 1) / 2 * 2 : (h + 1) / 2;
            rig::job j{rig::shapes_of(k.from, w, h), rig::shapes_of(k.to, w, h), {}, {}};
            if (doubled)  // room for both rows of the last one
                for (size_t i : {1, 2}) j.dst[i] = rig::samples((w + 1) / 2, chroma_rows);
            // From 4:2:2 of odd height, the last chroma row is not written.
            j.holes = halved && h % 2;
            j.run = [=](const rig::picture &src, const rig::picture &dst) {
                rig::call(k.run, src, dst);
            };
            j.reference = [=](const rig::picture &src, const rig::picture &dst) {
                for (int y = 0; y < h; y++) std::copy_n(src.row(0, y), w, dst.row(0, y));
                for (int y = 0; y < chroma_rows; y++)
                    for (int x = 0; x < (w + 1) / 2; x++)
                        for (bool v : {false, true})
                            *chroma(k.to, dst, v, x, y) = *chroma(k.from, src, v, x,
                                                                  halved    ? 2 * y
                                                                  : doubled ? y / 2
                                                                            : y);
            };
            return j;
        });
}

// Planes
// -----------------------------------------------------------------------------------------

TEST(layout, pairs_are_taken_apart_to_the_last_odd_byte) {
    rig::check_jobs("simgp_csc_8b8b_unpck", {.max_width = 4 * 64 + 3}, [](int w, int h) {
        return rig::job{{rig::samples(w, h)},
                        {rig::samples((w + 1) / 2, h), rig::samples(w / 2, h)},
                        [=](const rig::picture &src, const rig::picture &dst) {
                            simgp_csc_8b8b_unpck(src.planes[0], w, h, src.strides[0],
                                                 dst.strides[0], dst.strides[1], dst.planes[0],
                                                 dst.planes[1]);
                        },
                        [=](const rig::picture &src, const rig::picture &dst) {
                            for (int y = 0; y < h; y++)
                                for (int x = 0; x < w; x++)
                                    dst.row(x % 2, y)[x / 2] = src.row(0, y)[x];
                        }};
    });
}

TEST(layout, two_planes_are_interleaved) {
    rig::check_jobs("simgp_csc_8b8b_pck", {}, [](int w, int h) {
        return rig::job{{rig::samples(w, h), rig::samples(w, h)},
                        {rig::samples(w, h, 2)},
                        [=](const rig::picture &src, const rig::picture &dst) {
                            simgp_csc_8b8b_pck(src.planes[0], src.planes[1], w, h, src.strides[0],
                                               src.strides[1], dst.strides[0], dst.planes[0]);
                        },
                        [=](const rig::picture &src, const rig::picture &dst) {
                            for (int y = 0; y < h; y++)
                                for (int x = 0; x < 2 * w; x++)
                                    dst.row(0, y)[x] = src.row(x % 2, y)[x / 2];
                        }};
    });
}

TEST(layout, rows_are_halved_and_doubled) {
    const uint8_t src[] = "aaa.bbb.ccc.ddd.eee";
    char got[33];
    const auto run = [&](simgp_plane_fn *kernel, const uint8_t *from, int width, int height,
                         int src_stride, int dst_stride, int first) {
        memset(got, '-', 32);
        got[32] = 0;
        kernel(from, width, height, src_stride, dst_stride, got + first);
        return got;
    };
    const auto halve = simgp_csc_1x2_to_1x1, twice = simgp_csc_1x1_to_1x2;
    EXPECT_STREQ(run(halve, src, 3, 4, 4, 3, 0), "aaaccc--------------------------");
    EXPECT_STREQ(run(halve, src, 3, 5, 4, 5, 1), "-aaa--ccc-----------------------");
    EXPECT_STREQ(run(halve, src, 3, 1, 4, 4, 0), "--------------------------------");
    EXPECT_STREQ(run(halve, src + 12, 2, 4, -4, 4, 0), "dd--bb--------------------------");
    EXPECT_STREQ(run(twice, src, 3, 2, 4, 3, 0), "aaaaaabbbbbb--------------------");
    EXPECT_STREQ(run(twice, src + 4, 2, 2, 8, -5, 20), "-----dd---dd---bb---bb----------");
}

TEST(layout, empty_planes_are_left_alone) {
    for (auto [w, h] : {std::pair(0, 4), {4, 0}, {-4, 4}, {4, -4}, {-1, -1}, {4, INT32_MIN}}) {
        uint8_t src[64] = {}, dst[64];
        memset(dst, 7, sizeof dst);
        simgp_csc_1x2_to_1x1(src, w, h, 4, 4, dst);
        simgp_csc_1x1_to_1x2(src, w, h, 4, 4, dst);
        simgp_csc_8b8b_pck(src, src, w, h, 4, 4, 8, dst);
        simgp_csc_8b8b_unpck(src, w, h, 8, 4, 4, dst, dst + 32);
        EXPECT_EQ(std::count(dst, dst + 64, 7), 64) << w << " x " << h;
    }
}

}  // namespace
