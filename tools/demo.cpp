// Pictures that show what the library does.
#include <algorithm>
#include <cstdio>
#include <cstring>
#include <filesystem>

#include "tools/job.h"
#include "tools/rgb.h"
#include "tools/road.h"
#include "tools/sheet.h"
#include "tools/sink.h"

namespace tools {

namespace {

void save(const std::string &path, const std::vector<Tile> &tiles, int columns) {
    Output output(path);
    write_png(output, lay_out(tiles, columns));
    output.commit();
}

std::string upper_label(const Road &road) {
    std::string text = road.text();
    text.erase(std::remove(text.begin(), text.end(), '-'), text.end());
    return text;
}

/// Frames 0, 20 and 40, or as many as there are, as 4:2:0.
std::vector<Picture> sample_frames(Source &source) {
    std::vector<Picture> frames;
    Picture frame(source.shape());
    Road road(source.shape(), format_coded(SIMGP_FMT_YUV420), false);
    for (int k = 0; k <= 40 && source.next(frame); ++k)
        if (k % 20 == 0) frames.push_back(road.run(frame));
    if (frames.empty()) throw Fault(source.name(), ": holds no frame");
    return frames;
}

/// Every RGB format, one column each.
std::vector<Tile> every_rgb(std::vector<Picture> &frames) {
    std::vector<Tile> tiles;
    for (Picture &frame : frames)
        for (const Format &to : formats())
            if (to.is_rgb()) {
                Road road(frame.shape(), to, false);
                tiles.push_back(make_tile(road.run(frame), std::string(to.name), 240, 240));
            }
    return tiles;
}

/// Every conversion from YUV to RGB that the library has, on the test card.
std::vector<Tile> every_pair() {
    std::vector<Tile> tiles;
    for (const Format &from : formats())
        for (const Format &to : formats()) {
            if (from.is_rgb() || !to.is_rgb() || !offered(from, to, Via::csc)) continue;
            auto card = open_testcard("testcard:192x144", from);
            Picture frame;
            card->next(frame);
            Road road(frame.shape(), to, false);
            tiles.push_back(make_tile(road.run(frame), upper_label(road), 192, 144));
        }
    return tiles;
}

/// The bytes of a tiled luma plane shown as if they were lines.
Picture read_as_lines(const Picture &tiled) {
    Picture grey({&format_coded(SIMGP_FMT_RGB888), tiled.width(), tiled.height()});
    const uint8_t *byte = tiled.row(0, 0);
    for (int y = 0; y < grey.height(); ++y)
        for (int x = 0; x < grey.width(); ++x, ++byte)
            for (int c = 0; c < 3; ++c) *grey.sample(c, x, y) = *byte;
    return grey;
}

/// A soft rise of grey over the width, a sixth of a level a pixel.
Picture gradient(int width, int height) {
    Picture picture({&format_coded(SIMGP_FMT_YUV420), width, height});
    for (int y = 0; y < height; ++y)
        for (int x = 0; x < width; ++x) {
            *picture.sample(0, x, y) = uint8_t(90 + x / 6 + y / 12);
            *picture.sample(1, x, y) = *picture.sample(2, x, y) = 128;
        }
    return picture;
}

/// `width` x `height` pixels from the middle of an RGB picture, each drawn `scale` times as large.
Picture enlarged(const Picture &picture, int width, int height, int scale) {
    width = std::min(width, picture.width());
    height = std::min(height, picture.height());
    const int left = (picture.width() - width) / 2, top = (picture.height() - height) / 2;
    const int bytes = picture.format().planes[0].bytes;
    Picture large({&picture.format(), width * scale, height * scale});
    for (int y = 0; y < large.height(); ++y)
        for (int x = 0; x < large.width(); ++x)
            std::memcpy(large.row(0, y) + x * bytes,
                        picture.row(0, top + y / scale) + (left + x / scale) * bytes,
                        size_t(bytes));
    return large;
}

/// A tiled frame on its road to the screen, then rows of 24-bit, plain and dithered 16-bit colour.
std::vector<Tile> tiles_and_dithering(Picture &frame) {
    std::vector<Tile> tiles;
    Road tile_up(frame.shape(), format_coded(SIMGP_FMT_T64X32), false);
    Picture &tiled = tile_up.run(frame);
    tiles.push_back(make_tile(read_as_lines(tiled), "t64x32 memory read as lines", 384, 384));
    for (int32_t code : {SIMGP_FMT_RGB565, SIMGP_FMT_BGR565}) {
        Road road(tiled.shape(), format_coded(code), false);
        tiles.push_back(make_tile(road.run(tiled), upper_label(road), 384, 384));
    }
    auto compare = [&](Picture &picture, int width, int height, int scale,
                       const std::string &what) {
        for (int column = 0; column < 3; ++column) {
            const Format &to = format_coded(column == 0 ? SIMGP_FMT_RGB888 : SIMGP_FMT_RGB565);
            Road road(picture.shape(), to, column == 2);
            const char *name = column == 0   ? "24 bits"
                               : column == 1 ? "16 bits"
                                             : "16 bits dithered";
            tiles.push_back(
                {to_rgb888(enlarged(road.run(picture), width, height, scale)), what + name});
        }
    };
    Picture soft = gradient(384, 192);
    compare(soft, 384, 192, 1, "gradient ");
    compare(soft, 96, 48, 4, "x 4: ");
    compare(frame, 192, 144, 2, "frame x 2: ");
    return tiles;
}

}  // namespace

void demo(const std::string &directory, const SourceOptions &options) {
    SourceOptions wanted = options;
    if (wanted.path.empty()) wanted.path = "testcard:@41";
    const auto source = open_source(wanted);
    std::error_code error;
    std::filesystem::create_directories(directory, error);
    if (error) throw Fault(directory, ": ", error.message());

    std::vector<Picture> frames = sample_frames(*source);
    const std::string folder = directory + "/";
    const std::vector<Tile> rgb = every_rgb(frames);
    save(folder + "every-rgb-format.png", rgb, int(rgb.size() / frames.size()));
    std::printf("%severy-rgb-format.png: %s in every RGB format\n", folder.c_str(),
                wanted.path == "-" ? "the video" : source->name().c_str());
    save(folder + "every-yuv-to-rgb.png", every_pair(), 6);
    std::printf("%severy-yuv-to-rgb.png: the test card through every YUV to RGB conversion\n",
                folder.c_str());
    save(folder + "tiles-and-dithering.png", tiles_and_dithering(frames.front()), 3);
    std::printf(
        "%stiles-and-dithering.png: from a tiled frame to the screen; dithered beside plain "
        "gradients\n",
        folder.c_str());
}

}  // namespace tools
