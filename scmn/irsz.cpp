// The line-based resizer: its kernels, and the object that is fed with bands. The filter is the
// resampler's (simgp/resample.h).
#include "scmn/irsz.h"

#include <stdlib.h>
#include <string.h>

#include <new>

#include "simgp/resample.h"

namespace simgp {
namespace {

struct irsz_format {
    int32_t code;
    scmn_irsz_fn *run;
    resize_kind kind;
    bool packs;  // what is made of 3 bytes a pixel is written as 565 words
    int32_t src_bytes, dst_bytes;
    int32_t unit;  // bytes that lengths count in
};

// Lines that become words wait beside a strip's plan, as many as the resampler makes at once.
constexpr ptrdiff_t lines_packed = 2;
constexpr ptrdiff_t packed_bytes(bool packs) { return packs ? lines_packed * 3 : 0; }

// Packs a line. The two lines below come next: a strip's short lines are too many streams for the
// processor to see what will be written.
void pack_line(rgb_to_rgb_row *pack, const uint8_t *src, const lines &dst, ptrdiff_t y,
               ptrdiff_t columns) {
    const uintptr_t ahead = reinterpret_cast<uintptr_t>(dst.first) +
                            uintptr_t(y + lines_packed) * uintptr_t(dst.stride);
    for (ptrdiff_t x = 0; x < 2 * columns; x += 64)
        __builtin_prefetch(reinterpret_cast<const void *>(ahead + uintptr_t(x)), 1);
    pack(src, dst.line(y), columns);
}

// The lines of a band, and the one that was kept before.
struct band {
    const_lines given;
    ptrdiff_t first;
    const uint8_t *kept;
};
// The same as a source of lines, while bands come and go.
struct band_source {
    const band *now;
    ptrdiff_t stride;

    const uint8_t *fetch(ptrdiff_t y) const {
        return y < now->first ? now->kept : now->given.line(y - now->first);
    }
};

// Writes lines first ... first + count - 1 of a strip, for which there is room for `some` if they are
// packed.
template <bool Packs>
void write_lines(resampled_lines<band_source> &made, ptrdiff_t columns, ptrdiff_t first,
                 ptrdiff_t count, const lines &dst, [[maybe_unused]] uint8_t *some) {
    if constexpr (Packs) {
        const ptrdiff_t stride = columns * 3;
        const auto pack = live_rows().rgb2yuv.to_rgb565[size_t(rgb_packing::rgb888)];
        for (ptrdiff_t y = 0; y < count;) {
            const ptrdiff_t end = y + made.make_some(first + y, first + count, some, stride);
            for (const uint8_t *line = some; y < end; y++, line += stride)
                pack_line(pack, line, dst, y, columns);
        }
    } else {
        made.make(first, count, dst.first, dst.stride);
    }
}

template <bool Packs>
void resize_as(const irsz_format &f, const resampling &r, const band &src, ptrdiff_t width,
               ptrdiff_t first, ptrdiff_t count, const lines &dst) {
    resample_plane(
        r, band_source{&src, src.given.stride}, width,
        [&](auto &made, ptrdiff_t x, ptrdiff_t columns, uint8_t *some) {
            write_lines<Packs>(made, columns, first, count, dst.from(x * f.dst_bytes, 0), some);
        },
        packed_bytes(Packs));
}
void resize(const irsz_format &f, const resampling &r, const band &src, ptrdiff_t width,
            ptrdiff_t first, ptrdiff_t count, const lines &dst) {
    (f.packs ? resize_as<true> : resize_as<false>)(f, r, src, width, first, count, dst);
}

void resize_whole(const irsz_format &f, const void *src, int32_t src_line, int32_t width,
                  int32_t height, int32_t dst_line, void *dst, int32_t step_x, int32_t step_y) {
    if (width < 1 || height < 1) return;
    const const_lines whole = lines_of(src, ptrdiff_t(src_line) * f.unit);
    resize(f, resampling(f.kind, step_x, step_y), {whole, 0, nullptr}, width, 0, height,
           lines_of(dst, ptrdiff_t(dst_line) * f.unit));
}

void resize_row(const irsz_format &f, const void *const *of, const uint8_t *wrow, int32_t width,
                int32_t shift_x, int32_t inc_x, void *dst) {
    if (width < 1) return;
    // Of phase 0 across, the weight of the lower line is 8 times the phase down. Row 1, with a step
    // of two lines and this phase, lies where it should; with a step as long no row is kept.
    const int32_t phase = wrow[2] >> 3 & 7, step_y = 2 << 18 | phase << 15;
    const int32_t step_x = int32_t(uint32_t(inc_x) << 3 | uint32_t(shift_x));
    // Its two lines are those before line 3, and line 3.
    const band two = {lines_of(of[1], 0), 3, static_cast<const uint8_t *>(of[0])};
    resize(f, resampling(f.kind, step_x, step_y << 3), two, width, 1, 1, lines_of(dst, 0));
}

// Bands ---------------------------------------------------------------------------------------
//
// Taps lie on every e-th line of the source, e = 1 << shift_y. Row r has its upper tap on line U(r),
// the lower one on L(r), which is U(r) if its phase is 0, else U(r) + e; neither falls from a row to
// the next. After the band that ends before line E, all rows with L < E are written. The next row
// waits if U < E <= L, and so may further rows. But then L = U + e, and only one multiple of e, the
// last below E, is as close: they all wait with the same upper line, which is the only one of the
// past that is ever needed. It stays the one to keep until a band brings line U + e, however many
// bands come between.

// A strip stays through all bands, and with it the rows that are kept for its lines.
struct band_strip {
    band_strip(const resampling &r, ptrdiff_t at, ptrdiff_t columns, const source_span &span,
               const band_source &source, uint8_t *memory)
        : x(at),
          plan(r.plan(at, columns, span, memory)),
          made(r, plan, source, memory + r.plan_bytes(columns)),
          some(memory + r.plan_bytes(columns) + r.ring_bytes(columns)) {}

