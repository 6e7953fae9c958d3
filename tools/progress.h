// A progress bar on a terminal.
#ifndef TOOLS_PROGRESS_H
#define TOOLS_PROGRESS_H

#include <stdint.h>

#include <chrono>

namespace tools {

class progress {
  public:
    // Shows nothing unless standard error is a terminal and `wanted`, and nothing for work that
    // takes less than half a second.
    explicit progress(bool wanted);
    ~progress() { clear(); }

    // `frames` are done, which is `part` (0 ... 1) of the whole, or negative if that is not known.
    void show(int64_t frames, double part);
    // Takes the bar away, so that a message can stand in its place.
    void clear();

  private:
    using clock = std::chrono::steady_clock;
    bool active_, shown_ = false;
    clock::time_point start_, last_;
};

}  // namespace tools

#endif
