// The rig sees what it is there to see: copies of a plane, each with one fault.
#include "tests/rig.h"

#include <gtest/gtest-spi.h>

#include <cstring>

#include "simgp/simgp.h"

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

// In place
// -----------------------------------------------------------------------------------------

// Adds to every sample the one above it, and a constant from a table that is only read.
void accumulate(const picture &table, const picture &p) {
    for (ptrdiff_t y = 0; y < p.heights[0]; y++)
        for (int x = 0; x < p.widths[0]; x++)
            p.row(0, y)[x] =
                uint8_t(p.row(0, y)[x] + table.row(0, 0)[0] + (y ? p.row(0, y - 1)[x] : 0));
}

using fault_fn = std::function<void(const picture &src, const picture &dst)>;
bool check_in_place(const fault_fn &fault, const fault_fn &reference = nullptr) {
    return rig::check_jobs("accumulate", {.max_width = 40}, [&](int width, int height) {
        rig::job j{{rig::samples(1, 1)}, {rig::samples(width, height)}, {}, reference};
        j.run = [&](const picture &table, const picture &p) {
            accumulate(table, p);
            fault(table, p);
        };
        j.in_place = true;
        return j;
    });
}

// Every target, and the reference, find what was there at first, not what another one left.
TEST(rig_in_place, passes_what_is_right) {
    EXPECT_TRUE(check_in_place([](const picture &, const picture &) {}));
    EXPECT_TRUE(check_in_place([](const picture &, const picture &) {}, accumulate));
}

TEST(rig_in_place, sees_a_wrong_byte) {
    EXPECT_NONFATAL_FAILURE(check_in_place([](const picture &, const picture &p) {
                                if (vector_rows() && p.widths[0] == 17) *last(p) ^= 1;
                            }),
                            "accumulate, 17 x 2, lanes rows");
    // Of the scalar rows too, where there is a reference.
    EXPECT_NONFATAL_FAILURE(
        check_in_place([](const picture &, const picture &p) { *last(p) ^= 1; }, accumulate),
        "scalar rows");
}

TEST(rig_in_place, sees_work_that_is_not_done) {
    EXPECT_NONFATAL_FAILURE(
        rig::check_jobs("idle", {},
                        [](int width, int height) {
                            rig::job j{{}, {rig::samples(width, height)}, {}, {}};
                            j.run = [](const picture &, const picture &p) {
                                if (!vector_rows()) *last(p) ^= 1;
                            };
                            j.in_place = true;
                            return j;
                        }),
        "lanes rows");
}

TEST(rig_in_place, sees_a_byte_outside_the_plane_written) {
    EXPECT_NONFATAL_FAILURE(check_in_place([](const picture &, const picture &p) {
                                static int calls = 0;
                                if (calls++ == 0) p.row(0, 0)[-1] ^= 1;
                            }),
                            "was written");
}

TEST(rig_in_place, sees_a_source_written) {
    EXPECT_NONFATAL_FAILURE(
        check_in_place([](const picture &table, const picture &) { *last(table) ^= 1; }),
        "the source was written");
}

// Of 16 bytes and more: AddressSanitizer watches groups of 8, and some narrow gaps hold none.
bool padded(const picture &p) { return p.heights[0] > 1 && p.strides[0] >= p.widths[0] + 16; }
void touch_padding(const picture &, const picture &p) {
    if (padded(p)) p.row(0, 0)[p.widths[0]] ^= 0x10;
}
// What lies in the padding differs from call to call.
void read_padding(const picture &, const picture &p) {
    if (padded(p)) *last(p) ^= p.row(0, 0)[p.widths[0]];
}
#ifdef __SANITIZE_ADDRESS__
TEST(rig_in_place_death, padding_is_inaccessible) {
    EXPECT_DEATH(check_in_place(touch_padding), "use-after-poison");
    EXPECT_DEATH(check_in_place(read_padding), "use-after-poison");
}
#else
TEST(rig_in_place, sees_padding_written_and_read) {
    EXPECT_NONFATAL_FAILURE(check_in_place(touch_padding), "was written");
    EXPECT_NONFATAL_FAILURE(check_in_place(read_padding), "lanes rows");
}
#endif

// Other sizes
// --------------------------------------------------------------------------------------

// The nearest sample.
void stretch(const picture &src, const picture &dst) {
    for (int y = 0; y < dst.heights[0]; y++)
        for (int x = 0; x < dst.widths[0]; x++)
            dst.row(0, y)[x] =
                src.row(0, y * src.heights[0] / dst.heights[0])[x * src.widths[0] / dst.widths[0]];
}

