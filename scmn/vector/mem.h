// Fills.
#ifndef SCMN_VECTOR_MEM_H
#define SCMN_VECTOR_MEM_H

#include <string.h>

#include "simgp/rows.h"

#if defined(__x86_64__) || defined(__i386__)
#include <cpuid.h>
#endif

namespace simgp::SIMD_TARGET {

// From this size on, stores go past the caches: nobody reads that much back from a cache. Measured
// on a processor with 48 MiB of last-level cache by `./run bench mem`: from 32 MiB on, filling and
// then reading everything is 1.4 times as fast as with stores that keep the lines, at 4 MiB it is
// half as fast.
inline constexpr size_t stream_from = size_t(32) << 20;

// From this size on, the string store of x86 processors that call it fast beats vector stores: it
// takes whole lines without reading them first.
inline constexpr size_t string_from = 2048;

// `pattern` over `size` bytes at dst, a multiple of `bytes`.
template <bool String>
void fill_aligned(uint8_t *dst, uint32_t pattern, size_t size) {
#if defined(__x86_64__) || defined(__i386__)
    if (String && size >= string_from && size < stream_from) {
        size_t words = size / 4;
        __asm__ volatile("rep stosl" : "+D"(dst), "+c"(words) : "a"(pattern) : "memory");
        return;
    }
#endif
    const u8v v = set_u32(pattern);
    size_t x = 0;
    if (size >= stream_from) {
        for (; x < size; x += bytes) store_stream(dst + x, v);
        stream_end();
        return;
    }
    for (; x + 4 * bytes <= size; x += 4 * bytes) {
        store(dst + x, v);
        store(dst + x + bytes, v);
        store(dst + x + 2 * bytes, v);
        store(dst + x + 3 * bytes, v);
    }
    for (; x < size; x += bytes) store(dst + x, v);
}

// The first and the last vector lie where the block begins and ends, all between on aligned
// addresses, where the pattern begins with another byte.
template <bool String>
void fill_pattern(uint8_t *dst, uint32_t value, size_t size) {
    if (size < size_t(bytes)) {  // 32 bytes on a machine with wider vectors
        for (size_t x = 0; x < size; x += 4) memcpy(dst + x, &value, 4);
        return;
    }
    const u8v v = set_u32(value);
    store(dst, v);
    store(dst + size - bytes, v);
    const size_t head = -reinterpret_cast<uintptr_t>(dst) & (bytes - 1);
    if (size <= head + bytes) return;
    const unsigned turn = head % 4 * 8;
    const uint32_t turned = turn ? value >> turn | value << (32 - turn) : value;
    fill_aligned<String>(dst + head, turned, (size - head) & -size_t(bytes));
}

void fill_mem(rows &t) {
    t.fill = fill_pattern<false>;
#if defined(__x86_64__) || defined(__i386__)
    unsigned a, b, c, d;
    const bool fast_strings = __get_cpuid_count(7, 0, &a, &b, &c, &d) && (b & 1u << 9);  // ERMS
    if (fast_strings) t.fill = fill_pattern<true>;
#endif
}

}  // namespace simgp::SIMD_TARGET

#endif
