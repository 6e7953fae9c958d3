// The conversions between two formats that the tests expect, written down once more: the library's
// own tables are what is tested. A new kernel between known formats takes a line here.
#ifndef TESTS_CONVERSIONS_H
#define TESTS_CONVERSIONS_H

#include <cstring>

#include "simgp/simgp.h"
#include "tests/rig.h"

namespace rig {

// In what a kernel differs from its formula or its walk over the lines.
enum class exception {
    none,
    first_line_alone,  // of odd heights, when W is no multiple of 4
    coarse,            // the coarse matrix
};

struct conversion {
    const char *name;
    simgp_csc_fn *run;
    int from, to;
    exception but = exception::none;
};

#define CONVERSION(from, to, name, ...) \
    { #name, simgp_csc_##name, SIMGP_FMT_##from, SIMGP_FMT_##to, __VA_ARGS__ }
// clang-format off
inline const conversion conversions[] = {
    CONVERSION(YUV400, RGB565, yuv400_to_rgb565),
    CONVERSION(YUV420, RGB565, yuv420_to_rgb565, exception::first_line_alone),
    CONVERSION(YUV420, BGR565, yuv420_to_bgr565),
    CONVERSION(YUV420, RGB888, yuv420_to_rgb888),
    CONVERSION(YUV420, BGR888, yuv420_to_bgr888),
    CONVERSION(YUV420, RGBA8888, yuv420_to_rgba8888, exception::first_line_alone),
    CONVERSION(YUV420, BGRA8888, yuv420_to_bgra8888, exception::first_line_alone),
    CONVERSION(YUV420, ARGB8888, yuv420_to_argb8888, exception::first_line_alone),
    CONVERSION(YUV422N, RGB565, yuv422n_to_rgb565),
    CONVERSION(YUV422N, BGR565, yuv422n_to_bgr565),
    CONVERSION(YUV444, RGB565, yuv444_to_rgb565),
    CONVERSION(YUV444, BGR565, yuv444_to_bgr565),
    CONVERSION(YV12, RGB565, yv12_to_rgb565, exception::first_line_alone),
    CONVERSION(YV12, BGR565, yv12_to_bgr565),
    CONVERSION(YV12, RGB888, yv12_to_rgb888),
    CONVERSION(NV12, RGB565, nv12_to_rgb565),
    CONVERSION(NV12, BGR565, nv12_to_bgr565),
    CONVERSION(NV12, RGB888, nv12_to_rgb888),
    CONVERSION(NV21, RGB565, nv21_to_rgb565, exception::coarse),
    CONVERSION(NV21, BGR565, nv21_to_bgr565),
    CONVERSION(NV21, RGB888, nv21_to_rgb888),
    CONVERSION(YUV422W, RGB565, yuv422w_to_rgb565),
    CONVERSION(YUV422W, BGR565, yuv422w_to_bgr565),
    CONVERSION(YUYV, RGB565, yuyv_to_rgb565),
    CONVERSION(YUYV, RGB888, yuyv_to_rgb888),
    CONVERSION(UYVY, RGB565, uyvy_to_rgb565),
    CONVERSION(UYVY, BGR565, uyvy_to_bgr565),
    CONVERSION(UYVY, RGB888, uyvy_to_rgb888),
    CONVERSION(UYVY, BGR888, uyvy_to_bgr888),
    CONVERSION(UYVY, RGBA8888, uyvy_to_rgba8888),
    CONVERSION(UYVY, BGRA8888, uyvy_to_bgra8888),
    CONVERSION(UYVY, ARGB8888, uyvy_to_argb8888),
    CONVERSION(RGB888, YUV420, rgb888_to_yuv420),
    CONVERSION(RGB888, YV12, rgb888_to_yv12),
    CONVERSION(RGB888, NV12, rgb888_to_nv12),
    CONVERSION(RGB888, NV21, rgb888_to_nv21),
    CONVERSION(RGB888, RGB565, rgb888_to_rgb565),
    CONVERSION(BGR888, YUV420, bgr888_to_yuv420),
    CONVERSION(BGR888, YV12, bgr888_to_yv12),
    CONVERSION(RGB565, YUV420, rgb565_to_yuv420),
    CONVERSION(RGB565, YV12, rgb565_to_yv12),
    CONVERSION(RGB565, NV12, rgb565_to_nv12),
    CONVERSION(RGB565, NV21, rgb565_to_nv21),
    CONVERSION(RGBA8888, RGB565, rgba8888_to_rgb565),
    CONVERSION(YUV420, YUV422N, yuv420_to_yuv422n),
    CONVERSION(YUV420, YV12, yuv420_to_yv12),
    CONVERSION(YUV420, NV12, yuv420_to_nv12),
    CONVERSION(YUV420, NV21, yuv420_to_nv21),
    CONVERSION(YUV420, T64X32, yuv420_to_t64x32),
    CONVERSION(YUV422N, YUV420, yuv422n_to_yuv420),
    CONVERSION(YUV422N, YV12, yuv422n_to_yv12),
    CONVERSION(YV16, YV12, yv16_to_yv12),
    CONVERSION(YV16, YUV420, yv16_to_yuv420),
    CONVERSION(NV12, YUV420, nv12_to_yuv420),
    CONVERSION(NV12, YV12, nv12_to_yv12),
    CONVERSION(NV21, YUV420, nv21_to_yuv420),
    CONVERSION(NV21, YV12, nv21_to_yv12),
    CONVERSION(T64X32, RGB565, t64x32_to_rgb565),
    CONVERSION(T64X32, BGRA8888, t64x32_to_bgra8888),
    CONVERSION(T64X32, NV12, t64x32_to_nv12),
    CONVERSION(T64X32, YUV420, t64x32_to_yuv420),
};
// clang-format on
#undef CONVERSION

// What a conversion is tested by.
enum class family {
    yuv_to_rgb,     // yuv2rgb_test
    packed_to_rgb,  // packed2rgb_test
    from_rgb,       // rgb2yuv_test
    layout,         // layout_test
    tile,           // tile_test, kernel by kernel
    none
};
inline family family_of(const conversion &c) {
    const format &from = format_of(c.from), &to = format_of(c.to);
    if (from.tiled || to.tiled) return family::tile;
    if (from.is_rgb()) return family::from_rgb;
    if (to.is_rgb()) return from.is_packed() ? family::packed_to_rgb : family::yuv_to_rgb;
    return from.is_packed() || to.is_packed() ? family::none : family::layout;
}
inline std::vector<conversion> conversions_of(family f) {
    std::vector<conversion> found;
    for (const conversion &c : conversions)
        if (family_of(c) == f) found.push_back(c);
    return found;
}

// Null if there is none.
inline const conversion *conversion_between(int from, int to) {
    for (const conversion &c : conversions)
        if (c.from == from && c.to == to) return &c;
    return nullptr;
}
inline const conversion &conversion_named(const char *name) {
    for (const conversion &c : conversions)
        if (strcmp(c.name, name) == 0) return c;
    fprintf(stderr, "no conversion %s\n", name);
    abort();
}

// Converts pictures whose lines each cover the end of the one above, by a sample: they are to be written from
// top to bottom. `shapes` are the planes as far as they are written.
inline void check_overlapping_lines(const conversion &k, int32_t width, int32_t height,
                                    const std::vector<plane_shape> &shapes) {
    rng random(seed());
    picture src(shapes_of(k.from, width, height));
    src.fill(content::random, random);
    for_each_target([&](const target_rows &) {
        using planes = std::vector<std::vector<uint8_t>>;
        const auto run = [&](int samples_apart) {
            planes out;
            uint8_t *dst[3] = {};
            int32_t strides[3] = {};
            for (size_t p = 0; p < shapes.size(); p++) {
                out.emplace_back(size_t(shapes[p].row_bytes * shapes[p].rows));
                dst[p] = out[p].data();
                strides[p] = int32_t(shapes[p].row_bytes) + samples_apart * shapes[p].sample_bytes;
            }
            k.run(src.planes, src.widths, src.heights, src.strides, strides, dst);
            return out;
        };
        const planes apart = run(0);
        planes expected;
        for (size_t p = 0; p < shapes.size(); p++) {
            const ptrdiff_t line = shapes[p].row_bytes;
            expected.emplace_back(apart[p].size());
            for (ptrdiff_t y = 0; y < shapes[p].rows; y++)
                memcpy(expected[p].data() + y * (line - shapes[p].sample_bytes),
                       apart[p].data() + y * line, size_t(line));
        }
        EXPECT_EQ(run(-1), expected) << k.name;
    });
}

}  // namespace rig

#endif
