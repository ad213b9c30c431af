// The lane vocabulary's test cases, written once (test_simd.cpp) and compiled
// once per column with that column's flags: the SSE2 column (where most
// operations are emulated) and, on x86-64, the AVX2 and AVX-512 ones.  Each
// compiled copy fills a table of its cases in its own namespace (isa<k>, as
// frame/abi.h names it); test_simd_columns.cpp runs the table of every
// column the processor supports.
#pragma once

#define ZT_SIMD_CASES(X)                          \
    X(LanewiseOperationsMatchTheirScalarTwins)    \
    X(WideningAndNarrowingKeepTheirLaneOrder)     \
    X(BlockwiseOperationsFollowTheirLaneIndices)  \
    X(BlocksGathersMasksAndSums)                  \
    X(WholeRegisterLaneOrder)

namespace zt {

struct SimdCases {
#define ZT_SIMD_CASE_SLOT(name) void (*name)();
    ZT_SIMD_CASES(ZT_SIMD_CASE_SLOT)
#undef ZT_SIMD_CASE_SLOT
};

namespace isa2 { extern const SimdCases simdCases; }
namespace isa5 { extern const SimdCases simdCases; }
namespace isa6 { extern const SimdCases simdCases; }

}  // namespace zt
