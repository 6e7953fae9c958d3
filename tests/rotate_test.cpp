// Turns and mirrors, alone and of every second row or sample: every kernel against the places of
// its samples, and what the entry points serve and refuse.
#include <algorithm>
#include <cstring>
#include <type_traits>

#include "simgp/simgp.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"
#include "tests/turns.h"

namespace {

using rig::is_quarter;
using rig::place;
using rig::turned;

rig::plane_shape turned_shape(int rot, int w, int h, int bytes = 1) {
    if (is_quarter(rot)) std::swap(w, h);
    rig::plane_shape shape = rig::samples(w, h, bytes);
    shape.stride_unit = bytes;  // odd strides of words have a test of their own
    return shape;
}

// Turns w x h samples: those of columns 0, gap, 2 gap ... of rows 0, step, 2 step ...
void turn(const rig::plane &src, const rig::plane &dst, int rot, int w, int h, int bytes,
          int gap = 1, int step = 1) {
    for (int y = 0; y < h; y++)
        for (int x = 0; x < w; x++) {
            const place to = turned(rot, x, y, w, h);
            memcpy(dst.row(to.row) + to.column * bytes, src.row(y * step) + x * gap * bytes,
                   size_t(bytes));
        }
}

// Around whole blocks of 64 bytes, power-of-two strides, and more than what is fetched ahead.
const rig::sweep sizes{
    .max_width = 133,
    .max_height = 133,
    .rounds = 3,
    .large = {{1024, 1030}, {1033, 513}, {64, 256}, {3, 700}, {700, 3}, {512, 64}, {193, 257}}};

const char *const kinds[] = {"none", "90l", "90r", "180", "hori", "vert"};

void check_kernels(simgp_plane_fn *const (&table)[6], int bytes) {
    for (int rot = SIMGP_ROT_90L; rot <= SIMGP_ROT_VERT; rot++) {
        const std::string name =
            "simgp_rot_" + std::to_string(8 * bytes) + "b_" + std::string(kinds[rot]);
        rig::check_jobs(name, sizes, [&](int w, int h) {
            rig::plane_shape src = rig::samples(w, h, bytes);
            src.stride_unit = bytes;
            return rig::job{{src},
                            {turned_shape(rot, w, h, bytes)},
                            [=, kernel = table[rot]](const rig::picture &s, const rig::picture &d) {
                                kernel(s.planes[0], w, h, s.strides[0], d.strides[0], d.planes[0]);
                            },
                            [=](const rig::picture &s, const rig::picture &d) {
                                turn(s.parts[0], d.parts[0], rot, w, h, bytes);
                            }};
        });
    }
}
TEST(rotate, every_kernel_of_bytes) { check_kernels(simgp_tbl_fn_rot_8b, 1); }
TEST(rotate, every_kernel_of_words) { check_kernels(simgp_tbl_fn_rot_16b, 2); }

TEST(rotate, every_kernel_of_every_second_row) {
    for (int rot : {SIMGP_ROT_90L, SIMGP_ROT_90R})
        rig::check_jobs(
            std::string("simgp_csc_1x2_to_1x1_rot_") + kinds[rot], sizes, [&](int w, int h) {
                return rig::job{{rig::samples(w, h)},
                                {turned_shape(rot, w, h / 2)},
                                [=](const rig::picture &s, const rig::picture &d) {
                                    simgp_tbl_fn_csc_1x2_to_1x1_rot[rot](
                                        s.planes[0], w, h, s.strides[0], d.strides[0], d.planes[0]);
                                },
                                [=](const rig::picture &s, const rig::picture &d) {
                                    turn(s.parts[0], d.parts[0], rot, w, h / 2, 1, 1, 2);
                                }};
            });
}

TEST(rotate, quarter_size) {
    rig::check_jobs("simgp_rsz_8b_rot_90r_quarter", sizes, [](int w, int h) {
        return rig::job{{rig::samples(2 * h, 2 * w)},
                        {rig::samples(w, h)},
                        [=](const rig::picture &s, const rig::picture &d) {
                            simgp_rsz_8b_rot_90r_quarter(s.planes[0], s.strides[0], w, h,
                                                         d.strides[0], d.planes[0]);
                        },
                        [=](const rig::picture &s, const rig::picture &d) {
                            turn(s.parts[0], d.parts[0], SIMGP_ROT_90R, h, w, 1, 2, 2);
                        }};
    });
}

using bytes = std::vector<uint8_t>;

TEST(rotate, six_samples_by_hand) {
    const uint8_t src[] = {1, 2, 3,   //
                           4, 5, 6};  // 3 x 2
    const bytes expected[] = {{1, 2, 3, 4, 5, 6}, {3, 6, 2, 5, 1, 4}, {4, 1, 5, 2, 6, 3},
                              {6, 5, 4, 3, 2, 1}, {3, 2, 1, 6, 5, 4}, {4, 5, 6, 1, 2, 3}};
    rig::for_each_target([&](const rig::target_rows &) {
        for (int rot = 0; rot < 6; rot++) {
            const int across = is_quarter(rot) ? 2 : 3;
            bytes got(6);
            simgp_tbl_fn_rot_8b[rot](src, 3, 2, 3, across, got.data());
            EXPECT_EQ(got, expected[rot]) << rot;

            bytes words(12), pairs(12), expected_pairs(12);
            for (size_t i = 0; i < 6; i++) {
                words[2 * i] = src[i];
                words[2 * i + 1] = uint8_t(100 + src[i]);
                expected_pairs[2 * i] = expected[rot][i];
                expected_pairs[2 * i + 1] = uint8_t(100 + expected[rot][i]);
            }
            simgp_tbl_fn_rot_16b[rot](words.data(), 3, 2, 6, 2 * across, pairs.data());
            EXPECT_EQ(pairs, expected_pairs) << rot;
        }
    });
}

TEST(rotate, every_second_row_by_hand) {
    const uint8_t src[] = {1,  2,  3,   //
                           4,  5,  6,   //
                           7,  8,  9,   //
                           10, 11, 12,  //
                           13, 14, 15};
    bytes left(6), right(6);
    simgp_csc_1x2_to_1x1_rot_90l(src, 3, 5, 3, 2, left.data());
    simgp_csc_1x2_to_1x1_rot_90r(src, 3, 5, 3, 2, right.data());
    EXPECT_EQ(left, (bytes{3, 9, 2, 8, 1, 7}));
    EXPECT_EQ(right, (bytes{7, 1, 8, 2, 9, 3}));
    bytes quarter(2);  // rows 0 and 2, column 0
    simgp_rsz_8b_rot_90r_quarter(src, 3, 2, 1, 2, quarter.data());
    EXPECT_EQ(quarter, (bytes{7, 1}));
}

template <class Table>
constexpr bool is_read_only = std::is_const_v<std::remove_extent_t<std::remove_reference_t<Table>>>;
static_assert(is_read_only<decltype(simgp_tbl_fn_rot_8b)>);
static_assert(is_read_only<decltype(simgp_tbl_fn_rot_16b)>);
static_assert(is_read_only<decltype(simgp_tbl_fn_csc_1x2_to_1x1_rot)>);

// The entries not called through the tables above.
TEST(rotate, tables) {
    EXPECT_EQ(simgp_tbl_fn_rot_8b[0], simgp_cpy_8b);
    EXPECT_EQ(simgp_tbl_fn_rot_16b[0], simgp_cpy_16b);
    EXPECT_EQ(simgp_tbl_fn_rot_8b[1], simgp_rot_8b_90l);
    EXPECT_EQ(simgp_tbl_fn_rot_8b[2], simgp_rot_8b_90r);
    EXPECT_EQ(simgp_tbl_fn_rot_8b[3], simgp_rot_8b_180);
    EXPECT_EQ(simgp_tbl_fn_rot_8b[4], simgp_rot_8b_hori);
    EXPECT_EQ(simgp_tbl_fn_rot_8b[5], simgp_rot_8b_vert);
    EXPECT_EQ(simgp_tbl_fn_rot_16b[1], simgp_rot_16b_90l);
    EXPECT_EQ(simgp_tbl_fn_rot_16b[2], simgp_rot_16b_90r);
    EXPECT_EQ(simgp_tbl_fn_rot_16b[3], simgp_rot_16b_180);
    EXPECT_EQ(simgp_tbl_fn_rot_16b[4], simgp_rot_16b_hori);
    EXPECT_EQ(simgp_tbl_fn_rot_16b[5], simgp_rot_16b_vert);
    EXPECT_EQ(simgp_tbl_fn_csc_1x2_to_1x1_rot[0], simgp_csc_1x2_to_1x1);
    EXPECT_EQ(simgp_tbl_fn_csc_1x2_to_1x1_rot[1], simgp_csc_1x2_to_1x1_rot_90l);
    EXPECT_EQ(simgp_tbl_fn_csc_1x2_to_1x1_rot[2], simgp_csc_1x2_to_1x1_rot_90r);
    for (int rot : {3, 4, 5}) EXPECT_EQ(simgp_tbl_fn_csc_1x2_to_1x1_rot[rot], nullptr);
}

// Negative ones too: rounded down, not towards 0.
TEST(rotate, odd_strides_of_16_bit_planes_are_the_next_lower_even_ones) {
    uint8_t src[128];
    for (int i = 0; i < 128; i++) src[i] = uint8_t(i + 1);
    for (int rot = 1; rot < 6; rot++)
        for (auto [from, to] : {std::pair(7, 6), {6, 9}, {-7, 11}, {9, -7}}) {
            uint8_t got[128] = {}, expected[128] = {};
            const auto even = [](int stride) { return stride % 2 ? stride - 1 : stride; };
            simgp_tbl_fn_rot_16b[rot](src + 64, 3, 3, from, to, got + 64);
            simgp_tbl_fn_rot_16b[rot](src + 64, 3, 3, even(from), even(to), expected + 64);
            EXPECT_EQ(memcmp(got, expected, 128), 0) << rot << ": " << from << " to " << to;
        }
}

TEST(rotate, empty_planes_are_left_alone) {
    for (auto [w, h] : {std::pair(0, 4),
                        {4, 0},
                        {-4, 4},
                        {4, -4},
                        {0, INT32_MIN},
                        {INT32_MIN, 1},
                        {0, INT32_MAX}}) {
        for (int rot = 1; rot < 6; rot++)
            for (simgp_plane_fn *kernel : {simgp_tbl_fn_rot_8b[rot], simgp_tbl_fn_rot_16b[rot]}) {
                uint8_t src[64] = {}, dst[64];
                memset(dst, 7, sizeof dst);
                kernel(src, w, h, 4, 4, dst);
                kernel(nullptr, w, h, 16, 8, nullptr);
                kernel(dst, w, h, INT32_MIN, INT32_MIN, dst);
                EXPECT_EQ(std::count(dst, dst + 64, 7), 64) << w << " x " << h;
            }
        simgp_csc_1x2_to_1x1_rot_90l(nullptr, w, h, 8, 8, nullptr);
        simgp_csc_1x2_to_1x1_rot_90r(nullptr, w, h, 8, 8, nullptr);
        simgp_rsz_8b_rot_90r_quarter(nullptr, 8, w, h, 8, nullptr);
    }
    simgp_csc_1x2_to_1x1_rot_90l(nullptr, 4, 1, 8, 8, nullptr);  // half a row
}

// Pictures
// ----------------------------------------------------------------------------------------

simgp_img unread_sizes(simgp_img p) {
    for (int k = 0; k < 4; k++) p.width[k] = p.height[k] = -1;
    return p;
}

TEST(rotate, pictures_of_every_format_and_back) {
    rig::rng random(rig::seed());
    constexpr int back[] = {SIMGP_ROT_NONE, SIMGP_ROT_90R,  SIMGP_ROT_90L,
                            SIMGP_ROT_180,  SIMGP_ROT_HORI, SIMGP_ROT_VERT};
    for (int format : rig::format_codes())
        for (int rot = 0; rot < 6; rot++) {
            SCOPED_TRACE(std::to_string(format) + " by " + std::to_string(rot));
            std::vector<rig::plane_shape> shapes, turned_shapes;
            int w = 37, h = 21;
            for (int size : rig::kept_planes(format)) {
                shapes.push_back(rig::samples(w, h, size));
                turned_shapes.push_back(turned_shape(rot, w, h, size));
                w = 19, h = 11;
            }
            rig::picture src(shapes), expected(turned_shapes), got(turned_shapes), again(shapes);
            src.fill(rig::content::random, random);
            for (rig::picture *p : {&expected, &got, &again}) p->fill_pattern(unsigned(format));
            for (size_t k = 0; k < shapes.size(); k++)
                turn(src.parts[k], expected.parts[k], rot, shapes[k].width, shapes[k].height,
                     shapes[k].sample_bytes);
            const bool known = !shapes.empty();
            const int32_t result = known ? SIMGP_OK : SIMGP_ERR_UNSUPPORTED;
            const simgp_img a = src.img(format), b = unread_sizes(got.img(format ^ 1));
            EXPECT_EQ(simgp_rot(&a, rot, &b), result);
            EXPECT_EQ(rig::difference(expected, got), "");
            EXPECT_EQ(got.stray_write(), "");
            const simgp_img c = got.img(format), d = unread_sizes(again.img(0));
            EXPECT_EQ(simgp_rot(&c, back[rot], &d), result);
            EXPECT_EQ(rig::difference(src, again), "");
        }
}

// Nothing is touched: the planes have no bytes. With the size 0, what is served all the same is
// named, not just the end of the program.
TEST(rotate, everything_else_is_refused) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    for (int size : {0, 64}) {
        for (int k = 0; k < 4; k++) src.widths[k] = src.heights[k] = size;
        for (int format : rig::format_codes())
            for (int rot : {-1, 6, 256, 65536, INT32_MIN, INT32_MAX, 0, 5}) {
                if (rot >= 0 && rot <= 5 && !rig::kept_planes(format).empty()) continue;
                const simgp_img a = src.img(format), b = dst.img(format);
                EXPECT_EQ(simgp_rot(&a, rot, &b), SIMGP_ERR_UNSUPPORTED) << format << ", " << rot;
            }
    }
    EXPECT_EQ(dst.stray_write(), "");
}

