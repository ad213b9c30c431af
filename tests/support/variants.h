// Running a test body on every code variant the processor supports.
//
// api(k) is the whole library as variant k's entries, typed exactly like the
// exports, taken straight from column k of the dispatch table: calling
// api(k).zoriFoo(...) runs variant k whatever the load-time binding chose.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "frame/column_api.h"
#include "zor.h"

namespace zt {

using Api = zor::dispatch::ColumnApi;

const Api& api(int variant);

// The columns of the dispatch table: the five variants, and on x86-64 the
// wide columns 5 (AVX2 with FMA) and 6 (AVX-512): api(5) and api(6) hold
// the wide entries where an export has them and the SSSE3 entries elsewhere.
constexpr int kColumns = zor::dispatch::kColumns;

// Variants whose instruction set the running processor has, lowest first.
const std::vector<int>& supportedVariants();
bool variantSupported(int variant);

std::string variantName(const ::testing::TestParamInfo<int>& info);

// A test fixture parameterised by variant:
//   class CopyTest : public zt::VariantTest {};
//   TEST_P(CopyTest, Rows) { z().zoriCopy_8u_C1R(...); }
//   ZT_ALL_VARIANTS(CopyTest);
class VariantTest : public ::testing::TestWithParam<int> {
protected:
    int variant() const { return GetParam(); }
    const Api& z() const { return api(GetParam()); }
};

}  // namespace zt

#define ZT_ALL_VARIANTS(Suite)                                                          \
    INSTANTIATE_TEST_SUITE_P(Variants, Suite, ::testing::ValuesIn(zt::supportedVariants()), \
                             zt::variantName)
