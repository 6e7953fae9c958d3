// The one way in which the tools report that something cannot be done.
#ifndef TOOLS_FAULT_H
#define TOOLS_FAULT_H

#include <sstream>
#include <stdexcept>
#include <string>

namespace tools {

// Ends the work. The text is one line that says what is wrong and where: file, frame, byte.
struct fault : std::runtime_error {
    template <class... Part>
    explicit fault(const Part &...part) : std::runtime_error(join(part...)) {}

  private:
    template <class... Part>
    static std::string join(const Part &...part) {
        std::ostringstream text;
        (text << ... << part);
        return text.str();
    }
};

}  // namespace tools

#endif
