/* The image descriptor, pixel formats, rotation codes, result codes, the types of the kernels. */
#ifndef SIMGP_IMG_H
#define SIMGP_IMG_H

#include <stddef.h>
#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

/* Pixel formats -------------------------------------------------------------------------------
 *
 * The drawings show bytes in memory order, lowest address first, so they hold on every machine.
 * Y0 Y1 are the first two pixels of a line; a 16-bit word stands with its low byte first, as it
 * lies in memory. "W/2" and "H/2" of chroma planes are rounded up: a 5 x 3 picture in 4:2:0 has
 * chroma planes of 3 x 2 samples. Samples of YUV are unsigned bytes.
 */
enum {
    /* One plane of luma; no chroma.
     *   plane 0: Y0 Y1 Y2 Y3 ...                                     W x H */
    SIMGP_FMT_YUV400 = 0,

    /* Planar 4:2:0 ("I420"): one U and one V sample for each 2 x 2 block of pixels.
     *   plane 0: Y0 Y1 Y2 Y3 ...                                     W x H
     *   plane 1: U0 U1 ...                                           W/2 x H/2
     *   plane 2: V0 V1 ...                                           W/2 x H/2 */
    SIMGP_FMT_YUV420 = 1,

    /* Planar 4:2:2 ("I422"): chroma of half width and full height ("narrow").
     *   plane 0: Y,  W x H      plane 1: U, W/2 x H      plane 2: V, W/2 x H */
    SIMGP_FMT_YUV422N = 2,

    /* Planar 4:4:4: one U and one V sample for each pixel.
     *   plane 0: Y,  W x H      plane 1: U, W x H        plane 2: V, W x H */
    SIMGP_FMT_YUV444 = 3,

    /* Planar 4:2:0 with V before U.
     *   plane 0: Y,  W x H      plane 1: V, W/2 x H/2    plane 2: U, W/2 x H/2 */
    SIMGP_FMT_YV12 = 4,

    /* Planar 4:2:2 with V before U; chroma of half width and full height.
     *   plane 0: Y,  W x H      plane 1: V, W/2 x H      plane 2: U, W/2 x H */
    SIMGP_FMT_YV16 = 5,

    /* Semi-planar 4:2:0, U first.
     *   plane 0: Y0 Y1 Y2 Y3 ...                                     W x H
     *   plane 1: U0 V0 U1 V1 ...                                     W/2 pairs x H/2 lines */
    SIMGP_FMT_NV12 = 6,

    /* Semi-planar 4:2:0, V first (what many cameras deliver).
     *   plane 0: Y0 Y1 Y2 Y3 ...                                     W x H
     *   plane 1: V0 U0 V1 U1 ...                                     W/2 pairs x H/2 lines */
    SIMGP_FMT_NV21 = 7,

    /* Planar, chroma of full width and half height ("wide").
     *   plane 0: Y,  W x H      plane 1: U, W x H/2      plane 2: V, W x H/2 */
    SIMGP_FMT_YUV422W = 8,

    /* NV12 cut into tiles of 64 bytes x 32 rows, as hardware video decoders write it; tile.h says
     * in which order they lie. The strides of a tiled picture are not used.
     *   plane 0: tiles of Y0 Y1 Y2 Y3 ...                            W bytes x H
     *   plane 1: tiles of U0 V0 U1 V1 ...                            W bytes x H/2 rounded down */
    SIMGP_FMT_T64X32 = 11,

    /* Packed 4:2:2: two pixels in four bytes.
     *   plane 0: U0 Y0 V0 Y1   U1 Y2 V1 Y3 ...                       2 W bytes x H */
    SIMGP_FMT_UYVY = 100,
    /*   plane 0: Y0 U0 Y1 V0   Y2 U1 Y3 V1 ...                       2 W bytes x H */
    SIMGP_FMT_YUYV = 101,

    /* 16-bit RGB, one little-endian word a pixel; bit 7 of each byte first.
     *   byte 0:  G2 G1 G0 B4 B3 B2 B1 B0
     *   byte 1:  R4 R3 R2 R1 R0 G5 G4 G3 */
    SIMGP_FMT_RGB565 = 200,
    /*   byte 0:  G2 G1 G0 R4 R3 R2 R1 R0
     *   byte 1:  B4 B3 B2 B1 B0 G5 G4 G3 */
    SIMGP_FMT_BGR565 = 201,

    /* 24-bit RGB, three bytes a pixel. */
    SIMGP_FMT_RGB888 = 400, /* R0 G0 B0  R1 G1 B1 ... */
    SIMGP_FMT_BGR888 = 401, /* B0 G0 R0  B1 G1 R1 ... */

    /* 32-bit RGB, four bytes a pixel. Every conversion to these writes A = 255. */
    SIMGP_FMT_RGBA8888 = 500, /* R0 G0 B0 A0  R1 G1 B1 A1 ... */
    SIMGP_FMT_BGRA8888 = 501, /* B0 G0 R0 A0  B1 G1 R1 A1 ... */
    SIMGP_FMT_ARGB8888 = 502  /* A0 R0 G0 B0  A1 R1 G1 B1 ... */
};

