// Layout conversions: every kernel at every size on every target, against where the samples belong.
#ifdef __linux__
#include <sys/mman.h>
#include <unistd.h>
#endif

#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/conversions.h"
#include "tests/rig.h"

namespace {

using rig::channel;
using rig::conversion;

TEST(layout, every_kernel_at_every_size_on_every_target) {
    for (const conversion &k : rig::conversions_of(rig::family::layout)) {
        const rig::format &from = rig::format_of(k.from), &to = rig::format_of(k.to);
        const int above = from.at(channel::u).down, below = to.at(channel::u).down;
        ASSERT_EQ(from.at(channel::u).across, to.at(channel::u).across) << k.name;
        rig::check_jobs(k.name, {.max_width = 2 * 130}, [&](int w, int h) {
            const bool halved = above < below;
            const bool doubled = above > below;
            const int chroma_rows = halved    ? h / 2
                                    : doubled ? (h + 1) / 2 * 2
                                              : (h + above - 1) / above;
            rig::job j{rig::shapes_of(k.from, w, h), rig::shapes_of(k.to, w, h), {}, {}};
            if (doubled)  // room for both rows of the last one
                for (size_t i : {1, 2}) j.dst[i] = rig::samples((w + 1) / 2, chroma_rows);
            // From 4:2:2 of odd height, the last chroma row is not written.
            j.holes = halved && h % 2;
            j.run = [=](const rig::picture &src, const rig::picture &dst) {
                rig::call(k.run, src, dst);
            };
            j.reference = [=](const rig::picture &src, const rig::picture &dst) {
                static constexpr channel both[] = {channel::u, channel::v};
                for (int y = 0; y < h; y++) std::copy_n(src.row(0, y), w, dst.row(0, y));
                for (int row = 0; row < chroma_rows; row++)  // a row is for pixels from below * row
                    for (int x = 0; x < w; x++)
                        for (channel c : both)
                            *sample(dst, to, c, x, below * row) =
                                *sample(src, from, c, x, below * row);
            };
            return j;
        });
    }
}

// width x height samples; line y of the destination is line y * below / above of the source.
void copy_samples(const rig::picture &src, const rig::channel_place &from, const rig::picture &dst,
                  const rig::channel_place &to, int width, int height, int above, int below) {
    for (int y = 0; y < height; y++)
        for (int x = 0; x < width; x++)
            dst.row(to.plane, y)[to.first + x * to.step] =
                src.row(from.plane, y * below / above)[from.first + x * from.step];
}

// Chroma has the sizes that the source names, whatever they are: each plane its own, two that are
// packed those of plane 1.
TEST(layout, sizes_of_chroma_are_those_of_the_source) {
    rig::rng random(rig::seed());
    for (const conversion &k : rig::conversions_of(rig::family::layout)) {
        const rig::format &from = rig::format_of(k.from), &to = rig::format_of(k.to);
        const bool apart = !from.is_semi_planar(), packs = to.is_semi_planar();
        const int above = from.at(channel::u).down, below = to.at(channel::u).down;
        std::vector<rig::plane_shape> in = {rig::samples(9, 4), rig::samples(7, 6, apart ? 1 : 2)};
        if (apart) in.push_back(packs ? rig::samples(7, 6) : rig::samples(3, 8));
        const auto made_of = [&](channel c) -> const rig::plane_shape & {
            return in[size_t(from.at(c).plane)];
        };
        std::vector<rig::plane_shape> out = {rig::samples(9, 4)};
        for (size_t p = 1; p < rig::shapes_of(k.to, 2, 2).size(); p++) {
            const auto &shape =
                made_of(to.at(channel::u).plane == int(p) ? channel::u : channel::v);
            out.push_back(rig::samples(shape.width, shape.height * above / below, packs ? 2 : 1));
        }
        rig::picture src(in), dst(out), expected(out);
        src.fill(rig::content::random, random);
        dst.fill_pattern(4);
        for (channel c : {channel::y, channel::u, channel::v}) {
            const rig::channel_place &a = from.at(c), &b = to.at(c);
            const rig::plane_shape &shape = out[size_t(b.plane)];
            copy_samples(src, a, expected, b, shape.width, shape.height,
                         c == channel::y ? 1 : above, c == channel::y ? 1 : below);
        }
        if (packs) src.widths[2] = src.heights[2] = INT32_MAX;
        rig::call(k.run, src, dst);
        EXPECT_EQ(rig::difference(expected, dst), "") << k.name;
        EXPECT_EQ(dst.stray_write(), "") << k.name;
    }
}

#ifdef __linux__  // elsewhere, no file in memory
// More than 2 GiB that take 2 MiB of memory: all pieces but the last are the same.
class large_plane {
  public:
    static constexpr size_t piece = 1 << 20, pieces = 2049;

