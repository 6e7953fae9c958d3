// Resize with a turn: every kernel against the filter and the places of its samples, the entry point
// against a resize and a turn one after the other, and what it refuses in which order.
#include <algorithm>
#include <cstring>
#include <type_traits>

#include "simgp/simgp.h"
#include "tests/bilinear.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"
#include "tests/turns.h"

namespace {

using rig::is_quarter;

const char *const kinds[] = {"none", "90l", "90r", "180"};
struct kernels {
    const char *name;
    simgp_rsz_fn *const *by_code;
    int bytes;  // of a sample
};
const kernels all_kernels[] = {{"simgp_rsz_8b_rot_", simgp_tbl_fn_rsz_8b_rot, 1},
                               {"simgp_rsz_8b8b_rot_", simgp_tbl_fn_rsz_8b8b_rot, 2}};

// Resizes to w x h samples and then turns them.
void resize_and_turn(const rig::plane &src, const rig::plane &dst, int rot, rig::size to,
                     int bytes) {
    const rig::spread across(src.shape().width, to.width), down(src.shape().height, to.height);
    for (int y = 0; y < to.height; y++)
        for (int x = 0; x < to.width; x++) {
            const rig::place p = rig::turned(rot, x, y, to.width, to.height);
            for (int k = 0; k < bytes; k++)
                dst.row(p.row)[p.column * bytes + k] =
                    uint8_t(rig::bilinear(across, down, x, y, [&](int column, int row) {
                        return src.row(row)[column * bytes + k];
                    }));
        }
}

rig::size turned_size(int rot, rig::size s) {
    return is_quarter(rot) ? rig::size{s.height, s.width} : s;
}

void call(simgp_rsz_fn *kernel, int rot, const rig::picture &s, const rig::picture &d) {
    int32_t across = -1, down = -1;
    simgp_rsz_get_step(s.widths[0], s.heights[0], d.widths[0], d.heights[0], rot, &across, &down);
    kernel(s.planes[0], s.strides[0], d.widths[0], d.heights[0], d.strides[0], d.planes[0], across,
           down);
}

rig::job make_job(const kernels &k, int rot, rig::size from, rig::size to) {
    const rig::size after = turned_size(rot, to);
    rig::job j{{rig::samples(from.width, from.height, k.bytes)},
               {rig::samples(after.width, after.height, k.bytes)},
               [=, kernel = k.by_code[rot]](const rig::picture &s, const rig::picture &d) {
                   call(kernel, rot, s, d);
               },
               [=, bytes = k.bytes](const rig::picture &s, const rig::picture &d) {
                   resize_and_turn(s.parts[0], d.parts[0], rot, to, bytes);
               }};
    j.src[0].stride_unit = j.dst[0].stride_unit = k.bytes;  // odd ones have a test of their own
    return j;
}

// Around whole blocks of the transposition, in both directions.
const rig::sweep sizes{.max_width = 133,
                       .max_height = 71,
                       .rounds = 1,
                       .large = {{640, 67}, {67, 640}, {1030, 33}, {33, 1030}}};

TEST(resize_rot, every_kernel) {
    for (const kernels &k : all_kernels)
        for (int rot = SIMGP_ROT_90L; rot <= SIMGP_ROT_180; rot++)
            rig::check_resize_jobs(std::string(k.name) + kinds[rot], sizes,
                                   [&](const rig::size &from, const rig::size &to) {
                                       return make_job(k, rot, from, to);
                                   });
}

// Of planes beyond the caches lines are asked for ahead, which changes nothing.
TEST(resize_rot, large_planes) {
    const kernels &k = all_kernels[1];
    for (int rot : {int(SIMGP_ROT_90L), int(SIMGP_ROT_90R)})
        rig::check_jobs(std::string(k.name) + kinds[rot],
                        {.max_width = 0, .rounds = 1, .large = {{530, 498}}}, [&](int w, int h) {
                            return make_job(k, rot, {w / 2, h / 3}, {w, h});
                        });
}

// Every decimation across with every one down.
TEST(resize_rot, strong_reductions) {
    const rig::sweep few{.step_x = 7,
                         .max_width = 49,
                         .max_height = 9,
                         .rounds = 6,
                         .large = {{1, 1}, {1, 40}, {70, 1}, {66, 34}}};
    const int ratios[] = {1, 3, 5, 9, 17, 40};
    for (const kernels &k : all_kernels)
        for (int rot = SIMGP_ROT_90L; rot <= SIMGP_ROT_180; rot++) {
            int calls = rot;
            rig::check_jobs(std::string(k.name) + kinds[rot], few, [&](int w, int h) {
                const int ratio = ratios[calls % 6], other = ratios[calls / 6 % 6];
                calls++;
                return make_job(k, rot, {w * ratio + calls % 3, h * other + calls % 2}, {w, h});
            });
        }
}

using bytes = std::vector<uint8_t>;

// 2 x 2 samples become 4 x 2, a half apart across and down:
//    0   80           0  20  40  60
//  160  240   that is 80 100 120 140
TEST(resize_rot, four_samples_by_hand) {
    const uint8_t src[] = {0, 80, 160, 240};
    const bytes expected[] = {{0, 20, 40, 60, 80, 100, 120, 140},
                              {60, 140, 40, 120, 20, 100, 0, 80},
                              {80, 0, 100, 20, 120, 40, 140, 60},
                              {140, 120, 100, 80, 60, 40, 20, 0}};
    rig::for_each_target([&](const rig::target_rows &) {
        for (int rot = 0; rot <= 3; rot++) {
            const rig::size to = turned_size(rot, {4, 2});
            int32_t across, down;
            simgp_rsz_get_step(2, 2, to.width, to.height, rot, &across, &down);
            EXPECT_EQ(across, 1 << 16 << 3) << rot;
            EXPECT_EQ(down, 1 << 17 << 3) << rot;
            bytes got(8), pairs(16);
            simgp_tbl_fn_rsz_8b_rot[rot](src, 2, to.width, to.height, to.width, got.data(), across,
                                         down);
            EXPECT_EQ(got, expected[rot]) << rot;
            const uint8_t of_pairs[] = {0, 240, 80, 160, 160, 80, 240, 0};
            simgp_tbl_fn_rsz_8b8b_rot[rot](of_pairs, 4, to.width, to.height, 2 * to.width,
                                           pairs.data(), across, down);
            for (size_t i = 0; i < 8; i++) {
                EXPECT_EQ(pairs[2 * i], expected[rot][i]) << rot << ", " << i;
                EXPECT_EQ(pairs[2 * i + 1], 240 - expected[rot][i]) << rot << ", " << i;
            }
        }
    });
}

template <class Table>
constexpr bool is_read_only = std::is_const_v<std::remove_extent_t<std::remove_reference_t<Table>>>;
static_assert(is_read_only<decltype(simgp_tbl_fn_rsz_8b_rot)>);
static_assert(is_read_only<decltype(simgp_tbl_fn_rsz_8b8b_rot)>);

TEST(resize_rot, tables) {
    simgp_rsz_fn *const of_bytes[] = {simgp_rsz_8b, simgp_rsz_8b_rot_90l, simgp_rsz_8b_rot_90r,
                                      simgp_rsz_8b_rot_180};
    simgp_rsz_fn *const of_pairs[] = {simgp_rsz_8b8b, simgp_rsz_8b8b_rot_90l,
                                      simgp_rsz_8b8b_rot_90r, simgp_rsz_8b8b_rot_180};
    for (int rot = 0; rot < 6; rot++) {
        EXPECT_EQ(simgp_tbl_fn_rsz_8b_rot[rot], rot < 4 ? of_bytes[rot] : nullptr);
        EXPECT_EQ(simgp_tbl_fn_rsz_8b8b_rot[rot], rot < 4 ? of_pairs[rot] : nullptr);
    }
}

// Negative ones too: rounded down, not towards 0.
TEST(resize_rot, odd_strides_of_pairs_are_the_next_lower_even_ones) {
    uint8_t src[512];
    for (int i = 0; i < 512; i++) src[i] = uint8_t(i * 37);
    const auto even = [](int stride) { return stride % 2 ? stride - 1 : stride; };
    for (int rot = 1; rot < 4; rot++)
        for (auto [from, to] : {std::pair(21, 16), {20, 19}, {-21, 17}, {23, -19}}) {
            int32_t across, down;
            simgp_rsz_get_step(9, 9, 7, 7, rot, &across, &down);
            uint8_t got[512] = {}, expected[512] = {};
            simgp_rsz_fn *const kernel = simgp_tbl_fn_rsz_8b8b_rot[rot];
            kernel(src + 256, from, 7, 7, to, got + 256, across, down);
            kernel(src + 256, even(from), 7, 7, even(to), expected + 256, across, down);
            EXPECT_EQ(memcmp(got, expected, 512), 0) << rot << ": " << from << " to " << to;
        }
}

TEST(resize_rot, empty_planes_are_left_alone) {
    for (auto [w, h] : {std::pair(0, 4), {4, 0}, {-4, 4}, {4, -4}, {INT32_MIN, INT32_MIN}})
        for (const kernels &k : all_kernels)
            for (int rot = 1; rot < 4; rot++)
                k.by_code[rot](nullptr, 16, w, h, 16, nullptr, 1 << 20, 1 << 20);
}

// Pictures
// ----------------------------------------------------------------------------------------

// The planes of a picture, chroma a bit more than half.
std::vector<rig::plane_shape> shapes_of(int format, rig::size s) {
    std::vector<rig::plane_shape> shapes;
    for (int bytes : rig::kept_planes(format)) {
        shapes.push_back(rig::samples(s.width, s.height, bytes));
        s = {s.width / 2 + 1, s.height / 2 + 1};
    }
    return shapes;
}
std::vector<rig::plane_shape> turned_shapes(int rot, std::vector<rig::plane_shape> shapes) {
    for (rig::plane_shape &s : shapes) {
        const rig::size to = turned_size(rot, {s.width, s.height});
        s = rig::samples(to.width, to.height, s.sample_bytes);
    }
    return shapes;
}

TEST(resize_rot, pictures_are_resized_and_then_turned) {
    rig::rng random(rig::seed());
    const rig::size from = {46, 38};
    for (int format : rig::format_codes()) {
        if (rig::kept_planes(format).empty() || format >= 200) continue;
        // To another size, to one that only a quarter turn keeps, and to its own.
        for (rig::size to : {rig::size{31, 57}, {46, 37}, {38, 46}, {46, 38}})
            for (int rot = 0; rot < 6; rot++) {
                SCOPED_TRACE(std::to_string(format) + " to " + std::to_string(to.width) + " x " +
                             std::to_string(to.height) + " by " + std::to_string(rot));
                const bool kept = to.width == from.width && to.height == from.height;
                if (rot >= 4 && !kept) continue;
                const auto shapes = shapes_of(format, to);
                rig::picture src(shapes_of(format, from)), between(shapes),
                    expected(turned_shapes(rot, shapes)), got(turned_shapes(rot, shapes));
                src.fill(rig::content::random, random);
                got.fill_pattern(unsigned(rot));
                const simgp_img a = src.img(format), b = between.img(format);
                const simgp_img c = expected.img(format), d = got.img(format);
                ASSERT_EQ(simgp_rsz(&a, &b), SIMGP_OK);
                ASSERT_EQ(simgp_rot(&b, rot, &c), SIMGP_OK);
                EXPECT_EQ(simgp_rsz_rot(&a, rot, &d), SIMGP_OK);
                EXPECT_EQ(rig::difference(expected, got), "");
                EXPECT_EQ(got.stray_write(), "");
            }
    }
}

// Chroma of any size, where luma keeps its own: the picture is turned, by the source's sizes.
TEST(resize_rot, plane_0_decides_whether_a_picture_keeps_its_size) {
    rig::rng random(rig::seed());
    rig::picture src({rig::samples(20, 12), rig::samples(9, 5), rig::samples(7, 3)});
    src.fill(rig::content::random, random);
    const std::vector<rig::plane_shape> turned = {rig::samples(12, 20), rig::samples(5, 9),
                                                  rig::samples(3, 7)};
    rig::picture expected(turned), got(turned);
    const simgp_img a = src.img(SIMGP_FMT_YUV420), b = expected.img(SIMGP_FMT_YUV420);
    simgp_img c = got.img(SIMGP_FMT_YUV420);
    c.width[1] = 1000, c.height[2] = 0;
    ASSERT_EQ(simgp_rot(&a, SIMGP_ROT_90R, &b), SIMGP_OK);
    EXPECT_EQ(simgp_rsz_rot(&a, SIMGP_ROT_90R, &c), SIMGP_OK);
    EXPECT_EQ(rig::difference(expected, got), "");
}

TEST(resize_rot, words_of_rgb_are_turned_at_their_own_size) {
    rig::rng random(rig::seed());
    rig::picture src({rig::samples(13, 6, 2)}), expected({rig::samples(6, 13, 2)}),
        got({rig::samples(6, 13, 2)});
    src.fill(rig::content::random, random);
    for (int format : {200, 201, 299}) {
        const simgp_img a = src.img(format), b = expected.img(format), c = got.img(format);
        ASSERT_EQ(simgp_rot(&a, SIMGP_ROT_90L, &b), SIMGP_OK);
        got.fill_pattern(unsigned(format));
        EXPECT_EQ(simgp_rsz_rot(&a, SIMGP_ROT_90L, &c), SIMGP_OK);
        EXPECT_EQ(rig::difference(expected, got), "");
    }
}

// In the order of the checks. Nothing is touched: the planes have no bytes.
int32_t expected_refusal(int from, int to, int rot, bool kept, bool good_sizes) {
    if (from != to) return SIMGP_ERR_PARAM;
    if (rot < 0 || rot > 5) return SIMGP_ERR_UNSUPPORTED;
    const std::vector<int> planes = rig::kept_planes(from);
    const bool known = !planes.empty();
    if (kept) return known ? SIMGP_OK : SIMGP_ERR_UNSUPPORTED;
    if (!known || from > 99 || rot > 3) return SIMGP_ERR_UNSUPPORTED;
    return good_sizes ? SIMGP_OK : SIMGP_ERR_PARAM;
}

TEST(resize_rot, what_is_refused_and_in_which_order) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    for (int format : rig::format_codes())
        for (int other : {format, format ^ 1})
            for (int rot : {0, 1, 2, 3, 4, 5, -1, 6, 256, INT32_MIN, INT32_MAX})
                for (bool kept : {true, false})
                    for (bool good : {true, false}) {
                        const int32_t result = expected_refusal(format, other, rot, kept, good);
                        if (result == SIMGP_OK) continue;
                        simgp_img a = src.img(format), b = dst.img(other);
                        for (int k = 0; k < 4; k++) {
                            a.width[k] = 16, a.height[k] = good ? 8 : -8;
                            b.width[k] = 16, b.height[k] = a.height[k];
                            if (is_quarter(rot)) std::swap(b.width[k], b.height[k]);
                            if (!kept) b.width[k] += 3;
                        }
                        EXPECT_EQ(simgp_rsz_rot(&a, rot, &b), result)
                            << format << ", " << other << ", " << rot << ", " << kept << good;
                    }
    EXPECT_EQ(dst.stray_write(), "");
}

