#include "simgp/names.h"

#include "simgp/formats.h"

namespace simgp {
namespace {

struct other_name {
    short_name name;
    int32_t code;
};
constexpr other_name other_names[] = {
    {"gray", SIMGP_FMT_YUV400},     {"gray8", SIMGP_FMT_YUV400},    {"grey", SIMGP_FMT_YUV400},
    {"y800", SIMGP_FMT_YUV400},     {"i420", SIMGP_FMT_YUV420},     {"iyuv", SIMGP_FMT_YUV420},
    {"yuv420p", SIMGP_FMT_YUV420},  {"i422", SIMGP_FMT_YUV422N},    {"yuv422", SIMGP_FMT_YUV422N},
    {"yuv422p", SIMGP_FMT_YUV422N}, {"i444", SIMGP_FMT_YUV444},     {"yuv444p", SIMGP_FMT_YUV444},
    {"yuv440p", SIMGP_FMT_YUV422W}, {"uyvy422", SIMGP_FMT_UYVY},    {"yuyv422", SIMGP_FMT_YUYV},
    {"yuy2", SIMGP_FMT_YUYV},       {"rgb565le", SIMGP_FMT_RGB565}, {"bgr565le", SIMGP_FMT_BGR565},
    {"rgb24", SIMGP_FMT_RGB888},    {"bgr24", SIMGP_FMT_BGR888},    {"rgba", SIMGP_FMT_RGBA8888},
    {"bgra", SIMGP_FMT_BGRA8888},   {"argb", SIMGP_FMT_ARGB8888},
};

// Letters of ASCII alone, whatever the locale.
constexpr char small(char c) { return c >= 'A' && c <= 'Z' ? char(c - 'A' + 'a') : c; }

bool is_name(const char *given, const char *name) {
    for (; *name && small(*given) == *name; ++given, ++name) {
    }
    return *name == '\0' && *given == '\0';
}

}  // namespace
}  // namespace simgp

using namespace simgp;

int32_t simgp_version(void) { return SIMGP_VERSION; }

const char *simgp_result_text(int32_t result) {
    switch (result) {
        case SIMGP_OK:
            return "success";
        case SIMGP_ERR_PARAM:
            return "bad argument, or formats that do not go together";
        case SIMGP_ERR_UNSUPPORTED:
            return "not implemented for these formats";
        default:
            return "unknown result";
    }
}

const char *simgp_format_name(int32_t format) {
    const simgp::format *const known = find_format(format);
    return known ? known->name.text : nullptr;
}

int32_t simgp_format_of_name(const char *name) {
    if (!name) return -1;
    for (const coded_format &f : coded_formats)
        if (is_name(name, f.is->name.text)) return f.code;
    for (const other_name &other : other_names)
        if (is_name(name, other.name.text)) return other.code;
    return -1;
}
