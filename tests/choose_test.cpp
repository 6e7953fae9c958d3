// The choice of the instruction set.
#include "rows/choose.h"

#if defined(__x86_64__) || defined(__i386__)
#include <cpuid.h>
#endif
#ifdef __linux__
#include <sys/auxv.h>
#endif

#include <atomic>
#include <cstdlib>
#include <fstream>
#include <sstream>
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

// What the kernel says of the processor, which it finds out in its own way. An emulated processor is
// not the one in /proc/cpuinfo.
target best_of_the_kernel() {
    const auto flagged = [](const char *flag) {
        std::ifstream info("/proc/cpuinfo");
        std::string word, line;
        while (std::getline(info, line))
            if (line.rfind("flags", 0) == 0) {
                std::istringstream words(line);
                while (words >> word)
                    if (word == flag) return true;
                return false;
            }
        return false;
    };
    (void)flagged;
#ifdef SIMGP_HAVE_avx512
    bool all = true;
    for (const char *flag : {"avx512f", "avx512bw", "avx512dq", "avx512vl", "avx512vbmi"})
        all = all && flagged(flag);
    if (all) return target::avx512;
#endif
#ifdef SIMGP_HAVE_avx2
    if (flagged("avx2")) return target::avx2;
#endif
#ifdef SIMGP_HAVE_sse41
    if (flagged("sse4_1")) return target::sse41;
#endif
#ifdef SIMGP_HAVE_neon
    if (sizeof(void *) == 8 || (getauxval(AT_HWCAP) & 1u << 12)) return target::neon;
#endif
    return target::scalar;
}

TEST(choice, is_the_best_that_the_processor_has) {
    EXPECT_TRUE(simgp::target_available(target::scalar));
    EXPECT_EQ(simgp::live_target(), best_available());
    const char *const live = simgp::target_name(simgp::live_target());
    printf("live rows: %s\n", live);
    const char *const expected = getenv("SIMGP_TEST_EXPECT_TARGET");
    const char *const emulator = getenv("SIMGP_EMULATE");
    if (expected && *expected) {
        EXPECT_STREQ(live, expected);
    } else if (!emulator || !*emulator) {
        EXPECT_STREQ(live, simgp::target_name(best_of_the_kernel()));
    }
}

// The build's list of targets has no name that the choice does not know.
TEST(choice, knows_every_target_that_is_compiled) {
    std::istringstream compiled(SIMGP_TARGETS);
    std::string name;
    while (compiled >> name) {
        bool known = false;
        for (int t = 0; t < int(target::count); t++)
            known = known || simgp::target_name(target(t)) == name;
        EXPECT_TRUE(known) << name;
    }
}

// Each bit that a target needs is looked at: without it the processor has the next lower one.
#if defined(__x86_64__) || defined(__i386__)
TEST(choice, follows_the_words_of_the_processor) {
    constexpr uint32_t sse41 = 1u << 19, osxsave = 1u << 27;                         // leaf 1, ECX
    constexpr uint32_t avx2 = 1u << 5, erms = 1u << 9, f = 1u << 16, dq = 1u << 17;  // leaf 7, EBX
    constexpr uint32_t bw = 1u << 30, vl = 1u << 31, vbmi = 1u << 1;                 // and ECX
    constexpr uint32_t all7 = avx2 | erms | f | dq | bw | vl;
    const struct {
        simgp::cpuid_words words;
        const char *has;
    } cases[] = {
        {{0, 0, 0, 0}, ""},
        {{~sse41, ~0u, ~0u, ~0u}, "avx2 avx512 erms "},
        {{sse41, 0, 0, 0}, "sse41 "},
        {{sse41, erms, 0, 0}, "sse41 erms "},
        {{sse41, ~0u, ~0u, ~0u}, "sse41 erms "},  // without OSXSAVE no word of saved states
        {{sse41 | osxsave, avx2, 0, 6}, "sse41 avx2 "},
        {{sse41 | osxsave, avx2, 0, 2}, "sse41 "},
        {{sse41 | osxsave, avx2, 0, 4}, "sse41 "},
        {{sse41 | osxsave, ~avx2, 0, 6}, "sse41 erms "},
        {{sse41 | osxsave, all7, vbmi, 0xE6}, "sse41 avx2 avx512 erms "},
        {{sse41 | osxsave, all7, vbmi, 0xE7}, "sse41 avx2 avx512 erms "},
        {{sse41 | osxsave, all7, vbmi, 0x66}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7, vbmi, 0xA6}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7, vbmi, 0xC6}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7, vbmi, 0xE2}, "sse41 erms "},
        {{sse41 | osxsave, all7, ~vbmi, 0xE6}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7 & ~f, vbmi, 0xE6}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7 & ~dq, vbmi, 0xE6}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7 & ~bw, vbmi, 0xE6}, "sse41 avx2 erms "},
        {{sse41 | osxsave, all7 & ~vl, vbmi, 0xE6}, "sse41 avx2 erms "},
    };
    for (const auto &c : cases) {
        const simgp::cpu has = simgp::features_of(c.words);
        EXPECT_FALSE(has.neon);
        EXPECT_EQ(std::string(has.sse41 ? "sse41 " : "") + (has.avx2 ? "avx2 " : "") +
                      (has.avx512 ? "avx512 " : "") + (has.fast_strings ? "erms " : ""),
                  c.has)
            << &c - cases;
    }
}

TEST(choice, string_stores_are_for_processors_with_fast_ones) {
    unsigned eax = 0, ebx = 0, ecx = 0, edx = 0;
    __get_cpuid_count(7, 0, &eax, &ebx, &ecx, &edx);
    for (int t = 0; t < int(target::count); t++) {
        const simgp::mem_rows &rows = simgp::rows_of(target(t)).mem;
        if (!simgp::target_available(target(t)) || !rows.fill_with_strings) continue;
        EXPECT_EQ(rows.fill == rows.fill_with_strings, (ebx >> 9 & 1) != 0)
            << simgp::target_name(target(t));
    }
}
#endif

TEST(choice, can_be_forced_and_given_back) {
    for (const rig::target_rows &t : rig::all_targets()) {
        rig::forced rows(t);
        EXPECT_EQ(&simgp::live_rows(), t.rows);
    }
    EXPECT_EQ(simgp::live_target(), best_available());
}

// Rows shorter than a vector are left to the widest vectors that they fill, if the processor has any.
TEST(choice, short_rows_go_to_shorter_vectors) {
    using simgp::rows_of;
    for (const rig::target_rows &t : rig::all_targets()) {
        rig::forced rows(t);
        for (ptrdiff_t width : {-3, 0, 1, 31, 32, 63, 64, 1000}) {
            const simgp::row_table *expected = t.rows;
            if (t.name == std::string("avx512") && width < 64) expected = &rows_of(target::avx2);
            if (expected == &rows_of(target::avx2) && width < 32)
                expected = &rows_of(target::sse41);
            EXPECT_EQ(&simgp::live_rows(width), expected) << t.name << ", " << width;
        }
    }
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
