// Bilinear resize: steps and weights, every kernel against the formula with four weights, lines made
// in pieces, and the entry point.
#include "simgp/resize.h"

#include <algorithm>
#include <cstring>

#include "simgp/resample.h"
#include "simgp/simgp.h"
#include "tests/rig.h"

namespace {

// The formula
// -------------------------------------------------------------------------------------

// One axis as the header puts it.
struct axis {
    int64_t step;
    int shift;

    explicit axis(int32_t packed) : step(packed / 8), shift(packed % 8) {}
    int at(int i) const { return int(i * step / 262144) << shift; }
    int phase(int i) const { return int(i * step / 32768) % 8; }
    // How much of a source n samples need: neighbours without weight are not needed.
    int needs(int n) const { return at(n - 1) + (phase(n - 1) ? 1 << shift : 0) + 1; }
};

struct kernel {
    const char *name;
    simgp_rsz_fn *call;
    simgp::resize_kind kind;
    int bytes;
    std::vector<int> fields;  // the bits of each channel, the lowest first
};
const kernel kernels[] = {
    {"simgp_rsz_8b", simgp_rsz_8b, simgp::resize_kind::bytes1, 1, {8}},
    {"simgp_rsz_8b8b", simgp_rsz_8b8b, simgp::resize_kind::bytes2, 2, {8, 8}},
    {"simgp_rsz_8b8b8b", simgp_rsz_8b8b8b, simgp::resize_kind::bytes3, 3, {8, 8, 8}},
    {"simgp_rsz_8b8b8b8b", simgp_rsz_8b8b8b8b, simgp::resize_kind::bytes4, 4, {8, 8, 8, 8}},
    {"simgp_rsz_5b6b5b", simgp_rsz_5b6b5b, simgp::resize_kind::word565, 2, {5, 6, 5}},
};
const kernel &kernel_of(simgp_rsz_fn *call) {
    return *std::find_if(std::begin(kernels), std::end(kernels),
                         [=](const kernel &k) { return k.call == call; });
}

uint32_t pixel_at(const kernel &k, const rig::plane &p, int x, int y) {
    uint32_t pixel = 0;
    for (int i = 0; i < k.bytes; i++) pixel |= uint32_t(p.row(y)[x * k.bytes + i]) << 8 * i;
    return pixel;
}

void resize_by_formula(const kernel &k, const rig::plane &src, const rig::plane &dst,
                       int32_t step_x, int32_t step_y) {
    const axis across(step_x), down(step_y);
    for (int j = 0; j < dst.shape().rows; j++)
        for (int i = 0; i < dst.shape().width; i++) {
            const int fx = across.phase(i), fy = down.phase(j);
            const uint8_t *const w = simgp_tbl_rsz_weight + 32 * fx + 4 * fy;
            uint32_t pixel = 0, near[4];
            for (int n = 0; n < 4; n++)
                near[n] = w[n] ? pixel_at(k, src, across.at(i) + (n & 1 ? 1 << across.shift : 0),
                                          down.at(j) + (n & 2 ? 1 << down.shift : 0))
                               : 0;
            int first = 0;
            for (int bits : k.fields) {
                uint32_t sum = 0;
                for (int n = 0; n < 4; n++) sum += w[n] * (near[n] >> first & ((1u << bits) - 1));
                pixel |= sum >> 6 << first;
                first += bits;
            }
            for (int b = 0; b < k.bytes; b++) dst.row(j)[i * k.bytes + b] = uint8_t(pixel >> 8 * b);
        }
}

// Steps and weights
// --------------------------------------------------------------------------------

TEST(resize, weights) {
    for (int fx = 0; fx < 8; fx++)
        for (int fy = 0; fy < 8; fy++) {
            const int expected[] = {(8 - fx) * (8 - fy), fx * (8 - fy), (8 - fx) * fy, fx * fy};
            EXPECT_TRUE(
                std::equal(expected, expected + 4, simgp_tbl_rsz_weight + 32 * fx + 4 * fy));
        }
}

std::pair<int, int> steps(int src_width, int src_height, int dst_width, int dst_height, int mode) {
    std::pair<int, int> packed(-1, -1);
    simgp_rsz_get_step(src_width, src_height, dst_width, dst_height, mode, &packed.first,
                       &packed.second);
    return packed;
}
// The step along rows alone, and its shift.
std::pair<int, int> step(int from, int to) {
    const int packed = steps(from, 1, to, 1, SIMGP_ROT_NONE).first;
    return {packed >> 3, packed & 7};
}

TEST(resize, steps) {
    using p = std::pair<int, int>;
    EXPECT_EQ(step(2, 8), p(32768, 0));
    EXPECT_EQ(step(4, 4), p(3 << 16, 0));
    EXPECT_EQ(step(640, 320), p(639 * 262144 / 320, 0));
    EXPECT_EQ(step(959, 320), p(958 * 8192 / 10, 0));
    EXPECT_EQ(step(960, 320), p(479 * 8192 / 10, 1));
    EXPECT_EQ(step(1280, 320), p(639 * 8192 / 10, 1));
    EXPECT_EQ(step(1600, 320), p(399 * 8192 / 10, 2));
    EXPECT_EQ(step(80, 10), p(19 * 262144 / 10, 2));
    EXPECT_EQ(step(90, 10), p(11 * 262144 / 10, 3));
    EXPECT_EQ(step(160, 10), p(19 * 262144 / 10, 3));
    EXPECT_EQ(step(170, 10), p(10 * 262144 / 10, 4));
    EXPECT_EQ(step(640, 10), p(39 * 262144 / 10, 4));
    EXPECT_EQ(step(1, 5), p(0, 0));
    // The largest that the numbers hold, and those beyond.
    EXPECT_EQ(step(8192, 8192), p(8191 * 32, 0));
    EXPECT_EQ(step(8192, INT32_MAX), p(0, 0));
    EXPECT_EQ(step(16384, 4096), p(8191 * 64, 1));
    EXPECT_EQ(step(131072, 4096), p(8191 * 64, 4));
    EXPECT_EQ(step(16384, 1), p(1023 * 262144, 4));
    for (auto [from, to] : {std::pair(8193, 8192),
                            {8193, 4096},
                            {16385, 4096},
                            {131073, 4096},
                            {16385, 1},
                            {INT32_MAX, 1},
                            {INT32_MAX, INT32_MAX},
                            {0, 5},
                            {5, 0},
                            {-640, 320},
                            {640, -320},
                            {INT32_MIN, -1},
                            {INT32_MIN, INT32_MIN}})
        EXPECT_EQ(step(from, to), p(0, 0)) << from << " to " << to;

    // A quarter turn spreads the width over the height.
    const int wide = 639 * 8192 / 10 * 8, high = 719 * 4096 / 9 * 8;
    EXPECT_EQ(steps(640, 720, 320, 576, 0), p(wide, high));
    for (int mode : {-1, 3, 4, 5, 6}) EXPECT_EQ(steps(640, 720, 320, 576, mode), p(wide, high));
    for (int mode : {1, 2}) EXPECT_EQ(steps(640, 720, 576, 320, mode), p(wide, high));
    EXPECT_EQ(steps(640, 720, 0, 576, 0), p(0, high));
}

TEST(resize, by_hand) {
    rig::for_each_target([](const rig::target_rows &) {
        const auto row = [](simgp_rsz_fn *call, int bytes, std::vector<uint8_t> src, int width) {
            const int32_t packed = steps(int(src.size()) / bytes, 1, width, 1, 0).first;
            std::vector<uint8_t> dst(size_t(width * bytes));
            call(src.data(), 0, width, 1, 0, dst.data(), packed, 0);
            return dst;
        };
        using bytes = std::vector<uint8_t>;
        EXPECT_EQ(row(simgp_rsz_8b, 1, {0, 255}, 8), bytes({0, 31, 63, 95, 127, 159, 191, 223}));
        EXPECT_EQ(row(simgp_rsz_8b, 1, {8, 16, 64, 72}, 4), bytes({8, 14, 40, 66}));
        EXPECT_EQ(row(simgp_rsz_8b, 1, {77}, 3), bytes({77, 77, 77}));
        // Every second one of 12 to 3: positions 0, 1.67 (phase 5) and 3.33 (phase 2) of
        // 10, 30, 50, 70, 90, 110.
        EXPECT_EQ(row(simgp_rsz_8b, 1, {10, 0, 30, 0, 50, 0, 70, 0, 90, 0, 110, 0}, 3),
                  bytes({10, 42, 75}));
        EXPECT_EQ(row(simgp_rsz_8b8b, 2, {0, 100, 80, 20}, 2), bytes({0, 100, 40, 60}));
        // Fields do not carry into each other.
        EXPECT_EQ(row(simgp_rsz_5b6b5b, 2, {0x00, 0xF8, 0x1F, 0x00}, 2),
                  bytes({0x00, 0xF8, 0x0F, 15 << 3}));

        // Four pixels, between all of which lies the last one of 2 x 2.
        const uint8_t square[] = {0, 100, 40, 200};
        uint8_t dst[4];
        simgp_rsz_8b(square, 2, 2, 2, 2, dst, 131072 << 3, 131072 << 3);
        EXPECT_EQ(bytes(dst, dst + 4), bytes({0, 50, 20, 85}));
    });
}

// Kernels
// -----------------------------------------------------------------------------------------

// The source has no more than what is needed, and lies flush against inaccessible memory.
void check_kernel(const kernel &k, const rig::sweep &to, int reduction) {
    const auto make = [&](const rig::size &from, const rig::size &size) {
        const int width = from.width * reduction, height = from.height * reduction;
        const auto [x, y] = steps(width, height, size.width, size.height, 0);
        EXPECT_LE(axis(x).needs(size.width), width);
        EXPECT_LE(axis(y).needs(size.height), height);
        rig::plane_shape src =
            rig::samples(axis(x).needs(size.width), axis(y).needs(size.height), k.bytes);
        rig::plane_shape dst = rig::samples(size.width, size.height, k.bytes);
        src.stride_unit = dst.stride_unit = k.bytes == 3 ? 1 : k.bytes;
        return rig::job{{src},
                        {dst},
                        [=, x = x, y = y](const rig::picture &a, const rig::picture &b) {
                            k.call(a.planes[0], a.strides[0], b.widths[0], b.heights[0],
                                   b.strides[0], b.planes[0], x, y);
                        },
                        [=, x = x, y = y](const rig::picture &a, const rig::picture &b) {
                            resize_by_formula(k, a.parts[0], b.parts[0], x, y);
                        }};
    };
    rig::check_resize_jobs(k.name, to, make);
}

TEST(resize, kernels) {
    for (const kernel &k : kernels)
        check_kernel(k, {.max_height = 9, .large = {{640, 6}, {1918, 5}, {259, 67}, {4099, 3}}}, 1);
}

// Several strips, each with steps of any kind; neighbours up to 16 pixels apart.
TEST(resize, kernels_at_large_reductions) {
    for (const kernel &k : kernels)
        for (int reduction : {3, 7, 14, 31})
            check_kernel(k, {.max_width = 40, .rounds = 1, .large = {{135, 3}, {400, 2}}},
                         reduction);
}

TEST(resize, odd_strides_are_rounded_down_to_whole_samples) {
    rig::rng random(rig::seed());
    std::vector<uint8_t> src(9 * 64);
    rig::fill_bytes(src.data(), src.size(), rig::content::random, random);
    for (const kernel &k : kernels) {
        const auto run = [&](int src_stride, int dst_stride) {
            std::vector<uint8_t> dst(9 * 64, 7);
            k.call(src.data() + 4 * 64, src_stride, 5, 4, dst_stride, dst.data() + 4 * 64,
                   131072 << 3, 300000 << 3);
            return dst;
        };
        const int unit = k.bytes == 3 ? 1 : k.bytes;
        for (int stride : {40, -40})
            for (int more = 1; more < unit; more++) {
                EXPECT_EQ(run(stride + more, 60), run(stride, 60)) << k.name;
                EXPECT_EQ(run(40, stride + more), run(40, stride)) << k.name;
            }
    }
}

TEST(resize, nothing_to_write) {
    for (const kernel &k : kernels)
        for (auto [w, h] : {std::pair(0, 4), {4, 0}, {-4, 4}, {4, -4}, {INT32_MIN, 1}})
            k.call(nullptr, 16, w, h, 16, nullptr, 1 << 18, 1 << 18);
}

// Lines in pieces
// ----------------------------------------------------------------------------------

// A source that holds one row at a time, of which only the part that is wanted is there.
struct one_row {
    const rig::plane &src;
    simgp::source_span span;
    int bytes;
    std::vector<uint8_t> held;
    ptrdiff_t last = -1;

