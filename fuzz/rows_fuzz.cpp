// The functions of one family (FUZZ_FAMILY) with any formats, sizes, strides, alignments and bytes:
// the rows of every target against the scalar rows, in guarded memory. The input begins with numbers,
// which choose the function, the size and all else; the rest is laid over the pictures.
#include "fuzz/input.h"
#include "tests/operations.h"

namespace {

using rig::operation;

const std::vector<operation> &family() {
    static const std::vector<operation> members = [] {
        const std::string name = FUZZ_FAMILY;
        if (name == "empty") return rig::empty_calls();
        std::vector<operation> found;
        for (const operation &o : rig::operations())
            if (o.family == name) found.push_back(o);
        if (found.empty()) abort();
        return found;
    }();
    return members;
}

// Mostly what a few vectors hold, sometimes nothing, sometimes more than a strip or a block.
int length(fuzz::input &in) { return in.below(16) ? in.below(140) : in.below(600); }

rig::placement place(fuzz::input &in) {
    rig::placement p;
    const int flags = in.below(256);
    p.where = rig::flush(flags & 1);
    p.bottom_up = flags & 2;
    p.excess = flags >> 2 & 3;
    if (flags & 16) p.gap = size_t(in.below(128));
    if (flags & 32) p.padding = in.below(flags & 64 ? 1100 : 8);
    return p;
}
std::vector<rig::placement> places(size_t count, fuzz::input &in) {
    std::vector<rig::placement> all(count);
    for (rig::placement &p : all) p = place(in);
    return all;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size) {
    fuzz::input in(data, size);
    const operation &o = family()[size_t(in.below(int(family().size())))];
    const int width = length(in), height = length(in);
    const rig::job j = o.make({width, height}, [&](int n) { return in.below(n); });

    rig::setting how;
    how.src = places(j.src.size(), in);
    how.dst = places(j.dst.size(), in);
    const auto what = rig::content(in.below(int(rig::content::count)));
    const uint64_t seed = uint64_t(in.below(65536));
    how.salt = unsigned(seed);
    how.fill = [&](rig::picture &p) {
        rig::rng random(seed);
        p.fill(what, random);
        size_t used = 0;
        for (const rig::plane &part : p.parts)
            for (ptrdiff_t y = 0; y < part.shape().rows; y++)
                for (ptrdiff_t x = 0; x < part.shape().row_bytes && used < in.size(); x++)
                    part.row(y)[x] = in.data()[used++];
    };
    how.words = "content " + std::to_string(int(what)) + " and " + std::to_string(in.size()) +
                " bytes of the input";
    fuzz::stop_at(rig::fault_of(
        o.name + ", " + std::to_string(width) + " x " + std::to_string(height), j, how));
    return 0;
}
