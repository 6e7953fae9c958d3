// A progress bar on a terminal.
#pragma once

#include <chrono>
#include <cstdint>

namespace tools {

class Progress {
  public:
    /// Shows nothing unless standard error is a terminal and `wanted`, and nothing for work that
    /// takes less than half a second.
    explicit Progress(bool wanted);
    ~Progress() { clear(); }

    /// `frames` are done, which is `part` (0 ... 1) of the whole, or negative if that is not known.
    void show(int64_t frames, double part);
    /// Takes the bar away, so that a message can stand in its place.
    void clear();

  private:
    using Clock = std::chrono::steady_clock;
    bool active_, shown_ = false;
    Clock::time_point start_, last_;
};

}  // namespace tools
