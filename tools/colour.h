// What Y, U and V mean: a matrix and a range.
#ifndef TOOLS_COLOUR_H
#define TOOLS_COLOUR_H

#include <stdint.h>

#include <string>
#include <string_view>
#include <vector>

namespace tools {

struct colour {
    std::string_view name;    // "bt709-full"
    std::string_view matrix;  // "bt709"
    bool full;                // black is 0 and white 255, not 16 and 235
    int32_t code;             // SIMGP_COLOUR_*
    double red, blue;         // their shares in luma
};

// In the order of the codes.
const std::vector<colour> &colours();
std::vector<std::string> colour_names();
// Both end in a fault if there is none.
const colour &colour_named(std::string_view name);
const colour &colour_of(std::string_view matrix, bool full);

// What is known of a stream's colour; empty: nothing.
struct colour_note {
    std::string matrix;  // "bt601", "bt709", "bt2020"
    std::string range;   // "limited", "full"
};

// The matrix of pictures that do not say it: HD is BT.709 and less is BT.601, whichever way up.
std::string_view usual_matrix(int width, int height);

// The colour of pictures of this size. What is not known is the usual matrix, the limited range.
const colour &resolved(const colour_note &known, int width, int height);

}  // namespace tools

#endif