    const ptrdiff_t x;
    const resize_strip plan;
    resampled_lines<band_source> made;
    uint8_t *const some;
};

// The object for bands: behind what everyone sees lie the strips, and behind them their memory.
struct band_resizer : scmn_irsz_ctx {
    resampling r;
    ptrdiff_t row_bytes;  // of a source line, as far as taps reach
    band now;
    band_strip *strips;
    ptrdiff_t count;
};

// How many rows need no line from `end` on: those whose position, in whole eighths, is that of the
// last line with taps before `end`, or less.
ptrdiff_t rows_before(const band_resizer &b, int64_t end) {
    constexpr int64_t units = 1 << 13;  // positions are below
    const int64_t last = (end - 1) >> b.shift_y;
    if (last >= units || b.inc_y == 0) return b.dst_h;
    const int32_t beyond = (8 * int32_t(last) + 1) * (1 << 15), rows = (beyond - 1) / b.inc_y + 1;
    return rows < b.dst_h ? rows : b.dst_h;
}

void resize_band(const irsz_format &f, band_resizer &b, const uint8_t *src, int32_t first,
                 int32_t count) {
    if (first < 0 || count < 1) return;
    const int64_t end = int64_t(first) + count;
    const ptrdiff_t stride = ptrdiff_t(b.dst_line) * f.unit;
    const resize_axis &y = b.r.y;
    b.now.given = {src, ptrdiff_t(b.src_line) * f.unit};
    b.now.first = first;

    const ptrdiff_t next = b.row - b.carry, ready = rows_before(b, end);
    const ptrdiff_t row = ready > next ? ready : next;
    if (row > next) {
        const lines dst = lines_of(b.dst, stride).from(0, next);
        for (ptrdiff_t k = 0; k < b.count; k++) {
            band_strip &s = b.strips[k];
            (f.packs ? write_lines<true>
                     : write_lines<false>)(s.made, s.plan.columns, next, row - next,
                                           dst.from(s.x * f.dst_bytes, 0), s.some);
        }
    }

    const ptrdiff_t upper = y.cell(row);
    const bool waits = row < b.dst_h && upper < end;
    if (waits && upper >= first)
        memcpy(b.line_buf, b.now.given.line(upper - first), size_t(b.row_bytes));
    b.carry = waits;
    b.row = int32_t(row + waits);
    b.y_pos = int32_t(y.at(b.row));
    b.carry_off = waits ? int32_t((y.next(row) - end) * b.src_line) : 0;
    b.reuse = waits && row + 1 < b.dst_h && y.cell(row + 1) == upper;
}

int32_t run(const irsz_format &f, scmn_irsz_ctx *ctx, const void *src, int32_t first,
            int32_t count) {
    const auto packed = [](int32_t step, int32_t shift) { return step << 3 | shift; };
    if (ctx->mode == SCMN_IRSZ_FULL)
        resize_whole(f, src, ctx->src_line, ctx->dst_w, ctx->dst_h, ctx->dst_line, ctx->dst,
                     packed(ctx->inc_x, ctx->shift_x), packed(ctx->inc_y, ctx->shift_y));
    else
        resize_band(f, *static_cast<band_resizer *>(ctx), static_cast<const uint8_t *>(src), first,
                    count);
    return 0;
}

constexpr irsz_format irsz_formats[] = {
    {SCMN_IRSZ_8B, scmn_irsz8b, resize_kind::bytes1, false, 1, 1, 1},
    {SCMN_IRSZ_8B8B8B, scmn_irsz8b8b8b, resize_kind::bytes3, false, 3, 3, 1},
    {SCMN_IRSZ_8B8B8B_5B6B5B, scmn_irsz8b8b8b_5b6b5b, resize_kind::bytes3, true, 3, 2, 1},
    {SCMN_IRSZ_5B6B5B, scmn_irsz5b6b5b, resize_kind::word565, false, 2, 2, 2},
    {SCMN_IRSZ_8B8B8B8B, scmn_irsz8b8b8b8b, resize_kind::bytes4, false, 4, 4, 1},
};
constexpr const irsz_format *find_irsz_format(int32_t code) {
    for (const irsz_format &f : irsz_formats)
        if (f.code == code) return &f;
    return nullptr;
}
template <int32_t Code>
constexpr const irsz_format &irsz_format_of = *find_irsz_format(Code);

// Creation ------------------------------------------------------------------------------------

constexpr bool is_word(int64_t n) { return n == int32_t(n); }

// Fills in what does not change, and the rest with 0. False where the arithmetic does not hold the
// sizes; in bytes, all lengths must have 32 bits.
bool describe(const scmn_irsz_param &p, const irsz_format &f, scmn_irsz_ctx &c) {
    const resize_spread x(p.src_w, p.dst_w), y(p.src_h, p.dst_h);
    if (!x.fits || !y.fits) return false;
    const int64_t src_line = int64_t(p.src_stride) * f.src_bytes;
    const int64_t dst_line = int64_t(p.dst_stride) * f.dst_bytes;
    if (!is_word(src_line) || !is_word(dst_line) || !is_word(src_line << y.shift)) return false;
    int64_t chunk = p.chunk_lines * src_line;
    if (!is_word(chunk)) {
        if (p.mode == SCMN_IRSZ_LINE) return false;
        chunk = 0;
    }
    // Of what is read and written, too; strips are rounded up.
    constexpr int64_t longest = INT32_MAX - 255;
    if (p.src_w > longest / f.src_bytes || p.dst_w > longest / f.src_bytes) return false;

    c = {};
    c.format = p.format;
    c.mode = p.mode;
    c.inc_x = x.step;
    c.inc_y = y.step;
    c.tap_dx = 1 << x.shift;
    c.src_line = int32_t(src_line) / f.unit;
    c.dst_w = p.dst_w;
    c.dst_h = p.dst_h;
    c.dst_line = int32_t(dst_line) / f.unit;
    c.shift_x = x.shift;
    c.shift_y = y.shift;
    c.tap_dy = c.src_line * (1 << y.shift);
    c.chunk_size = int32_t(chunk) / f.unit;
    c.upscale = p.dst_w > p.src_w || p.dst_h > p.src_h;
    c.run = f.run;
    c.dst = p.dst;
    return true;
}

scmn_irsz_ctx *make_whole(const scmn_irsz_ctx &c) {
    void *const memory = malloc(sizeof c);
    return memory ? new (memory) scmn_irsz_ctx(c) : nullptr;
}

// One block for the object and its strips, and one for the line.
scmn_irsz_ctx *make_for_bands(const scmn_irsz_ctx &c, const irsz_format &f, int32_t src_w) {
    const resampling r(f.kind, c.inc_x << 3 | c.shift_x, c.inc_y << 3 | c.shift_y);
    // As wide as those of the kernels are, so that what a strip works on stays in the cache; twice that
    // where rows are kept, as each band is short work for a strip, and the cache has room for it.
    const ptrdiff_t memory_of_strip = resample_stack * (r.keeps() ? 2 : 1);
    const ptrdiff_t columns = r.strip_width(c.dst_w, memory_of_strip, packed_bytes(f.packs));
    const ptrdiff_t count = (c.dst_w + columns - 1) / columns;
    constexpr ptrdiff_t unit = resize_alignment;
    const ptrdiff_t packed = (columns * packed_bytes(f.packs) + unit - 1) / unit * unit;
    const ptrdiff_t strip_bytes = r.plan_bytes(columns) + r.ring_bytes(columns) + packed;
    const uint64_t size = sizeof(band_resizer) + resize_alignment +
                          uint64_t(count) * (sizeof(band_strip) + uint64_t(strip_bytes));
    if (size > PTRDIFF_MAX) return nullptr;

    uint8_t *const memory = static_cast<uint8_t *>(malloc(size_t(size)));
    if (!memory) return nullptr;
    uint8_t *const line = static_cast<uint8_t *>(malloc(size_t(src_w) * size_t(f.src_bytes)));
    if (!line) {
        free(memory);
        return nullptr;
    }

    const source_span span = r.whole_rows(c.dst_w);
    band_strip *const strips =
        static_cast<band_strip *>(static_cast<void *>(memory + sizeof(band_resizer)));
    band_resizer *const made =
        new (memory) band_resizer{c, r, span.columns * f.src_bytes, {{}, 0, line}, strips, count};
    made->line_buf = line;
    uint8_t *at = reinterpret_cast<uint8_t *>(strips + count);
    at += -reinterpret_cast<uintptr_t>(at) % resize_alignment;
    const band_source source = {&made->now, ptrdiff_t(c.src_line) * f.unit};
    for (ptrdiff_t k = 0; k < count; k++, at += strip_bytes) {
        const ptrdiff_t x = k * columns, rest = c.dst_w - x;
        new (strips + k) band_strip(made->r, x, rest < columns ? rest : columns, span, source, at);
    }
    return made;
}

int32_t create(const scmn_irsz_param &p, scmn_irsz_ctx *&made) {
    if (p.mode != SCMN_IRSZ_FULL && p.mode != SCMN_IRSZ_LINE) return SCMN_IRSZ_ERR_MODE;
    const irsz_format *const f = find_irsz_format(p.format);
    if (!f) return SCMN_IRSZ_ERR_FORMAT;
    scmn_irsz_ctx c;
    if (!describe(p, *f, c)) return SCMN_IRSZ_ERR_MEMORY;
    made = p.mode == SCMN_IRSZ_FULL ? make_whole(c) : make_for_bands(c, *f, p.src_w);
    return made ? SCMN_IRSZ_OK : SCMN_IRSZ_ERR_MEMORY;
}

}  // namespace
}  // namespace simgp

