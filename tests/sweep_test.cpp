// Every exported function that has rows, at every width and height up to a little more than what two
// of the widest vectors and a row of tiles hold, at all alignments, with the rows of every target.
#include <fstream>
#include <set>

#include "tests/operations.h"

namespace {

// What has no rows of its own: exported names that begin so, and why.
const char *const without_rows[] = {
    "scmn_bsr_",          "scmn_bsw_",              // bitstreams, one word at a time
    "scmn_fcc2mt",                                  // a table of tags
    "scmn_floor_log2",    "scmn_ceil_log2",         // one number
    "scmn_malloc_",       "scmn_mfree_",            // memory
    "scmn_irsz_create",   "scmn_irsz_delete",       // tests of the resizer's functions use both
    "scmn_version",       "simgp_get_tile_offset",  // no loop
    "simgp_rsz_get_step",                           // no loop
    "simgp_version",      "simgp_result_text",      // constants
    "simgp_format_",                                // names of formats
    "simgp_tbl_",         "tbl_rsz_weight",  // data; the tables of kernels list what is swept
};

TEST(sweep, leaves_out_no_exported_function) {
    std::ifstream list(SIMGP_EXPORTS);
    std::set<std::string> swept;
    for (const rig::operation &o : rig::operations())
        EXPECT_TRUE(swept.insert(o.name).second) << o.name << " twice";
    int names = 0;
    for (std::string name; std::getline(list, name);) {
        if (name.empty() || name[0] == '#') continue;
        names++;
        bool excused = false;
        for (const char *start : without_rows) excused |= name.rfind(start, 0) == 0;
        EXPECT_EQ(swept.erase(name), size_t(!excused)) << name;
    }
    EXPECT_GT(names, 100);
    for (const std::string &name : swept) ADD_FAILURE() << name << " is not exported";
}

class DISABLED_sweep : public testing::TestWithParam<const char *> {};

// Alone, so that a fault in one family hides none of another.
TEST_P(DISABLED_sweep, every_size) {
    rig::rng random(rig::seed());
    const rig::chooser pick = [&](int n) { return random.below(n); };
    int calls = 0;
    for (const rig::operation &o : rig::operations()) {
        if (o.family != GetParam()) continue;
        // An entry point that leads to many kernels takes more than one turn.
        const int turns = o.name == "simgp_csc_any" ? 12 : o.name == "simgp_csc" ? 3 : 1;
        for (int turn = 0; turn < turns; turn++)
            ASSERT_TRUE(rig::check_every_size(o.name, 130, 34, random, [&](int w, int h) {
                calls++;
                return o.make({w, h}, pick);
            }));
    }
    ASSERT_GT(calls, 0);
    RecordProperty("calls_of_each_target", calls);
}
INSTANTIATE_TEST_SUITE_P(all, DISABLED_sweep,
                         testing::Values("csc", "csc_any", "copy", "fill", "dither", "turn",
                                         "resize", "resize_rot", "resize_csc", "irsz", "deblock",
                                         "keyframe"));

}  // namespace
