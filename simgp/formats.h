// The formats by their codes.
#ifndef SIMGP_FORMATS_H
#define SIMGP_FORMATS_H

#include "rows/formats.h"
#include "simgp/img.h"

namespace simgp {

struct coded_format {
    int32_t code;
    const format *is;
};

// Every code that has a name, in rising order.
inline constexpr coded_format coded_formats[] = {
#define ENTRY(token, ...) {SIMGP_FMT_##token, &formats::token},
    SIMGP_FORMATS(ENTRY)
#undef ENTRY
};

constexpr const format *find_format(int32_t code) {
    for (const coded_format &f : coded_formats)
        if (f.code == code) return f.is;
    return nullptr;
}

// The planes that operations see which keep the format, copy and rotation: planar and semi-planar
// YUV, where codes without a name count as three planes of full size, and 16-bit RGB, where the whole
// family of 200 to 299 does. Null: the format has no rule.
constexpr const format *planes_kept(int32_t code) {
    if (code >= 200 && code <= 299) return &formats::RGB565;
    if (code < 0 || code > 99) return nullptr;
    const format *const known = find_format(code);
    if (!known) return &formats::YUV444;
    return known->kind == format_kind::planar ? known : nullptr;
}

}  // namespace simgp

#endif
