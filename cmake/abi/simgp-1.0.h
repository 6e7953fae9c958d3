/* The public headers of the release in one, for tests/package/oldheader.sh; ./run abi writes it. */
/* clang-format off */
#ifndef SIMGP_EXPORT_H
#define SIMGP_EXPORT_H 
#if defined(_WIN32) && defined(SIMGP_STATIC)
#define SIMGP_API 
#elif defined(_WIN32)
#define SIMGP_API __declspec(dllimport)
#elif defined(__GNUC__)
#define SIMGP_API __attribute__((visibility("default")))
#else
#define SIMGP_API 
#endif
#ifdef __cplusplus
#define SIMGP_BEGIN_DECLS extern "C" {
#define SIMGP_END_DECLS }
#define SIMGP_STATIC_ASSERT(condition,text) static_assert(condition, text)
#else
#define SIMGP_BEGIN_DECLS 
#define SIMGP_END_DECLS 
#define SIMGP_STATIC_ASSERT(condition,text) _Static_assert(condition, text)
#endif
#endif
#ifndef SCMN_BITS_H
#define SCMN_BITS_H 
#include <stddef.h>
#include <stdint.h>
SIMGP_BEGIN_DECLS
typedef struct scmn_bsr_ctx scmn_bsr_ctx;
typedef struct scmn_bsw_ctx scmn_bsw_ctx;
typedef int32_t (*scmn_bsr_refill_fn)(scmn_bsr_ctx *ctx, int32_t nbytes);
struct scmn_bsr_ctx {
    uint32_t cache;
    int32_t bits;
    const uint8_t *cur;
    const uint8_t *last;
    const uint8_t *start;
    int32_t size;
    scmn_bsr_refill_fn refill;
};
typedef int32_t (*scmn_bsw_byte_fn)(scmn_bsw_ctx *ctx);
struct scmn_bsw_ctx {
    uint8_t *cur;
    int32_t free_bits;
    uint8_t *last;
    uint8_t *start;
    int32_t size;
    scmn_bsw_byte_fn on_byte;
};
#if UINTPTR_MAX == 0xFFFFFFFFu
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, cur) == 8, "scmn_bsr_ctx.cur moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, last) == 12, "scmn_bsr_ctx.last moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, start) == 16, "scmn_bsr_ctx.start moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, size) == 20, "scmn_bsr_ctx.size moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, refill) == 24, "scmn_bsr_ctx.refill moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_bsr_ctx) == 28, "scmn_bsr_ctx is not 7 words");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, free_bits) == 4, "scmn_bsw_ctx.free_bits moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, last) == 8, "scmn_bsw_ctx.last moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, start) == 12, "scmn_bsw_ctx.start moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, size) == 16, "scmn_bsw_ctx.size moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, on_byte) == 20, "scmn_bsw_ctx.on_byte moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_bsw_ctx) == 24, "scmn_bsw_ctx is not 6 words");
#else
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, cur) == 8, "scmn_bsr_ctx.cur moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, last) == 16, "scmn_bsr_ctx.last moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, start) == 24, "scmn_bsr_ctx.start moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, size) == 32, "scmn_bsr_ctx.size moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsr_ctx, refill) == 40, "scmn_bsr_ctx.refill moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_bsr_ctx) == 48, "scmn_bsr_ctx changed its size");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, free_bits) == 8, "scmn_bsw_ctx.free_bits moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, last) == 16, "scmn_bsw_ctx.last moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, start) == 24, "scmn_bsw_ctx.start moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, size) == 32, "scmn_bsw_ctx.size moved");
SIMGP_STATIC_ASSERT(offsetof(scmn_bsw_ctx, on_byte) == 40, "scmn_bsw_ctx.on_byte moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_bsw_ctx) == 48, "scmn_bsw_ctx changed its size");
#endif
SIMGP_API void scmn_bsr_init(scmn_bsr_ctx *ctx, const uint8_t *buf, int32_t size,
                             scmn_bsr_refill_fn refill);
SIMGP_API int32_t scmn_bsr_flush(scmn_bsr_ctx *ctx, int32_t nbytes);
SIMGP_API int32_t scmn_bsr_le_flush(scmn_bsr_ctx *ctx, int32_t nbytes);
SIMGP_API uint32_t scmn_bsr_read(scmn_bsr_ctx *ctx, int32_t n);
SIMGP_API uint32_t scmn_bsr_read1(scmn_bsr_ctx *ctx);
SIMGP_API void scmn_bsr_skip(scmn_bsr_ctx *ctx, int32_t n);
SIMGP_API uint32_t scmn_bsr_peek(scmn_bsr_ctx *ctx, int32_t n);
SIMGP_API uint32_t scmn_bsr_skip_peek(scmn_bsr_ctx *ctx, int32_t nskip, int32_t npeek);
SIMGP_API void scmn_bsr_skip_to_align8(scmn_bsr_ctx *ctx);
SIMGP_API uint32_t scmn_bsr_le_read(scmn_bsr_ctx *ctx, int32_t n);
SIMGP_API void scmn_bsr_le_skip(scmn_bsr_ctx *ctx, int32_t n);
SIMGP_API void scmn_bsr_le_skip_to_align8(scmn_bsr_ctx *ctx);
SIMGP_API int32_t scmn_bsr_clz_in_code(uint32_t x);
SIMGP_API void scmn_bsw_init(scmn_bsw_ctx *ctx, uint8_t *buf, int32_t size,
                             scmn_bsw_byte_fn on_byte);
SIMGP_API int32_t scmn_bsw_write1(scmn_bsw_ctx *ctx, uint32_t bit);
SIMGP_API int32_t scmn_bsw_write(scmn_bsw_ctx *ctx, uint32_t value, int32_t n);
SIMGP_END_DECLS
#endif
#ifndef SCMN_IRSZ_H
#define SCMN_IRSZ_H 
#include <stddef.h>
#include <stdint.h>
SIMGP_BEGIN_DECLS
enum {
    SCMN_IRSZ_8B = 20,
    SCMN_IRSZ_8B8B8B = 21,
    SCMN_IRSZ_8B8B8B_5B6B5B = 23,
    SCMN_IRSZ_5B6B5B = 25,
    SCMN_IRSZ_8B8B8B8B = 29
};
enum {
    SCMN_IRSZ_FULL = 10,
    SCMN_IRSZ_LINE = 11
};
enum {
    SCMN_IRSZ_OK = 0,
    SCMN_IRSZ_ERR_MODE = -2,
    SCMN_IRSZ_ERR_MEMORY = -3,
    SCMN_IRSZ_ERR_FORMAT = -4
};
typedef struct scmn_irsz_param {
    int32_t format;
    int32_t mode;
    int32_t src_w;
    int32_t src_h;
    int32_t src_stride;
    int32_t chunk_lines;
    int32_t dst_w;
    int32_t dst_h;
    int32_t dst_stride;
    void *dst;
} scmn_irsz_param;
typedef struct scmn_irsz_ctx scmn_irsz_ctx;
typedef int32_t scmn_irsz_fn(scmn_irsz_ctx *ctx, const void *src, int32_t first_line,
                             int32_t nlines);
struct scmn_irsz_ctx {
    int32_t format;
    int32_t mode;
    int32_t inc_x;
    int32_t inc_y;
    int32_t y_pos;
    int32_t tap_dx;
    int32_t src_line;
    int32_t dst_w;
    int32_t dst_h;
    int32_t dst_line;
    int32_t shift_x;
    int32_t shift_y;
    int32_t tap_dy;
    int32_t carry_off;
    int32_t carry;
    int32_t chunk_size;
    int32_t row;
    int32_t upscale;
    int32_t reuse;
    scmn_irsz_fn *run;
    void *line_buf;
    void *dst;
};
#if UINTPTR_MAX == 0xFFFFFFFFu
SIMGP_STATIC_ASSERT(offsetof(scmn_irsz_param, dst) == 36, "scmn_irsz_param.dst moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_irsz_param) == 40, "scmn_irsz_param is not 10 words");
SIMGP_STATIC_ASSERT(offsetof(scmn_irsz_ctx, run) == 76, "scmn_irsz_ctx.run moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_irsz_ctx) == 88, "scmn_irsz_ctx is not 22 words");
#else
SIMGP_STATIC_ASSERT(offsetof(scmn_irsz_param, dst) == 40, "scmn_irsz_param.dst moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_irsz_param) == 48, "scmn_irsz_param changed its size");
SIMGP_STATIC_ASSERT(offsetof(scmn_irsz_ctx, run) == 80, "scmn_irsz_ctx.run moved");
SIMGP_STATIC_ASSERT(sizeof(scmn_irsz_ctx) == 104, "scmn_irsz_ctx changed its size");
#endif
SIMGP_STATIC_ASSERT(offsetof(scmn_irsz_ctx, reuse) == 72, "scmn_irsz_ctx.reuse moved");
SIMGP_API scmn_irsz_ctx *scmn_irsz_create(const scmn_irsz_param *param, int32_t *err);
SIMGP_API scmn_irsz_fn scmn_irsz;
SIMGP_API scmn_irsz_fn scmn_irsz8b;
SIMGP_API scmn_irsz_fn scmn_irsz8b8b8b;
SIMGP_API scmn_irsz_fn scmn_irsz8b8b8b_5b6b5b;
SIMGP_API scmn_irsz_fn scmn_irsz5b6b5b;
SIMGP_API scmn_irsz_fn scmn_irsz8b8b8b8b;
SIMGP_API void scmn_irsz_delete(scmn_irsz_ctx *ctx);
typedef void scmn_irsz_line_fn(const void *const *lines, const uint8_t *wrow, int32_t dst_w,
                               int32_t shift_x, int32_t tap_dx, int32_t inc_x, void *dst_row);
typedef void scmn_irsz_full_fn(const void *src, int32_t src_line, int32_t dst_w, int32_t dst_h,
                               int32_t dst_line, void *dst, int32_t step_x, int32_t step_y);
SIMGP_API scmn_irsz_line_fn scmn_irsz8b_line;
SIMGP_API scmn_irsz_line_fn scmn_irsz8b8b8b_line;
SIMGP_API scmn_irsz_line_fn scmn_irsz8b8b8b_5b6b5b_line;
SIMGP_API scmn_irsz_line_fn scmn_irsz5b6b5b_line;
SIMGP_API scmn_irsz_line_fn scmn_irsz8b8b8b8b_line;
SIMGP_API scmn_irsz_full_fn scmn_irsz8b_full;
SIMGP_API scmn_irsz_full_fn scmn_irsz8b8b8b_full;
SIMGP_API scmn_irsz_full_fn scmn_irsz8b8b8b_5b6b5b_full;
SIMGP_API scmn_irsz_full_fn scmn_irsz5b6b5b_full;
SIMGP_API scmn_irsz_full_fn scmn_irsz8b8b8b8b_full;
SIMGP_API extern const uint8_t tbl_rsz_weight[256];
SIMGP_END_DECLS
#endif
#ifndef SCMN_KEYFRAME_H
#define SCMN_KEYFRAME_H 
#include <stdint.h>
SIMGP_BEGIN_DECLS
SIMGP_API int32_t scmn_is_vkeyfrm(int32_t media_type, const uint8_t *buf, int32_t size);
SIMGP_END_DECLS
#endif
#ifndef SCMN_MEM_H
#define SCMN_MEM_H 
#include <stdint.h>
SIMGP_BEGIN_DECLS
SIMGP_API void *scmn_malloc_align32(uint32_t size);
SIMGP_API void *scmn_malloc_fast_align32(uint32_t size);
SIMGP_API void scmn_mfree_align32(void *p);
SIMGP_API void scmn_mfree_fast_align32(void *p);
SIMGP_API void scmn_blk_mcpy(void *dst, const void *src, int32_t dst_stride, int32_t src_stride,
                             int32_t width, int32_t height);
SIMGP_API void scmn_mset_x128(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x64(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x64a(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x32(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mset_x32ax4(void *dst, uint32_t value, int32_t count);
SIMGP_API void scmn_mclr_x64(void *dst, int32_t count);
SIMGP_API int32_t scmn_floor_log2(uint32_t x);
SIMGP_API int32_t scmn_ceil_log2(uint32_t x);
SIMGP_API const char *scmn_version(void);
SIMGP_END_DECLS
#endif
#ifndef SCMN_TAGS_H
#define SCMN_TAGS_H 
#include <stdint.h>
SIMGP_BEGIN_DECLS
enum {
    SCMN_MT_NONE = 0,
    SCMN_MT_MPEG4 = 102,
    SCMN_MT_H263 = 103,
    SCMN_MT_H264 = 104,
    SCMN_MT_WMV1 = 105,
    SCMN_MT_WMV2 = 106,
    SCMN_MT_WMV3 = 107,
    SCMN_MT_DIV3 = 110,
    SCMN_MT_VID_UNKNOWN = 299,
    SCMN_MT_PCM = 300,
    SCMN_MT_ALAW = 301,
    SCMN_MT_MULAW = 302,
    SCMN_MT_MPEGAUDIO = 304,
    SCMN_MT_MP3 = 305,
    SCMN_MT_AAC = 306,
    SCMN_MT_AC3 = 307,
    SCMN_MT_DTS = 308,
    SCMN_MT_AMRNB = 309,
    SCMN_MT_AMRWB = 310,
    SCMN_MT_QCELP = 311,
    SCMN_MT_WMA = 312,
    SCMN_MT_WMAPRO = 313,
    SCMN_MT_WMALOSSLESS = 314,
    SCMN_MT_EVRC = 321,
    SCMN_MT_AUD_UNKNOWN = 499,
    SCMN_MT_DRM = 1100,
    SCMN_MT_DRM_UNKNOWN = 1299
};
#define SCMN_FOURCC(a,b,c,d) \
    ((uint32_t)(uint8_t)(a) | (uint32_t)(uint8_t)(b) << 8 | (uint32_t)(uint8_t)(c) << 16 | \
     (uint32_t)(uint8_t)(d) << 24)
SIMGP_API int32_t scmn_fcc2mt_aud(uint32_t tag);
SIMGP_API int32_t scmn_fcc2mt_vid(uint32_t tag);
SIMGP_API int32_t scmn_fcc2mt_drm(uint32_t tag);
SIMGP_API int32_t scmn_fcc2mt(uint32_t tag);
SIMGP_END_DECLS
#endif
#ifndef SCMN_SCMN_H
#define SCMN_SCMN_H 
#endif
#ifndef SIMGP_IMG_H
#define SIMGP_IMG_H 
#include <stddef.h>
#include <stdint.h>
SIMGP_BEGIN_DECLS
enum {
    SIMGP_FMT_YUV400 = 0,
    SIMGP_FMT_YUV420 = 1,
    SIMGP_FMT_YUV422N = 2,
    SIMGP_FMT_YUV444 = 3,
    SIMGP_FMT_YV12 = 4,
    SIMGP_FMT_YV16 = 5,
    SIMGP_FMT_NV12 = 6,
    SIMGP_FMT_NV21 = 7,
    SIMGP_FMT_YUV422W = 8,
    SIMGP_FMT_T64X32 = 11,
    SIMGP_FMT_UYVY = 100,
    SIMGP_FMT_YUYV = 101,
    SIMGP_FMT_RGB565 = 200,
    SIMGP_FMT_BGR565 = 201,
    SIMGP_FMT_RGB888 = 400,
    SIMGP_FMT_BGR888 = 401,
    SIMGP_FMT_RGBA8888 = 500,
    SIMGP_FMT_BGRA8888 = 501,
    SIMGP_FMT_ARGB8888 = 502
};
enum {
    SIMGP_ROT_NONE = 0,
    SIMGP_ROT_90L = 1,
    SIMGP_ROT_90R = 2,
    SIMGP_ROT_180 = 3,
    SIMGP_ROT_HORI = 4,
    SIMGP_ROT_VERT = 5
};
enum {
    SIMGP_OK = 0,
    SIMGP_ERR_PARAM = -1,
    SIMGP_ERR_UNSUPPORTED = -3
};
typedef struct simgp_img {
    int32_t width[4];
    int32_t height[4];
    int32_t stride[4];
    uint32_t reserved0[4];
    uint8_t *plane[4];
    uint32_t reserved1[4];
    int32_t format;
} simgp_img;
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
typedef void simgp_csc_fn(uint8_t *const *src_planes, const int32_t *src_widths,
                          const int32_t *src_heights, const int32_t *src_strides,
                          const int32_t *dst_strides, uint8_t *const *dst_planes);
typedef void simgp_plane_fn(const void *src, int32_t width, int32_t height, int32_t src_stride,
                            int32_t dst_stride, void *dst);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_COPY_H
#define SIMGP_COPY_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_cpy(const simgp_img *src, const simgp_img *dst);
SIMGP_API simgp_plane_fn simgp_cpy_8b;
SIMGP_API simgp_plane_fn simgp_cpy_16b;
SIMGP_API simgp_plane_fn simgp_cpy_24b;
SIMGP_API simgp_plane_fn simgp_cpy_32b;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_CSC_H
#define SIMGP_CSC_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_csc(const simgp_img *src, const simgp_img *dst);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_CSC_ANY_H
#define SIMGP_CSC_ANY_H 
SIMGP_BEGIN_DECLS
enum {
    SIMGP_COLOUR_BT601 = 0,
    SIMGP_COLOUR_BT601_FULL = 1,
    SIMGP_COLOUR_BT709 = 2,
    SIMGP_COLOUR_BT709_FULL = 3,
    SIMGP_COLOUR_BT2020 = 4,
    SIMGP_COLOUR_BT2020_FULL = 5,
    SIMGP_CHROMA_MEAN = 256
};
SIMGP_API int32_t simgp_csc_any(const simgp_img *src, const simgp_img *dst, int32_t colour);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_CSC_ROT_H
#define SIMGP_CSC_ROT_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_csc_rot(const simgp_img *src, int32_t rot, const simgp_img *dst);
SIMGP_API simgp_plane_fn simgp_csc_1x2_to_1x1_rot_90l;
SIMGP_API simgp_plane_fn simgp_csc_1x2_to_1x1_rot_90r;
SIMGP_API extern simgp_plane_fn *const simgp_tbl_fn_csc_1x2_to_1x1_rot[6];
SIMGP_END_DECLS
#endif
#ifndef SIMGP_DEBLOCK_H
#define SIMGP_DEBLOCK_H 
SIMGP_BEGIN_DECLS
SIMGP_API void simgp_dbf8x8(uint8_t *plane, int16_t strength, int32_t stride, int32_t width,
                            int32_t height);
SIMGP_API void simgp_dbf8x8_h263_hor(uint8_t *plane, int16_t strength, int32_t stride,
                                     int32_t width, int32_t height);
SIMGP_API void simgp_dbf8x8_h263_ver(uint8_t *plane, int16_t strength, int32_t stride,
                                     int32_t width, int32_t height);
SIMGP_API int32_t simgp_dbf8x8_yuv(const simgp_img *img, int16_t strength);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_DITHER_H
#define SIMGP_DITHER_H 
SIMGP_BEGIN_DECLS
SIMGP_API simgp_plane_fn simgp_dit_8b;
SIMGP_API int32_t simgp_csc_dither(const simgp_img *src, const simgp_img *dst);
SIMGP_API simgp_csc_fn simgp_csc_yuv400_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgr565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_bgr565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_bgr565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_rgb565_dither;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_bgr565_dither;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_LAYOUT_H
#define SIMGP_LAYOUT_H 
SIMGP_BEGIN_DECLS
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_yuv422n;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_nv21;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_yv16_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_yv16_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_yv12;
SIMGP_API simgp_plane_fn simgp_csc_1x2_to_1x1;
SIMGP_API simgp_plane_fn simgp_csc_1x1_to_1x2;
SIMGP_API void simgp_csc_8b8b_pck(const uint8_t *src_a, const uint8_t *src_b, int32_t width,
                                  int32_t height, int32_t stride_a, int32_t stride_b,
                                  int32_t dst_stride, uint8_t *dst);
SIMGP_API void simgp_csc_8b8b_unpck(const uint8_t *src, int32_t width, int32_t height,
                                    int32_t src_stride, int32_t stride_a, int32_t stride_b,
                                    uint8_t *dst_a, uint8_t *dst_b);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_NAMES_H
#define SIMGP_NAMES_H 
SIMGP_BEGIN_DECLS
#define SIMGP_VERSION_MAJOR 1
#define SIMGP_VERSION_MINOR 0
#define SIMGP_VERSION_PATCH 0
#define SIMGP_VERSION (SIMGP_VERSION_MAJOR << 16 | SIMGP_VERSION_MINOR << 8 | SIMGP_VERSION_PATCH)
SIMGP_API int32_t simgp_version(void);
SIMGP_API const char *simgp_result_text(int32_t result);
SIMGP_API const char *simgp_format_name(int32_t format);
SIMGP_API int32_t simgp_format_of_name(const char *name);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_PACKED2RGB_H
#define SIMGP_PACKED2RGB_H 
SIMGP_BEGIN_DECLS
SIMGP_API simgp_csc_fn simgp_csc_yuyv_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuyv_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_bgr888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_rgba8888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_bgra8888;
SIMGP_API simgp_csc_fn simgp_csc_uyvy_to_argb8888;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_RESIZE_H
#define SIMGP_RESIZE_H 
SIMGP_BEGIN_DECLS
SIMGP_API extern const uint8_t simgp_tbl_rsz_weight[256];
SIMGP_API void simgp_rsz_get_step(int32_t src_width, int32_t src_height, int32_t dst_width,
                                  int32_t dst_height, int32_t mode, int32_t *step_x,
                                  int32_t *step_y);
SIMGP_API int32_t simgp_rsz(const simgp_img *src, const simgp_img *dst);
typedef void simgp_rsz_fn(const void *src_plane, int32_t src_stride, int32_t dst_width,
                          int32_t dst_height, int32_t dst_stride, void *dst_plane, int32_t step_x,
                          int32_t step_y);
SIMGP_API simgp_rsz_fn simgp_rsz_8b;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b8b;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b8b8b;
SIMGP_API simgp_rsz_fn simgp_rsz_5b6b5b;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_RESIZE_CSC_H
#define SIMGP_RESIZE_CSC_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_rsz_csc(const simgp_img *src, const simgp_img *dst);
typedef void simgp_rsz_csc_fn(uint8_t *const *src_planes, const int32_t *src_widths,
                              const int32_t *src_heights, const int32_t *src_strides,
                              const int32_t *dst_widths, const int32_t *dst_heights,
                              const int32_t *dst_strides, uint8_t *const *dst_planes);
SIMGP_API simgp_rsz_csc_fn simgp_rsz_csc_yuv420_to_rgb565;
SIMGP_API simgp_rsz_csc_fn simgp_rsz_csc_t64x32_to_rgb565;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_RESIZE_ROT_H
#define SIMGP_RESIZE_ROT_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_rsz_rot(const simgp_img *src, int32_t rot, const simgp_img *dst);
SIMGP_API simgp_rsz_fn simgp_rsz_8b_rot_90l;
SIMGP_API simgp_rsz_fn simgp_rsz_8b_rot_90r;
SIMGP_API simgp_rsz_fn simgp_rsz_8b_rot_180;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b_rot_90l;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b_rot_90r;
SIMGP_API simgp_rsz_fn simgp_rsz_8b8b_rot_180;
SIMGP_API extern simgp_rsz_fn *const simgp_tbl_fn_rsz_8b_rot[6];
SIMGP_API extern simgp_rsz_fn *const simgp_tbl_fn_rsz_8b8b_rot[6];
SIMGP_API void simgp_rsz_8b_rot_90r_quarter(const void *src_plane, int32_t src_stride,
                                            int32_t dst_width, int32_t dst_height,
                                            int32_t dst_stride, void *dst_plane);
SIMGP_END_DECLS
#endif
#ifndef SIMGP_RGB2YUV_H
#define SIMGP_RGB2YUV_H 
SIMGP_BEGIN_DECLS
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_nv21;
SIMGP_API simgp_csc_fn simgp_csc_bgr888_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_bgr888_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_yv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_rgb565_to_nv21;
SIMGP_API simgp_csc_fn simgp_csc_rgb888_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_rgba8888_to_rgb565;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_ROTATE_H
#define SIMGP_ROTATE_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_rot(const simgp_img *src, int32_t rot, const simgp_img *dst);
SIMGP_API simgp_plane_fn simgp_rot_8b_90l;
SIMGP_API simgp_plane_fn simgp_rot_8b_90r;
SIMGP_API simgp_plane_fn simgp_rot_8b_180;
SIMGP_API simgp_plane_fn simgp_rot_8b_hori;
SIMGP_API simgp_plane_fn simgp_rot_8b_vert;
SIMGP_API simgp_plane_fn simgp_rot_16b_90l;
SIMGP_API simgp_plane_fn simgp_rot_16b_90r;
SIMGP_API simgp_plane_fn simgp_rot_16b_180;
SIMGP_API simgp_plane_fn simgp_rot_16b_hori;
SIMGP_API simgp_plane_fn simgp_rot_16b_vert;
SIMGP_API extern simgp_plane_fn *const simgp_tbl_fn_rot_8b[6];
SIMGP_API extern simgp_plane_fn *const simgp_tbl_fn_rot_16b[6];
SIMGP_END_DECLS
#endif
#ifndef SIMGP_TILE_H
#define SIMGP_TILE_H 
SIMGP_BEGIN_DECLS
SIMGP_API int32_t simgp_get_tile_offset(int32_t width, int32_t height, int32_t x, int32_t y);
SIMGP_API void simgp_csc_copy_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                              int32_t dst_stride, uint8_t *dst);
SIMGP_API void simgp_csc_unpack_tiles_to_linear(const uint8_t *src, int32_t width, int32_t height,
                                                int32_t stride_u, uint8_t *dst_u, int32_t stride_v,
                                                uint8_t *dst_v);
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_nv12;
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_yuv420;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_t64x32;
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_t64x32_to_bgra8888;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_YUV2RGB_H
#define SIMGP_YUV2RGB_H 
SIMGP_BEGIN_DECLS
SIMGP_API simgp_csc_fn simgp_csc_yuv400_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgr888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_rgba8888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_bgra8888;
SIMGP_API simgp_csc_fn simgp_csc_yuv420_to_argb8888;
SIMGP_API simgp_csc_fn simgp_csc_yv12_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yv12_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_yv12_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv422n_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv422w_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_yuv444_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_nv12_to_rgb888;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_rgb565;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_bgr565;
SIMGP_API simgp_csc_fn simgp_csc_nv21_to_rgb888;
SIMGP_END_DECLS
#endif
#ifndef SIMGP_SIMGP_H
#define SIMGP_SIMGP_H 
#endif
