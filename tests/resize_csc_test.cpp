// Resize with conversion: every pixel against the filter and the matrix in plain integers, and
// against a resize of the planes and a conversion, where that is the same.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/bilinear.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"

namespace {

constexpr int yuv420 = SIMGP_FMT_YUV420, t64x32 = SIMGP_FMT_T64X32, rgb565 = SIMGP_FMT_RGB565;

// ITU-R BT.601, limited range, 8 fractional bits.
void put_pixel(uint8_t *to, int y, int u, int v) {
    const auto clamped = [](int sum) { return std::min(std::max(sum >> 8, 0), 255); };
    y = 298 * (y - 16) + 128, u -= 128, v -= 128;
    rig::put_rgb(rig::format_of(rgb565),
                 {clamped(y + 409 * v), clamped(y - 100 * u - 208 * v), clamped(y + 516 * u)}, to);
}

// Byte x of a row of a tiled plane; of the row below its last one too: that of its tile, else the
// last row, or mid-grey where there is none.
int tiled_byte(const uint8_t *plane, int width, int rows, int x, int y) {
    if (rows == 0) return 128;
    if (y == rows && rows % 32 == 0) y--;
    return plane[simgp_get_tile_offset(width, rows, x, y)];
}

// Sample (x, y) of a channel.
int sample(const rig::picture &p, int format, rig::channel c, int x, int y) {
    if (format != t64x32) return p.row(int(c), y)[x];
    const int w = p.widths[0], h = p.heights[0];
    if (c == rig::channel::y) return tiled_byte(p.planes[0], w, h, x, y);
    return tiled_byte(p.planes[1], w, h / 2, 2 * x + (c == rig::channel::v), y);
}

void resize_and_convert(const rig::picture &src, int format, const rig::picture &dst) {
    const int w = dst.widths[0], h = dst.heights[0];
    const rig::spread across(src.widths[0], w), down(src.heights[0], h);
    const bool tiled = format == t64x32;
    const int chroma_width = tiled ? std::max(1, src.widths[0] / 2) : src.widths[1];
    const int chroma_height = tiled ? (src.heights[0] + 1) / 2 : src.heights[1];
    const rig::spread chroma_across(chroma_width, (w + 1) / 2),
        chroma_down(chroma_height, (h + 1) / 2);
    for (int y = 0; y < h; y++)
        for (int x = 0; x < w; x++) {
            const auto channel = [&](const rig::spread &a, const rig::spread &d, int i, int j,
                                     rig::channel c) {
                return rig::bilinear(a, d, i, j, [&](int column, int row) {
                    return sample(src, format, c, column, row);
                });
            };
            const auto chroma = [&](rig::channel c) {
                return channel(chroma_across, chroma_down, x / 2, y / 2, c);
            };
            put_pixel(dst.row(0, y) + 2 * x, channel(across, down, x, y, rig::channel::y),
                      chroma(rig::channel::u), chroma(rig::channel::v));
        }
}

void call(simgp_rsz_csc_fn *kernel, const rig::picture &s, const rig::picture &d) {
    kernel(s.planes, s.widths, s.heights, s.strides, d.widths, d.heights, d.strides, d.planes);
}
simgp_rsz_csc_fn *kernel_of(int format) {
    return format == t64x32 ? simgp_rsz_csc_t64x32_to_rgb565 : simgp_rsz_csc_yuv420_to_rgb565;
}
const char *name_of(int format) {
    return format == t64x32 ? "simgp_rsz_csc_t64x32_to_rgb565" : "simgp_rsz_csc_yuv420_to_rgb565";
}

// `chroma` pixels more than half are in the planes of chroma.
rig::job make_job(int format, rig::size from, rig::size to, int chroma = 0) {
    rig::job j{
        rig::shapes_of(format, from.width, from.height),
        {rig::samples(to.width, to.height, 2)},
        [=](const rig::picture &s, const rig::picture &d) { call(kernel_of(format), s, d); },
        [=](const rig::picture &s, const rig::picture &d) { resize_and_convert(s, format, d); }};
    if (chroma && format != t64x32)
        for (int k : {1, 2})
            j.src[size_t(k)] = rig::samples(from.width / 2 + chroma, from.height / 2 + chroma);
    j.dst[0].stride_unit = 2;  // odd ones have a test of their own
    return j;
}

// Also strips of several widths.
TEST(resize_csc, every_kernel) {
    for (int format : {yuv420, t64x32}) {
        const rig::sweep sizes{.max_width = 133,
                               .max_height = 71,
                               .rounds = 1,
                               .large = {{1, 1}, {1918, 6}, {1281, 35}, {2, 300}, {300, 2}}};
        int calls = 0;
        rig::check_resize_jobs(name_of(format), sizes,
                               [&](const rig::size &from, const rig::size &to) {
                                   return make_job(format, from, to, calls++ % 3);
                               });
    }
}

// Around the ends of tiles, in luma and in chroma, and of pairs of tile rows.
TEST(resize_csc, tiled_pictures_of_many_sizes) {
    const int widths[] = {1, 2, 3, 63, 64, 65, 127, 128, 129, 176, 191, 257};
    const int heights[] = {1, 2, 3, 31, 32, 33, 63, 64, 65, 66, 127, 128, 129, 144, 193};
    const rig::sweep few{.step_x = 11,
                         .max_width = 140,
                         .max_height = 100,
                         .rounds = 7,
                         .large = {{176, 144}, {320, 240}, {352, 288}}};
    int calls = 0;
    rig::check_jobs(name_of(t64x32), few, [&](int w, int h) {
        const rig::size from = {widths[calls % 12], heights[calls % 15]};
        calls++;
        return make_job(t64x32, from, {w, h});
    });
}

// Tiles of planes beyond the caches are asked for ahead, which changes nothing.
TEST(resize_csc, large_tiled_pictures) {
    rig::check_jobs(name_of(t64x32), {.max_width = 0, .rounds = 1, .large = {{410, 90}}},
                    [](int w, int h) {
                        return make_job(t64x32, {8100, 520}, {w, h});
                    });
}

// Every decimation across with every one down, and so strong ones that columns come alone.
TEST(resize_csc, strong_reductions) {
    const rig::sweep few{
        .step_x = 7,
        .max_width = 49,
        .max_height = 6,
        .rounds = 6,
        .large = {{66, 6}, {1, 1}, {1, 2}, {3, 7}, {5, 1}, {1, 1}, {2, 2}, {3, 3}}};
    const int ratios[] = {3, 5, 9, 17, 40, 1};
    for (int format : {yuv420, t64x32}) {
        int calls = 0;
        rig::check_jobs(name_of(format), few, [&](int w, int h) {
            const int ratio = ratios[calls % 6], other = ratios[calls / 6 % 6];
            calls++;
            if (w < 6) return make_job(format, {w * 8000 + 1, h * 9}, {w, h});
            return make_job(format, {w * ratio + calls % 3, h * other + calls % 2}, {w, h});
        });
    }
}

// A resize of the planes and a conversion: for even sizes, whose chroma is that of the descriptors.
TEST(resize_csc, two_steps_give_the_same) {
    rig::rng random(rig::seed());
    const auto check = [&](rig::size from, rig::size to) {
        SCOPED_TRACE(std::to_string(from.width) + " x " + std::to_string(from.height) + " to " +
                     std::to_string(to.width) + " x " + std::to_string(to.height));
        rig::picture src(rig::shapes_of(yuv420, from.width, from.height)),
            tiles(rig::shapes_of(t64x32, from.width, from.height)),
            resized(rig::shapes_of(yuv420, to.width, to.height));
        rig::picture expected({rig::samples(to.width, to.height, 2)}),
            got({rig::samples(to.width, to.height, 2)});
        src.fill(rig::content::random, random);
        const simgp_img a = src.img(yuv420), t = tiles.img(t64x32), b = resized.img(yuv420),
                        c = expected.img(rgb565), d = got.img(rgb565);
        ASSERT_EQ(simgp_csc(&a, &t), SIMGP_OK);
        ASSERT_EQ(simgp_rsz(&a, &b), SIMGP_OK);
        ASSERT_EQ(simgp_csc(&b, &c), SIMGP_OK);
        for (const simgp_img *from_img : {&a, &t}) {
            got.fill_pattern(3);
            EXPECT_EQ(simgp_rsz_csc(from_img, &d), SIMGP_OK);
            EXPECT_EQ(rig::difference(expected, got), "");
            EXPECT_EQ(got.stray_write(), "");
        }
    };
    for (auto [from, to] : {std::pair(rig::size{640, 480}, rig::size{320, 240}),
                            {{176, 144}, {352, 288}},
                            {{1920, 1080}, {1280, 720}},
                            {{1280, 720}, {1920, 1080}},
                            {{320, 180}, {1366, 768}},
                            {{1922, 82}, {202, 46}}})
        check(from, to);
}

// By pencil and paper: grey pictures are 298 (Y - 16) + 128 >> 8, whatever their size.
TEST(resize_csc, some_colours) {
    struct {
        int y, u, v, word;
    } const known[] = {{16, 128, 128, 0x0000}, {235, 128, 128, 0xFFFF}, {128, 128, 128, 0x8410},
                       {81, 90, 240, 0xF800},  {255, 128, 255, 0xFD7F}, {0, 128, 0, 0x02A0},
                       {200, 100, 150, 0xFE73}};
    for (const auto &c : known)
        for (int format : {yuv420, t64x32}) {
            rig::picture src(rig::shapes_of(format, 6, 4)), dst({rig::samples(9, 7, 2)});
            if (format == t64x32) {
                memset(src.planes[0], c.y, 8192);
                for (int i = 0; i < 8192; i++) src.planes[1][i] = uint8_t(i % 2 ? c.v : c.u);
            } else {
                const int samples[] = {c.y, c.u, c.v};
                for (int k = 0; k < 3; k++)
                    for (int y = 0; y < src.heights[k]; y++)
                        memset(src.row(k, y), samples[k], size_t(src.widths[k]));
            }
            const simgp_img a = src.img(format), b = dst.img(rgb565);
            ASSERT_EQ(simgp_rsz_csc(&a, &b), SIMGP_OK);
            for (int y = 0; y < 7; y++)
                for (int x = 0; x < 9; x++)
                    ASSERT_EQ(dst.row(0, y)[2 * x] | dst.row(0, y)[2 * x + 1] << 8, c.word)
                        << c.y << " " << c.u << " " << c.v << " from " << format;
        }
}

// Negative ones too: rounded down, not towards 0.
TEST(resize_csc, odd_strides_are_the_next_lower_even_ones) {
    rig::rng random(rig::seed());
    for (int format : {yuv420, t64x32}) {
        rig::picture src(rig::shapes_of(format, 40, 30));
        src.fill(rig::content::random, random);
        const auto run = [&](int32_t stride) {
            std::vector<uint8_t> dst(1200);
            const int32_t w = 23, h = 9;
            uint8_t *const planes[] = {dst.data() + 600};
            kernel_of(format)(src.planes, src.widths, src.heights, src.strides, &w, &h, &stride,
                              planes);
            return dst;
        };
        EXPECT_EQ(run(51), run(50));
        EXPECT_EQ(run(-51), run(-52));
    }
}

TEST(resize_csc, empty_destinations_are_left_alone) {
    const int32_t sizes[] = {8, 8, 8};
    uint8_t *const none[] = {nullptr, nullptr, nullptr};
    for (auto [w, h] : {std::pair(0, 4), {4, 0}, {-4, 4}, {4, -4}, {INT32_MIN, INT32_MIN}})
        for (int format : {yuv420, t64x32})
            kernel_of(format)(none, sizes, sizes, sizes, &w, &h, sizes, none);
}

// Nothing is touched: the planes have no bytes.
TEST(resize_csc, all_other_pairs_are_refused) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    const std::vector<int> codes = rig::format_codes();
    for (int size : {0, 64}) {
        for (int k = 0; k < 4; k++)
            src.widths[k] = src.heights[k] = dst.widths[k] = dst.heights[k] = size;
        for (int from : codes)
            for (int to : codes) {
                if ((from == yuv420 || from == t64x32) && to == rgb565) continue;
                const simgp_img a = src.img(from), b = dst.img(to);
                ASSERT_EQ(simgp_rsz_csc(&a, &b),
                          from == to ? SIMGP_ERR_PARAM : SIMGP_ERR_UNSUPPORTED)
                    << from << " to " << to;
            }
    }
    EXPECT_EQ(dst.stray_write(), "");
}

