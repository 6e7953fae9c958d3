/* Descriptors without arithmetic by hand: sizes of planes, layouts in memory, bands, checks.
 *
 *     simgp_img src, dst;
 *     const char *why = "";
 *     if (simgp_describe(&src, SIMGP_FMT_NV12, 640, 480, 1, frame, frame_bytes, &why) ||
 *         simgp_describe(&dst, SIMGP_FMT_RGB565, 640, 480, 1, screen, screen_bytes, &why) ||
 *         simgp_csc(&src, &dst))
 *         fprintf(stderr, "cannot be shown: %s\n", why);
 *
 * All of it is inline and computes; nothing here reads or writes a pixel, allocates, or keeps
 * anything. The functions that return a result give SIMGP_OK, or SIMGP_ERR_PARAM if something is
 * wrong with the arguments. Where `why` is not NULL they then store there what that is, a constant
 * text in English; it is left alone if all is well. What they were to fill is then left alone, too.
 *
 *   format   SIMGP_FMT_*; other codes have no planes, and nothing is described for them
 *   plane    number of a plane, from 0; planes that the format does not have take 0 bytes
 *   width    of the picture in pixels
 *   height   of the picture in pixels */
#ifndef SIMGP_DESCRIBE_H
#define SIMGP_DESCRIBE_H

#include <stddef.h>
#include <stdint.h>

#include "simgp/img.h"

/* In C++ programs, all files of a program share one of each function; the small ones may be
 * computed by the compiler. */
#ifdef __cplusplus
#define SIMGP_INLINE inline
#define SIMGP_CONSTEXPR constexpr
#else
#define SIMGP_INLINE static inline
#define SIMGP_CONSTEXPR static inline
#endif

SIMGP_BEGIN_DECLS

/* Planes ----------------------------------------------------------------------------------------
 */

/* How many planes a format has: 1 to 3, 0 if there is no such format. */
SIMGP_CONSTEXPR int32_t simgp_format_planes(int32_t format) {
    switch (format) {
        case SIMGP_FMT_YUV420:
        case SIMGP_FMT_YUV422N:
        case SIMGP_FMT_YUV444:
        case SIMGP_FMT_YV12:
        case SIMGP_FMT_YV16:
        case SIMGP_FMT_YUV422W:
            return 3;
        case SIMGP_FMT_NV12:
        case SIMGP_FMT_NV21:
        case SIMGP_FMT_T64X32:
            return 2;
        case SIMGP_FMT_YUV400:
        case SIMGP_FMT_UYVY:
        case SIMGP_FMT_YUYV:
        case SIMGP_FMT_RGB565:
        case SIMGP_FMT_BGR565:
        case SIMGP_FMT_RGB888:
        case SIMGP_FMT_BGR888:
        case SIMGP_FMT_RGBA8888:
        case SIMGP_FMT_BGRA8888:
        case SIMGP_FMT_ARGB8888:
            return 1;
        default:
            return 0;
    }
}

/* Bytes of a sample: 1, 2 for a pair of U and V, and 2, 3 or 4 for a pixel of packed YUV and of
 * RGB. 0: there is no such plane. */
SIMGP_CONSTEXPR int32_t simgp_plane_sample(int32_t format, int32_t plane) {
    const int32_t planes = simgp_format_planes(format);
    if (plane < 0 || plane >= planes) return 0;
    if (planes > 1) return planes == 2 && plane == 1 ? 2 : 1;
    switch (format) {
        case SIMGP_FMT_YUV400:
            return 1;
        case SIMGP_FMT_RGB888:
        case SIMGP_FMT_BGR888:
            return 3;
        case SIMGP_FMT_RGBA8888:
        case SIMGP_FMT_BGRA8888:
        case SIMGP_FMT_ARGB8888:
            return 4;
        default:
            return 2;
    }
}

