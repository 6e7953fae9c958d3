// simgp-convert as its users meet it: the program is run on files and pipes in a folder of its own.
#include <fcntl.h>
#include <gtest/gtest.h>
#include <stdlib.h>
#include <string.h>
#include <sys/ioctl.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <filesystem>
#include <set>
#include <string>

#include "tests/convert_program.h"
#include "tools/colour.h"
#include "tools/picture.h"
#include "tools/progress.h"
#include "tools/road.h"

namespace {

namespace fs = std::filesystem;
using tools::picture;
using tools::pixel_format;

std::vector<const pixel_format *> yuv_formats() {
    std::vector<const pixel_format *> list;
    for (const pixel_format &format : tools::formats())
        if (!format.is_rgb()) list.push_back(&format);
    return list;
}

// The largest difference between two RGB pictures of the same size, and where it is.
int difference(const picture &a, const picture &b, std::string *where = nullptr) {
    EXPECT_EQ(a.width(), b.width());
    EXPECT_EQ(a.height(), b.height());
    if (a.width() != b.width() || a.height() != b.height()) return 256;
    int worst = -1;
    for (int y = 0; y < a.height(); ++y)
        for (int x = 0; x < a.width(); ++x)
            for (int c = 0; c < 3; ++c) {
                const int apart = abs(*a.sample(c, x, y) - *b.sample(c, x, y));
                if (apart <= worst) continue;
                worst = apart;
                if (where)
                    *where = "x " + std::to_string(x) + ", y " + std::to_string(y) + ", channel " +
                             std::to_string(c);
            }
    return worst;
}

constexpr std::array<std::array<int, 3>, 8> bar_colours = {{{255, 255, 255},
                                                            {255, 255, 0},
                                                            {0, 255, 255},
                                                            {0, 255, 0},
                                                            {255, 0, 255},
                                                            {255, 0, 0},
                                                            {0, 0, 255},
                                                            {0, 0, 0}}};

// The bars stand where they should, left to right, in their colours.
void expect_bars(const picture &p, int tolerance, bool grey, const std::string &what) {
    for (int bar = 0; bar < 8; ++bar) {
        const int x = (2 * bar + 1) * p.width() / 16;
        for (int c = 0; c < 3; ++c) {
            if (grey && bar != 0 && bar != 7) continue;
            EXPECT_NEAR(*p.sample(c, x, 0), bar_colours[bar][c], tolerance)
                << what << ": bar " << bar << ", channel " << c;
        }
    }
}

// What a raw file holds is what was drawn, pixel for pixel and with the right colours, at sizes that end in
// every part of a group, a tile and a group of tiles: a wrong plane order, offset, stride or channel shows.
TEST_F(convert_test, raw_files_of_every_format_come_back_at_every_size) {
    for (const pixel_format &format : tools::formats())
        for (const std::string size : {"1x1", "3x33", "97x51", "128x64", "300x70"}) {
            const std::string name(format.name), raw = size + "." + name;
            const std::string card = "testcard:" + size + "@3 -q -f " + name;
            good(card + " -o " + raw + " && $C " + card + " -n 1 -o drawn.png");
            good(raw + " -q -n 1 -s " + size + " -o read.png");
            EXPECT_EQ(read("read.png"), read("drawn.png")) << raw;
            // Nothing to convert: the same bytes again, all three frames of them.
            good(raw + " -s " + size + " -o again." + name);
            EXPECT_EQ(read("again." + name), read(raw)) << raw;
            if (size.size() < 5) continue;
            const picture p = png("read.png");
            const int tolerance = !format.is_rgb() ? 9 : format.is_rgb16() ? 8 : 2;
            expect_bars(p, tolerance, name == "yuv400", raw);
            // 5 and 6 bits are widened to full white.
            for (int c = 0; c < 3 && format.is_rgb(); ++c)
                EXPECT_EQ(*p.sample(c, 1, 0), 255) << raw;
        }
    EXPECT_EQ(read("128x64.yuv420").size(), 3u * 128 * 64 * 3 / 2);
    EXPECT_EQ(read("97x51.uyvy").size(), 3u * 97 * 2 * 51);
    EXPECT_EQ(read("97x51.nv21").size(), 3u * (97 * 51 + 49 * 2 * 26));
    // 97 x 51: one pair of tile rows of one group; chroma of 25 rows: one single tile row.
    EXPECT_EQ(read("97x51.t64x32").size(), 3u * (8192 + 8192));
    EXPECT_EQ(read("97x51.argb8888").substr(0, 4), "\xff\xff\xff\xff");
    EXPECT_EQ(read("97x51.argb8888").substr(4 * 18, 4), std::string("\xff\xff\xff\x00", 4));
    // The last pixel of an odd line has no V of its own.
    good("97x51.uyvy -s 97x51 -n 1 -q -o last.png");
    const picture last = png("last.png");
    for (int c = 0; c < 3; ++c) EXPECT_LE(*last.sample(c, 96, 0), 8);
    // Formats go by the names that others give them, in capitals too.
    good("97x51.yuv420 -s 97x51 --format I420 --to yuyv422 -o other.raw");
    good("97x51.yuv420 -s 97x51 -o own.yuyv && $C 97x51.yuv420 -s 97x51 -o by_ending.YUY2");
    EXPECT_EQ(read("other.raw"), read("own.yuyv"));
    EXPECT_EQ(read("by_ending.YUY2"), read("own.yuyv"));
    // PPM has the bytes of rgb888 behind its header.
    good("97x51.rgb888 -s 97x51 -n 1 -o one.ppm && $C 97x51.rgb888 -s 97x51 -n 1 -o one.rgb888");
    EXPECT_EQ(read("one.ppm"), "P6\n97 51\n255\n" + read("one.rgb888"));
}

// What the two matrices allow: a PNG goes to every YUV format and comes back. The picture has soft
// colours, of which subsampling takes little, and odd sizes, so that the last column and line need
// chroma of their own; at a height of 65 that line is more than the chroma tiles hold, which lie
// otherwise if there is one more row of them, from a third tile column on.
TEST_F(convert_test, pictures_go_into_every_yuv_format_and_come_back) {
    constexpr int width = 139;
    for (int height : {67, 65}) {
        const std::string size = std::to_string(width) + "x" + std::to_string(height);
        picture soft({&tools::format_named("rgb888"), width, height});
        std::string bytes;
        for (int y = 0; y < height; ++y) {
            for (int x = 0; x < width; ++x) {
                *soft.sample(0, x, y) = uint8_t(60 + x);
                *soft.sample(1, x, y) = uint8_t(200 - y);
                *soft.sample(2, x, y) = uint8_t(90 + x / 2 + y / 2);
            }
            bytes.append(reinterpret_cast<char *>(soft.line(0, y)), width * 3);
        }
        write("soft.rgb888", bytes);
        good("soft.rgb888 --size " + size + " -o soft.png");
        ASSERT_EQ(difference(png("soft.png"), soft), 0);
        for (const pixel_format *format : yuv_formats())
            for (const std::string how : {"", " --chroma mean", " --colour bt709-full"}) {
                const std::string name(format->name);
                good("soft.png -o soft." + name + how);
                good("soft." + name + " --size " + size + " -q -o back.png" + how);
                if (name == "yuv400") continue;
                // Rounding of both matrices, and the slope of the picture within a chroma block.
                std::string where;
                const int apart = difference(png("back.png"), soft, &where);
                EXPECT_LE(apart, 7) << name << how << " at " << where;
            }
    }
}

TEST_F(convert_test, y4m_of_every_layout_comes_from_files_and_pipes) {
    for (const char *format : {"yuv400", "yuv420", "yuv422n", "yuv444"}) {
        const std::string name(format);
        good("testcard:33x17@4 --format " + name + " -o " + name + ".y4m");
        ASSERT_EQ(shell("cat " + name + ".y4m | $C - -o - --as y4m > pipe.y4m"), 0) << got.err;
        EXPECT_EQ(read(name + ".y4m"), read("pipe.y4m")) << name;
    }
    // Parameters of frames, comments, the tags for rate and aspect: read, and kept where they
    // matter.
    const std::string video = read("yuv420.y4m");
    const size_t header = video.find('\n') + 1;
    write("tags.y4m", "YUV4MPEG2 W33 H17 F30000:1001 Ip A4:3 C420mpeg2 XCOMMENT=none\nFRAME Ip\n" +
                          video.substr(header + 6));
    good("tags.y4m -o kept.y4m");
    const std::string kept = read("kept.y4m");
    EXPECT_EQ(kept.substr(0, kept.find('\n')),
              "YUV4MPEG2 W33 H17 F30000:1001 Ip A4:3 C420mpeg2 XCOMMENT=none");
    EXPECT_EQ(kept.substr(kept.find('\n') + 1), video.substr(header));
    write("tags.y4m",
          "YUV4MPEG2 W33 H17 C420paldv XYSCSS=420PALDV XA=b\nFRAME\n" + video.substr(header + 6));
    good("tags.y4m -o kept.y4m --to yuv444");
    EXPECT_EQ(got.err,
              "simgp-convert: note: yuv444 holds chroma as if it lay on the first pixel, not as "
              "420paldv says\n");
    EXPECT_EQ(read("kept.y4m").find("YUV4MPEG2 W33 H17 F25:1 Ip A1:1 C444 XA=b\nFRAME\n"), 0u);
    // Without a colour space it is 4:2:0, of whatever siting; headers may be long.
    for (const std::string tags : {"", " C420", " C420paldv", " C420jpeg", " "})
        for (const size_t longer : {0, 900}) {
            write("tags.y4m", "YUV4MPEG2 H17 W33" + tags + " X" + std::string(longer, 'x') + "\n" +
                                  video.substr(header));
            good("tags.y4m -o plain.yuv420 && $C yuv420.y4m -o expected.yuv420");
            EXPECT_EQ(read("plain.yuv420"), read("expected.yuv420")) << tags;
        }
}

TEST_F(convert_test, stills_come_one_by_one_or_numbered) {
    good("testcard:40x30@3 -o n%02d.png");
    good("testcard:40x30@3 -o whole.rgb888");
    good("n%02d.png -o films.rgb888");
    EXPECT_EQ(read("films.rgb888"), read("whole.rgb888"));
    good("testcard:40x30 -o one.ppm");
    good("one.ppm -o back.png");
    EXPECT_EQ(difference(png("back.png"), png("n00.png")), 0);
    shell("rm n00.png");
    good("n%02d.png -o rest.rgb888");  // from number 1 on
    EXPECT_EQ(read("rest.rgb888"), read("whole.rgb888").substr(40 * 30 * 3));
    write("grey.pgm", "P5 # a comment\n2\t2\n255\n\x10\xEB\x20\x30");
    good("grey.pgm -o grey.rgb888");
    EXPECT_EQ(read("grey.rgb888"), "\x10\x10\x10\xEB\xEB\xEB\x20\x20\x20\x30\x30\x30");
    shell("cp one.ppm n02.png");  // of the same size: kinds may be mixed
    good("n%02d.png -o mixed.rgb888");
    EXPECT_EQ(read("mixed.rgb888").size(), 2u * 40 * 30 * 3);
}

TEST_F(convert_test, what_a_format_cannot_hold_is_said_once) {
    const struct {
        const char *arguments, *note;
    } cases[] = {
        {"testcard:8x8 -o o.png", ""},
        {"testcard:8x8 -o o.yuv420", ""},
        {"testcard:8x8 -f yuv444 -o o.nv12",
         "nv12 holds a quarter of the chroma samples, those of "
         "every first pixel"},
        {"testcard:8x8 -f yuv444 -o o.uyvy --chroma mean",
         "uyvy holds half of the chroma samples, "
         "averaged"},
        {"testcard:8x8 -o o.yuv400", "yuv400 holds no colour"},
        {"testcard:8x8 -o o.rgb565", "rgb565 holds 5 and 6 bits of each channel"},
        {"testcard:8x8 -f rgba8888 -o o.rgb565 --dither",
         "rgb565 holds 5 and 6 bits of each channel, dithered; no alpha"},
        {"testcard:8x8 -f rgba8888 -o o.png", "rgba8888 holds no alpha in a png file"},
        {"testcard:8x8 -o o.nv21 --colour bt601-full", "nv21 holds nothing that says bt601-full"},
    };
    for (const auto &c : cases) {
        good(c.arguments);
        EXPECT_EQ(got.err, *c.note ? std::string("simgp-convert: note: ") + c.note + "\n" : "")
            << c.arguments;
        good(std::string(c.arguments) + " --quiet");
        EXPECT_EQ(got.err, "");
    }
    // Grey is the same grey in every RGB format.
    good("testcard:64x48 -f yuv400 -o grey.y4m");
    good("grey.y4m -o a.png --to rgb565");
    good("grey.y4m -o b.png --to rgb888");
    EXPECT_LT(difference(png("a.png"), png("b.png")), 8);
}

// 16-bit samples are rounded to 8 bits; alpha is read where it is asked for.
TEST_F(convert_test, png_of_16_bits) {
    const uint8_t deep[] = {0x89, 0x50, 0x4e, 0x47, 0x0d, 0x0a, 0x1a, 0x0a, 0x00, 0x00, 0x00, 0x0d,
                            0x49, 0x48, 0x44, 0x52, 0x00, 0x00, 0x00, 0x02, 0x00, 0x00, 0x00, 0x01,
                            0x10, 0x02, 0x00, 0x00, 0x00, 0x2b, 0xd0, 0x34, 0x9e, 0x00, 0x00, 0x00,
                            0x15, 0x49, 0x44, 0x41, 0x54, 0x78, 0xda, 0x63, 0x60, 0x60, 0xf8, 0xff,
                            0xbf, 0xa1, 0x9e, 0x91, 0xa9, 0xfe, 0xff, 0x3f, 0x06, 0x00, 0x21, 0x78,
                            0x05, 0x7d, 0xf8, 0xf8, 0x1e, 0x43, 0x00, 0x00, 0x00, 0x00, 0x49, 0x45,
                            0x4e, 0x44, 0xae, 0x42, 0x60, 0x82};  // 0000 FFFF 807F, 0102 7FFF FE00
    write("deep.png", std::string(reinterpret_cast<const char *>(deep), sizeof deep));
    good("deep.png -o flat.rgb888 && $C deep.png -f rgba8888 -o flat.rgba8888");
    EXPECT_EQ(read("flat.rgb888"), std::string("\x00\xff\x80\x01\x7f\xfd", 6));
    EXPECT_EQ(read("flat.rgba8888"), std::string("\x00\xff\x80\xff\x01\x7f\xfd\xff", 8));
}

TEST_F(convert_test, several_frames_become_numbered_files_or_a_sheet) {
    good("testcard:64x48@12 -o a%%-%03d.png");
    std::set<std::string> expected;
    for (int k = 0; k < 12; ++k)
        expected.insert("a%-0" + std::string(k < 10 ? "0" : "") + std::to_string(k) + ".png");
    EXPECT_EQ(files(), expected);
    EXPECT_GT(difference(png("a%-000.png"), png("a%-011.png")), 100) << "the card does not move";

    // A picture of 64 x 48 stands on the sheet unchanged, below its label.
    const auto expect_on = [](const picture &sheet, int left, int top, const picture &p) {
        for (int y = 0; y < 48; ++y)
            ASSERT_EQ(memcmp(sheet.sample(0, left, top + y), p.line(0, y), 64 * 3), 0) << y;
    };
    good("testcard:64x48@12 -n 6 -o sheet.png --sheet --columns 3");
    const picture sheet = png("sheet.png");
    EXPECT_EQ(sheet.width(), 3 * (64 + 8) + 8);
    expect_on(sheet, 8, (sheet.height() - 8) / 2 - 48, png("a%-000.png"));

    // Of more than 64 frames every second is shown, of more than 128 every fourth.
    for (const auto &[count, every] : {std::pair(64, 1), {65, 2}, {128, 2}, {129, 4}}) {
        SCOPED_TRACE(count);
        const std::string card = "testcard:64x48@" + std::to_string(count);
        good(card + " -o long.png --sheet --columns 64 && $C " + card + " -o b%d.png");
        const picture strip = png("long.png");
        const int shown = (count + every - 1) / every;
        ASSERT_EQ(strip.width(), shown * (64 + 8) + 8);
        for (int k : {0, 1, shown - 1})
            expect_on(strip, 8 + k * (64 + 8), strip.height() - 8 - 48,
                      png("b" + std::to_string(k * every) + ".png"));
    }
    // Wide and high pictures are reduced to the means of squares of 3 x 3, the last of which may be smaller.
    for (const std::string card : {"testcard:650x100", "testcard:300x500"}) {
        good(card + " -o large.png && $C " + card + " -o reduced.png --sheet");
        const picture large = png("large.png"), reduced = png("reduced.png");
        const int width = large.width() / 3, height = large.height() / 3;
        ASSERT_EQ(reduced.width(), width + 16) << card;
        int wrong = 0;
        for (int y = 0; y < height; ++y)
            for (int x = 0; x < width; ++x)
                for (int c = 0; c < 3; ++c) {
                    int sum = 0;
                    for (int k = 0; k < 9; ++k)
                        sum += *large.sample(c, 3 * x + k % 3, 3 * y + k / 3);
                    wrong += *reduced.sample(c, 8 + x, reduced.height() - 8 - height + y) !=
                             (sum + 4) / 9;
                }
        EXPECT_EQ(wrong, 0) << card;
    }
}

// Where pixel (x, y) of a picture of w x h goes (simgp/rotate.h).
struct position {
    int x, y;
};
position turned_to(const std::string &turn, int x, int y, int w, int h) {
    if (turn == "90l") return {y, w - 1 - x};
    if (turn == "90r") return {h - 1 - y, x};
    if (turn == "180") return {w - 1 - x, h - 1 - y};
    return turn == "hori" ? position{w - 1 - x, y} : position{x, h - 1 - y};
}

// At even sizes the turn is that of YUV, at odd ones chroma samples would be taken for other pixels.
TEST_F(convert_test, turned_pixels_are_where_they_should_be) {
    for (const char *size : {"96x52", "97x51"}) {
        good(std::string("testcard:") + size + " -o plain.png");
        const picture plain = png("plain.png");
        const int w = plain.width(), h = plain.height();
        for (const std::string turn : {"90l", "90r", "180", "hori", "vert"}) {
            good(std::string("testcard:") + size + " -o turned.png --rotate " + turn);
            const picture turned = png("turned.png");
            const bool quarter = turn[0] == '9';
            ASSERT_EQ(turned.width(), quarter ? h : w);
            ASSERT_EQ(turned.height(), quarter ? w : h);
            int wrong = 0;
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) {
                    const position to = turned_to(turn, x, y, w, h);
                    wrong += memcmp(turned.sample(0, to.x, to.y), plain.sample(0, x, y), 3) != 0;
                }
            EXPECT_EQ(wrong, 0) << size << " " << turn;
        }
    }
}

