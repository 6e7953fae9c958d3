// The rig sees what it is there to see: copies of a plane, each with one fault.
#include "tests/rig.h"

#include <gtest/gtest-spi.h>

#include <cstring>

namespace {

using rig::picture;

void copy(const picture &src, const picture &dst) {
    for (ptrdiff_t y = 0; y < dst.parts[0].shape().rows; y++)
        memcpy(dst.row(0, y), src.row(0, y), size_t(dst.parts[0].shape().row_bytes));
}

uint8_t *last(const picture &p) {
    const rig::plane_shape &s = p.parts[0].shape();
    return p.row(0, s.rows - 1) + s.row_bytes - 1;
}

bool vector_rows() { return &simgp::live_rows() != &simgp::rows_of(simgp::target::scalar); }

bool check(const std::function<void(const picture &, const picture &)> &fault) {
    return rig::check_jobs("copy", {}, [&](int width, int height) {
        return rig::job{{rig::samples(width, height)},
                        {rig::samples(width, height)},
                        [=](const picture &src, const picture &dst) {
                            copy(src, dst);
                            fault(src, dst);
                        },
                        nullptr};
    });
}

TEST(rig, passes_what_is_right) {
    EXPECT_TRUE(check([](const picture &, const picture &) {}));
}

TEST(rig, sees_a_wrong_byte) {
    EXPECT_NONFATAL_FAILURE(check([](const picture &, const picture &dst) {
                                if (vector_rows() && dst.widths[0] == 17) *last(dst) ^= 1;
                            }),
                            "lanes rows");
}

// Not even by the scalar rows.
TEST(rig, sees_a_byte_that_is_not_written) {
    EXPECT_NONFATAL_FAILURE(rig::check_jobs("copy", {},
                                            [](int width, int height) {
                                                return rig::job{
                                                    {rig::samples(width, height)},
                                                    {rig::samples(width, height)},
                                                    [](const picture &src, const picture &dst) {
                                                        const uint8_t before = *last(dst);
                                                        copy(src, dst);
                                                        *last(dst) = before;
                                                    },
                                                    nullptr};
                                            }),
                            "expected 0x");
}

TEST(rig, sees_a_byte_of_padding_written) {
    EXPECT_NONFATAL_FAILURE(check([](const picture &, const picture &dst) {
                                if (dst.heights[0] > 1 && dst.strides[0] > dst.widths[0])
                                    dst.row(0, 0)[dst.widths[0]] ^= 0x10;
                            }),
                            "was written");
}

TEST(rig, sees_a_byte_before_the_plane_written) {
    EXPECT_NONFATAL_FAILURE(
        check([](const picture &, const picture &dst) {
            static int calls = 0;  // the first plane lies flush at its end, so there is room before
            if (calls++ == 0) dst.parts[0].row(0)[-1] ^= 1;
        }),
        "was written");
}

TEST(rig, sees_a_source_written) {
    EXPECT_NONFATAL_FAILURE(check([](const picture &src, const picture &) { *last(src) ^= 1; }),
                            "the source was written");
}

// Touches a byte so that no compiler leaves it out.
void touch(const uint8_t *p) { (void)*static_cast<const volatile uint8_t *>(p); }

using rig_death = testing::Test;

TEST(rig_death, a_byte_behind_the_plane_ends_the_program) {
    EXPECT_DEATH(check([](const picture &src, const picture &) { touch(last(src) + 1); }),
                 "copy, 1 x 1");
}

TEST(rig_death, a_byte_before_the_plane_ends_the_program) {
    const rig::guarded memory(100, rig::flush::at_start);
    touch(memory.data());
    EXPECT_DEATH(touch(memory.data() - 1), "");
}

#ifdef __SANITIZE_ADDRESS__
TEST(rig_death, under_address_sanitizer_a_byte_of_padding_does_too) {
    rig::placement padded;
    padded.padding = 32;
    picture p({rig::samples(40, 3)}, padded);
    p.parts[0].forbid_padding();
    touch(p.row(0, 1) + 39);
    EXPECT_DEATH(touch(p.row(0, 1) + 40), "use-after-poison");
}
#endif

}  // namespace
