#include "bench/picture.h"

#include <math.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>

#include <algorithm>
#include <chrono>
#include <map>

extern "C" {
#include <libavutil/log.h>
#include <libswscale/swscale.h>
}

#include "simgp/csc.h"
#include "simgp/csc_any.h"
#include "simgp/describe.h"
#include "simgp/formats.h"

namespace bench {
namespace {

// A plane as a repeated group of bytes: Y U V R G B A, or w, W for the two bytes of a word of
// 16-bit RGB.
struct plane_shape {
    std::string group;
    int group_pixels_log2;
};
struct format_shape {
    const simgp::format *format;
    std::vector<plane_shape> planes;
};

format_shape shape_of(int code) {
    const simgp::format *const f = simgp::find_format(code);
    if (!f) fail("no such format: " + std::to_string(code));
    format_shape shape{f, {}};
    if (f->kind == simgp::format_kind::rgb) {
        const simgp::pixel_bytes at = simgp::pixels_of[size_t(f->packing)];
        std::string group = "wW";
        if (at.size > 2) {
            group.assign(size_t(at.size), 'A');
            group[size_t(at.r)] = 'R', group[size_t(at.g)] = 'G', group[size_t(at.b)] = 'B';
        }
        shape.planes = {{group, 0}};
    } else if (f->kind == simgp::format_kind::packed) {
        shape.planes = {{f->layout == simgp::yuv_layout::uyvy ? "UYVY" : "YUYV", 1}};
    } else {
        shape.planes = {{"Y", 0}};
        for (int k = 1; k < f->planes; k++) {
            const char *const group = f->u == f->v
                                          ? f->layout == simgp::yuv_layout::vu ? "VU" : "UV"
                                      : k == f->u ? "U"
                                                  : "V";
            shape.planes.push_back({group, f->x_shift[k]});
        }
    }
    return shape;
}

std::string name_of(int code) { return shape_of(code).format->name.text; }
bool blue_is_high(int code) {
    const simgp::pixel_bytes at = simgp::pixels_of[size_t(simgp::find_format(code)->packing)];
    return at.b > at.r;
}

// swscale's names.
AVPixelFormat swscale_format(int code) {
    static const std::map<int, AVPixelFormat> formats = {
        {SIMGP_FMT_YUV400, AV_PIX_FMT_GRAY8},    {SIMGP_FMT_YUV420, AV_PIX_FMT_YUV420P},
        {SIMGP_FMT_YUV422N, AV_PIX_FMT_YUV422P}, {SIMGP_FMT_YUV444, AV_PIX_FMT_YUV444P},
        {SIMGP_FMT_YV12, AV_PIX_FMT_YUV420P},    {SIMGP_FMT_YV16, AV_PIX_FMT_YUV422P},
        {SIMGP_FMT_NV12, AV_PIX_FMT_NV12},       {SIMGP_FMT_NV21, AV_PIX_FMT_NV21},
        {SIMGP_FMT_YUV422W, AV_PIX_FMT_YUV440P}, {SIMGP_FMT_UYVY, AV_PIX_FMT_UYVY422},
        {SIMGP_FMT_YUYV, AV_PIX_FMT_YUYV422},    {SIMGP_FMT_RGB565, AV_PIX_FMT_RGB565LE},
        {SIMGP_FMT_BGR565, AV_PIX_FMT_BGR565LE}, {SIMGP_FMT_RGB888, AV_PIX_FMT_RGB24},
        {SIMGP_FMT_BGR888, AV_PIX_FMT_BGR24},    {SIMGP_FMT_RGBA8888, AV_PIX_FMT_RGBA},
        {SIMGP_FMT_BGRA8888, AV_PIX_FMT_BGRA},   {SIMGP_FMT_ARGB8888, AV_PIX_FMT_ARGB},
    };
    const auto found = formats.find(code);
    return found == formats.end() ? AV_PIX_FMT_NONE : found->second;
}

// The value of a channel at (x, y), each 0 ... 1.
double channel(char name, double x, double y) {
    switch (name) {
        case 'Y':
            return 16 + 219 * (0.8 * x + 0.2 * y);
        case 'U':
            return 128 + 90 * sin(6 * y + 2 * x);
        case 'V':
            return 128 + 90 * cos(5 * x - 3 * y);
        case 'R':
            return 255 * x;
        case 'G':
            return 255 * y;
        case 'B':
            return 127.5 + 127.5 * sin(4 * (x + y));
        default:
            return 255;
    }
}

int to_word(int format, int r, int g, int b) {
    if (blue_is_high(format)) std::swap(r, b);
    return r >> 3 << 11 | g >> 2 << 5 | b >> 3;
}

// Calls f(channel, value) for the channels of the byte; for a word's two bytes at its first.
template <class F>
void for_channels(int format, char name, const uint8_t *at, const F &f) {
    if (name == 'W') return;
    if (name != 'w') return f(name, *at);
    const int word = at[0] | at[1] << 8;
    const bool bgr = blue_is_high(format);
    f(bgr ? 'B' : 'R', (word >> 11) * 255 / 31);
    f('G', (word >> 5 & 63) * 255 / 63);
    f(bgr ? 'R' : 'B', (word & 31) * 255 / 31);
}

// Calls f(name, byte, x, y), with x and y in 0 ... 1, for the bytes of all planes. Of small pictures
// these are the corner of a larger one: colours are to change no faster from pixel to pixel.
template <class F>
void for_bytes(const picture &p, const F &f) {
    const format_shape shape = shape_of(p.format);
    for (size_t k = 0; k < shape.planes.size(); k++) {
        const plane_shape &plane = shape.planes[k];
        const double part_x = std::min(1., p.width[0] / 320.),
                     part_y = std::min(1., p.height[0] / 240.);
        const int size = int(plane.group.size());
        const int groups =
            (p.width[0] + (1 << plane.group_pixels_log2) - 1) >> plane.group_pixels_log2;
        for (int y = 0; y < p.height[k]; y++) {
            uint8_t *line = p.plane[k] + ptrdiff_t(y) * p.stride[k];
            for (int g = 0; g < groups; g++)
                for (int i = 0; i < size; i++)
                    f(plane.group[size_t(i)], line + g * size + i, part_x * g / groups,
                      part_y * y / p.height[k]);
        }
    }
}

bool v_before_u(int code) {
    const simgp::format &f = *simgp::find_format(code);
    return f.v >= 0 && f.v < f.u;
}

simgp_img exchanged(simgp_img p) {
    std::swap(p.plane[1], p.plane[2]);
    std::swap(p.stride[1], p.stride[2]);
    return p;
}

double microseconds(const std::function<void()> &f) {
    const auto start = std::chrono::steady_clock::now();
    f();
    return std::chrono::duration<double, std::micro>(std::chrono::steady_clock::now() - start)
        .count();
}

}  // namespace

picture::picture(int format, int w, int h) : simgp_img{} {
    const char *why = "";
    simgp_layout layout = {};
    if (simgp_lay_out(&layout, format, w, h, 64, &why) != SIMGP_OK) fail(why);
    bytes = layout.bytes;
    memory.reset(static_cast<uint8_t *>(aligned_alloc(4096, (bytes + 4095) & ~size_t(4095))), free);
    memset(memory.get(), 0xA5, bytes);
    if (simgp_describe(this, format, w, h, 64, memory.get(), bytes, &why) != SIMGP_OK) fail(why);
    // Ours has no use for them; libyuv finds rows of tiles by them.
    if (format == SIMGP_FMT_T64X32) stride[0] = stride[1] = (w + 63) & -64;
}

void paint(const picture &p) {
    if (p.format == SIMGP_FMT_T64X32) {
        const picture linear(SIMGP_FMT_YUV420, p.width[0], p.height[0]);
        paint(linear);
        if (simgp_csc(&linear, &p) != SIMGP_OK) fail("no way to a tiled picture");
        return;
    }
    uint32_t state = 1;
    for_bytes(p, [&](char name, uint8_t *at, double x, double y) {
        const auto value = [&](char c) {
            state = state * 1664525 + 1013904223;
            const double noise = c == 'U' || c == 'V' ? 0 : (state >> 24) / 128.0 - 1;
            return int(std::clamp(channel(c, x, y) + noise, 0.0, 255.0));
        };
        if (name == 'W') return;
        if (name != 'w') {
            *at = uint8_t(value(name));
            return;
        }
        const int word = to_word(p.format, value('R'), value('G'), value('B'));
        at[0] = uint8_t(word);
        at[1] = uint8_t(word >> 8);
    });
}

void expect_alike(const std::string &what, const picture &a, const picture &b, double tolerance) {
    double sums[128] = {}, counts[128] = {};
    const ptrdiff_t to_b = b.memory.get() - a.memory.get();
    for_bytes(a, [&](char name, uint8_t *at, double, double) {
        int values[3], n = 0;
        for_channels(a.format, name, at, [&](char, int value) { values[n++] = value; });
        n = 0;
        for_channels(a.format, name, at + to_b, [&](char c, int value) {
            sums[int(c)] += abs(values[n++] - value);
            counts[int(c)]++;
        });
    });
    for (int c = 0; c < 128; c++) {
        if (counts[c] == 0 || sums[c] / counts[c] <= tolerance) continue;
        char text[100];
        snprintf(text, sizeof text, ": channel %c differs by %.1f of 255 on average", c,
                 sums[c] / counts[c]);
        fail(what + text);
    }
}

simgp_img lines(const simgp_img &p, int y, int count) {
    const char *why = "";
    simgp_img part = p;
    if (simgp_band(&p, y, count, &part, &why) != SIMGP_OK) fail(why);
    return part;
}

operation exchange_src_chroma(const operation &f) {
    return [f](const simgp_img &s, const simgp_img &d) { f(exchanged(s), d); };
}
operation exchange_dst_chroma(const operation &f) {
    return [f](const simgp_img &s, const simgp_img &d) { f(s, exchanged(d)); };
}

peer libyuv_peer(operation f) {
    return {"libyuv", [f](const simgp_img &, const simgp_img &) { return f; }};
}

peer libyuv_peer(operation first, int between, operation second) {
    return {std::string("libyuv via ") + name_of(between),
            [=](const simgp_img &s, const simgp_img &) -> operation {
                constexpr int band = 8;
                const picture temporary(between, s.width[0], band);
                return [=](const simgp_img &src, const simgp_img &dst) {
                    for (int y = 0; y < src.height[0]; y += band) {
                        const int count = std::min(band, src.height[0] - y);
                        const simgp_img from = lines(src, y, count);
                        const simgp_img mid = lines(temporary, 0, count);
                        first(from, mid);
                        second(mid, lines(dst, y, count));
                    }
                };
            }};
}

std::vector<peer> swscale_peer(int from, int to, int extra_flags, resizing how, int32_t colour) {
    av_log_set_level(AV_LOG_ERROR);
    const AVPixelFormat a = swscale_format(from), b = swscale_format(to);
    if (a == b && how == resizing::none) return {};
    if (!sws_isSupportedInput(a) || !sws_isSupportedOutput(b)) return {};
    const bool swap_src = v_before_u(from), swap_dst = v_before_u(to);

    const operation_maker make = [=](const simgp_img &src, const simgp_img &dst) {
        operation best;
        double least = 0;
        for (const int flags : {SWS_POINT, SWS_FAST_BILINEAR, SWS_BILINEAR}) {
            if (flags == SWS_POINT && how == resizing::interpolates) continue;
            std::shared_ptr<SwsContext> context(
                sws_getContext(src.width[0], src.height[0], a, dst.width[0], dst.height[0], b,
                               flags | extra_flags, nullptr, nullptr, nullptr),
                sws_freeContext);
            if (!context) continue;
            if (colour == SIMGP_COLOUR_BT709) {
                const int *const table = sws_getCoefficients(SWS_CS_ITU709);
                sws_setColorspaceDetails(context.get(), table, 0, table, 0, 0, 1 << 16, 1 << 16);
            }
            const operation convert = [=](const simgp_img &s, const simgp_img &d) {
                const uint8_t *from_planes[4] = {s.plane[0], s.plane[1 + swap_src],
                                                 s.plane[2 - swap_src], nullptr};
                const int from_strides[4] = {s.stride[0], s.stride[1 + swap_src],
                                             s.stride[2 - swap_src], 0};
                uint8_t *to_planes[4] = {d.plane[0], d.plane[1 + swap_dst], d.plane[2 - swap_dst],
                                         nullptr};
                const int to_strides[4] = {d.stride[0], d.stride[1 + swap_dst],
                                           d.stride[2 - swap_dst], 0};
                sws_scale(context.get(), from_planes, from_strides, 0, s.height[0], to_planes,
                          to_strides);
            };
            const auto run = [&] { convert(src, dst); };
            run();
            const double time = std::min({microseconds(run), microseconds(run), microseconds(run)});
            if (!best || time < least) best = convert, least = time;
        }
        if (!best) fail("swscale makes no context");
        return best;
    };
    return {{"swscale", make}};
}

namespace {

// A source and a destination. Where these are one, the way back to what was painted.
struct arena {
    picture src, dst;
    std::function<void()> restore;

