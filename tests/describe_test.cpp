// Descriptors without arithmetic by hand (simgp/describe.h), against the rig's own numbers.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/rig.h"

namespace {

using bytes = std::vector<uint8_t>;

const rig::size sizes[] = {{1, 1},    {2, 2},    {1, 2},    {5, 3},   {6, 4},
                           {64, 32},  {65, 33},  {127, 7},  {128, 1}, {129, 65},
                           {258, 64}, {300, 97}, {63, 129}, {66, 200}};

simgp_img described(int32_t format, int32_t width, int32_t height, const bytes &memory,
                    int32_t alignment = 1) {
    simgp_img img;
    const char *why = "";
    EXPECT_EQ(
        simgp_describe(&img, format, width, height, alignment, memory.data(), memory.size(), &why),
        SIMGP_OK)
        << why;
    return img;
}

size_t packed_bytes(int32_t format, int32_t width, int32_t height) {
    simgp_layout layout{};
    EXPECT_EQ(simgp_lay_out(&layout, format, width, height, 1, nullptr), SIMGP_OK);
    return layout.bytes;
}

TEST(describe, planes_are_those_of_the_rig) {
    for (const rig::format &f : rig::formats())
        for (const rig::size &s : sizes) {
            SCOPED_TRACE(testing::Message() << f.code << ", " << s.width << " x " << s.height);
            const auto shapes = rig::shapes_of(f.code, s.width, s.height);
            ASSERT_EQ(simgp_format_planes(f.code), int(shapes.size()));
            for (int k = 0; k < int(shapes.size()); k++) {
                const rig::plane_shape &shape = shapes[size_t(k)];
                if (f.tiled) {
                    EXPECT_EQ(simgp_plane_bytes(f.code, k, s.width, s.height, 0), shape.row_bytes);
                    continue;
                }
                EXPECT_EQ(simgp_plane_width(f.code, k, s.width), shape.width);
                EXPECT_EQ(simgp_plane_height(f.code, k, s.height), shape.height);
                EXPECT_EQ(simgp_plane_sample(f.code, k), shape.sample_bytes);
                EXPECT_EQ(simgp_line_bytes(f.code, k, s.width), shape.row_bytes);
                for (const int32_t stride : {1000, -1000})
                    EXPECT_EQ(simgp_plane_bytes(f.code, k, s.width, s.height, stride),
                              1000 * shape.rows);
            }
        }
}

TEST(describe, other_planes_and_formats_have_nothing) {
    for (const int32_t format : {int32_t{SIMGP_FMT_NV12}, int32_t{SIMGP_FMT_YUV420}, 9, 503, -1})
        for (const int32_t plane : {-1, simgp_format_planes(format), 3, INT32_MAX}) {
            EXPECT_EQ(simgp_plane_sample(format, plane), 0);
            EXPECT_EQ(simgp_plane_width(format, plane, 10), 0);
            EXPECT_EQ(simgp_plane_height(format, plane, 10), 0);
            EXPECT_EQ(simgp_plane_bytes(format, plane, 10, 10, 10), 0);
        }
    // The largest sizes need no more than 32 bits for samples, and no more than 64 for bytes.
    EXPECT_EQ(simgp_plane_width(SIMGP_FMT_NV12, 1, INT32_MAX), 1 << 30);
    EXPECT_EQ(simgp_line_bytes(SIMGP_FMT_RGBA8888, 0, INT32_MAX), int64_t{4} * INT32_MAX);
    EXPECT_EQ(simgp_plane_bytes(SIMGP_FMT_YUV400, 0, 1, INT32_MAX, INT32_MIN),
              (int64_t{1} << 31) * INT32_MAX);
    EXPECT_EQ(simgp_plane_width(SIMGP_FMT_NV12, 0, 0), 0);
    EXPECT_EQ(simgp_plane_height(SIMGP_FMT_NV12, 1, INT32_MIN), 0);
}

TEST(describe, layouts_by_hand) {
    simgp_layout layout;
    ASSERT_EQ(simgp_lay_out(&layout, SIMGP_FMT_NV12, 5, 3, 1, nullptr), SIMGP_OK);
    EXPECT_EQ(layout.planes, 2);
    EXPECT_EQ(layout.stride[0], 5);
    EXPECT_EQ(layout.stride[1], 6);
    EXPECT_EQ(layout.offset[1], 15u);
    EXPECT_EQ(layout.bytes, 27u);
    ASSERT_EQ(simgp_lay_out(&layout, SIMGP_FMT_YUV422W, 17, 5, 16, nullptr), SIMGP_OK);
    EXPECT_EQ(layout.stride[1], 32);
    EXPECT_EQ(layout.offset[1], 160u);
    EXPECT_EQ(layout.offset[2], 256u);
    EXPECT_EQ(layout.bytes, 352u);
    // 3 rows of 2 tiles: a pair of rows in one group, and a single one in another; of chroma, two
    // rows.
    ASSERT_EQ(simgp_lay_out(&layout, SIMGP_FMT_T64X32, 100, 96, 4096, nullptr), SIMGP_OK);
    EXPECT_EQ(layout.stride[0], 0);
    EXPECT_EQ(layout.offset[1], 16384u);
    EXPECT_EQ(layout.bytes, 24576u);
}

// Planes of every format are where the layout says, and apart.
TEST(describe, planes_in_one_piece_of_memory) {
    for (const rig::format &f : rig::formats())
        for (const rig::size &s : sizes)
            for (const int32_t alignment : {1, 2, 32, 4096}) {
                SCOPED_TRACE(testing::Message() << f.code << ", " << s.width << " x " << s.height
                                                << " at " << alignment);
                simgp_layout layout;
                ASSERT_EQ(simgp_lay_out(&layout, f.code, s.width, s.height, alignment, nullptr),
                          SIMGP_OK);
                const bytes memory(layout.bytes);
                const simgp_img img = described(f.code, s.width, s.height, memory, alignment);
                EXPECT_EQ(img.format, f.code);
                const auto shapes = rig::shapes_of(f.code, s.width, s.height);
                size_t free = 0;
                for (size_t k = 0; k < shapes.size(); k++) {
                    const size_t at = size_t(img.plane[k] - memory.data());
                    EXPECT_EQ(at % size_t(alignment), 0u);
                    EXPECT_GE(at, free);
                    EXPECT_LT(at, free + size_t(alignment));
                    if (!f.tiled) {
                        EXPECT_EQ(img.width[k], shapes[k].width);
                        EXPECT_EQ(img.height[k], shapes[k].height);
                        EXPECT_EQ(img.stride[k] % alignment, 0);
                        EXPECT_GE(img.stride[k], shapes[k].row_bytes);
                        EXPECT_LT(img.stride[k], shapes[k].row_bytes + alignment);
                    }
                    free =
                        at + size_t(f.tiled ? shapes[k].row_bytes : img.stride[k] * shapes[k].rows);
                }
                EXPECT_EQ(free, layout.bytes);
                // A byte less is too little, and nothing is filled in then.
                simgp_img other = img;
                other.reserved0[0] = 7;
                EXPECT_EQ(simgp_describe(&other, f.code, s.width, s.height, alignment,
                                         memory.data(), memory.size() - 1, nullptr),
                          SIMGP_ERR_PARAM);
                EXPECT_EQ(other.reserved0[0], 7u);
            }
}

// Refused, for this reason and with this result.
#define EXPECT_REFUSED(text, call)        \
    do {                                  \
        const char *why = "nothing said"; \
        EXPECT_EQ(call, SIMGP_ERR_PARAM); \
        EXPECT_STREQ(why, text);          \
    } while (0)

TEST(describe, layouts_that_are_refused) {
    simgp_layout l{};
    l.bytes = 99;
    EXPECT_REFUSED("unknown format", simgp_lay_out(&l, 9, 8, 8, 1, &why));
    EXPECT_REFUSED("width below 1", simgp_lay_out(&l, SIMGP_FMT_NV12, 0, 8, 1, &why));
    EXPECT_REFUSED("height below 1", simgp_lay_out(&l, SIMGP_FMT_NV12, 8, -1, 1, &why));
    for (const int32_t alignment : {0, -1, 3, 48, 8192, INT32_MIN})
        EXPECT_REFUSED("alignment is no power of two from 1 to 4096",
                       simgp_lay_out(&l, SIMGP_FMT_NV12, 8, 8, alignment, &why));
    EXPECT_REFUSED("lines are too long",
                   simgp_lay_out(&l, SIMGP_FMT_RGBA8888, 1 << 29, 1, 1, &why));
    EXPECT_REFUSED("lines are too long",
                   simgp_lay_out(&l, SIMGP_FMT_YUV400, INT32_MAX - 1, 1, 64, &why));
    if (sizeof(void *) == 4)
        EXPECT_REFUSED("the picture is larger than memory can be",
                       simgp_lay_out(&l, SIMGP_FMT_YUV444, 1 << 15, 1 << 15, 1, &why));
    else
        EXPECT_REFUSED("the picture is larger than memory can be",
                       simgp_lay_out(&l, SIMGP_FMT_YUV444, INT32_MAX, INT32_MAX, 1, &why));
    EXPECT_EQ(l.bytes, 99u);

    simgp_img img;
    uint8_t memory[64] = {};
    EXPECT_REFUSED("memory is NULL",
                   simgp_describe(&img, SIMGP_FMT_NV12, 2, 2, 1, nullptr, 64, &why));
    EXPECT_REFUSED("memory is too small for the picture",
                   simgp_describe(&img, SIMGP_FMT_NV12, 2, 2, 1, memory, 5, &why));
}

TEST(describe, planes_that_are_refused) {
    uint8_t p[64] = {};
    simgp_img img;
    const auto planes = [&](int32_t format, int32_t w, int32_t h, const void *p0, int32_t s0,
                            const void *p1, int32_t s1, const void *p2, int32_t s2,
                            const char **why) {
        return simgp_describe_planes(&img, format, w, h, p0, s0, p1, s1, p2, s2, why);
    };
    const int32_t i420 = SIMGP_FMT_YUV420;
    EXPECT_REFUSED("unknown format", planes(503, 5, 3, p, 5, p, 3, p, 3, &why));
    EXPECT_REFUSED("width below 1", planes(i420, 0, 3, p, 5, p, 3, p, 3, &why));
    EXPECT_REFUSED("height below 1", planes(i420, 5, 0, p, 5, p, 3, p, 3, &why));
    EXPECT_REFUSED("plane 0 is NULL", planes(i420, 5, 3, nullptr, 5, p, 3, p, 3, &why));
    EXPECT_REFUSED("plane 1 is NULL", planes(i420, 5, 3, p, 5, nullptr, 3, p, 3, &why));
    EXPECT_REFUSED("plane 2 is NULL", planes(i420, 5, 3, p, 5, p, 3, nullptr, 3, &why));
    EXPECT_REFUSED("stride of plane 0 is shorter than a line",
                   planes(i420, 5, 3, p, 4, p, 3, p, 3, &why));
    EXPECT_REFUSED("stride of plane 1 is shorter than a line",
                   planes(i420, 5, 3, p, -5, p, 2, p, 3, &why));
    EXPECT_REFUSED("stride of plane 2 is shorter than a line",
                   planes(i420, 5, 3, p, 5, p, 3, p, -2, &why));
    // Taken: bottom-up, one line with any stride, planes that the format has not, tiles.
    EXPECT_EQ(planes(i420, 5, 3, p, -5, p, -3, p, INT32_MIN, nullptr), SIMGP_OK);
    EXPECT_EQ(planes(i420, 5, 2, p, 5, p, 0, p, 1, nullptr), SIMGP_OK);
    EXPECT_EQ(planes(SIMGP_FMT_RGB565, 5, 2, p, 10, nullptr, 0, nullptr, 0, nullptr), SIMGP_OK);
    EXPECT_EQ(planes(SIMGP_FMT_T64X32, 5, 2, p, 0, p, 0, nullptr, 0, nullptr), SIMGP_OK);
    EXPECT_EQ(planes(SIMGP_FMT_T64X32, 5, 1, p, 0, nullptr, 0, nullptr, 0, nullptr), SIMGP_OK);

    EXPECT_REFUSED("no descriptor", simgp_check(nullptr, &why));
    ASSERT_EQ(planes(i420, 5, 3, p, 5, p, 3, p, 3, nullptr), SIMGP_OK);
    img.width[1] = 2;
    EXPECT_REFUSED("plane 1 has not the size that its format gives it", simgp_check(&img, &why));
    img.width[1] = 3;
    img.height[2] = 1;
    EXPECT_REFUSED("plane 2 has not the size that its format gives it", simgp_check(&img, &why));
}

TEST(describe, memory_that_is_too_small) {
    uint8_t m[128] = {};
    simgp_img img;
    // NV12 of 5 x 3, with gaps of one byte: luma in 6 lines of 6 less one; chroma of 2 x 7 less one.
    ASSERT_EQ(simgp_describe_planes(&img, SIMGP_FMT_NV12, 5, 3, m + 10, 6, m + 27, 7, nullptr, 0,
                                    nullptr),
              SIMGP_OK);
    EXPECT_EQ(simgp_check_memory(&img, m + 10, 30, nullptr), SIMGP_OK);
    EXPECT_REFUSED("memory is too small for plane 1", simgp_check_memory(&img, m + 10, 29, &why));
    EXPECT_REFUSED("memory is too small for plane 0", simgp_check_memory(&img, m + 11, 40, &why));
    EXPECT_REFUSED("memory is too small for plane 0", simgp_check_memory(&img, m + 10, 16, &why));
    // From bottom to top: the same bytes.
    img.plane[0] += 12, img.stride[0] = -6;
    img.plane[1] += 7, img.stride[1] = -7;
    EXPECT_EQ(simgp_check_memory(&img, m + 10, 30, nullptr), SIMGP_OK);
    EXPECT_REFUSED("memory is too small for plane 0", simgp_check_memory(&img, m + 11, 40, &why));
    EXPECT_REFUSED("memory is too small for plane 1", simgp_check_memory(&img, m + 10, 29, &why));
    img.plane[0] = nullptr;
    EXPECT_REFUSED("plane 0 is NULL", simgp_check_memory(&img, m, 128, &why));

    const bytes tiles(packed_bytes(SIMGP_FMT_T64X32, 3, 1));
    const simgp_img tiled = described(SIMGP_FMT_T64X32, 3, 1, tiles);
    EXPECT_EQ(tiles.size(), 8192u);
    EXPECT_EQ(simgp_check_memory(&tiled, tiles.data(), 8192, nullptr), SIMGP_OK);
    EXPECT_REFUSED("memory is too small for plane 0",
                   simgp_check_memory(&tiled, tiles.data(), 8191, &why));
}

// Chroma as Android's cameras give it, in the three ways that it can lie, means the same.
TEST(describe, chroma_with_a_distance_between_its_samples) {
    constexpr int32_t w = 7, h = 5, cw = 4, ch = 3, stride = 10;
    rig::rng random(rig::seed());
    bytes y(w * h), u(cw * ch), v(cw * ch), uv(stride * ch), vu(stride * ch);
    rig::fill_bytes(y.data(), y.size(), rig::content::random, random);
    rig::fill_bytes(u.data(), u.size(), rig::content::random, random);
    rig::fill_bytes(v.data(), v.size(), rig::content::random, random);
    for (int row = 0; row < ch; row++)
        for (int x = 0; x < cw; x++) {
            uv[size_t(row * stride + 2 * x)] = vu[size_t(row * stride + 2 * x + 1)] =
                u[size_t(row * cw + x)];
            uv[size_t(row * stride + 2 * x + 1)] = vu[size_t(row * stride + 2 * x)] =
                v[size_t(row * cw + x)];
        }
    const auto shown = [&](int32_t format, const uint8_t *at_u, const uint8_t *at_v, int32_t step,
                           int32_t distance) {
        simgp_img src;
        const char *why = "";
        EXPECT_EQ(simgp_describe_yuv_420_888(&src, w, h, y.data(), w, at_u, step, at_v, step,
                                             distance, &why),
                  SIMGP_OK)
            << why;
        EXPECT_EQ(src.format, format);
        bytes pixels(3 * w * h);
        const simgp_img dst = described(SIMGP_FMT_RGB888, w, h, pixels);
        EXPECT_EQ(simgp_csc_any(&src, &dst, SIMGP_COLOUR_BT601_FULL), SIMGP_OK);
        return pixels;
    };
    const bytes planar = shown(SIMGP_FMT_YUV420, u.data(), v.data(), cw, 1);
    EXPECT_EQ(shown(SIMGP_FMT_NV12, uv.data(), uv.data() + 1, stride, 2), planar);
    EXPECT_EQ(shown(SIMGP_FMT_NV21, vu.data() + 1, vu.data(), stride, 2), planar);

    simgp_img img;
    const uint8_t *const p = uv.data(), *const none = nullptr;
    const auto refused = [&](const uint8_t *at_u, int32_t su, const uint8_t *at_v, int32_t sv,
                             int32_t distance, const char **why) {
        return simgp_describe_yuv_420_888(&img, w, h, y.data(), w, at_u, su, at_v, sv, distance,
                                          why);
    };
    EXPECT_REFUSED("pixel stride of chroma is neither 1 nor 2",
                   refused(p, stride, p + 1, stride, 3, &why));
    EXPECT_REFUSED("U and V do not lie one byte apart", refused(p, stride, p + 2, stride, 2, &why));
    EXPECT_REFUSED("U and V do not lie one byte apart", refused(p, stride, p, stride, 2, &why));
    EXPECT_REFUSED("strides of U and V differ", refused(p, stride, p + 1, 9, 2, &why));
    EXPECT_REFUSED("plane 1 is NULL", refused(none, stride, p, stride, 2, &why));
    EXPECT_REFUSED("plane 2 is NULL", refused(p, stride, none, stride, 2, &why));
    EXPECT_REFUSED("stride of plane 1 is shorter than a line", refused(p, 7, p + 1, 7, 2, &why));
}

TEST(describe, rows_are_shared_without_a_rest) {
    uint8_t byte = 0;
    for (const int32_t format : {SIMGP_FMT_YUV422N, SIMGP_FMT_NV12, SIMGP_FMT_T64X32}) {
        const int32_t step = simgp_band_step(format);
        EXPECT_EQ(step, format == SIMGP_FMT_YUV422N ? 1 : format == SIMGP_FMT_NV12 ? 2 : 128);
        for (int32_t height = 1; height < 900; height += height < 20 ? 1 : 7)
            for (int32_t parts = 1; parts < 7; parts++) {
                SCOPED_TRACE(testing::Message() << format << ", " << height << " in " << parts);
                simgp_img img, band;
                ASSERT_EQ(simgp_describe_planes(&img, format, 1, height, &byte, 2, &byte, 2, &byte,
                                                2, nullptr),
                          SIMGP_OK);
                int32_t next = 0;
                for (int32_t part = 0; part < parts; part++) {
                    int32_t first = -1, rows = -1;
                    simgp_share_rows(height, step, parts, part, &first, &rows);
                    if (rows == 0) continue;
                    ASSERT_EQ(first, next);
                    // Each gets as many whole steps as the others or one more; a rest may come.
                    ASSERT_LE(rows, (height / step / parts + 1) * step + 1);
                    const char *why = "";
                    ASSERT_EQ(simgp_band(&img, first, rows, &band, &why), SIMGP_OK) << why;
                    ASSERT_EQ(band.height[0], rows);
                    next += rows;
                }
                ASSERT_EQ(next, height);
            }
    }
    EXPECT_EQ(simgp_band_step(9), 0);
    int32_t first, rows;
    simgp_share_rows(INT32_MAX, 2, 4096, 4095, &first, &rows);
    EXPECT_EQ(int64_t{first} + rows, INT32_MAX);
}

TEST(describe, bands_that_are_refused) {
    const bytes memory(1 << 16);
    const simgp_img nv12 = described(SIMGP_FMT_NV12, 5, 9, memory),
                    tiles = described(SIMGP_FMT_T64X32, 5, 257, memory);
    simgp_img band = {};
    band.format = 77;
    const auto refused = [&](const simgp_img &img, int32_t first, int32_t rows, const char **why) {
        return simgp_band(&img, first, rows, &band, why);
    };
    for (const auto &[first, rows] : {std::pair{-2, 2},
                                      {0, 10},
                                      {0, 0},
                                      {0, -2},
                                      {10, 2},
                                      {8, 2},
                                      {INT32_MAX - 1, 2},
                                      {2, INT32_MAX}})
        EXPECT_REFUSED("the picture has no such rows", refused(nv12, first, rows, &why));
    const char *const multiples = "rows of a band are multiples of simgp_band_step";
    EXPECT_REFUSED(multiples, refused(nv12, 1, 2, &why));
    EXPECT_REFUSED(multiples, refused(nv12, 2, 3, &why));
    EXPECT_REFUSED(multiples, refused(tiles, 64, 128, &why));
    EXPECT_REFUSED(multiples, refused(tiles, 0, 64, &why));
    EXPECT_REFUSED("a last row of tiles alone is no band", refused(tiles, 256, 1, &why));
    simgp_img broken = nv12;
    broken.plane[1] = nullptr;
    EXPECT_REFUSED("plane 1 is NULL", refused(broken, 0, 2, &why));
    EXPECT_EQ(band.format, 77);
}

// Every conversion done in bands gives the bytes of the whole one, forwards and bottom-up.
TEST(describe, bands_joined_are_the_picture) {
    rig::rng random(rig::seed());
    const std::vector<rig::size> pictures =
        rig::quick() ? std::vector<rig::size>{{67, 259}}
                     : std::vector<rig::size>{{67, 259}, {130, 386}, {64, 257}};
    // At odd heights these kernels take another line of chroma, or write one more.
    const auto walks_otherwise = [](int from, int to) {
        if (from == SIMGP_FMT_YUV420 && to == SIMGP_FMT_YUV422N) return true;
        return std::any_of(
            std::begin(rig::conversions), std::end(rig::conversions), [=](const auto &c) {
                return c.from == from && c.to == to && c.but == rig::exception::first_line_alone;
            });
    };
    // From bottom to top, where there are lines.
    const auto upside_down = [](simgp_img img) {
        for (int k = 0; k < simgp_format_planes(img.format); k++) {
            img.plane[k] += ptrdiff_t(img.height[k] - 1) * img.stride[k];
            img.stride[k] = -img.stride[k];
        }
        return img;
    };
    for (const rig::size &s : pictures)
        for (const rig::format &from : rig::formats())
            for (const rig::format &to : rig::formats())
                for (const int32_t colour : {0, SIMGP_COLOUR_BT709 + SIMGP_CHROMA_MEAN}) {
                    if (colour == 0 && s.height % 2 && walks_otherwise(from.code, to.code))
                        continue;
                    SCOPED_TRACE(testing::Message()
                                 << from.code << " to " << to.code << ", colour " << colour << ", "
                                 << s.width << " x " << s.height);
                    bytes source(packed_bytes(from.code, s.width, s.height));
                    rig::fill_bytes(source.data(), source.size(), rig::content::random, random);
                    bytes whole(packed_bytes(to.code, s.width, s.height), 0x5A), joined = whole;
                    simgp_img src = described(from.code, s.width, s.height, source);
                    const simgp_img dst = described(to.code, s.width, s.height, whole);
                    simgp_img parts = described(to.code, s.width, s.height, joined);
                    if (!from.tiled && random.below(2)) src = upside_down(src);
                    ASSERT_EQ(simgp_csc_any(&src, &dst, colour), SIMGP_OK);

                    const int32_t step =
                        std::max(simgp_band_step(from.code), simgp_band_step(to.code));
                    const int32_t count = 1 + random.below(5);
                    for (int32_t i = count - 1; i >= 0; i--) {
                        int32_t first, rows;
                        simgp_share_rows(s.height, step, count, i, &first, &rows);
                        if (rows == 0) continue;
                        simgp_img a, b;
                        ASSERT_EQ(simgp_band(&src, first, rows, &a, nullptr), SIMGP_OK);
                        ASSERT_EQ(simgp_band(&parts, first, rows, &b, nullptr), SIMGP_OK);
                        ASSERT_EQ(simgp_csc_any(&a, &b, colour), SIMGP_OK);
                    }
                    ASSERT_TRUE(joined == whole);
                }
}

}  // namespace
