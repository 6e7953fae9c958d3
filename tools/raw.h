// Frames as they lie in files: plane after plane, line after line, without padding.
#ifndef TOOLS_RAW_H
#define TOOLS_RAW_H

#include "tools/input.h"
#include "tools/output.h"
#include "tools/picture.h"

namespace tools {

// Reads one frame of `to`'s shape; one that the input ends within is a fault.
void read_frame(input &in, picture &to, int64_t frame);
void write_frame(output &out, const picture &p);

}  // namespace tools

#endif
