// The build stamp, in a file of its own so that no other result depends on the time.
#include "scmn/mem.h"

#ifndef SCMN_BUILD_DATE
#define SCMN_BUILD_DATE __DATE__
#define SCMN_BUILD_TIME __TIME__
#endif

// Kept in one piece, where a compiler would make immediate operands of it: the stamp of a binary can then be
// read without running it.
[[gnu::used]] static constexpr char stamp[] = SCMN_BUILD_DATE " " SCMN_BUILD_TIME "\n";

const char *scmn_version(void) {
    static char buffer[64];
    // Any number of threads may write the same text here at once.
    for (unsigned i = 0; i < sizeof stamp; i++)
        __atomic_store_n(&buffer[i], stamp[i], __ATOMIC_RELAXED);
    return buffer;
}
