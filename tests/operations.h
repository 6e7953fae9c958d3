// Every exported function that has rows, as jobs of the rig: for sweeps over all sizes and for
// fuzzers. What else a call needs, such as strengths, colours and the sizes of other planes, is picked
// by whoever asks for the job.
#ifndef TESTS_OPERATIONS_H
#define TESTS_OPERATIONS_H

#include "tests/rig.h"

namespace rig {

// A number from 0 to n - 1.
using chooser = std::function<int(int n)>;

struct operation {
    std::string name;    // of the function
    std::string family;  // what is fuzzed together
    // `size` is that of the pictures or planes; of the destination where something is resized. Any of
    // its two may be 0. For what has no size it makes a length.
    std::function<job(const size &s, const chooser &pick)> make;
};
const std::vector<operation> &operations();

// Calls of every entry point with any codes of formats and sizes of 0 and less, whose planes nobody
// may touch: the answers have to agree.
const std::vector<operation> &empty_calls();

}  // namespace rig

#endif
