#include "tools/nearest.h"

#include <ctype.h>

#include <algorithm>
#include <numeric>

namespace tools {

namespace {

// How many letters have to be put in, left out, changed, or exchanged with the next one (counted as
// two).
size_t distance(std::string_view a, std::string_view b) {
    const auto same = [](char x, char y) {
        return tolower(static_cast<unsigned char>(x)) == tolower(static_cast<unsigned char>(y));
    };
    std::vector<size_t> row(b.size() + 1);
    std::iota(row.begin(), row.end(), size_t(0));
    for (size_t i = 0; i < a.size(); ++i) {
        size_t diagonal = row[0];
        row[0] = i + 1;
        for (size_t k = 0; k < b.size(); ++k) {
            const size_t change = diagonal + !same(a[i], b[k]);
            diagonal = row[k + 1];
            row[k + 1] = std::min({change, row[k] + 1, row[k + 1] + 1});
        }
    }
    return row.back();
}

}  // namespace

std::string did_you_mean(std::string_view text, const std::vector<std::string_view> &names) {
    std::string_view best;
    size_t least = std::max<size_t>(text.size() / 3, 1) + 1;
    for (std::string_view name : names)
        if (const size_t d = distance(text, name); d < least) least = d, best = name;
    return best.empty() ? "" : "; did you mean '" + std::string(best) + "'?";
}

}  // namespace tools
