// YUV to RGB: hand-computed pixels, the formula over all colours, every kernel at every size.
#include <cstring>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/rig.h"

namespace {

using rig::channel;
using rig::conversion;
using rig::conversion_named;
using rig::rgb;

const std::vector<conversion> kernels = rig::conversions_of(rig::family::yuv_to_rgb);

bool coarse(const conversion &k) { return k.but == rig::exception::coarse; }
bool grey(const conversion &k) { return !rig::format_of(k.from).has_chroma(); }

// The reference, on its own numbers
// ----------------------------------------------------------------

int rounded(int sum, int scale) {  // floor(sum / scale + 1/2), limited to a byte
    const int n = 2 * sum + scale, d = 2 * scale;
    const int floor = n >= 0 ? n / d : -((d - 1 - n) / d);
    return floor < 0 ? 0 : floor > 255 ? 255 : floor;
}

rgb matrix(bool in_64ths, int y, int u, int v) {
    y -= 16, u -= 128, v -= 128;
    if (in_64ths)
        return {rounded(75 * y + 102 * v, 64), rounded(75 * y - 25 * u - 52 * v, 64),
                rounded(75 * y + 129 * u, 64)};
    return {rounded(298 * y + 409 * v, 256), rounded(298 * y - 100 * u - 208 * v, 256),
            rounded(298 * y + 516 * u, 256)};
}

rgb reference(const conversion &k, const rig::format &from, const rig::picture &src, int x, int y) {
    const int luma = *sample(src, from, channel::y, x, y);
    if (grey(k)) return {luma, luma, luma};
    const bool alone = k.but == rig::exception::first_line_alone && src.widths[0] % 4;
    const int lead = alone ? src.heights[0] % 2 : 0;
    return matrix(coarse(k), luma, *sample(src, from, channel::u, x, y + lead),
                  *sample(src, from, channel::v, x, y + lead));
}

TEST(yuv2rgb, every_kernel_at_every_size_on_every_target) {
    for (const conversion &k : kernels) {
        const rig::format &from = rig::format_of(k.from), &to = rig::format_of(k.to);
        rig::check_csc(k.name, k.run, k.from, k.to, {},
                       [&](const rig::picture &src, const rig::picture &dst) {
                           for (int y = 0; y < src.heights[0]; y++)
                               for (int x = 0; x < src.widths[0]; x++)
                                   put_rgb(to, reference(k, from, src, x, y), pixel(dst, to, x, y));
                       });
    }
}

// Hand-computed pixels
// -----------------------------------------------------------------------------

// A picture of one colour; the pixels of the result, which must all be the same.
std::vector<uint8_t> flat(const conversion &k, int y, int u, int v) {
    rig::picture src(rig::shapes_of(k.from, 6, 4)), dst(rig::shapes_of(k.to, 6, 4));
    const rig::format &from = rig::format_of(k.from), &to = rig::format_of(k.to);
    for (int row = 0; row < 4; row++)
        for (int x = 0; x < 6; x++) {
            *sample(src, from, channel::y, x, row) = uint8_t(y);
            if (grey(k)) continue;
            *sample(src, from, channel::u, x, row) = uint8_t(u);
            *sample(src, from, channel::v, x, row) = uint8_t(v);
        }
    rig::call(k.run, src, dst);
    const size_t size = size_t(to.pixel_bytes);
    const std::vector<uint8_t> first(dst.row(0, 0), dst.row(0, 0) + size);
    for (int row = 0; row < 4; row++)
        for (int x = 0; x < 6; x++)
            EXPECT_EQ(memcmp(pixel(dst, to, x, row), first.data(), size), 0) << k.name;
    return first;
}

using bytes = std::vector<uint8_t>;

TEST(yuv2rgb, colours_computed_by_hand) {
    const conversion &fine = conversion_named("yuv420_to_rgba8888");
    EXPECT_EQ(flat(fine, 16, 128, 128), (bytes{0, 0, 0, 255}));
    EXPECT_EQ(flat(fine, 235, 128, 128), (bytes{255, 255, 255, 255}));
    EXPECT_EQ(flat(fine, 0, 128, 128), (bytes{0, 0, 0, 255}));
    EXPECT_EQ(flat(fine, 255, 128, 128), (bytes{255, 255, 255, 255}));
    EXPECT_EQ(flat(fine, 128, 128, 128), (bytes{130, 130, 130, 255}));
    EXPECT_EQ(flat(fine, 81, 90, 240), (bytes{255, 0, 0, 255}));
    EXPECT_EQ(flat(fine, 145, 54, 34), (bytes{0, 255, 1, 255}));
    EXPECT_EQ(flat(fine, 41, 240, 110), (bytes{0, 0, 255, 255}));

    EXPECT_EQ(flat(conversion_named("yuv444_to_rgb565"), 81, 90, 240), (bytes{0x00, 0xF8}));
    EXPECT_EQ(flat(conversion_named("yuv444_to_bgr565"), 81, 90, 240), (bytes{0x1F, 0x00}));
    EXPECT_EQ(flat(conversion_named("nv12_to_rgb565"), 128, 128, 128), (bytes{0x10, 0x84}));

    const conversion &coarse = conversion_named("nv21_to_rgb565");  // 131, 131, 131; 251, 209, 159
    EXPECT_EQ(flat(coarse, 128, 128, 128), (bytes{0x10, 0x84}));
    EXPECT_EQ(flat(coarse, 200, 100, 150), (bytes{0x93, 0xFE}));

    const conversion &grey = conversion_named("yuv400_to_rgb565");
    EXPECT_EQ(flat(grey, 0, 0, 0), (bytes{0x00, 0x00}));
    EXPECT_EQ(flat(grey, 16, 0, 0), (bytes{0x82, 0x10}));
    EXPECT_EQ(flat(grey, 255, 0, 0), (bytes{0xFF, 0xFF}));
}

// Y, U, V = 200, 100, 150 is R, G, B = 249, 207, 158 from every source, in every byte order.
TEST(yuv2rgb, one_colour_through_every_kernel) {
    for (const conversion &k : kernels) {
        if (coarse(k) || grey(k)) continue;
        const rig::format &to = rig::format_of(k.to);
        bytes pixel(size_t(to.pixel_bytes));
        put_rgb(to, {249, 207, 158}, pixel.data());
        EXPECT_EQ(flat(k, 200, 100, 150), pixel) << k.name;
    }
}

TEST(yuv2rgb, odd_heights_choose_their_chroma_lines) {
    // Chroma line 0 is grey, line 1 is not.
    const auto lines = [](const char *name, int width) {
        const conversion &k = conversion_named(name);
        const rig::format &to = rig::format_of(k.to);
        rig::picture src(rig::shapes_of(k.from, width, 3)), dst(rig::shapes_of(k.to, width, 3));
        for (int y = 0; y < 3; y++) memset(src.row(0, y), 128, size_t(width));
        for (int plane = 1; plane < 3; plane++)
            for (int y = 0; y < 2; y++)
                memset(src.row(plane, y), y ? 240 : 128, size_t(width + 1) / 2);
        rig::call(k.run, src, dst);
        std::string found;
        for (int y = 0; y < 3; y++) {
            uint8_t of_line_0[4];
            put_rgb(to, {130, 130, 130}, of_line_0);
            found += memcmp(dst.row(0, y), of_line_0, size_t(to.pixel_bytes)) ? '1' : '0';
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
    struct sweep {
        const conversion &k;
        const rig::format &from, &to;
        rig::picture src;
    };
    std::vector<sweep> sweeps;
    for (const char *name : {"yuv420_to_rgba8888", "yuv420_to_rgb565", "nv21_to_rgb565",
                             "nv21_to_bgr565", "yuv444_to_rgb565", "nv12_to_rgb888"}) {
        const conversion &k = conversion_named(name);
        sweeps.push_back({k, rig::format_of(k.from), rig::format_of(k.to),
                          rig::picture(rig::shapes_of(k.from, width, 1))});
    }
    const auto &all = rig::all_targets();
    for (int v = 0; v < 256; v++) {
        const bool in_full = v % 51 == 0;
        std::vector<rig::target_rows> targets(all.begin() + (in_full ? 0 : 2), all.end());
        if (!in_full && !rig::quick()) targets.push_back(all[0]);  // scalar; all[1] is lanes
        if (targets.empty()) continue;
        for (const sweep &s : sweeps)
            for (int x = 0; x < width; x++) {
                *sample(s.src, s.from, channel::u, x, 0) = uint8_t(x / 2);
                *sample(s.src, s.from, channel::v, x, 0) = uint8_t(v);
            }
        for (int k = 0; k < (in_full || !rig::quick() ? 256 : 128); k++) {
            uint8_t luma[width];
            rgb fine[width], in_64ths[width];
            for (int x = 0; x < width; x++) {
                luma[x] = uint8_t(k + 37 * (x / 2) + 128 * (x & 1));
                fine[x] = matrix(false, luma[x], x / 2, v);
                in_64ths[x] = matrix(true, luma[x], x / 2, v);
            }
            for (const sweep &s : sweeps) {
                if (&s == &sweeps[3] && !in_full && rig::quick()) break;
                memcpy(s.src.row(0, 0), luma, width);
                const int size = s.to.pixel_bytes;
                uint8_t expected[4 * width], got[4 * width];
                for (int x = 0; x < width; x++)
                    put_rgb(s.to, coarse(s.k) ? in_64ths[x] : fine[x], expected + x * size);
                for (const rig::target_rows &t : targets) {
                    rig::forced rows(t);
                    uint8_t *const planes[] = {got};
                    const int32_t strides[] = {0};
                    memset(got, 0xA5, sizeof got);
                    s.k.run(s.src.planes, s.src.widths, s.src.heights, s.src.strides, strides,
                            planes);
                    if (memcmp(expected, got, size_t(width * size)) == 0) continue;
                    int at = 0;
                    while (expected[at] == got[at]) at++;
                    const int x = at / size;
                    FAIL() << s.k.name << ", " << t.name << " rows, pixel " << x << ": Y "
                           << int(luma[x]) << ", U " << x / 2 << ", V " << v << ", byte "
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
    for (const conversion &k : kernels)
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

// Where no two rows share their chroma, of pictures with columns and of such that are one as a whole.
TEST(yuv2rgb, lines_that_overlap_are_written_from_top_to_bottom) {
    for (const rig::family f : {rig::family::yuv_to_rgb, rig::family::packed_to_rgb})
        for (const conversion &k : rig::conversions_of(f)) {
            const rig::format &from = rig::format_of(k.from);
            if (from.has_chroma() && from.at(channel::u).down > 1) continue;
            for (const int width : {9, 65})
                rig::check_overlapping_lines(k, width, 12, rig::shapes_of(k.to, width, 12));
        }
}

// The luma of a line may lie in the same line of the output, W bytes from its start or more.
TEST(yuv2rgb, grey_works_over_its_own_luma) {
    const rig::format &to = rig::format_of(SIMGP_FMT_RGB565);
    for (int kind = 0; kind < 5; kind++)
        rig::check_jobs("yuv400_to_rgb565, over its luma", {.max_width = 2 * 64 + 70},
                        [&](int w, int h) {
                            const int distances[] = {w, w + 1, w + 3, 2 * w - 1, 2 * w};
                            const int distance = distances[kind];
                            rig::job j;
                            j.dst = {rig::samples(std::max(2 * w, distance + w), h)};
                            j.in_place = true;
                            j.run = [=](const rig::picture &, const rig::picture &line) {
                                uint8_t *const luma[] = {line.row(0, 0) + distance};
                                simgp_csc_yuv400_to_rgb565(luma, &w, &h, line.strides, line.strides,
                                                           line.planes);
                            };
                            j.reference = [=](const rig::picture &, const rig::picture &line) {
                                for (int y = 0; y < h; y++) {
                                    const std::vector<uint8_t> luma(line.row(0, y) + distance,
                                                                    line.row(0, y) + distance + w);
                                    for (int x = 0; x < w; x++) {
                                        const int c = luma[size_t(x)];
                                        put_rgb(to, {c, c, c}, line.row(0, y) + 2 * x);
                                    }
                                }
                            };
                            return j;
                        });
    // Columns of many lines, whose last pixels are made together.
    rig::rng random(rig::seed());
    for (const int width : {1, 5, 17, 33, 65, 129})
        for (const int height : {65, 129, 200}) {
            rig::plane apart(rig::samples(width, height), {}),
                over(rig::samples(2 * width, height), {});
            rig::plane expected(rig::samples(2 * width, height), {});
            apart.fill(rig::content::random, random);
            const int strides[] = {int(apart.stride()), int(over.stride()), int(expected.stride())};
            rig::for_each_target([&](const rig::target_rows &) {
                uint8_t *const luma[] = {apart.row(0)}, *const same[] = {over.row(0) + width};
                uint8_t *const out[] = {expected.row(0)}, *const same_out[] = {over.row(0)};
                for (int y = 0; y < height; y++)
                    memcpy(over.row(y) + width, apart.row(y), size_t(width));
                simgp_csc_yuv400_to_rgb565(luma, &width, &height, strides, strides + 2, out);
                simgp_csc_yuv400_to_rgb565(same, &width, &height, strides + 1, strides + 1,
                                           same_out);
                for (int y = 0; y < height; y++)
                    ASSERT_EQ(memcmp(over.row(y), expected.row(y), size_t(2 * width)), 0)
                        << width << " x " << height << ", line " << y;
            });
        }
}

}  // namespace
