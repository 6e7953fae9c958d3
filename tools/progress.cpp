#include "tools/progress.h"

#include <stdio.h>
#include <sys/ioctl.h>
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
    char text[80];
    const int length =
        part >= 0 ? snprintf(text, sizeof text, "%3d%%  %lld frames  %.1f/s", int(part * 100),
                             (long long)frames, rate)
                  : snprintf(text, sizeof text, "%lld frames  %.1f/s", (long long)frames, rate);
    // A line that is wider than the terminal would leave its beginning on the line above.
    winsize terminal = {};
    if (ioctl(STDERR_FILENO, TIOCGWINSZ, &terminal) != 0 || terminal.ws_col == 0)
        terminal.ws_col = 80;
    const int room = terminal.ws_col - 1, wide = std::min(room - length - 3, 40);
    std::string line;
    if (part >= 0 && wide > 4) {
        const int done = int(std::clamp(part, 0.0, 1.0) * wide);
        line.append("[").append(size_t(done), '#').append(size_t(wide - done), '.').append("] ");
    }
    line.append(text);
    if (int(line.size()) > room) line.resize(size_t(room));
    fprintf(stderr, "\r%s\033[K", line.c_str());
    fflush(stderr);
    shown_ = true;
}

void progress::clear() {
    if (shown_) fputs("\r\033[K", stderr);
    shown_ = false;
}

}  // namespace tools
