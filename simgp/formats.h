// The formats by their codes.
#ifndef SIMGP_FORMATS_H
#define SIMGP_FORMATS_H

#include "rows/formats.h"
#include "simgp/describe.h"
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

// What programs compute with (describe.h) is what the table says.
consteval bool described_as_listed() {
    for (const coded_format &f : coded_formats) {
        if (simgp_format_planes(f.code) != f.is->planes) return false;
        for (int k = 0; k < 3; ++k)
            if (simgp_plane_sample(f.code, k) != f.is->bytes[k] ||
                simgp_plane_x_shift(f.code, k) != f.is->x_shift[k] ||
                simgp_plane_y_shift(f.code, k) != f.is->y_shift[k])
                return false;
    }
    return true;
}
static_assert(described_as_listed());

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