using namespace simgp;

const uint8_t tbl_rsz_weight[256] = SIMGP_RESIZE_WEIGHTS;

scmn_irsz_ctx *scmn_irsz_create(const scmn_irsz_param *param, int32_t *err) {
    scmn_irsz_ctx *made = nullptr;
    const int32_t result = create(*param, made);
    if (err) *err = result;
    return made;
}

int32_t scmn_irsz(scmn_irsz_ctx *ctx, const void *src, int32_t first_line, int32_t nlines) {
    return ctx->run(ctx, src, first_line, nlines);
}

void scmn_irsz_delete(scmn_irsz_ctx *ctx) {
    if (!ctx) return;
    free(ctx->line_buf);
    free(ctx);
}

#define SCMN_IRSZ_ENTRY(name, format)                                                       \
    int32_t name(scmn_irsz_ctx *ctx, const void *src, int32_t first_line, int32_t nlines) { \
        return run(irsz_format_of<format>, ctx, src, first_line, nlines);                   \
    }
SCMN_IRSZ_ENTRY(scmn_irsz8b, SCMN_IRSZ_8B)
SCMN_IRSZ_ENTRY(scmn_irsz8b8b8b, SCMN_IRSZ_8B8B8B)
SCMN_IRSZ_ENTRY(scmn_irsz8b8b8b_5b6b5b, SCMN_IRSZ_8B8B8B_5B6B5B)
SCMN_IRSZ_ENTRY(scmn_irsz5b6b5b, SCMN_IRSZ_5B6B5B)
SCMN_IRSZ_ENTRY(scmn_irsz8b8b8b8b, SCMN_IRSZ_8B8B8B8B)

