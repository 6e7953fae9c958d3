// One call of a library function with arguments that a generator makes up, and the checksum of all
// that it gave. Nothing here depends on the machine: the same seed makes the same calls everywhere.
#ifndef TOOLS_TRIAL_H
#define TOOLS_TRIAL_H

#include <stddef.h>
#include <stdint.h>

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "simgp/simgp.h"

namespace tools {

// The CRC-32 of Ethernet, zlib and PNG: polynomial EDB88320, lowest bit first.
class crc32 {
  public:
    void add(const void *bytes, size_t size);
    void add(std::string_view text) { add(text.data(), text.size()); }
    void number(uint32_t n);  // as four bytes, the lowest first
    uint32_t value() const { return ~state_; }

  private:
    uint32_t state_ = ~0u;
};

// A plane in the memory of a trial.
struct plane {
    uint8_t *first = nullptr;  // the row that is processed first
    int32_t stride = 0;        // may be negative
    uint8_t *row(int32_t y) const { return first + ptrdiff_t(stride) * y; }
};

struct extent {
    int32_t w, h;
};

class trial {
  public:
    // `index` counts the calls of a function.
    trial(std::string_view function, uint64_t seed, int index);

    const int index;

    // Arguments: a number from low to high, yes once in n times.
    int32_t pick(int32_t low, int32_t high);
    bool one_in(int32_t n) { return pick(1, n) == 1; }
    template <class List>
    auto one_of(const List &list) {
        return list[size_t(pick(0, int32_t(std::size(list)) - 1))];
    }
    uint32_t word();  // any 32 bits, all of their lengths equally often

    // Of pictures: from one pixel to a few of the widest vectors, small ones more often, either way up;
    // now and then nothing at all.
    extent size();
    extent some_size();   // at least 1 x 1
    extent small_size();  // for functions that need many calls

    // Memory: planes with gaps between their rows, at any alignment, some of them from bottom to top.
    // `unit` divides the strides. A further plane lies behind the one before, with some bytes between.
    plane add(int32_t row_bytes, int32_t rows, int32_t unit = 1);
    uint8_t *bytes(int32_t size) { return add(size, 1).first; }
    // All of it gets random contents, once it is laid out.
    void fill();
    // These bytes may hold anything after the call.
    void ignore(const uint8_t *first, ptrdiff_t size) { ignored_.push_back({first, size}); }

    // What the function returned.
    void result(uint32_t n) { crc_.number(n); }
    void result(const void *bytes, size_t size) { crc_.add(bytes, size); }

    // The checksum: what was returned, then all of the memory, what lies between the planes and their
    // rows too, so that a stray write shows.
    uint32_t checksum();

    // The numbers that were picked.
    const std::string &arguments() const { return arguments_; }

  private:
    struct range {
        const uint8_t *first;
        ptrdiff_t size;
    };
    uint64_t next();

    uint64_t state_;
    size_t used_ = 0;
    std::vector<range> ignored_;
    crc32 crc_;
    std::string arguments_;
};

// Pictures -----------------------------------------------------------------------------------------

// Samples of a plane.
struct shape {
    int32_t width, height, bytes;
};

// The planes of a format, or of a number that is none, for a picture of this size.
std::vector<shape> shapes_of(int32_t format, extent size);

// Every format, and numbers that are none; some of these are taken all the same.
extern const int32_t formats[25];

// A picture in the memory of a trial. What no function reads holds anything.
simgp_img picture(trial &t, int32_t format, extent size);
simgp_img picture(trial &t, int32_t format, const std::vector<shape> &shapes);

// As the destination of a conversion, whose sizes are not read.
simgp_img destination(trial &t, int32_t format, extent size);

// All functions --------------------------------------------------------------------------------------

struct function {
    std::string name;
    int calls;
    void (*run)(trial &, const function &);
    void (*code)() = nullptr;  // what is called, where one `run` serves several
    int32_t numbers[4] = {};

    // The checksum of all calls. `log` gets a line for each.
    uint32_t fingerprint(uint64_t seed, FILE *log = nullptr) const;
};

// In the order of their names.
std::vector<function> all_functions();

// Its parts.
void add_pixel_functions(std::vector<function> &);   // simgp_*
void add_stream_functions(std::vector<function> &);  // scmn_*

template <class Fn>
Fn *code_of(const function &f) {
    return reinterpret_cast<Fn *>(f.code);
}

}  // namespace tools

#endif
