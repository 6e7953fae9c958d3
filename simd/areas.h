// The areas that have rows: each is a family of inner loops with scalar rows (<family>/<area>.cpp)
// and vector rows (<family>/vector/<area>.h). The build reads this list too.
#ifndef SIMD_AREAS_H
#define SIMD_AREAS_H

// clang-format off
#define SIMGP_AREAS(X) \
    X(simgp, rgb2yuv) \
    X(simgp, yuv2rgb) \
    X(simgp, dither)  \
    X(simgp, layout)  \
    X(simgp, tile)    \
    X(scmn, mem)      \
    X(scmn, keyframe)
// clang-format on

#endif
