// Runs the lane vocabulary's cases (simd_cases.h) as each column compiled
// them, skipping the columns whose registers the processor lacks.
#include "tests/frame/simd_cases.h"
#include "tests/support/variants.h"

#include <gtest/gtest.h>

namespace {

const zt::SimdCases& casesOf(int column) {
#if defined(__x86_64__)
    if (column == 5) return zt::isa5::simdCases;
    if (column == 6) return zt::isa6::simdCases;
#endif
    return zt::isa2::simdCases;
}

class SimdLanes : public ::testing::TestWithParam<int> {
protected:
    void SetUp() override {
        if (!zt::variantSupported(GetParam()))
            GTEST_SKIP() << "this processor (or its operating system) lacks the registers of column "
                         << zt::variantName({GetParam(), 0});
    }
};

#define ZT_RUN_SIMD_CASE(name) \
    TEST_P(SimdLanes, name) { casesOf(GetParam()).name(); }
ZT_SIMD_CASES(ZT_RUN_SIMD_CASE)

#if defined(__x86_64__)
INSTANTIATE_TEST_SUITE_P(Columns, SimdLanes, ::testing::Values(2, 5, 6), zt::variantName);
#else
INSTANTIATE_TEST_SUITE_P(Columns, SimdLanes, ::testing::Values(2), zt::variantName);
#endif

}  // namespace