#define SCMN_IRSZ_LINE_KERNEL(name, format)                                                  \
    void name(const void *const *lines, const uint8_t *wrow, int32_t dst_w, int32_t shift_x, \
              int32_t, int32_t inc_x, void *dst_row) {                                       \
        resize_row(irsz_format_of<format>, lines, wrow, dst_w, shift_x, inc_x, dst_row);     \
    }
SCMN_IRSZ_LINE_KERNEL(scmn_irsz8b_line, SCMN_IRSZ_8B)
SCMN_IRSZ_LINE_KERNEL(scmn_irsz8b8b8b_line, SCMN_IRSZ_8B8B8B)
SCMN_IRSZ_LINE_KERNEL(scmn_irsz8b8b8b_5b6b5b_line, SCMN_IRSZ_8B8B8B_5B6B5B)
SCMN_IRSZ_LINE_KERNEL(scmn_irsz5b6b5b_line, SCMN_IRSZ_5B6B5B)
SCMN_IRSZ_LINE_KERNEL(scmn_irsz8b8b8b8b_line, SCMN_IRSZ_8B8B8B8B)

#define SCMN_IRSZ_FULL_KERNEL(name, format)                                                      \
    void name(const void *src, int32_t src_line, int32_t dst_w, int32_t dst_h, int32_t dst_line, \
              void *dst, int32_t step_x, int32_t step_y) {                                       \
        resize_whole(irsz_format_of<format>, src, src_line, dst_w, dst_h, dst_line, dst, step_x, \
                     step_y);                                                                    \
    }
SCMN_IRSZ_FULL_KERNEL(scmn_irsz8b_full, SCMN_IRSZ_8B)
SCMN_IRSZ_FULL_KERNEL(scmn_irsz8b8b8b_full, SCMN_IRSZ_8B8B8B)
SCMN_IRSZ_FULL_KERNEL(scmn_irsz8b8b8b_5b6b5b_full, SCMN_IRSZ_8B8B8B_5B6B5B)
SCMN_IRSZ_FULL_KERNEL(scmn_irsz5b6b5b_full, SCMN_IRSZ_5B6B5B)
SCMN_IRSZ_FULL_KERNEL(scmn_irsz8b8b8b8b_full, SCMN_IRSZ_8B8B8B8B)
