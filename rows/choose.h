// Which instruction set the library uses.
#ifndef ROWS_CHOOSE_H
#define ROWS_CHOOSE_H

#include <atomic>

#include "rows/table.h"

namespace simgp {

// The instruction sets, from the least to the most wanted.
enum class target : uint8_t { scalar, neon, sse41, avx2, avx512, count };

const char *target_name(target t);

// What a processor offers, with its operating system.
struct cpu {
    bool neon = false, sse41 = false, avx2 = false, avx512 = false;
    bool fast_strings = false;  // x86: ERMS
};

// x86: what the instruction CPUID says, and the register states that the operating system saves (XCR0).
struct cpuid_words {
    uint32_t leaf1_ecx = 0, leaf7_ebx = 0, leaf7_ecx = 0, saved_states = 0;
};
cpu features_of(const cpuid_words &words);

// Compiled into this build, and offered by the processor and the operating system.
bool target_available(target t);

// The rows of one target; t must be available.
const row_table &rows_of(target t);

// The rows in use: those of the most wanted target that is available, unless a test or a benchmark
// has forced others. The choice is made at the first call, on whatever thread that is. Inline,
// as a call shows in fills of some hundred bytes.
extern std::atomic<const row_table *> live_table;  // null until the choice is made
const row_table &choose_rows();
inline const row_table &live_rows() {
    const row_table *table = live_table.load(std::memory_order_acquire);
    return table ? *table : choose_rows();
}

// The same for rows of `width` samples: where that is less than a vector, the rows of an instruction
// set with shorter ones, which the same processor has.
const row_table &live_rows(ptrdiff_t width);

// The target in use.
target live_target();

// For tests and benchmarks: makes `table` the rows in use from now on, for all threads; null goes
// back to the library's own choice.
void force_rows(const row_table *table);

}  // namespace simgp

#endif
