#include "simgp/column.h"

namespace simgp {

namespace {

// By value, since bytes that are stored might be those of the arguments.
template <int Bytes>
void copy_pieces(const_lines from, lines to, ptrdiff_t bytes, ptrdiff_t count) {
    const ptrdiff_t last = bytes - Bytes;
    for (ptrdiff_t y = 0; y < count; y++) {
        uint8_t *const q = to.line(y);
        const uint8_t *const p = from.line(y);
        for (ptrdiff_t x = 0; x < last; x += Bytes) memcpy(q + x, p + x, Bytes);
        memcpy(q + last, p + last, Bytes);
    }
}

}  // namespace

void copy_column(const const_lines &from, const lines &to, ptrdiff_t bytes, ptrdiff_t count) {
    if (bytes >= 16) return copy_pieces<16>(from, to, bytes, count);
    if (bytes >= 8) return copy_pieces<8>(from, to, bytes, count);
    if (bytes >= 4) return copy_pieces<4>(from, to, bytes, count);
    if (bytes >= 2) return copy_pieces<2>(from, to, bytes, count);
    copy_pieces<1>(from, to, bytes, count);
}

void gather_column(const planes_to_rgb &p, const column &c, ptrdiff_t first, ptrdiff_t count,
                   pixel_column &to) {
    const ptrdiff_t pitch = pitch_of(c), pairs = pitch / 2;
    const int rows = p.two_rows ? 2 : 1;
    const bool packed = is_packed(p.layout);
    const ptrdiff_t size = packed ? 2 : 1;
    for (int r = 0; r < rows; r++)
        copy_column({p.y.line(p.lead + rows * first + r) + size * c.x, rows * p.y.stride},
                    {to.y[r], size * pitch}, size * c.width, count);
    const auto chroma = [&](const const_lines &from, uint8_t *at, ptrdiff_t x, ptrdiff_t step,
                            ptrdiff_t bytes) {
        copy_column(from.from(x, p.lead + first), {at, step}, bytes, count);
    };
    if (packed) {
        if (!(c.width & 1)) return;
        // The V of a half group is that of the group before.
        const ptrdiff_t v = 2 * (c.width - 1) + (p.layout == yuv_layout::yuyv ? 3 : 2);
        if (c.end() > 1)
            return copy_column(p.y.from(2 * c.x + v - 4, first), {to.y[0] + v, 2 * pitch}, 1,
                               count);
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
        copy_column(
            const_lines{from.rgb[r], p.pixel_bytes * pitch_of(c)},
            {p.dst.line(p.lead + rows * first + r) + p.pixel_bytes * c.x, rows * p.dst.stride},
            p.pixel_bytes * c.width, count);
}

}  // namespace simgp
