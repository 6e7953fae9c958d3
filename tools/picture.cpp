#include "tools/picture.h"

#include <array>
#include <charconv>
#include <iterator>

#include "simgp/formats.h"
#include "tools/fault.h"
#include "tools/nearest.h"

namespace tools {

namespace {

using family = pixel_format::family;

// A format of the library's table, with the places of the channels that its layout means.
constexpr pixel_format described(const simgp::coded_format &coded) {
    using simgp::format_kind;
    using simgp::yuv_layout;
    const simgp::format &f = *coded.is;
    pixel_format d{coded.code, f.name.text, family::planar, f.planes, {}, {}};
    for (int k = 0; k < f.planes; ++k) d.planes[k] = {f.bytes[k], f.x_shift[k], f.y_shift[k]};
    if (f.kind == format_kind::rgb) {
        const simgp::pixel_bytes at = simgp::pixels_of[size_t(f.packing)];
        d.kind = at.size == 2 ? family::rgb16 : family::rgb;
        if (at.size == 2) return d;
        const int first[] = {at.r, at.g, at.b};
        for (int c = 0; c < 3; ++c) d.channels[c] = {0, first[c], at.size, 0, 0};
    } else if (f.kind == format_kind::tiled) {
        d.kind = family::tiled;
    } else if (f.kind == format_kind::packed) {
        d.kind = family::packed;
        const int y = f.layout == yuv_layout::uyvy ? 1 : 0, u = 1 - y;
        d.channels[0] = {0, y, 2, 0, 0};
        d.channels[1] = {0, u, 4, 1, 0};
        d.channels[2] = {0, u + 2, 4, 1, 0};
    } else {
        d.channels[0] = {0, 0, 1, 0, 0};
        for (int c = 1; c < 3 && f.u >= 0; ++c) {
            const int plane = c == 1 ? f.u : f.v;
            const bool second = c == 1 ? f.layout == yuv_layout::vu : f.layout == yuv_layout::uv;
            d.channels[c] = {plane, second, f.bytes[plane], f.x_shift[plane], f.y_shift[plane]};
        }
    }
    return d;
}

constexpr auto table = [] {
    std::array<pixel_format, std::size(simgp::coded_formats)> all{};
    for (size_t i = 0; i < all.size(); ++i) all[i] = described(simgp::coded_formats[i]);
    return all;
}();

int even(int n) { return n + (n & 1); }
int whole_fours(int n) { return (n + 3) & ~3; }

}  // namespace

int pixel_format::chroma() const {
    const bool grey = kind == family::planar && plane_count == 1;
    return grey ? 0 : 4 >> (chroma_x_shift() + chroma_y_shift());
}

std::span<const pixel_format> formats() { return table; }

const pixel_format *find_format(std::string_view name) {
    const int32_t code = simgp_format_of_name(std::string(name).c_str());
    for (const pixel_format &format : table)
        if (format.code == code) return &format;
    return nullptr;
}

const pixel_format &format_named(std::string_view name) {
    if (const pixel_format *format = find_format(name)) return *format;
    std::string known;
    std::vector<std::string_view> names;
    for (const pixel_format &format : table) {
        known.append(" ").append(format.name);
        names.push_back(format.name);
    }
    const std::string meant = did_you_mean(name, names);
    throw fault("unknown format '", name, "'", meant.empty() ? "; there are" + known : meant);
}

const pixel_format &format_coded(int32_t code) {
    for (const pixel_format &format : table)
        if (format.code == code) return format;
    throw fault("unknown format code ", code);
}

std::string ending_of(const std::string &path) {
    const size_t dot = path.rfind('.');
    return dot == std::string::npos || path.find('/', dot) != std::string::npos
               ? ""
               : path.substr(dot + 1);
}

void check_size(int64_t width, int64_t height, const std::string &where) {
    if (width < 1 || height < 1 || width > 65535 || height > 65535)
        throw fault(where, ": impossible size ", width, "x", height,
                    "; width and height go from 1 to 65535");
    if (width * height > (int64_t{1} << 30) / 4)
        throw fault(where, ": impossible size ", width, "x", height,
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
            throw fault(what, ": impossible size ", text, "; width and height go from 1 to 65535");
    }
    if (!good) throw fault(what, ": '", text, "' is not a size such as 640x480");
    check_size(w, h, what);
    width = int(w);
    height = int(h);
}

picture::picture(const picture_shape &shape) : shape_(shape) {
    const bool tiled = format().is_tiled();
    const char *why = "";
    if (simgp_lay_out(&layout_, format().code, tiled ? width() : whole_fours(width()),
                      tiled ? height() : whole_fours(height()), 1, &why) != SIMGP_OK)
        throw fault("a picture of ", width(), "x", height(), ": ", why);
    memory_.resize(layout_.bytes);
}

size_t picture::line_bytes(int plane) const {
    return size_t(format().is_tiled()
                      ? simgp_plane_bytes(format().code, plane, width(), height(), 0)
                      : simgp_line_bytes(format().code, plane, width()));
}

int picture::lines(int plane) const {
    return format().is_tiled() ? 1 : simgp_plane_height(format().code, plane, height());
}

size_t picture::raw_bytes() const {
    size_t total = 0;
    for (int k = 0; k < planes(); ++k) total += line_bytes(k) * size_t(lines(k));
    return total;
}

simgp_img picture::descriptor(bool even_width, bool even_height) {
    const int w = even_width ? even(width()) : width();
    const int h = even_height ? even(height()) : height();
    simgp_img img = {};
    img.format = format().code;
    for (int k = 0; k < planes(); ++k) {
        img.width[k] = simgp_plane_width(img.format, k, w);
        img.height[k] = simgp_plane_height(img.format, k, h);
        img.stride[k] = layout_.stride[k];
        img.plane[k] = line(k, 0);
    }
    return img;
}

}  // namespace tools