// Nothing is lost on the way there and back, in any format. Packed 4:2:2 alone cannot hold what a
// quarter turn makes of its chroma, and says so; half groups at odd widths have no V to turn.
TEST_F(convert_test, turned_twice_is_the_picture_again) {
    const std::array<std::array<std::string, 2>, 4> turns = {
        {{"90l", "90r"}, {"180", "180"}, {"hori", "hori"}, {"vert", "vert"}}};
    for (const pixel_format &format : tools::formats()) {
        const std::string name(format.name), source = "source." + name;
        const bool packed = name == "uyvy" || name == "yuyv";
        for (const std::string size : {"98x52", "97x51"}) {
            if (packed && size != "98x52") continue;
            if (format.is_rgb() && size == "98x52") continue;  // the odd one shows as much
            good("testcard:" + size + " -q -o " + source + " --format " + name);
            for (const auto &turn : turns) {
                const bool quarter = turn[0] == "90l";
                const std::string swapped = size.substr(3) + "x" + size.substr(0, 2);
                const bool planar422 = name == "yuv422n" || name == "yv16" || name == "yuv422w";
                std::string between = name;
                if (quarter && planar422) between = name == "yuv422w" ? "yuv422n" : "yuv422w";
                const std::string there = source + " --size " + size + " -o there --rotate ";
                if (packed && quarter) {
                    good(there + turn[0]);
                    EXPECT_NE(got.err.find("passes through 4:2:0 chroma"), std::string::npos)
                        << got.err;
                    continue;
                }
                good(there + turn[0] + " && $C there --format " + between + " --size " +
                     (quarter ? swapped : size) + " -o back." + name + " --rotate " + turn[1]);
                EXPECT_EQ(got.err, "");
                EXPECT_EQ(read(source), read("back." + name)) << name << size << turn[0];
            }
        }
    }
    // V before U or after it: what becomes of the planes has U first.
    for (const std::string edit : {"--rotate 90l", "--rotate 90r --resize 40x60", "--thumbnail"}) {
        good("testcard:98x52 -o n " + edit + " --format yuv422n && $C testcard:98x52 -o v " + edit +
             " --format yv16");
        EXPECT_EQ(read("n"), read("v")) << edit;
    }
    // Alpha, which no conversion keeps, is turned as well.
    write("one.rgba8888", "RGBArgba");
    good("one.rgba8888 --size 2x1 -o two.rgba8888 --rotate hori");
    EXPECT_EQ(read("two.rgba8888"), "rgbaRGBA");
}

