// First use of the library by many threads at once. The preset `thread` looks for data races here.
#include <sys/wait.h>
#include <unistd.h>

#include <barrier>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "scmn/scmn.h"
#include "simgp/simgp.h"

namespace {

constexpr int count = 16;

// Runs work(0) ... work(count - 1) on threads that start together.
void at_once(const std::function<void(int)> &work) {
    std::barrier<> start(count);
    std::vector<std::thread> threads;
    for (int i = 0; i < count; i++)
        threads.emplace_back([&, i] {
            start.arrive_and_wait();
            work(i);
        });
    for (std::thread &t : threads) t.join();
}

// The library chooses its rows once in a process, so each round has a process of its own. This one,
// which never calls the library, must stay as it is.
void in_fresh_processes(const std::function<bool()> &succeeds) {
    const int rounds = getenv("SIMGP_TEST_QUICK") ? 10 : 100;
    for (int i = 0; i < rounds; i++) {
        fflush(nullptr);
        const pid_t child = fork();
        ASSERT_NE(child, -1);
        if (child == 0) _exit(succeeds() ? 0 : 1);
        int status = -1;
        ASSERT_EQ(waitpid(child, &status, 0), child);
        ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << "round " << i;
    }
}

constexpr int width = 332, rows_each = 6, height = count * rows_each;

struct frame {
    std::vector<uint8_t> y, u, v, rgb;
    frame() : y(width * height), u(width * height / 4), v(u), rgb(2 * width * height) {
        uint32_t n = 1;
        for (auto *plane : {&y, &u, &v})
            for (uint8_t &sample : *plane) sample = uint8_t((n = n * 1664525 + 1013904223) >> 24);
    }
    // Converts `rows` rows from row `first` on.
    int32_t convert(int first, int rows) {
        simgp_img src{}, dst{};
        src.format = SIMGP_FMT_YUV420;
        src.width[0] = src.stride[0] = width;
        src.height[0] = rows;
        for (int k : {1, 2}) {
            src.width[k] = src.stride[k] = width / 2;
            src.height[k] = rows / 2;
        }
        src.plane[0] = y.data() + width * first;
        src.plane[1] = u.data() + width / 2 * (first / 2);
        src.plane[2] = v.data() + width / 2 * (first / 2);
        dst.format = SIMGP_FMT_RGB565;
        dst.stride[0] = 2 * width;
        dst.plane[0] = rgb.data() + 2 * width * first;
        return simgp_csc(&src, &dst);
    }
};

TEST(threads, bands_of_one_picture) {
    in_fresh_processes([] {
        frame shared, alone;
        int32_t result[count];
        at_once([&](int i) { result[i] = shared.convert(i * rows_each, rows_each); });
        for (int32_t r : result)
            if (r != SIMGP_OK) return false;
        return alone.convert(0, height) == SIMGP_OK && shared.rgb == alone.rgb;
    });
}

// Functions of every kind of rows, and the one that writes a buffer of the library.
std::vector<uint8_t> work(int i) {
    std::vector<uint8_t> from(64 * 64 * 4), to(from.size());
    for (size_t k = 0; k < from.size(); k++) from[k] = uint8_t(k * k >> 3);
    from[900] = from[901] = 0;
    from[902] = 1;
    uint8_t *const p = to.data();
    int32_t x, y;
    switch (i % 8) {
        case 0:
            scmn_mset_x32ax4(p, 0x01020304, 999);
            break;
        case 1:
            simgp_rot_8b_90l(from.data(), 64, 64, 64, 64, p);
            break;
        case 2:
            simgp_dit_8b(from.data(), 64, 64, 64, 64, p);
            break;
        case 3:
            simgp_rsz_get_step(64, 64, 50, 80, SIMGP_ROT_NONE, &x, &y);
            simgp_rsz_8b(from.data(), 64, 50, 80, 50, p, x, y);
            break;
        case 4:
            simgp_csc_8b8b_pck(from.data(), p + 8192, 64, 64, 64, 64, 128, p);
            break;
        case 5:
            to = from;
            simgp_dbf8x8(to.data(), 12, 64, 64, 64);
            break;
        case 6:
            p[0] = uint8_t(scmn_is_vkeyfrm(SCMN_MT_H264, from.data(), 4096));
            break;
        case 7:
            strcpy(reinterpret_cast<char *>(p), std::to_string(scmn_version() != nullptr).c_str());
    }
    return to;
}

TEST(threads, functions_of_all_kinds) {
    in_fresh_processes([] {
        std::vector<uint8_t> results[count];
        at_once([&](int i) { results[i] = work(i); });
        for (int i = 0; i < count; i++)
            if (results[i] != work(i)) return false;
        return true;
    });
}

}  // namespace
