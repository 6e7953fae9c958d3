// The bilinear filter in plain integers, sample by sample.
#ifndef TESTS_BILINEAR_H
#define TESTS_BILINEAR_H

#include <cstdint>

namespace rig {

// Where the samples of an axis lie that has `to` samples in the place of `from`: at a distance of so
// many 2^18ths, counted in every 2^shift-th sample.
struct spread {
    int64_t step;
    int shift;

    spread(int from, int to) : step(0), shift(0) {
        const int ratio = from / to;
        if (ratio >= 3)
            while (shift < 4 && 2 << shift < ratio) shift++;
        step = (int64_t((from - 1) >> shift) << 18) / to;
    }
    // The sample before position i, the one behind it, and how far i lies between them, in eighths.
    int before(int i) const { return int(i * step >> 18) << shift; }
    int behind(int i) const { return eighths(i) ? before(i) + (1 << shift) : before(i); }
    int eighths(int i) const { return int(i * step >> 15 & 7); }
    // The same, as kernels take it.
    int32_t packed() const { return int32_t(step * 8 + shift); }
};

// Sample (i, j), where at(x, y) are those of the source.
template <class At>
int bilinear(const spread &across, const spread &down, int i, int j, At at) {
    const int x0 = across.before(i), x1 = across.behind(i), fx = across.eighths(i);
    const int y0 = down.before(j), y1 = down.behind(j), fy = down.eighths(j);
    return ((8 - fx) * (8 - fy) * at(x0, y0) + fx * (8 - fy) * at(x1, y0) +
            (8 - fx) * fy * at(x0, y1) + fx * fy * at(x1, y1)) /
           64;
}

}  // namespace rig

#endif
