// A file or a pipe that is read once, from front to back, and knows where it stands.
#ifndef TOOLS_INPUT_H
#define TOOLS_INPUT_H

#include <stdint.h>
#include <stdio.h>

#include <string>
#include <vector>

#include "tools/fault.h"

namespace tools {

class input {
  public:
    // "-" is the standard input. A file that cannot be read ends in a fault.
    explicit input(const std::string &path);
    ~input();
    input(const input &) = delete;
    input &operator=(const input &) = delete;

    const std::string &name() const { return name_; }
    // The next up to 16 bytes, without taking them; fewer only where the input ends.
    std::string peek(size_t count);
    // Takes `count` bytes, fewer only where the input ends; a read error ends in a fault.
    size_t read(void *to, size_t count);
    // Takes a line of up to `limit` bytes, without its line feed; false where the input ends
    // without one or the line is longer.
    bool line(std::string &to, size_t limit);
    std::vector<uint8_t> rest();

    int64_t offset() const { return offset_; }
    // Bytes of a regular file, otherwise -1.
    int64_t size() const { return size_; }
    // How much has been read, 0 ... 1; negative where the size is not known.
    double done() const { return size_ > 0 ? double(offset_) / double(size_) : -1; }

    // Ends in a fault at `frame` (counted from 0; none if negative) and byte `at` of this input.
    template <class... Part>
    [[noreturn]] void fail(int64_t frame, int64_t at, const Part &...part) const {
        if (frame < 0) throw fault(name_, ": byte ", at, ": ", part...);
        throw fault(name_, ": frame ", frame, ", byte ", at, ": ", part...);
    }

  private:
    std::string name_;
    FILE *file_;
    std::string peeked_;
    int64_t offset_ = 0, size_ = -1;
};

}  // namespace tools

#endif
