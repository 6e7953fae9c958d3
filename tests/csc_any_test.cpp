// Any format to any format: every pair against one rule in plain integers, every matrix over all
// colours and against real numbers.
#include <array>
#include <cmath>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"
#include "tests/tile_map.h"

namespace {

using rig::channel;
using rig::rgb;
using bytes = std::vector<uint8_t>;

// The reference: matrices
// --------------------------------------------------------------------------

struct yuv {
    int y, u, v;
};
int floor_256(int n) { return n >= 0 ? n / 256 : -((255 - n) / 256); }
int clamp(int n) { return n < 0 ? 0 : n > 255 ? 255 : n; }

struct matrix {
    const char *name;
    int32_t code;
    bool full;
    double red, blue;      // the shares of red and blue in luma, of which all else follows
    int kr, kgu, kgv, kb;  // to RGB, in 256ths
    int y[3], u[3], v[3];  // from RGB, in 256ths

    rgb to_rgb(const yuv &p) const {
        const int luma = full ? 256 * p.y : 298 * (p.y - 16);
        const int cu = p.u - 128, cv = p.v - 128;
        return {clamp(floor_256(luma + kr * cv + 128)),
                clamp(floor_256(luma - kgu * cu - kgv * cv + 128)),
                clamp(floor_256(luma + kb * cu + 128))};
    }
    yuv to_yuv(const rgb &c) const {
        const auto sum = [&c](const int(&k)[3]) { return k[0] * c.r + k[1] * c.g + k[2] * c.b; };
        return {clamp(floor_256(sum(y)) + (full ? 0 : 16)), clamp(floor_256(sum(u) + 128) + 128),
                clamp(floor_256(sum(v) + 128) + 128)};
    }
};
// clang-format off
const matrix matrices[] = {
    {"BT.601", SIMGP_COLOUR_BT601, false, .299, .114,
     409, 100, 208, 516, {66, 129, 25}, {-38, -74, 112}, {112, -94, -18}},
    {"BT.601 full", SIMGP_COLOUR_BT601_FULL, true, .299, .114,
     359, 88, 183, 454, {77, 150, 29}, {-43, -85, 128}, {128, -107, -21}},
    {"BT.709", SIMGP_COLOUR_BT709, false, .2126, .0722,
     459, 55, 136, 541, {47, 157, 16}, {-26, -86, 112}, {112, -102, -10}},
    {"BT.709 full", SIMGP_COLOUR_BT709_FULL, true, .2126, .0722,
     403, 48, 120, 475, {54, 184, 18}, {-29, -99, 128}, {128, -116, -12}},
    {"BT.2020", SIMGP_COLOUR_BT2020, false, .2627, .0593,
     430, 48, 167, 548, {58, 149, 13}, {-31, -81, 112}, {112, -103, -9}},
    {"BT.2020 full", SIMGP_COLOUR_BT2020_FULL, true, .2627, .0593,
     378, 42, 146, 482, {67, 174, 15}, {-36, -92, 128}, {128, -118, -10}},
};
// clang-format on

// The matrices, then the same with averaged chroma.
std::vector<int32_t> all_colours() {
    std::vector<int32_t> codes;
    for (int32_t flag : {0, int32_t(SIMGP_CHROMA_MEAN)})
        for (const matrix &m : matrices) codes.push_back(m.code | flag);
    return codes;
}
const std::vector<int32_t> colours = all_colours();
const matrix &matrix_of(int32_t colour) {
    for (const matrix &m : matrices)
        if (m.code == (colour & ~SIMGP_CHROMA_MEAN)) return m;
    abort();
}
bool means(int32_t colour) { return colour & SIMGP_CHROMA_MEAN; }

// The reference: pictures
// --------------------------------------------------------------------------

// A picture without a layout: what each pixel is, as Y, U and V or as R, G, B and alpha.
class pixels {
  public:
    pixels(const rig::picture &src, const rig::format &f)
        : width(src.widths[0]), height(src.heights[0]), all_(size_t(width) * size_t(height)) {
        const rig::tile_map luma = map(f, width, height), pairs = map(f, width, height / 2);
        for (int y = 0; y < height; y++)
            for (int x = 0; x < width; x++) {
                std::array<int, 4> &p = all_[size_t(y) * size_t(width) + size_t(x)];
                if (f.is_rgb()) {
                    const uint8_t *const from = pixel(src, f, x, y);
                    const rgb c = get_rgb(f, from);
                    p = {c.r, c.g, c.b, get_alpha(f, from)};
                } else if (f.tiled) {
                    // The line below the last one of an odd height is in its tile, if there is one.
                    int line = y / 2;
                    if (line / 32 > (height / 2 - 1) / 32) line = height / 2 - 1;
                    const uint8_t *const pair =
                        height == 1 ? nullptr : src.planes[1] + pairs.at(x & ~1, line);
                    p = {src.planes[0][luma.at(x, y)], pair ? pair[0] : 128, pair ? pair[1] : 128,
                         0};
                } else {
                    p = {*sample(src, f, channel::y, x, y), 128, 128, 0};
                    if (!f.has_chroma()) continue;
                    p[1] = *sample(src, f, channel::u, x, y);
                    // The half group at the end of a packed line has no V.
                    const bool half_group = f.is_packed() && x % 2 == 0 && x + 1 == width;
                    p[2] = !half_group ? *sample(src, f, channel::v, x, y)
                           : x         ? *sample(src, f, channel::v, x - 2, y)
                                       : 128;
                }
            }
    }

