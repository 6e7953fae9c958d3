// The bit reader and writer as they look from outside: a row of single bits, no caches and no
// shifts of words. The tests and the fuzzers let it run beside the real ones and compare results
// and states.
#ifndef TESTS_BIT_MODEL_H
#define TESTS_BIT_MODEL_H

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "scmn/bits.h"
#include "tests/guard.h"

namespace bit_model {

enum class order { msb_first, lsb_first };

class reader {
  public:
    reader(const uint8_t *bytes, int64_t size, order o)
        : size_(std::max<int64_t>(size, 0)), order_(o) {
        for (int64_t i = 0; i < 8 * size_; i++) {
            const int place = int(i % 8);
            stream_.push_back(bytes[i / 8] >> (o == order::msb_first ? 7 - place : place) & 1);
        }
    }

    int64_t bits() const { return 8 * loaded_ - position_; }
    int64_t loaded() const { return loaded_; }
    uint32_t cache() const {
        uint32_t word = 0;
        for (int64_t i = 0; i < bits(); i++)
            word |= uint32_t(stream_[size_t(position_ + i)])
                    << (order_ == order::msb_first ? 31 - i : i);
        return word;
    }

    uint32_t read(int n) {
        const int64_t have = bits();
        if (have < n && !refill(4)) return 0xFFFFFFFF;
        const uint32_t value = look(n);
        position_ += n;
        // Dropping 32 bits least significant first leaves an empty cache, not a negative count.
        if (order_ == order::lsb_first && have < n && n - have == 32) position_ = 8 * loaded_;
        return value;
    }
    void skip(int n) {
        if (bits() >= n || refill(4)) position_ += n;
    }
    uint32_t peek(int n) {
        // Whole bytes that fit beside the bits there are.
        if (bits() < n) loaded_ += std::clamp<int64_t>((32 - bits()) / 8, 0, size_ - loaded_);
        return look(n);
    }
    uint32_t skip_peek(int nskip, int npeek) {
        if (bits() < nskip && !refill(4)) return 0;
        position_ += nskip;
        return bits() >= npeek ? look(npeek) : peek(npeek);
    }
    void drop(int n) { position_ += n; }
    void align() { position_ += bits() & 7; }

  private:
    bool refill(int64_t bytes) {
        if (loaded_ == size_) {
            position_ = 8 * loaded_;
            return false;
        }
        loaded_ += std::min(bytes, size_ - loaded_);
        return true;
    }
    uint32_t look(int n) const {
        uint32_t value = 0;
        for (int i = 0; i < n; i++) {
            const int64_t at = position_ + i;
            const uint32_t bit = at < 8 * size_ ? stream_[size_t(at)] : 0;
            value |= bit << (order_ == order::msb_first ? n - 1 - i : i);
        }
        return value;
    }

    std::vector<bool> stream_;
    int64_t size_;
    order order_;
    int64_t position_ = 0;  // bits consumed, past the end too
    int64_t loaded_ = 0;    // bytes that went through the cache
};

// A writer that changes one bit at a time.
class writer {
  public:
    using callback = void (*)(writer &);
    explicit writer(std::vector<uint8_t> content, callback on_byte = nullptr)
        : bytes(std::move(content)), on_byte_(on_byte) {}

    int32_t write(uint32_t value, int n) {
        if (cur >= bytes.size()) return -1;
        for (int i = std::min(n, 32) - 1; i >= 0; i--) {
            if (cur >= bytes.size()) return -1;
            bytes[cur] = uint8_t(2 * bytes[cur] + (value >> i & 1));
            if (--free_bits == 0) {
                if (on_byte_) on_byte_(*this);
                free_bits = 8;
                cur++;
            }
        }
        return 0;
    }

    std::vector<uint8_t> bytes;
    size_t cur = 0;
    int free_bits = 8;

