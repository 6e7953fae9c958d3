// The pixel formats: one table for rows, kernels, tools and benchmarks. simgp/formats.h knows their
// codes.
#ifndef ROWS_FORMATS_H
#define ROWS_FORMATS_H

#include <stddef.h>
#include <stdint.h>

namespace simgp {

// How the samples of one row of pixels lie in memory.
enum class yuv_layout : uint8_t {
    grey,  // y: a sample per pixel; no chroma
    half,  // y; u, v: a sample for two pixels
    full,  // y; u, v: a sample per pixel
    uv,    // y; u: pairs U V, one for two pixels
    vu,    // y; u: pairs V U, one for two pixels
    uyvy,  // y: bytes U Y V Y for two pixels
    yuyv,  // y: bytes Y U Y V for two pixels; of a half group at the end, U is taken, and V of
           // the group before, or 128 where there is none
    count
};

// How a pixel is stored.
enum class rgb_packing : uint8_t {
    rgb565,
    bgr565,
    rgb888,
    bgr888,
    rgba8888,
    bgra8888,
    argb8888,
    count
};

// The bytes of a pixel, and which of them holds a channel; -1: none. Of the two bytes of a 16-bit
// word, red and blue have the ends, green the bits between.
struct pixel_bytes {
    int8_t size, r, g, b, a;
};
inline constexpr pixel_bytes pixels_of[size_t(rgb_packing::count)] = {
    {2, 1, -1, 0, -1},  // rgb565
    {2, 0, -1, 1, -1},  // bgr565
    {3, 0, 1, 2, -1},   // rgb888
    {3, 2, 1, 0, -1},   // bgr888
    {4, 0, 1, 2, 3},    // rgba8888
    {4, 2, 1, 0, 3},    // bgra8888
    {4, 1, 2, 3, 0},    // argb8888
};
static_assert(pixels_of[size_t(rgb_packing::count) - 1].size != 0, "a packing has no line");

enum class format_kind : uint8_t { planar, tiled, packed, rgb };

// A name, in place: a pointer would have to be set when the library is loaded.
struct short_name {
    char text[12];

    consteval short_name(const char *s) : text() {
        for (int i = 0; (text[i] = s[i]) != 0;) i++;  // no constant where the name is too long
    }
};

// Planes of samples: of one byte, or of two where a sample is a pair of U and V; of whole pixels in
// the formats of a single plane. A sample of plane k stands for 2^x_shift x 2^y_shift pixels.
struct format {
    short_name name;  // as functions are named
    format_kind kind;
    uint8_t planes;
    uint8_t bytes[3], x_shift[3], y_shift[3];  // by plane
    int8_t u, v;          // the planes of U and V, the same for pairs; -1: none
    yuv_layout layout;    // of a row; count for RGB
    rgb_packing packing;  // count for YUV
};

// What the table is made with.
consteval format grey_format(short_name name) {
    return {
        name, format_kind::planar, 1, {1}, {}, {}, -1, -1, yuv_layout::grey, rgb_packing::count};
}
consteval format planar_format(short_name name, uint8_t x_shift, uint8_t y_shift, int8_t u,
                               int8_t v) {
    return {name,
            format_kind::planar,
            3,
            {1, 1, 1},
            {0, x_shift, x_shift},
            {0, y_shift, y_shift},
            u,
            v,
            x_shift ? yuv_layout::half : yuv_layout::full,
            rgb_packing::count};
}
consteval format pair_format(short_name name, format_kind kind, yuv_layout layout) {
    return {name, kind, 2, {1, 2}, {0, 1}, {0, 1}, 1, 1, layout, rgb_packing::count};
}
consteval format packed_format(short_name name, yuv_layout layout) {
    return {name, format_kind::packed, 1, {2}, {}, {}, 0, 0, layout, rgb_packing::count};
}
consteval format rgb_format(short_name name, rgb_packing packing) {
    return {name, format_kind::rgb,  1,      {uint8_t(pixels_of[size_t(packing)].size)}, {}, {}, -1,
            -1,   yuv_layout::count, packing};
}

}  // namespace simgp

// X(token, format), in the order of the codes SIMGP_FMT_<token>.
// clang-format off
#define SIMGP_FORMATS(X) \
    X(YUV400,   grey_format("yuv400")) \
    X(YUV420,   planar_format("yuv420",  1, 1, 1, 2)) \
    X(YUV422N,  planar_format("yuv422n", 1, 0, 1, 2)) \
    X(YUV444,   planar_format("yuv444",  0, 0, 1, 2)) \
    X(YV12,     planar_format("yv12",    1, 1, 2, 1)) \
    X(YV16,     planar_format("yv16",    1, 0, 2, 1)) \
    X(NV12,     pair_format("nv12", format_kind::planar, yuv_layout::uv)) \
    X(NV21,     pair_format("nv21", format_kind::planar, yuv_layout::vu)) \
    X(YUV422W,  planar_format("yuv422w", 0, 1, 1, 2)) \
    X(T64X32,   pair_format("t64x32", format_kind::tiled, yuv_layout::uv)) \
    X(UYVY,     packed_format("uyvy", yuv_layout::uyvy)) \
    X(YUYV,     packed_format("yuyv", yuv_layout::yuyv)) \
    X(RGB565,   rgb_format("rgb565",   rgb_packing::rgb565)) \
    X(BGR565,   rgb_format("bgr565",   rgb_packing::bgr565)) \
    X(RGB888,   rgb_format("rgb888",   rgb_packing::rgb888)) \
    X(BGR888,   rgb_format("bgr888",   rgb_packing::bgr888)) \
    X(RGBA8888, rgb_format("rgba8888", rgb_packing::rgba8888)) \
    X(BGRA8888, rgb_format("bgra8888", rgb_packing::bgra8888)) \
    X(ARGB8888, rgb_format("argb8888", rgb_packing::argb8888))
// clang-format on

namespace simgp::formats {
#define DEFINE(token, ...) inline constexpr format token = __VA_ARGS__;
SIMGP_FORMATS(DEFINE)
#undef DEFINE
}  // namespace simgp::formats

#endif
