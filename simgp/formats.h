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

// Where a code stands in that list. Codes with a name are 100 n + 0 ... 11, below 600.
class format_places {
  public:
    static constexpr int count = int(sizeof coded_formats / sizeof *coded_formats);

    consteval format_places() : place_() {
        for (int8_t &p : place_) p = -1;
        for (int8_t i = 0; i < count; i++) place_[slot(coded_formats[i].code)] = i;
    }
    // -1: it has no name.
    constexpr int of(int32_t code) const {
        if (code < 0 || code >= 100 * families || code % 100 >= members) return -1;
        return place_[slot(code)];
    }

  private:
    static constexpr int families = 6, members = 12;
    static constexpr int slot(int32_t code) { return code / 100 * members + code % 100; }
    int8_t place_[families * members];
};
inline constexpr format_places places_of_formats;

constexpr const format *find_format(int32_t code) {
    const int place = places_of_formats.of(code);
    return place < 0 ? nullptr : coded_formats[place].is;
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
