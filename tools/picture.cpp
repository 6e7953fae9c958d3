#include "tools/picture.h"

#include <algorithm>
#include <charconv>
#include <cstring>

#include "tools/fault.h"

namespace tools {

namespace {

const std::vector<Format> table = {
    {SIMGP_FMT_YUV400, "yuv400", Kind::planar, {{1, 0, 0}}, {{0, 0, 1, 0, 0}, {}, {}}},
    {SIMGP_FMT_YUV420,
     "yuv420",
     Kind::planar,
     {{1, 0, 0}, {1, 1, 1}, {1, 1, 1}},
     {{0, 0, 1, 0, 0}, {1, 0, 1, 1, 1}, {2, 0, 1, 1, 1}}},
    {SIMGP_FMT_YUV422N,
     "yuv422n",
     Kind::planar,
     {{1, 0, 0}, {1, 1, 0}, {1, 1, 0}},
     {{0, 0, 1, 0, 0}, {1, 0, 1, 1, 0}, {2, 0, 1, 1, 0}}},
    {SIMGP_FMT_YUV444,
     "yuv444",
     Kind::planar,
     {{1, 0, 0}, {1, 0, 0}, {1, 0, 0}},
     {{0, 0, 1, 0, 0}, {1, 0, 1, 0, 0}, {2, 0, 1, 0, 0}}},
    {SIMGP_FMT_YV12,
     "yv12",
     Kind::planar,
     {{1, 0, 0}, {1, 1, 1}, {1, 1, 1}},
     {{0, 0, 1, 0, 0}, {2, 0, 1, 1, 1}, {1, 0, 1, 1, 1}}},
    {SIMGP_FMT_YV16,
     "yv16",
     Kind::planar,
     {{1, 0, 0}, {1, 1, 0}, {1, 1, 0}},
     {{0, 0, 1, 0, 0}, {2, 0, 1, 1, 0}, {1, 0, 1, 1, 0}}},
    {SIMGP_FMT_NV12,
     "nv12",
     Kind::planar,
     {{1, 0, 0}, {2, 1, 1}},
     {{0, 0, 1, 0, 0}, {1, 0, 2, 1, 1}, {1, 1, 2, 1, 1}}},
    {SIMGP_FMT_NV21,
     "nv21",
     Kind::planar,
     {{1, 0, 0}, {2, 1, 1}},
     {{0, 0, 1, 0, 0}, {1, 1, 2, 1, 1}, {1, 0, 2, 1, 1}}},
    {SIMGP_FMT_YUV422W,
     "yuv422w",
     Kind::planar,
     {{1, 0, 0}, {1, 0, 1}, {1, 0, 1}},
     {{0, 0, 1, 0, 0}, {1, 0, 1, 0, 1}, {2, 0, 1, 0, 1}}},
    {SIMGP_FMT_T64X32, "t64x32", Kind::tiled, {{1, 0, 0}, {2, 1, 1}}, {}},
    {SIMGP_FMT_UYVY,
     "uyvy",
     Kind::packed,
     {{2, 0, 0}},
     {{0, 1, 2, 0, 0}, {0, 0, 4, 1, 0}, {0, 2, 4, 1, 0}}},
    {SIMGP_FMT_YUYV,
     "yuyv",
     Kind::packed,
     {{2, 0, 0}},
     {{0, 0, 2, 0, 0}, {0, 1, 4, 1, 0}, {0, 3, 4, 1, 0}}},
    {SIMGP_FMT_RGB565, "rgb565", Kind::rgb16, {{2, 0, 0}}, {}},
    {SIMGP_FMT_BGR565, "bgr565", Kind::rgb16, {{2, 0, 0}}, {}},
    {SIMGP_FMT_RGB888,
     "rgb888",
     Kind::rgb,
     {{3, 0, 0}},
     {{0, 0, 3, 0, 0}, {0, 1, 3, 0, 0}, {0, 2, 3, 0, 0}}},
    {SIMGP_FMT_BGR888,
     "bgr888",
     Kind::rgb,
     {{3, 0, 0}},
     {{0, 2, 3, 0, 0}, {0, 1, 3, 0, 0}, {0, 0, 3, 0, 0}}},
    {SIMGP_FMT_RGBA8888,
     "rgba8888",
     Kind::rgb,
     {{4, 0, 0}},
     {{0, 0, 4, 0, 0}, {0, 1, 4, 0, 0}, {0, 2, 4, 0, 0}}},
    {SIMGP_FMT_BGRA8888,
     "bgra8888",
     Kind::rgb,
     {{4, 0, 0}},
     {{0, 2, 4, 0, 0}, {0, 1, 4, 0, 0}, {0, 0, 4, 0, 0}}},
    {SIMGP_FMT_ARGB8888,
     "argb8888",
     Kind::rgb,
     {{4, 0, 0}},
     {{0, 1, 4, 0, 0}, {0, 2, 4, 0, 0}, {0, 3, 4, 0, 0}}},
};

int even(int n) { return n + (n & 1); }
int shifted_up(int n, int shift) { return (n + (1 << shift) - 1) >> shift; }

}  // namespace

int Format::chroma() const {
    if (is_rgb()) return 4;
    if (kind == Kind::tiled) return 1;
    if (channel[1].step == 0) return 0;
    return 4 >> (channel[1].x_shift + channel[1].y_shift);
}

std::span<const Format> formats() { return table; }

const Format *find_format(std::string_view name) {
    for (const Format &format : table)
        if (format.name == name) return &format;
    return nullptr;
}

const Format &format_named(std::string_view name) {
    if (const Format *format = find_format(name)) return *format;
    std::string known;
    for (const Format &format : table) known.append(" ").append(format.name);
    throw Fault("unknown format '", name, "'; there are", known);
}

const Format &format_coded(int32_t code) {
    for (const Format &format : table)
        if (format.code == code) return format;
    throw Fault("unknown format code ", code);
}

void check_size(int64_t width, int64_t height, const std::string &where) {
    if (width < 1 || height < 1 || width > 65535 || height > 65535)
        throw Fault(where, ": impossible size ", width, "x", height,
                    "; width and height go from 1 to 65535");
    if (width * height > (int64_t{1} << 30) / 4)
        throw Fault(where, ": impossible size ", width, "x", height,
                    "; a frame may have up to 268435456 pixels");
}

void parse_size(std::string_view text, const std::string &what, int &width, int &height) {
    int64_t w = 0, h = 0;
    const char *end = text.data() + text.size();
    auto first = std::from_chars(text.data(), end, w);
    bool good = first.ec != std::errc::invalid_argument && first.ptr != end && *first.ptr == 'x';
    if (good) {
        auto second = std::from_chars(first.ptr + 1, end, h);
        good = second.ec != std::errc::invalid_argument && second.ptr == end;
        if (good && (first.ec != std::errc() || second.ec != std::errc()))
            throw Fault(what, ": impossible size ", text, "; width and height go from 1 to 65535");
    }
    if (!good) throw Fault(what, ": '", text, "' is not a size such as 640x480");
    check_size(w, h, what);
    width = int(w);
    height = int(h);
}

size_t tiled_plane_bytes(size_t row_bytes, size_t rows) {
    const size_t tile_rows = (rows + 31) / 32;
    // Whole pairs of tile rows hold groups of 2 x 2 tiles; a last single one, groups of 4 x 1.
    return 8192 * ((row_bytes + 127) / 128 * (tile_rows / 2) +
                   (tile_rows % 2 ? (row_bytes + 255) / 256 : 0));
}

Picture::Picture(const Shape &shape) : shape_(shape) {
    size_t total = 0;
    for (int k = 0; k < planes(); ++k) {
        const PlaneShape &p = format().planes[k];
        start_[k] = total;
        if (format().kind == Kind::tiled) {
            rows_[k] = 1;
            row_bytes_[k] = tiled_plane_bytes(width(), height() >> p.y_shift);
            total += row_bytes_[k];
            continue;
        }
        rows_[k] = shifted_up(height(), p.y_shift);
        row_bytes_[k] = size_t(shifted_up(width(), p.x_shift)) * p.bytes;
        stride_[k] = ptrdiff_t(shifted_up(even(width()), p.x_shift)) * p.bytes;
        total += size_t(stride_[k]) * shifted_up(even(height()), p.y_shift);
    }
    memory_.resize(total);
}

size_t Picture::raw_bytes() const {
    size_t total = 0;
    for (int k = 0; k < planes(); ++k) total += row_bytes_[k] * rows_[k];
    return total;
}

simgp_img Picture::descriptor(bool even_width, bool even_height) {
    const int w = even_width ? even(width()) : width();
    const int h = even_height ? even(height()) : height();
    simgp_img img = {};
    img.format = format().code;
    for (int k = 0; k < planes(); ++k) {
        const PlaneShape &p = format().planes[k];
        img.width[k] = shifted_up(w, p.x_shift);
        img.height[k] = format().kind == Kind::tiled ? h >> p.y_shift : shifted_up(h, p.y_shift);
        img.stride[k] = int32_t(stride_[k]);
        img.plane[k] = row(k, 0);
    }
    return img;
}

void move_samples(const Picture &src, Picture &dst) {
    // The V of a last half group lies outside the row: that of the group before serves, as everywhere
    // in the library.
    const bool half_group = src.format().kind == Kind::packed && src.width() % 2 == 1;
    for (int c = 0; c < 3; ++c) {
        const Channel &to = dst.format().channel[c];
        if (to.step == 0) continue;
        const bool known = src.format().channel[c].step != 0;
        for (int y = 0; y < dst.height(); y += 1 << to.y_shift)
            for (int x = 0; x < dst.width(); x += 1 << to.x_shift) {
                const int from = half_group && c == 2 && x == src.width() - 1 ? x - 2 : x;
                *dst.sample(c, x, y) = known && from >= 0 ? *src.sample(c, from, y) : uint8_t{128};
            }
    }
}

}  // namespace tools
