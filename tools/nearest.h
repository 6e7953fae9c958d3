// What someone may have meant.
#ifndef TOOLS_NEAREST_H
#define TOOLS_NEAREST_H

#include <string>
#include <string_view>
#include <vector>

namespace tools {

// "; did you mean 'nv12'?", where one of the names is near enough to `text`; else empty. Case does
// not count.
std::string did_you_mean(std::string_view text, const std::vector<std::string_view> &names);

}  // namespace tools

#endif