    const std::array<int, 4> &at(int x, int y) const {
        return all_[size_t(y) * size_t(width) + size_t(x)];
    }
    yuv yuv_at(int x, int y) const { return {at(x, y)[0], at(x, y)[1], at(x, y)[2]}; }
    rgb rgb_at(int x, int y) const { return {at(x, y)[0], at(x, y)[1], at(x, y)[2]}; }

    // The rounded mean of a channel over every step_x-th pixel of every step_y-th row of a block,
    // as far as it lies in the picture.
    int mean(int c, int x0, int y0, int across, int down, int step_x, int step_y) const {
        int sum = 0, count = 0;
        for (int y = y0; y < y0 + down && y < height; y += step_y)
            for (int x = x0; x < x0 + across && x < width; x += step_x, count++)
                sum += at(x, y)[size_t(c)];
        return (2 * sum + count) / (2 * count);
    }

    int width, height;

  private:
    static rig::tile_map map(const rig::format &f, int width, int rows) {
        return f.tiled ? rig::tile_map(width, rows) : rig::tile_map(0, 0);
    }
    std::vector<std::array<int, 4>> all_;
};

// U and V of the chroma sample whose first pixel is (x, y).
yuv chroma(const pixels &src, const rig::format &from, const rig::format &to, int32_t colour, int x,
           int y) {
    const matrix &m = matrix_of(colour);
    if (!means(colour)) return from.is_rgb() ? m.to_yuv(src.rgb_at(x, y)) : src.yuv_at(x, y);
    const int across = to.at(channel::u).across, down = to.at(channel::u).down;
    if (from.is_rgb())
        return m.to_yuv({src.mean(0, x, y, across, down, 1, 1),
                         src.mean(1, x, y, across, down, 1, 1),
                         src.mean(2, x, y, across, down, 1, 1)});
    const int step_x = from.at(channel::u).across, step_y = from.at(channel::u).down;
    return {0, src.mean(1, x, y, across, down, step_x, step_y),
            src.mean(2, x, y, across, down, step_x, step_y)};
}

void one_rule(const rig::picture &source, const rig::picture &dst, const rig::format &from,
              const rig::format &to, int32_t colour) {
    const matrix &m = matrix_of(colour);
    const pixels src(source, from);
    const int width = src.width, height = src.height;
    if (to.is_rgb()) {
        for (int y = 0; y < height; y++)
            for (int x = 0; x < width; x++)
                put_rgb(to, from.is_rgb() ? src.rgb_at(x, y) : m.to_rgb(src.yuv_at(x, y)),
                        pixel(dst, to, x, y), from.is_rgb() ? src.at(x, y)[3] : 255);
        return;
    }
    // Lines of chroma in tiles are those of whole pairs of rows.
    const rig::tile_map luma(to.tiled ? width : 0, height), pairs(to.tiled ? width : 0, height / 2);
    for (int y = 0; y < height; y++)
        for (int x = 0; x < width; x++) {
            const int value = from.is_rgb() ? m.to_yuv(src.rgb_at(x, y)).y : src.yuv_at(x, y).y;
            (to.tiled ? dst.planes[0][luma.at(x, y)] : *sample(dst, to, channel::y, x, y)) =
                uint8_t(value);
            const rig::channel_place &place = to.at(channel::u);
            if (!to.has_chroma() || x % place.across || y % place.down) continue;
            if (to.tiled && y / 2 >= height / 2) continue;
            const yuv c = chroma(src, from, to, colour, x, y);
            if (to.tiled) {
                dst.planes[1][pairs.at(x, y / 2)] = uint8_t(c.u);
                dst.planes[1][pairs.at(x, y / 2) + 1] = uint8_t(c.v);
                continue;
            }
            *sample(dst, to, channel::u, x, y) = uint8_t(c.u);
            if (to.is_packed() && x + 1 == width) continue;  // lies beyond the line
            *sample(dst, to, channel::v, x, y) = uint8_t(c.v);
        }
}

// The kernel whose result a pair has instead, if it has one.
const rig::conversion *as_ever(int from, int to, int32_t colour) {
    return colour == SIMGP_COLOUR_BT601 ? rig::conversion_between(from, to) : nullptr;
}

void reference(const rig::picture &src, const rig::picture &dst, int from, int to, int32_t colour) {
    if (const rig::conversion *kernel = as_ever(from, to, colour))
        return rig::call(kernel->run, src, dst);
    one_rule(src, dst, rig::format_of(from), rig::format_of(to), colour);
}

int32_t convert(const rig::picture &src, int from, const rig::picture &dst, int to,
                int32_t colour) {
    const simgp_img a = src.img(from);
    simgp_img b = dst.img(to);
    for (int k = 0; k < 4; k++)
        b.width[k] = INT32_MIN + k, b.height[k] = INT32_MAX - k;  // not read
    return simgp_csc_any(&a, &b, colour);
}

rig::job make_job(int from, int to, int32_t colour, int w, int h) {
    const rig::format &f = rig::format_of(from), &t = rig::format_of(to);
    rig::job j{rig::shapes_of(from, w, h), rig::shapes_of(to, w, h),
               [=](const rig::picture &src, const rig::picture &dst) {
                   EXPECT_EQ(convert(src, from, dst, to, colour), SIMGP_OK);
               },
               [=](const rig::picture &src, const rig::picture &dst) {
                   reference(src, dst, from, to, colour);
               }};
    // Lines of words advance by whole pixels, but for what linear YUV becomes.
    const auto words = [](const rig::format &rgb) {
        return rgb.pixel_bytes == 2 || rgb.pixel_bytes == 4;
    };
    if (words(f)) j.src[0].stride_unit = f.pixel_bytes;
    if (words(t) && (f.is_rgb() || f.tiled)) j.dst[0].stride_unit = t.pixel_bytes;
    j.holes = t.tiled;
    if (!as_ever(from, to, colour)) return j;
    // The kernels of old leave out chroma at odd sizes, or write a line too many.
    j.holes = true;
    if (from == SIMGP_FMT_YUV420 && to == SIMGP_FMT_YUV422N)
        for (size_t k : {1, 2}) j.dst[k] = rig::samples((w + 1) / 2, (h + 1) / 2 * 2);
    return j;
}

std::string name_of(int from, int to) { return std::to_string(from) + " to " + std::to_string(to); }

// Calls f(from, to) for the pairs that it is meant for.
template <typename F>
void for_pairs(F f) {
    for (const rig::format &from : rig::formats())
        for (const rig::format &to : rig::formats()) f(from, to);
}

// Holds a pair against the reference, with another colour at every size, so that each meets all kinds
// of sizes; SIMGP_COLOUR_BT601 and its flag take turns with the others like any.
void check(const rig::format &from, const rig::format &to, const rig::sweep &sizes) {
    size_t turn = size_t(from.code + to.code);
    rig::check_jobs(name_of(from.code, to.code), sizes, [&](int w, int h) {
        const int32_t colour = colours[turn++ % colours.size()];
        SCOPED_TRACE(colour);
        return make_job(from.code, to.code, colour, w, h);
    });
}

// Sizes
// --------------------------------------------------------------------------

TEST(csc_any, every_pair_at_small_sizes_and_beyond_any_strip) {
    for_pairs([](const rig::format &from, const rig::format &to) {
        check(
            from, to,
            {.max_width = 13,
             .rounds = 6,
             .large = {
                 {33, 3}, {65, 133}, {9, 67}, {130, 3}, {263, 2}, {517, 3}, {1031, 2}, {2050, 3}}});
    });
}

// Each colour at one size, odd both ways, and each of the pairs that have kernels at some more.
TEST(csc_any, every_pair_in_every_colour) {
    for_pairs([](const rig::format &from, const rig::format &to) {
        for (int32_t colour : colours) {
            std::vector<std::pair<int, int>> sizes = {{71, 5}};
            if (as_ever(from.code, to.code, colour))
                sizes = {{1, 1}, {2, 3},  {3, 2},  {6, 5},   {7, 4},
                         {8, 7}, {37, 5}, {66, 9}, {1927, 3}};
            rig::check_jobs(name_of(from.code, to.code) + ", colour " + std::to_string(colour),
                            {.max_width = 0, .large = sizes}, [&](int w, int h) {
                                return make_job(from.code, to.code, colour, w, h);
                            });
        }
    });
}

TEST(csc_any, pairs_in_daily_use_at_every_width) {
    const std::vector<int> video = {SIMGP_FMT_NV12,    SIMGP_FMT_NV21,   SIMGP_FMT_YUV420,
                                    SIMGP_FMT_YUV422N, SIMGP_FMT_YUV444, SIMGP_FMT_YUYV,
                                    SIMGP_FMT_UYVY},
                           screen = {SIMGP_FMT_RGBA8888, SIMGP_FMT_BGRA8888, SIMGP_FMT_RGB888,
                                     SIMGP_FMT_RGB565},
                           coded = {SIMGP_FMT_NV12, SIMGP_FMT_YUV420};
    const auto all = [](const std::vector<int> &from, const std::vector<int> &to) {
        for (int a : from)
            for (int b : to) check(rig::format_of(a), rig::format_of(b), {.max_width = 130});
    };
    all(video, screen);
    all(screen, coded);
    all(screen, screen);
    all({SIMGP_FMT_YUYV, SIMGP_FMT_UYVY, SIMGP_FMT_YUV422N, SIMGP_FMT_YUV444}, coded);
}

// Pictures of more than two tile columns and up to three tile rows, of chroma as well.
TEST(csc_any, tiled_pictures) {
    for_pairs([](const rig::format &from, const rig::format &to) {
        if (!from.tiled && !to.tiled) return;
        check(from, to,
              {.step_x = 3,
               .max_width = 133,
               .max_height = 131,
               .rounds = 2,
               .large = {{1, 65}, {64, 1}, {65, 65}, {130, 65}, {257, 129}, {320, 193}}});
    });
}

TEST(csc_any, strides_of_words_are_rounded_down_to_whole_pixels) {
    constexpr int width = 10, height = 3, middle = 200;
    const struct {
        int from, to, sloppy_src, src, sloppy_dst, dst;
    } cases[] = {
        {SIMGP_FMT_RGB565, SIMGP_FMT_NV12, 21, 20, 13, 13},
        {SIMGP_FMT_BGR565, SIMGP_FMT_YUYV, -21, -22, -23, -23},
        {SIMGP_FMT_BGRA8888, SIMGP_FMT_YUV444, 43, 40, 13, 13},
        {SIMGP_FMT_ARGB8888, SIMGP_FMT_RGB888, -41, -44, 31, 31},
        {SIMGP_FMT_RGB888, SIMGP_FMT_RGBA8888, 31, 31, -41, -44},
        {SIMGP_FMT_BGR565, SIMGP_FMT_BGR565, 23, 22, -23, -24},
        {SIMGP_FMT_T64X32, SIMGP_FMT_BGRA8888, 1, 2, 42, 40},
    };
    rig::rng random(rig::seed());
    bytes in(8192);
    rig::fill_bytes(in.data(), in.size(), rig::content::random, random);
    rig::for_each_target([&](const rig::target_rows &) {
        for (const auto &c : cases) {
            const auto run = [&](int src_stride, int dst_stride) {
                bytes out(6 * middle);
                simgp_img src = {}, dst = {};
                src.format = c.from, dst.format = c.to;
                for (int k = 0; k < 3; k++) {
                    src.plane[k] = in.data() + (src_stride < 0 ? middle : 0);
                    dst.plane[k] = out.data() + 2 * middle * k + middle;
                    src.width[k] = width, src.height[k] = height;
                    src.stride[k] = src_stride;
                    dst.stride[k] = k ? width : dst_stride;
                }
                EXPECT_EQ(simgp_csc_any(&src, &dst, SIMGP_COLOUR_BT2020), SIMGP_OK);
                return out;
            };
            EXPECT_EQ(run(c.sloppy_src, c.sloppy_dst), run(c.src, c.dst))
                << name_of(c.from, c.to) << ", " << c.sloppy_src;
        }
    });
}

TEST(csc_any, empty_pictures_write_nothing) {
    rig::for_each_target([](const rig::target_rows &) {
        for_pairs([](const rig::format &from, const rig::format &to) {
            const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
            rig::picture src(nothing), dst(nothing);
            dst.fill_pattern(3);
            for (auto [w, h] :
                 {std::pair(0, 4), {4, 0}, {-1, 4}, {4, -3}, {0, 0}, {-8, INT32_MIN}}) {
                src.widths[0] = w, src.heights[0] = h;
                // What the planes of chroma say, some kernels have to believe.
                for (int k : {1, 2, 3}) src.widths[k] = src.heights[k] = 0;
                for (int32_t colour : colours)
                    EXPECT_EQ(convert(src, from.code, dst, to.code, colour), SIMGP_OK)
                        << name_of(from.code, to.code) << ", " << w << " x " << h;
            }
            EXPECT_EQ(dst.stray_write(), "") << name_of(from.code, to.code);
        });
    });
}

// Answers
// --------------------------------------------------------------------------

// The planes have no bytes: what is refused touches none, whatever the size; and what is not refused
// has the size 0.
TEST(csc_any, unknown_formats_and_colours_are_refused_before_anything_else) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    const auto answer = [&](int from, int to, int32_t colour, int size) {
        for (int k = 0; k < 4; k++) src.widths[k] = src.heights[k] = size;
        return convert(src, from, dst, to, colour);
    };
    const auto known = [](int code) {
        for (const rig::format &f : rig::formats())
            if (f.code == code) return true;
        return false;
    };
    for (int from : rig::format_codes())
        for (int to : rig::format_codes()) {
            const bool both = known(from) && known(to);
            ASSERT_EQ(answer(from, to, SIMGP_COLOUR_BT709, 0), both ? SIMGP_OK : SIMGP_ERR_PARAM)
                << name_of(from, to);
            if (both) continue;
            ASSERT_EQ(answer(from, to, SIMGP_COLOUR_BT709, 64), SIMGP_ERR_PARAM) << from << to;
        }

