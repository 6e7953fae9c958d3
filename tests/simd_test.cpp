// Every operation of every vector layer against its meaning over plain lanes.
#include "tests/simd_lists.h"

#include <cstring>

#include "tests/rig.h"

namespace simgp {
// clang-format off
namespace neon   { simd_lists list_operations(); }
namespace sse41  { simd_lists list_operations(); }
namespace avx2   { simd_lists list_operations(); }
namespace avx512 { simd_lists list_operations(); }
// clang-format on
}  // namespace simgp

namespace {

void check_layer(simgp::target target, simgp::simd_lists (*list)()) {
    if (!simgp::target_available(target))
        GTEST_SKIP() << "the processor does not offer " << simgp::target_name(target);
    const simgp::simd_lists lists = list();
    ASSERT_GT(lists.count, 0);
    rig::rng random(rig::seed());
    rig::guarded in(size_t(8 * lists.bytes));
    for (int i = 0; i < lists.count; i++) {
        const auto &op = lists.all[i];
        const std::vector<rig::plane_shape> shape = {rig::samples(op.out_bytes, 1)};
        rig::picture expected(shape), got(shape);
        for (int round = 0; round < (rig::quick() ? 100 : 2000); round++) {
            rig::fill_bytes(in.data(), in.size(), rig::content(round % int(rig::content::count)),
                            random);
            expected.fill_pattern(unsigned(round));
            got.fill_pattern(~unsigned(round));
            op.meaning(in.end(), expected.planes[0]);
            op.run(in.end(), got.planes[0]);
            const std::string fault = got.stray_write() + rig::difference(expected, got);
            ASSERT_EQ(fault, "") << op.name << ", seed " << rig::seed() << ", round " << round;
        }
    }
}

#define LAYER(name) \
    TEST(simd, name) { check_layer(simgp::target::name, simgp::name::list_operations); }
#ifdef SIMGP_HAVE_neon
LAYER(neon)
#endif
#ifdef SIMGP_HAVE_sse41
LAYER(sse41)
#endif
#ifdef SIMGP_HAVE_avx2
LAYER(avx2)
#endif
#ifdef SIMGP_HAVE_avx512
LAYER(avx512)
#endif

TEST(simd, every_layer_is_tested) {
    const auto *suite = testing::UnitTest::GetInstance()->current_test_suite();
    EXPECT_EQ(suite->total_test_count() - 1, SIMGP_LAYERS);
}

}  // namespace
