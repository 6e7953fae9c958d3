// Plane copy.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"

namespace {

simgp_plane_fn *const kernels[] = {simgp_cpy_8b, simgp_cpy_16b, simgp_cpy_24b, simgp_cpy_32b};

TEST(copy, every_kernel_copies_the_samples_and_nothing_else) {
    for (int bytes = 1; bytes <= 4; bytes++)
        rig::check_jobs("simgp_cpy_" + std::to_string(8 * bytes) + "b", {}, [&](int w, int h) {
            rig::plane_shape shape = rig::samples(w, h, bytes);
            if (bytes == 2) shape.stride_unit = 2;  // odd ones are another test's
            return rig::job{{shape},
                            {shape},
                            [=](const rig::picture &src, const rig::picture &dst) {
                                kernels[bytes - 1](src.planes[0], w, h, src.strides[0],
                                                   dst.strides[0], dst.planes[0]);
                            },
                            [=](const rig::picture &src, const rig::picture &dst) {
                                for (int y = 0; y < h; y++)
                                    std::copy_n(src.row(0, y), w * bytes, dst.row(0, y));
                            }};
        });
}

// Strides of 16-bit planes count whole samples, rounded down, and so does the test for one block.
TEST(copy, odd_strides_of_16_bit_planes_are_the_next_lower_even_ones) {
    uint8_t src[64];
    for (int i = 0; i < 64; i++) src[i] = uint8_t(i + 1);
    for (int from : {6, 7, 9, -7})
        for (int to : {6, 7, 11, -7, -5}) {
            uint8_t got[64] = {}, expected[64] = {};
            const auto even = [](int stride) { return stride % 2 ? stride - 1 : stride; };
            for (int y = 0; y < 3; y++)
                for (int i = 0; i < 6; i++)
                    expected[32 + y * even(to) + i] = src[32 + y * even(from) + i];
            simgp_cpy_16b(src + 32, 3, 3, from, to, got + 32);
            EXPECT_EQ(memcmp(got, expected, 64), 0) << from << " to " << to;
        }
}

TEST(copy, empty_planes_are_left_alone) {
    for (simgp_plane_fn *kernel : kernels)
        for (auto [w, h] : {std::pair(0, 4), {4, 0}, {-4, 4}, {4, -4}, {0, INT32_MIN}}) {
            uint8_t src[64] = {}, dst[64];
            memset(dst, 7, sizeof dst);
            kernel(src, w, h, 4, 4, dst);
            kernel(src, w, h, 16, 8, dst);
            EXPECT_EQ(std::count(dst, dst + 64, 7), 64) << w << " x " << h;
        }
}

TEST(copy, pictures_of_every_format) {
    rig::rng random(rig::seed());
    for (int format : rig::format_codes()) {
        SCOPED_TRACE(format);
        std::vector<rig::plane_shape> shapes;
        int width = 37, height = 5;
        for (int bytes : rig::kept_planes(format)) {
            shapes.push_back(rig::samples(width, height, bytes));
            width = 19, height = 3;
        }
        rig::picture src(shapes), dst(shapes);
        src.fill(rig::content::random, random);
        dst.fill_pattern(unsigned(format));
        const simgp_img from = src.img(format);
        simgp_img to = dst.img(format ^ 1);
        EXPECT_EQ(simgp_cpy(&from, &to), SIMGP_ERR_PARAM);
        to.format = format;
        for (int k = 0; k < 4; k++) to.width[k] = to.height[k] = -1;  // never read
        const bool known = !shapes.empty();
        // Padding and the bytes around stay: a call that was refused left the pattern, too.
        EXPECT_EQ(simgp_cpy(&from, &to), known ? SIMGP_OK : SIMGP_ERR_UNSUPPORTED);
        EXPECT_EQ(rig::difference(src, dst), "");
        EXPECT_EQ(dst.stray_write(), "");
    }
}

TEST(copy, refused_pictures_are_left_alone) {
    rig::picture src(rig::shapes_of(SIMGP_FMT_YUV420, 8, 8));
    rig::picture dst(rig::shapes_of(SIMGP_FMT_YUV420, 0, 0));
    dst.fill_pattern(1);
    for (auto [from, to] : {std::pair(1, 4),
                            {4, 1},
                            {0, 1},
                            {11, 11},
                            {11, 6},
                            {100, 100},
                            {101, 101},
                            {300, 300},
                            {400, 400},
                            {500, 500},
                            {503, 503},
                            {-1, -1}}) {
        const simgp_img a = src.img(from), b = dst.img(to);
        EXPECT_EQ(simgp_cpy(&a, &b), from == to ? SIMGP_ERR_UNSUPPORTED : SIMGP_ERR_PARAM);
        EXPECT_EQ(dst.stray_write(), "") << from << " to " << to;
    }
}

}  // namespace
