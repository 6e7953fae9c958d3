// Frames as they lie in files: plane after plane, line after line, without padding.
#pragma once

#include "tools/input.h"
#include "tools/output.h"
#include "tools/picture.h"

namespace tools {

/// Reads one frame of `to`'s shape; one that the input ends within is a Fault.
void read_frame(Input &input, Picture &to, int64_t frame);
void write_frame(Output &output, const Picture &picture);

}  // namespace tools