// Whatever is done on the way, no road leads through 16 bits, grey or 4:2:2 unless one of its ends is that;
// one that leads through 4:2:0 says so.
TEST(road, keeps_what_both_ends_hold) {
    std::vector<tools::edits> wishes;
    for (int turn = SIMGP_ROT_NONE; turn <= SIMGP_ROT_VERT; ++turn)
        for (const auto &[width, height] : {std::pair(0, 0), {20, 11}, {101, 60}})
            for (int deblock : {0, 4}) wishes.push_back({deblock, width, height, turn, false});
    wishes.push_back({.thumbnail = true});
    const auto try_all = [&](const pixel_format &from, const pixel_format &to, bool dither,
                             int width, int32_t colour) {
        const int chroma = std::min(from.chroma(), to.chroma());
        for (const tools::edits &wish : wishes) {
            if (wish.deblock && from.is_rgb()) continue;
            tools::road r({&from, width, 17}, to, dither, wish, colour);
            for (const tools::step &s : r.steps()) {
                const pixel_format &f = *s.out().format;
                const bool noted = r.loss() == "4:2:0 chroma" && f.chroma() == 1;
                EXPECT_TRUE(f.chroma() >= chroma || noted) << r.text() << r.loss();
                EXPECT_TRUE(!f.is_rgb16() || from.is_rgb16() || to.is_rgb16()) << r.text();
            }
        }
    };
    for (const pixel_format &from : tools::formats())
        for (const pixel_format &to : tools::formats()) {
            try_all(from, to, false, 33, SIMGP_COLOUR_BT601);
            try_all(from, to, false, 32, SIMGP_COLOUR_BT709);
            if (to.is_rgb16()) try_all(from, to, true, 33, SIMGP_COLOUR_BT601);
        }
}

