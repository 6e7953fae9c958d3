/* A resizer for pictures that arrive in bands of lines. */
#ifndef SCMN_IRSZ_H
#define SCMN_IRSZ_H

#include <stddef.h>
#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

/* A decoder that delivers a picture band by band creates a resizer once per picture and hands it
 * each band; every call writes the destination rows whose source lines have come. Of the source one
 * line is kept between calls; bands are not looked at again.
 *
 *     scmn_irsz_param param = {SCMN_IRSZ_8B, SCMN_IRSZ_LINE, 1920, 1080, 1920, 16,
 *                              640, 360, 640, screen};
 *     scmn_irsz_ctx *resizer = scmn_irsz_create(&param, NULL);
 *     if (!resizer) return -1;
 *     for (line = 0; line < 1080; line += count)
 *         count = decode_band(band), scmn_irsz(resizer, band, line, count);
 *     scmn_irsz_delete(resizer);
 *
 * The filter is that of simgp_rsz (simgp/resize.h): the same positions, phases and weights, so the
 * destination is the one that simgp_rsz_8b and its like give for the whole picture.
 *
 * Objects are independent of each other; one must not be used from two threads at once. */

/* Pixel formats: the source's pixel, and the destination's. Every byte is interpolated on its own,
 * with truncation. */
enum {
    SCMN_IRSZ_8B = 20,            /* 1 byte */
    SCMN_IRSZ_8B8B8B = 21,        /* 3 bytes */
    SCMN_IRSZ_8B8B8B_5B6B5B = 23, /* 3 bytes e0, e1, e2, to a word e0 >> 3 << 11 | e1 >> 2 << 5
                                    * | e2 >> 3, low byte first */
    SCMN_IRSZ_5B6B5B = 25,        /* 16-bit words, low byte first, with channels of 5, 6, 5 bits:
                                    * each is interpolated on its own and truncated to its bits */
    SCMN_IRSZ_8B8B8B8B = 29       /* 4 bytes */
};

/* Modes: what a call is given. */
enum {
    SCMN_IRSZ_FULL = 10, /* whole pictures, any number, one in each call */
    SCMN_IRSZ_LINE = 11  /* one picture, in bands of lines */
};

/* Result codes of scmn_irsz_create. */
enum {
    SCMN_IRSZ_OK = 0,          /* the object was made */
    SCMN_IRSZ_ERR_MODE = -2,   /* the mode is none of the two */
    SCMN_IRSZ_ERR_MEMORY = -3, /* no memory, or sizes that the arithmetic does not hold */
    SCMN_IRSZ_ERR_FORMAT = -4  /* the format is none of the five */
};

/* What a resizer is to do. */
typedef struct scmn_irsz_param {
    int32_t format;      /* SCMN_IRSZ_8B ... */
    int32_t mode;        /* SCMN_IRSZ_FULL or SCMN_IRSZ_LINE */
    int32_t src_w;       /* pixels in a source line, at least 1 */
    int32_t src_h;       /* source lines, at least 1 */
    int32_t src_stride;  /* pixels from one source line to the next */
    int32_t chunk_lines; /* lines that a band usually has; any number will do, bands may differ */
    int32_t dst_w;       /* pixels in a destination row, at least 1 */
    int32_t dst_h;       /* destination rows, at least 1 */
    int32_t dst_stride;  /* pixels from one destination row to the next */
    void *dst;           /* first pixel of the destination: written by every call, never freed */
} scmn_irsz_param;

/* The object, to be looked at but not written. Positions have 18 fractional bits and count in units
 * of 1 << shift pixels (lines). Lengths are in bytes, for SCMN_IRSZ_5B6B5B in 16-bit words. */
typedef struct scmn_irsz_ctx scmn_irsz_ctx;
/* An entry function; the parameters are explained at scmn_irsz. */
typedef int32_t scmn_irsz_fn(scmn_irsz_ctx *ctx, const void *src, int32_t first_line,
                             int32_t nlines);
