// The lines of a plane.
#ifndef SIMGP_LINES_H
#define SIMGP_LINES_H

#include <stddef.h>
#include <stdint.h>
#include <string.h>

namespace simgp {

template <class Byte>
struct plane_lines {
    Byte *first;
    ptrdiff_t stride;

    Byte *line(ptrdiff_t y) const { return first + y * stride; }
    Byte *fetch(ptrdiff_t y) const { return line(y); }  // as a source of lines, see walk.h
    // The lines from byte x of line y on, or every so many of them.
    plane_lines from(ptrdiff_t x, ptrdiff_t y, ptrdiff_t apart = 1) const {
        return {line(y) + x, apart * stride};
    }
    // `height` lines from the last to the first.
    plane_lines upside_down(ptrdiff_t height) const {
        return {height > 0 ? line(height - 1) : first, -stride};
    }

    operator plane_lines<const Byte>() const { return {first, stride}; }
};
using lines = plane_lines<uint8_t>;
using const_lines = plane_lines<const uint8_t>;

// The lines of what a kernel gets as untyped memory.
inline const_lines lines_of(const void *plane, ptrdiff_t stride) {
    return {static_cast<const uint8_t *>(plane), stride};
}
inline lines lines_of(void *plane, ptrdiff_t stride) {
    return {static_cast<uint8_t *>(plane), stride};
}

// Whether lines of a destination lie apart, so that the order in which they are written is not seen.
inline bool lie_apart(const lines &dst, ptrdiff_t bytes) {
    return dst.stride >= bytes || dst.stride <= -bytes;
}

// Copies `height` lines of `width` bytes, which must not overlap.
void copy_lines(const const_lines &src, const lines &dst, ptrdiff_t width, ptrdiff_t height);

}  // namespace simgp

#endif
