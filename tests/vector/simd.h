// The operations of one target's vector layer and their meaning over lanes of the same width, as
// two lists for simd_test.cpp. Compiled per target, like vector rows.
#ifndef TESTS_VECTOR_SIMD_H
#define TESTS_VECTOR_SIMD_H

#include <string.h>

#include "tests/simd_lists.h"

// Everything lies in the target's namespace, the lanes too.
#define SIMD_LANES_BYTES simgp::SIMD_TARGET::bytes
#define SIMD_LANES_NAMESPACE SIMD_TARGET::meaning
#include "simd/lanes.h"

namespace simgp::SIMD_TARGET {

namespace layer {
#include "tests/vector/operations.h"
}
namespace meaning {
#include "tests/vector/operations.h"
}

simd_lists list_operations() {
    simd_lists lists{bytes, 0, {}};
    static_assert(sizeof layer::operations / sizeof layer::operations[0] <= simd_lists::room);
    for (const auto &op : layer::operations) {
        const auto &means = meaning::operations[lists.count];
        lists.all[lists.count++] = {op.name, op.out_bytes, op.run, means.run};
    }
    return lists;
}

}  // namespace simgp::SIMD_TARGET

#endif
