// Allocation failures: every call that takes blocks from the library's
// allocator is repeated with its k-th block refused, for each k in turn.
// The call must then report StatusNoMemory (a null pointer from the
// allocators), write nothing, leave no block behind and make no object;
// the call oracle checks all but the status, which is checked here.  A
// family that falls back to another path when memory runs out
// (FamilyRule::fallbackDiffers) may instead succeed.
//
//   zor_faults [--tries N] [--seed S]   N seeded calls per export (default 48)
#include <cstdio>
#include <cstdlib>
#include <string>

#include "tests/fuzz/contract.h"
#include "tests/fuzz/whitebox.h"

int main(int argc, char** argv) {
    int tries = 48;
    uint64_t seed = 7;
    for (int k = 1; k + 1 < argc; k += 2) {
        const std::string a = argv[k];
        if (a == "--tries") tries = std::atoi(argv[k + 1]);
        else if (a == "--seed") seed = std::strtoull(argv[k + 1], nullptr, 0);
    }
    zf::CountingAllocator counter(size_t(256) << 20);
    const std::vector<zf::Entries> variants = zf::variantEntries();
    zf::Options options;
    options.allocations = &counter;
    options.bufferLimit = size_t(1) << 20;

    int failures = 0, allocating = 0;
    long injected = 0;
    for (const zf::Export& e : zf::exports()) {
        if (!e.skipReason.empty()) continue;
        const zf::FamilyRule* family = nullptr;
        for (const zf::FamilyRule& f : zf::familyRules())
            if (e.family == f.home) family = &f;
        bool allocates = false;
        for (int t = 0; t < tries && failures < 20; ++t) {
            // Mostly valid calls, so that they get as far as their allocations.
            const uint64_t callSeed = seed * 1000003 + uint64_t(e.index) * 4099 + uint64_t(t);
            const int variant = t % 2 ? int(variants.size()) - 1 : 0;
            zf::Source src(callSeed, 13);
            const zf::Outcome clean = zf::Caller(variants, options).call(src, e.index, variant);
            if (!clean.made || clean.allocations == 0) continue;
            if (!clean.failure.empty()) {
                std::fprintf(stderr, "FAILED (no fault injected): %s\n  call: %s\n", clean.failure.c_str(),
                             clean.description.c_str());
                ++failures;
                continue;
            }
            allocates = true;
            for (int64_t k = 1; k <= clean.allocations && k <= 8; ++k) {
                zf::Options failing = options;
                failing.failAllocation = k;
                zf::Source again(callSeed, 13);
                const zf::Outcome o = zf::Caller(variants, failing).call(again, e.index, variant);
                ++injected;
                std::string why = o.failure;
                const bool noMemory = e.result == zf::Result::Pointer ? o.result == 0
                                      : e.result == zf::Result::Status ? int32_t(o.result) == StatusNoMemory
                                                                       : true;
                if (why.empty() && !counter.failed() && !noMemory)
                    why = "block " + std::to_string(k) + " was never asked for";
                if (why.empty() && !noMemory && !(family && family->fallbackDiffers && o.result >= 0))
                    why = "block " + std::to_string(k) + " of " + std::to_string(clean.allocations) +
                          " refused, but it returned " + zf::statusName(o.result);
                if (!why.empty()) {
                    std::fprintf(stderr, "FAILED: %s\n  call: %s\n", why.c_str(), o.description.c_str());
                    if (++failures >= 20) break;
                }
            }
        }
        allocating += allocates;
    }
    std::printf("%ld refused blocks over %d allocating exports (%d calls each): %d failed\n", injected, allocating,
                tries, failures);
    return failures ? 1 : 0;
}
