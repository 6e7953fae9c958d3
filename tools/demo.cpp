// Pictures that show what the library does.
#include <stdio.h>
#include <string.h>

#include <algorithm>
#include <cmath>
#include <filesystem>
#include <numbers>

#include "tools/job.h"
#include "tools/rgb.h"
#include "tools/road.h"
#include "tools/sheet.h"
#include "tools/sink.h"

namespace tools {

namespace {

void save(const std::string &path, const std::vector<tile> &tiles, int columns) {
    output out(destination{path});
    write_png(out, lay_out(tiles, columns));
    out.commit();
}

std::string upper_label(const road &r) {
    std::string text = r.text();
    text.erase(std::remove(text.begin(), text.end(), '-'), text.end());
    return text;
}

// Frames 0, 20 and 40, or as many as there are, as 4:2:0 in BT.601.
std::vector<picture> sample_frames(source &in, const colour &c) {
    std::vector<picture> frames;
    picture frame(in.shape());
    const bool other = c.code != SIMGP_COLOUR_BT601 && !in.shape().format->is_rgb();
    const pixel_format &goal = format_coded(SIMGP_FMT_YUV420);
    road to_rgb(in.shape(), other ? format_coded(SIMGP_FMT_RGB888) : *in.shape().format, false, {},
                c.code);
    road r(to_rgb.out(), goal, false);
    for (int k = 0; k <= 40 && in.next(frame); ++k)
        if (k % 20 == 0) frames.push_back(r.run(to_rgb.run(frame)));
    if (frames.empty()) throw fault(in.name(), ": holds no frame");
    return frames;
}

// Every RGB format, one column each.
std::vector<tile> every_rgb(std::vector<picture> &frames) {
    std::vector<tile> tiles;
    for (picture &frame : frames)
        for (const pixel_format &to : formats())
            if (to.is_rgb()) {
                road r(frame.shape(), to, false);
                tiles.push_back(make_tile(r.run(frame), std::string(to.name), 240, 240));
            }
    return tiles;
}

// The size of a picture whose longer side has `side` pixels.
edits shrunk_to(const picture &p, int side) {
    const int longer = std::max(p.width(), p.height());
    edits edit;
    edit.width = std::max(p.width() * side / longer, 1);
    edit.height = std::max(p.height() * side / longer, 1);
    return edit;
}

// Every conversion from YUV to RGB that the library has.
std::vector<tile> every_pair(picture &frame) {
    std::vector<tile> tiles;
    for (const pixel_format &from : formats()) {
        if (from.is_rgb()) continue;
        road shrink(frame.shape(), from, false, shrunk_to(frame, 192));
        picture &small = shrink.run(frame);
        for (const pixel_format &to : formats()) {
            if (!to.is_rgb() || !offered(from, to, method::csc)) continue;
            road r(small.shape(), to, false);
            tiles.push_back(make_tile(r.run(small), upper_label(r), 192, 192));
        }
    }
    return tiles;
}

// The frame as one in BT.709 and as one in full range, shown as what they are and as the BT.601 that
// they are not.
std::vector<tile> right_and_wrong(picture &frame) {
    std::vector<tile> tiles;
    const pixel_format &screen = format_coded(SIMGP_FMT_RGB888);
    road shrink(frame.shape(), screen, false, shrunk_to(frame, 480));
    picture &small = shrink.run(frame);
    for (const std::string name : {"bt709", "bt601-full"})
        for (const std::string &taken_for : {name, std::string("bt601")}) {
            road coded(small.shape(), format_coded(SIMGP_FMT_NV12), false, {},
                       colour_named(name).code);
            picture &film = coded.run(small);
            road shown(film.shape(), screen, false, {}, colour_named(taken_for).code);
            const std::string label =
                name + (taken_for == name ? ": right" : " taken for bt601: wrong");
            tiles.push_back(make_tile(shown.run(film), label, 480, 480));
        }
    return tiles;
}

// The bytes of a tiled luma plane shown as if they were lines.
picture read_as_lines(const picture &tiled) {
    picture grey({&format_coded(SIMGP_FMT_RGB888), tiled.width(), tiled.height()});
    const uint8_t *byte = tiled.line(0, 0);
    for (int y = 0; y < grey.height(); ++y)
        for (int x = 0; x < grey.width(); ++x, ++byte)
            for (int c = 0; c < 3; ++c) *grey.sample(c, x, y) = *byte;
    return grey;
}

// A soft rise of grey over the width, a sixth of a level a pixel.
picture gradient(int width, int height) {
    picture p({&format_coded(SIMGP_FMT_YUV420), width, height});
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x) {
            *p.sample(0, x, y) = uint8_t(90 + x / 6 + y / 12);
            *p.sample(1, x, y) = *p.sample(2, x, y) = 128;
        }
    return p;
}

enum class part { middle, corner };

// `width` x `height` pixels from the middle or the upper left corner of an RGB picture, each drawn
// `scale` times as large.
picture enlarged(const picture &p, int width, int height, int scale, part which = part::middle) {
    width = std::min(width, p.width());
    height = std::min(height, p.height());
    const bool middle = which == part::middle;
    const int left = middle ? (p.width() - width) / 2 : 0;
    const int top = middle ? (p.height() - height) / 2 : 0;
    const int bytes = p.format().planes[0].bytes;
    picture large({&p.format(), width * scale, height * scale});
    for (int y = 0; y < large.height(); ++y)
        for (int x = 0; x < large.width(); ++x)
            memcpy(large.line(0, y) + x * bytes,
                   p.line(0, top + y / scale) + (left + x / scale) * bytes, size_t(bytes));
    return large;
}

// A tiled frame on its road to the screen, then rows of 24-bit, plain and dithered 16-bit colour.
std::vector<tile> tiles_and_dithering(picture &frame) {
    std::vector<tile> tiles;
    road tile_up(frame.shape(), format_coded(SIMGP_FMT_T64X32), false);
    picture &tiled = tile_up.run(frame);
    tiles.push_back(make_tile(read_as_lines(tiled), "t64x32 memory read as lines", 384, 384));
    for (int32_t code : {SIMGP_FMT_RGB565, SIMGP_FMT_BGR565}) {
        road r(tiled.shape(), format_coded(code), false);
        tiles.push_back(make_tile(r.run(tiled), upper_label(r), 384, 384));
    }
    auto compare = [&](picture &p, int width, int height, int scale, const std::string &what) {
        for (int column = 0; column < 3; ++column) {
            const pixel_format &to =
                format_coded(column == 0 ? SIMGP_FMT_RGB888 : SIMGP_FMT_RGB565);
            road r(p.shape(), to, column == 2);
            const char *name = column == 0   ? "24 bits"
                               : column == 1 ? "16 bits"
                                             : "16 bits dithered";
            tiles.push_back({to_rgb888(enlarged(r.run(p), width, height, scale)), what + name});
        }
    };
    picture soft = gradient(384, 192);
    compare(soft, 384, 192, 1, "gradient ");
    compare(soft, 96, 48, 4, "x 4: ");
    compare(frame, 192, 144, 2, "frame x 2: ");
    return tiles;
}

// A tiled frame that is resized, converted and turned for a screen that stands upright; and the
// thumbnail that the same turn gives.
std::vector<tile> road_to_the_screen(picture &frame) {
    std::vector<tile> tiles;
    road tile_up(frame.shape(), format_coded(SIMGP_FMT_T64X32), false);
    picture &tiled = tile_up.run(frame);
    tiles.push_back(make_tile(read_as_lines(tiled), "tiles read as lines", 384, 384));
    const pixel_format &screen = format_coded(SIMGP_FMT_RGB565);
    road fit(tiled.shape(), screen, false, shrunk_to(tiled, 360));
    picture &fitting = fit.run(tiled);
    tiles.push_back(make_tile(fitting, "rgb565 (simgp_rsz_csc)", 384, 384));
    edits turn;
    turn.turn = SIMGP_ROT_90R;
    road turn_right(fitting.shape(), screen, false, turn);
    tiles.push_back(make_tile(turn_right.run(fitting), "turned (simgp_rot 90r)", 384, 384));
    edits thumbnail;
    thumbnail.thumbnail = true;
    road shrink(frame.shape(), format_coded(SIMGP_FMT_RGB888), false, thumbnail);
    tiles.push_back(make_tile(shrink.run(frame), "thumbnail", 384, 384));
    return tiles;
}

// What a decoder makes of a plane of `width` x `height` samples that was coded in blocks of 8 x 8:
// their cosine transforms, rounded to multiples of `step`.
void code_coarsely(picture &p, int plane, int width, int height, double step) {
    double cosine[8][8];  // [frequency][place], orthonormal
    for (int f = 0; f < 8; ++f)
        for (int at = 0; at < 8; ++at)
            cosine[f][at] = (f == 0 ? std::sqrt(0.125) : 0.5) *
                            std::cos((2 * at + 1) * f * std::numbers::pi / 16);
    for (int top = 0; top < height; top += 8)
        for (int left = 0; left < width; left += 8) {
            double block[8][8], half[8][8] = {};
            // Blocks that lie across the edge of the picture go on with its last samples.
            for (int y = 0; y < 8; ++y)
                for (int x = 0; x < 8; ++x)
                    block[y][x] =
                        p.line(plane, std::min(top + y, height - 1))[std::min(left + x, width - 1)];
            for (int y = 0; y < 8; ++y)
                for (int f = 0; f < 8; ++f)
                    for (int x = 0; x < 8; ++x) half[y][f] += block[y][x] * cosine[f][x];
            for (int g = 0; g < 8; ++g)
                for (int f = 0; f < 8; ++f) {
                    double sum = 0;
                    for (int y = 0; y < 8; ++y) sum += half[y][f] * cosine[g][y];
                    block[g][f] = step * std::round(sum / step);
                }
            for (int y = 0; y < 8 && top + y < height; ++y)
                for (int x = 0; x < 8 && left + x < width; ++x) {
                    double sum = 0;
                    for (int g = 0; g < 8; ++g)
                        for (int f = 0; f < 8; ++f)
                            sum += block[g][f] * cosine[g][y] * cosine[f][x];
                    p.line(plane, top + y)[left + x] =
                        uint8_t(std::clamp(std::lround(sum), 0l, 255l));
                }
        }
}

// What is done most to frames: resized and turned for a screen, shown in 24 and 16 bits, deblocked.
std::vector<tile> at_a_glance(picture &frame) {
    std::vector<tile> tiles;
    const pixel_format &wide = format_coded(SIMGP_FMT_RGB888);
    const pixel_format &narrow = format_coded(SIMGP_FMT_RGB565);
    const edits fitting = shrunk_to(frame, 320);
    road shrink(frame.shape(), frame.format(), false, fitting);
    picture &small = shrink.run(frame);
    auto shown = [](picture &from, const pixel_format &to, bool dither, const edits &edit) {
        road r(from.shape(), to, dither, edit);
        return to_rgb888(r.run(from));
    };
    auto part_of = [&](const picture &p, int scale, part which, const std::string &label) {
        tiles.push_back({enlarged(p, std::max(small.width() / scale, 1),
                                  std::max(small.height() / scale, 1), scale, which),
                         label});
    };
    tiles.push_back({shown(small, wide, false, {}), "24 bits"});
    part_of(shown(small, narrow, false, {}), 3, part::corner, "x 3: 16 bits");
    part_of(shown(small, narrow, true, {}), 3, part::corner, "x 3: 16 bits dithered");

    edits turned = fitting;
    turned.turn = SIMGP_ROT_180;
    tiles.push_back({shown(frame, wide, false, turned), "turned"});
    picture coded = small;  // which may be the frame itself
    for (int plane = 0; plane < 3; ++plane) {
        const int half = plane > 0;
        code_coarsely(coded, plane, (small.width() + half) >> half, (small.height() + half) >> half,
                      56);
    }
    part_of(shown(coded, wide, false, {}), 2, part::middle, "x 2: coded in blocks");
    edits deblocked;
    deblocked.deblock = 12;
    part_of(shown(coded, wide, false, deblocked), 2, part::middle, "x 2: deblocked");
    return tiles;
}

// Every rotation code in formats that are turned in different ways: a row for each format.
std::vector<tile> every_turn(picture &frame) {
    std::vector<tile> tiles;
    for (int32_t code : {SIMGP_FMT_YUV420, SIMGP_FMT_YUV422N, SIMGP_FMT_NV12, SIMGP_FMT_RGB565}) {
        road to_format(frame.shape(), format_coded(code), false);
        picture &source = to_format.run(frame);
        for (int turn = SIMGP_ROT_NONE; turn <= SIMGP_ROT_VERT; ++turn) {
            edits edit = shrunk_to(source, 192);
            if (is_quarter(turn)) std::swap(edit.width, edit.height);
            edit.turn = turn;
            road r(source.shape(), format_coded(SIMGP_FMT_RGB565), false, edit);
            const std::string label(source.format().name);
            tiles.push_back(
                make_tile(r.run(source), label + " " + std::string(turn_names[turn]), 192, 192));
        }
    }
    return tiles;
}

}  // namespace