// Each extent of each plane, across and down.
TEST(resize_rot, extents_beyond_the_arithmetic_are_refused) {
    rig::picture src({rig::samples(0, 0), rig::samples(0, 0), rig::samples(0, 0)});
    for (int format : {int(SIMGP_FMT_YUV400), int(SIMGP_FMT_YUV420), int(SIMGP_FMT_NV12)})
        for (int rot = 0; rot < 4; rot++)
            for (size_t k = 0; k < rig::kept_planes(format).size(); k++)
                for (int which = 0; which < 4; which++)
                    for (int extent : {0, -1, INT32_MIN, 8193, INT32_MAX}) {
                        simgp_img a = src.img(format), b = a;
                        for (int i = 0; i < 3; i++) {
                            a.width[i] = a.height[i] = 16;
                            b.width[i] = b.height[i] = 3000;
                        }
                        if (which >= 2 && extent > 0) continue;  // as large as one likes
                        int32_t *const words[] = {a.width, a.height, b.width, b.height};
                        words[which][k] = extent;
                        EXPECT_EQ(simgp_rsz_rot(&a, rot, &b), SIMGP_ERR_PARAM)
                            << format << ", " << rot << ", plane " << k << ", " << which << ", "
                            << extent;
                    }
}

// The largest that fit, of every decimation.
TEST(resize_rot, the_longest_rows) {
    rig::rng random(rig::seed());
    for (int shift = 0; shift <= 4; shift++) {
        const int longest = 8192 << shift, to = shift ? longest / (2 << shift) : 5000;
        for (int rot : {int(SIMGP_ROT_90R), int(SIMGP_ROT_180)}) {
            rig::picture src({rig::samples(longest, 2)});
            const rig::size after = turned_size(rot, {to, 3});
            rig::picture expected({rig::samples(after.width, after.height)}),
                got({rig::samples(after.width, after.height)});
            src.fill(rig::content::random, random);
            resize_and_turn(src.parts[0], expected.parts[0], rot, {to, 3}, 1);
            simgp_img a = src.img(SIMGP_FMT_YUV400);
            const simgp_img b = got.img(SIMGP_FMT_YUV400);
            EXPECT_EQ(simgp_rsz_rot(&a, rot, &b), SIMGP_OK) << shift;
            EXPECT_EQ(rig::difference(expected, got), "") << shift;
            a.width[0]++;
            EXPECT_EQ(simgp_rsz_rot(&a, rot, &b), SIMGP_ERR_PARAM) << shift;
        }
    }
}

}  // namespace
