// Turns and mirrors.
#ifndef SIMGP_VECTOR_ROTATE_H
#define SIMGP_VECTOR_ROTATE_H

#include <string.h>

#include "rows/rotate.h"

namespace simgp::SIMD_TARGET {

// The vector registers of the machine.
#if defined(__AVX512F__) || defined(__aarch64__)
inline constexpr int registers = 32;
#else
inline constexpr int registers = 16;
#endif

// Asks for lines of the block that follows, a few at a time. A hint may lead behind a plane, but no
// pointer may: hence the integer.
struct lines_ahead {
    uintptr_t at;
    ptrdiff_t stride;

    void fetch(int count) {
        for (int i = 0; i < count; i++, at += uintptr_t(stride))
            __builtin_prefetch(reinterpret_cast<const void *>(at));
    }
};

// The unit of work is a square: 16 bytes of samples from each row of the source (31, of even
// bytes), and a vector for each row of the destination; block j of its vectors is 16 bytes of
// those.
//
// It is transposed in two halves. The first takes four rows at a time and interleaves them into
// granules of four samples of a column. The second puts the granules of a column together.
//
// A machine with the registers for it keeps a whole square between the halves, as any does with
// words. Otherwise all squares of a block meet on the stack: neither half then needs more than eight
// registers, and each goes through the cache lines of its side one after the other, a whole line at
// a time.
template <sample_kind S>
struct transposition {
    static constexpr int size = int(sample_size<S>), gap = int(sample_gap<S> / sample_size<S>);
    static constexpr ptrdiff_t side = block_side<S>;
    static constexpr ptrdiff_t columns_of_square = 16 / size, rows_of_square = bytes / size;
    static constexpr int quads = int(columns_of_square / 4);  // of rows in a block of a vector
    static constexpr bool meets_in_registers = S == sample_kind::words || registers == 32;

    // [columns 4 k / size ...][rows 4 q ... 4 q + 3]
    using square = u8v[4][quads];

    // Quad q of the square; row(r, x) loads row r of the four from byte x on.
    template <class Row>
    static void collect(square &to, int q, Row row) {
        u8v lo01, hi01, lo23, hi23;
        if constexpr (S == sample_kind::even_bytes) {
            // Bytes 0, 2, ... 14 and 16, 18, ... 30, these from the upper halves of words that begin
            // a byte early: nothing behind the last sample is read.
            const auto low = [](u8v a, u8v b) { return as_u8(bit_or(even(a), shl<8>(as_u16(b)))); };
            const auto high = [](u8v a, u8v b) { return join_high(as_u16(a), as_u16(b)); };
            lo01 = low(row(0, 0), row(1, 0));
            lo23 = low(row(2, 0), row(3, 0));
            hi01 = high(row(0, 15), row(1, 15));
            hi23 = high(row(2, 15), row(3, 15));
        } else {
            const u8v r0 = row(0, 0), r1 = row(1, 0), r2 = row(2, 0), r3 = row(3, 0);
            lo01 = zip_low<size>(r0, r1);
            hi01 = zip_high<size>(r0, r1);
            lo23 = zip_low<size>(r2, r3);
            hi23 = zip_high<size>(r2, r3);
        }
        to[0][q] = zip_low<2 * size>(lo01, lo23);
        to[1][q] = zip_high<2 * size>(lo01, lo23);
        to[2][q] = zip_low<2 * size>(hi01, hi23);
        to[3][q] = zip_high<2 * size>(hi01, hi23);
    }

    // Calls put(x, v) for the columns x of a square, v being a column's samples.
    template <class Put>
    static void place(const square &from, Put put) {
        for (int k = 0; k < 4; k++) {
            const auto &v = from[k];
            if constexpr (size == 1) {
                const u8v lo01 = zip_low<4>(v[0], v[1]), hi01 = zip_high<4>(v[0], v[1]);
                const u8v lo23 = zip_low<4>(v[2], v[3]), hi23 = zip_high<4>(v[2], v[3]);
                put(4 * k, zip_low<8>(lo01, lo23));
                put(4 * k + 1, zip_high<8>(lo01, lo23));
                put(4 * k + 2, zip_low<8>(hi01, hi23));
                put(4 * k + 3, zip_high<8>(hi01, hi23));
            } else {
                put(2 * k, zip_low<8>(v[0], v[1]));
                put(2 * k + 1, zip_high<8>(v[0], v[1]));
            }
        }
    }

