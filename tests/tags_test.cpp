#include <gtest/gtest.h>

#include "tests/tag_table.h"

namespace {

// Every known tag, and its neighbours: one bit or one letter's case away, one more, one less.
TEST(tags, known_tags_and_their_neighbours) {
    for (const auto *table : {&tag_table::audio, &tag_table::video})
        for (const auto &[tag, type] : *table) {
            EXPECT_TRUE(tag_table::agrees(tag)) << std::hex << tag;
            EXPECT_EQ(scmn_fcc2mt(tag), type);
            for (int bit = 0; bit < 32; bit++)
                EXPECT_TRUE(tag_table::agrees(tag ^ 1u << bit)) << std::hex << (tag ^ 1u << bit);
            for (uint32_t cases = 0; cases < 16; cases++) {
                const uint32_t letters = (cases & 1 ? 0x20 : 0) | (cases & 2 ? 0x2000 : 0) |
                                         (cases & 4 ? 0x200000 : 0) | (cases & 8 ? 0x20000000 : 0);
                EXPECT_TRUE(tag_table::agrees(tag ^ letters)) << std::hex << (tag ^ letters);
            }
            EXPECT_TRUE(tag_table::agrees(tag + 1) && tag_table::agrees(tag - 1));
            EXPECT_TRUE(tag_table::agrees(__builtin_bswap32(tag)));
        }
    for (uint32_t tag = 0; tag < 0x12000; tag++) ASSERT_TRUE(tag_table::agrees(tag)) << tag;
}

TEST(tags, names_are_the_numbers_of_the_interface) {
    EXPECT_EQ(SCMN_FOURCC('a', 'v', 'c', '1'), 0x31637661u);
    EXPECT_EQ(SCMN_FOURCC('\xFF', '\x80', 0, '\xFE'), 0xFE0080FFu);
    EXPECT_EQ(scmn_fcc2mt(SCMN_FOURCC('D', 'I', 'V', 'X')), SCMN_MT_MPEG4);
    EXPECT_EQ(scmn_fcc2mt_drm(SCMN_FOURCC('D', 'I', 'V', 'X')), SCMN_MT_DRM);
    EXPECT_EQ(scmn_fcc2mt(SCMN_FOURCC('A', 'v', 'c', '1')), SCMN_MT_NONE);
    EXPECT_EQ(scmn_fcc2mt_aud(0x162), SCMN_MT_WMAPRO);
}

}  // namespace
