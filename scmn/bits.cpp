// The functions themselves are defined here.
#define SCMN_BITS_CALLED
#include "scmn/bits.h"

#include <string.h>

// Shifts by any count. The counts of a regular stream go from 0 to 32, where 32 empties the word; a
// context that read past the end can bring others, which empty it too.
static inline uint32_t shl(uint32_t x, int32_t n) {
    return static_cast<uint32_t>(n) < 32 ? x << n : 0;
}
static inline uint32_t shr(uint32_t x, int32_t n) {
    return static_cast<uint32_t>(n) < 32 ? x >> n : 0;
}
static inline uint32_t low_bits(uint32_t x, int32_t n) {
    return n >= 32 ? x : n > 0 ? x & ((1u << n) - 1) : 0;
}

// Counts may be anything that a caller gave or stored; sums wrap.
static inline int32_t plus(int32_t a, int32_t b) {
    return static_cast<int32_t>(static_cast<uint32_t>(a) + static_cast<uint32_t>(b));
}
static inline int32_t minus(int32_t a, int32_t b) {
    return static_cast<int32_t>(static_cast<uint32_t>(a) - static_cast<uint32_t>(b));
}

// Bytes from cur to last, in integers: last may lie before the buffer, where pointers may not be
// formed.
static inline intptr_t bytes_left(const uint8_t *cur, const uint8_t *last) {
    return static_cast<intptr_t>(reinterpret_cast<uintptr_t>(last) + 1 -
                                 reinterpret_cast<uintptr_t>(cur));
}
static inline uint8_t *last_byte(const uint8_t *buf, int32_t size) {
    return reinterpret_cast<uint8_t *>(reinterpret_cast<uintptr_t>(buf) +
                                       static_cast<uintptr_t>(static_cast<intptr_t>(size)) - 1);
}

static inline uint32_t big_endian(uint32_t x) {
    return __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__ ? __builtin_bswap32(x) : x;
}
static inline uint32_t little_endian(uint32_t x) {
    return __BYTE_ORDER__ == __ORDER_LITTLE_ENDIAN__ ? x : __builtin_bswap32(x);
}

template <bool Msb>
static inline int32_t load_cache(scmn_bsr_ctx *ctx, int32_t nbytes) {
    const intptr_t left = bytes_left(ctx->cur, ctx->last);
    if (left >= 4 && nbytes >= 1) {
        const int32_t count = nbytes < 4 ? nbytes : 4, excess = 32 - 8 * count;
        uint32_t word;
        memcpy(&word, ctx->cur, 4);
        ctx->cache =
            Msb ? big_endian(word) >> excess << excess : little_endian(word) << excess >> excess;
        ctx->bits = 8 * count;
        ctx->cur += count;
        return 0;
    }
    const int32_t count = left < nbytes ? static_cast<int32_t>(left) : nbytes;
    ctx->cache = 0;
    if (left <= 0 || count <= 0) {
        ctx->bits = 0;
        return -1;
    }
    for (int32_t i = 0; i < count; i++)
        ctx->cache |= static_cast<uint32_t>(ctx->cur[i]) << (Msb ? 24 - 8 * i : 8 * i);
    ctx->bits = 8 * count;
    ctx->cur += count;
    return 0;
}

// The refill of the context, without a call where it is the library's own.
template <bool Msb>
static inline bool has_own_refill(const scmn_bsr_ctx *ctx) {
    return ctx->refill == (Msb ? scmn_bsr_flush : scmn_bsr_le_flush);
}
template <bool Msb>
static inline int32_t refill(scmn_bsr_ctx *ctx, int32_t nbytes) {
    return has_own_refill<Msb>(ctx) ? load_cache<Msb>(ctx, nbytes) : ctx->refill(ctx, nbytes);
}

// Are four bytes at hand for the library's own refill? What does not begin with this question saves
// registers for the refill's call, so it is a function of its own that is jumped to.
template <bool Msb>
static inline bool word_at_hand(const scmn_bsr_ctx *ctx) {
    return has_own_refill<Msb>(ctx) && bytes_left(ctx->cur, ctx->last) >= 4;
}

static inline void drop(scmn_bsr_ctx *ctx, int32_t n) {
    ctx->cache = shl(ctx->cache, n);
    ctx->bits = minus(ctx->bits, n);
}

static inline void le_drop(scmn_bsr_ctx *ctx, int32_t n) {
    ctx->cache = shr(ctx->cache, n);
    ctx->bits = n == 32 ? 0 : minus(ctx->bits, n);
}

void scmn_bsr_init(scmn_bsr_ctx *ctx, const uint8_t *buf, int32_t size, scmn_bsr_refill_fn refill) {
    ctx->cache = 0;
    ctx->bits = 0;
    ctx->cur = buf;
    ctx->last = last_byte(buf, size);
    ctx->start = buf;
    ctx->size = size;
    ctx->refill = refill ? refill : scmn_bsr_flush;
}

