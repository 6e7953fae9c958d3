// The test rig: pictures in guarded memory, seeded inputs, every target in turn, and drivers that
// hold a kernel's vector rows against its scalar rows. A family of kernels takes a line:
//
//   rig::check_csc("simgp_csc_nv12_to_rgb565", simgp_csc_nv12_to_rgb565, SIMGP_FMT_NV12,
//                  SIMGP_FMT_RGB565);
//
// Environment of the test programs:
//   SIMGP_TEST_SEED=n           the seed of all random inputs (default 1); failures print it
//   SIMGP_TEST_QUICK=1          fewer rounds and strided sweeps, for emulators
//   SIMGP_TEST_EXPECT_TARGET=t  the rows that must be in use (see choice in choose_test.cpp)
#ifndef TESTS_RIG_H
#define TESTS_RIG_H

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "rows/choose.h"
#include "simgp/img.h"
#include "tests/guard.h"

namespace rig {

uint64_t seed();
bool quick();

// Random numbers, the same on every machine (splitmix64).
class rng {
  public:
    explicit rng(uint64_t start) : state_(start) {}
    uint64_t next() {
        uint64_t z = state_ += 0x9E3779B97F4A7C15u;
        z = (z ^ z >> 30) * 0xBF58476D1CE4E5B9u;
        z = (z ^ z >> 27) * 0x94D049BB133111EBu;
        return z ^ z >> 31;
    }
    int below(int n) { return int(next() >> 33) % n; }

  private:
    uint64_t state_;
};

// Inputs: random bytes; 0 and 255 at random; 0 and 255 in turn; values where formulas saturate or
// change their sign; all 0; all 255; steps of at most 4 from byte to byte.
enum class content { random, extremes, alternating, corners, zeros, ones, smooth, count };
void fill_bytes(uint8_t *p, size_t size, content what, rng &random);

// Formats
// ------------------------------------------------------------------------------------------

// What the tests expect of a format, written down once more: the library has a table of its own.

// Where the samples of Y, U or V lie: the plane, the first sample's byte in a line, the bytes from
// one to the next, and how many pixels across and down share a sample.
struct channel_place {
    int plane = 0, first = 0, step = 0;  // step 0: there is no such channel
    int across = 1, down = 1;
};
enum class channel { y, u, v };

// Bits of a pixel.
struct field {
    int count = 0, first = 0;
};

struct format {
    int code;
    channel_place yuv[3] = {};  // by channel
    // RGB: a pixel is a number of `pixel_bytes` bytes, the lowest first, with these bits.
    int pixel_bytes = 0;
    field red = {}, green = {}, blue = {}, alpha = {};
    bool tiled = false;  // its samples are in tiles of 64 x 32 bytes

