// What a fuzzer's bytes mean: numbers first, what is left is content.
#ifndef FUZZ_INPUT_H
#define FUZZ_INPUT_H

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>

namespace fuzz {

class input {
  public:
    input(const uint8_t *data, size_t size) : data_(data), end_(data + size) {}

    // A number from 0 to n - 1; 0 where the bytes have ended.
    int below(int n) {
        uint32_t value = 0;
        for (uint32_t reach = 1; reach < uint32_t(n); reach <<= 8)
            value = value << 8 | (data_ < end_ ? *data_++ : 0u);
        return n > 0 ? int(value % uint32_t(n)) : 0;
    }
    const uint8_t *data() const { return data_; }
    size_t size() const { return size_t(end_ - data_); }

  private:
    const uint8_t *data_, *end_;
};

// Ends the program, with the reason; libFuzzer keeps the input.
inline void stop_at(const std::string &fault) {
    if (fault.empty()) return;
    fprintf(stderr, "\nfault: %s\n", fault.c_str());
    abort();
}

}  // namespace fuzz

#endif
