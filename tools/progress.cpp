#include "tools/progress.h"

#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <string>

namespace tools {

Progress::Progress(bool wanted)
    : active_(wanted && isatty(STDERR_FILENO)), start_(Clock::now()), last_(start_) {}

void Progress::show(int64_t frames, double part) {
    if (!active_) return;
    using namespace std::chrono_literals;
    const auto now = Clock::now();
    if (now - start_ < 500ms || now - last_ < 100ms) return;
    last_ = now;
    const double rate = double(frames) / std::chrono::duration<double>(now - start_).count();
    if (part >= 0) {
        const int done = int(std::clamp(part, 0.0, 1.0) * 40);
        const std::string bar =
            std::string(size_t(done), '#') + std::string(size_t(40 - done), '.');
        std::fprintf(stderr, "\r[%s] %3d%%  %lld frames  %.1f/s \033[K", bar.c_str(),
                     int(part * 100), (long long)frames, rate);
    } else {
        std::fprintf(stderr, "\r%lld frames  %.1f/s \033[K", (long long)frames, rate);
    }
    std::fflush(stderr);
    shown_ = true;
}

void Progress::clear() {
    if (shown_) std::fputs("\r\033[K", stderr);
    shown_ = false;
}

}  // namespace tools
