// Packed YUV to RGB: every kernel against its scalar rows, and against the planar kernels.
#include <string.h>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/rig.h"

namespace {

using rig::channel;
using rig::conversion;

const std::vector<conversion> kernels = rig::conversions_of(rig::family::packed_to_rgb);

TEST(packed2rgb, vector_rows_equal_scalar_rows) {
    for (const conversion &k : kernels) rig::check_csc(k.name, k.run, k.from, k.to);
}

// Rows, unpacked by hand, must give what the planar kernel gives. Of an odd width the last chroma
// pair is the last U with the V before it, or 128. The rows lie end to end, which must not make one
// row of them where the width is odd.
TEST(packed2rgb, packed_rows_equal_planar_rows) {
    rig::rng random(rig::seed());
    const rig::format &planes = rig::format_of(SIMGP_FMT_YUV420);
    for (const conversion &k : kernels) {
        const rig::format &from = rig::format_of(k.from);
        const conversion *const from_planes = rig::conversion_between(SIMGP_FMT_YUV420, k.to);
        ASSERT_NE(from_planes, nullptr) << k.name;
        for (int width = 1; width <= 150; width += 1 + random.below(3)) {
            SCOPED_TRACE(testing::Message() << k.name << ", width " << width);
            rig::picture src(rig::shapes_of(k.from, width, 2));
            src.fill(rig::content::random, random);
            rig::picture planar(rig::shapes_of(SIMGP_FMT_YUV420, width, 1)),
                row(rig::shapes_of(k.to, width, 1));
            const auto shapes = rig::shapes_of(k.to, width, 2);
            rig::picture expected(shapes), got(shapes);
            for (int y = 0; y < 2; y++) {
                const auto in = [&](channel c, int x) { return *sample(src, from, c, x, y); };
                for (int x = 0; x < width; x++) {
                    *sample(planar, planes, channel::y, x, 0) = in(channel::y, x);
                    if (x % 2) continue;
                    *sample(planar, planes, channel::u, x, 0) = in(channel::u, x);
                    *sample(planar, planes, channel::v, x, 0) = x + 1 < width ? in(channel::v, x)
                                                                : x ? in(channel::v, x - 2)
                                                                    : uint8_t(128);
                }
                rig::call(from_planes->run, planar, row);
                memcpy(expected.row(0, y), row.row(0, 0), size_t(shapes[0].row_bytes));
            }
            rig::for_each_target([&](const rig::target_rows &) {
                got.fill_pattern(0);
                rig::call(k.run, src, got);
                EXPECT_EQ(rig::difference(expected, got), "");
            });
        }
    }
}

std::vector<uint8_t> convert(simgp_csc_fn *kernel, int to, std::vector<uint8_t> group) {
    std::vector<uint8_t> out(8, 0x55);
    uint8_t *const src[] = {group.data()}, *const dst[] = {out.data()};
    const int32_t width[] = {2}, height[] = {1}, stride[] = {8};
    kernel(src, width, height, stride, stride, dst);
    out.resize(size_t(rig::shapes_of(to, 2, 1)[0].row_bytes));
    return out;
}

TEST(packed2rgb, known_colours) {
    using bytes = std::vector<uint8_t>;
    rig::for_each_target([](const rig::target_rows &) {
        const bytes black_white = {128, 16, 128, 235};
        EXPECT_EQ(convert(simgp_csc_uyvy_to_rgba8888, SIMGP_FMT_RGBA8888, black_white),
                  (bytes{0, 0, 0, 255, 255, 255, 255, 255}));
        EXPECT_EQ(convert(simgp_csc_uyvy_to_bgra8888, SIMGP_FMT_BGRA8888, black_white),
                  (bytes{0, 0, 0, 255, 255, 255, 255, 255}));
        EXPECT_EQ(convert(simgp_csc_uyvy_to_argb8888, SIMGP_FMT_ARGB8888, black_white),
                  (bytes{255, 0, 0, 0, 255, 255, 255, 255}));
        const bytes red = {81, 90, 81, 240};
        EXPECT_EQ(convert(simgp_csc_yuyv_to_rgb565, SIMGP_FMT_RGB565, red),
                  (bytes{0x00, 0xF8, 0x00, 0xF8}));
        EXPECT_EQ(convert(simgp_csc_yuyv_to_rgb888, SIMGP_FMT_RGB888, red),
                  (bytes{255, 0, 0, 255, 0, 0}));
        EXPECT_EQ(convert(simgp_csc_uyvy_to_bgr565, SIMGP_FMT_BGR565, {90, 81, 240, 81}),
                  (bytes{0x1F, 0x00, 0x1F, 0x00}));
    });
}

}  // namespace