/* A sample of a plane stands for 2^x_shift x 2^y_shift pixels. */
SIMGP_CONSTEXPR int32_t simgp_plane_x_shift(int32_t format, int32_t plane) {
    if (simgp_plane_sample(format, plane) == 0 || plane == 0) return 0;
    return format != SIMGP_FMT_YUV444 && format != SIMGP_FMT_YUV422W;
}
SIMGP_CONSTEXPR int32_t simgp_plane_y_shift(int32_t format, int32_t plane) {
    if (simgp_plane_sample(format, plane) == 0 || plane == 0) return 0;
    return format != SIMGP_FMT_YUV444 && format != SIMGP_FMT_YUV422N && format != SIMGP_FMT_YV16;
}

/* Samples in a line of the plane (pairs, where U and V alternate), and lines of it: what width[]
 * and height[] of a descriptor hold. Chroma is rounded up, but for the lines of T64X32, which are
 * rounded down. 0 for sizes below 1. */
SIMGP_CONSTEXPR int32_t simgp_plane_width(int32_t format, int32_t plane, int32_t width) {
    if (width < 1 || simgp_plane_sample(format, plane) == 0) return 0;
    return simgp_plane_x_shift(format, plane) ? width / 2 + width % 2 : width;
}
SIMGP_CONSTEXPR int32_t simgp_plane_height(int32_t format, int32_t plane, int32_t height) {
    if (height < 1 || simgp_plane_sample(format, plane) == 0) return 0;
    if (!simgp_plane_y_shift(format, plane)) return height;
    return format == SIMGP_FMT_T64X32 ? height / 2 : height / 2 + height % 2;
}

/* Visible bytes in a line of the plane: the least that a stride may be, without its sign. For
 * T64X32 that of the lines that the tiles hold; its strides are not used. */
SIMGP_CONSTEXPR int64_t simgp_line_bytes(int32_t format, int32_t plane, int32_t width) {
    return (int64_t)simgp_plane_width(format, plane, width) * simgp_plane_sample(format, plane);
}

/* Bytes of a whole plane of lines that lie `stride` bytes apart; the last one counts as `stride`
 * bytes, too. The sign of the stride makes no difference. For T64X32 those of the tiles, empty
 * places included (tile.h), whatever the stride. */
SIMGP_CONSTEXPR int64_t simgp_plane_bytes(int32_t format, int32_t plane, int32_t width,
                                          int32_t height, int32_t stride) {
    const int64_t lines = simgp_plane_height(format, plane, height);
    if (format == SIMGP_FMT_T64X32) {
        const int64_t wide = width < 1 ? 0 : width, tile_rows = (lines + 31) / 32;
        return 8192 * ((wide + 127) / 128 * (tile_rows / 2) + (wide + 255) / 256 * (tile_rows % 2));
    }
    return lines * (stride < 0 ? -(int64_t)stride : stride);
}

/* Layouts ---------------------------------------------------------------------------------------
 */

/* All planes of a picture in one piece of memory, one after the other, from top to bottom. */
typedef struct simgp_layout {
    size_t bytes;      /* of all planes */
    size_t offset[4];  /* where plane k begins, in bytes */
    int32_t stride[4]; /* bytes from one line of plane k to the next; 0 for T64X32 */
    int32_t planes;    /* their number */
} simgp_layout;

/* For the inline functions alone: what is wrong, and texts that name the plane. */
SIMGP_INLINE int32_t simgp_refuse_(const char **why, const char *text) {
    if (why) *why = text;
    return SIMGP_ERR_PARAM;
}
SIMGP_INLINE int32_t simgp_refuse_plane_(const char **why, int32_t plane, const char *text0,
                                         const char *text1, const char *text2) {
    return simgp_refuse_(why, plane == 0 ? text0 : plane == 1 ? text1 : text2);
}