TEST(resize_csc, extents_beyond_the_arithmetic_are_refused) {
    rig::picture src({rig::samples(0, 0), rig::samples(0, 0), rig::samples(0, 0)});
    for (int format : {yuv420, t64x32})
        for (int which = 0; which < 6; which++)
            for (int extent : {0, -1, INT32_MIN, 8193, INT32_MAX}) {
                simgp_img a = src.img(format), b = src.img(rgb565);
                for (int k = 0; k < 2; k++) a.width[k] = a.height[k] = 64;
                b.width[0] = b.height[0] = 6000;
                int32_t *const words[] = {&a.width[0],  &a.height[0], &b.width[0],
                                          &b.height[0], &a.width[1],  &a.height[1]};
                if (format == t64x32 && which >= 4) continue;            // not read
                if ((which == 2 || which == 3) && extent > 0) continue;  // as large as one likes
                *words[which] = extent;
                EXPECT_EQ(simgp_rsz_csc(&a, &b), SIMGP_ERR_PARAM)
                    << format << ", " << which << ", " << extent;
            }
}

// Words that are not read may hold anything.
TEST(resize_csc, sizes_that_do_not_count) {
    rig::rng random(rig::seed());
    for (int format : {yuv420, t64x32}) {
        rig::picture src(rig::shapes_of(format, 50, 40)), expected({rig::samples(33, 17, 2)}),
            got({rig::samples(33, 17, 2)});
        src.fill(rig::content::random, random);
        resize_and_convert(src, format, expected);
        simgp_img a = src.img(format), b = got.img(rgb565);
        a.width[2] = a.height[2] = -1;
        if (format == t64x32) {
            a.width[1] = a.height[1] = 0;
            a.stride[0] = a.stride[1] = INT32_MIN;
            a.plane[2] = nullptr;
        }
        for (int k = 1; k < 4; k++) b.width[k] = b.height[k] = b.stride[k] = -1;
        EXPECT_EQ(simgp_rsz_csc(&a, &b), SIMGP_OK);
        EXPECT_EQ(rig::difference(expected, got), "");
    }
}

}  // namespace