    // Where piece k of a length begins; the last one begins early, to end with it.
    static ptrdiff_t start(ptrdiff_t k, ptrdiff_t piece, ptrdiff_t length) {
        return (k + 1) * piece <= length ? k * piece : length - piece;
    }

    // A block of at least a square, Across x Down squares at a time.
    template <int Across, int Down>
    static inline void squares(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst,
                               ptrdiff_t dst_stride, ptrdiff_t columns, ptrdiff_t rows,
                               ptrdiff_t next) {
        constexpr ptrdiff_t wide = columns_of_square, high = rows_of_square;
        constexpr int steps = int(side / wide) / Across * int(side / high) * quads;
        lines_ahead ahead{reinterpret_cast<uintptr_t>(src) + uintptr_t(next), src_stride};
        for (ptrdiff_t c = 0; c * wide < columns; c += Across)
            for (ptrdiff_t u = 0; u * high < rows; u += Down) {
                square between[Across][Down];
                const auto x = [=](int i) { return start(c + i, wide, columns); };
                const auto y = [=](int j) { return start(u + j, high, rows); };
                const auto more = [=](int i) { return (c + i) * wide < columns; };
                const auto below = [=](int j) { return (u + j) * high < rows; };
                for (int j = 0; j < Down && below(j); j++)
                    for (int q = 0; q < quads; q++) {
                        if (next) ahead.fetch(int(side) / steps);
                        const uint8_t *const line = src + (y(j) + 4 * q) * src_stride;
                        for (int i = 0; i < Across && more(i); i++) {
                            const uint8_t *const p = line + x(i) * gap * size;
                            collect(between[i][j], q, [=](int r, int at) {
                                return load_blocks(p + r * src_stride + at, wide * src_stride);
                            });
                        }
                    }
                for (int i = 0; i < Across && more(i); i++)
                    for (int j = 0; j < Down && below(j); j++) {
                        uint8_t *const to = dst + x(i) * dst_stride + y(j) * size;
                        place(between[i][j], [=](int k, u8v v) { store(to + k * dst_stride, v); });
                    }
            }
    }
    static void block_of_squares(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst,
                                 ptrdiff_t dst_stride, ptrdiff_t columns, ptrdiff_t rows,
                                 ptrdiff_t next) {
        if constexpr (meets_in_registers) {
            squares<1, 1>(src, src_stride, dst, dst_stride, columns, rows, next);
        } else {
            constexpr int across = int(side / columns_of_square), down = int(side / rows_of_square);
            // With its size known, the compiler unrolls the block.
            if (columns == side && rows == side)
                squares<across, down>(src, src_stride, dst, dst_stride, side, side, next);
            else if (S == sample_kind::bytes && columns == side && rows == side / 2)
                squares<across, down / 2>(src, src_stride, dst, dst_stride, side, side / 2, 0);
            else
                squares<across, down>(src, src_stride, dst, dst_stride, columns, rows, 0);
        }
    }

    // Squares the other way round: a vector of samples from each row of the source, and 16 bytes for
    // each row of the destination. At least one of them.
    static void strip(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
                      ptrdiff_t columns) {
        constexpr ptrdiff_t wide = rows_of_square;
        for (ptrdiff_t c = 0; c * wide < columns; c++) {
            const ptrdiff_t x = start(c, wide, columns);
            square between;
            for (int q = 0; q < quads; q++) {
                const uint8_t *const p = src + 4 * q * src_stride + x * gap * size;
                collect(between, q, [=](int r, int at) {
                    const uint8_t *const from = p + r * src_stride + at;
                    return gap == 1 ? load(from) : load_blocks(from, 16 * gap);
                });
            }
            place(between, [=](int k, u8v v) {
                store_blocks(dst + (x + k) * dst_stride, columns_of_square * dst_stride, v);
            });
        }
    }

