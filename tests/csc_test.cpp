// The dispatcher: every pair of codes answers as the table says, and reaches its kernel.
#include <cstring>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"

namespace {

using rig::conversion;
using rig::conversions;

TEST(csc, every_expected_conversion_has_a_test_of_what_it_computes) {
    for (const conversion &c : conversions)
        EXPECT_NE(rig::family_of(c), rig::family::none) << c.name;
}

TEST(csc, pairs_that_convert_reach_their_kernel) {
    constexpr int width = 38, height = 6;
    rig::rng random(rig::seed());
    for (const conversion &p : conversions) {
        SCOPED_TRACE(p.name);
        const auto shapes = rig::shapes_of(p.to, width, height);
        rig::picture src(rig::shapes_of(p.from, width, height)), expected(shapes), got(shapes);
        src.fill(rig::content::random, random);
        expected.fill_pattern(1);
        got.fill_pattern(1);
        rig::call(p.run, src, expected);

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

// Everything else is refused, and nothing is touched: the planes have no bytes. With the size 0, a
// pair that is served all the same is named, not just the end of the program.
TEST(csc, all_other_pairs_are_refused) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    const std::vector<int> all = rig::format_codes();
    for (int size : {0, 64}) {
        for (int k = 0; k < 4; k++) src.widths[k] = src.heights[k] = size;
        for (int from : all)
            for (int to : all) {
                if (rig::conversion_between(from, to)) continue;
                const simgp_img a = src.img(from), b = dst.img(to);
                ASSERT_EQ(simgp_csc(&a, &b), from == to ? SIMGP_ERR_PARAM : SIMGP_ERR_UNSUPPORTED)
                    << from << " to " << to;
            }
    }
    EXPECT_EQ(dst.stray_write(), "");
}

// The size is that of the source, and an empty one is no error.
TEST(csc, an_empty_picture_is_converted_to_nothing) {
    for (const conversion &p : conversions) {
        rig::picture src(rig::shapes_of(p.from, 0, 0)), dst(rig::shapes_of(p.to, 0, 0));
        dst.fill_pattern(3);
        const simgp_img from = src.img(p.from), to = dst.img(p.to);
        EXPECT_EQ(simgp_csc(&from, &to), SIMGP_OK) << p.name;
        EXPECT_EQ(dst.stray_write(), "") << p.name;
    }
}

}  // namespace
