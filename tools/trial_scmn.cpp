// Trials of the functions scmn_*, the library's own of those that programs may have in place.
#define SCMN_BITS_CALLED
#include <string.h>

#include "scmn/scmn.h"
#include "tools/trial.h"

namespace tools {
namespace {

using run_fn = void (*)(trial &, const function &);

// Memory ---------------------------------------------------------------------------------------------

// The aligned blocks: that there is one, that it is aligned, that the word below it holds an address
// that leaves room for that, that it can be written, and that it keeps its bytes while others come and
// go. Sizes that leave 32 bits give none. The release functions leave no other trace.
template <void *allocate(uint32_t), void release(void *)>
void blocks(trial &t, const function &) {
    struct block {
        uint8_t *bytes;
        uint32_t size;
    } all[6];
    const auto open = [&](block &b) {
        b.size = t.one_in(6) ? uint32_t(t.pick(0, 1)) : uint32_t(t.pick(0, 6000));
        b.bytes = static_cast<uint8_t *>(allocate(b.size));
        t.result(b.bytes != nullptr);
        if (!b.bytes) return;
        uintptr_t start;
        memcpy(&start, b.bytes - sizeof start, sizeof start);
        const uintptr_t distance = uintptr_t(b.bytes) - start;
        t.result(uintptr_t(b.bytes) % 32 == 0 && distance >= sizeof start &&
                 distance <= 32 + sizeof start);
        for (uint32_t i = 0; i < b.size; i++) b.bytes[i] = uint8_t(i * 37 + b.size);
    };
    const auto close = [&](const block &b) {
        if (b.bytes) t.result(b.bytes, b.size);
        release(b.bytes);
    };
    for (block &b : all) open(b);
    for (int i = 0; i < 8; i++) {
        block &b = all[t.pick(0, 5)];
        close(b);
        open(b);
    }
    for (const block &b : all) close(b);
    t.result(allocate(uint32_t(t.pick(-31, -1))) == nullptr);
    release(nullptr);
}

void block_copy(trial &t, const function &) {
    const extent size = t.size();
    const plane src = t.add(size.w, size.h), dst = t.add(size.w, size.h);
    t.fill();
    scmn_blk_mcpy(dst.first, src.first, dst.stride, src.stride, size.w, size.h);
}

using set_fn = void(void *, uint32_t, int32_t);

void set(trial &t, const function &f) {
    const int32_t count = t.one_in(10) ? t.pick(-300, 0) : t.pick(1, 2000);
    const uint32_t value = t.word();
    uint8_t *const to = t.bytes(std::max(128, (count + 127) / 128 * 128));
    t.fill();
    code_of<set_fn>(f)(to, value, count);
}

void clear(trial &t, const function &) {
    const int32_t words = t.one_in(10) ? t.pick(-300, 0) : t.pick(1, 700);
    uint8_t *const to = t.bytes(4 * std::max(words, 0));
    t.fill();
    scmn_mclr_x64(to, words);
}

using number_fn = int32_t(uint32_t);

void number(trial &t, const function &f) {
    const uint32_t n = t.word();
    for (uint32_t x : {n, n + 1, n - 1, ~n, 0u}) t.result(uint32_t(code_of<number_fn>(f)(x)));
}

// The build stamp is another one in each build; its form is not: letters, digits (a day of one digit
// has a space before it) and the rest. Nor is where it lies.
void version(trial &t, const function &) {
    const char *const text = scmn_version();
    for (const char *c = text; c < text + 64; c++) {
        const bool digit = (*c >= '0' && *c <= '9') || (c == text + 4 && *c == ' ');
        const bool letter = (*c >= 'A' && *c <= 'Z') || (*c >= 'a' && *c <= 'z');
        t.result(digit ? '0' : letter ? 'a' : uint8_t(*c));
    }
    t.result(scmn_version() == text);
}

// Tags -----------------------------------------------------------------------------------------------

// Known tags, with letters of the other case, and numbers around those of WAVE formats.
void tags(trial &t, const function &f) {
    static constexpr char known[][5] = {
        "aac ", "mp4a", "samr", "sawb", "sqcp", "dqcp", "evrc", "DX50", "DIVX", "XVID", "DIV4",
        "FMP4", "MP4V", "M4S2", "H263", "d263", "s263", "AVC1", "avcC", "H264", "x264", "WMV1",
        "WMV2", "WMV3", "DIV3", "MP43", "drms", "RIFF", "wma ", "ac-3", "mp3 ", "alaw"};
    const auto result = [&](uint32_t tag) { t.result(uint32_t(code_of<number_fn>(f)(tag))); };
    for (const char *tag : known)
        for (uint32_t cases = 0; cases < 16; cases++)
            result(SCMN_FOURCC(tag[0], tag[1], tag[2], tag[3]) ^ (cases & 1) << 5 ^
                   (cases & 2) << 12 ^ (cases & 4) << 19 ^ (cases & 8) << 26);
    for (uint32_t tag = 0; tag < 0x2100; tag++) result(tag);
    for (int i = 0; i < 64; i++) result(t.word());
}

// Key frames -----------------------------------------------------------------------------------------

void key_frame(trial &t, const function &) {
    static constexpr uint8_t units[] = {0x65, 0x41, 0x67, 0x68, 0x09, 0x06, 0xB6, 0xB0,
                                        0x80, 0x81, 0x82, 0x83, 0x25, 0x01, 0x05, 0xB3};
    const int32_t size = t.pick(0, t.one_in(4) ? 600 : 40), type = t.pick(101, 112);
    uint8_t *const buffer = t.bytes(size);
    t.fill();
    // Long stretches without a start code, and codes that are cut off at the end.
    for (int32_t i = t.pick(0, size); i + 3 < size; i += t.pick(1, 60)) {
        const uint8_t h263 = uint8_t(type == SCMN_MT_H263 || type == 111 ? t.pick(0, 1) : 0);
        const uint8_t code[4] = {0, 0, uint8_t(h263 ? t.pick(0x7F, 0x84) : t.pick(0, 2)),
                                 t.one_of(units)};
        memcpy(buffer + i, code, h263 ? 3 : 4);
    }
    t.result(uint32_t(scmn_is_vkeyfrm(type, buffer, size)));
    t.result(uint32_t(scmn_is_vkeyfrm(t.pick(-5, 400), buffer, size)));
    t.result(uint32_t(scmn_is_vkeyfrm(type, nullptr, t.pick(-5, 0))));
}

// Bits -----------------------------------------------------------------------------------------------

// A reader that goes on in a second buffer.
struct two_buffers {
    scmn_bsr_ctx reader;
    const uint8_t *further;
    int32_t size;
    bool least_first;
};

int32_t refill(scmn_bsr_ctx *ctx, int32_t nbytes) {
    two_buffers &all = *reinterpret_cast<two_buffers *>(ctx);
    if (ctx->last + 1 == ctx->cur && all.size > 0) {
        ctx->cur = all.further;
        ctx->last = all.further + all.size - 1;
        all.size = 0;
    }
    const int32_t n = int32_t(std::min(ptrdiff_t(nbytes), ctx->last + 1 - ctx->cur));
    ctx->cache = 0;
    ctx->bits = 0;
    if (n <= 0) return -1;
    for (int32_t i = 0; i < n; i++)
        ctx->cache |= uint32_t(*ctx->cur++) << (all.least_first ? 8 * i : 24 - 8 * i);
    ctx->bits = 8 * n;
    return 0;
}

enum reader_call : int32_t {
    init,
    flush,
    read,
    read1,
    skip,
    peek,
    skip_peek,
    skip_to_align8,
    le_flush,
    le_read,
    le_skip,
    le_skip_to_align8
};

void call_reader(trial &t, scmn_bsr_ctx &ctx, int32_t call) {
    switch (call) {
        case flush:
            return t.result(uint32_t(scmn_bsr_flush(&ctx, t.pick(1, 6))));
        case read:
            return t.result(scmn_bsr_read(&ctx, t.pick(0, 32)));
        case read1:
            return t.result(scmn_bsr_read1(&ctx));
        case skip:
            return scmn_bsr_skip(&ctx, t.pick(0, 32));
        case peek:
            return t.result(scmn_bsr_peek(&ctx, t.pick(0, 32)));
        case skip_peek: {
            const int32_t skipped = t.pick(0, 32), peeked = t.pick(0, 32);
            return t.result(scmn_bsr_skip_peek(&ctx, skipped, peeked));
        }
        case skip_to_align8:
            return scmn_bsr_skip_to_align8(&ctx);
        case le_flush:
            return t.result(uint32_t(scmn_bsr_le_flush(&ctx, t.pick(1, 6))));
        case le_read:
            return t.result(scmn_bsr_le_read(&ctx, t.pick(0, 32)));
        case le_skip:
            return scmn_bsr_le_skip(&ctx, t.pick(0, std::clamp(ctx.bits, 0, 32)));
        case le_skip_to_align8:
            return scmn_bsr_le_skip_to_align8(&ctx);
    }
}

// Numbers: the function, which is called every second time, among the others of its bit order. After
// each call the record is looked at, its addresses as distances.
void reader(trial &t, const function &f) {
    const int32_t own = f.numbers[0];
    const bool least_first = own >= le_flush || (own == init && t.one_in(2));
    const int32_t size = t.pick(0, 40), further = t.pick(0, 40);
    uint8_t *const buffer = t.bytes(size);
    two_buffers all{{}, t.bytes(further), further, least_first};
    t.fill();
    scmn_bsr_refill_fn fn = refill;
    if (t.one_in(2)) fn = least_first ? scmn_bsr_le_flush : t.one_in(2) ? scmn_bsr_flush : nullptr;
    scmn_bsr_ctx &ctx = all.reader;
    scmn_bsr_init(&ctx, buffer, t.one_in(20) ? -size : size, fn);
    t.result(ctx.start == buffer);
    t.result(uint32_t(ctx.size));
    for (int i = 0; i < 40; i++) {
        const int32_t other =
            least_first ? t.pick(le_read, le_skip_to_align8) : t.pick(read, skip_to_align8);
        call_reader(t, ctx, own == init || t.one_in(2) ? other : own);
        t.result(ctx.cache);
        t.result(uint32_t(ctx.bits));
        t.result(uint32_t(ctx.last - ctx.cur));
    }
}

// What a writer's callback was called for.
struct counted_writer {
    scmn_bsw_ctx writer;
    crc32 bytes;
};

int32_t count_byte(scmn_bsw_ctx *ctx) {
    reinterpret_cast<counted_writer *>(ctx)->bytes.add(ctx->cur, 1);
    return 0;
}

// Numbers: 1 for single bits, else their longest run. The last byte is completed, since it means
// nothing before.
void writer(trial &t, const function &f) {
    const int32_t size = t.pick(0, 60);
    counted_writer all;
    uint8_t *const buffer = t.bytes(size);
    t.fill();
    scmn_bsw_ctx &ctx = all.writer;
    const bool counts = t.one_in(2);
    scmn_bsw_init(&ctx, buffer, t.one_in(20) ? -size : size, counts ? count_byte : nullptr);
    t.result(ctx.start == buffer);
    for (int i = 0; i < 40; i++) {
        const uint32_t value = t.word();
        const bool single = f.numbers[0] == 1 || t.one_in(4);
        t.result(uint32_t(single ? scmn_bsw_write1(&ctx, value)
                                 : scmn_bsw_write(&ctx, value, t.pick(-1, f.numbers[0]))));
        t.result(uint32_t(ctx.free_bits));
        t.result(uint32_t(ctx.last - ctx.cur));
    }
    while (ctx.free_bits != 8 && scmn_bsw_write1(&ctx, 0) == 0) {
    }
    t.result(all.bytes.value());
}

// The resizer of bands ------------------------------------------------------------------------------

struct pixel {
    int32_t format, from, to;  // bytes
};
constexpr pixel pixels[] = {{SCMN_IRSZ_8B, 1, 1},
                            {SCMN_IRSZ_8B8B8B, 3, 3},
                            {SCMN_IRSZ_8B8B8B_5B6B5B, 3, 2},
                            {SCMN_IRSZ_5B6B5B, 2, 2},
                            {SCMN_IRSZ_8B8B8B8B, 4, 4}};

// The numbers of the object; its pointers are not looked at.
void result_of(trial &t, const scmn_irsz_ctx &ctx) {
    for (int32_t n :
         {ctx.format, ctx.mode, ctx.inc_x, ctx.inc_y, ctx.y_pos, ctx.tap_dx, ctx.src_line,
          ctx.dst_w, ctx.dst_h, ctx.dst_line, ctx.shift_x, ctx.shift_y, ctx.tap_dy, ctx.carry_off,
          ctx.carry, ctx.chunk_size, ctx.row, ctx.upscale, ctx.reuse})
        t.result(uint32_t(n));
}

// A whole picture, or one in bands; the object after each call. Numbers: the place of the format in
// the list, or -1 for any, then for any function that runs it.
void bands(trial &t, const function &f) {
    const pixel &p = f.numbers[0] < 0 ? t.one_of(pixels) : pixels[f.numbers[0]];
    const extent from = t.some_size(), to = t.some_size();
    const plane src = t.add(from.w * p.from, from.h, p.from), dst = t.add(to.w * p.to, to.h, p.to);
    const int32_t mode = t.one_in(3) ? SCMN_IRSZ_FULL : SCMN_IRSZ_LINE;
    const int32_t most = t.pick(1, 20);
    const scmn_irsz_param param = {
        p.format,          mode,     from.w, from.h, src.stride / p.from, t.pick(0, 20), to.w, to.h,
        dst.stride / p.to, dst.first};
    t.fill();
    int32_t error = 77;
    scmn_irsz_ctx *const ctx = scmn_irsz_create(&param, &error);
    t.result(uint32_t(error));
    t.result(ctx != nullptr);
    if (!ctx) return;
    for (int32_t line = 0; line < from.h;) {
        const int32_t count =
            mode == SCMN_IRSZ_FULL ? from.h : std::min(t.pick(1, most), from.h - line);
        t.result(uint32_t(code_of<scmn_irsz_fn>(f)(ctx, src.row(line), line, count)));
        result_of(t, *ctx);
        line += count;
    }
    scmn_irsz_delete(ctx);
}

// Which parameters are refused, and what the others give. Nothing is resized.
void create(trial &t, const function &) {
    static constexpr int32_t numbers[] = {20, 21, 23, 25, 29, 22};
    const auto length = [&] {
        return t.one_in(12) ? int32_t(t.word()) : t.pick(t.one_in(12) ? -1 : 1, 9000);
    };
    scmn_irsz_param param;
    uint8_t *const dst = t.bytes(16);
    param.format = t.one_of(numbers);
    param.mode = t.one_in(12) ? t.pick(8, 13) : t.pick(10, 11);
    for (int32_t *n : {&param.src_w, &param.src_h, &param.src_stride, &param.chunk_lines,
                       &param.dst_w, &param.dst_h, &param.dst_stride})
        *n = length();
    // What is as wide as memory depends on how much of that there is; wider rows never fit.
    if (param.dst_w > 9000) param.dst_w = INT32_MAX - t.pick(0, 200);
    param.dst = dst;
    t.fill();
    int32_t error = 77;
    scmn_irsz_ctx *const ctx = scmn_irsz_create(&param, &error);
    t.result(uint32_t(error));
    if (ctx) result_of(t, *ctx);
    scmn_irsz_delete(ctx);
    scmn_irsz_delete(scmn_irsz_create(&param, nullptr));
}

// Steps of a source and a destination.
struct steps {
    int32_t x, y;
    steps(extent from, extent to) { simgp_rsz_get_step(from.w, from.h, to.w, to.h, 0, &x, &y); }
};

void row_kernel(trial &t, const function &f) {
    const pixel &p = pixels[f.numbers[0]];
    const extent from = t.some_size(), to = t.some_size();
    const steps step(from, to);
    uint8_t *const upper = t.bytes(from.w * p.from), *const lower = t.bytes(from.w * p.from);
    uint8_t *const row = t.bytes(to.w * p.to);
    const int32_t phase = t.pick(0, 7), width = t.one_in(20) ? t.pick(-1, 0) : to.w;
    const void *lines[2] = {upper, phase == 0 && t.one_in(2) ? nullptr : lower};
    t.fill();
    code_of<scmn_irsz_line_fn>(f)(lines, tbl_rsz_weight + 4 * phase, width, step.x & 7,
                                  1 << (step.x & 7), step.x >> 3, row);
}

void picture_kernel(trial &t, const function &f) {
    const pixel &p = pixels[f.numbers[0]];
    const bool words = p.format == SCMN_IRSZ_5B6B5B;
    const extent from = t.some_size(), to = t.some_size();
    const steps step(from, to);
    const plane src = t.add(from.w * p.from, from.h, p.from), dst = t.add(to.w * p.to, to.h, p.to);
    t.fill();
    code_of<scmn_irsz_full_fn>(f)(src.first, words ? src.stride / 2 : src.stride, to.w, to.h,
                                  words ? dst.stride / 2 : dst.stride, dst.first, step.x, step.y);
}

void weights(trial &t, const function &) { t.result(tbl_rsz_weight, sizeof tbl_rsz_weight); }

}  // namespace

void add_stream_functions(std::vector<function> &all) {
    constexpr int usual = 96;
    const auto add = [&](const char *name, int calls, run_fn run, auto *code, int32_t number = 0) {
        all.push_back({name, calls, run, reinterpret_cast<void (*)()>(code), {number}});
    };
    const auto add_plain = [&](const char *name, int calls, run_fn run, int32_t number = 0) {
        all.push_back({name, calls, run, nullptr, {number}});
    };

    add_plain("scmn_malloc_align32", usual, blocks<scmn_malloc_align32, scmn_mfree_fast_align32>);
    add_plain("scmn_malloc_fast_align32", usual,
              blocks<scmn_malloc_fast_align32, scmn_mfree_align32>);
    add_plain("scmn_mfree_align32", usual, blocks<scmn_malloc_align32, scmn_mfree_align32>);
    add_plain("scmn_mfree_fast_align32", usual,
              blocks<scmn_malloc_fast_align32, scmn_mfree_fast_align32>);
    add_plain("scmn_blk_mcpy", 2 * usual, block_copy);
    add_plain("scmn_mclr_x64", 2 * usual, clear);
    add_plain("scmn_version", 1, version);
    add_plain("scmn_is_vkeyfrm", 40 * usual, key_frame);

#define FUNCTION(name, ...) add(#name, __VA_ARGS__)
    FUNCTION(scmn_mset_x128, 2 * usual, set, scmn_mset_x128);
    FUNCTION(scmn_mset_x64, 2 * usual, set, scmn_mset_x64);
    FUNCTION(scmn_mset_x64a, 2 * usual, set, scmn_mset_x64a);
    FUNCTION(scmn_mset_x32, 2 * usual, set, scmn_mset_x32);
    FUNCTION(scmn_mset_x32ax4, 2 * usual, set, scmn_mset_x32ax4);
    FUNCTION(scmn_floor_log2, 4 * usual, number, scmn_floor_log2);
    FUNCTION(scmn_ceil_log2, 4 * usual, number, scmn_ceil_log2);
    FUNCTION(scmn_bsr_clz_in_code, 4 * usual, number, scmn_bsr_clz_in_code);
    FUNCTION(scmn_fcc2mt, 2, tags, scmn_fcc2mt);
    FUNCTION(scmn_fcc2mt_aud, 2, tags, scmn_fcc2mt_aud);
    FUNCTION(scmn_fcc2mt_vid, 2, tags, scmn_fcc2mt_vid);
    FUNCTION(scmn_fcc2mt_drm, 2, tags, scmn_fcc2mt_drm);
#undef FUNCTION

#define READER(call) add_plain("scmn_bsr_" #call, 4 * usual, reader, call)
    READER(init);
    READER(flush);
    READER(read);
    READER(read1);
    READER(skip);
    READER(peek);
    READER(skip_peek);
    READER(skip_to_align8);
    READER(le_flush);
    READER(le_read);
    READER(le_skip);
    READER(le_skip_to_align8);
#undef READER
    add_plain("scmn_bsw_init", 4 * usual, writer, 8);
    add_plain("scmn_bsw_write", 4 * usual, writer, 40);
    add_plain("scmn_bsw_write1", 4 * usual, writer, 1);

    add_plain("scmn_irsz_create", 20 * usual, create);
    add("scmn_irsz_delete", usual, bands, scmn_irsz, -1);
    add("scmn_irsz", 2 * usual, bands, scmn_irsz, -1);
#define FORMAT(name, place)                                                           \
    add("scmn_irsz" #name, usual, bands, scmn_irsz##name, place);                     \
    add("scmn_irsz" #name "_line", usual, row_kernel, scmn_irsz##name##_line, place); \
    add("scmn_irsz" #name "_full", usual, picture_kernel, scmn_irsz##name##_full, place)
    FORMAT(8b, 0);
    FORMAT(8b8b8b, 1);
    FORMAT(8b8b8b_5b6b5b, 2);
    FORMAT(5b6b5b, 3);
    FORMAT(8b8b8b8b, 4);
#undef FORMAT
    add_plain("tbl_rsz_weight", 1, weights);
}

}  // namespace tools
