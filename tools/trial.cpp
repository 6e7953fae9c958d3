#include "tools/trial.h"

#include <stdio.h>
#include <stdlib.h>

#include <array>

namespace tools {

void crc32::add(const void *bytes, size_t size) {
    static const auto table = [] {
        std::array<uint32_t, 256> t;
        for (uint32_t i = 0; i < 256; i++) {
            t[i] = i;
            for (int bit = 0; bit < 8; bit++) t[i] = t[i] >> 1 ^ (t[i] & 1 ? 0xEDB88320u : 0);
        }
        return t;
    }();
    const uint8_t *p = static_cast<const uint8_t *>(bytes);
    for (size_t i = 0; i < size; i++) state_ = state_ >> 8 ^ table[(state_ ^ p[i]) & 255];
}

void crc32::number(uint32_t n) {
    const uint8_t bytes[4] = {uint8_t(n), uint8_t(n >> 8), uint8_t(n >> 16), uint8_t(n >> 24)};
    add(bytes, 4);
}

// The memory of a trial. Its alignment is the same everywhere, and so are those of the planes.
alignas(64) static uint8_t memory[3 << 20];

trial::trial(std::string_view function, uint64_t seed, int index) : index(index) {
    crc32 name;
    name.add(function);
    state_ = seed;
    state_ = next() ^ name.value();
    state_ = next() + uint64_t(index);
}

// SplitMix64 (Steele, Lea and Flood, 2014).
uint64_t trial::next() {
    uint64_t z = state_ += 0x9E3779B97F4A7C15u;
    z = (z ^ z >> 30) * 0xBF58476D1CE4E5B9u;
    z = (z ^ z >> 27) * 0x94D049BB133111EBu;
    return z ^ z >> 31;
}

int32_t trial::pick(int32_t low, int32_t high) {
    const uint64_t count = uint64_t(int64_t(high) - low) + 1;
    const int32_t n = int32_t(low + int64_t((next() >> 32) * count >> 32));
    arguments_ += ' ' + std::to_string(n);
    return n;
}

uint32_t trial::word() {
    const int32_t length = pick(0, 32);
    const uint32_t n = length == 0 ? 0 : uint32_t(next() >> (64 - length));
    arguments_ += ' ' + std::to_string(n);
    return n;
}

extent trial::size() {
    const int32_t wide = pick(0, 15), high = pick(0, 15);
    extent e;
    e.w = wide == 0   ? pick(-2, 1)
          : wide < 6  ? pick(1, 17)
          : wide < 13 ? pick(18, 140)
                      : pick(141, 420);
    e.h = high == 0 ? pick(-1, 1) : high < 13 ? pick(1, 12) : pick(13, 40);
    if (one_in(3)) std::swap(e.w, e.h);
    return e;
}

extent trial::some_size() {
    const extent e = size();
    return {std::max(e.w, 1), std::max(e.h, 1)};
}

extent trial::small_size() {
    return {one_in(20) ? pick(-1, 0) : pick(1, 90), one_in(20) ? pick(-1, 0) : pick(1, 9)};
}

plane trial::add(int32_t row_bytes, int32_t rows, int32_t unit) {
    row_bytes = std::max(row_bytes, 0);
    rows = std::max(rows, 0);
    // Some functions round strides down to whole pixels: rows then begin below where they would.
    const size_t margin = 64 + 4 * size_t(rows);
    const int32_t gap = one_in(4) ? 0 : pick(0, 70 / unit) * unit;
    const bool upward = one_in(4);
    const size_t pitch = size_t(row_bytes) + size_t(gap);
    const size_t start = used_ + margin + size_t(pick(0, 63));
    used_ = start + pitch * size_t(rows) + margin;
    if (used_ > sizeof memory) abort();
    if (!upward) return {memory + start, int32_t(pitch)};
    return {memory + start + (rows > 0 ? size_t(rows - 1) * pitch : 0), -int32_t(pitch)};
}

void trial::fill() {
    const int32_t kind = pick(0, 6);
    const int32_t base = pick(0, 255), bits = pick(1, 5);
    uint8_t level = uint8_t(base);
    static constexpr uint8_t extremes[8] = {0, 255, 16, 235, 128, 240, 127, 1};
    for (size_t i = 0; i < used_; i += 8) {
        uint64_t random = next();
        for (size_t k = i; k < std::min(i + 8, used_); k++, random >>= 8) {
            const uint8_t n = uint8_t(random);
            switch (kind) {
                case 4:
                    memory[k] = extremes[n & 7];
                    break;
                case 5:
                    memory[k] = level = uint8_t(level + (n & 7) - 3);
                    break;  // a slow walk
                case 6:
                    memory[k] = uint8_t(base + (n >> (8 - bits)));
                    break;  // a faint noise
                default:
                    memory[k] = n;
            }
        }
    }
}

uint32_t trial::checksum() {
    std::sort(ignored_.begin(), ignored_.end(),
              [](const range &a, const range &b) { return a.first < b.first; });
    const uint8_t *from = memory, *const end = memory + used_;
    for (const range &r : ignored_) {
        if (r.first > from) crc_.add(from, size_t(r.first - from));
        from = std::max(from, r.first + r.size);
    }
    if (end > from) crc_.add(from, size_t(end - from));
    ignored_.clear();
    used_ = 0;
    return crc_.value();
}

// Pictures -----------------------------------------------------------------------------------------

const int32_t formats[25] = {SIMGP_FMT_YUV400,
                             SIMGP_FMT_YUV420,
                             SIMGP_FMT_YUV422N,
                             SIMGP_FMT_YUV444,
                             SIMGP_FMT_YV12,
                             SIMGP_FMT_YV16,
                             SIMGP_FMT_NV12,
                             SIMGP_FMT_NV21,
                             SIMGP_FMT_YUV422W,
                             SIMGP_FMT_T64X32,
                             SIMGP_FMT_UYVY,
                             SIMGP_FMT_YUYV,
                             SIMGP_FMT_RGB565,
                             SIMGP_FMT_BGR565,
                             SIMGP_FMT_RGB888,
                             SIMGP_FMT_BGR888,
                             SIMGP_FMT_RGBA8888,
                             SIMGP_FMT_BGRA8888,
                             SIMGP_FMT_ARGB8888,
                             -1,
                             9,
                             99,
                             299,
                             503,
                             600};

namespace {

constexpr int32_t half(int32_t n) { return n > 0 ? (n + 1) / 2 : n; }

// Bytes of a tiled plane (simgp/tile.h).
int32_t tiled_bytes(int32_t width, int32_t height) {
    if (width <= 0 || height <= 0) return 0;
    const int32_t tile_rows = (height + 31) / 32;
    return 8192 * ((width + 127) / 128) * (tile_rows / 2) +
           8192 * ((width + 255) / 256) * (tile_rows & 1);
}

}  // namespace

std::vector<shape> shapes_of(int32_t format, extent size) {
    const auto [w, h] = size;
    switch (format) {
        case SIMGP_FMT_YUV400:
            return {{w, h, 1}};
        case SIMGP_FMT_YUV420:
        case SIMGP_FMT_YV12:
            return {{w, h, 1}, {half(w), half(h), 1}, {half(w), half(h), 1}};
        case SIMGP_FMT_YUV422N:
        case SIMGP_FMT_YV16:
            return {{w, h, 1}, {half(w), h, 1}, {half(w), h, 1}};
        case SIMGP_FMT_YUV422W:
            return {{w, h, 1}, {w, half(h), 1}, {w, half(h), 1}};
        case SIMGP_FMT_NV12:
        case SIMGP_FMT_NV21:
            return {{w, h, 1}, {half(w), half(h), 2}};
        case SIMGP_FMT_T64X32:
            return {{w, h, 1}, {w, h / 2, 1}};
        case SIMGP_FMT_UYVY:
        case SIMGP_FMT_YUYV:
            return {{w, h, 2}};
        case SIMGP_FMT_RGB888:
        case SIMGP_FMT_BGR888:
            return {{w, h, 3}};
    }
    if (format > 0 && format < 100) return {{w, h, 1}, {w, h, 1}, {w, h, 1}};
    return {{w, h, format / 100 == 2 ? 2 : 4}};
}

simgp_img picture(trial &t, int32_t format, const std::vector<shape> &shapes) {
    simgp_img p{};
    p.format = format;
    for (int k = 0; k < 4; k++) {
        p.width[k] = p.height[k] = p.stride[k] = -7777 * (k + 1);
        p.reserved0[k] = p.reserved1[k] = 0xBADBADu;
    }
    for (size_t k = 0; k < shapes.size(); k++) {
        const shape &s = shapes[k];
        p.width[k] = s.width;
        p.height[k] = s.height;
        if (format == SIMGP_FMT_T64X32) {
            p.plane[k] = t.bytes(tiled_bytes(s.width, s.height));
            continue;
        }
        // From 4:2:0, one row more may be written than an odd height has.
        const plane memory = t.add(s.width * s.bytes, s.height + (s.height & 1));
        p.plane[k] = memory.first;
        p.stride[k] = memory.stride;
    }
    return p;
}

simgp_img picture(trial &t, int32_t format, extent size) {
    return picture(t, format, shapes_of(format, size));
}

simgp_img destination(trial &t, int32_t format, extent size) {
    simgp_img p = picture(t, format, size);
    for (int k = 0; k < 4; k++) p.width[k] = p.height[k] = -999 * (k + 1);
    return p;
}

// All functions ------------------------------------------------------------------------------------

uint32_t function::fingerprint(uint64_t seed, FILE *log) const {
    crc32 all;
    for (int i = 0; i < calls; i++) {
        trial t(name, seed, i);
        run(t, *this);
        const uint32_t checksum = t.checksum();
        if (log)
            fprintf(log, "%s %d %08x%s\n", name.c_str(), i, unsigned(checksum),
                    t.arguments().c_str());
        all.number(checksum);
    }
    return all.value();
}

std::vector<function> all_functions() {
    std::vector<function> all;
    add_stream_functions(all);
    add_pixel_functions(all);
    std::sort(all.begin(), all.end(),
              [](const function &a, const function &b) { return a.name < b.name; });
    return all;
}

}  // namespace tools
