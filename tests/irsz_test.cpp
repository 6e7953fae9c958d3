// The line-based resizer: kernels, whole pictures and bands of any size against the filter in plain
// integers.
#include <string.h>

#include <algorithm>
#include <numeric>
#include <set>

#include "scmn/scmn.h"
#include "simgp/resize.h"
#include "tests/irsz_kinds.h"
#include "tests/rig.h"

// Memory
// --------------------------------------------------------------------------------------------

// The linker leads malloc and free here. Between watch() and the end of a scope they are counted,
// and the allocation that is named fails.
extern "C" {
void *__real_malloc(size_t size);
void __real_free(void *p);
void *__wrap_malloc(size_t size);
void __wrap_free(void *p);
}

namespace {

struct allocations {
    bool on = false;
    int made = 0, failing = -1;
    std::set<void *> live;
} watched;

class watch {
  public:
    explicit watch(int failing = -1) {
        watched.made = 0, watched.failing = failing;
        watched.on = true;
    }
    ~watch() { watched.on = false; }
    watch(const watch &) = delete;
};

}  // namespace

void *__wrap_malloc(size_t size) {
    if (!watched.on) return __real_malloc(size);
    if (watched.made++ == watched.failing) return nullptr;
    void *const p = __real_malloc(size);
    memset(p, 0xA5, size);  // nothing may count on zeros
    watched.on = false;     // the set allocates too
    watched.live.insert(p);
    watched.on = true;
    return p;
}
void __wrap_free(void *p) {
    const bool on = watched.on;
    watched.on = false;
    watched.live.erase(p);
    watched.on = on;
    __real_free(p);
}