int32_t scmn_bsr_flush(scmn_bsr_ctx *ctx, int32_t nbytes) { return load_cache<true>(ctx, nbytes); }
int32_t scmn_bsr_le_flush(scmn_bsr_ctx *ctx, int32_t nbytes) {
    return load_cache<false>(ctx, nbytes);
}

// `high` are the bits of the cache, fewer than n; `loaded` what a refill returned.
static inline uint32_t read_on(scmn_bsr_ctx *ctx, uint32_t high, int32_t rest, int32_t loaded) {
    if (loaded != 0) return 0xFFFFFFFF;
    const uint32_t result = high | shr(ctx->cache, minus(32, rest));
    drop(ctx, rest);
    return result;
}
[[gnu::noinline]] static uint32_t read_at_end(scmn_bsr_ctx *ctx, uint32_t high, int32_t rest) {
    return read_on(ctx, high, rest, refill<true>(ctx, 4));
}

uint32_t scmn_bsr_read(scmn_bsr_ctx *ctx, int32_t n) {
    const uint32_t high =
        shr(ctx->cache, minus(32, n));  // where bits < n: the valid ones, then zeros
    if (ctx->bits >= n) {
        drop(ctx, n);
        return high;
    }
    const int32_t rest = minus(n, ctx->bits);
    if (word_at_hand<true>(ctx)) return read_on(ctx, high, rest, load_cache<true>(ctx, 4));
    return read_at_end(ctx, high, rest);
}

uint32_t scmn_bsr_read1(scmn_bsr_ctx *ctx) {
    if (ctx->bits <= 0) return scmn_bsr_read(ctx, 1);
    const uint32_t result = ctx->cache >> 31;
    ctx->cache <<= 1;
    ctx->bits -= 1;
    return result;
}

// Of n bits, more than the cache holds. Returns false at the end.
static inline bool skip_on(scmn_bsr_ctx *ctx, int32_t rest, int32_t loaded) {
    if (loaded == 0) drop(ctx, rest);
    return loaded == 0;
}
[[gnu::noinline]] static bool skip_at_end(scmn_bsr_ctx *ctx, int32_t rest) {
    return skip_on(ctx, rest, refill<true>(ctx, 4));
}
static inline bool skip(scmn_bsr_ctx *ctx, int32_t n) {
    if (ctx->bits >= n) {
        drop(ctx, n);
        return true;
    }
    const int32_t rest = minus(n, ctx->bits);
    if (word_at_hand<true>(ctx)) return skip_on(ctx, rest, load_cache<true>(ctx, 4));
    return skip_at_end(ctx, rest);
}

void scmn_bsr_skip(scmn_bsr_ctx *ctx, int32_t n) { skip(ctx, n); }

// The next n bits, from the cache and from the byte behind it.
static inline uint32_t look(const scmn_bsr_ctx *ctx, int32_t n) {
    uint32_t result = shr(ctx->cache, minus(32, n));
    const int32_t lack = minus(n, ctx->bits);
    // 1 to 7 inside a buffer, as the cache is topped up by whole bytes.
    if (lack > 0 && lack <= 8 && bytes_left(ctx->cur, ctx->last) > 0)
        result |= static_cast<uint32_t>(*ctx->cur) >> (8 - lack);
    return result;
}

[[gnu::noinline]] static uint32_t peek_at_end(scmn_bsr_ctx *ctx, int32_t n) {
    const int32_t have = ctx->bits;
    const int32_t room = minus(32, have) / 8;
    if (room >= 1) {
        const uint32_t old = ctx->cache;
        // After a failure nothing is added to what there was.
        refill<true>(ctx, room < 4 ? room : 4);
        ctx->cache = old | shr(ctx->cache, have);
        ctx->bits = plus(ctx->bits, have);
    }
    return look(ctx, n);
}

uint32_t scmn_bsr_peek(scmn_bsr_ctx *ctx, int32_t n) {
    const int32_t have = ctx->bits;
    if (have >= n) return shr(ctx->cache, minus(32, n));
    // The same where all goes well: as many whole bytes as there is room for, behind those bits.
    if (have < 0 || have > 24 || !word_at_hand<true>(ctx)) return peek_at_end(ctx, n);
    uint32_t word;
    memcpy(&word, ctx->cur, 4);
    const int32_t excess = (32 - have) % 8;
    ctx->cache = (ctx->cache | big_endian(word) >> have) >> excess << excess;
    ctx->bits = 32 - excess;
    ctx->cur += (32 - have) / 8;
    return look(ctx, n);
}

uint32_t scmn_bsr_skip_peek(scmn_bsr_ctx *ctx, int32_t nskip, int32_t npeek) {
    return skip(ctx, nskip) ? scmn_bsr_peek(ctx, npeek) : 0;
}