/* Lays a picture out.
 *
 *   alignment   a power of two from 1 to 4096. Planes begin at multiples of it, and lines of
 *               linear planes at multiples of it from there. With 1 there are no gaps: the order of
 *               raw frames in files
 *
 * Refused are unknown formats, sizes below 1, other alignments, and pictures whose strides do not
 * fit 32 bits or which are larger than memory can be. */
SIMGP_INLINE int32_t simgp_lay_out(simgp_layout *layout, int32_t format, int32_t width,
                                   int32_t height, int32_t alignment, const char **why) {
    const int32_t planes = simgp_format_planes(format);
    simgp_layout made = {0, {0, 0, 0, 0}, {0, 0, 0, 0}, 0};
    int64_t bytes = 0;
    int32_t k;
    if (planes == 0) return simgp_refuse_(why, "unknown format");
    if (width < 1) return simgp_refuse_(why, "width below 1");
    if (height < 1) return simgp_refuse_(why, "height below 1");
    if (alignment < 1 || alignment > 4096 || (alignment & (alignment - 1)) != 0)
        return simgp_refuse_(why, "alignment is no power of two from 1 to 4096");
    for (k = 0; k < planes; k++) {
        const int64_t mask = alignment - 1;
        const int64_t stride = (simgp_line_bytes(format, k, width) + mask) & ~mask;
        int64_t size;
        if (format != SIMGP_FMT_T64X32) {
            if (stride > INT32_MAX) return simgp_refuse_(why, "lines are too long");
            made.stride[k] = (int32_t)stride;
        }
        bytes = (bytes + mask) & ~mask;
        size = simgp_plane_bytes(format, k, width, height, made.stride[k]);
        /* Of 64 bits or 32, and with room for the next plane's alignment. */
        if (size > (int64_t)PTRDIFF_MAX - 4096 - bytes)
            return simgp_refuse_(why, "the picture is larger than memory can be");
        made.offset[k] = (size_t)bytes;
        bytes += size;
    }
    made.bytes = (size_t)bytes;
    made.planes = planes;
    *layout = made;
    return SIMGP_OK;
}

/* Checks ----------------------------------------------------------------------------------------
 */

/* Whether a descriptor describes a picture that the library can work on. The functions that take
 * descriptors trust them; this asks first:
 *
 *     if (simgp_check(&src, &why) || simgp_check(&dst, &why) || simgp_csc(&src, &dst)) ...
 *
 * Refused are NULL, unknown formats, sizes below 1, sizes of chroma planes that are not those of
 * the format (simgp_plane_width, simgp_plane_height), planes that are NULL, and strides whose
 * lines would overlap. Of T64X32, width[0], height[0] and the planes are looked at, as its kernels
 * do. The format's own planes alone count, and only those with samples. Whether the memory behind
 * the planes is there cannot be seen from a descriptor: simgp_check_memory asks that. */
SIMGP_INLINE int32_t simgp_check(const simgp_img *img, const char **why) {
    int32_t planes, k;
    if (!img) return simgp_refuse_(why, "no descriptor");
    planes = simgp_format_planes(img->format);
    if (planes == 0) return simgp_refuse_(why, "unknown format");
    if (img->width[0] < 1) return simgp_refuse_(why, "width below 1");
    if (img->height[0] < 1) return simgp_refuse_(why, "height below 1");
    for (k = 0; k < planes; k++) {
        const int32_t tiled = img->format == SIMGP_FMT_T64X32;
        const int32_t lines = simgp_plane_height(img->format, k, img->height[0]);
        const int64_t stride = img->stride[k];
        if (lines == 0) continue;
        if (!tiled && (img->width[k] != simgp_plane_width(img->format, k, img->width[0]) ||
                       img->height[k] != lines))
            return simgp_refuse_plane_(why, k, "plane 0 has not the size that its format gives it",
                                       "plane 1 has not the size that its format gives it",
                                       "plane 2 has not the size that its format gives it");
        if (!img->plane[k])
            return simgp_refuse_plane_(why, k, "plane 0 is NULL", "plane 1 is NULL",
                                       "plane 2 is NULL");
        if (!tiled && lines > 1 &&
            (stride < 0 ? -stride : stride) < simgp_line_bytes(img->format, k, img->width[0]))
            return simgp_refuse_plane_(why, k, "stride of plane 0 is shorter than a line",
                                       "stride of plane 1 is shorter than a line",
                                       "stride of plane 2 is shorter than a line");
    }
    return SIMGP_OK;
}

