/* Bit readers and a bit writer over the caller's bytes.
 *
 * The reader keeps up to 32 bits in `cache`, loaded by a refill function that a caller may replace,
 * and the writer fills one byte after the other. Both keep their whole state in a record of the
 * caller, valid from init until the caller drops it; nothing needs releasing. The record does not
 * say which bit order it serves: use the functions of one order only, with the refill of that
 * order.
 *
 * A record belongs to one thread at a time; different records are independent. */
#ifndef SCMN_BITS_H
#define SCMN_BITS_H

#include <stddef.h>
#include <stdint.h>

#include "simgp/export.h"

SIMGP_BEGIN_DECLS

/* The records of a reader and of a writer; their members stand below. */
typedef struct scmn_bsr_ctx scmn_bsr_ctx;
typedef struct scmn_bsw_ctx scmn_bsw_ctx;

/* Refill of a reader: throws the content of `cache` away and loads the next bytes.
 *
 *   nbytes    how many to load, 1 to 4
 *   returns   0 if at least one byte was loaded, else a value other than 0
 *
 * What a refill has to do: n is the smaller of nbytes and last + 1 - cur, compared as signed
 * numbers. If n is 0 or less, set `cache` and `bits` to 0 and return -1. Otherwise put n bytes into
 * `cache`, the first into bits 31..24, the next into 23..16 and so on (least significant bit first:
 * the first into bits 7..0, the next into 15..8), all others 0; set `bits` to 8 n, advance `cur` by
 * n, return 0.
 *
 * A refill may set `cur` and `last` to a further buffer before it loads. It should load all the
 * bytes it is asked for unless the stream ends there; a reader whose `bits` is negative (see below)
 * has already reported bits that did not exist, and must be initialised anew. */
typedef int32_t (*scmn_bsr_refill_fn)(scmn_bsr_ctx *ctx, int32_t nbytes);

/* State of a reader. The first unread bit of the stream is at the top of `cache` (bit 31), or at
 * its bottom (bit 0) when reading least significant bit first; bits that are not valid are 0. */
struct scmn_bsr_ctx {
    uint32_t cache;            /* bits loaded and not yet consumed */
    int32_t bits;              /* their number, 0 to 32; negative after reading past the end */
    const uint8_t *cur;        /* next byte to load */
    const uint8_t *last;       /* last byte of the buffer; may be cur - 1, when all is loaded */
    const uint8_t *start;      /* the buffer as given to init; not used again */
    int32_t size;              /* its size as given to init; not used again */
    scmn_bsr_refill_fn refill; /* never NULL */
};

/* Called by a writer for each completed byte, which `cur` still addresses; the result is ignored.
 * It may set `cur` to another place (writing goes on at cur + 1) and `last` with it. */
typedef int32_t (*scmn_bsw_byte_fn)(scmn_bsw_ctx *ctx);

/* State of a writer. New bits enter the current byte at its bottom and push the others up, so the
 * buffer need not be cleared, and a byte is meaningful only when it is complete. */
struct scmn_bsw_ctx {
    uint8_t *cur;             /* the byte being filled */
    int32_t free_bits;        /* bits that it still takes, 8 down to 1 */
    uint8_t *last;            /* last byte of the buffer */
    uint8_t *start;           /* the buffer as given to init; not used again */
    int32_t size;             /* its size as given to init; not used again */
    scmn_bsw_byte_fn on_byte; /* or NULL */
};

/* The layouts are part of the binary interface: pointers are native, all else has 32 bits. */
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

/* Reading -----------------------------------------------------------------------------------------
 *
 * The end of the data. A call that needs more bits than `cache` holds refills it, once. If no byte
 * is left, what the cache still held is lost (except to scmn_bsr_peek) and the call reports the end
 * as it says below; later calls try again and fail again. If the refill could load some bytes but
 * too few, the call gives what there is followed by zeros, and `bits` becomes negative by the
 * number of bits that were missing (scmn_bsr_le_read: or 0, where 32 bits were taken from the new
 * bytes); the next call then meets the end. A 32-bit read of 0xFFFFFFFF looks like a failure: look
 * at `bits` and `cur` where that matters.
 *
 * Counts outside 0 to 32 are not checked and give no useful result, but do no harm. */