namespace {

// The reference
// -----------------------------------------------------------------------------------------

using rig::irsz_kinds;
using kind = rig::irsz_kind;

// n positions over an extent of N samples.
struct axis {
    int64_t step;
    int shift;
    axis(int64_t extent, int64_t n) : shift(0) {
        const int64_t ratio = extent / n;
        if (ratio >= 3)
            while (shift < 4 && ratio > 2LL << shift) shift++;
        step = (((extent - 1) >> shift) * (1 << 18)) / n;
    }
    int64_t upper(int64_t i) const { return i * step / (1 << 18) * (1 << shift); }
    int phase(int64_t i) const { return int(i * step / (1 << 15) % 8); }
    // The last sample that takes part.
    int64_t lower(int64_t i) const { return upper(i) + (phase(i) ? 1 << shift : 0); }
    int32_t packed() const { return int32_t(step * 8 + shift); }
};

// Pixel i of a row between two lines; the lower is not looked at with phase 0.
void resample_pixel(const kind &k, const uint8_t *above, const uint8_t *below, int fy,
                    const axis &x, int i, uint8_t *to) {
    const int fx = x.phase(i);
    const ptrdiff_t left = x.upper(i), right = x.lower(i);
    const auto word = [](const uint8_t *line, ptrdiff_t at) {
        return line[2 * at] | line[2 * at + 1] << 8;
    };
    const auto blend = [&](auto sample) {
        const int a = (8 - fx) * sample(above, left) + fx * sample(above, right);
        const int b = fy ? (8 - fx) * sample(below, left) + fx * sample(below, right) : 0;
        return ((8 - fy) * a + fy * b) >> 6;
    };
    int channels[4] = {}, result;
    for (int c = 0; c < k.src_bytes; c++)
        channels[c] =
            blend([&](const uint8_t *p, ptrdiff_t at) { return p[k.src_bytes * at + c]; });
    if (k.format == SCMN_IRSZ_5B6B5B)
        result = blend([&](const uint8_t *p, ptrdiff_t at) { return word(p, at) >> 11; }) << 11 |
                 blend([&](const uint8_t *p, ptrdiff_t at) { return word(p, at) >> 5 & 63; }) << 5 |
                 blend([&](const uint8_t *p, ptrdiff_t at) { return word(p, at) & 31; });
    else
        result = channels[0] >> 3 << 11 | channels[1] >> 2 << 5 | channels[2] >> 3;
    for (int c = 0; c < k.dst_bytes; c++)
        to[c] = uint8_t(k.dst_bytes == 2 ? result >> 8 * c : channels[c]);
}

// A picture by its lines.
template <class Line>
void resample_row(const kind &k, Line line, const axis &x, const axis &y, int width, int row,
                  uint8_t *to) {
    for (int i = 0; i < width; i++)
        resample_pixel(k, line(y.upper(row)), line(y.lower(row)), y.phase(row), x, i,
                       to + i * k.dst_bytes);
}

// Kernels and whole pictures
// ---------------------------------------------------------------------------

scmn_irsz_param params(const kind &k, int mode, const rig::size &from, ptrdiff_t src_stride,
                       const rig::size &to, ptrdiff_t dst_stride, void *dst, int chunk = 16) {
    return {k.format,
            mode,
            from.width,
            from.height,
            int32_t(src_stride / k.src_bytes),
            chunk,
            to.width,
            to.height,
            int32_t(dst_stride / k.dst_bytes),
            dst};
}

// The source ends with the last pixel that a tap reaches.
rig::job job_of(const kind &k, const rig::size &from, const rig::size &to,
                const std::function<void(const rig::picture &, const rig::picture &)> &run) {
    const axis x(from.width, to.width), y(from.height, to.height);
    rig::plane_shape src = rig::samples(int32_t(x.lower(to.width - 1) + 1),
                                        int32_t(y.lower(to.height - 1) + 1), k.src_bytes);
    rig::plane_shape dst = rig::samples(to.width, to.height, k.dst_bytes);
    src.stride_unit = k.src_bytes, dst.stride_unit = k.dst_bytes;
    return {{src}, {dst}, run, [=, &k](const rig::picture &s, const rig::picture &d) {
                for (int j = 0; j < to.height; j++)
                    resample_row(
                        k, [&](int64_t line) { return s.row(0, line); }, x, y, to.width, j,
                        d.row(0, j));
            }};
}

TEST(irsz, kernels_of_whole_pictures) {
    for (const kind &k : irsz_kinds)
        ASSERT_TRUE(
            rig::check_resize_jobs(k.name, {}, [&](const rig::size &from, const rig::size &to) {
                const axis x(from.width, to.width), y(from.height, to.height);
                return job_of(k, from, to, [=, &k](const rig::picture &s, const rig::picture &d) {
                    k.full(s.planes[0], s.strides[0] / k.unit, to.width, to.height,
                           d.strides[0] / k.unit, d.planes[0], x.packed(), y.packed());
                });
            }));
}

TEST(irsz, kernels_of_rows) {
    // Any copy of the weights will do.
    static const std::vector<uint8_t> weights(tbl_rsz_weight, tbl_rsz_weight + 256);
    for (const kind &k : irsz_kinds)
        ASSERT_TRUE(
            rig::check_resize_jobs(k.name, {}, [&](const rig::size &from, const rig::size &to) {
                const axis x(from.width, to.width), y(from.height, to.height);
                return job_of(k, from, to, [=, &k](const rig::picture &s, const rig::picture &d) {
                    for (int j = 0; j < to.height; j++) {
                        const int fy = y.phase(j);
                        const void *const lines[] = {s.row(0, y.upper(j)),
                                                     fy ? s.row(0, y.lower(j)) : nullptr};
                        k.line(lines, (j % 2 ? tbl_rsz_weight : weights.data()) + 4 * fy, to.width,
                               x.shift, 1 << x.shift, int32_t(x.step), d.row(0, j));
                    }
                });
            }));
}

TEST(irsz, objects_for_whole_pictures) {
    for (const kind &k : irsz_kinds)
        ASSERT_TRUE(
            rig::check_resize_jobs(k.name, {}, [&](const rig::size &from, const rig::size &to) {
                return job_of(k, from, to, [=, &k](const rig::picture &s, const rig::picture &d) {
                    const scmn_irsz_param param = params(k, SCMN_IRSZ_FULL, from, s.strides[0], to,
                                                         d.strides[0], d.planes[0]);
                    scmn_irsz_ctx *const resizer = scmn_irsz_create(&param, nullptr);
                    ASSERT_NE(resizer, nullptr);
                    const scmn_irsz_ctx fresh = *resizer;
                    // Twice: nothing stays of a picture.
                    EXPECT_EQ(scmn_irsz(resizer, s.planes[0], 7, -1), 0);
                    EXPECT_EQ(k.entry(resizer, s.planes[0], 0, 0), 0);
                    EXPECT_EQ(memcmp(&fresh, resizer, sizeof fresh), 0);
                    scmn_irsz_delete(resizer);
                });
            }));
}

TEST(irsz, kernels_of_nothing) {
    const uint8_t *const none = nullptr;
    const void *const lines[] = {none, none};
    for (const kind &k : irsz_kinds)
        for (int size : {0, -1, INT32_MIN}) {
            k.full(none, 1, size, 1, 1, nullptr, 1 << 21, 1 << 21);
            k.full(none, 1, 1, size, 1, nullptr, 1 << 21, 1 << 21);
            k.line(lines, tbl_rsz_weight, size, 0, 1, 1 << 18, nullptr);
        }
}

TEST(irsz, weights) {
    int sum = 0;
    for (int fx = 0; fx < 8; fx++)
        for (int fy = 0; fy < 8; fy++) {
            const uint8_t *const w = tbl_rsz_weight + 32 * fx + 4 * fy;
            const int expected[] = {(8 - fx) * (8 - fy), fx * (8 - fy), (8 - fx) * fy, fx * fy};
            for (int i = 0; i < 4; i++) EXPECT_EQ(w[i], expected[i]) << fx << " " << fy;
            sum += w[0];
        }
    EXPECT_EQ(sum, 36 * 36);
    EXPECT_EQ(memcmp(tbl_rsz_weight, simgp_tbl_rsz_weight, 256), 0);
}

// By pencil and paper: four pixels of two lines, made eight of three.
TEST(irsz, small_results) {
    const auto resize = [](const kind &k, const std::vector<uint8_t> &src, const rig::size &from,
                           const rig::size &to) {
        std::vector<uint8_t> dst(size_t(to.width * to.height * k.dst_bytes));
        for (int mode : {SCMN_IRSZ_FULL, SCMN_IRSZ_LINE}) {
            std::fill(dst.begin(), dst.end(), uint8_t(0xEE));
            const scmn_irsz_param param = params(k, mode, from, from.width * k.src_bytes, to,
                                                 to.width * k.dst_bytes, dst.data(), from.height);
            scmn_irsz_ctx *const resizer = scmn_irsz_create(&param, nullptr);
            scmn_irsz(resizer, src.data(), 0, from.height);
            scmn_irsz_delete(resizer);
        }
        return dst;
    };
    using bytes = std::vector<uint8_t>;
    // Eighths of the way from 0 to 255, truncated.
    EXPECT_EQ(resize(irsz_kinds[0], {0, 255}, {2, 1}, {8, 1}),
              (bytes{0, 31, 63, 95, 127, 159, 191, 223}));
    // White and red as words; halfway between them 127 of 255 are left of green and blue.
    EXPECT_EQ(resize(irsz_kinds[2], {255, 255, 255, 255, 0, 0}, {2, 1}, {2, 1}),
              (bytes{0xFF, 0xFF, 0xEF, 0xFB}));
    // Halfway between red and blue: 15 of 31 parts of each, nothing carried over.
    EXPECT_EQ(resize(irsz_kinds[3], {0x00, 0xF8, 0x1F, 0x00}, {2, 1}, {2, 1}),
              (bytes{0x00, 0xF8, 0x0F, 0x78}));
    // Positions 0 and 2 of lines of 5 and of columns of 1.
    EXPECT_EQ(resize(irsz_kinds[0], {1, 2, 3, 4, 5}, {1, 5}, {1, 2}), (bytes{1, 3}));
}

// Bands
// ---------------------------------------------------------------------------------------------

struct picture_case {
    rig::size from, to;
    int longest;  // band
};

// Every band lies in memory of its own, tight to the last tap of its last line, and is gone after
// the call.
void check_bands(const kind &k, const picture_case &c, rig::rng &random) {
    const rig::size &from = c.from, &to = c.to;
    const axis x(from.width, to.width), y(from.height, to.height);
    const int chunk = random.below(c.longest) + 1;
    SCOPED_TRACE(std::string(k.name) + ", " + std::to_string(from.width) + " x " +
                 std::to_string(from.height) + " to " + std::to_string(to.width) + " x " +
                 std::to_string(to.height) + " in bands of up to " + std::to_string(c.longest));
    const ptrdiff_t row_bytes = (x.lower(to.width - 1) + 1) * k.src_bytes;
    std::vector<uint8_t> source(size_t(row_bytes * from.height));
    rig::fill_bytes(source.data(), source.size(), rig::content(random.below(3)), random);

    rig::plane_shape shape = rig::samples(to.width, to.height, k.dst_bytes);
    shape.stride_unit = k.dst_bytes;
    rig::plane dst(shape, rig::any_placement(rig::flush(random.below(2)), random));
    dst.fill_pattern(unsigned(random.below(1000)));
    std::vector<std::vector<uint8_t>> before, expected;
    for (int j = 0; j < to.height; j++) {
        before.emplace_back(dst.row(j), dst.row(j) + shape.row_bytes);
        expected.emplace_back(shape.row_bytes);
        resample_row(
            k, [&](int64_t line) { return source.data() + line * row_bytes; }, x, y, to.width, j,
            expected.back().data());
    }

    // Every band has the same stride, whatever else.
    rig::placement place = rig::any_placement(rig::flush::at_end, random);
    const ptrdiff_t padding = place.padding;
    const bool bottom_up = place.bottom_up;
    const auto band_of = [&](int lines) {
        rig::plane_shape s = rig::samples(from.width, lines, k.src_bytes);
        s.row_bytes = row_bytes;
        s.stride_unit = k.src_bytes;
        place = rig::any_placement(rig::flush(random.below(2)), random);
        place.padding = padding, place.bottom_up = bottom_up;
        return rig::plane(s, place);
    };
    const ptrdiff_t stride = band_of(1).stride();
    const scmn_irsz_param param =
        params(k, SCMN_IRSZ_LINE, from, stride, to, dst.stride(), dst.row(0), chunk);
    int32_t err = 1;
    scmn_irsz_ctx *const resizer = scmn_irsz_create(&param, &err);
    ASSERT_NE(resizer, nullptr);
    ASSERT_EQ(err, SCMN_IRSZ_OK);
    ASSERT_EQ(resizer->src_line, stride / k.unit);
    ASSERT_EQ(resizer->chunk_size, stride / k.unit * chunk);

    int written = 0;
    for (int line = 0; line < from.height;) {
        const int lines = std::min(random.below(c.longest) + 1, from.height - line);
        rig::plane band = band_of(lines);
        ASSERT_EQ(band.stride(), stride);
        band.fill(rig::content::random, random);
        for (int i = 0; i < lines; i++)
            memcpy(band.row(i), source.data() + (line + i) * row_bytes, size_t(row_bytes));
        band.forbid_padding();
        {
            const watch nothing_is_allocated;
            ASSERT_EQ(scmn_irsz(resizer, band.row(0), line, lines), 0);
            ASSERT_EQ(watched.made, 0);
        }
        band.allow_padding();
        band.fill(rig::content::random, random);
        line += lines;

        // Bands that are none change nothing.
        scmn_irsz(resizer, nullptr, line, 0);
        scmn_irsz(resizer, nullptr, -1, 1);

        // What could be written has been, and nothing else.
        const int since = written;
        while (written < to.height && y.lower(written) < line) written++;
        for (int j = since; j < to.height; j++)
            ASSERT_EQ(memcmp(dst.row(j), (j < written ? expected : before)[size_t(j)].data(),
                             size_t(shape.row_bytes)),
                      0)
                << "row " << j << " after line " << line;
        const bool waits = written < to.height && y.upper(written) < line;
        ASSERT_EQ(resizer->carry, waits);
        ASSERT_EQ(resizer->row, written + waits);
        ASSERT_EQ(resizer->y_pos, (written + waits) * y.step);
        ASSERT_EQ(resizer->reuse,
                  waits && written + 1 < to.height && y.upper(written + 1) == y.upper(written));
        const ptrdiff_t missing = waits ? y.lower(written) - line : 0;
        ASSERT_EQ(resizer->carry_off * ptrdiff_t(k.unit), missing * stride);
    }
    ASSERT_EQ(written, to.height);
    ASSERT_EQ(resizer->row, to.height);
    // All has been said.
    scmn_irsz(resizer, nullptr, from.height, 1);
    EXPECT_EQ(dst.stray_write(), "");
    for (int j = 0; j < to.height; j++)
        ASSERT_EQ(memcmp(dst.row(j), expected[size_t(j)].data(), size_t(shape.row_bytes)), 0);
    scmn_irsz_delete(resizer);
}

// A length, and one that it is resized to: alike, by half and double, to a small part, to anything.
std::pair<int, int> lengths(int most, rig::rng &random) {
    const int n = 1 + random.below(most), part = 1 + random.below(40);
    switch (random.below(6)) {
        case 0:
            return {n, n};
        case 1:
            return {n, 2 * n + random.below(3)};
        case 2:
            return {2 * n + random.below(3), n};
        case 3:
            return {n, std::max(1, n / part)};
        case 4:
            return {n, 1 + random.below(8)};
        default:
            return {n, 1 + random.below(most)};
    }
}

TEST(irsz, bands_of_any_size) {
    const int rounds = rig::quick() ? 30 : 150;
    rig::for_each_target([&](const rig::target_rows &) {
        rig::rng random(rig::seed());
        for (int i = 0; i < rounds; i++) {
            const auto [from_w, to_w] = lengths(i % 8 ? 90 : 300, random);
            const auto [from_h, to_h] = lengths(60, random);
            const int bands[] = {1, 2, 3, 5, 16, from_h};
            for (const kind &k : irsz_kinds) {
                check_bands(k, {{from_w, from_h}, {to_w, to_h}, bands[random.below(6)]}, random);
                if (testing::Test::HasFatalFailure()) return;
            }
        }
        // Long lines.
        for (const kind &k : irsz_kinds) {
            check_bands(k, {{1999, 7}, {4003, 12}, 2}, random);
            check_bands(k, {{4003, 40}, {1921, 13}, 9}, random);
            if (testing::Test::HasFatalFailure()) return;
        }
    });
}

// Bands far shorter than the way from a tap to the one below.
TEST(irsz, strong_reductions_in_short_bands) {
    rig::rng random(rig::seed());
    for (const kind &k : irsz_kinds)
        for (int longest : {1, 2, 16})
            for (int to : {10, 62, 200, 333, 1000, 2001}) {
                check_bands(k, {{9, 1000}, {5, to}, longest}, random);
                if (HasFatalFailure()) return;
            }
}

TEST(irsz, two_resizers_at_once) {
    // Their bands in turn: what each keeps is its own.
    std::vector<uint8_t> a(40), b(40), dst_a(80), dst_b(80), whole(80);
    for (size_t i = 0; i < 40; i++) a[i] = uint8_t(6 * i), b[i] = uint8_t(255 - 5 * i);
    scmn_irsz_param param{SCMN_IRSZ_8B, SCMN_IRSZ_LINE, 4, 10, 4, 1, 4, 20, 4, dst_a.data()};
    scmn_irsz_ctx *const first = scmn_irsz_create(&param, nullptr);
    param.dst = dst_b.data();
    scmn_irsz_ctx *const second = scmn_irsz_create(&param, nullptr);
    for (int line = 0; line < 10; line++) {
        scmn_irsz(first, a.data() + 4 * line, line, 1);
        scmn_irsz(second, b.data() + 4 * line, line, 1);
    }
    scmn_irsz_delete(first), scmn_irsz_delete(second);
    const axis x(4, 4), y(10, 20);
    scmn_irsz8b_full(a.data(), 4, 4, 20, 4, whole.data(), x.packed(), y.packed());
    EXPECT_EQ(dst_a, whole);
    scmn_irsz8b_full(b.data(), 4, 4, 20, 4, whole.data(), x.packed(), y.packed());
    EXPECT_EQ(dst_b, whole);
}

// Creation
// ------------------------------------------------------------------------------------------

TEST(irsz, creation) {
    uint8_t pixel[4];
    for (const kind &k : irsz_kinds)
        for (int mode : {SCMN_IRSZ_FULL, SCMN_IRSZ_LINE}) {
            const scmn_irsz_param param{k.format, mode, 640, 100, 700, 16, 160, 201, 164, pixel};
            scmn_irsz_ctx *r;
            int32_t err = 1;
            {
                const watch allocations;
                r = scmn_irsz_create(&param, &err);
            }
            ASSERT_NE(r, nullptr);
            EXPECT_EQ(err, SCMN_IRSZ_OK);
            EXPECT_EQ(watched.made, mode == SCMN_IRSZ_LINE ? 2 : 1);
            const int src_line = 700 * k.src_bytes / k.unit, dst_line = 164 * k.dst_bytes / k.unit;
            const int32_t got[] = {r->format, r->mode,      r->inc_x,    r->inc_y,
                                   r->y_pos,  r->tap_dx,    r->src_line, r->dst_w,
                                   r->dst_h,  r->dst_line,  r->shift_x,  r->shift_y,
                                   r->tap_dy, r->carry_off, r->carry,    r->chunk_size,
                                   r->row,    r->upscale,   r->reuse};
            const int32_t expected[] = {k.format,
                                        mode,
                                        (319 << 18) / 160,
                                        (99 << 18) / 201,
                                        0,
                                        2,
                                        src_line,
                                        160,
                                        201,
                                        dst_line,
                                        1,
                                        0,
                                        src_line,
                                        0,
                                        0,
                                        src_line * 16,
                                        0,
                                        1,
                                        0};
            static_assert(std::size(got) == 19 && std::size(expected) == 19);
            EXPECT_TRUE(std::equal(got, got + 19, expected)) << k.name;
            EXPECT_EQ(memcmp(r, got, sizeof got), 0);  // the record begins with them, in this order
            EXPECT_EQ(r->run, k.entry);
            EXPECT_EQ(r->dst, pixel);
            EXPECT_EQ(r->line_buf != nullptr, mode == SCMN_IRSZ_LINE);
            EXPECT_TRUE(!r->line_buf ||
                        rig::size_of_block(r->line_buf) >= size_t(640 * k.src_bytes));
            scmn_irsz_delete(r);
            EXPECT_TRUE(watched.live.empty());
        }
    scmn_irsz_param param{SCMN_IRSZ_8B, SCMN_IRSZ_LINE, 640, 480, 640, 16, 80, 40, 80, pixel};
    scmn_irsz_ctx *const r = scmn_irsz_create(&param, nullptr);
    EXPECT_EQ(r->upscale, 0);
    EXPECT_EQ(r->shift_x, 2);
    EXPECT_EQ(r->shift_y, 3);
    EXPECT_EQ(r->tap_dy, 640 * 8);
    scmn_irsz_delete(r);
    scmn_irsz_delete(nullptr);
}

TEST(irsz, refusals) {
    uint8_t pixel[4];
    const scmn_irsz_param good{
        SCMN_IRSZ_8B8B8B8B, SCMN_IRSZ_LINE, 64, 48, 64, 16, 32, 24, 32, pixel};
    const auto check = [](const scmn_irsz_param &param, int32_t expected, int failing = -1) {
        for (bool with_err : {true, false}) {
            int32_t err = 1;
            scmn_irsz_ctx *r;
            {
                const watch allocations(failing);
                r = scmn_irsz_create(&param, with_err ? &err : nullptr);
            }
            EXPECT_EQ(r == nullptr, expected != SCMN_IRSZ_OK);
            EXPECT_EQ(err, with_err ? expected : 1);
            scmn_irsz_delete(r);
            EXPECT_TRUE(watched.live.empty());
        }
    };
    const auto with = [&](auto change) {
        scmn_irsz_param p = good;
        change(p);
        return p;
    };
    using param = scmn_irsz_param;
    check(good, SCMN_IRSZ_OK);
    // One after the other.
    for (int mode : {0, 9, 12, -1}) {
        check(with([&](param &p) { p.mode = mode; }), SCMN_IRSZ_ERR_MODE);
        check(with([&](param &p) { p.mode = mode, p.format = 22, p.src_w = 0; }),
              SCMN_IRSZ_ERR_MODE);
    }
    for (int format : {0, 19, 22, 24, 26, 28, 30, -1}) {
        check(with([&](param &p) { p.format = format; }), SCMN_IRSZ_ERR_FORMAT);
        check(with([&](param &p) { p.format = format, p.dst_h = 0; }), SCMN_IRSZ_ERR_FORMAT);
    }
    // Either allocation.
    check(good, SCMN_IRSZ_ERR_MEMORY, 0);
    check(good, SCMN_IRSZ_ERR_MEMORY, 1);
    check(good, SCMN_IRSZ_OK, 2);
    check(with([](param &p) { p.mode = SCMN_IRSZ_FULL; }), SCMN_IRSZ_ERR_MEMORY, 0);
    check(with([](param &p) { p.mode = SCMN_IRSZ_FULL; }), SCMN_IRSZ_OK, 1);
    for (int32_t param::*size : {&param::src_w, &param::src_h, &param::dst_w, &param::dst_h})
        for (int32_t n : {0, -1, INT32_MIN}) check(with([&](param &p) { p.*size = n; }), -3);
    // What the positions hold, by the way of the decimation.
    const struct {
        int32_t from, to, expected;
    } extents[] = {{8192, 8000, 0},       {8193, 8000, -3},      {16384, 5000, 0},
                   {16385, 5000, -3},     {131072, 4000, 0},     {131073, 4000, -3},
                   {INT32_MAX, 4000, -3}, {8193, INT32_MAX, -3}, {INT32_MAX, INT32_MAX, -3}};
    for (const auto &e : extents) {
        check(with([&](param &p) { p.src_w = e.from, p.dst_w = e.to; }), e.expected);
        check(with([&](param &p) { p.src_h = e.from, p.dst_h = e.to; }), e.expected);
    }
    // Lengths: of a line, of a row, from tap to tap, of a band.
    const int32_t longest = INT32_MAX / 4;
    const auto lone = [&](auto change) {
        return with([&](param &p) { p.chunk_lines = 1, change(p); });
    };
    check(lone([&](param &p) { p.src_stride = longest; }), 0);
    check(lone([&](param &p) { p.src_stride = longest + 1; }), -3);
    check(lone([&](param &p) { p.src_stride = -longest - 1; }), 0);
    check(lone([&](param &p) { p.src_stride = -longest - 2; }), -3);
    check(lone([&](param &p) { p.dst_stride = longest; }), 0);
    check(lone([&](param &p) { p.dst_stride = longest + 1; }), -3);
    check(lone([&](param &p) { p.dst_stride = INT32_MIN; }), -3);
    check(lone([&](param &p) { p.src_stride = longest / 16, p.src_h = 1000; }), 0);
    check(lone([&](param &p) { p.src_stride = longest / 16 + 1, p.src_h = 1000; }), -3);
    check(with([&](param &p) { p.src_stride = longest / 16; }), 0);
    check(with([&](param &p) { p.src_stride = longest / 16 + 1; }), -3);
    // Bands do not matter to whole pictures.
    check(with([&](param &p) { p.mode = SCMN_IRSZ_FULL, p.chunk_lines = INT32_MAX; }), 0);
    // Words of 16 bits are two bytes too.
    check(lone([&](param &p) { p.format = SCMN_IRSZ_5B6B5B, p.src_stride = INT32_MAX / 2; }), 0);
    check(lone([&](param &p) { p.format = SCMN_IRSZ_5B6B5B, p.src_stride = 1 << 30; }), -3);
}

// Beyond the sweep: extents at the limit of the positions.
TEST(irsz, the_largest_extents) {
    rig::rng random(rig::seed());
    for (const kind &k : irsz_kinds) {
        check_bands(k, {{8192, 3}, {8191, 2}, 1}, random);
        check_bands(k, {{131072, 2}, {4000, 1}, 2}, random);
        check_bands(k, {{2, 131072}, {1, 4000}, 500}, random);
    }
}

}  // namespace