bool check_stretch(const fault_fn &fault) {
    return rig::check_resize_jobs("stretch", {}, [&](const rig::size &from, const rig::size &to) {
        return rig::job{{rig::samples(from.width, from.height)},
                        {rig::samples(to.width, to.height)},
                        [&](const picture &src, const picture &dst) {
                            stretch(src, dst);
                            fault(src, dst);
                        },
                        nullptr};
    });
}

TEST(rig_resize, passes_what_is_right) {
    EXPECT_TRUE(check_stretch([](const picture &, const picture &) {}));
}

// The sizes are the same for a seed, keep to the steps, and have every case that resizers treat in
// a way of its own, across with any down.
TEST(rig_resize, sizes_meet_each_other) {
    const auto tried = [] {
        std::vector<std::pair<rig::size, rig::size>> all;
        rig::check_resize_jobs("none", {.step_x = 2, .step_y = 2, .max_height = 12},
                               [&](const rig::size &from, const rig::size &to) {
                                   all.emplace_back(from, to);
                                   rig::job j;
                                   j.run = [](const picture &, const picture &) {};
                                   return j;
                               });
        return all;
    };
    const auto all = tried(), again = tried();
    ASSERT_EQ(all.size(), again.size());
    bool seen[4][4] = {};
    for (size_t i = 0; i < all.size(); i++) {
        const auto &[from, to] = all[i];
        EXPECT_EQ(from.width, again[i].first.width);
        EXPECT_EQ(from.height, again[i].first.height);
        EXPECT_EQ(from.width % 2 + from.height % 2 + to.width % 2 + to.height % 2, 0);
        EXPECT_GT(std::min({from.width, from.height, to.width, to.height}), 0);
        const auto kind = [](int a, int b) { return a == b ? 0 : a == 2 * b ? 1 : a < b ? 2 : 3; };
        seen[kind(from.width, to.width)][kind(from.height, to.height)] = true;
    }
    for (const auto &across : seen)
        for (bool down : across) EXPECT_TRUE(down);
}

TEST(rig_resize, sees_a_wrong_byte_and_names_both_sizes) {
    EXPECT_NONFATAL_FAILURE(check_stretch([](const picture &, const picture &dst) {
                                if (vector_rows() && dst.widths[0] == 2) *last(dst) ^= 1;
                            }),
                            " to 2 x 2, lanes rows");
}

TEST(rig_resize, sees_bytes_written_elsewhere) {
    EXPECT_NONFATAL_FAILURE(check_stretch(touch_padding), "was written");
    EXPECT_NONFATAL_FAILURE(check_stretch([](const picture &, const picture &dst) {
                                static int calls = 0;
                                if (calls++ == 0) dst.row(0, 0)[-1] ^= 1;
                            }),
                            "was written");
    EXPECT_NONFATAL_FAILURE(
        check_stretch([](const picture &src, const picture &) { *last(src) ^= 1; }),
        "the source was written");
}

// A turned plane: the destination's shape comes from a function.
template <int Wrong>
void turn(const void *src, int32_t width, int32_t height, int32_t src_stride, int32_t dst_stride,
          void *dst) {
    const auto *from = static_cast<const uint8_t *>(src);
    auto *to = static_cast<uint8_t *>(dst);
    for (int y = 0; y < height; y++)
        for (int x = 0; x < width; x++)
            to[ptrdiff_t(x) * dst_stride + y] = from[ptrdiff_t(y) * src_stride + x];
    if (Wrong == 1 && vector_rows() && height == 3) to[2] ^= 1;
    if (Wrong == 2 && width > 1 && dst_stride > height) to[height] ^= 1;
    if (Wrong == 3) const_cast<uint8_t *>(from)[width - 1] ^= 1;
}
bool check_turn(simgp_plane_fn *kernel) {
    return rig::check_plane_fn("turn", kernel, 1, [](int w, int h) { return rig::samples(h, w); },
                               {.max_width = 40});
}

TEST(rig_plane_fn, sees_faults_in_a_destination_of_another_shape) {
    EXPECT_TRUE(check_turn(turn<0>));
    EXPECT_NONFATAL_FAILURE(check_turn(turn<1>), "sample (2, 0), its byte 0");
    EXPECT_NONFATAL_FAILURE(check_turn(turn<2>), "was written");
    EXPECT_NONFATAL_FAILURE(check_turn(turn<3>), "the source was written");
}

// Formats
// ------------------------------------------------------------------------------------------

