// The C++ interface (simgp/simgp.hpp): views, pictures, and calls that check first.
#include "simgp/simgp.hpp"

#include <cstring>
#include <vector>

#include "tests/rig.h"

namespace {

using simgp::const_view;
using simgp::picture;
using simgp::result;
using simgp::view;

TEST(cxx, results) {
    EXPECT_TRUE(result());
    EXPECT_STREQ(result().text(), "success");
    EXPECT_FALSE(result(SIMGP_ERR_UNSUPPORTED));
    EXPECT_STREQ(result(SIMGP_ERR_UNSUPPORTED).text(), simgp_result_text(SIMGP_ERR_UNSUPPORTED));
    EXPECT_STREQ(result(SIMGP_ERR_PARAM, "of its own").text(), "of its own");
}

TEST(cxx, views) {
    std::vector<uint8_t> memory(27);
    const std::vector<uint8_t> &source = memory;
    const view v(SIMGP_FMT_NV12, 5, 3, memory);
    ASSERT_TRUE(v);
    EXPECT_TRUE(v.check());
    EXPECT_EQ(v.planes(), 2);
    EXPECT_EQ(v.width(), 5);
    EXPECT_EQ(v.height(), 3);
    EXPECT_EQ(v.lines(1), 2);
    EXPECT_EQ(v.line(1, 1).data(), memory.data() + 21);
    EXPECT_EQ(v.line(1, 1).size(), 6u);
    const const_view c = v, other(SIMGP_FMT_NV12, 5, 3, source);
    EXPECT_EQ(c.line(0, 2).data(), memory.data() + 10);
    EXPECT_EQ(other.plane(1), source.data() + 15);
    static_assert(!std::is_constructible_v<view, const_view>);

    const view last = v.band(2, 1);
    ASSERT_TRUE(last);
    EXPECT_EQ(last.plane(0), memory.data() + 10);
    EXPECT_EQ(last.plane(1), memory.data() + 21);

    const const_view planes(SIMGP_FMT_YUV420, 2, 2,
                            {{memory.data(), 2}, {&memory[4], 1}, {&memory[5], 1}});
    ASSERT_TRUE(planes);
    EXPECT_EQ(planes.plane(2), &memory[5]);
    const auto camera =
        const_view::yuv_420_888(2, 2, {memory.data(), 2}, {&memory[5], 2}, {&memory[4], 2}, 2);
    EXPECT_EQ(camera.format(), SIMGP_FMT_NV21);
    EXPECT_EQ(camera.plane(1), &memory[4]);
}

// Whatever is wrong is said at the end of the chain.
TEST(cxx, empty_views_say_why) {
    std::vector<uint8_t> memory(26);
    const picture screen(SIMGP_FMT_RGB565, 5, 3);
    picture target(SIMGP_FMT_RGB565, 5, 3);
    const auto said = [&](const const_view &v) {
        EXPECT_FALSE(v);
        EXPECT_EQ(v.planes(), 0);
        EXPECT_TRUE(v.line(0, 0).empty());
        const result r = simgp::csc_any(v, target);
        EXPECT_EQ(r.code(), SIMGP_ERR_PARAM);
        EXPECT_STREQ(simgp::csc_any(screen, view(const_cast<simgp_img &>(v.img()))).text(),
                     "unknown format");
        return std::string(r.text());
    };
    EXPECT_EQ(said({}), "no picture");
    EXPECT_EQ(said(view()), "no picture");
    EXPECT_EQ(said({SIMGP_FMT_NV12, 5, 3, memory}), "memory is too small for the picture");
    EXPECT_EQ(said(view(SIMGP_FMT_NV12, 0, 3, memory)), "width below 1");
    EXPECT_EQ(said({SIMGP_FMT_NV12, 5, 3, {{memory.data(), 5}}}), "plane 1 is NULL");
    EXPECT_EQ(said(const_view(screen).band(1, 3)), "the picture has no such rows");
    EXPECT_EQ(said(const_view().band(0, 1).band(0, 1)), "no picture");
    EXPECT_EQ(said(const_view::yuv_420_888(2, 2, {memory.data(), 2}, {}, {}, 2)),
              "plane 1 is NULL");
    EXPECT_EQ(said(picture(SIMGP_FMT_NV12, 5, -1)), "height below 1");
    EXPECT_STREQ(picture(SIMGP_FMT_NV12, 5, -1).check().text(), "height below 1");
    EXPECT_STREQ(picture().check().text(), "no picture");
}

TEST(cxx, pictures_own_their_memory) {
    picture a(SIMGP_FMT_YUV420, 5, 3, 256);
    ASSERT_TRUE(a);
    EXPECT_EQ(uintptr_t(a.all().plane(0)) % 256, 0u);
    EXPECT_EQ(uintptr_t(a.all().plane(2)) % 256, 0u);
    EXPECT_EQ(a.memory().size(), 256u * 7);
    memset(a.memory().data(), 77, a.memory().size());
    const uint8_t *const at = a.all().plane(0);
    picture b = std::move(a);
    EXPECT_FALSE(a);
    EXPECT_EQ(a.memory().size(), 0u);
    EXPECT_EQ(b.all().plane(0), at);
    a = picture(SIMGP_FMT_RGB888, 2, 2);
    a = std::move(b);
    EXPECT_EQ(a.all().line(1, 1)[2], 77);
    EXPECT_EQ(a.format(), SIMGP_FMT_YUV420);
    EXPECT_FALSE(b);
}

TEST(cxx, refused_before_the_call) {
    picture wide(SIMGP_FMT_YUV420, 6, 4), high(SIMGP_FMT_YUV420, 4, 6), odd(SIMGP_FMT_YUV420, 6, 3),
        narrow(SIMGP_FMT_YUV422N, 6, 3), turned(SIMGP_FMT_YUV422N, 3, 6),
        pairs(SIMGP_FMT_NV12, 6, 4);
    EXPECT_STREQ(simgp::csc_any(wide, high).text(), "source and destination have different sizes");
    EXPECT_STREQ(simgp::cpy(wide, high).text(), "source and destination have different sizes");
    EXPECT_STREQ(simgp::rot(wide, SIMGP_ROT_90R, wide).text(),
                 "the destination has not the size of the turned source");
    EXPECT_STREQ(simgp::rot(wide, SIMGP_ROT_180, pairs).text(),
                 "the destination has not the format of the turned source");
    EXPECT_STREQ(simgp::rot(narrow, SIMGP_ROT_90L, turned).text(),
                 "the destination has not the format of the turned source");
    EXPECT_STREQ(simgp::rsz_rot(narrow, SIMGP_ROT_90L, turned).text(),
                 "the destination has not the format of the turned source");
    EXPECT_STREQ(simgp::csc(odd, narrow).text(),
                 "simgp_csc writes a line of chroma more at odd heights");
    EXPECT_STREQ(simgp::dbf8x8_yuv(pairs, 4).text(), "deblocking takes planes of 8-bit samples");
    EXPECT_STREQ(simgp::csc_any_part(wide, wide, 0, 2, 2).text(), "there is no such part");
    EXPECT_STREQ(simgp::csc_any_part(wide, wide, 0, 0, 0).text(), "there is no such part");
    std::vector<uint8_t> memory(100);
    const view askew(SIMGP_FMT_RGB565, 6, 4, {{memory.data(), 13}});
    EXPECT_STREQ(simgp::csc_any(wide, askew).text(),
                 "a stride is no multiple of the plane's samples");
    // What the C functions refuse goes through.
    EXPECT_EQ(simgp::csc(wide, wide).code(), SIMGP_ERR_PARAM);
    EXPECT_EQ(simgp::rsz_csc(pairs, high).code(), SIMGP_ERR_UNSUPPORTED);
}

// No call leaves the planes that were described, whatever formats, odd sizes and codes meet; and
// most of them do something.
TEST(cxx, calls_stay_inside_the_pictures) {
    rig::rng random(rig::seed());
    int done = 0, refused = 0;
    const int rounds = rig::quick() ? 1 : 4;
    for (int round = 0; round < rounds; round++)
        for (const rig::format &from : rig::formats())
            for (const rig::format &to : rig::formats())
                for (int operation = 0; operation < 10; operation++) {
                    const int w = 1 + random.below(20), h = 1 + random.below(20);
                    const int32_t code = random.below(6);
                    const bool turns = operation >= 5 && operation <= 7;
                    const bool quarter = turns && (code == SIMGP_ROT_90L || code == SIMGP_ROT_90R);
                    rig::picture a(rig::shapes_of(from.code, w, h)),
                        b(rig::shapes_of(to.code, quarter ? h : w, quarter ? w : h)),
                        other(rig::shapes_of(to.code, 1 + random.below(20), 1 + random.below(20)));
                    a.fill(rig::content::random, random);
                    b.fill_pattern(1);
                    other.fill_pattern(1);
                    const const_view src(a.img(from.code));
                    const view dst(b.img(to.code)), any(other.img(to.code));
                    ASSERT_TRUE(src && dst && any);
                    SCOPED_TRACE(testing::Message()
                                 << "operation " << operation << ", " << from.code << " to "
                                 << to.code << ", " << w << " x " << h << ", code " << code);
                    const result got = [&] {
                        switch (operation) {
                            case 0:
                                return simgp::csc_any(src, dst);
                            case 1:
                                return simgp::csc_any(src, dst, SIMGP_COLOUR_BT709_FULL);
                            case 2:
                                return simgp::csc(src, dst);
                            case 3:
                                return simgp::csc_dither(src, dst);
                            case 4:
                                return simgp::cpy(src, dst);
                            case 5:
                                return simgp::rot(src, code, dst);
                            case 6:
                                return simgp::csc_rot(src, code, dst);
                            case 7:
                                return simgp::rsz_rot(src, code, dst);
                            case 8:
                                return simgp::rsz(src, any);
                            default:
                                return simgp::rsz_csc(src, any);
                        }
                    }();
                    ++(got ? done : refused);
                    ASSERT_EQ(b.stray_write(), "");
                    ASSERT_EQ(other.stray_write(), "");
                }
    EXPECT_GT(done, 700 * rounds);
    EXPECT_GT(refused, 900 * rounds);
}

TEST(cxx, the_calls_are_those_of_c) {
    rig::rng random(rig::seed());
    picture src(SIMGP_FMT_YUV420, 37, 150), dst(SIMGP_FMT_BGRA8888, 37, 150),
        parts(SIMGP_FMT_BGRA8888, 37, 150), by_c(SIMGP_FMT_BGRA8888, 37, 150);
    rig::fill_bytes(src.memory().data(), src.memory().size(), rig::content::random, random);
    for (picture *p : {&dst, &parts, &by_c}) memset(p->memory().data(), 9, p->memory().size());
    EXPECT_TRUE(simgp::csc_any(src, dst, SIMGP_COLOUR_BT2020));
    EXPECT_EQ(simgp_csc_any(&src.all().img(), &by_c.all().img(), SIMGP_COLOUR_BT2020), SIMGP_OK);
    for (int part = 0; part < 7; part++)
        EXPECT_TRUE(simgp::csc_any_part(src, parts, SIMGP_COLOUR_BT2020, 7, part));
    const auto same = [](const picture &a, const picture &b) {
        return memcmp(a.memory().data(), b.memory().data(), a.memory().size()) == 0;
    };
    EXPECT_TRUE(same(dst, by_c));
    EXPECT_TRUE(same(parts, by_c));
    // More parts than steps: some have nothing to do.
    picture small(SIMGP_FMT_YUV420, 2, 2), grey(SIMGP_FMT_YUV400, 2, 2);
    memset(small.memory().data(), 50, small.memory().size());
    for (int part = 0; part < 3; part++)
        EXPECT_TRUE(simgp::csc_any_part(small, grey, SIMGP_COLOUR_BT601, 3, part));
    EXPECT_EQ(grey.all().line(0, 1)[1], 50);

    // 4:2:0 to 4:2:2 of odd height, without the line too many: the last chroma line once.
    picture odd(SIMGP_FMT_YUV420, 2, 3, 1), full(SIMGP_FMT_YUV422N, 2, 3, 1);
    const uint8_t samples[] = {1, 2, 3, 4, 5, 6, 10, 11, 20, 21};
    ASSERT_EQ(odd.memory().size(), sizeof samples);
    memcpy(odd.memory().data(), samples, sizeof samples);
    EXPECT_TRUE(simgp::csc_any(odd, full));
    const uint8_t expected[] = {1, 2, 3, 4, 5, 6, 10, 10, 11, 20, 20, 21};
    EXPECT_EQ(memcmp(full.memory().data(), expected, sizeof expected), 0);

    // A quarter turn of 4:2:2.
    picture turned(SIMGP_FMT_YUV422W, 3, 2, 1);
    EXPECT_TRUE(simgp::rot(full, SIMGP_ROT_90R, turned));
    const uint8_t right[] = {5, 3, 1, 6, 4, 2, 11, 10, 10, 21, 20, 20};
    EXPECT_EQ(memcmp(turned.memory().data(), right, sizeof right), 0);

    picture blocks(SIMGP_FMT_YUV400, 16, 16, 1);
    for (int32_t y = 0; y < 16; y++) memset(blocks.all().line(0, y).data(), y < 8 ? 100 : 112, 16);
    EXPECT_TRUE(simgp::dbf8x8_yuv(blocks, 4));
    EXPECT_EQ(blocks.all().line(0, 7)[0], 104);
}

}  // namespace
