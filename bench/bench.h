// The frame of the benchmarks: a comparison is one operation at one size, done by our rows of
// several targets, by the peers, and by memcpy and memset of the same bytes, all in one rotation.
//
// A machine is never quiet, so contenders are not measured one after the other. A round runs a
// short batch of each, in an order that changes from round to round; every figure is the median
// over the rounds, and ratios are taken within a round before the median is. What disturbs the
// machine for longer than a round disturbs all contenders alike; what is shorter falls out of the
// median.
#ifndef BENCH_BENCH_H
#define BENCH_BENCH_H

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "simgp/img.h"

namespace bench {

// What a comparison has to reach; 0 where nothing is asked. All are quotients of speeds, ours
// divided by the other's.
struct goal {
    double peer = 0;    // against the fastest peer
    double scalar = 4;  // against our scalar rows
    double limit = 0;   // against memcpy and memset of the same bytes
};

struct contender {
    std::string name;
    std::function<void()> run;
};

// One operation at one size, ready to run. The closures keep alive what they work on.
struct match {
    double units;                  // pixels of the destination (or bytes) that a run deals with
    std::function<void()> ours;    // run once for every target
    std::vector<contender> peers;  // what `ours` is held against
    std::function<void()> limit;   // memory traffic of the same bytes; may be empty
    goal goals;

    // Other work of ours whose speed this one should keep, such as the same at a rounder size; run
    // with the same target's rows.
    struct {
        std::string name;
        std::function<void()> run;  // may be empty
        double units = 0, goal = 0;
        std::function<void()> restore = {};
    } twin = {};

    // Puts back what all of these (but for the twin) work on in place: unmeasured, before every
    // single run, so that a filter never meets its own result, on which it has less to do. May be
    // empty.
    std::function<void()> restore = {};
};

// An operation. make(size) prepares a match, and ends the program if a peer does not compute the
// same as we do.
struct comparison {
    std::string name;
    std::vector<std::string>
        sizes;  // names of sizes, for make, such as "64x48" or "64x48 to 32x24"
    std::function<match(const std::string &size)> make;
};

// What `n` bytes read and `m` bytes written cost at least: memcpy of the bytes in common, then
// memset, or reads that leave the cache alone, of the others. Memory of both must exist.
std::function<void()> memory_traffic(std::shared_ptr<void> keep, const uint8_t *read, size_t n,
                                     uint8_t *written, size_t m);

// What reading and writing `n` bytes in place costs at least. Memory must exist.
std::function<void()> memory_traffic_in_place(std::shared_ptr<void> keep, uint8_t *p, size_t n);

// Ends the program with a message on stderr.
[[noreturn]] void fail(const std::string &message);

// Icons, macroblocks and spans: rows of less than a vector or two; and the least odd size above one
// of the usual ones.
inline const std::vector<std::string> small_sizes = {"8x8",   "16x16", "24x24",
                                                     "40x40", "64x48", "321x241"};
// What is measured at these: the main operations of each family.
inline const std::vector<std::string> small_operations = {"yuv420_to_rgb565",
                                                          "yuv420_to_rgb888",
                                                          "yuv420_to_rgba8888",
                                                          "yuv444_to_rgb565",
                                                          "nv12_to_rgb565",
                                                          "uyvy_to_rgb565",
                                                          "rgb888_to_yuv420",
                                                          "rgba8888_to_rgb565",
                                                          "yuv420_to_nv12",
                                                          "nv12_to_yuv420",
                                                          "cpy_8b",
                                                          "cpy_32b",
                                                          "any_yuv420_to_rgba8888",
                                                          "any_rgba8888_to_nv12",
                                                          "any_yuyv_to_yuv420",
                                                          "any_rgb888_to_bgra8888"};

// Each area's comparisons (bench/<area>_bench.cpp).
std::vector<comparison> yuv2rgb_comparisons();
std::vector<comparison> packed2rgb_comparisons();
std::vector<comparison> rgb2yuv_comparisons();
std::vector<comparison> layout_comparisons();
std::vector<comparison> copy_comparisons();
std::vector<comparison> csc_any_comparisons();
std::vector<comparison> resize_comparisons();
std::vector<comparison> tile_comparisons();
std::vector<comparison> dither_comparisons();
std::vector<comparison> deblock_comparisons();
std::vector<comparison> rotate_comparisons();
std::vector<comparison> resize_rot_comparisons();
std::vector<comparison> resize_csc_comparisons();
std::vector<comparison> irsz_comparisons();
std::vector<comparison> scmn_comparisons();
std::vector<comparison> stores_comparisons();

}  // namespace bench

#endif
