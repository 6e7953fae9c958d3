// A file that appears under its name only when it is complete.
#ifndef TOOLS_OUTPUT_H
#define TOOLS_OUTPUT_H

#include <stdio.h>

#include <string>

namespace tools {

// Where a file goes. It may replace one that is there, unless the user said otherwise.
struct destination {
    std::string path;
    bool may_replace = true;
};

class output {
  public:
    // Regular files are written under a temporary name in the same folder, that of the file itself
    // where `path` is a symbolic link; a file that is replaced leaves its mode to the new one. "-" is
    // the standard output; what exists and is no regular file (a pipe, a device) is written
    // directly. Fails with a fault, as every member does.
    explicit output(const destination &to);
    // Removes what was not committed.
    ~output();
    output(const output &) = delete;
    output &operator=(const output &) = delete;

    const std::string &name() const { return name_; }
    void write(const void *bytes, size_t count);
    void write(const std::string &text) { write(text.data(), text.size()); }
    // The file is complete: gives it its name.
    void commit();

  private:
    [[noreturn]] void fail(int error) const;

    std::string name_, path_, temporary_;
    bool may_replace_;
    FILE *file_ = nullptr;
    long long written_ = 0;
};

// Lets a broken pipe show as a failed write, and takes the temporary file away when the program is
// interrupted. To be called once, at the start.
void tidy_on_signals();

}  // namespace tools

#endif
