// Deblocking: every target against the definition, done in two passes as it is written down.
#include <algorithm>
#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

using rig::picture;

int limit(int low, int high, int x) { return std::max(low, std::min(high, x)); }

struct four {
    int a, b, c, d;
};
bool operator==(const four &x, const four &y) {
    return x.a == y.a && x.b == y.b && x.c == y.c && x.d == y.d;
}

// Steps of 1/8, rounded down by division rather than by shifts.
int floor_div(int x, int y) { return (x - ((x % y) + y) % y) / y; }

four filtered(const four &x, int strength) {
    const int d = floor_div(x.a - 4 * x.b + 4 * x.c - x.d, 8);
    const int t = std::max(0, std::abs(d) - std::max(0, 2 * (std::abs(d) - strength)));
    const int d1 = d >= 0 ? t : -t;
    const int d2 = limit(-(t / 2), t / 2, floor_div(x.a - x.d, 4));
    return {x.a - d2, limit(0, 255, x.b + d1), limit(0, 255, x.c - d1), x.d + d2};
}

void filter_across(uint8_t *c, ptrdiff_t step, int strength) {
    const four y = filtered({c[-2 * step], c[-step], c[0], c[step]}, strength);
    c[-2 * step] = uint8_t(y.a), c[-step] = uint8_t(y.b);
    c[0] = uint8_t(y.c), c[step] = uint8_t(y.d);
}
void horizontal_edges(uint8_t *p, ptrdiff_t stride, int width, int height, int strength) {
    for (int k = 1; k <= (height >> 3) - 1; k++)
        for (int x = 0; x < width; x++) filter_across(p + 8 * k * stride + x, stride, strength);
}
void vertical_edges(uint8_t *p, ptrdiff_t stride, int width, int height, int strength) {
    for (int k = 1; k <= (width >> 3) - 1; k++)
        for (int y = 0; y < height; y++) filter_across(p + y * stride + 8 * k, 1, strength);
}

struct kernel {
    const char *name;
    decltype(simgp_dbf8x8) *run;
    bool horizontal, vertical;
    int most;  // strength

    void reference(uint8_t *p, int strength, ptrdiff_t stride, int width, int height) const {
        strength = std::min(strength, most);
        if (horizontal) horizontal_edges(p, stride, width, height, strength);
        if (vertical) vertical_edges(p, stride, width, height, strength);
    }
};
const kernel kernels[] = {
    {"simgp_dbf8x8", simgp_dbf8x8, true, true, 12},
    {"simgp_dbf8x8_h263_hor", simgp_dbf8x8_h263_hor, true, false, INT16_MAX},
    {"simgp_dbf8x8_h263_ver", simgp_dbf8x8_h263_ver, false, true, INT16_MAX},
};
const int16_t strengths[] = {INT16_MIN, -1, 0,  1,   2,   5,   11,  12,
                             13,        14, 16, 100, 159, 160, 161, INT16_MAX};

// A plane of 16 x 16 with the same four samples across an edge everywhere, along x or along y.
struct square {
    uint8_t sample[16][16];
    square(const four &v, bool across_lines, int elsewhere) {
        for (int y = 0; y < 16; y++)
            for (int x = 0; x < 16; x++) {
                const int at = across_lines ? y : x;
                sample[y][x] = uint8_t(at == 6   ? v.a
                                       : at == 7 ? v.b
                                       : at == 8 ? v.c
                                       : at == 9 ? v.d
                                                 : elsewhere);
            }
    }
};

