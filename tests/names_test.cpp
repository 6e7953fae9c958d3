// Texts: versions, results, and formats by name.
#include <map>
#include <string>

#include "simgp/names.h"
#include "tests/rig.h"

namespace {

TEST(names, version_of_the_library_is_that_of_its_headers) {
    EXPECT_EQ(simgp_version(), SIMGP_VERSION);
    EXPECT_EQ(SIMGP_VERSION >> 16, SIMGP_VERSION_MAJOR);
    EXPECT_EQ(SIMGP_VERSION >> 8 & 255, SIMGP_VERSION_MINOR);
    EXPECT_EQ(SIMGP_VERSION & 255, SIMGP_VERSION_PATCH);
    // The CMake package and the library's file name take theirs from the same header.
    EXPECT_EQ(std::to_string(SIMGP_VERSION_MAJOR) + "." + std::to_string(SIMGP_VERSION_MINOR) +
                  "." + std::to_string(SIMGP_VERSION_PATCH),
              PACKAGE_VERSION);
}

TEST(names, results_have_texts_of_their_own) {
    std::map<std::string, int32_t> seen;
    for (const int32_t result :
         {int32_t{SIMGP_OK}, int32_t{SIMGP_ERR_PARAM}, int32_t{SIMGP_ERR_UNSUPPORTED}, 1}) {
        const char *const text = simgp_result_text(result);
        EXPECT_TRUE(seen.emplace(text, result).second) << text;
    }
    EXPECT_STREQ(simgp_result_text(SIMGP_OK), "success");
    EXPECT_STREQ(simgp_result_text(-2), "unknown result");
    EXPECT_STREQ(simgp_result_text(INT32_MIN), "unknown result");
}

TEST(names, formats_there_and_back) {
    const std::map<std::string, int32_t> known = {
        {"yuv400", 0},   {"yuv420", 1},     {"yuv422n", 2},    {"yuv444", 3},    {"yv12", 4},
        {"yv16", 5},     {"nv12", 6},       {"nv21", 7},       {"yuv422w", 8},   {"t64x32", 11},
        {"uyvy", 100},   {"yuyv", 101},     {"rgb565", 200},   {"bgr565", 201},  {"rgb888", 400},
        {"bgr888", 401}, {"rgba8888", 500}, {"bgra8888", 501}, {"argb8888", 502}};
    EXPECT_EQ(known.size(), rig::formats().size());
    for (const auto &[name, code] : known) {
        ASSERT_NE(simgp_format_name(code), nullptr) << name;
        EXPECT_EQ(simgp_format_name(code), name);
        EXPECT_EQ(simgp_format_of_name(name.c_str()), code) << name;
    }
    for (const int32_t code : {-1, 9, 12, 503, 600, INT32_MAX, INT32_MIN})
        EXPECT_EQ(simgp_format_name(code), nullptr) << code;
}

TEST(names, more_names_and_any_case) {
    EXPECT_EQ(simgp_format_of_name("NV12"), SIMGP_FMT_NV12);
    EXPECT_EQ(simgp_format_of_name("T64x32"), SIMGP_FMT_T64X32);
    EXPECT_EQ(simgp_format_of_name("I420"), SIMGP_FMT_YUV420);
    EXPECT_EQ(simgp_format_of_name("yuv422p"), SIMGP_FMT_YUV422N);
    EXPECT_EQ(simgp_format_of_name("YUYV422"), SIMGP_FMT_YUYV);
    EXPECT_EQ(simgp_format_of_name("YUY2"), SIMGP_FMT_YUYV);
    EXPECT_EQ(simgp_format_of_name("rgb24"), SIMGP_FMT_RGB888);
    EXPECT_EQ(simgp_format_of_name("argb"), SIMGP_FMT_ARGB8888);
    EXPECT_EQ(simgp_format_of_name("bgra"), SIMGP_FMT_BGRA8888);
    for (const char *const none : {"", "nv1", "nv12 ", " nv12", "nv123", "yuv", "n\xD6"})
        EXPECT_EQ(simgp_format_of_name(none), -1) << none;
    EXPECT_EQ(simgp_format_of_name(nullptr), -1);
}

}  // namespace
