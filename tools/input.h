// A file or a pipe that is read once, from front to back, and knows where it stands.
#pragma once

#include <cstdint>
#include <cstdio>
#include <string>
#include <vector>

#include "tools/fault.h"

namespace tools {

class Input {
  public:
    /// "-" is the standard input. A file that cannot be read ends in a Fault.
    explicit Input(const std::string &path);
    ~Input();
    Input(const Input &) = delete;
    Input &operator=(const Input &) = delete;

    const std::string &name() const { return name_; }
    /// The next up to 16 bytes, without taking them; fewer only where the input ends.
    std::string peek(size_t count);
    /// Takes `count` bytes, fewer only where the input ends; a read error ends in a Fault.
    size_t read(void *to, size_t count);
    /// Takes a line of up to `limit` bytes, without its line feed; false where the input ends
    /// without one or the line is longer.
    bool line(std::string &to, size_t limit);
    std::vector<uint8_t> rest();

    int64_t offset() const { return offset_; }
    /// Bytes of a regular file, otherwise -1.
    int64_t size() const { return size_; }

    /// Ends in a Fault at `frame` (counted from 0; none if negative) and byte `at` of this input.
    template <class... Part>
    [[noreturn]] void fail(int64_t frame, int64_t at, const Part &...part) const {
        if (frame < 0) throw Fault(name_, ": byte ", at, ": ", part...);
        throw Fault(name_, ": frame ", frame, ", byte ", at, ": ", part...);
    }

  private:
    std::string name_;
    std::FILE *file_;
    std::string peeked_;
    int64_t offset_ = 0, size_ = -1;
};

}  // namespace tools