/* What scmn_irsz_create made of the parameters, and how far the picture has come. */
struct scmn_irsz_ctx {
    int32_t format;     /* of the parameters */
    int32_t mode;       /* likewise */
    int32_t inc_x;      /* from one destination pixel to the next, along a source line */
    int32_t inc_y;      /* from one destination row to the next */
    int32_t y_pos;      /* position of destination row `row` */
    int32_t tap_dx;     /* source pixels from a tap to its right neighbour: 1 << shift_x */
    int32_t src_line;   /* length from one source line to the next */
    int32_t dst_w;      /* of the parameters */
    int32_t dst_h;      /* likewise */
    int32_t dst_line;   /* length from one destination row to the next */
    int32_t shift_x;    /* decimation along the lines, 0 to 4 */
    int32_t shift_y;    /* likewise, along the columns */
    int32_t tap_dy;     /* length from a source line to its lower neighbour: src_line << shift_y */
    int32_t carry_off;  /* from the next band's first line to the lower line of the waiting row */
    int32_t carry;      /* 1 while a destination row, row - 1, waits for its lower line */
    int32_t chunk_size; /* length of chunk_lines lines */
    int32_t row;        /* the first destination row that is neither written nor said to wait;
                         * dst_h, with a carry of 0, when the picture is complete */
    int32_t upscale;    /* 1 if the destination is wider or higher than the source */
    int32_t reuse;      /* 1 while row `row` too takes the kept line for its upper one */
    scmn_irsz_fn *run;  /* the format's entry function */
    void *line_buf;     /* the kept line; bands only */
    void *dst;          /* of the parameters */
};

/* The layout is part of the binary interface: pointers are native, every other word has 32 bits. */
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

/* Makes a resizer.
 *
 *   param   read, and not kept
 *   err     receives the result code; may be NULL
 *
 * Returns the object, to be released by scmn_irsz_delete, or NULL: SCMN_IRSZ_ERR_MODE first, then
 * SCMN_IRSZ_ERR_FORMAT, then SCMN_IRSZ_ERR_MEMORY. The latter also stands for sizes below 1, for
 * source extents that the steps cannot hold (simgp_rsz_get_step), and for lengths that leave 32
 * bits: of a line, of a row, from tap to tap, and of chunk_lines lines where there are bands; in
 * bytes, whatever the format counts in. Nothing stays allocated then. */
SIMGP_API scmn_irsz_ctx *scmn_irsz_create(const scmn_irsz_param *param, int32_t *err);

/* Runs the object's entry function on a source picture or a band of its lines.
 *
 *   src          the first pixel of the picture, or of the band
 *   first_line   the number of the band's first line; bands come in order, the first with 0, and
 *                none is left out
 *   nlines       lines of the band; of 0 or less nothing is done
 *
 * For whole pictures first_line and nlines are not read. Of a band, every destination row is
 * written that lacks no source line any more; a row whose upper line has come and whose lower line
 * has not waits for it. Of a line no pixel is read that no destination pixel needs, so the last
 * line may end with its last pixel. Lines are src_stride pixels apart. Calls after the last row do
 * nothing. Returns 0. */
SIMGP_API scmn_irsz_fn scmn_irsz;

/* The entry functions of the formats, for an object of their format. */
SIMGP_API scmn_irsz_fn scmn_irsz8b;
SIMGP_API scmn_irsz_fn scmn_irsz8b8b8b;
SIMGP_API scmn_irsz_fn scmn_irsz8b8b8b_5b6b5b;
SIMGP_API scmn_irsz_fn scmn_irsz5b6b5b;
SIMGP_API scmn_irsz_fn scmn_irsz8b8b8b8b;

/* Releases the object; NULL is ignored. The destination stays. */
SIMGP_API void scmn_irsz_delete(scmn_irsz_ctx *ctx);

/* The kernels: one destination row, and a whole picture.
 *
 *   lines                the upper and the lower source line
 *   wrow                 tbl_rsz_weight + 4 times the vertical phase; with 0 the lower line is not
 *                        read, and may be NULL
 *   dst_w, dst_h         destination pixels in a row, rows; of 0 or less nothing is written
 *   shift_x, tap_dx      horizontal decimation, and 1 << shift_x
 *   inc_x                from one destination pixel to the next, 18 fractional bits
 *   dst_row              the first pixel of the destination row
 *   src, dst             the first pixels of the pictures
 *   src_line, dst_line   from one line to the next: bytes, for 5b6b5b 16-bit words
 *   step_x, step_y       increment << 3 | shift, as simgp_rsz_get_step gives them
 */
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

/* The weights of the filter; the same as simgp_tbl_rsz_weight. Read-only. */
SIMGP_API extern const uint8_t tbl_rsz_weight[256];

SIMGP_END_DECLS

#endif