/* Rotation codes: what is done to the picture; turns are named by their sense. */
enum {
    SIMGP_ROT_NONE = 0, /* a plain copy */
    SIMGP_ROT_90L = 1,  /* a quarter turn to the left (counter-clockwise) */
    SIMGP_ROT_90R = 2,  /* a quarter turn to the right (clockwise) */
    SIMGP_ROT_180 = 3,  /* a half turn */
    SIMGP_ROT_HORI = 4, /* mirrored left to right */
    SIMGP_ROT_VERT = 5  /* mirrored top to bottom */
};

/* Results of the functions that take descriptors. Every failure is found before a pixel is touched:
 * a call that does not return SIMGP_OK has written nothing. */
enum {
    SIMGP_OK = 0,              /* the operation ran */
    SIMGP_ERR_PARAM = -1,      /* the two formats break the operation's rule, or a bad argument */
    SIMGP_ERR_UNSUPPORTED = -3 /* the format, or the pair of formats, has no implementation */
};

/* The image descriptor --------------------------------------------------------------------------
 *
 * The caller fills it and owns it, and every buffer it points to; the library reads it, never
 * writes it, and keeps no pointer to it. Index k of each array is the plane number; entries beyond
 * the format's planes are ignored and may hold anything.
 *
 * Conversions take the picture's size from the source alone: of the destination they read stride[],
 * plane[] and format, never width[] and height[].
 *
 * A 640 x 480 picture with packed lines:
 *
 *   format               width[]        height[]       stride[]       plane[]
 *   SIMGP_FMT_YUV420     640, 320, 320  480, 240, 240  640, 320, 320  Y, U, V
 *   SIMGP_FMT_NV21       640, 320       480, 240       640, 640       Y, interleaved V/U
 *   SIMGP_FMT_UYVY       640            480            1280           pixels
 *   SIMGP_FMT_RGBA8888   640            480            2560           pixels
 *
 * Strides are not checked. They may be negative where plane[k] then points to the line that is
 * processed first (a bottom-up picture). Validate sizes that come from a stream before you get
 * here.
 */
typedef struct simgp_img {
    int32_t width[4];      /* samples in a line of plane k (pairs, for interleaved chroma) */
    int32_t height[4];     /* lines of plane k */
    int32_t stride[4];     /* bytes from one line of plane k to the next */
    uint32_t reserved0[4]; /* never read */
    uint8_t *plane[4];     /* first byte of plane k */
    uint32_t reserved1[4]; /* never read */
    int32_t format;        /* SIMGP_FMT_* */
} simgp_img;

/* The layout is part of the binary interface: pointers are native, every other word has 32 bits. */
SIMGP_STATIC_ASSERT(offsetof(simgp_img, plane) == 64, "simgp_img.plane moved");
#if UINTPTR_MAX == 0xFFFFFFFFu
SIMGP_STATIC_ASSERT(offsetof(simgp_img, reserved1) == 80, "simgp_img.reserved1 moved");
SIMGP_STATIC_ASSERT(offsetof(simgp_img, format) == 96, "simgp_img.format moved");
SIMGP_STATIC_ASSERT(sizeof(simgp_img) == 100, "simgp_img is not 25 words");
#else
SIMGP_STATIC_ASSERT(offsetof(simgp_img, reserved1) == 96, "simgp_img.reserved1 moved");
SIMGP_STATIC_ASSERT(offsetof(simgp_img, format) == 112, "simgp_img.format moved");
SIMGP_STATIC_ASSERT(sizeof(simgp_img) == 120, "simgp_img changed its size");
#endif

/* Types of the kernels ---------------------------------------------------------------------------
 *
 * Below the descriptor functions stand the kernels that do the work. They may be called directly;
 * they return nothing, check nothing, and trust what they are given.
 */

/* A conversion of a whole picture. The arrays are those of two descriptors, with entry k for plane
 * k, and only the entries of planes that the formats have are read:
 *
 *   src_planes    plane[] of the source: the first byte of each plane, which is only read
 *   src_widths    width[] of the source: samples in a line, or pairs
 *   src_heights   height[] of the source: lines
 *   src_strides   stride[] of the source: bytes from one line to the next; may be negative
 *   dst_strides   stride[] of the destination
 *   dst_planes    plane[] of the destination: the first byte of each plane, which is written
 *
 * The picture is src_widths[0] x src_heights[0] pixels; a width or height of 0 or less writes
 * nothing. Planes need no alignment. Source and destination must not share memory unless the
 * function says so. */
typedef void simgp_csc_fn(uint8_t *const *src_planes, const int32_t *src_widths,
                          const int32_t *src_heights, const int32_t *src_strides,
                          const int32_t *dst_strides, uint8_t *const *dst_planes);

/* Work on one plane.
 *
 *   src                      first byte of the first row; only read
 *   width                    samples in a row; the function says what a sample is
 *   height                   rows of the source
 *   src_stride, dst_stride   bytes from one row to the next; may be negative
 *   dst                      first byte of the first row; written, and read where the function says
 *
 * A width or height of 0 or less does nothing; the pointers are not used then. No pointer needs
 * to be aligned. Source and destination must not share memory. */
typedef void simgp_plane_fn(const void *src, int32_t width, int32_t height, int32_t src_stride,
                            int32_t dst_stride, void *dst);

SIMGP_END_DECLS

#endif