    std::vector<int32_t> codes = {INT32_MIN, INT32_MAX, -SIMGP_CHROMA_MEAN};
    for (int code = -3; code < 1100; code++) codes.push_back(code);
    for (int bit = 0; bit < 32; bit++)
        for (int32_t colour : colours) codes.push_back(int32_t(uint32_t(colour) ^ 1u << bit));
    const std::pair<int, int> pairs[] = {
        {SIMGP_FMT_NV12, SIMGP_FMT_RGBA8888}, {SIMGP_FMT_YUV420, SIMGP_FMT_RGB565},
        {SIMGP_FMT_RGB888, SIMGP_FMT_YUV420}, {SIMGP_FMT_NV12, SIMGP_FMT_NV12},
        {SIMGP_FMT_YUV400, SIMGP_FMT_YUYV},   {SIMGP_FMT_RGB888, SIMGP_FMT_BGR565},
        {SIMGP_FMT_T64X32, SIMGP_FMT_YUV420}};
    for (int32_t colour : codes)
        for (const auto &[from, to] : pairs) {
            const bool is_one = std::count(colours.begin(), colours.end(), colour);
            ASSERT_EQ(answer(from, to, colour, 0), is_one ? SIMGP_OK : SIMGP_ERR_PARAM)
                << "colour " << colour;
            if (is_one) continue;
            ASSERT_EQ(answer(from, to, colour, 64), SIMGP_ERR_PARAM) << "colour " << colour;
        }
    EXPECT_EQ(dst.stray_write(), "");
}