TEST_F(convert_test, resized_pictures_keep_the_bars) {
    for (const pixel_format *format : yuv_formats())
        for (const std::string size : {"161x91", "301x203"}) {
            const std::string name(format->name);
            good("testcard:192x144 --format " + name + " -q -o out.png --resize " + size);
            const picture p = png("out.png");
            EXPECT_EQ(std::to_string(p.width()) + "x" + std::to_string(p.height()), size);
            expect_bars(p, 9, name == "yuv400", name + " " + size);
        }
}

// What the library does in one pass is what it does in several; the size that is there already is
// left alone.
TEST_F(convert_test, one_pass_gives_what_several_give) {
    const auto same = [&](const std::string &one, const std::string &kernel,
                          const std::string &several) {
        good("testcard:192x144 " + one + " -o one.raw -v");
        EXPECT_NE(got.err.find(kernel), std::string::npos) << one << got.err;
        ASSERT_EQ(shell("$C testcard:192x144 " + several + " -o several.raw"), 0) << got.err;
        EXPECT_EQ(read("one.raw"), read("several.raw")) << one;
    };
    const std::string then = " -o between.yuv420 && $C between.yuv420 -q --size ";
    const std::string small = "-q --resize 100x76", turn = " --rotate 90r --resize 76x100";
    same("-t rgb565 --resize 100x76", "yuv420 -> rgb565 100x76 (simgp_rsz_csc)\n",
         small + then + "100x76 -t rgb565");
    same("-f t64x32 -t rgb565 --resize 100x76", "t64x32 -> rgb565 100x76 (simgp_rsz_csc)\n",
         small + then + "100x76 -t rgb565");
    same(turn, "yuv420 -> yuv420 76x100 (simgp_rsz_rot 90r)\n",
         small + then + "100x76 --rotate 90r");
    same("-t rgb565" + turn, "(simgp_rsz_csc) -> rgb565 76x100 (simgp_rot 90r)\n",
         small + then + "100x76 --rotate 90r -t rgb565");
    same("-f yuv422n -t yuv420 --rotate 90l", "yuv422n -> yuv420 144x192 (simgp_csc_rot 90l)\n",
         "-f yuv422n" + then + "192x144 --rotate 90l");
    same("--resize 192x144", "yuv420\n", "");
    // What grows is resized as it came, what shrinks with all the chroma that it is to have.
    same("-t rgb888 --resize 400x300", "yuv420 -> yuv420 400x300 (simgp_rsz) -> rgb888\n",
         "-q --resize 400x300" + then + "400x300 -t rgb888");
    same("-t rgb888 --resize 100x76", "yuv420 -> rgb888 -> rgb888 100x76 (simgp_rsz)\n",
         "-o all.rgb888 && $C all.rgb888 -q --size 192x144 --resize 100x76");
    same("--rotate 90r --resize 144x192", "yuv420 -> yuv420 144x192 (simgp_rot 90r)\n",
         "--rotate 90r");
}

