// Luma dithering: the plane against its definition, the wrappers against a dithered copy that lies
// elsewhere and the plain conversion.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

using rig::flush;
using rig::picture;
using bytes = std::vector<uint8_t>;

// The definition, with the plane as one array.
bytes dithered(const uint8_t *src, int width, int height, ptrdiff_t stride) {
    bytes plane;
    for (int y = 0; y < height; y++)
        plane.insert(plane.end(), src + y * stride, src + y * stride + width);
    if (height < 3 || width < 5) return plane;
    const auto at = [&](int x, int y) -> uint8_t & { return plane[size_t(y * width + x)]; };
    const auto move = [](uint8_t &v, bool up, int by) {
        v = uint8_t(up ? std::min(v + by, 255) : std::max(v - by, 0));
    };
    for (int y = 1; y <= height - 2; y++)
        for (int k = 0; k <= (width - 5) / 2; k++) {
            const int x = 2 + 2 * k;
            const uint8_t p = at(x - 1, y), q = at(x, y), above = at(x, y - 1);
            move(at(x + 2, y), p > q, 2);
            move(at(x, y + 1), above > q, 1);
            move(at(x + 1, y + 1), above > q, 1);
        }
    return plane;
}

// Luma of all kinds: decisions are forced where neighbours differ by more than 2, and hang together
// where they don't; near 0 and 255 nudges are cut off.
enum luma { noise, extremes, flat, ramp, near_black, near_white, thresholds, luma_count };
void fill_luma(picture &p, luma kind, rig::rng &random) {
    p.fill(kind == extremes ? rig::content::extremes : rig::content::random, random);
    const rig::plane_shape &s = p.parts[0].shape();
    const int base = random.below(256), slope_x = random.below(5), slope_y = random.below(5);
    const int centre = 2 + random.below(252);
    for (int y = 0; y < s.rows; y++)
        for (int x = 0; x < s.row_bytes && kind >= flat; x++) {
            uint8_t &v = p.row(0, y)[x];
            if (kind == flat) v = uint8_t(base);
            if (kind == ramp) v = uint8_t((base + (slope_x * x + slope_y * y) / 4) % 256);
            if (kind == near_black) v = uint8_t(random.below(4));
            if (kind == near_white) v = uint8_t(252 + random.below(4));
            if (kind == thresholds) v = uint8_t(centre - 2 + random.below(5));
        }
}

void run_dither(const picture &src, const picture &dst) {
    simgp_dit_8b(src.planes[0], src.widths[0], src.heights[0], src.strides[0], dst.strides[0],
                 dst.planes[0]);
}

TEST(dither, plane_of_100) {
    const uint8_t expected[4][8] = {{100, 100, 100, 100, 100, 100, 100, 100},
                                    {100, 100, 100, 100, 98, 100, 102, 100},
                                    {100, 100, 99, 99, 103, 101, 98, 100},
                                    {100, 100, 101, 101, 99, 99, 100, 100}};
    const bytes src(32, 100);
    rig::for_each_target([&](const rig::target_rows &) {
        bytes dst(32);
        simgp_dit_8b(src.data(), 8, 4, 8, 8, dst.data());
        EXPECT_EQ(memcmp(dst.data(), expected, 32), 0);
    });
}

// Every width up to more than two of the widest vectors, and wide rows in which the chain passes
// through many of them.
TEST(dither, every_target_follows_the_definition) {
    rig::rng random(rig::seed());
    const auto check = [&](int width, int height, luma kind, const rig::target_rows &t) {
        for (flush where : {flush::at_end, flush::at_start}) {
            const std::vector<rig::plane_shape> shape = {rig::samples(width, height)};
            picture src(shape, rig::any_placement(where, random));
            picture dst(shape, rig::any_placement(where, random));
            fill_luma(src, kind, random);
            dst.fill_pattern(1);
            run_dither(src, dst);
            const bytes expected = dithered(src.planes[0], width, height, src.strides[0]);
            for (int y = 0; y < height; y++)
                for (int x = 0; x < width; x++)
                    if (dst.row(0, y)[x] != expected[size_t(y * width + x)]) {
                        ADD_FAILURE() << t.name << ", " << width << " x " << height << ", luma "
                                      << kind << ": (" << x << ", " << y << ")";
                        return false;
                    }
            EXPECT_EQ(dst.stray_write(), "") << width << " x " << height;
        }
        return true;
    };
    rig::for_each_target([&](const rig::target_rows &t) {
        for (int kind = 0; kind < luma_count; kind++) {
            for (int width = 1; width <= 2 * 64 + 15; width += 1 + 2 * rig::quick())
                if (!check(width, 1 + random.below(7), luma(kind), t)) return;
            for (int width : {320, 721, 1030})
                if (!check(width, 9, luma(kind), t)) return;
        }
    });
}

