// YUV to RGB: hand-computed pixels, the formula over all colours, every kernel at every size.
#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

struct kernel {
    const char *name;
    simgp_csc_fn *run;
    int from, to;
    bool first_line_alone = false;  // odd heights, when W is no multiple of 4
    bool coarse = false;
};

#define KERNEL(name, from, to, ...) \
    { #name, simgp_csc_##name, SIMGP_FMT_##from, SIMGP_FMT_##to, __VA_ARGS__ }
const kernel kernels[] = {
    KERNEL(yuv400_to_rgb565, YUV400, RGB565),
    KERNEL(yuv420_to_rgb565, YUV420, RGB565, true),
    KERNEL(yuv420_to_bgr565, YUV420, BGR565),
    KERNEL(yuv420_to_rgb888, YUV420, RGB888),
    KERNEL(yuv420_to_bgr888, YUV420, BGR888),
    KERNEL(yuv420_to_rgba8888, YUV420, RGBA8888, true),
    KERNEL(yuv420_to_bgra8888, YUV420, BGRA8888, true),
    KERNEL(yuv420_to_argb8888, YUV420, ARGB8888, true),
    KERNEL(yv12_to_rgb565, YV12, RGB565, true),
    KERNEL(yv12_to_bgr565, YV12, BGR565),
    KERNEL(yv12_to_rgb888, YV12, RGB888),
    KERNEL(yuv422n_to_rgb565, YUV422N, RGB565),
    KERNEL(yuv422n_to_bgr565, YUV422N, BGR565),
    KERNEL(yuv422w_to_rgb565, YUV422W, RGB565),
    KERNEL(yuv422w_to_bgr565, YUV422W, BGR565),
    KERNEL(yuv444_to_rgb565, YUV444, RGB565),
    KERNEL(yuv444_to_bgr565, YUV444, BGR565),
    KERNEL(nv12_to_rgb565, NV12, RGB565),
    KERNEL(nv12_to_bgr565, NV12, BGR565),
    KERNEL(nv12_to_rgb888, NV12, RGB888),
    KERNEL(nv21_to_rgb565, NV21, RGB565, false, true),
    KERNEL(nv21_to_bgr565, NV21, BGR565),
    KERNEL(nv21_to_rgb888, NV21, RGB888),
};

// The reference, on its own numbers
// ----------------------------------------------------------------

struct rgb {
    int r, g, b;
};

int channel(int sum, int scale) {  // floor(sum / scale + 1/2), limited to a byte
    const int n = 2 * sum + scale, d = 2 * scale;
    const int floor = n >= 0 ? n / d : -((d - 1 - n) / d);
    return floor < 0 ? 0 : floor > 255 ? 255 : floor;
}

rgb matrix(bool coarse, int y, int u, int v) {
    y -= 16, u -= 128, v -= 128;
    if (coarse)
        return {channel(75 * y + 102 * v, 64), channel(75 * y - 25 * u - 52 * v, 64),
                channel(75 * y + 129 * u, 64)};
    return {channel(298 * y + 409 * v, 256), channel(298 * y - 100 * u - 208 * v, 256),
            channel(298 * y + 516 * u, 256)};
}

int pixel_bytes(int format) { return format < 400 ? 2 : format < 500 ? 3 : 4; }

void put(int format, rgb c, uint8_t *p) {
    const auto bytes = [&](int a, int b, int d, int e) {
        const uint8_t all[4] = {uint8_t(a), uint8_t(b), uint8_t(d), uint8_t(e)};
        memcpy(p, all, size_t(pixel_bytes(format)));
    };
    const auto word = [&](int high, int mid, int low) {
        const int w = high / 8 * 2048 + mid / 4 * 32 + low / 8;
        bytes(w % 256, w / 256, 0, 0);
    };
    switch (format) {
        case SIMGP_FMT_RGB565:
            return word(c.r, c.g, c.b);
        case SIMGP_FMT_BGR565:
            return word(c.b, c.g, c.r);
        case SIMGP_FMT_RGB888:
        case SIMGP_FMT_RGBA8888:
            return bytes(c.r, c.g, c.b, 255);
        case SIMGP_FMT_BGR888:
        case SIMGP_FMT_BGRA8888:
            return bytes(c.b, c.g, c.r, 255);
        default:
            return bytes(255, c.r, c.g, c.b);
    }
}

rgb pixel(const kernel &k, const rig::picture &src, int x, int y) {
    const int luma = src.row(0, y)[x];
    const int lead = k.first_line_alone && src.widths[0] % 4 ? src.heights[0] % 2 : 0;
    const int half = (y + lead) / 2;
    switch (k.from) {
        case SIMGP_FMT_YUV400:
            return {luma, luma, luma};
        case SIMGP_FMT_YUV420:
            return matrix(k.coarse, luma, src.row(1, half)[x / 2], src.row(2, half)[x / 2]);
        case SIMGP_FMT_YV12:
            return matrix(k.coarse, luma, src.row(2, half)[x / 2], src.row(1, half)[x / 2]);
        case SIMGP_FMT_YUV422N:
            return matrix(k.coarse, luma, src.row(1, y)[x / 2], src.row(2, y)[x / 2]);
        case SIMGP_FMT_YUV422W:
            return matrix(k.coarse, luma, src.row(1, half)[x], src.row(2, half)[x]);
        case SIMGP_FMT_YUV444:
            return matrix(k.coarse, luma, src.row(1, y)[x], src.row(2, y)[x]);
        case SIMGP_FMT_NV12:
            return matrix(k.coarse, luma, src.row(1, half)[x / 2 * 2],
                          src.row(1, half)[x / 2 * 2 + 1]);
        default:
            return matrix(k.coarse, luma, src.row(1, half)[x / 2 * 2 + 1],
                          src.row(1, half)[x / 2 * 2]);
    }
}

TEST(yuv2rgb, every_kernel_at_every_size_on_every_target) {
    for (const kernel &k : kernels)
        rig::check_csc(
            k.name, k.run, k.from, k.to, {}, [&](const rig::picture &src, const rig::picture &dst) {
                for (int y = 0; y < src.heights[0]; y++)
                    for (int x = 0; x < src.widths[0]; x++)
                        put(k.to, pixel(k, src, x, y), dst.row(0, y) + x * pixel_bytes(k.to));
            });
}

// Hand-computed pixels
// -----------------------------------------------------------------------------

// A picture of one colour; the pixels of the result, which must all be the same.
std::vector<uint8_t> flat(const kernel &k, int y, int u, int v) {
    rig::picture src(rig::shapes_of(k.from, 6, 4)), dst(rig::shapes_of(k.to, 6, 4));
    const auto set = [&](int plane, int step, int value) {
        for (ptrdiff_t row = 0; row < src.parts[size_t(plane)].shape().rows; row++)
            for (ptrdiff_t i = 0; i < src.parts[size_t(plane)].shape().row_bytes; i += step)
                src.row(plane, row)[i] = uint8_t(value);
    };
    set(0, 1, y);
    if (k.from == SIMGP_FMT_NV12 || k.from == SIMGP_FMT_NV21) {
        set(1, 1, k.from == SIMGP_FMT_NV12 ? v : u);
        set(1, 2, k.from == SIMGP_FMT_NV12 ? u : v);
    } else if (k.from != SIMGP_FMT_YUV400) {
        set(1, 1, k.from == SIMGP_FMT_YV12 ? v : u);
        set(2, 1, k.from == SIMGP_FMT_YV12 ? u : v);
    }
    rig::call(k.run, src, dst);
    const int size = pixel_bytes(k.to);
    const std::vector<uint8_t> first(dst.row(0, 0), dst.row(0, 0) + size);
    for (int row = 0; row < 4; row++)
        for (int x = 0; x < 6; x++)
            EXPECT_EQ(memcmp(dst.row(0, row) + x * size, first.data(), size_t(size)), 0) << k.name;
    return first;
}

const kernel &named(const char *name) {
    for (const kernel &k : kernels)
        if (strcmp(k.name, name) == 0) return k;
    abort();
}

using bytes = std::vector<uint8_t>;

TEST(yuv2rgb, colours_computed_by_hand) {
    const kernel &fine = named("yuv420_to_rgba8888");
    EXPECT_EQ(flat(fine, 16, 128, 128), (bytes{0, 0, 0, 255}));
    EXPECT_EQ(flat(fine, 235, 128, 128), (bytes{255, 255, 255, 255}));
    EXPECT_EQ(flat(fine, 0, 128, 128), (bytes{0, 0, 0, 255}));
    EXPECT_EQ(flat(fine, 255, 128, 128), (bytes{255, 255, 255, 255}));
    EXPECT_EQ(flat(fine, 128, 128, 128), (bytes{130, 130, 130, 255}));
    EXPECT_EQ(flat(fine, 81, 90, 240), (bytes{255, 0, 0, 255}));
    EXPECT_EQ(flat(fine, 145, 54, 34), (bytes{0, 255, 1, 255}));
    EXPECT_EQ(flat(fine, 41, 240, 110), (bytes{0, 0, 255, 255}));

    EXPECT_EQ(flat(named("yuv444_to_rgb565"), 81, 90, 240), (bytes{0x00, 0xF8}));
    EXPECT_EQ(flat(named("yuv444_to_bgr565"), 81, 90, 240), (bytes{0x1F, 0x00}));
    EXPECT_EQ(flat(named("nv12_to_rgb565"), 128, 128, 128), (bytes{0x10, 0x84}));

    const kernel &coarse = named("nv21_to_rgb565");  // 131, 131, 131; 251, 209, 159
    EXPECT_EQ(flat(coarse, 128, 128, 128), (bytes{0x10, 0x84}));
    EXPECT_EQ(flat(coarse, 200, 100, 150), (bytes{0x93, 0xFE}));

    const kernel &grey = named("yuv400_to_rgb565");
    EXPECT_EQ(flat(grey, 0, 0, 0), (bytes{0x00, 0x00}));
    EXPECT_EQ(flat(grey, 16, 0, 0), (bytes{0x82, 0x10}));
    EXPECT_EQ(flat(grey, 255, 0, 0), (bytes{0xFF, 0xFF}));
}

// Y, U, V = 200, 100, 150 is R, G, B = 249, 207, 158 from every source, in every byte order.
TEST(yuv2rgb, one_colour_through_every_kernel) {
    for (const kernel &k : kernels) {
        if (k.coarse || k.from == SIMGP_FMT_YUV400) continue;
        const bytes expected = k.to == SIMGP_FMT_RGB565     ? bytes{0x73, 0xFE}
                               : k.to == SIMGP_FMT_BGR565   ? bytes{0x7F, 0x9E}
                               : k.to == SIMGP_FMT_RGB888   ? bytes{249, 207, 158}
                               : k.to == SIMGP_FMT_BGR888   ? bytes{158, 207, 249}
                               : k.to == SIMGP_FMT_RGBA8888 ? bytes{249, 207, 158, 255}
                               : k.to == SIMGP_FMT_BGRA8888 ? bytes{158, 207, 249, 255}
                                                            : bytes{255, 249, 207, 158};
        EXPECT_EQ(flat(k, 200, 100, 150), expected) << k.name;
    }
}

TEST(yuv2rgb, odd_heights_choose_their_chroma_lines) {
    // Chroma line 0 is grey, line 1 is not.
    const auto lines = [](const char *name, int width) {
        const kernel &k = named(name);
        rig::picture src(rig::shapes_of(k.from, width, 3)), dst(rig::shapes_of(k.to, width, 3));
        for (int y = 0; y < 3; y++) memset(src.row(0, y), 128, size_t(width));
        for (int plane = 1; plane < 3; plane++)
            for (int y = 0; y < 2; y++)
                memset(src.row(plane, y), y ? 240 : 128, size_t(width + 1) / 2);
        rig::call(k.run, src, dst);
        std::string found;
        for (int y = 0; y < 3; y++) {
            const uint8_t *p = dst.row(0, y);
            const bool grey = k.to == SIMGP_FMT_RGB565 || k.to == SIMGP_FMT_BGR565
                                  ? p[0] == 0x10 && p[1] == 0x84
                                  : p[1] == 130 && p[2] == 130;
            found += grey ? '0' : '1';
        }
        return found;
    };
    for (const char *name : {"yuv420_to_rgb565", "yuv420_to_rgba8888", "yuv420_to_bgra8888",
                             "yuv420_to_argb8888", "yv12_to_rgb565"}) {
        EXPECT_EQ(lines(name, 6), "011") << name;
        EXPECT_EQ(lines(name, 7), "011") << name;
        EXPECT_EQ(lines(name, 8), "001") << name;
        EXPECT_EQ(lines(name, 12), "001") << name;
    }
    for (const char *name :
         {"yuv420_to_bgr565", "yuv420_to_rgb888", "yuv420_to_bgr888", "yv12_to_bgr565"}) {
        EXPECT_EQ(lines(name, 6), "001") << name;
        EXPECT_EQ(lines(name, 8), "001") << name;
    }
}

// All colours
// --------------------------------------------------------------------------------------

// Rows of 512 pixels: chroma pair i has U = i, the even pixel has Y = k + 37 i, the odd one
// Y = k + 37 i + 128, so over k = 0 ... 127 every Y meets every U, and over k = 0 ... 255 at even
// and at odd pixels. V stays.
//
// The vector rows of the machine see every colour, in quick runs once, with the three kernels that
// come first: they hold all arithmetic. The rest then sees some.
TEST(yuv2rgb, every_colour_on_every_target) {
    constexpr int width = 512;
    const kernel *const swept[] = {&named("yuv420_to_rgba8888"), &named("yuv420_to_rgb565"),
                                   &named("nv21_to_rgb565"),     &named("nv21_to_bgr565"),
                                   &named("yuv444_to_rgb565"),   &named("nv12_to_rgb888")};
    rig::picture half(rig::shapes_of(SIMGP_FMT_YUV420, width, 1));
    rig::picture full(rig::shapes_of(SIMGP_FMT_YUV444, width, 1));
    rig::picture uv(rig::shapes_of(SIMGP_FMT_NV12, width, 1));
    rig::picture vu(rig::shapes_of(SIMGP_FMT_NV21, width, 1));
    const auto source = [&](const kernel &k) -> rig::picture & {
        return k.from == SIMGP_FMT_YUV420 ? half
               : k.from == SIMGP_FMT_NV12 ? uv
               : k.from == SIMGP_FMT_NV21 ? vu
                                          : full;
    };
    const auto &all = rig::all_targets();
    for (int v = 0; v < 256; v++) {
        const bool in_full = v % 51 == 0;
        std::vector<rig::target_rows> targets(all.begin() + (in_full ? 0 : 2), all.end());
        if (!in_full && !rig::quick()) targets.push_back(all[0]);  // scalar; all[1] is lanes
        if (targets.empty()) continue;
        for (int pair = 0; pair < 256; pair++) {
            half.row(1, 0)[pair] = uv.row(1, 0)[2 * pair] = vu.row(1, 0)[2 * pair + 1] =
                full.row(1, 0)[2 * pair] = full.row(1, 0)[2 * pair + 1] = uint8_t(pair);
            half.row(2, 0)[pair] = uv.row(1, 0)[2 * pair + 1] = vu.row(1, 0)[2 * pair] =
                full.row(2, 0)[2 * pair] = full.row(2, 0)[2 * pair + 1] = uint8_t(v);
        }
        for (int k = 0; k < (in_full || !rig::quick() ? 256 : 128); k++) {
            rgb fine[width], coarse[width];
            for (int x = 0; x < width; x++) {
                const int y = k + 37 * (x / 2) + 128 * (x & 1);
                half.row(0, 0)[x] = uint8_t(y);
                fine[x] = matrix(false, uint8_t(y), x / 2, v);
                coarse[x] = matrix(true, uint8_t(y), x / 2, v);
            }
            for (rig::picture *p : {&full, &uv, &vu}) memcpy(p->row(0, 0), half.row(0, 0), width);
            for (const kernel *to : swept) {
                if (to == swept[3] && !in_full && rig::quick()) break;
                const int size = pixel_bytes(to->to);
                uint8_t expected[4 * width], got[4 * width];
                for (int x = 0; x < width; x++)
                    put(to->to, to->coarse ? coarse[x] : fine[x], expected + x * size);
                for (const rig::target_rows &t : targets) {
                    rig::forced rows(t);
                    const rig::picture &src = source(*to);
                    uint8_t *const planes[] = {got};
                    const int32_t strides[] = {0};
                    memset(got, 0xA5, sizeof got);
                    to->run(src.planes, src.widths, src.heights, src.strides, strides, planes);
                    if (memcmp(expected, got, size_t(width * size)) == 0) continue;
                    int at = 0;
                    while (expected[at] == got[at]) at++;
                    const int x = at / size;
                    FAIL() << to->name << ", " << t.name << " rows, pixel " << x << ": Y "
                           << int(half.row(0, 0)[x]) << ", U " << x / 2 << ", V " << v << ", byte "
                           << at % size << ": expected " << int(expected[at]) << ", got "
                           << int(got[at]);
                }
            }
        }
    }
}

// Borders
// ------------------------------------------------------------------------------------------

TEST(yuv2rgb, empty_pictures_write_nothing) {
    const std::pair<int, int> sizes[] = {{0, 4}, {-1, 4}, {4, 0}, {4, -3}, {0, 0}, {-8, -8}};
    for (const kernel &k : kernels)
        for (const auto &size : sizes) {
            const int width = size.first, height = size.second;  // Clang 14 captures no bindings
            rig::for_each_target([&](const rig::target_rows &) {
                // Planes without a byte, right before the inaccessible page.
                rig::picture src(rig::shapes_of(k.from, 0, 0)), dst(rig::shapes_of(k.to, 0, 0));
                src.widths[0] = width, src.heights[0] = height;
                dst.fill_pattern(3);
                rig::call(k.run, src, dst);
                EXPECT_EQ(dst.stray_write(), "") << k.name << ", " << width << " x " << height;
            });
        }
}

// The luma of a line may lie in the same line of the output, W bytes from its start or more.
TEST(yuv2rgb, grey_works_over_its_own_luma) {
    constexpr int height = 3;
    rig::rng random(rig::seed());
    for (int width = 1; width <= 2 * 64 + 70; width++)
        for (int distance : {width, width + 1, width + 3, 2 * width - 1, 2 * width}) {
            if (distance < width) continue;
            rig::picture luma({rig::samples(width, height)}),
                expected({rig::samples(width, height, 2)});
            luma.fill(rig::content::random, random);
            rig::call(simgp_csc_yuv400_to_rgb565, luma, expected);
            rig::for_each_target([&](const rig::target_rows &t) {
                // Rows of the output that are as long as the luma reaches.
                rig::picture line({rig::samples(distance + width, height)});
                rig::picture dst({rig::samples(width, height, 2)});
                for (int y = 0; y < height; y++)
                    memcpy(line.row(0, y) + distance, luma.row(0, y), size_t(width));
                uint8_t *const from[] = {line.row(0, 0) + distance};
                simgp_csc_yuv400_to_rgb565(from, luma.widths, luma.heights, line.strides,
                                           line.strides, line.planes);
                for (int y = 0; y < height; y++)
                    memcpy(dst.row(0, y), line.row(0, y), size_t(2 * width));
                EXPECT_EQ(rig::difference(expected, dst), "")
                    << t.name << ", width " << width << ", luma at " << distance << ", seed "
                    << rig::seed();
            });
            if (testing::Test::HasFailure()) return;
        }
}

}  // namespace