bool is_csc_rot_pair(int from, int to) {
    return (from == SIMGP_FMT_YUV422N || from == SIMGP_FMT_YV16) &&
           (to == SIMGP_FMT_YUV420 || to == SIMGP_FMT_YV12);
}

TEST(rotate, from_422_to_420) {
    rig::rng random(rig::seed());
    for (int from : {SIMGP_FMT_YUV422N, SIMGP_FMT_YV16})
        for (int to : {SIMGP_FMT_YUV420, SIMGP_FMT_YV12})
            for (int rot = 0; rot <= 2; rot++)
                for (int chroma_height : {20, 21}) {  // of an odd number the last row is left
                    SCOPED_TRACE(std::to_string(from) + " to " + std::to_string(to) + " by " +
                                 std::to_string(rot));
                    const int widths[] = {37, 19, 18}, h = chroma_height;
                    std::vector<rig::plane_shape> src_shapes, dst_shapes;
                    const bool exchanged = (from == SIMGP_FMT_YUV422N) != (to == SIMGP_FMT_YUV420);
                    for (int k = 0; k < 3; k++) {
                        const int at = exchanged && k ? 3 - k : k;
                        src_shapes.push_back(rig::samples(widths[k], h));
                        dst_shapes.push_back(turned_shape(rot, widths[at], k ? h / 2 : h));
                    }
                    rig::picture src(src_shapes), expected(dst_shapes), got(dst_shapes);
                    src.fill(rig::content::random, random);
                    expected.fill_pattern(1);
                    got.fill_pattern(1);
                    for (int k = 0; k < 3; k++)
                        turn(src.parts[size_t(k)],
                             expected.parts[size_t(exchanged && k ? 3 - k : k)], rot, widths[k],
                             k ? h / 2 : h, 1, 1, k ? 2 : 1);
                    const simgp_img a = src.img(from), b = unread_sizes(got.img(to));
                    EXPECT_EQ(simgp_csc_rot(&a, rot, &b), SIMGP_OK);
                    EXPECT_EQ(rig::difference(expected, got), "");
                    EXPECT_EQ(got.stray_write(), "");
                }
}

TEST(rotate, from_anything_else_to_420_is_refused) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    const std::vector<int> codes = rig::format_codes();
    for (int size : {0, 64}) {
        for (int k = 0; k < 4; k++) src.widths[k] = src.heights[k] = size;
        for (int from : codes)
            for (int to : codes)
                for (int rot : {0, 1, 2, 3, 5, -1, 6, INT32_MIN, 65537}) {
                    if (is_csc_rot_pair(from, to) && rot >= 0 && rot <= 2) continue;
                    const simgp_img a = src.img(from), b = dst.img(to);
                    ASSERT_EQ(simgp_csc_rot(&a, rot, &b),
                              from == to ? SIMGP_ERR_PARAM : SIMGP_ERR_UNSUPPORTED)
                        << from << " to " << to << " by " << rot;
                }
    }
    EXPECT_EQ(dst.stray_write(), "");
}

}  // namespace
