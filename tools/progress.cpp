#include "tools/progress.h"

#include <stdio.h>
#include <unistd.h>

#include <algorithm>
#include <string>

namespace tools {

progress::progress(bool wanted)
    : active_(wanted && isatty(STDERR_FILENO)), start_(clock::now()), last_(start_) {}

void progress::show(int64_t frames, double part) {
    if (!active_) return;
    using namespace std::chrono_literals;
    const auto now = clock::now();
    if (now - start_ < 500ms || now - last_ < 100ms) return;
    last_ = now;
    const double rate = double(frames) / std::chrono::duration<double>(now - start_).count();
    if (part >= 0) {
        const int done = int(std::clamp(part, 0.0, 1.0) * 40);
        const std::string bar =
            std::string(size_t(done), '#') + std::string(size_t(40 - done), '.');
        fprintf(stderr, "\r[%s] %3d%%  %lld frames  %.1f/s \033[K", bar.c_str(), int(part * 100),
                (long long)frames, rate);
    } else {
        fprintf(stderr, "\r%lld frames  %.1f/s \033[K", (long long)frames, rate);
    }
    fflush(stderr);
    shown_ = true;
}

void progress::clear() {
    if (shown_) fputs("\r\033[K", stderr);
    shown_ = false;
}

}  // namespace tools
