// Fills.
#ifndef SCMN_VECTOR_MEM_H
#define SCMN_VECTOR_MEM_H

#include <string.h>

#include "rows/mem.h"

namespace simgp::SIMD_TARGET {

// From this size on, stores go past the caches: nobody finds that much in a cache afterwards. It is
// faster for the reader too: `./run bench --filter 'then read'` fills and reads 256 MiB at 1.2 times
// the speed of memset. At 4 MiB it would be slower, so smaller fills stay in the caches.
inline constexpr size_t stream_from = size_t(32) << 20;

// From this size on, the string store of x86 processors that call it fast beats vector stores: it
// takes whole lines without reading them first. Below, within the second-level cache, stores of 32
// bytes and more are faster (`./run bench --filter mset` measures both: sse41 changes at 2 KiB).
inline constexpr size_t string_from = bytes >= 32 ? size_t(1) << 20 : 2048;

// The pattern from dst, the start of a cache line, over `size` bytes but for less than a vector at
// their end. Returns the number of bytes written.
template <bool String>
static size_t fill_lines(uint8_t *dst, uint32_t pattern, size_t size) {
    const u8v v = set_u32(pattern);
    size_t x = 0;
    if (size >= stream_from) {
        for (; x + bytes <= size; x += bytes) store_stream(dst + x, v);
        stream_end();
        return x;
    }
#if defined(__x86_64__) || defined(__i386__)
    if (String && size >= string_from) {
        size_t words = size / 4;
        __asm__ volatile("rep stosl" : "+D"(dst), "+c"(words) : "a"(pattern) : "memory");
        return size & -size_t(4);
    }
#endif
    for (; x + 4 * bytes <= size; x += 4 * bytes) {
        store(dst + x, v);
        store(dst + x + bytes, v);
        store(dst + x + 2 * bytes, v);
        store(dst + x + 3 * bytes, v);
    }
    for (; x + bytes <= size; x += bytes) store(dst + x, v);
    return x;
}

// Unaligned vectors reach from the start to the first cache line and over the end; between them the
// pattern begins with another byte.
template <bool String>
static void fill_pattern(uint8_t *dst, uint32_t value, size_t size) {
    if (size < size_t(bytes)) {  // 32 bytes on a machine with wider vectors
        for (size_t x = 0; x < size; x += 4) memcpy(dst + x, &value, 4);
        return;
    }
    const u8v v = set_u32(value);
    const size_t head = -reinterpret_cast<uintptr_t>(dst) & 63;
    size_t x = 0;
    if (size >= 256) {
        for (; x < head; x += bytes) store(dst + x, v);
        const unsigned turn = head % 4 * 8;
        const uint32_t turned = turn ? value >> turn | value << (32 - turn) : value;
        x = head + fill_lines<String>(dst + head, turned, size - head);
    } else {
        for (; x + bytes <= size; x += bytes) store(dst + x, v);
    }
    if (x < size) store(dst + size - bytes, v);
}

void fill_mem(mem_rows &t) {
    t.fill = fill_pattern<false>;
#if defined(__x86_64__) || defined(__i386__)
    t.fill_with_strings = fill_pattern<true>;
#endif
}

}  // namespace simgp::SIMD_TARGET

#endif
