// Tables of conversions by pairs of formats.
#ifndef SIMGP_DISPATCH_H
#define SIMGP_DISPATCH_H

#include <stddef.h>

#include "simgp/formats.h"

namespace simgp {

struct conversion {
    int16_t from, to;
    simgp_csc_fn *kernel;
};
// An entry of such a table, from a line of a list in rows/conversions.h.
#define SIMGP_CONVERSION(name, from, to, ...) {SIMGP_FMT_##from, SIMGP_FMT_##to, name},

// Which conversion of a table leads from one format to another, by their places: its number from 1
// on, or 0.
struct conversion_numbers {
    uint8_t of[format_places::count][format_places::count] = {};

    template <size_t N>
    explicit consteval conversion_numbers(const conversion (&table)[N]) {
        static_assert(N < 256);
        for (size_t i = 0; i < N; i++)
            of[places_of_formats.of(table[i].from)][places_of_formats.of(table[i].to)] =
                uint8_t(i + 1);
    }
};

// Runs the conversion between the formats of two pictures, if the table has it.
template <const auto &Table>
int32_t convert_by(const simgp_img &src, const simgp_img &dst) {
    static constexpr conversion_numbers numbers(Table);
    const int from = places_of_formats.of(src.format), to = places_of_formats.of(dst.format);
    const int number = from < 0 || to < 0 ? 0 : numbers.of[from][to];
    if (!number) return SIMGP_ERR_UNSUPPORTED;
    Table[number - 1].kernel(src.plane, src.width, src.height, src.stride, dst.stride, dst.plane);
    return SIMGP_OK;
}

}  // namespace simgp

#endif