// Computed by hand
// --------------------------------------------------------------------------

// A picture of packed planes, which lie one after the other.
bytes converted(int from, bytes in, int to, int32_t colour, int width, int height) {
    rig::picture src(rig::shapes_of(from, width, height)), dst(rig::shapes_of(to, width, height));
    size_t at = 0;
    for (const rig::plane &p : src.parts)
        for (ptrdiff_t y = 0; y < p.shape().rows; y++, at += size_t(p.shape().row_bytes))
            memcpy(p.row(y), in.data() + at, size_t(p.shape().row_bytes));
    EXPECT_EQ(at, in.size());
    EXPECT_EQ(convert(src, from, dst, to, colour), SIMGP_OK);
    bytes out;
    for (const rig::plane &p : dst.parts)
        for (ptrdiff_t y = 0; y < p.shape().rows; y++)
            out.insert(out.end(), p.row(y), p.row(y) + p.shape().row_bytes);
    return out;
}

TEST(csc_any, pure_colours) {
    const auto to_yuv = [](int32_t colour, uint8_t r, uint8_t g, uint8_t b) {
        return converted(SIMGP_FMT_RGB888, {r, g, b}, SIMGP_FMT_YUV444, colour, 1, 1);
    };
    const auto to_rgb = [](int32_t colour, uint8_t y, uint8_t u, uint8_t v) {
        return converted(SIMGP_FMT_YUV444, {y, u, v}, SIMGP_FMT_RGB888, colour, 1, 1);
    };
    rig::for_each_target([&](const rig::target_rows &) {
        // 47 * 255 / 256 = 46.8, -26 * 255 / 256 = -25.9, 112 * 255 / 256 = 111.6
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT709, 255, 0, 0), (bytes{62, 102, 240}));
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT709, 0, 255, 0), (bytes{172, 42, 26}));
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT709, 0, 0, 255), (bytes{31, 240, 118}));
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT709, 255, 255, 255), (bytes{235, 128, 128}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT709, 63, 102, 240), (bytes{255, 1, 0}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT709, 173, 42, 26), (bytes{0, 255, 1}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT709, 32, 240, 118), (bytes{1, 0, 255}));

        // 128 * 255 / 256 = 127.5, which is 128 and then 256, beyond a byte
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT601_FULL, 255, 0, 0), (bytes{76, 85, 255}));
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT601_FULL, 0, 255, 0), (bytes{149, 43, 21}));
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT601_FULL, 0, 0, 255), (bytes{28, 255, 107}));
        EXPECT_EQ(to_yuv(SIMGP_COLOUR_BT601_FULL, 255, 255, 255), (bytes{255, 128, 128}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT601_FULL, 76, 85, 255), (bytes{254, 0, 0}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT601_FULL, 149, 43, 21), (bytes{0, 255, 0}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT601_FULL, 28, 255, 107), (bytes{0, 0, 253}));
        EXPECT_EQ(to_rgb(SIMGP_COLOUR_BT601_FULL, 0, 128, 128), (bytes{0, 0, 0}));
    });
}