TEST_F(convert_test, deblocking_comes_first_and_is_the_librarys) {
    // Stripes of 8 columns: 100 | 112 gives d = 36 >> 3 = 4 and is softened by 4 and 2 (the example
    // of simgp/deblock.h), 112 | 100 gives d = -36 >> 3 = -5, and 3 and 1.
    std::string luma, chroma(16 * 8 * 2, char(128));
    for (int y = 0; y < 16; ++y)
        for (int x = 0; x < 32; ++x) luma += char(x / 8 % 2 ? 112 : 100);
    write("blocks.yuv420", luma + chroma);
    good("blocks.yuv420 --size 32x16 -o smooth.yuv420 --deblock 4");
    const std::string smooth = read("smooth.yuv420");
    const uint8_t expected[] = {100, 100, 102, 104, 108, 110, 112, 112,
                                112, 112, 111, 109, 103, 101, 100};
    EXPECT_EQ(memcmp(smooth.data() + 4, expected, sizeof expected), 0);
    EXPECT_EQ(smooth.substr(32 * 16), chroma);
    good("blocks.yuv420 --size 32x16 -o same.yuv420 --deblock 0");
    EXPECT_EQ(read("same.yuv420"), luma + chroma);
    // Other layouts are taken to planes for it, without loss, and it comes before the rest.
    for (const std::string format : {"nv12", "t64x32", "uyvy"}) {
        good("blocks.yuv420 --size 32x16 -q -o blocks." + format);
        good("blocks." + format + " --size 32x16 -o smooth." + format + " --deblock 4");
        good("smooth." + format + " --size 32x16 -q -o luma --to yuv420");
        EXPECT_EQ(read("luma").substr(0, 32 * 16), smooth.substr(0, 32 * 16)) << format;
    }
    // From tiles, too, in the planes that were coded.
    good("blocks.t64x32 --size 32x16 -v -o tiles.rgb888 --deblock 4");
    EXPECT_NE(got.err.find("t64x32 -> yuv420 -> yuv420 (simgp_dbf8x8_yuv 4) -> rgb888"),
              std::string::npos)
        << got.err;
    good("blocks.yuv420 --size 32x16 -o one.rgb565 --deblock 4 --resize 20x10 --rotate 180");
    good("smooth.yuv420 --size 32x16 -o two.rgb565 --resize 20x10 --rotate 180");
    EXPECT_EQ(read("one.rgb565"), read("two.rgb565"));
}

