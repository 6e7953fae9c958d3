#include "tools/numbered.h"

#include "tools/fault.h"

namespace tools {

numbered_name::numbered_name(const std::string &path) {
    for (size_t at = 0; at < path.size(); ++at) {
        std::string &part = numbered ? behind : before;
        if (path[at] != '%') {
            part += path[at];
        } else if (path.compare(at, 2, "%%") == 0) {
            part += '%';
            ++at;
        } else {
            size_t end = at + 1;
            while (end < path.size() && path[end] >= '0' && path[end] <= '9') ++end;
            const std::string width = path.substr(at + 1, end - at - 1);
            const bool good = end < path.size() && path[end] == 'd' && width.size() <= 2 &&
                              (width.empty() || width[0] == '0');
            if (!good || numbered)
                throw fault(path,
                            ": one number such as %d or %04d may stand in the name; for '%' "
                            "itself write %%");
            digits = width.empty() ? 0 : std::stoul(width);
            numbered = true;
            at = end;
        }
    }
}

std::string numbered_name::name(int64_t number) const {
    if (!numbered) return before;
    std::string text = std::to_string(number);
    if (text.size() < digits) text.insert(0, digits - text.size(), '0');
    return before + text + behind;
}

}  // namespace tools