  private:
    callback on_byte_;
};

// `pick(low, high)` gives numbers within the two, from a random generator or from a fuzzer. Both
// functions return what went wrong first, or nothing. What the header puts in place of a call and the
// library's function serve one record by turns.
template <typename Pick>
std::string compare_reader(const std::vector<uint8_t> &bytes, order o, Pick pick, int operations) {
    const bool msb = o == order::msb_first;
    const rig::guarded buffer(bytes.size(), pick(0, 1) ? rig::flush::at_end : rig::flush::at_start);
    std::copy(bytes.begin(), bytes.end(), buffer.data());
    const int32_t size = int32_t(bytes.size());

    reader model(buffer.data(), size, o);
    scmn_bsr_ctx ctx;
    scmn_bsr_init(&ctx, buffer.data(), size, msb ? nullptr : scmn_bsr_le_flush);
    const scmn_bsr_refill_fn refill = msb ? scmn_bsr_flush : scmn_bsr_le_flush;

    std::ostringstream trace;
    for (int i = 0; i < operations; i++) {
        const bool called = pick(0, 1);
        if (called) trace << " called";
        const int n = pick(0, 3) ? int(pick(0, 32)) : int(pick(0, 1)) * 32;
        uint32_t expected = 0, got = 0;
        switch (msb ? pick(0, 5) : 6 + pick(0, 2)) {
            case 0:
                trace << " read(" << n << ")";
                expected = model.read(n);
                got = called ? (scmn_bsr_read)(&ctx, n) : scmn_bsr_read(&ctx, n);
                break;
            case 1:
                trace << " read1";
                expected = model.read(1);
                got = called ? (scmn_bsr_read1)(&ctx) : scmn_bsr_read1(&ctx);
                break;
            case 2:
                trace << " skip(" << n << ")";
                model.skip(n);
                called ? (scmn_bsr_skip)(&ctx, n) : scmn_bsr_skip(&ctx, n);
                break;
            case 3:
                trace << " peek(" << n << ")";
                expected = model.peek(n);
                got = called ? (scmn_bsr_peek)(&ctx, n) : scmn_bsr_peek(&ctx, n);
                break;
            case 4: {
                const int next = int(pick(0, 32));
                trace << " skip_peek(" << n << ", " << next << ")";
                expected = model.skip_peek(n, next), got = scmn_bsr_skip_peek(&ctx, n, next);
                break;
            }
            case 5:
                trace << " skip_to_align8";
                model.align(), scmn_bsr_skip_to_align8(&ctx);
                break;
            case 6:
                trace << " le_read(" << n << ")";
                expected = model.read(n), got = scmn_bsr_le_read(&ctx, n);
                break;
            case 7: {
                const int there = std::min(n, std::max(0, int(ctx.bits)));
                trace << " le_skip(" << there << ")";
                model.drop(there);
                scmn_bsr_le_skip(&ctx, there);
                break;
            }
            default:
                trace << " le_skip_to_align8";
                model.align(), scmn_bsr_le_skip_to_align8(&ctx);
        }
        const bool same = got == expected && ctx.cache == model.cache() &&
                          ctx.bits == model.bits() && ctx.cur == buffer.data() + model.loaded() &&
                          ctx.last + 1 == buffer.data() + size && ctx.start == buffer.data() &&
                          ctx.size == size && ctx.refill == refill;
        if (!same) {
            trace << " of " << size << " bytes: result " << std::hex << got << " not " << expected
                  << ", cache " << ctx.cache << " not " << model.cache() << std::dec << ", bits "
                  << ctx.bits << " not " << model.bits() << ", loaded " << ctx.cur - buffer.data()
                  << " not " << model.loaded();
            return trace.str();
        }
    }
    return "";
}

// What a host does on completed bytes: nothing; or the emulation prevention of H.264, which puts a
// 3 behind two zero bytes when the byte after them would be 3 or less, here always.
inline int32_t prevent_emulation(scmn_bsw_ctx *ctx) {
    if (ctx->cur > ctx->start && ctx->cur[-1] == 0 && ctx->cur[0] == 0 && ctx->cur < ctx->last)
        *++ctx->cur = 3;
    return 1;  // ignored
}
inline void prevent_emulation_model(writer &w) {
    if (w.cur > 0 && w.bytes[w.cur - 1] == 0 && w.bytes[w.cur] == 0 && w.cur + 1 < w.bytes.size())
        w.bytes[++w.cur] = 3;
}

template <typename Pick>
std::string compare_writer(const std::vector<uint8_t> &before, Pick pick, int operations) {
    const rig::guarded buffer(before.size(),
                              pick(0, 1) ? rig::flush::at_end : rig::flush::at_start);
    std::copy(before.begin(), before.end(), buffer.data());
    const bool callback = pick(0, 1);
    writer model(before, callback ? prevent_emulation_model : nullptr);
    scmn_bsw_ctx ctx;
    scmn_bsw_init(&ctx, buffer.data(), int32_t(before.size()),
                  callback ? prevent_emulation : nullptr);

    std::ostringstream trace;
    for (int i = 0; i < operations; i++) {
        const bool called = pick(0, 1);
        if (called) trace << " called";
        const uint32_t value = pick(0, 2) ? uint32_t(pick(0, 0xFFFFFFFF)) : 0;
        int32_t expected, got;
        if (pick(0, 2) == 0) {
            trace << " write1(" << value << ")";
            expected = model.write(value & 1, 1);
            got = called ? (scmn_bsw_write1)(&ctx, value) : scmn_bsw_write1(&ctx, value);
        } else {
            int n = int(pick(0, 34)) - 1;
            if (n > 32) n = int(pick(33, 0x7FFFFFFF));
            trace << " write(" << value << ", " << n << ")";
            expected = model.write(value, n), got = scmn_bsw_write(&ctx, value, n);
        }
        const bool same = got == expected && ctx.cur == buffer.data() + model.cur &&
                          ctx.free_bits == model.free_bits &&
                          ctx.last + 1 == buffer.data() + before.size() &&
                          ctx.start == buffer.data() && ctx.size == int32_t(before.size()) &&
                          std::equal(model.bytes.begin(), model.bytes.end(), buffer.data());
        if (!same) {
            trace << " into " << before.size() << " bytes: result " << got << " not " << expected
                  << ", at byte " << ctx.cur - buffer.data() << " not " << model.cur << ", free "
                  << ctx.free_bits << " not " << model.free_bits << ", or other bytes";
            return trace.str();
        }
    }
    return "";
}

}  // namespace bit_model

#endif
