#include "scmn/bits.h"

#include <gtest/gtest.h>

#include "tests/bit_model.h"
#include "tests/rig.h"

namespace {

using bit_model::order;

struct random_pick {
    rig::rng &random;
    uint32_t operator()(uint32_t low, uint32_t high) const {
        return uint32_t(low + random.next() % (uint64_t(high) - low + 1));
    }
};

template <typename Compare>
void compare_many(Compare compare) {
    for (uint32_t round = 0; round < (rig::quick() ? 1000 : 6000); round++) {
        rig::rng random(rig::seed() + uint64_t(round) * 1000);
        const random_pick pick{random};
        std::vector<uint8_t> bytes(pick(0, 3) ? pick(0, 14) : pick(0, 300));
        for (uint8_t &byte : bytes) byte = uint8_t(pick(0, 255));
        const std::string fault = compare(bytes, pick, int(bytes.size()) + 12);
        ASSERT_EQ(fault, "") << "round " << round << " of seed " << rig::seed();
    }
}

TEST(bits, reader_is_a_row_of_bits) {
    for (order o : {order::msb_first, order::lsb_first})
        compare_many([&](auto &bytes, auto pick, int operations) {
            return bit_model::compare_reader(bytes, o, pick, operations);
        });
}

TEST(bits, writer_is_a_row_of_bits) {
    compare_many([](auto &bytes, auto pick, int operations) {
        return bit_model::compare_writer(bytes, pick, operations);
    });
}

// Known answers, for both orders.
TEST(bits, reads_known_bits) {
    const uint8_t bytes[] = {0xA5, 0x0F};
    scmn_bsr_ctx ctx;
    scmn_bsr_init(&ctx, bytes, 2, nullptr);
    EXPECT_EQ(scmn_bsr_read(&ctx, 4), 0xAu);
    EXPECT_EQ(scmn_bsr_read(&ctx, 8), 0x50u);
    EXPECT_EQ(scmn_bsr_read(&ctx, 4), 0xFu);
    EXPECT_EQ(scmn_bsr_read(&ctx, 1), 0xFFFFFFFFu);
    scmn_bsr_init(&ctx, bytes, 2, scmn_bsr_le_flush);
    EXPECT_EQ(scmn_bsr_le_read(&ctx, 4), 0x5u);
    EXPECT_EQ(scmn_bsr_le_read(&ctx, 8), 0xFAu);
    EXPECT_EQ(scmn_bsr_le_read(&ctx, 4), 0x0u);
    EXPECT_EQ(scmn_bsr_le_read(&ctx, 1), 0xFFFFFFFFu);

    const uint8_t five[] = {0x12, 0x34, 0x56, 0x78, 0x9A};
    scmn_bsr_init(&ctx, five, 5, nullptr);
    scmn_bsr_skip(&ctx, 3);
    EXPECT_EQ(scmn_bsr_peek(&ctx, 32), 0x91A2B3C4u);
    EXPECT_EQ(scmn_bsr_read(&ctx, 32), 0x91A2B3C4u);
    EXPECT_EQ(scmn_bsr_skip_peek(&ctx, 1, 4), 0xAu);
}

// An over-read leaves a negative count; everything that follows tries to refill and says so.
TEST(bits, over_read_is_followed_by_the_end) {
    const uint8_t byte = 0xC3;
    for (int operation = 0; operation < 5; operation++) {
        scmn_bsr_ctx ctx;
        scmn_bsr_init(&ctx, &byte, 1, nullptr);
        EXPECT_EQ(scmn_bsr_read(&ctx, 12), 0xC30u);
        EXPECT_EQ(ctx.bits, -4);
        switch (operation) {
            case 0:
                EXPECT_EQ(scmn_bsr_read1(&ctx), 0xFFFFFFFFu);
                break;
            case 1:
                EXPECT_EQ(scmn_bsr_read(&ctx, 0), 0xFFFFFFFFu);
                break;
            case 2:
                EXPECT_EQ(scmn_bsr_skip_peek(&ctx, 0, 32), 0u);
                break;
            case 3:
                scmn_bsr_skip(&ctx, 32);
                break;
            default:
                EXPECT_EQ(scmn_bsr_peek(&ctx, 32), 0u);
        }
        EXPECT_EQ(ctx.bits, operation == 4 ? -4 : 0);
        EXPECT_EQ(ctx.cache, 0u);
    }
}

// No buffer at all, of size 0 or less.
TEST(bits, nothing_to_read_or_write) {
    const rig::guarded nothing(0);
    for (int32_t size : {0, -1, INT32_MIN + 1})
        for (uint8_t *at : {nothing.data(), static_cast<uint8_t *>(nullptr)}) {
            scmn_bsr_ctx reader;
            scmn_bsr_init(&reader, at, size, nullptr);
            EXPECT_EQ(scmn_bsr_read(&reader, 0), 0u);
            EXPECT_EQ(scmn_bsr_peek(&reader, 32), 0u);
            EXPECT_EQ(scmn_bsr_read(&reader, 8), 0xFFFFFFFFu);
            EXPECT_EQ(scmn_bsr_read1(&reader), 0xFFFFFFFFu);
            scmn_bsw_ctx writer;
            scmn_bsw_init(&writer, at, size, nullptr);
            EXPECT_EQ(scmn_bsw_write1(&writer, 1), -1);
            EXPECT_EQ(scmn_bsw_write(&writer, 1, 9), -1);
            EXPECT_EQ(scmn_bsw_write(&writer, 1, 0), -1);
            EXPECT_EQ(writer.cur, at);
            EXPECT_EQ(writer.free_bits, 8);
        }
}

// Refills ask for what the cache can take, and load no more than they are asked for.
TEST(bits, refills) {
    const rig::guarded buffer(6);
    for (int i = 0; i < 6; i++) buffer.data()[i] = uint8_t(0x11 * (i + 1));
    for (int32_t n = -1; n <= 5; n++) {
        scmn_bsr_ctx ctx;
        scmn_bsr_init(&ctx, buffer.data(), 6, nullptr);
        const int32_t loaded = std::clamp(n, 0, 4);
        ctx.cache = 123, ctx.bits = 7;
        EXPECT_EQ(scmn_bsr_flush(&ctx, n), loaded ? 0 : -1);
        EXPECT_EQ(ctx.bits, 8 * loaded);
        EXPECT_EQ(ctx.cache, loaded ? 0x11223344u >> (32 - 8 * loaded) << (32 - 8 * loaded) : 0);
        EXPECT_EQ(ctx.cur, buffer.data() + loaded);
        ctx.cur = buffer.data();
        EXPECT_EQ(scmn_bsr_le_flush(&ctx, n), loaded ? 0 : -1);
        EXPECT_EQ(ctx.cache, loaded ? 0x44332211u & 0xFFFFFFFFu >> (32 - 8 * loaded) : 0);
        EXPECT_EQ(ctx.bits, 8 * loaded);
    }
}

// Whatever a refill returns, other than 0, is the end; what it left in the context is lost.
TEST(bits, refills_fail_with_any_value) {
    for (const int32_t result : {1, -1, 2, INT32_MAX, INT32_MIN}) {
        static int32_t answer;
        answer = result;
        const auto failing = [](scmn_bsr_ctx *ctx, int32_t) {
            ctx->cache = 0, ctx->bits = 0;
            return answer;
        };
        const auto after_4_bits = [&](uint32_t cache) {
            scmn_bsr_ctx ctx;
            scmn_bsr_init(&ctx, nullptr, 0, failing);
            ctx.cache = cache, ctx.bits = 4;
            return ctx;
        };
        scmn_bsr_ctx ctx = after_4_bits(0xA0000000);
        EXPECT_EQ(scmn_bsr_read(&ctx, 5), 0xFFFFFFFFu);
        ctx.bits = 0;
        EXPECT_EQ(scmn_bsr_read1(&ctx), 0xFFFFFFFFu);
        ctx = after_4_bits(0xA0000000);
        scmn_bsr_skip(&ctx, 5);
        EXPECT_EQ(ctx.bits, 0);
        ctx = after_4_bits(0xA0000000);
        EXPECT_EQ(scmn_bsr_skip_peek(&ctx, 5, 3), 0u);
        EXPECT_EQ(ctx.bits, 0);
        ctx = after_4_bits(0xA0000000);
        EXPECT_EQ(scmn_bsr_peek(&ctx, 8), 0xA0u);
        EXPECT_EQ(ctx.bits, 4);
        ctx = after_4_bits(0xA);
        EXPECT_EQ(scmn_bsr_le_read(&ctx, 5), 0xFFFFFFFFu);
        EXPECT_EQ(ctx.bits, 0);
    }
}

// Counts that make no sense do no harm: nothing is touched outside the buffer.
TEST(bits, impossible_counts_are_harmless) {
    const int32_t counts[] = {INT32_MIN, INT32_MIN + 1, -33, -32, -1, 33, 40, 64, INT32_MAX};
    const rig::guarded buffer(7);
    std::fill(buffer.data(), buffer.end(), uint8_t(0x5A));
    for (int32_t n : counts)
        for (int32_t before = 0; before <= 56; before += 7)
            for (int operation = 0; operation < 7; operation++) {
                const bool msb = operation < 5;
                scmn_bsr_ctx ctx;
                scmn_bsr_init(&ctx, buffer.data(), 7, msb ? nullptr : scmn_bsr_le_flush);
                for (int i = 0; i < before; i += 7)
                    msb ? scmn_bsr_read(&ctx, 7) : scmn_bsr_le_read(&ctx, 7);
                for (int again = 0; again < 3; again++) switch (operation) {
                        case 0:
                            scmn_bsr_read(&ctx, n);
                            break;
                        case 1:
                            scmn_bsr_skip(&ctx, n);
                            break;
                        case 2:
                            scmn_bsr_peek(&ctx, n);
                            break;
                        case 3:
                            scmn_bsr_skip_peek(&ctx, n, 8);
                            break;
                        case 4:
                            scmn_bsr_skip_peek(&ctx, 8, n);
                            break;
                        case 5:
                            scmn_bsr_le_read(&ctx, n);
                            break;
                        default:
                            scmn_bsr_le_skip(&ctx, n);
                    }
                EXPECT_GE(ctx.cur, buffer.data());
                EXPECT_LE(ctx.cur, buffer.end());
                // What was lost is not found again, and initialising heals.
                msb ? scmn_bsr_skip_to_align8(&ctx) : scmn_bsr_le_skip_to_align8(&ctx);
                scmn_bsr_init(&ctx, buffer.data(), 7, nullptr);
                EXPECT_EQ(scmn_bsr_read(&ctx, 8), 0x5Au);
            }
}

// A refill of the caller may go on in another buffer: a chain of buffers reads like one.
struct chained : scmn_bsr_ctx {
    std::vector<std::vector<uint8_t>> links;
    size_t next = 0;
    int asked_too_much = 0;
    order bit_order = order::msb_first;
};

int32_t chain_refill(scmn_bsr_ctx *ctx, int32_t nbytes) {
    chained *chain = static_cast<chained *>(ctx);
    chain->asked_too_much += nbytes < 1 || nbytes > 4;
    uint8_t bytes[4];
    int32_t count = 0;
    for (; count < nbytes; count++) {
        while (ctx->cur == ctx->last + 1 && chain->next < chain->links.size()) {
            const auto &link = chain->links[chain->next++];
            ctx->cur = link.data();
            ctx->last = link.data() + link.size() - 1;
        }
        if (ctx->cur == ctx->last + 1) break;
        bytes[count] = *ctx->cur++;
    }
    scmn_bsr_ctx copy;
    scmn_bsr_init(&copy, bytes, count, nullptr);
    const int32_t result =
        (chain->bit_order == order::msb_first ? scmn_bsr_flush : scmn_bsr_le_flush)(&copy, nbytes);
    ctx->cache = copy.cache;
    ctx->bits = copy.bits;
    return result;
}

TEST(bits, a_refill_may_chain_buffers) {
    for (uint32_t round = 0; round < 300; round++) {
        rig::rng random(rig::seed() + uint64_t(round) * 1000);
        const random_pick pick{random};
        chained ctx;
        const bool msb = round % 2;
        ctx.bit_order = msb ? order::msb_first : order::lsb_first;
        std::vector<uint8_t> all;
        for (uint32_t i = pick(1, 9); i > 0; i--) {
            std::vector<uint8_t> link(pick(1, 7));
            for (uint8_t &byte : link) byte = uint8_t(pick(0, 255)), all.push_back(byte);
            ctx.links.push_back(link);
        }
        scmn_bsr_init(&ctx, ctx.links[0].data(), 0, chain_refill);
        bit_model::reader model(all.data(), int64_t(all.size()), ctx.bit_order);
        // Peeks borrow from the byte at cur only, so at the seam of two links they see less.
        while (model.bits() > 0 || model.loaded() < int64_t(all.size())) {
            const int n = int(pick(0, 32));
            if (msb && pick(0, 1)) {
                model.skip(n), scmn_bsr_skip(&ctx, n);
            } else {
                ASSERT_EQ((msb ? scmn_bsr_read : scmn_bsr_le_read)(&ctx, n), model.read(n))
                    << "round " << round << " of seed " << rig::seed();
            }
            ASSERT_EQ(ctx.bits, model.bits()) << "round " << round << " of seed " << rig::seed();
            ASSERT_EQ(ctx.cache, model.cache()) << "round " << round << " of seed " << rig::seed();
        }
        EXPECT_EQ(ctx.asked_too_much, 0);
    }
}

int completed = 0;
uint8_t last_completed = 0;

TEST(bits, writes_known_bits) {
    uint8_t bytes[2] = {0xFF, 0xFF};
    scmn_bsw_ctx ctx;
    scmn_bsw_init(&ctx, bytes, 2, [](scmn_bsw_ctx *c) -> int32_t {
        completed++;
        last_completed = *c->cur;
        return -1;
    });
    for (uint32_t bit : {1, 0, 1}) EXPECT_EQ(scmn_bsw_write1(&ctx, bit), 0);
    EXPECT_EQ(scmn_bsw_write(&ctx, 0x1F, 5), 0);
    EXPECT_EQ(completed, 1);
    EXPECT_EQ(last_completed, 0xBF);
    EXPECT_EQ(ctx.cur, bytes + 1);
    EXPECT_EQ(scmn_bsw_write(&ctx, 0x3FF, 10), -1);  // eight of them fit
    EXPECT_EQ(bytes[1], 0xFF);
    EXPECT_EQ(ctx.cur, bytes + 2);
    EXPECT_EQ(completed, 2);
    EXPECT_EQ(scmn_bsw_write1(&ctx, 0), -1);
}

TEST(bits, leading_zeros) {
    EXPECT_EQ(scmn_bsr_clz_in_code(0), 32);
    for (int i = 0; i < 32; i++) {
        EXPECT_EQ(scmn_bsr_clz_in_code(1u << i), 31 - i);
        EXPECT_EQ(scmn_bsr_clz_in_code(0xFFFFFFFFu >> i), i);
    }
}

}  // namespace
