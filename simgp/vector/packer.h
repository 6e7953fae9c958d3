// Packers: how pixels of three channels are stored.
//
// A packer names the order of pixels that its stores want (see simd/lanes.h) and stores `bytes`
// pixels, the even and the odd ones apart: all at dst, or half of them each at `first` and `second`.
#ifndef SIMGP_VECTOR_PACKER_H
#define SIMGP_VECTOR_PACKER_H

#include "rows/formats.h"
#include "simgp/vector/matrix.h"

namespace simgp::SIMD_TARGET {

enum class pixel_order { natural, by8, by4 };

// Brings samples from natural order into the order of a packer.
template <pixel_order Order, class V>
inline V arrange(V v) {
    return Order == pixel_order::by8   ? natural_to_by8(v)
           : Order == pixel_order::by4 ? natural_to_by4(v)
                                       : v;
}

template <int Size, pixel_bytes At>
struct packer_of_size;

template <rgb_packing Packing>
struct packer : packer_of_size<pixels_of[size_t(Packing)].size, pixels_of[size_t(Packing)]> {};

template <pixel_bytes At>
struct packer_of_size<2, At> {
    static constexpr pixel_order order = pixel_order::by8;
    static constexpr int size = 2;
    static u16v pack(const rgb_s16 &p) {
        return At.r > At.b ? pack565(p.r, p.g, p.b) : pack565(p.b, p.g, p.r);
    }
    static void store(uint8_t *dst, const rgb_s16 &even, const rgb_s16 &odd) {
        store_zip16(dst, pack(even), pack(odd));
    }
    static void store(uint8_t *first, uint8_t *second, const rgb_s16 &even, const rgb_s16 &odd) {
        store_zip16(first, second, pack(even), pack(odd));
    }
};

template <pixel_bytes At>
struct packer_of_size<3, At> {
    static_assert(At.g == 1);
    static constexpr pixel_order order = pixel_order::natural;
    static constexpr int size = 3;
    static void store(uint8_t *dst, const rgb_s16 &even, const rgb_s16 &odd) {
        if constexpr (At.b == 0)
            store_narrow_zip3<6, 7, 7>(dst, even.b6, odd.b6, even.g, odd.g, even.r, odd.r);
        else
            store_narrow_zip3<7, 7, 6>(dst, even.r, odd.r, even.g, odd.g, even.b6, odd.b6);
    }
    static void store(uint8_t *first, uint8_t *second, const rgb_s16 &even, const rgb_s16 &odd) {
        if constexpr (At.b == 0)
            store_narrow_zip3<6, 7, 7>(first, second, even.b6, odd.b6, even.g, odd.g, even.r,
                                       odd.r);
        else
            store_narrow_zip3<7, 7, 6>(first, second, even.r, odd.r, even.g, odd.g, even.b6,
                                       odd.b6);
    }
};

template <pixel_bytes At>
struct packer_of_size<4, At> {
    static constexpr pixel_order order = pixel_order::by4;
    static constexpr int size = 4;
    // Calls put(bytes of the pixels ...).
    template <class Put>
    static void bytes_of(const rgb_s16 &even, const rgb_s16 &odd, Put put) {
        const u8v r = narrow_join<7>(even.r, odd.r), g = narrow_join<7>(even.g, odd.g),
                  b = narrow_join<6>(even.b6, odd.b6), a = set_u8(255);
        const auto byte = [&](int k) { return k == At.r ? r : k == At.g ? g : k == At.b ? b : a; };
        put(byte(0), byte(1), byte(2), byte(3));
    }
    static void store(uint8_t *dst, const rgb_s16 &even, const rgb_s16 &odd) {
        bytes_of(even, odd, [=](u8v a, u8v b, u8v c, u8v d) { store_zip4(dst, a, b, c, d); });
    }
    static void store(uint8_t *first, uint8_t *second, const rgb_s16 &even, const rgb_s16 &odd) {
        bytes_of(even, odd,
                 [=](u8v a, u8v b, u8v c, u8v d) { store_zip4(first, second, a, b, c, d); });
    }
};

}  // namespace simgp::SIMD_TARGET

#endif
