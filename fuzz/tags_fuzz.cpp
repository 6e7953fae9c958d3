// Any tag, beside the table of known ones.
#include <stdlib.h>
#include <string.h>

#include "tests/tag_table.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    uint32_t tag = 0;
    memcpy(&tag, data, size < 4 ? size : 4);
    if (!tag_table::agrees(tag)) abort();
    return 0;
}