TEST_F(convert_test, thumbnails_are_every_second_pixel_turned_right) {
    // Raw bytes of 97 x 51 pixels become those of 26 x 49.
    const size_t luma = 26 * 49;
    const struct {
        const char *format;
        size_t bytes;
    } sizes[] = {{"yuv400", luma},
                 {"yuv420", luma + 2 * 13 * 25},
                 {"nv21", luma + 2 * 13 * 25},
                 {"yuv422n", luma + 2 * 26 * 25},  // yuv422w then
                 {"yuv444", 3 * luma},
                 {"rgb565", 2 * luma},
                 {"argb8888", 4 * luma}};
    for (const auto &s : sizes) {
        good("testcard:97x51 -q --thumbnail -o thumbnail --format " + std::string(s.format));
        EXPECT_EQ(read("thumbnail").size(), s.bytes) << s.format;
    }
    for (const char *format : {"rgb888", "yuv420", "nv12", "t64x32", "uyvy"}) {
        good("testcard:194x102 -o small.png --thumbnail --format " + std::string(format));
        good("testcard:194x102 -o plain.png --format " + std::string(format));
        const picture small = png("small.png"), plain = png("plain.png");
        ASSERT_EQ(small.width(), 51);
        ASSERT_EQ(small.height(), 97);
        int wrong = 0;
        for (int y = 0; y < 97; ++y)
            for (int x = 0; x < 51; ++x) {
                // Luma takes every second pixel, and so does chroma of every second one.
                if (format[0] != 'r' && (y % 2 != 0 || (50 - x) % 2 != 0)) continue;
                wrong +=
                    memcmp(small.sample(0, x, y), plain.sample(0, 2 * y, 2 * (50 - x)), 3) != 0;
            }
        EXPECT_EQ(wrong, 0) << format;
    }
    // Samples of several bytes take as many calls: pairs of U and V are taken apart before.
    for (const std::string road : {"yuv420 -> yuv420 24x32", "nv12 -> yuv420 -> yuv420 24x32"}) {
        good("testcard:64x48 -v -o road.png --thumbnail -f " + road.substr(0, road.find(' ')));
        EXPECT_NE(got.err.find("\n" + road + " ("), std::string::npos) << got.err;
    }
}

