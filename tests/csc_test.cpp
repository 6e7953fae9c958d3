// The dispatcher: every pair of codes answers as the table says, and reaches its kernel.
#ifdef __linux__
#include <sys/mman.h>
#endif

#include <cstring>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/kept_planes.h"
#include "tests/rig.h"

namespace {

using rig::conversion;
using rig::conversions;

TEST(csc, every_expected_conversion_has_a_test_of_what_it_computes) {
    for (const conversion &c : conversions)
        EXPECT_NE(rig::family_of(c), rig::family::none) << c.name;
}

TEST(csc, pairs_that_convert_reach_their_kernel) {
    constexpr int width = 38, height = 6;
    rig::rng random(rig::seed());
    for (const conversion &p : conversions) {
        SCOPED_TRACE(p.name);
        const auto shapes = rig::shapes_of(p.to, width, height);
        rig::picture src(rig::shapes_of(p.from, width, height)), expected(shapes), got(shapes);
        src.fill(rig::content::random, random);
        expected.fill_pattern(1);
        got.fill_pattern(1);
        rig::call(p.run, src, expected);

        simgp_img from = src.img(p.from), to = got.img(p.to);
        for (int k = 0; k < 4; k++) to.width[k] = 3 - k, to.height[k] = -k;  // never read
        const simgp_img from_before = from, to_before = to;
        EXPECT_EQ(simgp_csc(&from, &to), SIMGP_OK);
        EXPECT_EQ(rig::difference(expected, got), "");
        EXPECT_EQ(got.stray_write(), "");
        EXPECT_EQ(memcmp(&from, &from_before, sizeof from), 0);
        EXPECT_EQ(memcmp(&to, &to_before, sizeof to), 0);
    }
}

// Everything else is refused, and nothing is touched: the planes have no bytes. With the size 0, a
// pair that is served all the same is named, not just the end of the program.
TEST(csc, all_other_pairs_are_refused) {
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    rig::picture src(nothing), dst(nothing);
    dst.fill_pattern(2);
    const std::vector<int> all = rig::format_codes();
    for (int size : {0, 64}) {
        for (int k = 0; k < 4; k++) src.widths[k] = src.heights[k] = size;
        for (int from : all)
            for (int to : all) {
                if (rig::conversion_between(from, to)) continue;
                const simgp_img a = src.img(from), b = dst.img(to);
                ASSERT_EQ(simgp_csc(&a, &b), from == to ? SIMGP_ERR_PARAM : SIMGP_ERR_UNSUPPORTED)
                    << from << " to " << to;
            }
    }
    EXPECT_EQ(dst.stray_write(), "");
}

// The size is that of the source, and an empty one is no error: planes without bytes are left alone.
TEST(csc, an_empty_picture_is_converted_to_nothing) {
    const std::pair<int, int> sizes[] = {{0, 0},   {0, 5},   {5, 0},         {-8, 4},
                                         {8, -3},  {-8, -3}, {INT32_MIN, 4}, {4, INT32_MIN},
                                         {-1, 70}, {70, -1}};
    const std::vector<rig::plane_shape> nothing(4, rig::samples(0, 0));
    for (const conversion &p : conversions)
        rig::for_each_target([&](const rig::target_rows &) {
            for (auto [w, h] : sizes) {
                rig::picture src(nothing), dst(nothing);
                dst.fill_pattern(3);
                simgp_img from = src.img(p.from), to = dst.img(p.to);
                for (int k = 0; k < 4; k++) {
                    const rig::format &f = rig::format_of(p.from);
                    const int across = k ? f.at(rig::channel::u).across : 1;
                    const int down = k ? f.at(rig::channel::u).down : 1;
                    from.width[k] = w > 0 ? (w + across - 1) / across : w / across;
                    from.height[k] = h > 0 ? (h + down - 1) / down : h / down;
                }
                EXPECT_EQ(simgp_csc(&from, &to), SIMGP_OK) << p.name;
                EXPECT_EQ(dst.stray_write(), "") << p.name << ", " << w << " x " << h;
            }
        });
}

#ifdef __linux__  // elsewhere, memory without reserve is another matter
// Pictures whose lines lie 1 GiB apart, up or down, with nothing between them: offsets have more than
// 32 bits. What every entry makes of them is what it makes of packed ones.
class far_apart {
  public:
    static constexpr ptrdiff_t apart = 1 << 30, rows = 72;
    static constexpr size_t size = size_t(uint64_t(apart) * uint64_t(rows));

    far_apart()
        : memory_(mmap(nullptr, size, PROT_READ | PROT_WRITE,
                       MAP_SHARED | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0)) {}
    ~far_apart() {
        if (is_there()) munmap(memory_, size);
    }
    far_apart(const far_apart &) = delete;
    bool is_there() const { return memory_ != MAP_FAILED; }

