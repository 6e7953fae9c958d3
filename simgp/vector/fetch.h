// Hints to the caches.
#ifndef SIMGP_VECTOR_FETCH_H
#define SIMGP_VECTOR_FETCH_H

#include <stddef.h>
#include <stdint.h>

namespace simgp::SIMD_TARGET {

// The line of the cache at p + ahead will soon be read, or written. A hint may lead behind a plane,
// but no pointer may: hence the integer.
[[gnu::always_inline]] inline const void *hint(const uint8_t *p, ptrdiff_t ahead) {
    return reinterpret_cast<const void *>(reinterpret_cast<uintptr_t>(p) + uintptr_t(ahead));
}
[[gnu::always_inline]] inline void fetch(const uint8_t *p, ptrdiff_t ahead) {
    __builtin_prefetch(hint(p, ahead));
}
[[gnu::always_inline]] inline void fetch_for_write(const uint8_t *p, ptrdiff_t ahead) {
    __builtin_prefetch(hint(p, ahead), 1);
}

}  // namespace simgp::SIMD_TARGET

#endif
