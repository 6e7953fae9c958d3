#include "scmn/mem.h"

#include <stdlib.h>
#include <string.h>

#include "rows/choose.h"
#include "scmn/bits.h"
#include "simgp/lines.h"

namespace simgp::scalar {

void fill_pattern(uint8_t *dst, uint32_t value, size_t size) {
    const uint8_t bytes[4] = {uint8_t(value), uint8_t(value >> 8), uint8_t(value >> 16),
                              uint8_t(value >> 24)};
    for (size_t i = 0; i < size; i += 4) memcpy(dst + i, bytes, 4);
}

void fill_mem(mem_rows &t) { t = {fill_pattern, nullptr}; }

}  // namespace simgp::scalar

void *scmn_malloc_align32(uint32_t size) {
    constexpr uint32_t more = 32 + sizeof(void *);
    if (size > UINT32_MAX - more) return NULL;
    uint8_t *raw = static_cast<uint8_t *>(malloc(size_t(size) + more));
    if (!raw) return NULL;
    // The first multiple of 32 that leaves room for the pointer below it.
    const uintptr_t first = reinterpret_cast<uintptr_t>(raw) + more - 1;
    uint8_t *p = raw + (more - 1 - (first & 31));
    memcpy(p - sizeof raw, &raw, sizeof raw);
    return p;
}

void scmn_mfree_align32(void *p) {
    if (!p) return;
    void *raw;
    memcpy(&raw, static_cast<uint8_t *>(p) - sizeof raw, sizeof raw);
    free(raw);
}

void *scmn_malloc_fast_align32(uint32_t size) { return scmn_malloc_align32(size); }
void scmn_mfree_fast_align32(void *p) { scmn_mfree_align32(p); }

void scmn_blk_mcpy(void *dst, const void *src, int32_t dst_stride, int32_t src_stride,
                   int32_t width, int32_t height) {
    simgp::copy_lines(simgp::lines_of(src, src_stride), simgp::lines_of(dst, dst_stride), width,
                      height);
}

// `whole` bytes of the pattern, and behind them `tail` bytes of its low byte; of 0 or less nothing. The
// tail is written first: the call of the row is then the last thing, a jump.
static inline void fill(void *dst, uint32_t value, ptrdiff_t whole, ptrdiff_t tail) {
    uint8_t *p = static_cast<uint8_t *>(dst);
    if (tail > 0) memset(p + whole, uint8_t(value), size_t(tail));
    if (whole > 0) simgp::live_rows().mem.fill(p, value, size_t(whole));
}

static ptrdiff_t whole_blocks(ptrdiff_t count, ptrdiff_t block) {
    return count > 0 ? count / block * block : 0;
}

void scmn_mset_x128(void *dst, uint32_t value, int32_t count) {
    fill(dst, value, count > 0 ? whole_blocks(ptrdiff_t(count) + 127, 128) : 128, 0);
}
void scmn_mset_x64(void *dst, uint32_t value, int32_t count) {
    fill(dst, value, whole_blocks(count, 128), 0);
}
void scmn_mset_x64a(void *dst, uint32_t value, int32_t count) {
    const ptrdiff_t whole = whole_blocks(count, 64);
    fill(dst, value, whole, count - whole);
}
void scmn_mset_x32(void *dst, uint32_t value, int32_t count) {
    fill(dst, value, whole_blocks(count, 32), 0);
}
void scmn_mset_x32ax4(void *dst, uint32_t value, int32_t count) {
    const ptrdiff_t whole = whole_blocks(count, 32);
    fill(dst, value, whole, count - whole);
}
void scmn_mclr_x64(void *dst, int32_t count) { fill(dst, 0, whole_blocks(count, 64) * 4, 0); }

int32_t scmn_floor_log2(uint32_t x) { return 31 - scmn_bsr_clz_in_code(x); }

int32_t scmn_ceil_log2(uint32_t x) {
    // Powers of two and 0 have no bit below the highest.
    return scmn_floor_log2(x) + ((x & (x - 1)) != 0);
}
