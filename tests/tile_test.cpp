// The tiled layout: addresses against a walk through the tiles as they lie in memory, and every
// kernel against those addresses.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"
#include "tests/tile_map.h"

namespace {

using rig::tile_map;

TEST(tile, offsets_follow_the_tiles_through_memory) {
    for (int width = 1; width <= 700; width += width < 140 ? 1 : 31)
        for (int height : {1, 2, 31, 32, 33, 63, 64, 65, 96, 97, 128, 150, 192, 193}) {
            const tile_map map(width, height);
            EXPECT_EQ(map.size(), rig::shapes_of(SIMGP_FMT_T64X32, width, 2 * height)[1].row_bytes);
            for (int y = 0; y < height; y++)
                for (int x = 0; x < width; x += 1 + (x % 64 > 1 && x % 64 < 50) * 13)
                    ASSERT_EQ(simgp_get_tile_offset(width, height, x, y), map.at(x, y))
                        << width << " x " << height << ": " << x << ", " << y;
        }
}

TEST(tile, offsets_of_hd_frames) {
    const auto hd = [](int x, int y) { return simgp_get_tile_offset(1280, 720, x, y); };
    EXPECT_EQ(hd(0, 0), 0);
    EXPECT_EQ(hd(64, 0), 2048);
    EXPECT_EQ(hd(0, 32), 4096);
    EXPECT_EQ(hd(128, 0), 12288);
    EXPECT_EQ(hd(0, 704), 901120);
    EXPECT_EQ(hd(64, 704), 903168);
    EXPECT_EQ(hd(256, 704), 909312);
    EXPECT_EQ(simgp_get_tile_offset(1920, 1080, 1919, 1079), tile_map(1920, 1080).at(1919, 1079));
}

// Kernels
// -----------------------------------------------------------------------------------------

// Widths up to more than two tiles, in pictures of up to three tile rows, of chroma as well.
const rig::sweep sizes{
    .max_width = 133,
    .max_height = 131,
    .rounds = 3,
    .large = {{130, 1}, {320, 193}, {257, 129}, {130, 65}, {256, 64}, {720, 98}}};

rig::plane_shape tiled(int width, int rows) {
    return rig::shapes_of(SIMGP_FMT_T64X32, width, 2 * rows)[1];
}

TEST(tile, planes_to_linear_rows) {
    rig::check_jobs("simgp_csc_copy_tiles_to_linear", sizes, [](int w, int h) {
        return rig::job{{tiled(w, h)},
                        {rig::samples(w, h)},
                        [=](const rig::picture &src, const rig::picture &dst) {
                            simgp_csc_copy_tiles_to_linear(src.planes[0], w, h, dst.strides[0],
                                                           dst.planes[0]);
                        },
                        [=](const rig::picture &src, const rig::picture &dst) {
                            const tile_map map(w, h);
                            for (int y = 0; y < h; y++)
                                for (int x = 0; x < w; x++)
                                    dst.row(0, y)[x] = src.planes[0][map.at(x, y)];
                        }};
    });
}

TEST(tile, pairs_to_linear_rows_of_u_and_v) {
    rig::check_jobs("simgp_csc_unpack_tiles_to_linear", sizes, [](int w, int h) {
        return rig::job{{tiled(w, h)},
                        {rig::samples((w + 1) / 2, h), rig::samples(w / 2, h)},
                        [=](const rig::picture &src, const rig::picture &dst) {
                            simgp_csc_unpack_tiles_to_linear(src.planes[0], w, h, dst.strides[0],
                                                             dst.planes[0], dst.strides[1],
                                                             dst.planes[1]);
                        },
                        [=](const rig::picture &src, const rig::picture &dst) {
                            const tile_map map(w, h);
                            for (int y = 0; y < h; y++)
                                for (int x = 0; x < w; x++)
                                    dst.row(x % 2, y)[x / 2] = src.planes[0][map.at(x, y)];
                        }};
    });
}

// An odd width leaves the last V of a row unwritten, an odd height the last row of chroma.
using walk = std::function<void(const rig::picture &, const rig::picture &)>;
void check(const char *name, simgp_csc_fn *kernel, int from, int to,
           const std::function<walk(int w, int h)> &reference) {
    rig::check_jobs(name, sizes, [&](int w, int h) {
        rig::job j{
            rig::shapes_of(from, w, h), rig::shapes_of(to, w, h),
            [=](const rig::picture &src, const rig::picture &dst) { rig::call(kernel, src, dst); },
            reference(w, h), true};
        return j;
    });
}

TEST(tile, pictures_to_nv12) {
    check("simgp_csc_t64x32_to_nv12", simgp_csc_t64x32_to_nv12, SIMGP_FMT_T64X32, SIMGP_FMT_NV12,
          [](int w, int h) -> walk {
              return [=](const rig::picture &src, const rig::picture &dst) {
                  for (int k : {0, 1}) {
                      const tile_map map(w, h / (k + 1));
                      for (int y = 0; y < h / (k + 1); y++)
                          for (int x = 0; x < w; x++)
                              dst.row(k, y)[x] = src.planes[k][map.at(x, y)];
                  }
              };
          });
}

TEST(tile, pictures_to_yuv420) {
    check("simgp_csc_t64x32_to_yuv420", simgp_csc_t64x32_to_yuv420, SIMGP_FMT_T64X32,
          SIMGP_FMT_YUV420, [](int w, int h) -> walk {
              return [=](const rig::picture &src, const rig::picture &dst) {
                  const tile_map luma(w, h), pairs(w, h / 2);
                  for (int y = 0; y < h; y++)
                      for (int x = 0; x < w; x++) dst.row(0, y)[x] = src.planes[0][luma.at(x, y)];
                  for (int y = 0; y < h / 2; y++)
                      for (int x = 0; x < w; x++)
                          dst.row(1 + x % 2, y)[x / 2] = src.planes[1][pairs.at(x, y)];
              };
          });
}

// Also holds that bytes of tiles outside the picture stay.
TEST(tile, pictures_from_yuv420) {
    check("simgp_csc_yuv420_to_t64x32", simgp_csc_yuv420_to_t64x32, SIMGP_FMT_YUV420,
          SIMGP_FMT_T64X32, [](int w, int h) -> walk {
              return [=](const rig::picture &src, const rig::picture &dst) {
                  const tile_map luma(w, h), pairs(w, h / 2);
                  for (int y = 0; y < h; y++)
                      for (int x = 0; x < w; x++) dst.planes[0][luma.at(x, y)] = src.row(0, y)[x];
                  for (int y = 0; y < h / 2; y++)
                      for (int x = 0; x < (w + 1) / 2; x++) {
                          dst.planes[1][pairs.at(2 * x, y)] = src.row(1, y)[x];
                          dst.planes[1][pairs.at(2 * x, y) + 1] = src.row(2, y)[x];
                      }
              };
          });
}

// Each row is a picture of one row in YUV420, whose kernels have tests of their own.
void check_rgb(const char *name, simgp_csc_fn *kernel, int to, simgp_csc_fn *from_yuv420) {
    const int size = rig::format_of(to).pixel_bytes;
    rig::check_jobs(name, sizes, [&](int w, int h) {
        rig::job j{rig::shapes_of(SIMGP_FMT_T64X32, w, h), rig::shapes_of(to, w, h), {}, {}};
        j.dst[0].stride_unit = size;
        j.run = [=](const rig::picture &src, const rig::picture &dst) {
            rig::call(kernel, src, dst);
        };
        j.reference = [=](const rig::picture &src, const rig::picture &dst) {
            const tile_map luma(w, h), pairs(w, h / 2);
            const size_t room = size_t(w);
            std::vector<uint8_t> y_row(room), u_row(room), v_row(room);
            for (int y = 0; y < h; y++) {
                // A row of chroma below the last one, but of its tile, is read from there.
                int line = y / 2;
                if (line / 32 > (h / 2 - 1) / 32) line = h / 2 - 1;
                for (int x = 0; x < w; x++) {
                    y_row[size_t(x)] = src.planes[0][luma.at(x, y)];
                    if (x % 2) continue;
                    const uint8_t *pair = h == 1 ? nullptr : src.planes[1] + pairs.at(x, line);
                    u_row[size_t(x / 2)] = pair ? pair[0] : 128;
                    v_row[size_t(x / 2)] = pair ? pair[1] : 128;
                }
                uint8_t *const rows[] = {y_row.data(), u_row.data(), v_row.data()};
                uint8_t *const to_row[] = {dst.row(0, y)};
                const int32_t one = 1, none[3] = {};
                from_yuv420(rows, &w, &one, none, none, to_row);
            }
        };
        return j;
    });
}

TEST(tile, pictures_to_rgb565) {
    check_rgb("simgp_csc_t64x32_to_rgb565", simgp_csc_t64x32_to_rgb565, SIMGP_FMT_RGB565,
              simgp_csc_yuv420_to_rgb565);
}

TEST(tile, pictures_to_bgra8888) {
    check_rgb("simgp_csc_t64x32_to_bgra8888", simgp_csc_t64x32_to_bgra8888, SIMGP_FMT_BGRA8888,
              simgp_csc_yuv420_to_bgra8888);
}

// Strides count whole pixels, rounded down.
TEST(tile, odd_strides_of_rgb_are_rounded_down) {
    rig::rng random(rig::seed());
    rig::picture src(rig::shapes_of(SIMGP_FMT_T64X32, 70, 6));
    src.fill(rig::content::random, random);
    const auto run = [&](simgp_csc_fn *kernel, int32_t stride) {
        std::vector<uint8_t> dst(6 * 320);
        uint8_t *const planes[] = {dst.data() + (stride < 0 ? 5 * 300 : 0)};
        kernel(src.planes, src.widths, src.heights, src.strides, &stride, planes);
        return dst;
    };
    EXPECT_EQ(run(simgp_csc_t64x32_to_rgb565, 151), run(simgp_csc_t64x32_to_rgb565, 150));
    EXPECT_EQ(run(simgp_csc_t64x32_to_rgb565, -151), run(simgp_csc_t64x32_to_rgb565, -152));
    for (int more : {1, 2, 3}) {
        const auto kernel = simgp_csc_t64x32_to_bgra8888;
        EXPECT_EQ(run(kernel, 280 + more), run(kernel, 280));
        EXPECT_EQ(run(kernel, -284 + more), run(kernel, -284));
    }
}

TEST(tile, empty_pictures_are_left_alone) {
    for (auto [w, h] : {std::pair(0, 64), {64, 0}, {-64, 64}, {64, -64}, {64, -1}}) {
        uint8_t src[64] = {}, dst[64];
        memset(dst, 7, sizeof dst);
        uint8_t *const from[] = {src, src, src}, *const to[] = {dst, dst, dst};
        const int32_t strides[3] = {64, 64, 64};
        for (simgp_csc_fn *kernel :
             {simgp_csc_t64x32_to_nv12, simgp_csc_t64x32_to_yuv420, simgp_csc_t64x32_to_rgb565,
              simgp_csc_t64x32_to_bgra8888, simgp_csc_yuv420_to_t64x32})
            kernel(from, &w, &h, strides, strides, to);
        simgp_csc_copy_tiles_to_linear(src, w, h, 64, dst);
        simgp_csc_unpack_tiles_to_linear(src, w, h, 64, dst, 64, dst);
        EXPECT_EQ(std::count(dst, dst + 64, 7), 64) << w << " x " << h;
    }
}

}  // namespace
