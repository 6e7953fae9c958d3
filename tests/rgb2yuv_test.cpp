// RGB to YUV and to RGB565: every kernel at every size and every colour against the formula.
#include <string.h>

#include <algorithm>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/rig.h"

namespace {

using rig::channel;
using rig::conversion;
using rig::rgb;

const std::vector<conversion> kernels = rig::conversions_of(rig::family::from_rgb);

// The planes with what is read or written: chroma rounded down, strides of whole pixels.
std::vector<rig::plane_shape> exact_shapes(int format, int width, int height) {
    auto shapes = rig::shapes_of(format, width, height);
    for (size_t k = 1; k < shapes.size(); k++)
        shapes[k] = rig::samples(width / 2, height / 2, shapes[k].sample_bytes);
    const int size = shapes[0].sample_bytes;
    if (size == 2 || size == 4) shapes[0].stride_unit = size;
    return shapes;
}

struct yuv {
    int y, u, v;
};
int floor_256(int sum) { return (sum + 256 * 256) / 256 - 256; }
yuv formula(const rgb &c) {
    return {floor_256(66 * c.r + 129 * c.g + 25 * c.b) + 16,
            floor_256(-38 * c.r - 74 * c.g + 112 * c.b + 128) + 128,
            floor_256(112 * c.r - 94 * c.g - 18 * c.b + 128) + 128};
}

// What every kernel must write: chroma comes from the top left pixel of each block.
void reference(const conversion &k, const rig::picture &src, const rig::picture &dst) {
    const rig::format &from = rig::format_of(k.from), &to = rig::format_of(k.to);
    const int width = src.widths[0], height = src.heights[0];
    for (int y = 0; y < height; y++)
        for (int x = 0; x < width; x++) {
            const rgb c = get_rgb(from, pixel(src, from, x, y));
            if (to.is_rgb()) {
                put_rgb(to, c, pixel(dst, to, x, y));
                continue;
            }
            const yuv e = formula(c);
            *sample(dst, to, channel::y, x, y) = uint8_t(e.y);
            if (y % 2 || x % 2 || y + 1 == height || x + 1 == width) continue;
            *sample(dst, to, channel::u, x, y) = uint8_t(e.u);
            *sample(dst, to, channel::v, x, y) = uint8_t(e.v);
        }
}

TEST(rgb2yuv, every_size) {
    for (const conversion &k : kernels)
        rig::check_jobs(k.name, {}, [&](int width, int height) {
            return rig::job{
                exact_shapes(k.from, width, height), exact_shapes(k.to, width, height),
                [&](const rig::picture &src, const rig::picture &dst) {
                    rig::call(k.run, src, dst);
                },
                [&](const rig::picture &src, const rig::picture &dst) { reference(k, src, dst); }};
        });
}

void check(const conversion &k, const rig::picture &src) {
    const auto shapes = rig::shapes_of(k.to, src.widths[0], src.heights[0]);
    rig::picture expected(shapes), got(shapes);
    reference(k, src, expected);
    rig::for_each_target([&](const rig::target_rows &) {
        for (const rig::plane &p : got.parts)  // not the result of the target before
            for (ptrdiff_t y = 0; y < p.shape().rows; y++)
                memset(p.row(y), 0, size_t(p.shape().row_bytes));
        rig::call(k.run, src, got);
        EXPECT_EQ(rig::difference(expected, got), "") << k.name;
    });
}

// Of a given red, each colour stands once where it gives chroma, and in an odd column and row.
TEST(rgb2yuv, every_24_bit_colour) {
    constexpr int size = 512;
    for (const conversion &k : kernels) {
        const rig::format &from = rig::format_of(k.from);
        if (from.red.count != 8) continue;
        if (k.to != SIMGP_FMT_YUV420 && !rig::format_of(k.to).is_rgb()) continue;
        rig::picture src(rig::shapes_of(k.from, size, size));
        for (int r = 0; r < 256 && !HasFailure(); r += rig::quick() ? 51 : 1) {
            for (int y = 0; y < size; y++)
                for (int x = 0; x < size; x++)
                    put_rgb(from, {r, y / 2, x % 2 ? 255 - x / 2 : x / 2}, pixel(src, from, x, y),
                            uint8_t(7 * x + y));
            check(k, src);
        }
    }
}

TEST(rgb2yuv, every_16_bit_colour) {
    rig::picture src(rig::shapes_of(SIMGP_FMT_RGB565, 512, 512));
    for (int y = 0; y < 512; y++)
        for (int x = 0; x < 512; x++) {
            src.row(0, y)[2 * x] = uint8_t(x / 2);
            src.row(0, y)[2 * x + 1] = uint8_t(y / 2);
        }
    check(rig::conversion_named("rgb565_to_yuv420"), src);
}

TEST(rgb2yuv, known_colours) {
    const struct {
        rgb c;
        yuv e;
    } known[] = {{{255, 255, 255}, {235, 128, 128}}, {{0, 0, 0}, {16, 128, 128}},
                 {{255, 0, 0}, {81, 90, 240}},       {{0, 255, 0}, {144, 54, 34}},
                 {{0, 0, 255}, {40, 240, 110}},      {{1, 1, 1}, {16, 128, 128}},
                 {{3, 3, 3}, {18, 128, 128}},        {{248, 252, 248}, {231, 127, 127}}};
    for (const auto &[c, e] : known) {
        const yuv f = formula(c);
        EXPECT_TRUE(f.y == e.y && f.u == e.u && f.v == e.v) << c.r << ' ' << c.g << ' ' << c.b;
    }
    const struct {
        uint8_t rgba[4];
        int word;
    } words[] = {{{255, 255, 255, 0}, 0xFFFF}, {{8, 4, 8, 255}, 0x0821}, {{7, 3, 7, 1}, 0x0000}};
    for (const auto &w : words)
        rig::for_each_target([&](const rig::target_rows &) {
            rig::picture src(rig::shapes_of(SIMGP_FMT_RGBA8888, 1, 1)),
                dst(rig::shapes_of(SIMGP_FMT_RGB565, 1, 1));
            memcpy(src.row(0, 0), w.rgba, 4);
            rig::call(simgp_csc_rgba8888_to_rgb565, src, dst);
            EXPECT_EQ(dst.row(0, 0)[0] | dst.row(0, 0)[1] << 8, w.word);
        });
}

// Lines of words and of four-byte pixels advance by whole pixels, rounded toward minus infinity.
TEST(rgb2yuv, strides_are_rounded_down_to_whole_pixels) {
    const struct {
        simgp_csc_fn *run;
        int from, to, sloppy_src, src, sloppy_dst, dst;
    } cases[] = {
        {simgp_csc_rgb565_to_yuv420, SIMGP_FMT_RGB565, SIMGP_FMT_YUV420, 21, 20, 13, 13},
        {simgp_csc_rgb565_to_yuv420, SIMGP_FMT_RGB565, SIMGP_FMT_YUV420, -21, -22, -13, -13},
        {simgp_csc_rgba8888_to_rgb565, SIMGP_FMT_RGBA8888, SIMGP_FMT_RGB565, 43, 40, 23, 22},
        {simgp_csc_rgba8888_to_rgb565, SIMGP_FMT_RGBA8888, SIMGP_FMT_RGB565, -41, -44, -23, -24},
        {simgp_csc_rgb888_to_rgb565, SIMGP_FMT_RGB888, SIMGP_FMT_RGB565, 31, 31, 21, 20},
    };
    const int width = 10, height = 3, middle = 200;
    rig::rng random(rig::seed());
    std::vector<uint8_t> in(2 * middle);
    rig::fill_bytes(in.data(), in.size(), rig::content::random, random);
    for (const auto &c : cases) {
        const auto run = [&](int src_stride, int dst_stride) {
            std::vector<uint8_t> y(2 * middle), u(2 * middle), v(2 * middle);
            uint8_t *const src[] = {in.data() + middle};
            uint8_t *const dst[] = {y.data() + middle, u.data() + middle, v.data() + middle};
            const int32_t src_strides[] = {src_stride},
                          dst_strides[] = {dst_stride, width / 2, width / 2};
            c.run(src, &width, &height, src_strides, dst_strides, dst);
            y.insert(y.end(), u.begin(), u.end());
            y.insert(y.end(), v.begin(), v.end());
            return y;
        };
        EXPECT_EQ(run(c.sloppy_src, c.sloppy_dst), run(c.src, c.dst)) << c.sloppy_src;
    }
}

TEST(rgb2yuv, lines_that_overlap_are_written_from_top_to_bottom) {
    for (const conversion &k : kernels)
        rig::check_overlapping_lines(k, 65, 12, exact_shapes(k.to, 65, 12));
}

}  // namespace