    const channel_place &at(channel c) const { return yuv[int(c)]; }
    bool is_rgb() const { return pixel_bytes > 0; }
    bool has_chroma() const { return yuv[1].step > 0; }
    bool is_semi_planar() const { return yuv[1].step == 2 && !is_packed(); }
    bool is_packed() const { return has_chroma() && yuv[0].plane == yuv[1].plane; }
};
const std::vector<format> &formats();
// Ends the program for a code that is none.
const format &format_of(int code);

struct rgb {
    int r, g, b;
};
bool operator==(const rgb &a, const rgb &b);

// A pixel at p, with the highest bits of each channel; and back, with low bits 0.
inline void put_rgb(const format &f, const rgb &c, uint8_t *p, int alpha = 255) {
    const auto bits = [](int value, const field &to) {
        return unsigned(value) >> (8 - to.count) << to.first;
    };
    const unsigned word =
        bits(c.r, f.red) | bits(c.g, f.green) | bits(c.b, f.blue) | bits(alpha, f.alpha);
    for (int i = 0; i < f.pixel_bytes; i++) p[i] = uint8_t(word >> 8 * i);
}
inline rgb get_rgb(const format &f, const uint8_t *p) {
    unsigned word = 0;
    for (int i = 0; i < f.pixel_bytes; i++) word |= unsigned(p[i]) << 8 * i;
    const auto value = [word](const field &from) {
        return int(word >> from.first & ((1u << from.count) - 1)) << (8 - from.count);
    };
    return {value(f.red), value(f.green), value(f.blue)};
}
// Opaque where the format has none.
inline int get_alpha(const format &f, const uint8_t *p) {
    return f.alpha.count ? p[f.alpha.first / 8] : 255;
}

// Planes and pictures
// ------------------------------------------------------------------------------

// The visible bytes of a plane, and what a descriptor says of it.
struct plane_shape {
    int32_t width, height;  // the descriptor's words
    int sample_bytes;
    ptrdiff_t row_bytes, rows;
    int stride_unit = 1;  // strides are multiples of this
    // The descriptor may say up to stride_unit - 1 bytes more, which have to be rounded off.
    bool rounded = false;
};
// width x height samples.
plane_shape samples(int32_t width, int32_t height, int sample_bytes = 1);

// The planes of a W x H picture, chroma rounded up. Of a tiled plane all bytes count as one row.
std::vector<plane_shape> shapes_of(int format, int32_t width, int32_t height);

// Where a plane lies: beside an inaccessible page or `gap` bytes away, its rows `padding` bytes
// apart, from top to bottom or (with a negative stride) from bottom to top.
struct placement {
    flush where = flush::at_end;
    size_t gap = 0;
    ptrdiff_t padding = 0;
    bool bottom_up = false;
    int excess = 0;  // what the descriptor says beyond the stride, modulo the unit of rounded ones
};
placement any_placement(flush where, rng &random);

class plane {
  public:
    plane(const plane_shape &shape, const placement &place);
    plane(plane &&) = default;
    ~plane() { allow_padding(); }

    const plane_shape &shape() const { return shape_; }
    ptrdiff_t stride() const { return stride_; }
    uint8_t *row(ptrdiff_t y) const { return first_ + y * stride_; }

    // As a source: random padding, visible bytes as asked.
    void fill(content what, rng &random);
    // As a destination: a pattern everywhere, in the surroundings too.
    void fill_pattern(unsigned salt);
    // The visible bytes of a plane of the same shape.
    void copy_visible(const plane &from);
    // The first byte outside the visible ones that no longer holds the pattern, in words; or "".
    std::string stray_write() const;

    // Under AddressSanitizer, makes the bytes between the rows inaccessible, as far as it can.
    void forbid_padding();
    void allow_padding();

  private:
    plane_shape shape_;
    ptrdiff_t stride_;
    guarded memory_;
    uint8_t *first_;
    unsigned salt_ = 0;
    bool forbidden_ = false;
};

// Planes with the arrays of the kernel convention. Entries of planes that are not there hold values
// that end the program when they are used.
class picture {
  public:
    picture(const std::vector<plane_shape> &shapes, const std::vector<placement> &places);
    // All planes packed and at the end of their memory.
    explicit picture(const std::vector<plane_shape> &shapes, const placement &place = {});

    std::vector<plane> parts;
    uint8_t *planes[4];
    int32_t widths[4], heights[4], strides[4];