    // A description of `p` with its planes there, number `first` and on; tiles have no lines.
    simgp_img place(const rig::picture &p, int format, int first, bool bottom_up) const {
        simgp_img img = p.img(format);
        for (int k = 0; k < int(p.parts.size()) && !rig::format_of(format).tiled; k++) {
            img.plane[k] = static_cast<uint8_t *>(memory_) + (first + k) * 4096 +
                           (bottom_up ? (p.parts[size_t(k)].shape().rows - 1) * apart : 0);
            img.stride[k] = int32_t(bottom_up ? -apart : apart);
        }
        return img;
    }
    // Copies the visible bytes of all planes to what `place` gave, or from there.
    static void copy(const rig::picture &p, const simgp_img &img, bool there) {
        for (int k = 0; k < int(p.parts.size()); k++)
            for (ptrdiff_t y = 0; y < p.parts[size_t(k)].shape().rows; y++) {
                uint8_t *const far = img.plane[k] + y * img.stride[k];
                const size_t bytes = size_t(p.parts[size_t(k)].shape().row_bytes);
                if (far != p.row(k, y))
                    memcpy(there ? far : p.row(k, y), there ? p.row(k, y) : far, bytes);
            }
    }

  private:
    void *memory_;
};

TEST(csc, lines_may_lie_farther_apart_than_2_gib_in_all) {
    if (sizeof(void *) < 8) GTEST_SKIP() << "there are no such pictures";
    const far_apart memory;
    if (!memory.is_there()) GTEST_SKIP() << "the system gives no room";
    const struct {
        const char *name;
        int width, height;  // of the destination; sources are 66 x 68
        int32_t (*run)(const simgp_img *, const simgp_img *);
    } entries[] = {
        {"simgp_cpy", 66, 68, simgp_cpy},
        {"simgp_csc", 66, 68, simgp_csc},
        {"simgp_csc_any", 66, 68,
         [](const simgp_img *a, const simgp_img *b) {
             return simgp_csc_any(a, b, SIMGP_COLOUR_BT601 | SIMGP_CHROMA_MEAN);
         }},
        {"simgp_csc_dither", 66, 68, simgp_csc_dither},
        {"simgp_csc_rot", 68, 66,
         [](const simgp_img *a, const simgp_img *b) { return simgp_csc_rot(a, SIMGP_ROT_90L, b); }},
        {"simgp_rot 90r", 68, 66,
         [](const simgp_img *a, const simgp_img *b) { return simgp_rot(a, SIMGP_ROT_90R, b); }},
        {"simgp_rot 180", 66, 68,
         [](const simgp_img *a, const simgp_img *b) { return simgp_rot(a, SIMGP_ROT_180, b); }},
        {"simgp_rsz", 40, 71, simgp_rsz},
        {"simgp_rsz_csc", 40, 71, simgp_rsz_csc},
        {"simgp_rsz_rot", 40, 71,
         [](const simgp_img *a, const simgp_img *b) { return simgp_rsz_rot(a, SIMGP_ROT_90L, b); }},
    };
    rig::rng random(rig::seed());
    int served[std::size(entries)] = {};
    for (const rig::format &from : rig::formats())
        for (const rig::format &to : rig::formats())
            for (size_t i = 0; i < std::size(entries); i++) {
                const auto &e = entries[i];
                // Turns look at the source's format alone, and half chroma makes other planes of it.
                const rig::channel_place &chroma = from.at(rig::channel::u);
                if (strstr(e.name, "rot") && !strstr(e.name, "csc") &&
                    (from.code != to.code || chroma.across != chroma.down))
                    continue;
                const rig::picture src(rig::shapes_of(from.code, 66, 68));
                rig::picture dst(rig::shapes_of(to.code, e.width, e.height)),
                    got(rig::shapes_of(to.code, e.width, e.height));
                for (const rig::plane &p : src.parts)
                    rig::fill_bytes(p.row(0), size_t(p.shape().row_bytes * p.shape().rows),
                                    rig::content::random, random);
                dst.fill_pattern(5);  // not all of it is written by all
                got.fill_pattern(5);
                const simgp_img near_src = src.img(from.code), near_dst = dst.img(to.code);
                if (e.run(&near_src, &near_dst) != SIMGP_OK) continue;
                served[i]++;
                const bool up = random.below(2);
                const simgp_img a = memory.place(src, from.code, 0, up),
                                b = memory.place(got, to.code, 4, !up);
                far_apart::copy(src, a, true);
                far_apart::copy(got, b, true);
                ASSERT_EQ(e.run(&a, &b), SIMGP_OK) << e.name;
                far_apart::copy(got, b, false);
                ASSERT_EQ(rig::difference(dst, got), "")
                    << e.name << ", " << from.code << " to " << to.code;
            }
    for (size_t i = 0; i < std::size(entries); i++) EXPECT_GT(served[i], 1) << entries[i].name;
}
#endif

}  // namespace
