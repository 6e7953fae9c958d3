#include "scmn/keyframe.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <initializer_list>
#include <vector>

#include "scmn/tags.h"
#include "tests/keyframe_rule.h"
#include "tests/rig.h"

namespace {

int32_t key(int32_t type, std::initializer_list<int> bytes) {
    const rig::guarded buffer(bytes.size());
    std::copy(bytes.begin(), bytes.end(), buffer.data());
    return scmn_is_vkeyfrm(type, buffer.data(), int32_t(bytes.size()));
}

TEST(keyframe, known_headers) {
    // MPEG-4: alone, behind other headers, too short.
    EXPECT_EQ(key(SCMN_MT_MPEG4, {0, 0, 1, 0xB6, 0x10}), 1);
    EXPECT_EQ(key(SCMN_MT_MPEG4, {0, 0, 1, 0xB6, 0x50}), 0);
    EXPECT_EQ(key(SCMN_MT_MPEG4, {0, 0, 1, 0x20, 8, 0, 0, 1, 0xB6, 0x3F}), 1);
    EXPECT_EQ(key(SCMN_MT_MPEG4, {0, 0, 1, 0xB6, 0x90, 0, 0, 1, 0xB6, 0x10}), 0);
    EXPECT_EQ(key(SCMN_MT_MPEG4, {0, 0, 1, 0xB6}), 0);
    // H.264: parameter sets are passed over, the first slice decides.
    EXPECT_EQ(key(SCMN_MT_H264, {0, 0, 0, 1, 0x67, 9, 0, 0, 0, 1, 0x68, 9, 0, 0, 1, 0x65}), 1);
    EXPECT_EQ(key(SCMN_MT_H264, {0, 0, 0, 1, 0x67, 9, 0, 0, 0, 1, 0x68, 9}), 0);
    EXPECT_EQ(key(SCMN_MT_H264, {0, 0, 1, 0x41, 0, 0, 1, 0x65}), 0);
    EXPECT_EQ(key(SCMN_MT_H264, {0, 0, 1}), 0);
    // H.263: intra and inter; the extended type with and without its optional part.
    for (int32_t type : {int32_t(SCMN_MT_H263), int32_t(111)}) {
        EXPECT_EQ(key(type, {0, 0, 0x80, 0x02, 0x08, 0, 0}), 1);
        EXPECT_EQ(key(type, {0, 0, 0x83, 0x02, 0x0A, 0, 0}), 0);
        EXPECT_EQ(key(type, {0, 0, 0x84, 0x02, 0x08, 0, 0}), 0);
        EXPECT_EQ(key(type, {0, 0, 0x80, 0x02, 0x1C, 0x00, 0xFF, 0xFF}), 1);
        EXPECT_EQ(key(type, {0, 0, 0x80, 0x02, 0x1C, 0x10, 0xFF, 0xFF}), 0);
        EXPECT_EQ(key(type, {0, 0, 0x80, 0x02, 0x1C, 0xFF, 0xFF, 0xE3}), 1);
        EXPECT_EQ(key(type, {0, 0, 0x80, 0x02, 0x1C, 0xFF, 0xFF, 0xE7}), 0);
        EXPECT_EQ(key(type, {0, 0, 0x80, 0x02, 0x1C, 0xFF, 0xFF}),
                  0);  // the deciding byte is missing
    }
    // One byte decides, if there is one.
    EXPECT_EQ(key(SCMN_MT_WMV2, {0x7F}), 1);
    EXPECT_EQ(key(SCMN_MT_WMV2, {0x80}), 0);
    for (int32_t type : {SCMN_MT_WMV1, SCMN_MT_DIV3}) {
        EXPECT_EQ(key(type, {0x3F}), 1);
        EXPECT_EQ(key(type, {0x40}), 0);
    }
    for (int32_t type = -1; type < 1300; type++) EXPECT_EQ(key(type, {}), 0);
    EXPECT_EQ(scmn_is_vkeyfrm(SCMN_MT_WMV1, nullptr, -5), 0);
    for (int32_t type : {0, 101, 107, 108, 109, 112, 299, 300, 1100})
        EXPECT_EQ(key(type, {0, 0, 1, 0x65, 0, 0, 1, 0xB6, 0, 0, 0, 0x80, 2, 8, 0, 0}), 0);
}

// Bytes that start codes are made of, at every length, up to the last byte of readable memory.
TEST(keyframe, rules_hold_for_any_bytes) {
    rig::for_each_target([](const rig::target_rows &) {
        int found = 0;
        for (uint32_t round = 0; round < 4000; round++) {
            rig::rng random(rig::seed() + uint64_t(round) * 1000);
            const size_t size = size_t(random.below(round % 8 ? 24 : 700));
            const rig::guarded buffer(size, round % 2 ? rig::flush::at_end : rig::flush::at_start);
            static const uint8_t likely[] = {0,    0,    0,    0,    0,    1,   1,
                                             0xB6, 0x65, 0x41, 0x80, 0x83, 0x1C};
            for (size_t i = 0; i < size; i++)
                buffer.data()[i] =
                    random.below(8) ? likely[random.below(sizeof likely)] : uint8_t(random.next());
            for (int32_t type = 101; type <= 112; type++) {
                const int expected = keyframe_rule::of(type, buffer.data(), int64_t(size));
                ASSERT_EQ(scmn_is_vkeyfrm(type, buffer.data(), int32_t(size)), expected)
                    << "type " << type << ", round " << round << " of seed " << rig::seed();
                found += expected;
            }
        }
        EXPECT_GT(found, 4000);  // the bytes above do make key frames
    });
}

// A code at every place of every short buffer and of some that take many steps, among zero pairs that are
// none, and none at all.
TEST(keyframe, search_finds_the_first_code) {
    rig::for_each_target([](const rig::target_rows &target) {
        // Zeros, the code byte, both and neither take turns in one buffer of four.
        const auto mixed = [](ptrdiff_t i) -> uint8_t {
            switch (i / 304 % 4) {
                case 0:
                    return 0;
                case 1:
                    return 7;
                case 2:
                    return i % 2 ? 0x83 : 0;
                default:
                    return 0x83;
            }
        };
        for (ptrdiff_t count = 0; count <= 2600; count += count < 140 ? 1 : count < 330 ? 17 : 753)
            for (ptrdiff_t at = 0; at <= count; at++) {
                const ptrdiff_t kind = (count + at) % 4;
                const rig::guarded buffer(size_t(count) + 2,
                                          at % 2 ? rig::flush::at_end : rig::flush::at_start);
                uint8_t *b = buffer.data();
                for (ptrdiff_t i = 0; i < count + 2; i++)
                    b[i] = kind == 0 ? 0 : kind == 1 ? mixed(i) : uint8_t(1 + i % 255);
                if (at < count) b[at] = b[at + 1] = 0, b[at + 2] = 0x83;
                ASSERT_EQ(target.rows->keyframe.find_code(b, count, 0xFC, 0x80), at)
                    << "of " << count;
                ASSERT_EQ(target.rows->keyframe.find_code(b, count, 0xFF, 0x82), count);
            }
    });
}

}  // namespace
