// The choice of the instruction set: the one place that looks at the processor.
#include "rows/choose.h"

#if defined(_WIN32)
#define WIN32_LEAN_AND_MEAN
#include <windows.h>
#else
#include <sched.h>
#endif

#include "areas.h"  // SIMGP_AREAS, made by the build from its list

#if defined(__x86_64__) || defined(__i386__)
#include <cpuid.h>
#elif defined(__arm__)
#include <sys/auxv.h>
#endif

namespace simgp {

std::atomic<const row_table *> live_table;

// clang-format off
#define DECLARE(area) void fill_##area(area##_rows &);
namespace scalar { SIMGP_AREAS(DECLARE) }
namespace neon   { SIMGP_AREAS(DECLARE) }
namespace sse41  { SIMGP_AREAS(DECLARE) }
namespace avx2   { SIMGP_AREAS(DECLARE) }
namespace avx512 { SIMGP_AREAS(DECLARE) }
#undef DECLARE
// clang-format on

#if defined(__x86_64__) || defined(__i386__)

cpu features_of(const cpuid_words &w) {
    const uint32_t saved = w.leaf1_ecx & bit_OSXSAVE ? w.saved_states : 0;
    const bool saves_ymm = (saved & 0x06) == 0x06;  // SSE and AVX state
    const bool saves_zmm = (saved & 0xE6) == 0xE6;  // and opmask, upper halves, upper registers
    // The byte permutes (VBMI) came with the second generation, which no longer slows down for wide
    // integer code: the first generation is better served by AVX2.
    const uint32_t needed = bit_AVX512F | bit_AVX512BW | bit_AVX512DQ | bit_AVX512VL;
    cpu has;
    has.sse41 = w.leaf1_ecx & bit_SSE4_1;
    has.avx2 = saves_ymm && (w.leaf7_ebx & bit_AVX2);
    has.avx512 = saves_zmm && (w.leaf7_ebx & needed) == needed && (w.leaf7_ecx & bit_AVX512VBMI);
    has.fast_strings = w.leaf7_ebx & 1u << 9;
    return has;
}

#endif

namespace {

#if defined(__x86_64__) || defined(__i386__)

// The register states that the operating system saves (XCR0). Written as bytes, since the
// instruction has a compiler intrinsic only where newer instructions are switched on.
uint32_t saved_states() {
    uint32_t low, high;
    __asm__ volatile(".byte 0x0f, 0x01, 0xd0" : "=a"(low), "=d"(high) : "c"(0));
    return low;
}

cpu detect() {
    cpuid_words w;
    uint32_t a, b, c, d;
    if (__get_cpuid(1, &a, &b, &c, &d)) w.leaf1_ecx = c;
    if (w.leaf1_ecx & bit_OSXSAVE) w.saved_states = saved_states();
    if (__get_cpuid_count(7, 0, &a, &b, &c, &d)) w.leaf7_ebx = b, w.leaf7_ecx = c;
    return features_of(w);
}

#elif defined(__arm__)

cpu detect() {
    cpu has;
    has.neon = getauxval(AT_HWCAP) & (1u << 12);  // HWCAP_NEON
    return has;
}

#elif defined(__aarch64__)

cpu detect() { return {.neon = true}; }

#else

cpu detect() { return {}; }

#endif

row_table tables[size_t(target::count)];
bool available[size_t(target::count)];
target best = target::scalar;

// The rows of a target take the place of the scalar ones.
row_table &add_table(target t) {
    constexpr ptrdiff_t vectors[] = {1, 16, 16, 32, 64};
    available[size_t(t)] = true;
    best = t;
    row_table &table = tables[size_t(t)] = tables[size_t(target::scalar)];
    table.vector = vectors[size_t(t)];
    return table;
}

// Rows shorter than the vectors of `wide` are left to those of `narrow`, if there are such.
void leave_short_rows(target wide, target narrow) {
    if (available[size_t(wide)] && available[size_t(narrow)])
        tables[size_t(wide)].for_short = &tables[size_t(narrow)];
}

// Rows that suit the processor better than those of its instruction set in general.
void fit(row_table &table, const cpu &has) {
    if (has.fast_strings && table.mem.fill_with_strings)
        table.mem.fill = table.mem.fill_with_strings;
}

#define FILL(area) fill_##area(table.area);
#define OFFER(name)                                 \
    {                                               \
        using namespace name;                       \
        row_table &table = add_table(target::name); \
        SIMGP_AREAS(FILL)                           \
        fit(table, has);                            \
    }

void fill_tables() {
    const cpu has = detect();
    OFFER(scalar)
#ifdef SIMGP_HAVE_neon
    if (has.neon) OFFER(neon)
#endif
#ifdef SIMGP_HAVE_sse41
    if (has.sse41) OFFER(sse41)
#endif
#ifdef SIMGP_HAVE_avx2
    if (has.avx2) OFFER(avx2)
#endif
#ifdef SIMGP_HAVE_avx512
    if (has.avx512) OFFER(avx512)
#endif
    leave_short_rows(target::avx2, target::sse41);
    leave_short_rows(target::avx512, target::avx2);
    live_table.store(&tables[size_t(best)], std::memory_order_release);
}
#undef FILL
#undef OFFER

#if defined(_WIN32)
void give_way() { SwitchToThread(); }
#else
void give_way() { sched_yield(); }
#endif

// As large as an int: some processors have no atomic exchange of less, and GCC calls a library.
enum class progress : int { none, filling, done };
std::atomic<progress> tables_are{progress::none};

// By whichever thread comes first; the others wait for the microsecond that it takes.
void ensure_tables() {
    progress now = tables_are.load(std::memory_order_acquire);
    if (now == progress::none && tables_are.compare_exchange_strong(now, progress::filling)) {
        fill_tables();
        tables_are.store(now = progress::done, std::memory_order_release);
    }
    while (now != progress::done) {
        give_way();
        now = tables_are.load(std::memory_order_acquire);
    }
}

}  // namespace

const char *target_name(target t) {
    constexpr const char *names[] = {"scalar", "neon", "sse41", "avx2", "avx512"};
    return names[size_t(t)];
}

bool target_available(target t) {
    ensure_tables();
    return available[size_t(t)];
}

const row_table &rows_of(target t) {
    ensure_tables();
    return tables[size_t(t)];
}

const row_table &choose_rows() {
    ensure_tables();
    return *live_table.load(std::memory_order_acquire);
}

const row_table &live_rows(ptrdiff_t width) {
    const row_table *rows = &live_rows();
    while (rows->for_short && width < rows->vector) rows = rows->for_short;
    return *rows;
}

target live_target() { return target(&live_rows() - tables); }

void force_rows(const row_table *table) {
    ensure_tables();
    live_table.store(table ? table : &tables[size_t(best)], std::memory_order_release);
}

}  // namespace simgp
