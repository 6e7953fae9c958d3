// Any bytes as a coded picture of any type, with the rows of every target, beside the plain rules.
// The bytes end at an inaccessible page.
#include <string.h>

#include "scmn/keyframe.h"
#include "tests/keyframe_rule.h"
#include "tests/rig.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    if (size == 0) return 0;
    const int32_t type = 100 + data[0] % 14;
    const rig::guarded picture(--size);
    if (size > 0) memcpy(picture.data(), data + 1, size);
    const int expected = keyframe_rule::of(type, picture.data(), int64_t(size));
    for (const rig::target_rows &t : rig::all_targets()) {
        const rig::forced rows(t);
        if (scmn_is_vkeyfrm(type, picture.data(), int32_t(size)) != expected) abort();
    }
    return 0;
}