// Grey has no hue, in any matrix, and in full range no other value.
TEST(csc_any, grey_stays_grey) {
    constexpr int size = 256;
    for (const matrix &m : matrices)
        rig::for_each_target([&](const rig::target_rows &) {
            SCOPED_TRACE(m.name);
            bytes greys, expected;
            for (int g = 0; g < size; g++) greys.insert(greys.end(), 3, uint8_t(g));
            const bytes planes =
                converted(SIMGP_FMT_RGB888, greys, SIMGP_FMT_YUV444, m.code, size, 1);
            EXPECT_EQ(bytes(planes.begin() + size, planes.end()), bytes(2 * size, 128));
            const bytes luma(planes.begin(), planes.begin() + size);
            EXPECT_EQ(luma[0], m.full ? 0 : 16);
            EXPECT_EQ(luma[255], m.full ? 255 : 235);
            EXPECT_EQ(converted(SIMGP_FMT_RGB888, greys, SIMGP_FMT_YUV400, m.code, size, 1), luma);
            const bytes back = converted(SIMGP_FMT_YUV400, luma, SIMGP_FMT_RGB888, m.code, size, 1);
            EXPECT_EQ(converted(SIMGP_FMT_YUV444, planes, SIMGP_FMT_RGB888, m.code, size, 1), back);
            EXPECT_TRUE(!m.full || back == greys);
            for (size_t i = 0; i < back.size(); i++) {
                EXPECT_EQ(back[i], back[i / 3 * 3]);
                EXPECT_LE(std::abs(back[i] - greys[i]), 2);
            }
        });
}

