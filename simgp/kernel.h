// Kernels: their arguments and how they are defined.
#ifndef SIMGP_KERNEL_H
#define SIMGP_KERNEL_H

#include "simgp/formats.h"
#include "simgp/img.h"
#include "simgp/lines.h"

namespace simgp {

// The six arguments of a conversion kernel.
struct csc_args {
    uint8_t *const *src_planes;
    const int32_t *src_widths, *src_heights, *src_strides, *dst_strides;
    uint8_t *const *dst_planes;
};

inline const_lines src_lines(const csc_args &a, int plane) {
    return {a.src_planes[plane], a.src_strides[plane]};
}
inline lines dst_lines(const csc_args &a, int plane) {
    return {a.dst_planes[plane], a.dst_strides[plane]};
}

// Lines of 16-bit and 32-bit pixels advance by whole pixels: strides are rounded down.
template <class Byte>
plane_lines<Byte> whole_pixel_lines(plane_lines<Byte> plane, int pixel_bytes) {
    if (pixel_bytes == 2 || pixel_bytes == 4) plane.stride &= -ptrdiff_t(pixel_bytes);
    return plane;
}

// The arguments of a kernel of one plane.
struct plane_args {
    const_lines src;
    ptrdiff_t width, height;
    lines dst;
};

// Planes of 16-bit samples: their lines advance by whole samples.
inline plane_args whole_words(const plane_args &a) {
    return {whole_pixel_lines(a.src, 2), a.width, a.height, whole_pixel_lines(a.dst, 2)};
}

// Runs a kernel of one plane from a plane of one picture to a plane of another.
inline void run_plane(simgp_plane_fn *kernel, const simgp_img &src, int from, const simgp_img &dst,
                      int to) {
    kernel(src.plane[from], src.width[from], src.height[from], src.stride[from], dst.stride[to],
           dst.plane[to]);
}

// Runs kernels for all planes of a picture: one for planes of bytes, one for those of 16-bit samples.
inline void run_planes(const format &planes, const simgp_img &src, const simgp_img &dst,
                       simgp_plane_fn *of_bytes, simgp_plane_fn *of_words) {
    for (int k = 0; k < planes.planes; k++)
        run_plane(planes.bytes[k] == 2 ? of_words : of_bytes, src, k, dst, k);
}

}  // namespace simgp

// Heads the definition of an exported conversion kernel, whose body then finds the arguments in
// `args`.
#define SIMGP_CSC_KERNEL(name, ...)                                                              \
    void name(uint8_t *const *src_planes, const int32_t *src_widths, const int32_t *src_heights, \
              const int32_t *src_strides, const int32_t *dst_strides,                            \
              uint8_t *const *dst_planes) {                                                      \
        const simgp::csc_args args{src_planes,  src_widths,  src_heights,                        \
                                   src_strides, dst_strides, dst_planes};                        \
        __VA_ARGS__;                                                                             \
    }

// The same for a kernel of one plane.
#define SIMGP_PLANE_KERNEL(name, ...)                                                 \
    void name(const void *src, int32_t width, int32_t height, int32_t src_stride,     \
              int32_t dst_stride, void *dst) {                                        \
        const simgp::plane_args args{simgp::lines_of(src, src_stride), width, height, \
                                     simgp::lines_of(dst, dst_stride)};               \
        __VA_ARGS__;                                                                  \
    }

#endif
