#include "scmn/mem.h"

#include <gtest/gtest.h>
#include <string.h>

#include <algorithm>
#include <vector>

#include "tests/rig.h"

extern "C" {
void *__real_malloc(size_t size);
void *__wrap_malloc(size_t size);
}
static bool refusing = false;
static size_t refused = 0;
void *__wrap_malloc(size_t size) {
    if (!refusing) return __real_malloc(size);
    refused = size;
    return nullptr;
}

namespace {

// What is asked for covers the block, the pointer and the alignment; beyond 32 bits nothing is.
TEST(mem, the_largest_aligned_blocks) {
    constexpr uint32_t more = 32 + sizeof(void *), largest = UINT32_MAX - more;
    for (uint32_t size : {0u, 1u, largest - 1, largest, largest + 1, UINT32_MAX - 31, UINT32_MAX}) {
        refused = 0;
        refusing = true;
        void *const block = scmn_malloc_align32(size);
        refusing = false;
        EXPECT_EQ(block, nullptr) << size;
        EXPECT_EQ(refused, size > largest ? 0 : size_t(size) + more) << size;
    }
}

TEST(mem, aligned_blocks) {
    void *(*const takes[])(uint32_t) = {scmn_malloc_align32, scmn_malloc_fast_align32};
    void (*const gives[])(void *) = {scmn_mfree_align32, scmn_mfree_fast_align32};
    for (uint32_t size : {0u, 1u, 31u, 32u, 33u, 1000u, 1u << 20})
        for (auto take : takes)
            for (auto give : gives) {
                uint8_t *p = static_cast<uint8_t *>(take(size));
                ASSERT_NE(p, nullptr);
                EXPECT_EQ(reinterpret_cast<uintptr_t>(p) % 32, 0u);
                uint8_t *raw;
                memcpy(&raw, p - sizeof raw, sizeof raw);
                EXPECT_GE(p - raw, ptrdiff_t(sizeof raw));
                EXPECT_LE(p - raw, ptrdiff_t(31 + sizeof raw));
                EXPECT_GE(rig::size_of_block(raw), size + 32 + sizeof raw);
                memset(p, 1, size);
                give(p);
            }
    for (auto give : gives) give(nullptr);
    for (auto take : takes)
        for (uint32_t size :
             {UINT32_MAX, UINT32_MAX - 31, uint32_t(UINT32_MAX - 31 - sizeof(void *))})
            EXPECT_EQ(take(size), nullptr) << size;
}

TEST(mem, block_copy) {
    struct {
        int32_t dst_stride, src_stride, width, height;
    } const cases[] = {{40, 50, 33, 7},  {33, 33, 33, 7},   {33, 40, 33, 7}, {-40, 50, 33, 7},
                       {40, -50, 33, 7}, {-33, -33, 33, 7}, {40, 0, 1, 7},   {40, 50, 33, 0},
                       {40, 50, 33, -1}, {40, 50, 0, 7},    {40, 50, -9, 7}, {0, 7, 5, 1}};
    for (const auto &c : cases) {
        const int32_t rows = std::max(c.height, 0), width = std::max(c.width, 0);
        const auto place = [&](int32_t stride) {  // bytes that the rows span
            return rows && width ? size_t(abs(stride) * (rows - 1) + width) : 0;
        };
        const rig::guarded dst(place(c.dst_stride)), src(place(c.src_stride));
        const auto first = [&](const rig::guarded &g, int32_t stride) {
            return stride < 0 && rows ? g.data() - stride * (rows - 1) : g.data();
        };
        for (size_t i = 0; i < src.size(); i++) src.data()[i] = uint8_t(i * 7 + i / 256);
        std::vector<uint8_t> expected(dst.size(), 0xEE);
        std::fill(dst.data(), dst.end(), uint8_t(0xEE));
        uint8_t *to = first(dst, c.dst_stride), *from = first(src, c.src_stride);
        for (int32_t y = 0; y < rows; y++)
            for (int32_t x = 0; x < width; x++)
                expected[size_t(to - dst.data() + y * c.dst_stride + x)] =
                    from[y * c.src_stride + x];
        scmn_blk_mcpy(to, from, c.dst_stride, c.src_stride, c.width, c.height);
        EXPECT_TRUE(std::equal(expected.begin(), expected.end(), dst.data()))
            << c.dst_stride << " " << c.src_stride << " " << c.width << " x " << c.height;
    }
}

// What the fills write for a count: a number of bytes of the pattern, then of its low byte.
struct extent {
    int64_t whole, tail;
};
struct fill_rule {
    const char *name;
    void (*fill)(void *, uint32_t, int32_t);
    extent (*rule)(int64_t count);
};
const fill_rule fills[] = {
    {"x128", scmn_mset_x128,
     [](int64_t n) {
         return extent{n > 0 ? (n + 127) / 128 * 128 : 128, 0};
     }},
    {"x64", scmn_mset_x64,
     [](int64_t n) {
         return extent{n / 128 * 128, 0};
     }},
    {"x64a", scmn_mset_x64a,
     [](int64_t n) {
         return extent{n / 64 * 64, n % 64};
     }},
    {"x32", scmn_mset_x32,
     [](int64_t n) {
         return extent{n / 32 * 32, 0};
     }},
    {"x32ax4", scmn_mset_x32ax4,
     [](int64_t n) {
         return extent{n / 32 * 32, n % 32};
     }},
    {"mclr_x64", [](void *p, uint32_t, int32_t n) { scmn_mclr_x64(p, n); },
     [](int64_t n) {
         return extent{n / 64 * 256, 0};
     }},
};

void check_fill(const fill_rule &f, int32_t count, uint32_t value, size_t gap) {
    extent e = f.rule(count);
    e.whole = std::max<int64_t>(e.whole, 0), e.tail = std::max<int64_t>(e.tail, 0);
    const size_t size = size_t(e.whole + e.tail);
    const rig::guarded buffer(size, gap % 2 ? rig::flush::at_end : rig::flush::at_start, gap);
    const auto room = buffer.room(300);
    std::fill(room.first, room.second, uint8_t(0xEE));
    f.fill(buffer.data(), value, count);
    if (f.fill == fills[5].fill) value = 0;
    size_t good = 0;
    const auto expected = [&](size_t i) {
        return uint8_t(int64_t(i) < e.whole ? value >> i % 4 * 8 : value);
    };
    while (good < size && buffer.data()[good] == expected(good)) good++;
    ASSERT_EQ(good, size) << f.name << ", count " << count << ", gap " << gap;
    const auto untouched = [](uint8_t byte) { return byte == 0xEE; };
    ASSERT_TRUE(std::all_of(room.first, buffer.data(), untouched) &&
                std::all_of(buffer.end(), room.second, untouched))
        << f.name << ", count " << count << ", gap " << gap;
}

TEST(mem, fills) {
    rig::for_each_target([](const rig::target_rows &) {
        rig::rng random(rig::seed());
        const auto value = [&] { return uint32_t(random.next()); };
        for (const fill_rule &f : fills) {
            for (int32_t count = -3; count <= 420; count++)
                check_fill(f, count, value(), size_t(random.below(70)));
            for (int32_t count : {INT32_MIN, 2047, 2048, 2176, 4099, 70000, 70001})
                for (size_t gap : {0, 1, 2, 3, 31, 32, 64, 127}) check_fill(f, count, value(), gap);
        }
        // Large enough for stores past the caches.
        check_fill(fills[2], (33 << 20) + 77, 0x11223344, 7);
    });
}

// By the string store of x86, whether or not this processor is one of those that call it fast.
TEST(mem, fills_with_strings) {
    for (const rig::target_rows &t : rig::all_targets()) {
        simgp::row_table table = *t.rows;
        if (!table.mem.fill_with_strings) continue;
        table.mem.fill = table.mem.fill_with_strings;
        rig::forced rows({t.name, &table});
        for (int32_t count : {64, 2047, 2200, 4099, (1 << 20) + 77, (1 << 20) + 200})
            for (size_t gap = 0; gap < 8; gap++) check_fill(fills[2], count, 0x11223344, gap);
    }
}

TEST(mem, logarithms) {
    EXPECT_EQ(scmn_floor_log2(0), -1);
    EXPECT_EQ(scmn_ceil_log2(0), -1);
    for (int i = 0; i < 32; i++) {
        const uint32_t power = 1u << i;
        EXPECT_EQ(scmn_floor_log2(power), i);
        EXPECT_EQ(scmn_ceil_log2(power), i);
        if (i < 2) continue;
        EXPECT_EQ(scmn_floor_log2(power - 1), i - 1);
        EXPECT_EQ(scmn_ceil_log2(power - 1), i);
        EXPECT_EQ(scmn_floor_log2(power + 1), i);
        EXPECT_EQ(scmn_ceil_log2(power + 1), i + 1);
    }
    EXPECT_EQ(scmn_floor_log2(UINT32_MAX), 31);
    EXPECT_EQ(scmn_ceil_log2(UINT32_MAX), 32);
}

TEST(mem, version) {
    const char *text = scmn_version();
    ASSERT_EQ(strlen(text), 21u);
    char month[4];
    int day, year, hours, minutes, seconds, end = 0;
    ASSERT_EQ(sscanf(text, "%3s %2d %4d %2d:%2d:%2d%n", month, &day, &year, &hours, &minutes,
                     &seconds, &end),
              6);
    EXPECT_EQ(end, 20);
    EXPECT_EQ(text[20], '\n');
    EXPECT_NE(strstr("JanFebMarAprMayJunJulAugSepOctNovDec", month), nullptr);
    EXPECT_EQ(scmn_version(), text);
}

}  // namespace