TEST(deblock, samples_by_hand) {
    const struct {
        int strength;
        four before, after;
    } samples[] = {
        {4, {100, 100, 112, 112}, {102, 104, 108, 110}},  // d 4, t 4, d2 -3 limited to -2
        {4, {50, 50, 150, 150}, {50, 50, 150, 150}},      // d 37, t 0
        {4, {108, 108, 100, 100}, {107, 105, 103, 101}},  // d -3, t 3, d2 2 limited to 1
        {4, {100, 100, 99, 99}, {100, 99, 100, 99}},      // d -3/8 rounded to -1, t 1, d2 0
        {4, {100, 100, 118, 118}, {101, 102, 116, 117}},  // d 6, t 2, d2 -5 limited to -1
        {30, {0, 0, 0, 200}, {12, 0, 25, 188}},           // d -25, B' -25, d2 -50 limited to -12
        {30, {255, 255, 255, 55}, {243, 255, 230, 67}},   // d 25, B' 280
        {160, {255, 0, 255, 0}, {192, 159, 96, 63}},      // the largest d, 159; d2 63
        {160, {0, 255, 0, 255}, {64, 95, 160, 191}},      // the smallest, -160; d2 -64
        {0, {100, 100, 112, 112}, {100, 100, 112, 112}},
        {INT16_MIN, {100, 100, 112, 112}, {100, 100, 112, 112}},
        {INT16_MAX, {0, 0, 100, 100}, {18, 37, 63, 82}},  // d 37, t 37, d2 -25 limited to -18
    };
    rig::for_each_target([&](const rig::target_rows &) {
        for (const auto &s : samples) {
            EXPECT_TRUE(filtered(s.before, s.strength) == s.after);
            for (const kernel &k : kernels) {
                if (s.strength > k.most) continue;
                for (bool across_lines : {true, false}) {
                    const bool filters = across_lines ? k.horizontal : k.vertical;
                    square got(s.before, across_lines, 7);
                    const square expected(filters ? s.after : s.before, across_lines, 7);
                    k.run(got.sample[0], int16_t(s.strength), 16, 16, 16);
                    EXPECT_EQ(memcmp(&got, &expected, sizeof got), 0)
                        << k.name << ", strength " << s.strength << ", B " << s.before.b;
                }
            }
        }
    });
}

// Every width, heights with and without edges and with a part of a block below them.
TEST(deblock, every_target_filters_all_edges_in_order) {
    rig::sweep sizes;
    sizes.max_width = 2 * 64 + 8 + 15;
    sizes.max_height = 43;  // coprime to the count of strengths
    sizes.rounds = 3;
    sizes.large = {{640, 24}, {1918, 21}, {259, 67}, {17, 200}, {1024, 16}};
    for (const kernel &k : kernels) {
        size_t call = 0;
        rig::check_jobs(k.name, sizes, [&](int w, int h) {
            const int16_t strength = strengths[call++ % std::size(strengths)];
            return rig::job{{},
                            {rig::samples(w, h)},
                            [=](const picture &, const picture &p) {
                                k.run(p.planes[0], strength, p.strides[0], w, h);
                            },
                            [=](const picture &, const picture &p) {
                                k.reference(p.planes[0], strength, p.strides[0], w, h);
                            },
                            false,
                            true};
        });
    }
}

// Samples across edges -------------------------------------------------------------------------

// A plane with 65536 groups of samples across edges: group i has A = i / 256, D = i % 256. Either
// all lie across one horizontal edge, or across 256 vertical edges of 256 lines.
class groups {
  public:
    explicit groups(bool across_lines)
        : across_lines_(across_lines),
          width_(across_lines ? 65536 : 8 * 257),
          height_(across_lines ? 16 : 256),
          plane_(size_t(width_) * size_t(height_)) {}

    void fill(int b, int c) {
        for (int i = 0; i < 65536; i++) {
            uint8_t *const p = behind_edge(i);
            p[-2 * step()] = uint8_t(i / 256), p[-step()] = uint8_t(b);
            p[0] = uint8_t(c), p[step()] = uint8_t(i % 256);
        }
    }
    // False if a sample needs more than 8 bits.
    bool filter_by_definition(int b, int c, int strength) {
        int outside = 0;
        for (int i = 0; i < 65536; i++) {
            const four y = filtered({i / 256, b, c, i % 256}, strength);
            outside |= (y.a | y.b | y.c | y.d) & ~255;
            uint8_t *const p = behind_edge(i);
            p[-2 * step()] = uint8_t(y.a), p[-step()] = uint8_t(y.b);
            p[0] = uint8_t(y.c), p[step()] = uint8_t(y.d);
        }
        return !outside;
    }
    void filter_by_library(int strength) {
        const auto run = across_lines_ ? simgp_dbf8x8_h263_hor : simgp_dbf8x8_h263_ver;
        run(plane_.data(), int16_t(strength), width_, width_, height_);
    }
    bool operator==(const groups &other) const { return plane_ == other.plane_; }