    // Whatever is less than a square goes through one on the stack.
    static void part(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst, ptrdiff_t dst_stride,
                     ptrdiff_t columns, ptrdiff_t rows) {
        constexpr ptrdiff_t wide = columns_of_square, high = rows_of_square;
        uint8_t in[16 * high] = {}, out[wide * bytes];
        for (ptrdiff_t y = 0; y < rows; y += high)
            for (ptrdiff_t x = 0; x < columns; x += wide) {
                const ptrdiff_t width = columns - x < wide ? columns - x : wide;
                const ptrdiff_t height = rows - y < high ? rows - y : high;
                for (ptrdiff_t r = 0; r < height; r++) {
                    const uint8_t *const from = src + (y + r) * src_stride + x * gap * size;
                    if constexpr (gap == 1)
                        memcpy(in + 16 * r, from, size_t(width * size));
                    else
                        for (ptrdiff_t i = 0; i < width; i++) in[16 * r + i] = from[gap * i];
                }
                using packed = transposition<size == 1 ? sample_kind::bytes : sample_kind::words>;
                packed::template squares<1, 1>(in, 16, out, bytes, wide, high, 0);
                for (ptrdiff_t k = 0; k < width; k++)
                    memcpy(dst + (x + k) * dst_stride + y * size, out + bytes * k,
                           size_t(height * size));
            }
    }

    // Rows that do not fill squares, 16 bytes of them or less, or less than one square has, go in
    // strips.
    static void any_block(const uint8_t *src, ptrdiff_t src_stride, uint8_t *dst,
                          ptrdiff_t dst_stride, ptrdiff_t columns, ptrdiff_t rows, ptrdiff_t next) {
        constexpr ptrdiff_t wide = columns_of_square, high = rows_of_square;
        if (columns < wide || rows < wide)
            return part(src, src_stride, dst, dst_stride, columns, rows);
        const ptrdiff_t left = rows % high;
        if (left > 0 && columns >= high && (left <= wide || left == rows)) {
            for (ptrdiff_t y = rows - left; y < rows; y += wide) {
                const ptrdiff_t at = y + wide <= rows ? y : rows - wide;
                strip(src + at * src_stride, src_stride, dst + at * size, dst_stride, columns);
            }
            rows -= left;
            if (rows == 0) return;
        }
        if (rows < high) return part(src, src_stride, dst, dst_stride, columns, rows);
        block_of_squares(src, src_stride, dst, dst_stride, columns, rows,
                         columns == side && rows == side ? next : 0);
    }
};

template <sample_kind S>
static u8v load_reversed(const uint8_t *p) {
    return S == sample_kind::words ? reverse_u16(load(p)) : reverse_u8(load(p));
}

// Loads go up, as the processor foresees them, and stores go down. The last vector may move some
// samples again.
template <sample_kind S>
static void reverse(const uint8_t *src, uint8_t *dst, ptrdiff_t count) {
    constexpr ptrdiff_t size = sample_size<S>;
    const ptrdiff_t length = count * size;
    if (length < bytes) {
        for (ptrdiff_t i = 0; i < count; i++)
            memcpy(dst + i * size, src + (count - 1 - i) * size, size_t(size));
        return;
    }
    const uint8_t *from = src;
    uint8_t *to = dst + length;
    const auto next = [&] {
        const u8v v = load_reversed<S>(from);
        from += bytes, step_pointer(from);
        return v;
    };
    const auto put = [&](u8v v) {
        to -= bytes, step_pointer(to);
        store(to, v);
    };
    const size_t vectors = size_t(length) / bytes;
    for (size_t fours = vectors / 4; fours != 0; fours--) {
        const u8v a = next(), b = next(), c = next(), d = next();
        put(a), put(b), put(c), put(d);
    }
    for (size_t rest = vectors % 4; rest != 0; rest--) put(next());
    if (from < src + length) store(dst, load_reversed<S>(src + length - bytes));
}

void fill_rotate(rotate_rows &t) {
    t.transpose[size_t(sample_kind::bytes)] = transposition<sample_kind::bytes>::any_block;
    t.transpose[size_t(sample_kind::words)] = transposition<sample_kind::words>::any_block;
    t.transpose[size_t(sample_kind::even_bytes)] =
        transposition<sample_kind::even_bytes>::any_block;
    t.reverse[size_t(sample_kind::bytes)] = reverse<sample_kind::bytes>;
    t.reverse[size_t(sample_kind::words)] = reverse<sample_kind::words>;
}

}  // namespace simgp::SIMD_TARGET

#endif