TEST(dither, no_rows_no_write) {
    uint8_t sample = 7;
    for (int height : {0, -1}) simgp_dit_8b(&sample, 8, height, 8, 8, nullptr);
    for (int width : {0, -1}) simgp_dit_8b(&sample, width, 8, 8, 8, nullptr);
}

// Pointers that lead nowhere are not even added up: a sanitizer would tell.
TEST(dither, of_pictures_without_columns_nothing_is_looked_at) {
    for (simgp_csc_fn *const kernel :
         {simgp_csc_yuv400_to_rgb565_dither, simgp_csc_yuv420_to_rgb565_dither,
          simgp_csc_yuv422n_to_bgr565_dither, simgp_csc_yuv444_to_rgb565_dither})
        for (int32_t width : {0, -1, INT32_MIN}) {
            uint8_t memory[8] = {};
            uint8_t *const planes[4] = {memory, memory, memory, memory};
            const int32_t widths[4] = {width, width, width, width};
            const int32_t heights[4] = {INT32_MAX, 0, 0, 0};
            const int32_t strides[4] = {INT32_MIN, INT32_MIN, INT32_MIN, INT32_MIN};
            kernel(planes, widths, heights, strides, strides, planes);
            for (uint8_t byte : memory) EXPECT_EQ(byte, 0);
        }
}

// Wrappers ------------------------------------------------------------------------------------

