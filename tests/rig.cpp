#include "tests/rig.h"

#include <algorithm>
#include <cstring>

#include "areas.h"
#include "simgp/simgp.h"

#ifdef RIG_ASAN
#include <sanitizer/asan_interface.h>
#endif

// The vector rows over plain lanes, compiled for the tests alone, on little-endian machines. On others
// a second table of the scalar rows stands in for them, so that there are two results to compare.
#ifdef SIMGP_HAVE_lanes
namespace simgp::lanes {
#define DECLARE(area) void fill_##area(area##_rows &);
SIMGP_AREAS(DECLARE)
#undef DECLARE
}  // namespace simgp::lanes
#endif

namespace rig {

namespace {

uint64_t number_from(const char *variable, uint64_t otherwise) {
    const char *text = getenv(variable);
    return text && *text ? strtoull(text, nullptr, 0) : otherwise;
}

// What the drivers run now, for a program that ends at an inaccessible page.
char running[512] = "";

constexpr size_t reach = 128;  // bytes that are watched on either side of a destination

uint8_t pattern(ptrdiff_t i, unsigned salt) {
    return uint8_t((unsigned(i) * 0x9E3779B1u ^ salt * 0x85EBCA6Bu) >> 21);
}

}  // namespace

uint64_t seed() {
    static const uint64_t value = number_from("SIMGP_TEST_SEED", 1);
    return value;
}

bool quick() {
    static const bool value = number_from("SIMGP_TEST_QUICK", 0) != 0;
    return value;
}

void fill_bytes(uint8_t *p, size_t size, content what, rng &random) {
    static constexpr uint8_t corners[] = {0,   1,   15,  16,  17,  100, 127, 128,
                                          129, 156, 200, 235, 236, 240, 254, 255};
    const bool by_chance = what == content::random || what == content::extremes ||
                           what == content::corners || what == content::smooth;
    uint8_t last = what == content::smooth ? uint8_t(random.next() >> 56) : 0;
    for (size_t i = 0; i < size; i++) {
        const uint64_t r = by_chance ? random.next() >> 56 : 0;
        switch (what) {
            case content::random:
                p[i] = uint8_t(r);
                break;
            case content::extremes:
                p[i] = r & 1 ? 255 : 0;
                break;
            case content::corners:
                p[i] = corners[r & 15];
                break;
            case content::alternating:
                p[i] = i & 1 ? 255 : 0;
                break;
            case content::ones:
                p[i] = 255;
                break;
            case content::smooth:
                p[i] = last = uint8_t(std::clamp(last + int(r % 9) - 4, 0, 255));
                break;
            default:
                p[i] = 0;
        }
    }
}

// Formats
// ------------------------------------------------------------------------------------------

namespace {

// Y of full size, in a plane of its own.
constexpr channel_place luma{0, 0, 1, 1, 1};

format yuv(int code, channel_place y, channel_place u, channel_place v) {
    return {code, {y, u, v}};
}
// Y, and pairs in the next plane; which byte is U, which is V.
format pairs(int code, int u, int v) { return yuv(code, luma, {1, u, 2, 2, 2}, {1, v, 2, 2, 2}); }
// Groups of four bytes for two pixels: where the first Y, U and V stand.
format groups(int code, int y, int u, int v) {
    return yuv(code, {0, y, 2, 1, 1}, {0, u, 4, 2, 1}, {0, v, 4, 2, 1});
}
format tiled(format f) {
    f.tiled = true;
    return f;
}
format rgb_words(int code, int bytes, field r, field g, field b, field a = {}) {
    return {code, {}, bytes, r, g, b, a};
}

}  // namespace

const std::vector<format> &formats() {
    // clang-format off
    static const std::vector<format> all = {
        yuv(SIMGP_FMT_YUV400,  luma, {}, {}),
        yuv(SIMGP_FMT_YUV420,  luma, {1, 0, 1, 2, 2}, {2, 0, 1, 2, 2}),
        yuv(SIMGP_FMT_YUV422N, luma, {1, 0, 1, 2, 1}, {2, 0, 1, 2, 1}),
        yuv(SIMGP_FMT_YUV444,  luma, {1, 0, 1, 1, 1}, {2, 0, 1, 1, 1}),
        yuv(SIMGP_FMT_YV12,    luma, {2, 0, 1, 2, 2}, {1, 0, 1, 2, 2}),
        yuv(SIMGP_FMT_YV16,    luma, {2, 0, 1, 2, 1}, {1, 0, 1, 2, 1}),
        pairs(SIMGP_FMT_NV12, 0, 1),
        pairs(SIMGP_FMT_NV21, 1, 0),
        yuv(SIMGP_FMT_YUV422W, luma, {1, 0, 1, 1, 2}, {2, 0, 1, 1, 2}),
        tiled(pairs(SIMGP_FMT_T64X32, 0, 1)),
        groups(SIMGP_FMT_UYVY, 1, 0, 2),
        groups(SIMGP_FMT_YUYV, 0, 1, 3),
        rgb_words(SIMGP_FMT_RGB565,   2, {5, 11}, {6, 5}, {5, 0}),
        rgb_words(SIMGP_FMT_BGR565,   2, {5, 0}, {6, 5}, {5, 11}),
        rgb_words(SIMGP_FMT_RGB888,   3, {8, 0}, {8, 8}, {8, 16}),
        rgb_words(SIMGP_FMT_BGR888,   3, {8, 16}, {8, 8}, {8, 0}),
        rgb_words(SIMGP_FMT_RGBA8888, 4, {8, 0}, {8, 8}, {8, 16}, {8, 24}),
        rgb_words(SIMGP_FMT_BGRA8888, 4, {8, 16}, {8, 8}, {8, 0}, {8, 24}),
        rgb_words(SIMGP_FMT_ARGB8888, 4, {8, 8}, {8, 16}, {8, 24}, {8, 0}),
    };
    // clang-format on
    return all;
}

const format &format_of(int code) {
    for (const format &f : formats())
        if (f.code == code) return f;
    fprintf(stderr, "the rig knows no format %d\n", code);
    abort();
}

bool operator==(const rgb &a, const rgb &b) { return a.r == b.r && a.g == b.g && a.b == b.b; }

// Planes and pictures
// ------------------------------------------------------------------------------

plane_shape samples(int32_t width, int32_t height, int sample_bytes) {
    const ptrdiff_t w = width > 0 ? width : 0, h = height > 0 ? height : 0;
    return {width, height, sample_bytes, h ? w * sample_bytes : 0, w ? h : 0};
}

static plane_shape tiles(int32_t width, int32_t rows) {
    const ptrdiff_t w = width, tile_rows = (rows + 31) / 32;
    const ptrdiff_t bytes =
        8192 * ((w + 127) / 128 * (tile_rows / 2) + (tile_rows & 1) * ((w + 255) / 256));
    return {width, rows, 1, bytes, 1};
}

std::vector<plane_shape> shapes_of(int code, int32_t w, int32_t h) {
    const format &f = format_of(code);
    if (f.is_rgb()) return {samples(w, h, f.pixel_bytes)};
    if (f.tiled) return {tiles(w, h), tiles(w, h / 2)};
    std::vector<plane_shape> shapes;
    const auto in_plane = [&](int k) {
        return std::find_if(std::begin(f.yuv), std::end(f.yuv),
                            [k](const channel_place &c) { return c.step && c.plane == k; });
    };
    // A plane has the size of any of its channels; of packed groups, Y comes first.
    for (auto c = in_plane(0); c != std::end(f.yuv); c = in_plane(int(shapes.size())))
        shapes.push_back(
            samples((w + c->across - 1) / c->across, (h + c->down - 1) / c->down, c->step));
    return shapes;
}

placement any_placement(flush where, rng &random) {
    static constexpr ptrdiff_t paddings[] = {0, 0, 1, 2, 3, 7, 16, 61};
    placement p;
    p.where = where;
    p.gap = random.below(3) ? 0 : size_t(1 + random.below(40));
    p.padding = paddings[random.below(8)];
    p.bottom_up = random.below(4) == 0;
    return p;
}

static ptrdiff_t step_of(const plane_shape &s, const placement &place) {
    const ptrdiff_t least = s.row_bytes + place.padding;
    return (least + s.stride_unit - 1) / s.stride_unit * s.stride_unit;
}

static size_t extent(const plane_shape &s, ptrdiff_t step) {
    return s.rows ? size_t((s.rows - 1) * step + s.row_bytes) : 0;
}

plane::plane(const plane_shape &shape, const placement &place)
    : shape_(shape),
      stride_(step_of(shape, place) * (place.bottom_up ? -1 : 1)),
      memory_(extent(shape, step_of(shape, place)), place.where, place.gap),
      first_(memory_.data()) {
    if (place.bottom_up && shape.rows) first_ -= (shape.rows - 1) * stride_;
}

void plane::fill(content what, rng &random) {
    fill_bytes(memory_.data(), memory_.size(), content::random, random);
    for (ptrdiff_t y = 0; y < shape_.rows; y++)
        fill_bytes(row(y), size_t(shape_.row_bytes), what, random);
}

void plane::fill_pattern(unsigned salt) {
    salt_ = salt;
    const auto [begin, end] = memory_.room(reach);
    for (uint8_t *p = begin; p < end; p++) *p = pattern(p - memory_.data(), salt);
}

void plane::copy_visible(const plane &from) {
    for (ptrdiff_t y = 0; y < shape_.rows; y++)
        memcpy(row(y), from.row(y), size_t(shape_.row_bytes));
}

std::string plane::stray_write() const {
    const ptrdiff_t step = stride_ < 0 ? -stride_ : stride_;
    const auto [begin, end] = memory_.room(reach);
    uint8_t *p = begin;
    const auto check_to = [&](uint8_t *to) {
        for (; p < to; p++)
            if (*p != pattern(p - memory_.data(), salt_)) return false;
        return true;
    };
    bool clean = true;
    for (ptrdiff_t i = 0; clean && i < shape_.rows; i++) {
        clean = check_to(memory_.data() + i * step);
        if (clean) p += shape_.row_bytes;
    }
    if (clean && check_to(end)) return "";
    const ptrdiff_t at = p - memory_.data();
    char text[160];
    const ptrdiff_t line = at < 0 || !step           ? 0
                           : at / step < shape_.rows ? at / step
                                                     : shape_.rows - 1;
    snprintf(text, sizeof text,
             "byte %td of memory row %td, outside the %td visible ones, was written: 0x%02x",
             at - line * step, line, shape_.row_bytes, *p);
    return text;
}

void plane::forbid_padding() {
#ifdef RIG_ASAN
    const ptrdiff_t step = stride_ < 0 ? -stride_ : stride_;
    for (ptrdiff_t i = 0; i + 1 < shape_.rows; i++)
        ASAN_POISON_MEMORY_REGION(memory_.data() + i * step + shape_.row_bytes,
                                  size_t(step - shape_.row_bytes));
    forbidden_ = true;
#endif
}

void plane::allow_padding() {
#ifdef RIG_ASAN
    if (forbidden_) ASAN_UNPOISON_MEMORY_REGION(memory_.data(), memory_.size());
#endif
    forbidden_ = false;
}

picture::picture(const std::vector<plane_shape> &shapes, const std::vector<placement> &places) {
    parts.reserve(shapes.size());
    for (size_t k = 0; k < shapes.size(); k++) parts.emplace_back(shapes[k], places[k]);
    for (size_t k = 0; k < 4; k++) {
        const bool there = k < shapes.size();
        planes[k] = there ? parts[k].row(0) : reinterpret_cast<uint8_t *>(uintptr_t(16));
        widths[k] = there ? shapes[k].width : INT32_MAX;
        heights[k] = there ? shapes[k].height : INT32_MAX;
        strides[k] = there ? int32_t(parts[k].stride()) : INT32_MIN;
        if (there && shapes[k].rounded) strides[k] += places[k].excess % shapes[k].stride_unit;
    }
}

picture::picture(const std::vector<plane_shape> &shapes, const placement &place)
    : picture(shapes, std::vector<placement>(shapes.size(), place)) {}

void picture::fill(content what, rng &random) {
    for (plane &p : parts) p.fill(what, random);
}

void picture::fill_pattern(unsigned salt) {
    for (plane &p : parts) p.fill_pattern(salt);
}

std::string picture::stray_write() const {
    for (size_t k = 0; k < parts.size(); k++) {
        const std::string found = parts[k].stray_write();
        if (!found.empty()) return "plane " + std::to_string(k) + ": " + found;
    }
    return "";
}

simgp_img picture::img(int format) const {
    simgp_img image;
    memset(&image, 0xA5, sizeof image);  // what is never read may hold anything
    for (int k = 0; k < 4; k++) {
        image.plane[k] = planes[k];
        image.width[k] = widths[k];
        image.height[k] = heights[k];
        image.stride[k] = strides[k];
    }
    image.format = format;
    return image;
}

std::string difference(const picture &expected, const picture &got) {
    for (size_t k = 0; k < expected.parts.size(); k++) {
        const plane_shape &s = expected.parts[k].shape();
        for (ptrdiff_t y = 0; y < s.rows; y++) {
            const uint8_t *e = expected.parts[k].row(y), *g = got.parts[k].row(y);
            if (memcmp(e, g, size_t(s.row_bytes)) == 0) continue;
            ptrdiff_t x = 0;
            while (e[x] == g[x]) x++;
            char text[200];
            snprintf(text, sizeof text,
                     "plane %zu: sample (%td, %td), its byte %td: expected 0x%02x, got 0x%02x", k,
                     x / s.sample_bytes, y, x % s.sample_bytes, e[x], g[x]);
            return text;
        }
    }
    return "";
}

// Targets
// ------------------------------------------------------------------------------------------

const std::vector<target_rows> &all_targets() {
    using simgp::target;
    static const simgp::row_table lanes = [] {
        simgp::row_table table = simgp::rows_of(target::scalar);
#ifdef SIMGP_HAVE_lanes
#define FILL(area) simgp::lanes::fill_##area(table.area);
        SIMGP_AREAS(FILL)
#undef FILL
        table.vector = 32;
#endif
        return table;
    }();
    static const std::vector<target_rows> all = [] {
        std::vector<target_rows> found = {{"scalar", &simgp::rows_of(target::scalar)},
                                          {"lanes", &lanes}};
        for (int t = int(target::scalar) + 1; t < int(target::count); t++)
            if (simgp::target_available(target(t)))
                found.push_back({simgp::target_name(target(t)), &simgp::rows_of(target(t))});
        return found;
    }();
    return all;
}

// Drivers
// ------------------------------------------------------------------------------------------

namespace {

std::string describe(const picture &p) {
    std::string text;
    for (const plane &part : p.parts)
        text += (text.empty() ? "" : ", ") + std::to_string(part.stride());
    return text;
}

std::string text_of(const size &s) {
    return std::to_string(s.width) + " x " + std::to_string(s.height);
}

std::string complaint;

}  // namespace

void complain(const std::string &fault) { complaint = fault; }

std::string fault_of(const std::string &what_runs, const job &j, const setting &how) {
    report_faults(running);
    picture src(j.src, how.src), expected(j.dst, how.dst), got(j.dst, how.dst);
    how.fill(src);
    if (j.season) j.season(src);
    picture input(j.in_place ? j.dst : std::vector<plane_shape>());
    how.fill(input);
    std::vector<std::vector<uint8_t>> before;
    for (const plane &p : src.parts)
        for (ptrdiff_t y = 0; y < p.shape().rows; y++)
            before.emplace_back(p.row(y), p.row(y) + p.shape().row_bytes);

    // What no job may change holds another pattern around each result: a job that reads it fails.
    const auto prepare = [&](picture &dst, unsigned salt) {
        dst.fill_pattern(salt);
        for (size_t k = 0; k < input.parts.size(); k++) dst.parts[k].copy_visible(input.parts[k]);
    };
    const bool by_reference = bool(j.reference);
    if (by_reference) {
        prepare(expected, how.salt);
        j.reference(src, expected);
    }
    for (const target_rows &t : all_targets()) {
        const bool defines = &t == &all_targets()[0] && !by_reference;
        picture &dst = defines ? expected : got;
        snprintf(running, sizeof running, "%s, %s rows, %s, strides %s -> %s", what_runs.c_str(),
                 t.name, how.words.c_str(), describe(src).c_str(), describe(dst).c_str());
        prepare(dst, defines || j.holes ? how.salt : ~how.salt);
        for (plane &p : src.parts) p.forbid_padding();
        for (size_t k = 0; k < input.parts.size(); k++) dst.parts[k].forbid_padding();
        complaint.clear();
        {
            forced rows(t);
            j.run(src, dst);
        }
        for (plane &p : src.parts) p.allow_padding();
        for (plane &p : dst.parts) p.allow_padding();

        std::string fault = dst.stray_write();
        size_t i = 0;
        for (const plane &p : src.parts)
            for (ptrdiff_t y = 0; y < p.shape().rows; y++, i++)
                if (!std::equal(before[i].begin(), before[i].end(), p.row(y)))
                    fault = "the source was written";
        if (fault.empty()) fault = complaint;
        if (fault.empty() && !defines) fault = difference(expected, got);
        if (fault.empty()) continue;
        fault += "\n  in: " + std::string(running);
        *running = 0;
        return fault;
    }
    *running = 0;
    return "";
}

namespace {

bool check_job(const std::string &what_runs, flush where, const job &j, rng &random,
               const std::function<placement()> &place) {
    const auto places = [&](size_t count) {
        std::vector<placement> p(count);
        for (placement &each : p) each = place();
        return p;
    };
    setting how;
    how.dst = places(j.dst.size());
    how.src = places(j.src.size());
    const content what = content(random.below(int(content::count) + 2) % int(content::count));
    how.fill = [&](picture &p) { p.fill(what, random); };
    how.salt = unsigned(random.next());
    how.words = std::string("planes flush at their ") + (where == flush::at_end ? "end" : "start") +
                ", content " + std::to_string(int(what)) +
                ", SIMGP_TEST_SEED=" + std::to_string(seed());
    const std::string fault = fault_of(what_runs, j, how);
    if (!fault.empty()) ADD_FAILURE() << fault;
    return fault.empty();
}

}  // namespace

namespace {

// Calls check(width, height) for the sizes of a sweep until it returns false.
template <typename F>
bool for_sizes(const sweep &sizes, const F &check) {
    int heights = 0;
    for (int round = 0; round < (quick() ? 1 : sizes.rounds); round++)
        for (int width = sizes.step_x; width <= sizes.max_width; width += sizes.step_x) {
            const int height = (1 + heights++ % (sizes.max_height / sizes.step_y)) * sizes.step_y;
            if (!check(width, height)) return false;
        }
    for (const auto &[width, height] : sizes.large)
        if (!check((width + sizes.step_x - 1) / sizes.step_x * sizes.step_x,
                   (height + sizes.step_y - 1) / sizes.step_y * sizes.step_y))
            return false;
    return true;
}

bool check_both_ways(const std::string &what_runs, const job &j, rng &random) {
    const auto check = [&](flush where) {
        return check_job(what_runs, where, j, random, [&] { return any_placement(where, random); });
    };
    return check(flush::at_end) && check(flush::at_start);
}

}  // namespace

bool check_jobs(const std::string &name, const sweep &sizes,
                const std::function<job(int width, int height)> &make) {
    rng random(seed());
    return for_sizes(sizes, [&](int width, int height) {
        return check_both_ways(name + ", " + text_of({width, height}), make(width, height), random);
    });
}

bool check_every_size(const std::string &name, int widths, int heights, rng &random,
                      const std::function<job(int width, int height)> &make) {
    for (int height = 1; height <= heights; height++)
        for (int width = 1; width <= widths; width++)
            for (flush where : {flush::at_end, flush::at_start}) {
                const auto place = [&] {
                    placement p = any_placement(where, random);
                    p.gap = random.below(2) ? size_t(random.below(64)) : 0;
                    p.excess = random.below(4);
                    return p;
                };
                if (!check_job(name + ", " + text_of({width, height}), where, make(width, height),
                               random, place))
                    return false;
            }
    return true;
}

bool check_resize_jobs(const std::string &name, const sweep &to,
                       const std::function<job(const size &from, const size &to)> &make) {
    rng random(seed());
    int calls = 0;
    // A length to start from; `most` bounds those that are drawn at random.
    const auto source_of = [&](int length, int kind, int step, int most) {
        const int lengths[] = {length,
                               length / 2,
                               2 * length,
                               length + step,
                               length - step,
                               3 * length / 2,
                               step,
                               1 + random.below(most),
                               1 + random.below(2 * most)};
        static_assert(std::size(lengths) == 9);
        return std::max(1, (lengths[kind] + step - 1) / step) * step;
    };
    return for_sizes(to, [&](int width, int height) {
        // Two sources for each destination; within 81 of them each kind across meets each kind down.
        for (int i = 0; i < 2; i++, calls++) {
            const size dst = {width, height};
            const size src = {
                source_of(width, calls % 9, to.step_x, to.max_width),
                source_of(height, (calls + calls / 9 * 5) % 9, to.step_y, to.max_height)};
            if (!check_both_ways(name + ", " + text_of(src) + " to " + text_of(dst), make(src, dst),
                                 random))
                return false;
        }
        return true;
    });
}

bool check_csc(const std::string &name, simgp_csc_fn *kernel, int from, int to, const sweep &sizes,
               const std::function<void(const picture &src, const picture &dst)> &reference) {
    return check_jobs(name, sizes, [&](int width, int height) {
        return job{shapes_of(from, width, height), shapes_of(to, width, height),
                   [=](const picture &src, const picture &dst) { call(kernel, src, dst); },
                   reference, format_of(to).tiled};
    });
}

bool check_plane_fn(const std::string &name, simgp_plane_fn *kernel, int src_sample_bytes,
                    const std::function<plane_shape(int width, int height)> &dst_shape,
                    const sweep &sizes,
                    const std::function<void(const picture &src, const picture &dst)> &reference) {
    return check_jobs(name, sizes, [&](int width, int height) {
        return job{{samples(width, height, src_sample_bytes)},
                   {dst_shape(width, height)},
                   [=](const picture &src, const picture &dst) {
                       kernel(src.planes[0], width, height, src.strides[0], dst.strides[0],
                              dst.planes[0]);
                   },
                   reference};
    });
}

}  // namespace rig
