// Any sequence of operations on any bytes, beside the model of single bits.
#include <fuzzer/FuzzedDataProvider.h>
#include <stdio.h>

#include "tests/bit_model.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    FuzzedDataProvider input(data, size);
    const auto pick = [&](uint32_t low, uint32_t high) {
        return input.ConsumeIntegralInRange(low, high);
    };
    const int kind = int(pick(0, 2)), operations = int(pick(1, 60));
    const auto bytes = input.ConsumeBytes<uint8_t>(pick(0, 80));
    using bit_model::order;
    const std::string fault =
        kind == 0 ? bit_model::compare_writer(bytes, pick, operations)
                  : bit_model::compare_reader(
                        bytes, kind == 1 ? order::msb_first : order::lsb_first, pick, operations);
    if (fault.empty()) return 0;
    fprintf(stderr, "%s\n", fault.c_str());
    abort();
}