TEST(csc_any, chroma_is_chosen_repeated_and_averaged) {
    const int32_t first = SIMGP_COLOUR_BT601_FULL, mean = first | SIMGP_CHROMA_MEAN;
    rig::for_each_target([&](const rig::target_rows &) {
        // 3 x 3 samples of U, and the same of V from bottom to top.
        bytes full(9, 50), half(9, 50);
        for (const int c : {10, 20, 31, 40, 51, 60, 70, 80, 91, 70, 80, 91, 40, 51, 60, 10, 20, 31})
            full.push_back(uint8_t(c));
        half.insert(half.end(), {10, 31, 70, 91, 70, 91, 10, 31});
        EXPECT_EQ(converted(SIMGP_FMT_YUV444, full, SIMGP_FMT_YUV420, first, 3, 3), half);
        bytes of_means(9, 50);  // 121 / 4, 91 / 2, 150 / 2, 91; 241 / 4, 151 / 2, 30 / 2, 31
        of_means.insert(of_means.end(), {30, 46, 75, 91, 60, 76, 15, 31});
        EXPECT_EQ(converted(SIMGP_FMT_YUV444, full, SIMGP_FMT_YUV420, mean, 3, 3), of_means);
        const bytes packed = {50, 10, 50, 70, 50, 31};  // the first line; no V at its end
        bytes lines = converted(SIMGP_FMT_YUV444, full, SIMGP_FMT_YUYV, first, 3, 3);
        EXPECT_EQ(bytes(lines.begin(), lines.begin() + 6), packed);
        // which is then that of the pair before
        EXPECT_EQ(converted(SIMGP_FMT_YUYV, packed, SIMGP_FMT_YUV444, first, 3, 1),
                  (bytes{50, 50, 50, 10, 10, 31, 70, 70, 70}));
        EXPECT_EQ(converted(SIMGP_FMT_UYVY, {9, 50}, SIMGP_FMT_NV21, first, 1, 1),
                  (bytes{50, 128, 9}));

        // Means of R, G and B: 255 / 4 = 63.75, 2 / 4, 255. The mean of samples would be another.
        const bytes corner = {255, 0, 255, 0, 0, 255, 0, 1, 255, 0, 1, 255};
        EXPECT_EQ(
            converted(SIMGP_FMT_RGB888, corner, SIMGP_FMT_NV12, mean, 2, 2),
            // (-43 * 64 - 85 + 128 * 255 + 128) / 256 + 128, (128 * 64 - 107 - 21 * 255 + 128)
            (bytes{105, 28, 29, 29, 244, 139}));
    });
}