    const uint8_t *fetch(ptrdiff_t y) {
        EXPECT_GE(y, last) << "rows are asked for in rising order";
        last = y;
        const uint8_t *const from = src.row(y) + span.first * bytes;
        // Elsewhere each time: the row before is gone.
        held = std::vector<uint8_t>(from, from + span.columns * bytes);
        return held.data();
    }
};

// Blocks of columns, each with its lines in several calls: the same as the kernel.
TEST(resize, lines_in_pieces) {
    rig::rng random(rig::seed());
    for (int round = 0; round < (rig::quick() ? 100 : 600); round++) {
        const kernel &k = kernels[round % 5];
        const int width = 1 + random.below(300), height = 1 + random.below(40);
        const int from_width = 1 + random.below(random.below(4) ? 2 * width : 20 * width);
        const int from_height = 1 + random.below(random.below(4) ? 2 * height : 20 * height);
        const auto [x, y] = steps(from_width, from_height, width, height, 0);
        rig::plane src(rig::samples(from_width, from_height, k.bytes), {});
        const rig::plane_shape shape = rig::samples(width, height, k.bytes);
        rig::plane expected(shape, {}), got(shape, {});
        src.fill(rig::content::random, random);
        resize_by_formula(k, src, expected, x, y);
        rig::for_each_target([&, x = x, y = y](const rig::target_rows &) {
            got.fill_pattern(1);
            const simgp::resampling r(k.kind, x, y);
            const bool keep = r.keeps() && random.below(3);
            simgp::resample_memory<4096> memory;
            const ptrdiff_t most = r.strip_width(300, memory.size);
            ASSERT_GE(most, 16);
            for (ptrdiff_t at = 0; at < width;) {
                const ptrdiff_t columns =
                    std::min<ptrdiff_t>(1 + random.below(int(most)), width - at);
                ASSERT_LE(r.plan_bytes(columns) + r.ring_bytes(columns), memory.size);
                const simgp::source_span span =
                    keep ? r.part_of_rows(at, columns) : r.whole_rows(width);
                const simgp::resize_strip strip = r.plan(at, columns, span, memory.bytes);
                uint8_t *const ring = memory.bytes + r.plan_bytes(columns);
                const auto make = [&](auto lines) {
                    for (int line = 0; line < height;) {
                        const int count = std::min(1 + random.below(7), height - line);
                        lines.make(line, count, got.row(line) + at * k.bytes, got.stride());
                        line += count;
                    }
                };
                if (keep)
                    make(simgp::resampled_lines(r, strip, one_row{src, span, k.bytes, {}}, ring));
                else
                    make(simgp::resampled_lines(
                        r, strip, simgp::const_lines{src.row(0), src.stride()}, ring));
                at += columns;
            }
            EXPECT_EQ(got.stray_write(), "");
            for (int line = 0; line < height; line++)
                ASSERT_EQ(memcmp(got.row(line), expected.row(line), size_t(width * k.bytes)), 0)
                    << k.name << ", " << from_width << " x " << from_height << " to " << width
                    << " x " << height << ", line " << line << ", keep " << keep;
        });
    }
}

// Pictures
// ----------------------------------------------------------------------------------------

// The kernel for each plane of a format; none: refused.
std::vector<simgp_rsz_fn *> kernels_of(int format) {
    if (format == 0) return {simgp_rsz_8b};
    if (format == 6 || format == 7) return {simgp_rsz_8b, simgp_rsz_8b8b};
    if (format >= 1 && format <= 99 && format != 11)
        return {simgp_rsz_8b, simgp_rsz_8b, simgp_rsz_8b};
    if (format == 200 || format == 201) return {simgp_rsz_5b6b5b};
    if (format == 400 || format == 401) return {simgp_rsz_8b8b8b};
    if (format >= 500 && format <= 503) return {simgp_rsz_8b8b8b8b};
    return {};
}

// Planes whose sizes have nothing to do with each other.
std::vector<rig::plane_shape> shapes_of(int format, std::vector<rig::size> sizes) {
    std::vector<rig::plane_shape> shapes;
    for (simgp_rsz_fn *call : kernels_of(format)) {
        const rig::size &s = sizes[shapes.size()];
        const int bytes = kernel_of(call).bytes;
        shapes.push_back(rig::samples(s.width, s.height, bytes));
        shapes.back().stride_unit = bytes == 3 ? 1 : bytes;
    }
    return shapes;
}

TEST(resize, pictures_of_every_format) {
    rig::rng random(rig::seed());
    std::vector<int> codes = {-1, -3, INT32_MIN, INT32_MAX, 65536, 1 << 24};
    for (int format = 0; format <= 600; format++) codes.push_back(format);
    for (int format : codes) {
        SCOPED_TRACE(format);
        const std::vector<simgp_rsz_fn *> calls = kernels_of(format);
        rig::picture src(shapes_of(format, {{37, 9}, {19, 5}, {8, 8}}));
        // The second plane keeps its size, which is no copy.
        const auto dst_shapes = shapes_of(format, {{37, 10}, {19, 5}, {1, 9}});
        rig::picture expected(dst_shapes), got(dst_shapes);
        src.fill(rig::content::random, random);
        got.fill_pattern(unsigned(format));
        const simgp_img from = src.img(format);
        simgp_img to = got.img(format ^ 1);
        EXPECT_EQ(simgp_rsz(&from, &to), SIMGP_ERR_PARAM);
        to.format = format;
        EXPECT_EQ(simgp_rsz(&from, &to), calls.empty() ? SIMGP_ERR_UNSUPPORTED : SIMGP_OK);
        for (size_t k = 0; k < calls.size(); k++) {
            const auto [x, y] =
                steps(src.widths[k], src.heights[k], got.widths[k], got.heights[k], 0);
            resize_by_formula(kernel_of(calls[k]), src.parts[k], expected.parts[k], x, y);
        }
        EXPECT_EQ(rig::difference(expected, got), "");
        EXPECT_EQ(got.stray_write(), "");
    }
}

// If the first plane keeps its size, all planes are copied, with the sizes and strides of the
// source's descriptor, whatever the destination's says of the others.
TEST(resize, pictures_of_the_same_size_are_copied) {
    rig::rng random(rig::seed());
    for (int format = 0; format <= 503; format++) {
        if (kernels_of(format).empty()) continue;
        SCOPED_TRACE(format);
        const auto shapes = shapes_of(format, {{37, 9}, {19, 5}, {3, 1}});
        for (ptrdiff_t padding : {0, 4}) {
            rig::picture src(shapes, rig::placement{.padding = padding});
            rig::picture dst(shapes, rig::placement{.padding = 2 * padding});
            src.fill(rig::content::random, random);
            dst.fill_pattern(unsigned(format));
            const simgp_img from = src.img(format);
            simgp_img to = dst.img(format);
            for (int k = 1; k < 4; k++) to.width[k] = to.height[k] = -1;
            EXPECT_EQ(simgp_rsz(&from, &to), SIMGP_OK);
            EXPECT_EQ(rig::difference(src, dst), "");
            EXPECT_EQ(dst.stray_write(), "");
        }
    }
}

// Pairs are copied as bytes, with strides of any parity; words by whole words.
TEST(resize, odd_strides_of_copies) {
    uint8_t src[64], luma = 5;
    for (int i = 0; i < 64; i++) src[i] = uint8_t(i + 1);
    for (int format : {SIMGP_FMT_NV12, SIMGP_FMT_RGB565}) {
        const int plane = format == SIMGP_FMT_NV12;
        uint8_t dst[64] = {}, expected[64] = {}, to_luma = 0;
        simgp_img from = {}, to = {};
        from.format = to.format = format;
        from.width[0] = from.height[0] = to.width[0] = to.height[0] = 1;
        from.plane[0] = &luma;
        to.plane[0] = &to_luma;
        from.width[plane] = to.width[plane] = 3;
        from.height[plane] = to.height[plane] = 2;
        from.stride[plane] = 7;
        to.stride[plane] = 9;
        from.plane[plane] = src;
        to.plane[plane] = dst;
        EXPECT_EQ(simgp_rsz(&from, &to), SIMGP_OK);
        memcpy(expected, src, 6);
        memcpy(expected + (plane ? 9 : 8), src + (plane ? 7 : 6), 6);
        EXPECT_EQ(memcmp(dst, expected, 64), 0) << format;
        EXPECT_EQ(to_luma, plane ? 5 : 0);
    }
}

// Formats come first, then the sizes of all planes; nothing is written before.
TEST(resize, refused_sizes) {
    rig::picture src(rig::shapes_of(SIMGP_FMT_YUV420, 8, 8));
    rig::picture dst(rig::shapes_of(SIMGP_FMT_YUV420, 4, 4));
    dst.fill_pattern(1);
    const simgp_img from = src.img(SIMGP_FMT_YUV420), to = dst.img(SIMGP_FMT_YUV420);
    for (int k = 0; k < 3; k++)
        for (int bad : {0, -1, INT32_MIN, INT32_MAX, 131073})
            for (int which = 0; which < 4; which++) {
                simgp_img a = from, b = to;
                int32_t &extent = which < 2 ? (which ? a.width : a.height)[k]
                                            : (which == 2 ? b.width : b.height)[k];
                if (which >= 2 && bad > 0) continue;  // as large as you like
                extent = bad;
                EXPECT_EQ(simgp_rsz(&a, &b), SIMGP_ERR_PARAM) << k << ", " << which << ": " << bad;
                a.format = SIMGP_FMT_YV12;
                EXPECT_EQ(simgp_rsz(&a, &b), SIMGP_ERR_PARAM);
                a.format = b.format = SIMGP_FMT_T64X32;
                EXPECT_EQ(simgp_rsz(&a, &b), SIMGP_ERR_UNSUPPORTED);
                EXPECT_EQ(dst.stray_write(), "");
            }
    // A plane that its format does not have may have any size.
    simgp_img a = from, b = to;
    a.format = b.format = SIMGP_FMT_YUV400;
    a.width[1] = b.height[1] = b.width[2] = 0;
    EXPECT_EQ(simgp_rsz(&a, &b), SIMGP_OK);
}

}  // namespace
