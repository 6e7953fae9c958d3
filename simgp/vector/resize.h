// Bilinear resize.
#ifndef SIMGP_VECTOR_RESIZE_H
#define SIMGP_VECTOR_RESIZE_H

#include "rows/resize.h"

namespace simgp::SIMD_TARGET {

// The scalar rows stay in place.
void fill_resize(resize_rows &) {}

}  // namespace simgp::SIMD_TARGET

#endif