// What Y4M says of its pictures stays true; the format is one that loses nothing.
TEST_F(convert_test, headers_of_edited_video_are_right) {
    write("in.y4m", "YUV4MPEG2 W4 H2 F25:1 It A4:3 C422\nFRAME\n" + std::string(16, 'x'));
    const auto header = [&](const std::string &arguments) {
        EXPECT_EQ(run("in.y4m -o out.y4m " + arguments), 0) << got.err;
        const std::string text = read("out.y4m");
        return text.substr(0, text.find('\n'));
    };
    EXPECT_EQ(header("--deblock 3"), "YUV4MPEG2 W4 H2 F25:1 It A4:3 C422");
    EXPECT_EQ(header("--rotate 180"), "YUV4MPEG2 W4 H2 F25:1 I? A4:3 C422");
    EXPECT_EQ(header("--rotate 90l"), "YUV4MPEG2 W2 H4 F25:1 I? A3:4 C444");
    EXPECT_EQ(header("--rotate 90l --to yuv420"), "YUV4MPEG2 W2 H4 F25:1 I? A3:4 C420jpeg");
    EXPECT_EQ(header("--resize 8x2"), "YUV4MPEG2 W8 H2 F25:1 I? A2:3 C422");
    EXPECT_EQ(header("--resize 8x4 --rotate 90r"), "YUV4MPEG2 W8 H4 F25:1 I? A3:16 C444");
    EXPECT_EQ(header("--thumbnail"), "YUV4MPEG2 W1 H2 F25:1 I? A3:4 C444");

    // Shapes of pixels that are unknown, or no shapes.
    for (const std::string aspect : {"0:0", "0:1", "1:0", "2000000:1", "1:2000000", "1:-1", "3"}) {
        write("in.y4m",
              "YUV4MPEG2 W4 H2 F25:1 Ip A" + aspect + " Cmono\nFRAME\n" + std::string(8, 'x'));
        EXPECT_EQ(header("--resize 8x2"), "YUV4MPEG2 W8 H2 F25:1 Ip A" + aspect + " Cmono");
    }
}

// Between YUV formats all of the last column and line, the first of its pixels or their mean.
TEST_F(convert_test, chroma_of_pixels_that_share_it) {
    const std::string luma = "luma luma", u = "\x0A\x14\x1E\x28\x32\x3C\x46\x50\x5A";
    write("in.yuv444", luma + u + std::string(u.rbegin(), u.rend()));
    const auto shared = [&](const std::string &options) {
        good("in.yuv444 --size 3x3 -o out.yuv420 -q " + options);
        return read("out.yuv420");
    };
    EXPECT_EQ(shared(""), luma + "\x0A\x1E\x46\x5A" + "\x5A\x46\x1E\x0A");
    EXPECT_EQ(shared("--chroma mean"), luma + "\x1E\x2D\x4B\x5A" + "\x46\x37\x19\x0A");
}

// In every colour the card is drawn, written, read and shown as what it is, and as nothing else.
TEST_F(convert_test, colours_are_named_noted_and_guessed) {
    for (const tools::colour &c : tools::colours()) {
        const std::string name(c.name), as_it_is = " --colour " + name;
        good("testcard:96x64 -f nv12 -o card.nv12" + as_it_is);
        good("card.nv12 --size 96x64 -o card.png" + as_it_is);
        expect_bars(png("card.png"), 3, false, name);
        good("testcard:96x64 -o card.y4m" + as_it_is);
        std::string matrix(c.matrix);
        for (char &letter : matrix) letter = char(toupper(letter));
        const std::string tags = std::string(" XCOLORRANGE=") + (c.full ? "FULL" : "LIMITED") +
                                 " XCOLORMATRIX=" + matrix + "\n";
        EXPECT_NE(read("card.y4m").find(tags), std::string::npos) << tags;
        good("card.y4m -o noted.png -v");
        EXPECT_NE(got.err.find("96x64, " + name + "\n"), std::string::npos) << got.err;
        EXPECT_EQ(difference(png("noted.png"), png("card.png")), 0) << name;
        good("card.y4m -o wrong.png --color " + std::string(name == "bt709" ? "bt601" : "bt709"));
        EXPECT_GT(difference(png("wrong.png"), png("card.png")), 10) << name;
        good("card.y4m -o dithered.png --to rgb565 --dither");
        expect_bars(png("dithered.png"), 16, false, name + ", dithered");
    }
    // The range alone, as ffmpeg writes it; HD says nothing and is BT.709, which smaller pictures
    // then have to say.
    write("range.y4m", "YUV4MPEG2 W2 H1 C444 XCOLORRANGE=FULL\nFRAME\n" +
                           std::string("\x4c\x4c\x55\x55\xff\xff", 6));
    good("range.y4m -o range.rgb888");
    EXPECT_EQ(read("range.rgb888"), std::string("\xfe\0\0\xfe\0\0", 6));
    good("testcard:1280x64 -f nv12 -o hd.nv12");
    good("hd.nv12 --size 1280x64 -o hd.png");
    expect_bars(png("hd.png"), 3, false, "HD");
    good("hd.nv12 --size 1280x64 -o hd.y4m");
    EXPECT_EQ(read("hd.y4m").find("XCOLOR"), std::string::npos);
    good("hd.y4m -o small.y4m --resize 320x16");
    EXPECT_NE(read("small.y4m").find(" XCOLORMATRIX=BT709\n"), std::string::npos);
}