void demo(const std::string &directory, const source_options &options) {
    source_options wanted = options;
    if (wanted.path.empty()) wanted.path = "testcard:@41";
    const auto in = open_source(wanted);
    std::error_code error;
    std::filesystem::create_directories(directory, error);
    if (error) throw fault(directory, ": ", error.message());

    const colour &c = wanted.colour.empty()
                          ? resolved(in->traits().colour, in->shape().width, in->shape().height)
                          : colour_named(wanted.colour);
    std::vector<picture> frames = sample_frames(*in, c);
    const std::string folder = directory + "/";
    save(folder + "at-a-glance.png", at_a_glance(frames.front()), 3);
    printf("%sat-a-glance.png: 24 and 16 bits, dithered, deblocked, resized and turned\n",
           folder.c_str());
    const std::vector<tile> rgb = every_rgb(frames);
    save(folder + "every-rgb-format.png", rgb, int(rgb.size() / frames.size()));
    printf("%severy-rgb-format.png: %s in every RGB format\n", folder.c_str(),
           wanted.path != "-"  ? in->name().c_str()
           : frames.size() > 1 ? "the video"
                               : "the picture");
    save(folder + "every-yuv-to-rgb.png", every_pair(frames.front()), 7);
    printf("%severy-yuv-to-rgb.png: every YUV to RGB conversion\n", folder.c_str());
    save(folder + "right-and-wrong-colour.png", right_and_wrong(frames.front()), 2);
    printf("%sright-and-wrong-colour.png: BT.709 and full range, taken for what they are or not\n",
           folder.c_str());
    save(folder + "tiles-and-dithering.png", tiles_and_dithering(frames.front()), 3);
    printf(
        "%stiles-and-dithering.png: from a tiled frame to the screen; dithered beside plain "
        "gradients\n",
        folder.c_str());
    save(folder + "road-to-the-screen.png", road_to_the_screen(frames.front()), 4);
    printf("%sroad-to-the-screen.png: a tiled frame, resized to 16-bit RGB, turned; a thumbnail\n",
           folder.c_str());
    save(folder + "every-turn.png", every_turn(frames.front()), 6);
    printf("%severy-turn.png: every turn and mirror, resized on the way\n", folder.c_str());
}

}  // namespace tools
