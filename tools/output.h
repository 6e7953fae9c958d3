// A file that appears under its name only when it is complete.
#pragma once

#include <cstdio>
#include <string>

namespace tools {

class Output {
  public:
    /// Regular files are written under a temporary name in the same folder; "-" is the standard
    /// output; what exists and is no regular file (a pipe, a device) is written directly. Fails
    /// with a Fault, as every member does.
    explicit Output(const std::string &path);
    /// Removes what was not committed.
    ~Output();
    Output(const Output &) = delete;
    Output &operator=(const Output &) = delete;

    const std::string &name() const { return name_; }
    void write(const void *bytes, size_t count);
    void write(const std::string &text) { write(text.data(), text.size()); }
    /// The file is complete: gives it its name.
    void commit();

  private:
    [[noreturn]] void fail(int error) const;

    std::string name_, path_, temporary_;
    std::FILE *file_ = nullptr;
    long long written_ = 0;
};

/// Lets a broken pipe show as a failed write, and takes the temporary file away when the program is
/// interrupted. To be called once, at the start.
void tidy_on_signals();

}  // namespace tools
