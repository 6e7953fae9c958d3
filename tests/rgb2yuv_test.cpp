// RGB to YUV and to RGB565: every kernel against its scalar rows, every colour against the formula.
#include <string.h>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

struct kernel {
    const char *name;
    simgp_csc_fn *run;
    int from, to;
};

#define KERNEL(name, from, to) \
    { #name, simgp_csc_##name, SIMGP_FMT_##from, SIMGP_FMT_##to }
const kernel kernels[] = {
    KERNEL(rgb888_to_yuv420, RGB888, YUV420), KERNEL(rgb888_to_yv12, RGB888, YV12),
    KERNEL(rgb888_to_nv12, RGB888, NV12),     KERNEL(rgb888_to_nv21, RGB888, NV21),
    KERNEL(bgr888_to_yuv420, BGR888, YUV420), KERNEL(bgr888_to_yv12, BGR888, YV12),
    KERNEL(rgb565_to_yuv420, RGB565, YUV420), KERNEL(rgb565_to_yv12, RGB565, YV12),
    KERNEL(rgb565_to_nv12, RGB565, NV12),     KERNEL(rgb565_to_nv21, RGB565, NV21),
    KERNEL(rgb888_to_rgb565, RGB888, RGB565), KERNEL(rgba8888_to_rgb565, RGBA8888, RGB565),
};

// The planes with what is read or written: chroma rounded down, strides of whole pixels.
std::vector<rig::plane_shape> exact_shapes(int format, int width, int height) {
    auto shapes = rig::shapes_of(format, width, height);
    for (size_t k = 1; k < shapes.size(); k++)
        shapes[k] = rig::samples(width / 2, height / 2, shapes[k].sample_bytes);
    const int size = shapes[0].sample_bytes;
    if (size == 2 || size == 4) shapes[0].stride_unit = size;
    return shapes;
}

TEST(rgb2yuv, vector_rows_equal_scalar_rows) {
    for (const kernel &k : kernels)
        rig::check_jobs(k.name, {}, [&](int width, int height) {
            return rig::job{exact_shapes(k.from, width, height), exact_shapes(k.to, width, height),
                            [&](const rig::picture &src, const rig::picture &dst) {
                                rig::call(k.run, src, dst);
                            }};
        });
}

struct colour {
    int r, g, b;
};
struct yuv {
    int y, u, v;
};
int floor_256(int sum) { return (sum + 256 * 256) / 256 - 256; }
yuv formula(const colour &c) {
    return {floor_256(66 * c.r + 129 * c.g + 25 * c.b) + 16,
            floor_256(-38 * c.r - 74 * c.g + 112 * c.b + 128) + 128,
            floor_256(112 * c.r - 94 * c.g - 18 * c.b + 128) + 128};
}

// Two rows of pixels in four source formats, and what must come out of them.
struct test_card {
    explicit test_card(int32_t width)
        : rgb888(rig::shapes_of(SIMGP_FMT_RGB888, width, 2)),
          bgr888(rig::shapes_of(SIMGP_FMT_BGR888, width, 2)),
          rgba8888(rig::shapes_of(SIMGP_FMT_RGBA8888, width, 2)),
          rgb565(rig::shapes_of(SIMGP_FMT_RGB565, width, 2)),
          yuv420(rig::shapes_of(SIMGP_FMT_YUV420, width, 2)) {}

    // The RGB565 picture holds what the 16-bit word can hold of c.
    void set(ptrdiff_t x, ptrdiff_t y, const colour &c) {
        const uint8_t r = uint8_t(c.r), g = uint8_t(c.g), b = uint8_t(c.b);
        const uint8_t rgba[] = {r, g, b, uint8_t(7 * x)}, bgr[] = {b, g, r};
        memcpy(rgb888.row(0, y) + 3 * x, rgba, 3);
        memcpy(bgr888.row(0, y) + 3 * x, bgr, 3);
        memcpy(rgba8888.row(0, y) + 4 * x, rgba, 4);
        const int word = r / 8 * 2048 + g / 4 * 32 + b / 8;
        rgb565.row(0, y)[2 * x] = uint8_t(word % 256);
        rgb565.row(0, y)[2 * x + 1] = uint8_t(word / 256);
        const yuv e = formula(c);
        yuv420.row(0, y)[x] = uint8_t(e.y);
        if (y == 0 && x % 2 == 0) {
            yuv420.row(1, 0)[x / 2] = uint8_t(e.u);
            yuv420.row(2, 0)[x / 2] = uint8_t(e.v);
        }
    }

    rig::picture rgb888, bgr888, rgba8888, rgb565, yuv420;
};

void expect(const rig::picture &expected, simgp_csc_fn *kernel, const rig::picture &src) {
    std::vector<rig::plane_shape> shapes;
    for (const rig::plane &p : expected.parts) shapes.push_back(p.shape());
    rig::picture got(shapes);
    rig::for_each_target([&](const rig::target_rows &) {
        got.fill_pattern(0);
        rig::call(kernel, src, got);
        EXPECT_EQ(rig::difference(expected, got), "");
    });
}

// Each colour stands once in an even column, where it gives chroma, and once in an odd one; both
// rows are the same.
TEST(rgb2yuv, every_24_bit_colour) {
    test_card card(2 * 65536);
    for (int r = 0; r < 256 && !HasFailure(); r += rig::quick() ? 51 : 1) {
        for (int i = 0; i < 65536; i++) {
            card.set(2 * i, 0, {r, i >> 8, i & 255});
            card.set(2 * i + 1, 0, {r, 255 - (i >> 8), 255 - (i & 255)});
        }
        for (rig::picture *p :
             {&card.rgb888, &card.bgr888, &card.rgba8888, &card.rgb565, &card.yuv420})
            memcpy(p->row(0, 1), p->row(0, 0), size_t(p->parts[0].shape().row_bytes));
        expect(card.yuv420, simgp_csc_rgb888_to_yuv420, card.rgb888);
        expect(card.yuv420, simgp_csc_bgr888_to_yuv420, card.bgr888);
        expect(card.rgb565, simgp_csc_rgb888_to_rgb565, card.rgb888);
        expect(card.rgb565, simgp_csc_rgba8888_to_rgb565, card.rgba8888);
    }
}

TEST(rgb2yuv, every_16_bit_colour) {
    test_card card(2 * 65536);
    for (int word = 0; word < 65536; word++) {
        const colour c{word / 2048 * 8, word / 32 % 64 * 4, word % 32 * 8}, white{248, 252, 248};
        card.set(2 * word, 0, c);
        card.set(2 * word + 1, 0, white);
        card.set(word, 1, c);
        card.set(65536 + word, 1, white);
    }
    expect(card.yuv420, simgp_csc_rgb565_to_yuv420, card.rgb565);
}

TEST(rgb2yuv, known_colours) {
    const struct {
        colour c;
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
        colour c;
        int word;
    } words[] = {{{255, 255, 255}, 0xFFFF}, {{8, 4, 8}, 0x0821}, {{7, 3, 7}, 0x0000}};
    for (const auto &[c, word] : words) {
        test_card card(1);
        card.set(0, 0, c);
        card.set(0, 1, c);
        EXPECT_EQ(card.rgb565.row(0, 0)[0] | card.rgb565.row(0, 0)[1] << 8, word);
        expect(card.rgb565, simgp_csc_rgba8888_to_rgb565, card.rgba8888);
    }
}

// The samples of a planar picture, checked above, in the other layouts.
TEST(rgb2yuv, layouts_hold_the_same_samples) {
    const int width = 139, height = 7;
    const struct {
        int from;
        simgp_csc_fn *yuv420, *yv12, *nv12, *nv21;
    } sources[] = {
        {SIMGP_FMT_RGB888, simgp_csc_rgb888_to_yuv420, simgp_csc_rgb888_to_yv12,
         simgp_csc_rgb888_to_nv12, simgp_csc_rgb888_to_nv21},
        {SIMGP_FMT_RGB565, simgp_csc_rgb565_to_yuv420, simgp_csc_rgb565_to_yv12,
         simgp_csc_rgb565_to_nv12, simgp_csc_rgb565_to_nv21},
        {SIMGP_FMT_BGR888, simgp_csc_bgr888_to_yuv420, simgp_csc_bgr888_to_yv12, nullptr, nullptr}};
    rig::rng random(rig::seed());
    for (const auto &s : sources) {
        const auto make = [&](int format) {
            return rig::picture(exact_shapes(format, width, height));
        };
        rig::picture src = make(s.from), planar = make(SIMGP_FMT_YUV420);
        src.fill(rig::content::random, random);
        rig::call(s.yuv420, src, planar);

        rig::picture yv12 = make(SIMGP_FMT_YV12), nv12 = make(SIMGP_FMT_NV12),
                     nv21 = make(SIMGP_FMT_NV21);
        for (rig::picture *p : {&yv12, &nv12, &nv21})
            for (int y = 0; y < height; y++) memcpy(p->row(0, y), planar.row(0, y), width);
        for (int y = 0; y < height / 2; y++)
            for (int x = 0; x < width / 2; x++) {
                const uint8_t u = planar.row(1, y)[x], v = planar.row(2, y)[x];
                yv12.row(1, y)[x] = nv12.row(1, y)[2 * x + 1] = nv21.row(1, y)[2 * x] = v;
                yv12.row(2, y)[x] = nv12.row(1, y)[2 * x] = nv21.row(1, y)[2 * x + 1] = u;
            }
        expect(yv12, s.yv12, src);
        if (s.nv12) expect(nv12, s.nv12, src);
        if (s.nv21) expect(nv21, s.nv21, src);
    }
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

}  // namespace