TEST(csc_any, alpha_and_low_bits) {
    const auto convert_one = [](int from, const bytes &in, int to) {
        return converted(from, in, to, SIMGP_COLOUR_BT709, 1, 1);
    };
    rig::for_each_target([&](const rig::target_rows &) {
        EXPECT_EQ(convert_one(SIMGP_FMT_RGBA8888, {1, 2, 3, 4}, SIMGP_FMT_ARGB8888),
                  (bytes{4, 1, 2, 3}));
        EXPECT_EQ(convert_one(SIMGP_FMT_ARGB8888, {4, 1, 2, 3}, SIMGP_FMT_BGRA8888),
                  (bytes{3, 2, 1, 4}));
        EXPECT_EQ(convert_one(SIMGP_FMT_BGRA8888, {3, 2, 1, 0}, SIMGP_FMT_BGRA8888),
                  (bytes{3, 2, 1, 0}));
        EXPECT_EQ(convert_one(SIMGP_FMT_BGR888, {3, 2, 1}, SIMGP_FMT_RGBA8888),
                  (bytes{1, 2, 3, 255}));
        EXPECT_EQ(convert_one(SIMGP_FMT_RGB565, {0xFF, 0xFF}, SIMGP_FMT_RGBA8888),
                  (bytes{248, 252, 248, 255}));
        EXPECT_EQ(convert_one(SIMGP_FMT_RGB565, {0x1F, 0xF0}, SIMGP_FMT_BGR565),
                  (bytes{0x1E, 0xF8}));
        EXPECT_EQ(convert_one(SIMGP_FMT_BGRA8888, {255, 7, 8, 0}, SIMGP_FMT_BGR565),
                  (bytes{0x21, 0xF8}));
    });
}

// All colours
// --------------------------------------------------------------------------

// Reports the first pixel that a target computes otherwise than the reference.
void same_on_every_target(const rig::picture &src, int from, int to, const matrix &m) {
    const auto shapes = rig::shapes_of(to, src.widths[0], src.heights[0]);
    rig::picture expected(shapes), got(shapes);
    // Not the exceptions: at even sizes, the pairs that are used here have none.
    one_rule(src, expected, rig::format_of(from), rig::format_of(to), m.code);
    unsigned salt = 0;
    rig::for_each_target([&](const rig::target_rows &) {
        got.fill_pattern(salt++);  // not the result of the target before
        EXPECT_EQ(convert(src, from, got, to, m.code), SIMGP_OK);
        EXPECT_EQ(rig::difference(expected, got), "") << name_of(from, to) << ", " << m.name;
    });
}
const int step = rig::quick() ? 51 : 1;

