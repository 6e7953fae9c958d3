// The choice of the instruction set.
#include "rows/choose.h"

#include <atomic>
#include <cstdlib>
#include <thread>

#include "tests/rig.h"

namespace {

using simgp::target;

target best_available() {
    for (int t = int(target::count) - 1; t > 0; t--)
        if (simgp::target_available(target(t))) return target(t);
    return target::scalar;
}

// The first test of this program, so that its threads make the first call.
TEST(choice, threads_that_race_for_the_first_call_agree) {
    constexpr int count = 8;
    std::atomic<int> ready = 0;
    const simgp::row_table *seen[count];
    std::vector<std::thread> threads;
    for (int i = 0; i < count; i++)
        threads.emplace_back([&, i] {
            for (ready++; ready < count;) std::this_thread::yield();
            seen[i] = &simgp::live_rows();
        });
    for (std::thread &t : threads) t.join();
    for (const simgp::row_table *rows : seen) {
        EXPECT_EQ(rows, &simgp::rows_of(best_available()));
        EXPECT_NE(rows->yuv2rgb.row[0][size_t(simgp::yuv_layout::half)][0], nullptr);
    }
}

TEST(choice, is_the_best_that_the_processor_has) {
    EXPECT_TRUE(simgp::target_available(target::scalar));
    EXPECT_EQ(simgp::live_target(), best_available());
    printf("live rows: %s\n", simgp::target_name(simgp::live_target()));
}

TEST(choice, is_the_expected_one) {
    const char *expected = getenv("SIMGP_TEST_EXPECT_TARGET");
    if (expected && *expected) {
        EXPECT_STREQ(simgp::target_name(simgp::live_target()), expected);
    }
}

TEST(choice, can_be_forced_and_given_back) {
    for (const rig::target_rows &t : rig::all_targets()) {
        rig::forced rows(t);
        EXPECT_EQ(&simgp::live_rows(), t.rows);
    }
    EXPECT_EQ(simgp::live_target(), best_available());
}

// A target has rows of its own, not those of another under a new name.
TEST(choice, every_target_has_its_own_rows) {
    if (__BYTE_ORDER__ != __ORDER_LITTLE_ENDIAN__) GTEST_SKIP() << "there are scalar rows only";
    const auto &all = rig::all_targets();
    for (size_t i = 0; i < all.size(); i++)
        for (size_t k = 0; k < i; k++)
            EXPECT_NE(all[i].rows->layout.pack, all[k].rows->layout.pack)
                << all[i].name << ", " << all[k].name;
}

}  // namespace