struct wrapper {
    const char *name;
    simgp_csc_fn *run, *plain;
    int from, tail_chroma;  // lines for the last 4 rows; 0: no tail
};
#define WRAPPER(name, from, tail) \
    { #name, simgp_csc_##name##_dither, simgp_csc_##name, SIMGP_FMT_##from, tail }
const wrapper wrappers[] = {
    WRAPPER(yuv400_to_rgb565, YUV400, 0),   WRAPPER(yuv420_to_rgb565, YUV420, 2),
    WRAPPER(yuv420_to_bgr565, YUV420, 2),   WRAPPER(yuv422n_to_rgb565, YUV422N, 4),
    WRAPPER(yuv422n_to_bgr565, YUV422N, 4), WRAPPER(yuv422w_to_rgb565, YUV422W, 2),
    WRAPPER(yuv422w_to_bgr565, YUV422W, 2), WRAPPER(yuv444_to_rgb565, YUV444, 4),
    WRAPPER(yuv444_to_bgr565, YUV444, 4),
};

// The pixels that a wrapper must give, row after row.
bytes expected_pixels(const wrapper &w, const picture &src) {
    const int32_t width = src.widths[0], height = src.heights[0], stride = 2 * width;
    bytes pixels(size_t(stride * height));
    const auto convert = [&](int32_t first, int32_t rows, uint8_t *luma, int32_t luma_stride,
                             bool tail) {
        uint8_t *planes[3] = {luma, src.planes[1], src.planes[2]};
        for (int k = 1; k < 3 && tail; k++)
            planes[k] += (src.heights[k] - w.tail_chroma) * ptrdiff_t(src.strides[k]);
        const int32_t strides[3] = {luma_stride, src.strides[1], src.strides[2]};
        uint8_t *dst = pixels.data() + first * stride;
        w.plain(planes, src.widths, &rows, strides, &stride, &dst);
    };
    const int32_t body = w.tail_chroma ? height - 4 : height;
    if (body < 0) {
        convert(0, height, src.planes[0], src.strides[0], false);
        return pixels;
    }
    bytes luma = dithered(src.planes[0], width, body, src.strides[0]);
    convert(0, body, luma.data(), width, false);
    if (w.tail_chroma) convert(body, 4, src.row(0, body), src.strides[0], true);
    return pixels;
}

bool rows_dithered(const wrapper &w, int width, int height) {
    return width >= 5 && height - (w.tail_chroma ? 4 : 0) >= 3;
}

// A destination of height * |stride| bytes, no more.
bool check_wrapper(const wrapper &w, int width, int height, int stride, luma kind,
                   rig::rng &random) {
    SCOPED_TRACE(testing::Message()
                 << w.name << ", " << width << " x " << height << ", destination stride " << stride
                 << ", luma " << kind << ", SIMGP_TEST_SEED=" << rig::seed());
    const flush where = random.below(2) ? flush::at_end : flush::at_start;
    picture src(rig::shapes_of(w.from, width, height), rig::any_placement(where, random));
    fill_luma(src, kind, random);
    const bytes expected = expected_pixels(w, src);

    const ptrdiff_t step = std::abs(stride), size = step * height;
    rig::guarded dst(size_t(size), where);
    bytes before(size_t(size) + 2 * 64);
    const auto [begin, end] = dst.room(64);
    rig::fill_bytes(begin, size_t(end - begin), rig::content::random, random);
    std::copy(begin, end, before.begin());
    const uint8_t *old = before.data() + (dst.data() - begin);

    uint8_t *first = dst.data() + (stride < 0 ? (height - 1) * step : 0);
    w.run(src.planes, src.widths, src.heights, src.strides, &stride, &first);

    for (int y = 0; y < height; y++) {
        const uint8_t *row = first + y * ptrdiff_t(stride);
        for (int x = 0; x < 2 * width; x++)
            if (row[x] != expected[size_t(y * 2 * width + x)]) {
                ADD_FAILURE() << "pixel (" << x / 2 << ", " << y << ")";
                return false;
            }
        // Luma waits in the last two rows, top-down in the second half of the destination.
        const bool may_wait = y >= height - 2 && rows_dithered(w, width, height);
        for (ptrdiff_t x = 2 * width; x < step; x++) {
            const ptrdiff_t at = row + x - dst.data();
            if (may_wait && (stride < 0 || at >= size / 2)) break;
            if (row[x] == old[at]) continue;
            ADD_FAILURE() << "padding of row " << y << ", byte " << x;
            return false;
        }
    }
    EXPECT_TRUE(std::equal(begin, dst.data(), before.data())) << "bytes before the destination";
    EXPECT_TRUE(std::equal(dst.end(), end, old + size)) << "bytes behind the destination";
    return !testing::Test::HasFailure();
}

TEST(dither, wrappers_convert_what_was_dithered) {
    rig::rng random(rig::seed());
    rig::for_each_target([&](const rig::target_rows &) {
        for (const wrapper &w : wrappers) {
            const auto check = [&](int width, int height) {
                const int paddings[] = {0, 0, 1, 2, 3, width, 6 * width + 5, 100};
                const int stride = 2 * width + paddings[random.below(8)];
                return check_wrapper(w, width, height, random.below(4) ? stride : -stride,
                                     luma(random.below(luma_count)), random);
            };
            for (int width = 1; width <= 2 * 64 + 3; width += 1 + 2 * rig::quick())
                if (!check(width, 1 + random.below(12))) return;
            for (int height = 1; height <= 40; height++)
                if (!check(1 + random.below(40), height)) return;
            if (!check(322, 61) || !check(319, 50)) return;
        }
    });
}

// A grey row that is read while it is overwritten: no slack at all in the last row.
TEST(dither, grey_survives_its_own_last_row) {
    rig::rng random(rig::seed());
    rig::for_each_target([&](const rig::target_rows &) {
        for (int width = 1; width <= 4 * 64 + 3; width += 1 + 2 * rig::quick())
            for (int stride : {2 * width, 2 * width + 1, -2 * width, -2 * width - 1})
                if (!check_wrapper(wrappers[0], width, 1 + random.below(6), stride, noise, random))
                    return;
        for (int width : {3, 64})  // many rows, where what an odd stride loses would add up
            for (int stride : {2 * width, 2 * width + 1, -2 * width - 1})
                if (!check_wrapper(wrappers[0], width, 700, stride, noise, random)) return;
    });
}

// Entry -----------------------------------------------------------------------------------------

struct served {
    int from, to;
};
const served pairs[] = {
    {SIMGP_FMT_YUV400, SIMGP_FMT_RGB565},  {SIMGP_FMT_YUV420, SIMGP_FMT_RGB565},
    {SIMGP_FMT_YUV420, SIMGP_FMT_BGR565},  {SIMGP_FMT_YUV420, SIMGP_FMT_YUV420},
    {SIMGP_FMT_YUV422N, SIMGP_FMT_RGB565}, {SIMGP_FMT_YUV422N, SIMGP_FMT_BGR565},
    {SIMGP_FMT_YUV422W, SIMGP_FMT_RGB565}, {SIMGP_FMT_YUV422W, SIMGP_FMT_BGR565},
    {SIMGP_FMT_YUV444, SIMGP_FMT_RGB565},  {SIMGP_FMT_YUV444, SIMGP_FMT_BGR565},
    {SIMGP_FMT_YV12, SIMGP_FMT_RGB565},    {SIMGP_FMT_YV12, SIMGP_FMT_BGR565},
};

TEST(dither, all_other_pairs_are_refused) {
    for (int from = -1; from <= 503; from++)
        for (int to = -1; to <= 503; to++) {
            const bool is_served = std::any_of(std::begin(pairs), std::end(pairs), [&](served p) {
                return p.from == from && p.to == to;
            });
            if (is_served) continue;
            simgp_img src{}, dst{};  // no planes: touching them would end the program
            src.format = from;
            dst.format = to;
            src.width[0] = src.height[0] = 8;
            ASSERT_EQ(simgp_csc_dither(&src, &dst), SIMGP_ERR_UNSUPPORTED) << from << ", " << to;
        }
}

TEST(dither, entry_reaches_the_kernel_of_the_pair) {
    rig::rng random(rig::seed());
    for (const served &pair : pairs) {
        if (pair.to == SIMGP_FMT_YUV420) continue;
        SCOPED_TRACE(testing::Message() << pair.from << " to " << pair.to);
        const bool yv12 = pair.from == SIMGP_FMT_YV12, bgr = pair.to == SIMGP_FMT_BGR565;
        const int from = yv12 ? SIMGP_FMT_YUV420 : pair.from;
        const wrapper *w = std::find_if(std::begin(wrappers), std::end(wrappers), [&](auto &c) {
            return c.from == from && (strstr(c.name, "bgr565") != nullptr) == bgr;
        });
        ASSERT_NE(w, std::end(wrappers));
        // Each plane has a stride of its own.
        std::vector<rig::placement> places(3);
        for (int k = 0; k < 3; k++) places[size_t(k)].padding = 5 * k;
        picture src(rig::shapes_of(pair.from, 22, 10), places);
        src.fill(rig::content::random, random);
        picture dst(rig::shapes_of(pair.to, 22, 10));
        const simgp_img src_img = src.img(pair.from), dst_img = dst.img(pair.to);
        ASSERT_EQ(simgp_csc_dither(&src_img, &dst_img), SIMGP_OK);
        if (yv12) {
            std::swap(src.planes[1], src.planes[2]);
            std::swap(src.strides[1], src.strides[2]);
        }
        const bytes expected = expected_pixels(*w, src);
        EXPECT_EQ(memcmp(dst.planes[0], expected.data(), expected.size()), 0);
    }
}

TEST(dither, planar_to_planar) {
    rig::rng random(rig::seed());
    picture src(rig::shapes_of(SIMGP_FMT_YUV420, 37, 11), rig::placement{.padding = 3});
    picture dst(rig::shapes_of(SIMGP_FMT_YUV420, 37, 11), rig::placement{.padding = 8});
    src.fill(rig::content::random, random);
    dst.fill_pattern(1);
    const simgp_img src_img = src.img(SIMGP_FMT_YUV420), dst_img = dst.img(SIMGP_FMT_YUV420);
    ASSERT_EQ(simgp_csc_dither(&src_img, &dst_img), SIMGP_OK);
    // All 11 rows are dithered, chroma is as it was.
    const bytes luma = dithered(src.planes[0], 37, 11, src.strides[0]);
    for (int y = 0; y < 11; y++) EXPECT_EQ(memcmp(dst.row(0, y), &luma[size_t(y) * 37], 37), 0);
    for (int k = 1; k < 3; k++)
        for (int y = 0; y < 6; y++) EXPECT_EQ(memcmp(dst.row(k, y), src.row(k, y), 19), 0);
    EXPECT_EQ(dst.stray_write(), "");
}

// What stands under "the last 4 rows" in the header, seen from outside.
TEST(dither, last_four_rows_are_not_dithered) {
    rig::rng random(rig::seed());
    for (const wrapper &w : wrappers) {
        if (!w.tail_chroma) continue;
        picture src(rig::shapes_of(w.from, 48, 12));
        fill_luma(src, noise, random);
        picture plain(rig::shapes_of(SIMGP_FMT_RGB565, 48, 12)),
            soft(rig::shapes_of(SIMGP_FMT_RGB565, 48, 12));
        rig::call(w.plain, src, plain);
        rig::call(w.run, src, soft);
        EXPECT_EQ(memcmp(plain.row(0, 8), soft.row(0, 8), 4 * 96), 0) << w.name;
        EXPECT_NE(memcmp(plain.row(0, 0), soft.row(0, 0), 8 * 96), 0) << w.name;
    }
}

}  // namespace