/* simgp_check, and whether all visible samples lie in the `bytes` bytes at `memory`; of T64X32, the
 * tiles with their empty places. Padding behind the last line need not be there.
 *
 * Refused is what simgp_check refuses, and memory that does not hold the samples. */
SIMGP_INLINE int32_t simgp_check_memory(const simgp_img *img, const void *memory, size_t bytes,
                                        const char **why) {
    int32_t k;
    const int32_t checked = simgp_check(img, why);
    if (checked != SIMGP_OK) return checked;
    for (k = 0; k < simgp_format_planes(img->format); k++) {
        const int32_t width = img->width[0];
        const int32_t lines = simgp_plane_height(img->format, k, img->height[0]);
        /* Bytes below the plane's pointer, and from there on; all of them are below 2^63. */
        const int64_t to_last =
            img->format == SIMGP_FMT_T64X32 ? 0 : (int64_t)(lines - 1) * img->stride[k];
        const int64_t last = img->format == SIMGP_FMT_T64X32
                                 ? simgp_plane_bytes(img->format, k, width, img->height[0], 0)
                                 : simgp_line_bytes(img->format, k, width);
        const uint64_t before = to_last < 0 ? (uint64_t)-to_last : 0;
        const uint64_t after = (uint64_t)(to_last < 0 ? 0 : to_last) + (uint64_t)last;
        /* A plane below the memory wraps to an offset beyond it. */
        const uint64_t at = (uintptr_t)((uintptr_t)img->plane[k] - (uintptr_t)memory);
        if (lines == 0) continue;
        if (at > bytes || before > at || after > bytes - at)
            return simgp_refuse_plane_(why, k, "memory is too small for plane 0",
                                       "memory is too small for plane 1",
                                       "memory is too small for plane 2");
    }
    return SIMGP_OK;
}

/* Descriptors -----------------------------------------------------------------------------------
 *
 * Pointers to const are taken, so that sources need no cast. A destination has to be writable all
 * the same: the library writes where plane[] of a destination points.
 */

/* For the inline functions alone: descriptors point to bytes that may be written. */
SIMGP_INLINE uint8_t *simgp_pointer_(const void *p) {
#ifdef __cplusplus
    return const_cast<uint8_t *>(static_cast<const uint8_t *>(p));
#else
    return (uint8_t *)(uintptr_t)p;
#endif
}

/* Describes a picture whose planes lie wherever they lie. Those that the format does not have are
 * NULL with a stride of 0, or anything else; they are not looked at. Strides may be negative, as
 * img.h says; those of T64X32 are not used.
 *
 *     simgp_describe_planes(&img, SIMGP_FMT_NV12, 640, 480, y, 768, uv, 768, NULL, 0, &why)
 *
 *   plane0, plane1, plane2      the first byte of each plane
 *   stride0, stride1, stride2   bytes from one line of it to the next
 *
 * Refused is what simgp_check refuses. */
