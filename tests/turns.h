// Where turns and mirrors put samples.
#ifndef TESTS_TURNS_H
#define TESTS_TURNS_H

#include "simgp/img.h"

namespace rig {

// Where sample (x, y) of w x h goes.
struct place {
    int column, row;
};
inline place turned(int rot, int x, int y, int w, int h) {
    switch (rot) {
        case SIMGP_ROT_90L:
            return {y, w - 1 - x};
        case SIMGP_ROT_90R:
            return {h - 1 - y, x};
        case SIMGP_ROT_180:
            return {w - 1 - x, h - 1 - y};
        case SIMGP_ROT_HORI:
            return {w - 1 - x, y};
        case SIMGP_ROT_VERT:
            return {x, h - 1 - y};
        default:
            return {x, y};
    }
}
inline bool is_quarter(int rot) { return rot == SIMGP_ROT_90L || rot == SIMGP_ROT_90R; }

}  // namespace rig

#endif