    uint8_t *row(int k, ptrdiff_t y) const { return parts[size_t(k)].row(y); }
    void fill(content what, rng &random);
    void fill_pattern(unsigned salt);
    std::string stray_write() const;
    simgp_img img(int format) const;
};

// The sample of a channel for pixel (x, y), and the bytes of an RGB pixel. Not of tiled pictures.
inline uint8_t *sample(const picture &p, const format &f, channel c, int x, int y) {
    const channel_place &at = f.at(c);
    return p.row(at.plane, y / at.down) + at.first + x / at.across * at.step;
}
inline uint8_t *pixel(const picture &p, const format &f, int x, int y) {
    return p.row(0, y) + x * f.pixel_bytes;
}

inline void call(simgp_csc_fn *kernel, const picture &src, const picture &dst) {
    kernel(src.planes, src.widths, src.heights, src.strides, dst.strides, dst.planes);
}

// The first visible byte in which two pictures differ, in words; or "".
std::string difference(const picture &expected, const picture &got);

// Targets
// ------------------------------------------------------------------------------------------

struct target_rows {
    const char *name;
    const simgp::row_table *rows;
};
// Scalar first; then `lanes`, the vector rows compiled over plain lanes; then every target that the
// processor offers.
const std::vector<target_rows> &all_targets();

// Puts a target's rows into use, as long as it lives.
class forced {
  public:
    explicit forced(const target_rows &t) { simgp::force_rows(t.rows); }
    ~forced() { simgp::force_rows(nullptr); }
    forced(const forced &) = delete;
};

// fn(const target_rows &) under the rows of each target.
template <typename F>
void for_each_target(F fn) {
    for (const target_rows &t : all_targets()) {
        SCOPED_TRACE(t.name);
        forced rows(t);
        fn(t);
    }
}

// Drivers
// ------------------------------------------------------------------------------------------

// One call of something: the planes that it reads, those that it writes, and how it is called.
struct job {
    std::vector<plane_shape> src, dst;
    std::function<void(const picture &src, const picture &dst)> run;
    // Writes what is right, independently of the library; null: the scalar rows are right.
    std::function<void(const picture &src, const picture &dst)> reference = nullptr;
    bool holes = false;  // dst has bytes that nothing writes, such as the unused slots of tiles
    // Works in place: dst is filled like a source, with the same bytes for every target and for the
    // reference. src may be empty, or hold what is read besides.
    bool in_place = false;
    // Puts into the sources what random bytes do not have.
    std::function<void(const picture &src)> season = nullptr;
};

// One run of a job: where its planes lie, with what the sources (and what is worked on in place) are
// filled, and the pattern around the results.
struct setting {
    std::vector<placement> src, dst;
    std::function<void(picture &)> fill;
    unsigned salt;
    std::string words;  // for the report
};

// Runs a job with the rows of every target. Returns the first of these in words, with all that is
// needed to tell what ran: a visible byte that differs from the reference or the scalar rows, a byte
// written elsewhere, a source that changed; or "". `what_runs`: the operation and its sizes.
std::string fault_of(const std::string &what_runs, const job &j, const setting &how);

// Called by a job that sees a fault of its own, such as a result code: fault_of reports it.
void complain(const std::string &fault);

// The sizes to try: every width from 1 to two of the widest vectors and 1 more, in steps, with
// small heights; then a few large pictures.
struct sweep {
    int step_x = 1, step_y = 1;  // widths and heights are multiples of these
    int max_width = 2 * 64 + 1;
    int max_height = 5;
    int rounds = 2;
    // The last two have more lines, and pairs of them, than are converted side by side: of one the last pixels,
    // as it has one more than whole vectors, the other as a whole (simgp/column.h).
    std::vector<std::pair<int, int>> large = {{640, 6}, {1918, 5}, {259, 5}, {257, 133}, {9, 67}};
};

// Runs the jobs of all sizes with the rows of every target, on the same inputs, with planes flush
// at their end and at their start, packed and padded, top-down and bottom-up. Reports the first
// fault. False after a failure.
bool check_jobs(const std::string &name, const sweep &sizes,
                const std::function<job(int width, int height)> &make);

// Runs the jobs of all widths with all heights, from 1 on, each once at either end of its memory,
// flush or at any of 64 alignments.
bool check_every_size(const std::string &name, int widths, int heights, rng &random,
                      const std::function<job(int width, int height)> &make);

// check_jobs for operations between any two sizes: `to` has the sizes of the destination, each of
// which meets sources that are as large, half and double, a pixel more or less, one pixel, and of
// any other size, across and down independently. They are multiples of the sweep's steps, too.
struct size {
    int width, height;
};
bool check_resize_jobs(const std::string &name, const sweep &to,
                       const std::function<job(const size &from, const size &to)> &make);

// check_jobs for a conversion kernel between two formats.
bool check_csc(
    const std::string &name, simgp_csc_fn *kernel, int from, int to, const sweep &sizes = {},
    const std::function<void(const picture &src, const picture &dst)> &reference = nullptr);

// check_jobs for a kernel of one plane, with what it makes of a plane of width x height samples.
bool check_plane_fn(
    const std::string &name, simgp_plane_fn *kernel, int src_sample_bytes,
    const std::function<plane_shape(int width, int height)> &dst_shape, const sweep &sizes = {},
    const std::function<void(const picture &src, const picture &dst)> &reference = nullptr);

}  // namespace rig

#endif