/* Starts reading `size` bytes (0 or less: none, and buf may be NULL) at buf, with the given refill
 * or, for NULL, with scmn_bsr_flush. Reading least significant bit first needs scmn_bsr_le_flush
 * here. Nothing is read yet: buf must stay as long as the reader is used. It is never written. */
SIMGP_API void scmn_bsr_init(scmn_bsr_ctx *ctx, const uint8_t *buf, int32_t size,
                             scmn_bsr_refill_fn refill);

/* The two refills, most and least significant bit first, as described at scmn_bsr_refill_fn. A
 * count above 4 loads 4. */
SIMGP_API int32_t scmn_bsr_flush(scmn_bsr_ctx *ctx, int32_t nbytes);
SIMGP_API int32_t scmn_bsr_le_flush(scmn_bsr_ctx *ctx, int32_t nbytes);

/* Most significant bit first: the first bit of a byte is its bit 7, and the first bit read ends up
 * highest in the result: of the bytes A5 0F, 4 bits give A, then 8 give 50, then 4 give F. */

/* The next n bits (0 to 32), right-aligned; 0xFFFFFFFF at the end. n = 0 gives 0 and consumes
 * nothing. */
SIMGP_API uint32_t scmn_bsr_read(scmn_bsr_ctx *ctx, int32_t n);
/* The next bit, 0 or 1; 0xFFFFFFFF at the end. */
SIMGP_API uint32_t scmn_bsr_read1(scmn_bsr_ctx *ctx);
/* Passes over n bits (0 to 32). */
SIMGP_API void scmn_bsr_skip(scmn_bsr_ctx *ctx, int32_t n);
/* The next n bits (0 to 32), right-aligned, without consuming them; bits past the end count as 0.
 * Works at any bit position: what does not fit the cache comes from the byte at `cur`. The cache is
 * topped up on the way, so `cache`, `bits` and `cur` may change, but not what will be read. */
SIMGP_API uint32_t scmn_bsr_peek(scmn_bsr_ctx *ctx, int32_t n);
/* Passes over nskip bits and peeks at the next npeek (each 0 to 32). Gives 0 if skipping meets the
 * end. */
SIMGP_API uint32_t scmn_bsr_skip_peek(scmn_bsr_ctx *ctx, int32_t nskip, int32_t npeek);
/* Passes over the rest of the current byte; at the start of a byte does nothing. */
SIMGP_API void scmn_bsr_skip_to_align8(scmn_bsr_ctx *ctx);

/* Least significant bit first: the first bit of a byte is its bit 0, and the first bit read ends up
 * lowest in the result: of the bytes A5 0F, 4 bits give 5, then 8 give FA, then 4 give 0. */

/* The next n bits (0 to 32), right-aligned; 0xFFFFFFFF at the end. */
SIMGP_API uint32_t scmn_bsr_le_read(scmn_bsr_ctx *ctx, int32_t n);
/* Drops n bits (0 to 32, not more than `bits`) from the cache; never refills. */
SIMGP_API void scmn_bsr_le_skip(scmn_bsr_ctx *ctx, int32_t n);
/* Passes over the rest of the current byte; at the start of a byte does nothing. */
SIMGP_API void scmn_bsr_le_skip_to_align8(scmn_bsr_ctx *ctx);

/* Number of zero bits above the highest one of x: 32 for 0, 31 for 1, 0 for 0x80000000. On a peeked
 * word it is the run of zeros that opens a variable-length code. */
SIMGP_API int32_t scmn_bsr_clz_in_code(uint32_t x);

/* Writing -----------------------------------------------------------------------------------------
 *
 * Most significant bit first. Nothing outside start .. last is touched. There is no flush: pad the
 * last byte, by writing free_bits more bits while free_bits is not 8, before you use the buffer. */

