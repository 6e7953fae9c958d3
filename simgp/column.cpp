#include "simgp/column.h"

namespace simgp {

void gather_column(const planes_to_rgb &p, const column &c, ptrdiff_t first, ptrdiff_t count,
                   pixel_column &to) {
    const ptrdiff_t pitch = pitch_of(c), pairs = pitch / 2;
    const int rows = p.two_rows ? 2 : 1;
    const bool packed = is_packed(p.layout);
    const ptrdiff_t size = packed ? 2 : 1;
    for (int r = 0; r < rows; r++)
        copy_lines(p.y.from(size * c.x, p.lead + rows * first + r, rows), {to.y[r], size * pitch},
                   size * c.width, count);
    const auto chroma = [&](const const_lines &from, uint8_t *at, ptrdiff_t x, ptrdiff_t step,
                            ptrdiff_t bytes) {
        copy_lines(from.from(x, p.lead + first), {at, step}, bytes, count);
    };
    if (packed) {
        if (!(c.width & 1)) return;
        // The V of a half group is that of the group before.
        const ptrdiff_t v = 2 * (c.width - 1) + (p.layout == yuv_layout::yuyv ? 3 : 2);
        if (c.end() > 1)
            return copy_lines(p.y.from(2 * c.x + v - 4, first), {to.y[0] + v, 2 * pitch}, 1, count);
        for (ptrdiff_t k = 0; k < count; k++) to.y[0][2 * pitch * k + v] = 128;
    } else if (p.layout == yuv_layout::half) {
        chroma(p.u, to.u, c.x / 2, pairs, pairs);
        chroma(p.v, to.v, c.x / 2, pairs, pairs);
    } else if (p.layout == yuv_layout::full) {
        chroma(p.u, to.u, c.x, pitch, c.width);
        chroma(p.v, to.v, c.x, pitch, c.width);
    } else if (p.layout != yuv_layout::grey) {
        chroma(p.u, to.u, c.x, pitch, pitch);
    }
}

void scatter_column(const pixel_column &from, const planes_to_rgb &p, const column &c,
                    ptrdiff_t first, ptrdiff_t count) {
    const int rows = p.two_rows ? 2 : 1;
    for (int r = 0; r < rows; r++)
        copy_lines(const_lines{from.rgb[r], p.pixel_bytes * pitch_of(c)},
                   p.dst.from(p.pixel_bytes * c.x, p.lead + rows * first + r, rows),
                   p.pixel_bytes * c.width, count);
}

}  // namespace simgp
