// Packers: how pixels of three channels are stored.
//
// A packer names the order of pixels that its stores want (see simd/lanes.h) and stores `bytes`
// pixels, the even and the odd ones apart.
#ifndef SIMGP_VECTOR_PACKER_H
#define SIMGP_VECTOR_PACKER_H

#include "simgp/rows.h"
#include "simgp/vector/matrix.h"

namespace simgp::SIMD_TARGET {

enum class pixel_order { natural, by8, by4 };

// Brings samples from natural order into the order of a packer.
template <pixel_order Order>
inline u8v arrange(u8v v) {
    return Order == pixel_order::by8   ? natural_to_by8(v)
           : Order == pixel_order::by4 ? natural_to_by4(v)
                                       : v;
}

template <rgb_packing>
struct packer;

template <bool BGR>
struct packer_565 {
    static constexpr pixel_order order = pixel_order::by8;
    static constexpr int size = 2;
    static u16v pack(const rgb_s16 &p) { return pack565(BGR ? p.b : p.r, p.g, BGR ? p.r : p.b); }
    static void store(uint8_t *dst, const rgb_s16 &even, const rgb_s16 &odd) {
        store_zip16(dst, pack(even), pack(odd));
    }
};
template <>
struct packer<rgb_packing::rgb565> : packer_565<false> {};
template <>
struct packer<rgb_packing::bgr565> : packer_565<true> {};

// The channels as bytes, clamped, pixel after pixel.
struct rgb_u8 {
    u8v r, g, b;
};
inline rgb_u8 narrow(const rgb_s16 &even, const rgb_s16 &odd) {
    return {narrow_join<7>(even.r, odd.r), narrow_join<7>(even.g, odd.g),
            narrow_join<6>(even.b6, odd.b6)};
}

template <bool BGR>
struct packer_888 {
    static constexpr pixel_order order = pixel_order::natural;
    static constexpr int size = 3;
    static void store(uint8_t *dst, const rgb_s16 &even, const rgb_s16 &odd) {
        if constexpr (BGR)
            store_narrow_zip3<6, 7, 7>(dst, even.b6, odd.b6, even.g, odd.g, even.r, odd.r);
        else
            store_narrow_zip3<7, 7, 6>(dst, even.r, odd.r, even.g, odd.g, even.b6, odd.b6);
    }
};
template <>
struct packer<rgb_packing::rgb888> : packer_888<false> {};
template <>
struct packer<rgb_packing::bgr888> : packer_888<true> {};

template <bool BGR, bool ALPHA_FIRST>
struct packer_8888 {
    static constexpr pixel_order order = pixel_order::by4;
    static constexpr int size = 4;
    static void store(uint8_t *dst, const rgb_s16 &even, const rgb_s16 &odd) {
        const rgb_u8 p = narrow(even, odd);
        const u8v first = BGR ? p.b : p.r, last = BGR ? p.r : p.b, alpha = set_u8(255);
        if constexpr (ALPHA_FIRST)
            store_zip4(dst, alpha, first, p.g, last);
        else
            store_zip4(dst, first, p.g, last, alpha);
    }
};
template <>
struct packer<rgb_packing::rgba8888> : packer_8888<false, false> {};
template <>
struct packer<rgb_packing::bgra8888> : packer_8888<true, false> {};
template <>
struct packer<rgb_packing::argb8888> : packer_8888<false, true> {};

}  // namespace simgp::SIMD_TARGET

#endif
