// The pixel formats of the line-based resizer, with their functions.
#ifndef TESTS_IRSZ_KINDS_H
#define TESTS_IRSZ_KINDS_H

#include "scmn/irsz.h"

namespace rig {

struct irsz_kind {
    const char *name;
    int32_t format;
    int src_bytes, dst_bytes;
    int unit;  // bytes that a length counts in
    scmn_irsz_fn *entry;
    scmn_irsz_line_fn *line;
    scmn_irsz_full_fn *full;
};
inline const irsz_kind irsz_kinds[] = {
    {"8b", 20, 1, 1, 1, scmn_irsz8b, scmn_irsz8b_line, scmn_irsz8b_full},
    {"8b8b8b", 21, 3, 3, 1, scmn_irsz8b8b8b, scmn_irsz8b8b8b_line, scmn_irsz8b8b8b_full},
    {"8b8b8b_5b6b5b", 23, 3, 2, 1, scmn_irsz8b8b8b_5b6b5b, scmn_irsz8b8b8b_5b6b5b_line,
     scmn_irsz8b8b8b_5b6b5b_full},
    {"5b6b5b", 25, 2, 2, 2, scmn_irsz5b6b5b, scmn_irsz5b6b5b_line, scmn_irsz5b6b5b_full},
    {"8b8b8b8b", 29, 4, 4, 1, scmn_irsz8b8b8b8b, scmn_irsz8b8b8b8b_line, scmn_irsz8b8b8b8b_full},
};

}  // namespace rig

#endif
