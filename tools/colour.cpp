#include "tools/colour.h"

#include <algorithm>

#include "simgp/simgp.h"
#include "tools/fault.h"

namespace tools {

const std::vector<colour> &colours() {
    static const std::vector<colour> all = {
        {"bt601", "bt601", false, SIMGP_COLOUR_BT601, .299, .114},
        {"bt601-full", "bt601", true, SIMGP_COLOUR_BT601_FULL, .299, .114},
        {"bt709", "bt709", false, SIMGP_COLOUR_BT709, .2126, .0722},
        {"bt709-full", "bt709", true, SIMGP_COLOUR_BT709_FULL, .2126, .0722},
        {"bt2020", "bt2020", false, SIMGP_COLOUR_BT2020, .2627, .0593},
        {"bt2020-full", "bt2020", true, SIMGP_COLOUR_BT2020_FULL, .2627, .0593}};
    return all;
}

std::vector<std::string> colour_names() {
    std::vector<std::string> names;
    for (const colour &c : colours()) names.emplace_back(c.name);
    return names;
}

const colour &colour_named(std::string_view name) {
    for (const colour &c : colours())
        if (c.name == name) return c;
    throw fault("unknown colour '", name, "'");
}

const colour &colour_of(std::string_view matrix, bool full) {
    for (const colour &c : colours())
        if (c.matrix == matrix && c.full == full) return c;
    throw fault("unknown matrix '", matrix, "'");
}

std::string_view usual_matrix(int width, int height) {
    const bool hd = std::max(width, height) >= 1280 || std::min(width, height) > 576;
    return hd ? "bt709" : "bt601";
}

const colour &resolved(const colour_note &known, int width, int height) {
    return colour_of(known.matrix.empty() ? usual_matrix(width, height) : known.matrix,
                     known.range == "full");
}

}  // namespace tools