TEST_F(convert_test, chroma_is_that_of_the_first_pixel_or_the_mean) {
    // R, G, B of four pixels: the means are 64, 1, 255.
    write("four.rgb888", std::string("\xff\0\xff"
                                     "\0\0\xff"
                                     "\0\1\xff"
                                     "\0\1\xff",
                                     12));
    const std::string four = "four.rgb888 --size 2x2 -o out.yuv420 --colour bt601-full --chroma ";
    good(four + "mean");
    EXPECT_EQ(read("out.yuv420"), "\x69\x1c\x1d\x1d\xf4\x8b");
    good(four + "first");
    EXPECT_EQ(read("out.yuv420").substr(0, 5), "\x69\x1c\x1d\x1d\xd5");  // 255, 0, 255 alone
}

TEST_F(convert_test, dithering_is_the_librarys_own) {
    good("testcard:64x48 -o plain.rgb565");
    good("testcard:64x48 -o dithered.rgb565 --dither");
    EXPECT_NE(read("plain.rgb565"), read("dithered.rgb565"));
    auto card = tools::open_source({.path = "testcard:64x48"});
    picture frame, screen({&tools::format_named("rgb565"), 64, 48});
    card->next(frame);
    const simgp_img src = frame.descriptor(), dst = screen.descriptor();
    ASSERT_EQ(simgp_csc_dither(&src, &dst), SIMGP_OK);
    EXPECT_EQ(read("dithered.rgb565"),
              std::string(reinterpret_cast<char *>(screen.line(0, 0)), 64 * 48 * 2));
    // Where the library does not dither from a format, the road goes over one from which it does.
    good("testcard:64x48 --format nv12 -o over.bgr565 --dither -v");
    EXPECT_NE(got.err.find("nv12 -> yuv420 -> bgr565 (dithered)"), std::string::npos) << got.err;
    // Without --to, a format that can be dithered is chosen; luma alone can be, too.
    good("testcard:64x48 -o seen.png --dither -v");
    EXPECT_NE(got.err.find("yuv420 -> rgb565 (dithered)"), std::string::npos) << got.err;
    good("testcard:64x48 -o luma.y4m --dither -v");
    EXPECT_NE(got.err.find("yuv420 -> yuv420 (dithered)"), std::string::npos) << got.err;
}

// One frame is enough for it, in another colour too.
TEST_F(convert_test, the_demonstration_leaves_its_pictures) {
    for (const std::string card : {"testcard:320x240@3", "testcard:64x48@1 --colour bt709"}) {
        good("--demo pictures " + card);
        EXPECT_EQ(
            files("pictures"),
            (std::set<std::string>{"at-a-glance.png", "every-rgb-format.png", "every-turn.png",
                                   "every-yuv-to-rgb.png", "right-and-wrong-colour.png",
                                   "road-to-the-screen.png", "tiles-and-dithering.png"}));
        for (const std::string &name : files("pictures")) {
            EXPECT_NE(got.out.find(name), std::string::npos);
            EXPECT_GT(png("pictures/" + name).width(), card.find("320") < 20 ? 800 : 300) << name;
        }
        std::filesystem::remove_all(at("pictures"));
    }
}

TEST_F(convert_test, the_list_names_formats_colours_and_dithered_conversions) {
    good("--list");
    for (const char *text : {" yuv422w t64x32 uyvy yuyv rgb565 bgr565 ", "  yuv400    -> rgb565\n",
                             " bt601 bt601-full bt709 bt709-full bt2020 bt2020-full\n"})
        EXPECT_NE(got.out.find(text), std::string::npos) << text << got.out;
    // What it says of all others.
    good("testcard:64x48 -f bgr565 -o one.uyvy -v");
    EXPECT_NE(got.err.find("bgr565 -> uyvy\n"), std::string::npos) << got.err;
}

// Nothing in the first half second; then a bar that fills the line but for its last place, half of it
// done.
TEST(progress, is_a_bar_as_wide_as_the_terminal) {
    const int terminal = posix_openpt(O_RDWR | O_NOCTTY);
    ASSERT_TRUE(terminal >= 0 && grantpt(terminal) == 0 && unlockpt(terminal) == 0);
    const int line = open(ptsname(terminal), O_RDWR | O_NOCTTY), kept = dup(STDERR_FILENO);
    const winsize size = {.ws_row = 24, .ws_col = 40, .ws_xpixel = 0, .ws_ypixel = 0};
    ASSERT_EQ(ioctl(line, TIOCSWINSZ, &size), 0);
    dup2(line, STDERR_FILENO);
    {
        tools::progress bar(true);
        bar.show(1, 0.1);
        usleep(600'000);
        bar.show(10, 0.5);
    }
    dup2(kept, STDERR_FILENO);
    char said[256] = {};
    ASSERT_GT(read(terminal, said, sizeof said - 1), 0);
    for (int descriptor : {terminal, line, kept}) close(descriptor);
    const std::string text = said, end = "/s\033[K\r\033[K";
    const size_t bar_end = text.find("]  50%  10 frames  ");
    ASSERT_NE(bar_end, std::string::npos) << text;
    const size_t done = (bar_end - 2) / 2;
    EXPECT_EQ(text.substr(0, bar_end),
              "\r[" + std::string(done, '#') + std::string(bar_end - 2 - done, '.'));
    EXPECT_EQ(text.size(), 1 + 39 + end.size() - 2) << text;
    EXPECT_EQ(text.substr(text.size() - end.size()), end);
}

}  // namespace
