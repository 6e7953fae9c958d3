// What the tests ask of the operating system's memory.
#ifndef TESTS_PAGES_H
#define TESTS_PAGES_H

#include <stddef.h>
#include <stdint.h>

// Whether AddressSanitizer is at work.
#if defined(__SANITIZE_ADDRESS__)
#define RIG_ASAN 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define RIG_ASAN 1
#endif
#endif

namespace rig {

size_t page_size();

// `size` accessible bytes, whole pages of zeros, between two pages that nobody may touch; they stay until
// the program ends. Ends the program if there are none to be had.
uint8_t *pages_between_inaccessible_ones(size_t size);

// What malloc() holds ready at `block`: no less than it was asked for.
size_t size_of_block(void *block);

// From now on, a program that ends at a page that it may not touch prints the text at `running` first.
// That is read then, and must stay.
// AddressSanitizer and UBSan then say it, too.
void report_faults(const char *running);

}  // namespace rig

#endif
