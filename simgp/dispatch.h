// Tables of conversions by pairs of formats.
#ifndef SIMGP_DISPATCH_H
#define SIMGP_DISPATCH_H

#include <stddef.h>

#include "simgp/img.h"

namespace simgp {

struct conversion {
    int16_t from, to;
    simgp_csc_fn *kernel;
};
// An entry of such a table, from a line of a list in rows/conversions.h.
#define SIMGP_CONVERSION(name, from, to, ...) {SIMGP_FMT_##from, SIMGP_FMT_##to, name},

// Runs the conversion between the formats of two pictures, if the table has it.
template <size_t N>
int32_t convert_by(const conversion (&table)[N], const simgp_img &src, const simgp_img &dst) {
    for (const conversion &c : table) {
        if (c.from != src.format || c.to != dst.format) continue;
        c.kernel(src.plane, src.width, src.height, src.stride, dst.stride, dst.plane);
        return SIMGP_OK;
    }
    return SIMGP_ERR_UNSUPPORTED;
}

}  // namespace simgp

#endif