// The bytes of a pixel as they stand in img.h.
TEST(rig_formats, pixels_are_those_of_the_drawings) {
    using bytes = std::vector<uint8_t>;
    const struct {
        int code;
        bytes pixel;
        rig::rgb back;
    } known[] = {{SIMGP_FMT_RGB565, {0x73, 0xFE}, {248, 204, 152}},
                 {SIMGP_FMT_BGR565, {0x7F, 0x9E}, {248, 204, 152}},
                 {SIMGP_FMT_RGB888, {249, 207, 158}, {249, 207, 158}},
                 {SIMGP_FMT_BGR888, {158, 207, 249}, {249, 207, 158}},
                 {SIMGP_FMT_RGBA8888, {249, 207, 158, 255}, {249, 207, 158}},
                 {SIMGP_FMT_BGRA8888, {158, 207, 249, 255}, {249, 207, 158}},
                 {SIMGP_FMT_ARGB8888, {255, 249, 207, 158}, {249, 207, 158}}};
    for (const auto &k : known) {
        const rig::format &f = rig::format_of(k.code);
        bytes pixel(size_t(f.pixel_bytes));
        put_rgb(f, {249, 207, 158}, pixel.data());
        EXPECT_EQ(pixel, k.pixel) << k.code;
        EXPECT_TRUE(get_rgb(f, pixel.data()) == k.back) << k.code;
    }
}

// Each sample has a place of its own, in a plane that is there; together they fill the planes. The
// names in the drawings of img.h are what is found at those places.
TEST(rig_formats, samples_fill_the_planes) {
    constexpr int width = 6, height = 4;
    for (const rig::format &f : rig::formats()) {
        if (f.is_rgb() || f.tiled) continue;
        SCOPED_TRACE(f.code);
        picture p(rig::shapes_of(f.code, width, height));
        for (const rig::plane &part : p.parts)
            for (ptrdiff_t y = 0; y < part.shape().rows; y++)
                memset(part.row(y), 0, size_t(part.shape().row_bytes));
        for (rig::channel c : {rig::channel::y, rig::channel::u, rig::channel::v})
            for (int y = 0; y < height && f.at(c).step; y++)
                for (int x = 0; x < width; x++) {
                    uint8_t &s = *sample(p, f, c, x, y);
                    const uint8_t name = uint8_t("YUV"[int(c)]);
                    EXPECT_TRUE(s == 0 || s == name);
                    s = name;
                }
        for (const rig::plane &part : p.parts)
            for (ptrdiff_t y = 0; y < part.shape().rows; y++)
                EXPECT_EQ(memchr(part.row(y), 0, size_t(part.shape().row_bytes)), nullptr);
    }
    const auto head = [](int code, int plane) {
        picture p(rig::shapes_of(code, width, height));
        const rig::format &f = rig::format_of(code);
        for (rig::channel c : {rig::channel::y, rig::channel::u, rig::channel::v})
            for (int x = 0; x < width; x++) *sample(p, f, c, x, 0) = uint8_t("YUV"[int(c)]);
        return std::string(p.row(plane, 0), p.row(plane, 0) + 4);
    };
    EXPECT_EQ(head(SIMGP_FMT_NV12, 1), "UVUV");
    EXPECT_EQ(head(SIMGP_FMT_NV21, 1), "VUVU");
    EXPECT_EQ(head(SIMGP_FMT_UYVY, 0), "UYVY");
    EXPECT_EQ(head(SIMGP_FMT_YUYV, 0), "YUYV");
    EXPECT_EQ(head(SIMGP_FMT_YV12, 1).substr(0, 3), "VVV");
    EXPECT_EQ(head(SIMGP_FMT_YV16, 1).substr(0, 3), "VVV");
    EXPECT_EQ(head(SIMGP_FMT_YUV422W, 2), "VVVV");
}

// Touches a byte so that no compiler leaves it out.
void touch(const uint8_t *p) { (void)*static_cast<const volatile uint8_t *>(p); }

using rig_death = testing::Test;

// In the regular expressions of the system, and in those that GoogleTest brings along.
#if GTEST_USES_SIMPLE_RE
#define NUMBER "\\d+"
#else
#define NUMBER "[0-9]+"
#endif

TEST(rig_death, a_byte_behind_the_plane_ends_the_program) {
    // Not always the first one: it may lie a few bytes away from the inaccessible page. What follows
    // the last line of a bottom-up plane is padding.
    EXPECT_DEATH(check([](const picture &src, const picture &) {
                     if (src.strides[0] > 0) touch(last(src) + 1);
                 }),
                 "fault in: copy, " NUMBER " x " NUMBER ", scalar rows, planes flush at their end");
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