    void run(const operation &f) const {
        if (restore) restore();
        f(src, dst);
    }
};

size destination_size(const conversion &c, const size &from) {
    return c.to_size ? c.to_size(from) : from;
}

arena make_arena(const conversion &c, int from_format, const size &from, const size &to) {
    const picture src(from_format, from.width, from.height);
    paint(src);
    const picture dst(c.to, to.width, to.height);
    if (!c.in_place) return {src, dst, {}};
    if (c.to != from_format || to.width != from.width || to.height != from.height)
        fail(c.name + ": in place, and yet from one format or size to another");
    return {dst, dst, [=] { memcpy(dst.memory.get(), src.memory.get(), src.bytes); }};
}

// A part of the pictures of `a`, which keep their strides.
picture corner_of(const picture &p, const size &s) {
    const picture compact(p.format, s.width, s.height);
    picture corner = p;
    std::copy_n(compact.width, std::size(compact.width), corner.width);
    std::copy_n(compact.height, std::size(compact.height), corner.height);
    return corner;
}
arena corner_of(arena a, const size &s) {
    return {corner_of(a.src, s), corner_of(a.dst, s), a.restore};
}

// The bytes of a plane, or of all.
struct extent {
    uint8_t *first;
    size_t count;
};
extent dealt_with(const picture &p, int plane) {
    if (plane < 0) return {p.memory.get(), p.bytes};
    return {p.plane[plane], size_t(p.stride[plane]) * size_t(p.height[plane])};
}

}  // namespace

comparison compare(conversion c) {
    if (c.name.empty()) c.name = c.name_prefix + name_of(c.from) + "_to_" + name_of(c.to);
    if (!c.ours)
        c.ours = [name = c.name](const simgp_img &s, const simgp_img &d) {
            if (simgp_csc(&s, &d) != SIMGP_OK) fail(name + ": simgp_csc does not know the pair");
        };
    if (c.against_swscale)
        for (peer &p : swscale_peer(c.from, c.to, 0, c.how, c.colour))
            c.peers.push_back(std::move(p));
    if (c.sizes.empty()) c.sizes = {"320x240", "1280x720", "1920x1080", "3840x2160", "1918x1078"};

    const auto make = [c](const std::string &name) {
        size from{}, to{};
        const int numbers = sscanf(name.c_str(), "%dx%d to %dx%d", &from.width, &from.height,
                                   &to.width, &to.height);
        if (numbers != 2 && numbers != 4) fail("no size: " + name);
        const bool any_size = c.how != resizing::none && !c.to_size;
        const size usual_to = destination_size(c, from);
        if (numbers == 2) to = usual_to;
        if (!any_size && (to.width != usual_to.width || to.height != usual_to.height))
            fail(c.name + " does not go from one size to the other: " + name);
        const arena a = make_arena(c, c.from, from, to);
        const picture ours(c.to, to.width, to.height);
        a.run(c.ours);
        memcpy(ours.memory.get(), a.dst.memory.get(), ours.bytes);

        match m{};
        const extent from_bytes = dealt_with(a.src, c.plane), to_bytes = dealt_with(a.dst, c.plane);
        m.units = c.plane < 0 ? double(a.dst.pixels())
                              : double(a.dst.width[c.plane]) * a.dst.height[c.plane];
        m.restore = a.restore;
        m.ours = [f = c.ours, a] { f(a.src, a.dst); };
        arena b = a;  // of work in place the same: all have the same memory before them
        if (!c.in_place) b.dst = picture(c.to, to.width, to.height);
        for (const peer &p : c.peers) {
            const operation convert = p.make(b.src, b.dst);
            memset(b.dst.memory.get(), 0xA5, b.dst.bytes);
            b.run(convert);
            // Of an icon the borders, where peers interpolate otherwise, are most of the picture; which of
            // its modes swscale takes is decided by their times.
            const bool icon = to.width * to.height < 1024;
            if (c.tolerance > 0)
                expect_alike(c.name + " by " + p.name, ours, b.dst, c.tolerance * (icon ? 1.5 : 1));
            m.peers.push_back({p.name, [=] { convert(b.src, b.dst); }});
        }
        m.limit = c.in_place
                      ? memory_traffic_in_place(a.dst.memory, a.dst.memory.get(), a.dst.bytes)
                      : memory_traffic(a.src.memory, from_bytes.first,
                                       size_t(double(from_bytes.count) * c.part_read),
                                       to_bytes.first, to_bytes.count);

        // Where a goal asks for the speed of memory, it is that of pictures beyond the cache, and
        // the peer's that of those inside.
        const std::string start = name.substr(0, name.find(' '));
        // Of a resize every size that it names counts.
        const bool in_cache = start == "320x240";
        const bool usual = in_cache || start == "1920x1080" || any_size;
        m.goals.scalar = usual ? c.goals.scalar : 0;
        m.goals.peer = (c.goals.limit > 0 ? in_cache : usual) ? c.goals.peer : 0;
        m.goals.limit = start == "3840x2160" ? c.goals.limit : 0;
        // Of small pictures it is asked of all operations alike.
        if (start == "16x16" || start == "24x24") m.goals.peer = 1;
        if (start == "40x40" || start == "64x48") m.goals.peer = c.goals.limit > 0 ? 1 : 1.3;
        const auto twin = [&](const std::string &what, const arena &t, double goal) {
            m.twin = {what, [f = c.ours, t] { f(t.src, t.dst); }, double(t.dst.pixels()), goal,
                      t.restore};
        };
        const auto arena_of = [&](int format, const size &s) {
            return make_arena(c, format, s, destination_size(c, s));
        };
        if (name == "1918x1078")
            twin("1080p", arena_of(c.from, {1920, 1080}), 0.9);
        else if (name == "321x241")
            // In planes of the same strides: those of 320 x 240 have no gaps, and are done as one line.
            twin("even", corner_of(arena_of(c.from, from), {320, 240}), 0.9);
        else if (c.twin_from >= 0)
            twin(name_of(c.twin_from), arena_of(c.twin_from, from), usual ? 0.9 : 0);
        else if (c.twin.make)
            m.twin = {c.twin.name, [f = c.twin.make(b.src, b.dst), b] { f(b.src, b.dst); }, m.units,
                      c.twin.goal};
        return m;
    };
    return {c.name, c.sizes, make};
}

std::vector<comparison> compare_all(const std::vector<conversion> &all) {
    std::vector<comparison> comparisons;
    for (const conversion &c : all) comparisons.push_back(compare(c));
    return comparisons;
}

}  // namespace bench
