#include "tests/pages.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>

#if defined(_WIN32)
#define WIN32_LEAN_AND_MEAN
#include <io.h>
#include <malloc.h>
#include <windows.h>
#else
#include <malloc.h>
#include <signal.h>
#include <sys/mman.h>
#include <unistd.h>
#endif

namespace rig {

namespace {

const char *running_now = "";

// Without anything that a program in any state might not be able to do.
void say_what_was_running() {
    const char *text[] = {"\nfault in: ", *running_now ? running_now : "no driver of the rig",
                          "\n"};
    for (const char *t : text)
        if (write(2, t, unsigned(strlen(t))) < 0) break;
}

[[noreturn]] void no_memory() {
    perror("guarded memory");
    abort();
}

}  // namespace

#if defined(_WIN32)

size_t page_size() {
    SYSTEM_INFO info;
    GetSystemInfo(&info);
    return info.dwPageSize;
}

uint8_t *pages_between_inaccessible_ones(size_t size) {
    void *all =
        VirtualAlloc(nullptr, size + 2 * page_size(), MEM_RESERVE | MEM_COMMIT, PAGE_NOACCESS);
    if (!all) no_memory();
    uint8_t *begin = static_cast<uint8_t *>(all) + page_size();
    DWORD before;
    if (!VirtualProtect(begin, size, PAGE_READWRITE, &before)) no_memory();
    return begin;
}

size_t size_of_block(void *block) { return _msize(block); }

static LONG CALLBACK see_exception(EXCEPTION_POINTERS *what) {
    const DWORD code = what->ExceptionRecord->ExceptionCode;
    if (code == EXCEPTION_ACCESS_VIOLATION || code == EXCEPTION_DATATYPE_MISALIGNMENT)
        say_what_was_running();
    return EXCEPTION_CONTINUE_SEARCH;
}

void report_faults(const char *running) {
    running_now = running;
    static void *const handler = AddVectoredExceptionHandler(1, see_exception);
    (void)handler;
}

#else

size_t page_size() { return size_t(sysconf(_SC_PAGESIZE)); }

uint8_t *pages_between_inaccessible_ones(size_t size) {
    void *all =
        mmap(nullptr, size + 2 * page_size(), PROT_NONE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    if (all == MAP_FAILED) no_memory();
    uint8_t *begin = static_cast<uint8_t *>(all) + page_size();
    if (mprotect(begin, size, PROT_READ | PROT_WRITE)) no_memory();
    return begin;
}

size_t size_of_block(void *block) { return malloc_usable_size(block); }

[[maybe_unused]] static void see_signal(int number) {
    say_what_was_running();
    signal(number, SIG_DFL);  // the instruction is tried again and ends the program
}

void report_faults(const char *running) {
    running_now = running;
#ifndef RIG_ASAN  // which sees to signals itself
    static const bool watching = [] {
        struct sigaction action = {};
        action.sa_handler = see_signal;
        sigaction(SIGSEGV, &action, nullptr);
        sigaction(SIGBUS, &action, nullptr);
        return true;
    }();
    (void)watching;
#endif
}

#endif

}  // namespace rig

#ifdef RIG_ASAN
// The sanitizers call these when they have found something.
extern "C" void __asan_on_error();
extern "C" void __ubsan_on_report();
void __asan_on_error() { rig::say_what_was_running(); }
void __ubsan_on_report() { rig::say_what_was_running(); }
#endif
