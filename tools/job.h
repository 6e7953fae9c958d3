// One run of simgp-convert: source -> stages -> sink.
#ifndef TOOLS_JOB_H
#define TOOLS_JOB_H

#include <stdint.h>

#include <string>

#include "tools/road.h"
#include "tools/source.h"

namespace tools {

struct job {
    source_options source;
    std::string output;
    std::string to;      // destination format; empty: what suits the output
    std::string as;      // png, ppm, y4m, raw; empty: by the ending of `output`
    int64_t frames = 0;  // stop after so many; 0: all
    bool dither = false;
    edits edit;
    bool chroma_mean = false;  // of several pixels or samples, not that of the first
    std::string resize;        // "320x240", the size in `edit`; empty: none
    bool may_replace = true;   // files that are there
    bool sheet = false;
    int columns = 0;
    bool verbose = false;
    bool quiet = false;  // no progress bar, no notes
};

void run(const job &j);

// The --list page: what converts into what.
std::string list_conversions();

// Writes the demonstration's pictures into the folder `directory`, which is made if it is missing,
// and says on standard output what they show.
void demo(const std::string &directory, const source_options &options);

}  // namespace tools

#endif
