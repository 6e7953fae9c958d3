// The translation unit of one area for one target. The build compiles it once per pair, with the
// flags of the target and
//   SIMD_TARGET   the target's name and namespace        avx2
//   SIMD_LAYER    the vector layer's header              "simd/avx2.h"
//   SIMD_AREA     the area's vector rows                 "simgp/vector/yuv2rgb.h"
// Everything that is compiled here must lie in the target's namespace: an inline function shared
// with baseline code could be emitted with the target's instructions and be the one that the linker
// keeps.
// clang-format off
#include SIMD_LAYER
#include SIMD_AREA
// clang-format on