/* Starts writing into `size` bytes (0 or less: none, and buf may be NULL) at buf, which must stay
 * as long as the writer is used. on_byte may be NULL. The buffer is not touched yet. */
SIMGP_API void scmn_bsw_init(scmn_bsw_ctx *ctx, uint8_t *buf, int32_t size,
                             scmn_bsw_byte_fn on_byte);

/* Appends the lowest bit of `bit`. Returns 0, or -1 and changes nothing if the buffer is full. */
SIMGP_API int32_t scmn_bsw_write1(scmn_bsw_ctx *ctx, uint32_t bit);

/* Appends the low n bits of `value` (n of 1 to 32; more counts as 32), highest first. Returns 0, or
 * -1 if the buffer is full or becomes full before the last bit; then the bits that fit are stored.
 * n of 0 or less stores nothing and returns 0, or -1 if the buffer is full. */
SIMGP_API int32_t scmn_bsw_write(scmn_bsw_ctx *ctx, uint32_t value, int32_t n);

/* Without calls -----------------------------------------------------------------------------------
 *
 * What these functions do nearly every time, a shift of the cache or a bit pushed into a byte,
 * takes less time than a call. So programs get it in place, from the functions below, and call the
 * library for the rest: the ends of the cache, of a byte and of the data. Results and records are
 * the same.
 *
 * The library's own function is meant by its address and by its name in parentheses,
 * (scmn_bsr_peek)(ctx, n), and everywhere in a source that defines SCMN_BITS_CALLED before it
 * includes this header. */
#ifndef SCMN_BITS_CALLED

static inline uint32_t scmn_bsr_read_inline(scmn_bsr_ctx *ctx, int32_t n) {
    if (n < 1 || n > 31 || n > ctx->bits) return (scmn_bsr_read)(ctx, n);
    const uint32_t result = ctx->cache >> (32 - n);
    ctx->cache <<= n;
    ctx->bits -= n;
    return result;
}

static inline uint32_t scmn_bsr_read1_inline(scmn_bsr_ctx *ctx) {
    if (ctx->bits < 1) return (scmn_bsr_read1)(ctx);
    const uint32_t result = ctx->cache >> 31;
    ctx->cache <<= 1;
    ctx->bits--;
    return result;
}

static inline void scmn_bsr_skip_inline(scmn_bsr_ctx *ctx, int32_t n) {
    if (n < 1 || n > 31 || n > ctx->bits) {
        (scmn_bsr_skip)(ctx, n);
    } else {
        ctx->cache <<= n;
        ctx->bits -= n;
    }
}

static inline uint32_t scmn_bsr_peek_inline(scmn_bsr_ctx *ctx, int32_t n) {
    if (n < 1 || n > 32 || n > ctx->bits) return (scmn_bsr_peek)(ctx, n);
    return ctx->cache >> (32 - n);
}

static inline int32_t scmn_bsw_write1_inline(scmn_bsw_ctx *ctx, uint32_t bit) {
    /* A byte's first bit has to ask whether there is room, and its last one ends it. */
    if (ctx->free_bits < 2 || ctx->free_bits > 7) return (scmn_bsw_write1)(ctx, bit);
    *ctx->cur = (*ctx->cur * 2u + (bit & 1u)) & 0xFFu;
    ctx->free_bits--;
    return 0;
}

#define scmn_bsr_read(ctx, n) scmn_bsr_read_inline(ctx, n)
#define scmn_bsr_read1(ctx) scmn_bsr_read1_inline(ctx)
#define scmn_bsr_skip(ctx, n) scmn_bsr_skip_inline(ctx, n)
#define scmn_bsr_peek(ctx, n) scmn_bsr_peek_inline(ctx, n)
#define scmn_bsw_write1(ctx, bit) scmn_bsw_write1_inline(ctx, bit)

#endif

SIMGP_END_DECLS

#endif
