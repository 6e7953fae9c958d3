// Rows between any two formats.
#ifndef SIMGP_VECTOR_ANY_H
#define SIMGP_VECTOR_ANY_H

#include "rows/any.h"

namespace simgp::SIMD_TARGET {

void fill_any(any_rows &) {}

}  // namespace simgp::SIMD_TARGET

#endif
