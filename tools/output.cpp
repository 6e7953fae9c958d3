#include "tools/output.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <csignal>
#include <cstdlib>
#include <cstring>

#include "tools/fault.h"

namespace tools {

namespace {

// The file to take away when a signal ends the program: a plain array, for the signal handler.
char unfinished[PATH_MAX];

void remove_unfinished(int signal) {
    if (unfinished[0]) unlink(unfinished);
    std::signal(signal, SIG_DFL);
    std::raise(signal);
}

}  // namespace

void tidy_on_signals() {
    std::signal(SIGPIPE, SIG_IGN);
    for (int signal : {SIGINT, SIGTERM, SIGHUP}) std::signal(signal, remove_unfinished);
}

Output::Output(const std::string &path) : name_(path), path_(path) {
    struct stat about;
    if (path == "-") {
        name_ = "standard output";
        if (isatty(STDOUT_FILENO))
            throw Fault("standard output is a terminal; picture data is not written to it");
        file_ = stdout;
    } else if (stat(path.c_str(), &about) == 0 && !S_ISREG(about.st_mode)) {
        file_ = std::fopen(path.c_str(), "wb");
    } else {
        const size_t slash = path.rfind('/') + 1;  // 0 where there is no slash
        temporary_ = path.substr(0, slash) + "." + path.substr(slash) + ".XXXXXX";
        const int descriptor = mkostemp(temporary_.data(), O_CLOEXEC);
        if (descriptor < 0) {
            temporary_.clear();
        } else {
            if (temporary_.size() < sizeof unfinished)
                std::memcpy(unfinished, temporary_.c_str(), temporary_.size() + 1);
            // mkostemp makes private files; this one shall be as any other.
            const mode_t mask = umask(0);
            umask(mask);
            fchmod(descriptor, 0666 & ~mask);
            file_ = fdopen(descriptor, "wb");
        }
    }
    if (!file_) fail(errno);
}

Output::~Output() {
    if (file_ && file_ != stdout) std::fclose(file_);
    if (!temporary_.empty()) {
        unlink(temporary_.c_str());
        unfinished[0] = 0;
    }
}

void Output::fail(int error) const {
    throw Fault(name_, ": ", std::strerror(error), written_ ? " after byte " : "",
                written_ ? std::to_string(written_) : "");
}

void Output::write(const void *bytes, size_t count) {
    const size_t done = std::fwrite(bytes, 1, count, file_);
    written_ += (long long)done;
    if (done != count) fail(errno);
}

void Output::commit() {
    if (file_ == stdout) {
        if (std::fflush(stdout) != 0) fail(errno);
        return;
    }
    std::FILE *file = file_;
    file_ = nullptr;
    if (std::fclose(file) != 0) fail(errno);
    if (temporary_.empty()) return;
    if (std::rename(temporary_.c_str(), path_.c_str()) != 0) fail(errno);
    temporary_.clear();
    unfinished[0] = 0;
}

}  // namespace tools
