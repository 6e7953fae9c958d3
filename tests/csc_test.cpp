// The dispatcher: which pairs of formats convert, and what the others answer.
#include <gtest/gtest.h>

#include "simgp/simgp.h"

TEST(csc, equal_formats_are_refused_before_unknown_ones) {
    simgp_img a{}, b{};
    for (int format : {0, 1, 9, 11, 100, 201, 503, -1}) {
        a.format = b.format = format;
        EXPECT_EQ(simgp_csc(&a, &b), SIMGP_ERR_PARAM) << format;
    }
    a.format = SIMGP_FMT_BGR565;
    b.format = SIMGP_FMT_YUV420;
    EXPECT_EQ(simgp_csc(&a, &b), SIMGP_ERR_UNSUPPORTED);
}