    large_plane() : memory_(mmap(nullptr, piece * pieces, PROT_NONE, flags, -1, 0)) {
        const int file = memfd_create("plane", 0);
        is_there_ = memory_ != MAP_FAILED && file >= 0 && ftruncate(file, 2 * piece) == 0;
        for (size_t k = 0; k < pieces && is_there_; k++)
            is_there_ =
                mmap(data() + k * piece, piece, PROT_READ | PROT_WRITE, MAP_SHARED | MAP_FIXED,
                     file, k + 1 < pieces ? 0 : piece) != MAP_FAILED;
        if (file >= 0) close(file);
    }
    ~large_plane() {
        if (memory_ != MAP_FAILED) munmap(memory_, piece * pieces);
    }
    large_plane(const large_plane &) = delete;

    bool is_there() const { return is_there_; }
    uint8_t *data() const { return static_cast<uint8_t *>(memory_); }
    uint8_t *last() const { return data() + (pieces - 1) * piece; }

  private:
    static constexpr int flags = MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE;
    void *memory_;
    bool is_there_;
};

// Lines without gaps are one, of more bytes than an int can count.
TEST(layout, planes_of_more_than_2_gib) {
    if (sizeof(void *) < 8) GTEST_SKIP() << "there are no such planes";
    if (rig::quick()) GTEST_SKIP() << "too much for an emulator";
    const large_plane src, dst;
    if (!src.is_there() || !dst.is_there()) GTEST_SKIP() << "the system gives no room";
    constexpr size_t piece = large_plane::piece;
    constexpr int32_t width = 1 << 16, height = int32_t(large_plane::pieces * piece / width);
    rig::rng random(rig::seed());
    rig::fill_bytes(src.data(), piece, rig::content::random, random);
    rig::fill_bytes(src.last(), piece, rig::content::random, random);
    simgp_cpy_8b(src.data(), width, height, width, width, dst.data());
    EXPECT_EQ(memcmp(dst.data(), src.data(), piece), 0);
    EXPECT_EQ(memcmp(dst.last(), src.last(), piece), 0);

    simgp_tbl_fn_rot_8b[SIMGP_ROT_180](src.data(), width, height, width, width, dst.data());
    for (size_t i = 0; i < piece; i++) ASSERT_EQ(dst.last()[i], src.data()[piece - 1 - i]) << i;

    simgp_csc_8b8b_pck(src.data(), src.data() + 1, width / 2, height, width / 2, width / 2, width,
                       dst.data());
    const uint8_t *const end = src.data() + (large_plane::pieces * piece) / 2;
    for (size_t i = 0; i < piece / 2; i++) {
        ASSERT_EQ(dst.last()[2 * i], end[i - piece / 2]) << i;
        ASSERT_EQ(dst.last()[2 * i + 1], end[i + 1 - piece / 2]) << i;
    }
}
#endif

// Planes
// -----------------------------------------------------------------------------------------

TEST(layout, pairs_are_taken_apart_to_the_last_odd_byte) {
    rig::check_jobs("simgp_csc_8b8b_unpck", {.max_width = 4 * 64 + 3}, [](int w, int h) {
        return rig::job{{rig::samples(w, h)},
                        {rig::samples((w + 1) / 2, h), rig::samples(w / 2, h)},
                        [=](const rig::picture &src, const rig::picture &dst) {
                            simgp_csc_8b8b_unpck(src.planes[0], w, h, src.strides[0],
                                                 dst.strides[0], dst.strides[1], dst.planes[0],
                                                 dst.planes[1]);
                        },
                        [=](const rig::picture &src, const rig::picture &dst) {
                            for (int y = 0; y < h; y++)
                                for (int x = 0; x < w; x++)
                                    dst.row(x % 2, y)[x / 2] = src.row(0, y)[x];
                        }};
    });
}

// Lines of a that overlap are written from top to bottom, each with its last odd byte.
TEST(layout, the_odd_byte_of_a_line_goes_under_the_next_line) {
    constexpr int width = 71, height = 5, pairs = width / 2;
    uint8_t src[height * width], a[height * (pairs + 1)], b[height * pairs];
    for (int i = 0; i < height * width; i++) src[i] = uint8_t(i * 37);
    for (int stride : {pairs, pairs - 3, 1}) {
        std::vector<uint8_t> expected(sizeof a);
        for (int y = 0; y < height; y++)
            for (int i = 0; i <= pairs; i++)
                expected[size_t(y * stride + i)] = src[y * width + 2 * i];
        rig::for_each_target([&](const rig::target_rows &) {
            memset(a, 0, sizeof a);
            simgp_csc_8b8b_unpck(src, width, height, width, stride, pairs, a, b);
            EXPECT_EQ(memcmp(a, expected.data(), sizeof a), 0) << "stride " << stride;
        });
    }
}

TEST(layout, two_planes_are_interleaved) {
    rig::check_jobs("simgp_csc_8b8b_pck", {}, [](int w, int h) {
        return rig::job{{rig::samples(w, h), rig::samples(w, h)},
                        {rig::samples(w, h, 2)},
                        [=](const rig::picture &src, const rig::picture &dst) {
                            simgp_csc_8b8b_pck(src.planes[0], src.planes[1], w, h, src.strides[0],
                                               src.strides[1], dst.strides[0], dst.planes[0]);
                        },
                        [=](const rig::picture &src, const rig::picture &dst) {
                            for (int y = 0; y < h; y++)
                                for (int x = 0; x < 2 * w; x++)
                                    dst.row(0, y)[x] = src.row(x % 2, y)[x / 2];
                        }};
    });
}

TEST(layout, planes_of_half_and_twice_the_rows) {
    const auto repeat = [](int times) {  // times / 2 rows for each row of the source
        return [=](const rig::picture &src, const rig::picture &dst) {
            for (int y = 0; y < dst.parts[0].shape().rows; y++)
                std::copy_n(src.row(0, 2 * y / times), src.widths[0], dst.row(0, y));
        };
    };
    rig::check_plane_fn(
        "simgp_csc_1x2_to_1x1", simgp_csc_1x2_to_1x1, 1,
        [](int w, int h) { return rig::samples(w, h / 2); }, {}, repeat(1));
    rig::check_plane_fn(
        "simgp_csc_1x1_to_1x2", simgp_csc_1x1_to_1x2, 1,
        [](int w, int h) { return rig::samples(w, 2 * h); }, {}, repeat(4));
}

TEST(layout, rows_are_halved_and_doubled) {
    const uint8_t src[] = "aaa.bbb.ccc.ddd.eee";
    char got[33];
    const auto run = [&](simgp_plane_fn *kernel, const uint8_t *from, int width, int height,
                         int src_stride, int dst_stride, int first) {
        memset(got, '-', 32);
        got[32] = 0;
        kernel(from, width, height, src_stride, dst_stride, got + first);
        return got;
    };
    const auto halve = simgp_csc_1x2_to_1x1, twice = simgp_csc_1x1_to_1x2;
    EXPECT_STREQ(run(halve, src, 3, 4, 4, 3, 0), "aaaccc--------------------------");
    EXPECT_STREQ(run(halve, src, 3, 5, 4, 5, 1), "-aaa--ccc-----------------------");
    EXPECT_STREQ(run(halve, src, 3, 1, 4, 4, 0), "--------------------------------");
    EXPECT_STREQ(run(halve, src + 12, 2, 4, -4, 4, 0), "dd--bb--------------------------");
    EXPECT_STREQ(run(twice, src, 3, 2, 4, 3, 0), "aaaaaabbbbbb--------------------");
    EXPECT_STREQ(run(twice, src + 4, 2, 2, 8, -5, 20), "-----dd---dd---bb---bb----------");
}

TEST(layout, empty_planes_are_left_alone) {
    for (auto [w, h] : {std::pair(0, 4), {4, 0}, {-4, 4}, {4, -4}, {-1, -1}, {4, INT32_MIN}}) {
        uint8_t src[64] = {}, dst[64];
        memset(dst, 7, sizeof dst);
        simgp_csc_1x2_to_1x1(src, w, h, 4, 4, dst);
        simgp_csc_1x1_to_1x2(src, w, h, 4, 4, dst);
        simgp_csc_8b8b_pck(src, src, w, h, 4, 4, 8, dst);
        simgp_csc_8b8b_unpck(src, w, h, 8, 4, 4, dst, dst + 32);
        EXPECT_EQ(std::count(dst, dst + 64, 7), 64) << w << " x " << h;
    }
}

}  // namespace
