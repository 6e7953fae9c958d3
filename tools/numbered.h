// Names of files with a number in them, one file for each frame.
#ifndef TOOLS_NUMBERED_H
#define TOOLS_NUMBERED_H

#include <stdint.h>

#include <string>

namespace tools {

// "out-%04d.png" as what stands before and behind the number, and its width. "%%" stands for a '%'.
struct numbered_name {
    std::string before, behind;
    size_t digits = 0;
    bool numbered = false;

    // Ends in a fault where more than one number, or none but a '%', stands in the name.
    explicit numbered_name(const std::string &path);
    std::string name(int64_t number) const;
};

}  // namespace tools

#endif