void scmn_bsr_skip_to_align8(scmn_bsr_ctx *ctx) { drop(ctx, ctx->bits & 7); }

uint32_t scmn_bsr_le_read(scmn_bsr_ctx *ctx, int32_t n) {
    const int32_t have = ctx->bits;
    if (have >= n) {
        const uint32_t result = low_bits(ctx->cache, n);
        le_drop(ctx, n);
        return result;
    }
    const uint32_t low = low_bits(ctx->cache, have);
    if (refill<false>(ctx, 4) != 0) return 0xFFFFFFFF;
    const int32_t rest = minus(n, have);
    const uint32_t result = low | shl(low_bits(ctx->cache, rest), have);
    le_drop(ctx, rest);
    return result;
}

void scmn_bsr_le_skip(scmn_bsr_ctx *ctx, int32_t n) { le_drop(ctx, n); }
void scmn_bsr_le_skip_to_align8(scmn_bsr_ctx *ctx) { le_drop(ctx, ctx->bits & 7); }

int32_t scmn_bsr_clz_in_code(uint32_t x) { return x ? __builtin_clz(x) : 32; }

void scmn_bsw_init(scmn_bsw_ctx *ctx, uint8_t *buf, int32_t size, scmn_bsw_byte_fn on_byte) {
    ctx->cur = buf;
    ctx->free_bits = 8;
    ctx->last = last_byte(buf, size);
    ctx->start = buf;
    ctx->size = size;
    ctx->on_byte = on_byte;
}

// A function of its own, which a write that does not end a byte saves no registers for. Returns 0.
[[gnu::noinline]] static int32_t end_byte(scmn_bsw_ctx *ctx) {
    if (ctx->on_byte) ctx->on_byte(ctx);
    ctx->free_bits = 8;
    ctx->cur++;
    return 0;
}

// Appends the low n bits of v to the current byte, which has room for them. Returns 0.
static inline int32_t put(scmn_bsw_ctx *ctx, uint32_t v, int32_t n) {
    const int32_t free_bits = ctx->free_bits - n;
    *ctx->cur = static_cast<uint8_t>(*ctx->cur << n | v);
    ctx->free_bits = free_bits;
    return free_bits == 0 ? end_byte(ctx) : 0;
}

// The low n bytes of x, 1 to 4, highest first; for 2 and more in two stores that may overlap.
static inline void store_bytes(uint8_t *p, uint32_t x, int32_t n) {
    if (n == 1) {
        *p = static_cast<uint8_t>(x);
        return;
    }
    const uint32_t memory = big_endian(x << (32 - 8 * n)), last = big_endian(x << 16);
    memcpy(p, &memory, 2);
    memcpy(p + n - 2, &last, 2);
}

int32_t scmn_bsw_write1(scmn_bsw_ctx *ctx, uint32_t bit) {
    if (bytes_left(ctx->cur, ctx->last) <= 0) return -1;
    return put(ctx, bit & 1, 1);
}

// Byte by byte, with a look at the end before each.
[[gnu::noinline]] static int32_t write_slowly(scmn_bsw_ctx *ctx, uint32_t value, int32_t n) {
    if (bytes_left(ctx->cur, ctx->last) <= 0) return -1;
    if (n <= 0) return 0;
    if (n > 32) n = 32;
    uint32_t v = value << (32 - n);
    while (n > 0) {
        if (bytes_left(ctx->cur, ctx->last) <= 0) return -1;
        const int32_t k = n < ctx->free_bits ? n : ctx->free_bits;
        put(ctx, shr(v, 32 - k), k);
        v = shl(v, k);
        n -= k;
    }
    return 0;
}

int32_t scmn_bsw_write(scmn_bsw_ctx *ctx, uint32_t value, int32_t n) {
    // Away from the end and without a callback: all bits at once, behind those of the current byte.
    uint8_t *cur = ctx->cur;
    if (n < 1 || n > 32 || ctx->on_byte || bytes_left(cur, ctx->last) < 5)
        return write_slowly(ctx, value, n);
    const int32_t total = 8 - ctx->free_bits + n;  // 1 to 39
    const uint64_t bits = static_cast<uint64_t>(*cur) << n | (value & 0xFFFFFFFFu >> (32 - n));
    if (total < 8) {
        *cur = static_cast<uint8_t>(bits);
        ctx->free_bits -= n;
        return 0;
    }
    const int32_t whole = total / 8, rest = total % 8;  // 1 to 4, 0 to 7
    store_bytes(cur, static_cast<uint32_t>(bits >> rest), whole);
    cur += whole;
    // The rest pushes up what its byte held before.
    *cur = static_cast<uint8_t>(*cur << rest | (bits & ((1u << rest) - 1)));
    ctx->cur = cur;
    ctx->free_bits = 8 - rest;
    return 0;
}
