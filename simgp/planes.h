// The planes of a picture as the operations see them that keep its format.
#ifndef SIMGP_PLANES_H
#define SIMGP_PLANES_H

#include <stddef.h>
#include <stdint.h>
#include <string.h>

#include "simgp/img.h"

namespace simgp {

// The planes of a format and the bytes of a sample of each; a pair of interleaved chroma is one
// sample of two bytes.
struct sample_planes {
    int count;  // 0: the format has no rule
    uint8_t bytes[3];
};

// What copy and rotation accept: planar and semi-planar YUV, where codes without a name count as
// three planes, and 16-bit RGB, where the whole family of 200 to 299 does.
constexpr sample_planes yuv_and_565_planes(int32_t format) {
    if (format < 0 || format == SIMGP_FMT_T64X32) return {};
    if (format == SIMGP_FMT_YUV400) return {1, {1}};
    if (format == SIMGP_FMT_NV12 || format == SIMGP_FMT_NV21) return {2, {1, 2}};
    if (format <= 99) return {3, {1, 1, 1}};
    if (format >= 200 && format <= 299) return {1, {2}};
    return {};
}

// Copies `height` rows of `width` bytes, which must not overlap. Rows without gaps are one.
inline void copy_rows(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
                      ptrdiff_t width, ptrdiff_t height) {
    if (width < 1 || height < 1) return;
    if (src_stride == width && dst_stride == width) {
        width *= height;
        height = 1;
    }
    for (ptrdiff_t y = 0; y < height; y++)
        memcpy(dst + y * dst_stride, src + y * src_stride, size_t(width));
}

}  // namespace simgp

#endif
