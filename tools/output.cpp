#include "tools/output.h"

#include <errno.h>
#include <fcntl.h>
#include <limits.h>
#include <signal.h>
#include <stdlib.h>
#include <string.h>
#include <sys/stat.h>
#include <unistd.h>

#include "tools/fault.h"

namespace tools {

namespace {

constexpr int ending_signals[] = {SIGINT, SIGTERM, SIGHUP};

// The file to take away when a signal ends the program: a plain array, for the signal handler.
char unfinished[PATH_MAX];

void remove_unfinished(int number) {
    if (unfinished[0]) unlink(unfinished);
    signal(number, SIG_DFL);
    raise(number);
}

}  // namespace

void tidy_on_signals() {
    signal(SIGPIPE, SIG_IGN);
    for (int number : ending_signals) signal(number, remove_unfinished);
}

output::output(const destination &to)
    : name_(to.path), path_(to.path), may_replace_(to.may_replace) {
    const std::string &path = path_;
    struct stat about;
    if (path == "-") {
        name_ = "standard output";
        if (isatty(STDOUT_FILENO))
            throw fault("standard output is a terminal; picture data is not written to it");
        file_ = stdout;
    } else if (const bool there = stat(path.c_str(), &about) == 0;
               there && !S_ISREG(about.st_mode)) {
        file_ = fopen(path.c_str(), "wb");
    } else {
        if (there && !may_replace_) fail(EEXIST);
        if (char *const real = there ? realpath(path.c_str(), nullptr) : nullptr) {
            path_ = real;
            free(real);
        }
        const size_t slash = path.rfind('/') + 1;  // 0 where there is no slash
        temporary_ = path.substr(0, slash) + "." + path.substr(slash) + ".XXXXXX";
        // A signal waits until the handler can find the name.
        sigset_t ending, before;
        sigemptyset(&ending);
        for (int number : ending_signals) sigaddset(&ending, number);
        sigprocmask(SIG_BLOCK, &ending, &before);
        const int descriptor = mkostemp(temporary_.data(), O_CLOEXEC);
        if (descriptor >= 0 && temporary_.size() < sizeof unfinished)
            memcpy(unfinished, temporary_.c_str(), temporary_.size() + 1);
        sigprocmask(SIG_SETMASK, &before, nullptr);
        if (descriptor < 0) {
            temporary_.clear();
        } else {
            // mkostemp makes private files; this one shall be as any other, or as the one before.
            const mode_t mask = umask(0);
            umask(mask);
            fchmod(descriptor, there ? about.st_mode & 07777 : 0666 & ~mask);
            file_ = fdopen(descriptor, "wb");
        }
    }
    if (!file_) fail(errno);
}

output::~output() {
    if (file_ && file_ != stdout) fclose(file_);
    if (!temporary_.empty()) {
        unlink(temporary_.c_str());
        unfinished[0] = 0;
    }
}

void output::fail(int error) const {
    throw fault(name_, ": ", strerror(error), written_ ? " after byte " : "",
                written_ ? std::to_string(written_) : "");
}

void output::write(const void *bytes, size_t count) {
    const size_t done = fwrite(bytes, 1, count, file_);
    written_ += (long long)done;
    if (done != count) fail(errno);
}

void output::commit() {
    if (file_ == stdout) {
        if (fflush(stdout) != 0) fail(errno);
        return;
    }
    FILE *file = file_;
    file_ = nullptr;
    if (fclose(file) != 0) fail(errno);
    if (temporary_.empty()) return;
    // A link is refused where a name has come up meanwhile.
    const bool named = may_replace_ ? rename(temporary_.c_str(), path_.c_str()) == 0
                                    : link(temporary_.c_str(), path_.c_str()) == 0;
    if (!named) fail(errno);
    if (!may_replace_) unlink(temporary_.c_str());
    temporary_.clear();
    unfinished[0] = 0;
}

}  // namespace tools