// Each pair of U and V at one place, where it meets all Y, picture by picture.
TEST(csc_any, DISABLED_every_colour_to_rgb) {
    for (auto [from_code, to] : {std::pair(SIMGP_FMT_YUV444, SIMGP_FMT_RGBA8888),
                                 {SIMGP_FMT_NV12, SIMGP_FMT_BGR888},
                                 {SIMGP_FMT_UYVY, SIMGP_FMT_RGB565}}) {
        const rig::format &from = rig::format_of(from_code);
        const int across = from.at(channel::u).across, down = from.at(channel::u).down;
        rig::picture src(rig::shapes_of(from_code, 256 * across, (255 / step + 1) * down));
        for (int first = 0; first < 256 && !HasFailure(); first += across * down) {
            for (int y = 0; y < src.heights[0]; y++)
                for (int x = 0; x < src.widths[0]; x++) {
                    const int u = x / across, v = y / down * step;
                    const int luma = first + x % across + y % down * across + 37 * u + 11 * v;
                    *sample(src, from, channel::y, x, y) = uint8_t(luma);
                    *sample(src, from, channel::u, x, y) = uint8_t(u);
                    *sample(src, from, channel::v, x, y) = uint8_t(v);
                }
            for (const matrix &m : matrices) same_on_every_target(src, from_code, to, m);
        }
    }
}

// Of each red, every colour stands where it gives chroma.
TEST(csc_any, DISABLED_every_colour_to_yuv) {
    for (auto [from_code, to] : {std::pair(SIMGP_FMT_RGBA8888, SIMGP_FMT_YUV444),
                                 {SIMGP_FMT_BGRA8888, SIMGP_FMT_NV12},
                                 {SIMGP_FMT_RGB888, SIMGP_FMT_YUYV}}) {
        const rig::format &from = rig::format_of(from_code);
        const rig::channel_place &place = rig::format_of(to).at(channel::u);
        rig::picture src(rig::shapes_of(from_code, 256 * place.across, 256 * place.down));
        for (int r = 0; r < 256 && !HasFailure(); r += step) {
            for (int y = 0; y < src.heights[0]; y++)
                for (int x = 0; x < src.widths[0]; x++) {
                    const int b = x / place.across;
                    const bool gives = x % place.across == 0 && y % place.down == 0;
                    put_rgb(from, {r, y / place.down, gives ? b : 255 - b}, pixel(src, from, x, y),
                            uint8_t(7 * x + y));
                }
            for (const matrix &m : matrices) same_on_every_target(src, from_code, to, m);
        }
    }
}

// How far the integers are from the real numbers that they stand for.
TEST(csc_any, DISABLED_distance_from_the_real_matrices) {
    for (const matrix &m : matrices) {
        const double green = 1 - m.red - m.blue;
        const double y_scale = m.full ? 1 : 219 / 255.0, y_zero = m.full ? 0 : 16;
        const double c_scale = m.full ? 1 : 224 / 255.0;
        double most_to_rgb = 0, most_to_y = 0, most_to_chroma = 0;
        const auto note = [](double &most, double real, int got) {
            const double limited = real < 0 ? 0 : real > 255 ? 255 : real;
            most = std::max(most, std::abs(limited - got));
        };
        for (int i = 0; i < 256; i += step)
            for (int j = 0; j < 256; j += rig::quick() ? 5 : 1)
                for (int k = 0; k < 256; k++) {
                    const rgb c = m.to_rgb({k, i, j});
                    const double y = (k - y_zero) / y_scale, u = (i - 128) / c_scale,
                                 v = (j - 128) / c_scale;
                    const double r = y + 2 * (1 - m.red) * v, b = y + 2 * (1 - m.blue) * u;
                    note(most_to_rgb, r, c.r);
                    note(most_to_rgb, (y - m.red * r - m.blue * b) / green, c.g);
                    note(most_to_rgb, b, c.b);

                    const yuv p = m.to_yuv({i, j, k});
                    const double luma = m.red * i + green * j + m.blue * k;
                    note(most_to_y, y_zero + y_scale * luma, p.y);
                    note(most_to_chroma, 128 + c_scale * (k - luma) / (2 * (1 - m.blue)), p.u);
                    note(most_to_chroma, 128 + c_scale * (i - luma) / (2 * (1 - m.red)), p.v);
                }
        printf("%-12s largest distance: R, G, B %.3f; Y %.3f; U, V %.3f\n", m.name, most_to_rgb,
               most_to_y, most_to_chroma);
        EXPECT_LT(most_to_rgb, 1) << m.name;
        EXPECT_LT(most_to_y, 2) << m.name;
        EXPECT_LT(most_to_chroma, 2) << m.name;
    }
}

}  // namespace