SIMGP_INLINE int32_t simgp_describe_planes(simgp_img *img, int32_t format, int32_t width,
                                           int32_t height, const void *plane0, int32_t stride0,
                                           const void *plane1, int32_t stride1, const void *plane2,
                                           int32_t stride2, const char **why) {
    const void *const planes[3] = {plane0, plane1, plane2};
    const int32_t strides[3] = {stride0, stride1, stride2};
    simgp_img made = {
        {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, {0, 0, 0, 0}, 0};
    int32_t k, checked;
    made.format = format;
    made.width[0] = width;
    made.height[0] = height;
    for (k = 0; k < simgp_format_planes(format); k++) {
        if (k > 0) made.width[k] = simgp_plane_width(format, k, width);
        if (k > 0) made.height[k] = simgp_plane_height(format, k, height);
        made.stride[k] = strides[k];
        made.plane[k] = simgp_pointer_(planes[k]);
    }
    checked = simgp_check(&made, why);
    if (checked == SIMGP_OK) *img = made;
    return checked;
}

/* Describes a picture that lies in one piece of memory, as simgp_lay_out lays it out.
 *
 *   alignment   as there; 1 for frames without gaps
 *   memory      the first byte of plane 0; it need not be aligned
 *   bytes       how many there are: simgp_layout's number or more
 *
 * Refused is what simgp_lay_out refuses, memory that is NULL, and memory that is too small. */
SIMGP_INLINE int32_t simgp_describe(simgp_img *img, int32_t format, int32_t width, int32_t height,
                                    int32_t alignment, const void *memory, size_t bytes,
                                    const char **why) {
    simgp_layout layout;
    const uint8_t *const first = (const uint8_t *)memory;
    const int32_t laid_out = simgp_lay_out(&layout, format, width, height, alignment, why);
    if (laid_out != SIMGP_OK) return laid_out;
    if (!memory) return simgp_refuse_(why, "memory is NULL");
    if (bytes < layout.bytes) return simgp_refuse_(why, "memory is too small for the picture");
    return simgp_describe_planes(img, format, width, height, first, layout.stride[0],
                                 first + layout.offset[1], layout.stride[1],
                                 first + layout.offset[2], layout.stride[2], why);
}

/* Describes a 4:2:0 picture whose U and V are given apart, with the distance of their samples: the
 * planes 0, 1 and 2 of YUV_420_888, which Android's cameras deliver. With a distance of 1 it is
 * YUV420. With 2, where U and V lie one byte apart, it is NV12 if U comes first, and NV21 if V
 * does; no sample is moved.
 *
 *   y, u, v                        the first sample of Y, U and V
 *   stride_y, stride_u, stride_v   bytes from one line of it to the next
 *   pixel_stride                   bytes from one sample of U, or of V, to the next in a line
 *
 * Refused is what simgp_check refuses, every other distance, and with 2 U and V that do not make
 * pairs or whose strides differ. */
SIMGP_INLINE int32_t simgp_describe_yuv_420_888(simgp_img *img, int32_t width, int32_t height,
                                                const void *y, int32_t stride_y, const void *u,
                                                int32_t stride_u, const void *v, int32_t stride_v,
                                                int32_t pixel_stride, const char **why) {
    const uintptr_t at_u = (uintptr_t)u, at_v = (uintptr_t)v;
    if (pixel_stride == 1)
        return simgp_describe_planes(img, SIMGP_FMT_YUV420, width, height, y, stride_y, u, stride_u,
                                     v, stride_v, why);
    if (pixel_stride != 2) return simgp_refuse_(why, "pixel stride of chroma is neither 1 nor 2");
    if (!u) return simgp_refuse_(why, "plane 1 is NULL");
    if (!v) return simgp_refuse_(why, "plane 2 is NULL");
    if (stride_u != stride_v) return simgp_refuse_(why, "strides of U and V differ");
    if (at_u + 1 != at_v && at_v + 1 != at_u)
        return simgp_refuse_(why, "U and V do not lie one byte apart");
    return simgp_describe_planes(img, at_u < at_v ? SIMGP_FMT_NV12 : SIMGP_FMT_NV21, width, height,
                                 y, stride_y, at_u < at_v ? u : v, stride_u, NULL, 0, why);
}

/* Bands -----------------------------------------------------------------------------------------
 *
 * A band is some rows of a picture as a picture of its own, in the same memory. Threads share a
 * conversion by converting a band each, of source and destination. What comes out is what the whole
 * call gives: of simgp_cpy, simgp_csc and simgp_csc_any, but for those pairs of simgp_csc that take
 * another chroma line in pictures of odd height (yuv2rgb.h), or write one more (layout.h). Where
 * rows are mixed, in resizing, deblocking and dithering, bands have borders of their own.
 */

/* Bands begin at multiples of this number of rows: 2 where two rows share a line of chroma; 128 for
 * T64X32, whose tile rows lie in pairs, of which one of chroma stands for 128 rows of pixels; 1 for
 * the others. 0: no such format. For a conversion take the larger one of both formats. */
SIMGP_CONSTEXPR int32_t simgp_band_step(int32_t format) {
    const int32_t planes = simgp_format_planes(format);
    if (format == SIMGP_FMT_T64X32) return 128;
    return planes == 0 ? 0 : 1 << simgp_plane_y_shift(format, planes - 1);
}

/* Describes rows first ... first + rows - 1 of a picture.
 *
 *   img     the picture; all of what simgp_check looks at is filled in
 *   first   a multiple of simgp_band_step(img->format)
 *   rows    likewise, unless the band ends with the picture
 *   band    the band is stored here; may be img
 *
 * Refused is what simgp_check refuses of img, rows that the picture does not have, other multiples,
 * and of T64X32 a last row alone, whose chroma lies in the band before. */
SIMGP_INLINE int32_t simgp_band(const simgp_img *img, int32_t first, int32_t rows, simgp_img *band,
                                const char **why) {
    simgp_img made;
    int32_t step, k;
    const int32_t checked = simgp_check(img, why);
    if (checked != SIMGP_OK) return checked;
    made = *img;
    step = simgp_band_step(img->format);
    if (first < 0 || rows < 1 || rows > img->height[0] || first > img->height[0] - rows)
        return simgp_refuse_(why, "the picture has no such rows");
    if (first % step != 0 || (rows % step != 0 && first + rows != img->height[0]))
        return simgp_refuse_(why, "rows of a band are multiples of simgp_band_step");
    if (img->format == SIMGP_FMT_T64X32 && rows == 1 && first > 0)
        return simgp_refuse_(why, "a last row of tiles alone is no band");
    for (k = 0; k < simgp_format_planes(img->format); k++) {
        const int32_t line = first >> simgp_plane_y_shift(img->format, k);
        made.height[k] = simgp_plane_height(img->format, k, rows);
        if (img->format == SIMGP_FMT_T64X32)
            made.plane[k] += simgp_plane_bytes(img->format, k, img->width[0], first, 0);
        else
            made.plane[k] += (ptrdiff_t)line * img->stride[k];
    }
    *band = made;
    return SIMGP_OK;
}

/* Shares the rows of a picture among `parts` bands, as evenly as steps allow.
 *
 *   height   of the picture, 1 or more
 *   step     simgp_band_step of its format, or the larger one of two pictures
 *   parts    1 or more: how many threads there are
 *   part     which of them, 0 ... parts - 1
 *   first    the first row of that band is stored here
 *   rows     their number is stored here; 0 if there are fewer steps than parts, and this part has
 *            nothing to do */
SIMGP_INLINE void simgp_share_rows(int32_t height, int32_t step, int32_t parts, int32_t part,
                                   int32_t *first, int32_t *rows) {
    /* A last row alone goes to the band before, as simgp_band wants it for tiles. */
    const int32_t rest = height % step, whole = height / step;
    const int32_t steps = whole + (rest > 1 || (rest == 1 && (step != 128 || whole == 0)));
    const int32_t from = (int32_t)((int64_t)steps * part / parts);
    const int32_t to = (int32_t)((int64_t)steps * (part + 1) / parts);
    *first = from * step;
    *rows = from == to ? 0 : to == steps ? height - from * step : (to - from) * step;
}

SIMGP_END_DECLS

#endif
