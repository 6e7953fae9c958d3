#include "simgp/column.h"

namespace simgp {
namespace {

// By value, since bytes that are stored might be those of the arguments.
template <int Bytes>
void copy_bytes(const_lines from, lines to, ptrdiff_t count) {
    for (ptrdiff_t y = 0, in = 0, out = 0; y < count; y++, in += from.stride, out += to.stride)
        memcpy(to.first + out, from.first + in, Bytes);
}

}  // namespace

void copy_column(const const_lines &from, const lines &to, int bytes, ptrdiff_t count) {
    if (bytes == 1) return copy_bytes<1>(from, to, count);
    if (bytes == 2) return copy_bytes<2>(from, to, count);
    if (bytes == 3) return copy_bytes<3>(from, to, count);
    copy_bytes<4>(from, to, count);
}

void gather_column(const planes_to_rgb &p, ptrdiff_t first, ptrdiff_t count, pixel_column &to) {
    const ptrdiff_t whole = p.width - 1;
    const auto gather = [&](const const_lines &from, ptrdiff_t x, ptrdiff_t y, int rows, int bytes,
                            uint8_t *at, int step) {
        copy_column({from.line(y) + x, rows * from.stride}, {at, step}, bytes, count);
    };
    const int rows = p.two_rows ? 2 : 1;
    const bool packed = p.layout == yuv_layout::uyvy || p.layout == yuv_layout::yuyv;
    const int luma_bytes = packed ? 2 : 1;
    for (int r = 0; r < rows; r++)
        gather(p.y, luma_bytes * whole, p.lead + rows * first + r, rows, luma_bytes, to.y[r],
               2 * luma_bytes);
    // Bytes of chroma for two pixels, of which the first takes so many.
    const auto chroma = [&](const const_lines &from, uint8_t *at, int bytes, int step) {
        gather(from, step * (whole / 2), p.lead + first, 1, bytes, at, step);
    };
    if (packed) {
        // The V of a half group is that of the group before.
        const int v = p.layout == yuv_layout::yuyv ? 3 : 2;
        gather(p.y, 2 * whole - 4 + v, first, 1, 1, to.y[0] + v, 4);
    } else if (p.layout == yuv_layout::half || p.layout == yuv_layout::full) {
        const int step = p.layout == yuv_layout::full ? 2 : 1;
        chroma(p.u, to.u, 1, step);
        chroma(p.v, to.v, 1, step);
    } else if (p.layout != yuv_layout::grey) {
        chroma(p.u, to.u, 2, 2);
    }
}

void scatter_column(const pixel_column &c, const planes_to_rgb &p, ptrdiff_t first,
                    ptrdiff_t count) {
    const int rows = p.two_rows ? 2 : 1;
    for (int r = 0; r < rows; r++)
        copy_column(const_lines{c.rgb[r], 2 * p.pixel_bytes},
                    {p.dst.line(p.lead + rows * first + r) + p.pixel_bytes * (p.width - 1),
                     rows * p.dst.stride},
                    p.pixel_bytes, count);
}

}  // namespace simgp
