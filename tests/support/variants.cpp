#include "tests/support/variants.h"

#include <cstdlib>

#include "frame/cpu.h"
#include "frame/dispatch.h"
#include "tests/support/record.h"

#include <cstdio>

namespace zt {

using zor::dispatch::columnApi;

// With ZT_RECORD_CALLS=<file> the generic variant's calls are recorded
// there (every test body runs on it): the fuzzer's seeds.
const Api& api(int variant) {
    static const Api apis[7] = {
        std::getenv("ZT_RECORD_CALLS") ? recordingApi(columnApi(0), std::getenv("ZT_RECORD_CALLS")) : columnApi(0),
        columnApi(1), columnApi(2), columnApi(3), columnApi(4),
        columnApi(kColumns > 5 ? 5 : 4), columnApi(kColumns > 6 ? 6 : 4)};
    return apis[variant];
}

bool variantSupported(int variant) {
    const zor::cpu::Regs l1 = zor::cpu::cpuid(1, 0);
    switch (variant) {
    case 0: return true;
    case 1: return (l1.edx >> 25) & 1;
    case 2: return (l1.edx >> 26) & 1;
    case 3: return l1.ecx & 1;
    case 4: return (l1.ecx >> 9) & 1;
    case 5: return kColumns > 5 && zor::cpu::usableWidth() >= 256;
    case 6: return kColumns > 6 && zor::cpu::usableWidth() >= 512;
    default: return false;
    }
}

const std::vector<int>& supportedVariants() {
    static const std::vector<int> v = [] {
        std::vector<int> r;
        for (int k = 0; k < kColumns; ++k) {
            if (variantSupported(k)) r.push_back(k);
            else if (k >= 5) std::printf("[ SKIPPED  ] column %d (%d-bit registers): not usable on this processor\n",
                                         k, k == 5 ? 256 : 512);
        }
        return r;
    }();
    return v;
}

std::string variantName(const ::testing::TestParamInfo<int>& info) {
    static const char* const names[7] = {"g0", "s1", "s2", "s3", "s4", "w256", "w512"};
    return names[info.param];
}

}  // namespace zt
