// The small chores: fills and block copy against the C library, bits against the readers and writers
// of media frameworks, the start-code scan against one built on memchr.
#include <benchmark/benchmark.h>
#include <gst/base/gstbitreader.h>
#include <gst/base/gstbitwriter.h>
#include <ogg/ogg.h>
#include <stdlib.h>
#include <string.h>
#include <wchar.h>

#include <random>

#include "bench/bench.h"
#include "scmn/scmn.h"

namespace bench {
namespace {

using buffer = std::shared_ptr<uint8_t>;

// Memory on pages that exist.
buffer memory(size_t size, int value) {
    buffer b(static_cast<uint8_t *>(aligned_alloc(4096, (size + 4095) / 4096 * 4096)), free);
    if (!b) fail("not enough memory");
    memset(b.get(), value, size);
    return b;
}

const std::vector<std::string> memory_sizes = {"16KiB", "256KiB", "4MiB", "256MiB"};
size_t bytes_of(const std::string &size) {
    return size_t(atoi(size.c_str())) << (size.find("MiB") == std::string::npos ? 10 : 20);
}

// Also once 3 bytes off any alignment, where the pattern has to be turned.
comparison fill(const std::string &name, void (*run)(void *, uint32_t, int32_t), int32_t unit,
                uint32_t value, size_t offset) {
    return {name, memory_sizes, [=](const std::string &size) {
                const size_t n = bytes_of(size);
                const buffer b = memory(n + offset, 1);
                uint8_t *p = b.get() + offset;
                match result{double(n),
                             [=] {
                                 run(p, value, int32_t(n) / unit);
                                 benchmark::DoNotOptimize(b.get());
                                 benchmark::ClobberMemory();
                             },
                             {{"memset",
                               [=] {
                                   memset(p, int(value & 255), n);
                                   benchmark::DoNotOptimize(b.get());
                                   benchmark::ClobberMemory();
                               }}},
                             {},
                             {0.95, 0, 0}};
                // The only one that can repeat four bytes, where a wchar_t may lie.
                if (offset % sizeof(wchar_t) == 0 && sizeof(wchar_t) == sizeof value)
                    result.peers.push_back({"wmemset", [=] {
                                                wmemset(reinterpret_cast<wchar_t *>(p),
                                                        wchar_t(value), n / 4);
                                                benchmark::DoNotOptimize(b.get());
                                                benchmark::ClobberMemory();
                                            }});
                return result;
            }};
}

[[gnu::noinline]] void read_lines(const uint8_t *p, size_t n) {
    uint64_t sum = 0, word;
    for (size_t i = 0; i < n; i += 64) memcpy(&word, p + i, 8), sum += word;
    benchmark::DoNotOptimize(sum);
}

// Who fills reads it again: does the way of filling cost the reader?
comparison fill_and_read(const std::string &name) {
    return {name, memory_sizes, [=](const std::string &size) {
                const size_t n = bytes_of(size);
                const buffer b = memory(n, 1);
                return match{
                    double(n),
                    [=] { scmn_mset_x64(b.get(), 0x11223344, int32_t(n)), read_lines(b.get(), n); },
                    {{"memset", [=] { memset(b.get(), 0x44, n), read_lines(b.get(), n); }}},
                    {},
                    {0.95, 0, 0}};
            }};
}

comparison block_copy(const std::string &name, int32_t width, int32_t padding) {
    return {name, memory_sizes, [=](const std::string &size) {
                const size_t n = bytes_of(size);
                const int32_t row = width ? width : int32_t(n), height = int32_t(n / size_t(row));
                const int32_t stride = row + padding;
                const buffer a = memory(size_t(stride) * size_t(height), 1);
                const buffer b = memory(size_t(stride) * size_t(height), 2);
                return match{double(row) * height,
                             [=] { scmn_blk_mcpy(b.get(), a.get(), stride, stride, row, height); },
                             {{"memcpy",
                               [=] {
                                   for (int32_t y = 0; y < height; y++)
                                       memcpy(b.get() + ptrdiff_t(y) * stride,
                                              a.get() + ptrdiff_t(y) * stride, size_t(row));
                                   benchmark::DoNotOptimize(b.get());
                                   benchmark::ClobberMemory();
                               }}},
                             {},
                             {0.95, 0, 0}};
            }};
}

// What a parser does: mostly short fields, single flags, some long ones; looks and skips.
struct step {
    enum { read, flag, peek, skip } what;
    int n;
};
struct script {
    std::vector<step> steps;
    std::vector<uint32_t> values;  // to write
    int64_t bits = 0;
};
std::shared_ptr<script> make_script(int count, bool writing) {
    auto s = std::make_shared<script>();
    std::mt19937 random(1);
    for (int i = 0; i < count; i++) {
        const int kind = int(random() % 8);
        step next{step::read, kind < 6 ? 1 + int(random() % 12) : 1 + int(random() % 32)};
        if (kind == 1) next = {step::flag, 1};
        if (!writing && kind == 2) next.what = step::skip;
        if (!writing && kind == 3) next.what = step::peek;
        s->steps.push_back(next);
        s->values.push_back(uint32_t(random()));
        s->bits += next.what == step::peek ? 0 : next.n;
    }
    return s;
}

uint32_t read_ours(const script &s, const uint8_t *data, int32_t size) {
    scmn_bsr_ctx bits;
    scmn_bsr_init(&bits, data, size, nullptr);
    uint32_t sum = 0;
    for (const step &next : s.steps) switch (next.what) {
            case step::read:
                sum = sum * 3 + scmn_bsr_read(&bits, next.n);
                break;
            case step::flag:
                sum = sum * 3 + scmn_bsr_read1(&bits);
                break;
            case step::peek:
                sum = sum * 3 + scmn_bsr_peek(&bits, next.n);
                break;
            case step::skip:
                scmn_bsr_skip(&bits, next.n);
                break;
        }
    return sum;
}

uint32_t read_gst(const script &s, const uint8_t *data, int32_t size) {
    GstBitReader bits;
    gst_bit_reader_init(&bits, data, guint(size));
    uint32_t sum = 0, value = 0;
    for (const step &next : s.steps) switch (next.what) {
            case step::read:
            case step::flag:
                if (!gst_bit_reader_get_bits_uint32(&bits, &value, guint(next.n))) return 0;
                sum = sum * 3 + value;
                break;
            case step::peek:
                if (!gst_bit_reader_peek_bits_uint32(&bits, &value, guint(next.n))) return 0;
                sum = sum * 3 + value;
                break;
            case step::skip:
                if (!gst_bit_reader_skip(&bits, guint(next.n))) return 0;
                break;
        }
    return sum;
}

match bit_reads(const std::string &) {
    const auto s = make_script(20000, false);
    const int32_t size = int32_t(s->bits / 8 + 8);
    const buffer data = memory(size_t(size), 0);
    std::mt19937 random(2);
    for (int32_t i = 0; i < size; i++) data.get()[i] = uint8_t(random());
    if (read_ours(*s, data.get(), size) != read_gst(*s, data.get(), size))
        fail("the bit readers differ");
    return {double(s->steps.size()),
            [=] { benchmark::DoNotOptimize(read_ours(*s, data.get(), size)); },
            {{"gstreamer", [=] { benchmark::DoNotOptimize(read_gst(*s, data.get(), size)); }}},
            {},
            {1.2, 0, 0}};
}

match bit_writes(const std::string &) {
    const auto s = make_script(20000, true);
    const int32_t size = int32_t(s->bits / 8 + 8);
    const buffer data = memory(size_t(size), 0);
    const auto ours = [=] {
        scmn_bsw_ctx bits;
        scmn_bsw_init(&bits, data.get(), size, nullptr);
        for (size_t i = 0; i < s->steps.size(); i++)
            scmn_bsw_write(&bits, s->values[i], s->steps[i].n);
        benchmark::ClobberMemory();
    };
    const std::shared_ptr<oggpack_buffer> packer(new oggpack_buffer, [](oggpack_buffer *p) {
        oggpackB_writeclear(p);
        delete p;
    });
    oggpackB_writeinit(packer.get());
    const auto theirs = [=] {
        oggpackB_reset(packer.get());
        for (size_t i = 0; i < s->steps.size(); i++)
            oggpackB_write(packer.get(), s->values[i], s->steps[i].n);
        benchmark::ClobberMemory();
    };
    ours();
    theirs();
    if (memcmp(data.get(), oggpackB_get_buffer(packer.get()), size_t(s->bits / 8)) != 0)
        fail("the bit writers differ");
    return {double(s->steps.size()), ours, {{"libogg", theirs}}, {}, {1.0, 0, 0}};
}

// Calls by themselves, many times. GStreamer's are inline functions of its headers: what a call costs
// is what it has ahead.
constexpr int single_calls = 8000;

match single_bits_read(const std::string &) {
    const buffer data = memory(single_calls / 8, 0x5A);
    return {double(single_calls),
            [=] {
                scmn_bsr_ctx bits;
                scmn_bsr_init(&bits, data.get(), single_calls / 8, nullptr);
                uint32_t sum = 0;
                for (int i = 0; i < single_calls; i++) sum += scmn_bsr_read1(&bits);
                benchmark::DoNotOptimize(sum);
            },
            {{"gstreamer",
              [=] {
                  GstBitReader bits;
                  gst_bit_reader_init(&bits, data.get(), single_calls / 8);
                  uint32_t sum = 0;
                  uint8_t bit = 0;
                  for (int i = 0; i < single_calls; i++) {
                      if (!gst_bit_reader_get_bits_uint8(&bits, &bit, 1)) return;
                      sum += bit;
                  }
                  benchmark::DoNotOptimize(sum);
              }}},
            {},
            {1.0, 0, 0}};
}

match single_bits_written(const std::string &) {
    const buffer data = memory(single_calls / 8, 0);
    return {double(single_calls),
            [=] {
                scmn_bsw_ctx bits;
                scmn_bsw_init(&bits, data.get(), single_calls / 8, nullptr);
                for (int i = 0; i < single_calls; i++) scmn_bsw_write1(&bits, uint32_t(i ^ i >> 3));
                benchmark::ClobberMemory();
            },
            {{"gstreamer",
              [=] {
                  GstBitWriter bits;
                  gst_bit_writer_init_with_data(&bits, data.get(), single_calls / 8, FALSE);
                  for (int i = 0; i < single_calls; i++)
                      if (!gst_bit_writer_put_bits_uint8(&bits, uint8_t((i ^ i >> 3) & 1), 1))
                          return;
                  benchmark::ClobberMemory();
              }}},
            {},
            {1.0, 0, 0}};
}

// As a table of codes is used: looks at nine bits, passes over five.
match peeks_and_skips(const std::string &) {
    constexpr int size = single_calls * 5 / 8 + 8;
    const buffer data = memory(size, 0x5A);
    return {double(single_calls),
            [=] {
                scmn_bsr_ctx bits;
                scmn_bsr_init(&bits, data.get(), size, nullptr);
                uint32_t sum = 0;
                for (int i = 0; i < single_calls; i++) {
                    sum += scmn_bsr_peek(&bits, 9);
                    scmn_bsr_skip(&bits, 5);
                }
                benchmark::DoNotOptimize(sum);
            },
            {{"gstreamer",
              [=] {
                  GstBitReader bits;
                  gst_bit_reader_init(&bits, data.get(), size);
                  uint32_t sum = 0, value = 0;
                  for (int i = 0; i < single_calls; i++) {
                      if (!gst_bit_reader_peek_bits_uint32(&bits, &value, 9)) return;
                      sum += value;
                      if (!gst_bit_reader_skip(&bits, 5)) return;
                  }
                  benchmark::DoNotOptimize(sum);
              }}},
            {},
            {1.0, 0, 0}};
}

// Start codes by way of the 1 in them, which is as rare as any byte.
int32_t scan_by_memchr(int32_t type, const uint8_t *buf, int32_t size) {
    const uint8_t *p = buf + 2, *end = buf + size - 2;
    while (p < end && (p = static_cast<const uint8_t *>(memchr(p, 1, size_t(end - p))))) {
        if (p[-1] == 0 && p[-2] == 0) {
            if (type == SCMN_MT_MPEG4 && p[1] == 0xB6) return p[2] < 0x40;
            if (type == SCMN_MT_H264 && (p[1] & 31) == 5) return 1;
            if (type == SCMN_MT_H264 && (p[1] & 31) == 1) return 0;
        }
        p++;
    }
    return 0;
}

// 200 KB of coded data in front of the picture that decides, without start codes in it: random bytes, of
// which `zeros` in a hundred are 0.
comparison scan(const std::string &name, int32_t type, int zeros) {
    return {name, {"200KB"}, [=](const std::string &) {
                const int32_t size = 200000;
                const buffer data = memory(size_t(size), 0);
                uint8_t *b = data.get();
                std::mt19937 random(3);
                for (int32_t i = 0; i < size; i++) {
                    b[i] = int(random() % 100) < zeros ? 0 : uint8_t(random());
                    if (i >= 2 && b[i - 2] == 0 && b[i - 1] == 0 && b[i] == 1) b[i] = 3;
                }
                memcpy(b, "\0\0\0\1\6", 5);
                memcpy(b + size - 6, type == SCMN_MT_H264 ? "\0\0\0\1\x65" : "\0\0\1\xB6\x10", 6);
                const auto ours = [=] { return scmn_is_vkeyfrm(type, b, size); };
                const auto theirs = [=] { return scan_by_memchr(type, b, size); };
                if (ours() != 1 || theirs() != 1) fail("the scans differ");
                return match{double(size),
                             [=] { (void)data, benchmark::DoNotOptimize(ours()); },
                             {{"memchr", [=] { (void)data, benchmark::DoNotOptimize(theirs()); }}},
                             {},
                             {1.0, 0, 0}};
            }};
}

}  // namespace

std::vector<comparison> scmn_comparisons() {
    const auto clear = [](void *p, uint32_t, int32_t words) { scmn_mclr_x64(p, words); };
    return {
        fill("scmn_mset_x128", scmn_mset_x128, 1, 0x11223344, 0),
        fill("scmn_mset_x64", scmn_mset_x64, 1, 0x11223344, 0),
        fill("scmn_mset_x64a", scmn_mset_x64a, 1, 0x11223344, 0),
        fill("scmn_mset_x64a unaligned", scmn_mset_x64a, 1, 0x11223344, 3),
        fill("scmn_mset_x32", scmn_mset_x32, 1, 0x11223344, 0),
        fill("scmn_mset_x32ax4", scmn_mset_x32ax4, 1, 0x11223344, 0),
        fill("scmn_mclr_x64", clear, 4, 0, 0),
        fill_and_read("scmn_mset_x64, then read"),
        block_copy("scmn_blk_mcpy, one row", 0, 0),
        block_copy("scmn_blk_mcpy, rows of 1 KiB", 1024, 64),
        {"bits, mixed reads", {"20000"}, bit_reads},
        {"bits, mixed writes", {"20000"}, bit_writes},
        {"bits, scmn_bsr_read1", {"8000"}, single_bits_read},
        {"bits, scmn_bsw_write1", {"8000"}, single_bits_written},
        {"bits, peek and skip", {"8000"}, peeks_and_skips},
        scan("scmn_is_vkeyfrm H.264", SCMN_MT_H264, 0),
        scan("scmn_is_vkeyfrm H.264, 60 % zeros", SCMN_MT_H264, 60),
        scan("scmn_is_vkeyfrm H.264, 95 % zeros", SCMN_MT_H264, 95),
        scan("scmn_is_vkeyfrm MPEG-4", SCMN_MT_MPEG4, 0),
        scan("scmn_is_vkeyfrm MPEG-4, 60 % zeros", SCMN_MT_MPEG4, 60),
        scan("scmn_is_vkeyfrm MPEG-4, 95 % zeros", SCMN_MT_MPEG4, 95),
    };
}

}  // namespace bench