  private:
    ptrdiff_t step() const { return across_lines_ ? width_ : 1; }
    uint8_t *behind_edge(int i) {
        const ptrdiff_t at =
            across_lines_ ? 8 * ptrdiff_t(width_) + i : i % 256 * width_ + 8 * (i / 256 + 1);
        return plane_.data() + at;
    }
    bool across_lines_;
    int width_, height_;
    std::vector<uint8_t> plane_;
};

void check_groups(groups &expected, groups &got, int pair, int strength,
                  const std::vector<rig::target_rows> &targets) {
    const int b = pair / 256, c = pair % 256;
    ASSERT_TRUE(expected.filter_by_definition(b, c, strength));
    for (const rig::target_rows &t : targets) {
        rig::forced rows(t);
        got.fill(b, c);
        got.filter_by_library(strength);
        ASSERT_TRUE(got == expected)
            << t.name << ", strength " << strength << ", B " << b << ", C " << c;
    }
}

// All A and D with some B and C, at strengths in turn.
TEST(deblock, samples_of_all_kinds) {
    for (bool across_lines : {true, false}) {
        groups expected(across_lines), got(across_lines);
        int round = 0;
        for (int pair = 0; pair < 65536; pair += rig::quick() ? 1999 : 97, round++) {
            const int of[] = {1, 4, 12, 15, 80, 127, 128, 159, 160, 1000};
            check_groups(expected, got, pair, of[size_t(round) % std::size(of)],
                         rig::all_targets());
            if (HasFatalFailure()) return;
        }
    }
}

// All there are; half a minute for each strength. ctest runs it under a name of its own.
TEST(deblock, DISABLED_all_samples) {
    groups expected(true), got(true);
    std::vector<rig::target_rows> targets = rig::all_targets();
    targets.erase(targets.begin() + 1);  // lanes
    for (int pair = 0; pair < 65536; pair += rig::quick() ? 101 : 1) {
        check_groups(expected, got, pair, 12, targets);
        if (HasFatalFailure()) return;
    }
}

// Entry points ---------------------------------------------------------------------------------

TEST(deblock, planes_without_samples_are_not_touched) {
    for (const kernel &k : kernels)
        for (auto [w, h] :
             {std::pair(0, 64), {64, 0}, {-64, 64}, {64, -64}, {0, 0}, {INT32_MIN, INT32_MIN}})
            k.run(nullptr, 12, 64, w, h);
}

// Three planes and an entry that ends the program when it is used.
struct yuv {
    picture planes{{rig::samples(40, 33), rig::samples(16, 16), rig::samples(23, 50)}};
    simgp_img img = planes.img(-77);
};

TEST(deblock, pictures) {
    rig::for_each_target([&](const rig::target_rows &) {
        for (unsigned present = 0; present < 8; present++)
            for (int16_t strength = 0; strength <= 15; strength++) {
                rig::rng random(rig::seed() + present), again = random;
                yuv got, expected;
                got.planes.fill(rig::content::random, random);
                expected.planes.fill(rig::content::random, again);
                for (int k = 0; k < 3; k++) {
                    if (present >> k & 1) {
                        const kernel two_passes{"", nullptr, true, true, 15};
                        two_passes.reference(expected.img.plane[k], strength,
                                             expected.img.stride[k], expected.img.width[k],
                                             expected.img.height[k]);
                    } else {
                        got.img.plane[k] = nullptr;
                        got.img.width[k] = got.img.height[k] = INT32_MAX;
                        got.img.stride[k] = INT32_MIN;
                    }
                }
                ASSERT_EQ(simgp_dbf8x8_yuv(&got.img, strength), SIMGP_OK);
                ASSERT_EQ(rig::difference(expected.planes, got.planes), "")
                    << "planes " << present << ", strength " << strength;
            }
    });
}

TEST(deblock, refused_strengths_touch_no_plane) {
    yuv p;
    rig::picture no_bytes({rig::samples(0, 0), rig::samples(0, 0), rig::samples(0, 0)});
    for (int k = 0; k < 3; k++) p.img.plane[k] = no_bytes.planes[k];
    for (int strength : {16, 17, 20, 255, 256, 1000, 0x7FF0, INT16_MAX, -1, -12, -16, INT16_MIN})
        EXPECT_EQ(simgp_dbf8x8_yuv(&p.img, int16_t(strength)), SIMGP_ERR_PARAM) << strength;
}

}  // namespace
