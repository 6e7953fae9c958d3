// How the operations of a vector layer reach their test.
#ifndef TESTS_SIMD_LISTS_H
#define TESTS_SIMD_LISTS_H

#include <stdint.h>

namespace simgp {

struct simd_lists {
    static constexpr int room = 192;
    int bytes;  // of a vector
    int count;
    struct {
        const char *name;
        int out_bytes;
        void (*run)(const uint8_t *in, uint8_t *out);
        void (*meaning)(const uint8_t *in, uint8_t *out);
    } all[room];
};

}  // namespace simgp

#endif
