// libFuzzer target: each input is a sequence of calls of any export on any
// code variant the processor runs, decoded by the call decoder (calls.h).
// Blocks above 256 MB are refused by the allocator hook, as on a machine
// with less memory: huge objects must then fail with StatusNoMemory at once.
#include <cstdio>
#include <cstdlib>

#include "tests/fuzz/calls.h"
#include "tests/fuzz/whitebox.h"

namespace {

uint64_t gCalls = 0;

zf::Caller& caller() {
    static zf::CountingAllocator counter(size_t(256) << 20);
    static zf::Caller c = [] {
        zf::Options o;
        o.allocations = &counter;
        o.reportSlow = std::getenv("ZOR_FUZZ_QUIET") == nullptr;
        return zf::Caller(zf::variantEntries(), o);
    }();
    return c;
}

void summary() { std::fprintf(stderr, "zor_fuzz: %llu calls made\n", static_cast<unsigned long long>(gCalls)); }

}  // namespace

extern "C" int LLVMFuzzerInitialize(int*, char***) {
    int skipped = 0;
    for (const zf::Export& e : zf::exports())
        if (!e.skipReason.empty()) {
            std::fprintf(stderr, "zor_fuzz: not called: %s (%s)\n", e.name.c_str(), e.skipReason.c_str());
            ++skipped;
        }
    std::fprintf(stderr, "zor_fuzz: %zu exports, %d not callable\n", zf::exports().size(), skipped);
    caller();
    std::atexit(summary);
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    zf::Source src(data, size);
    const zf::Outcome o = caller().run(src, &gCalls);
    if (!o.failure.empty()) {
        std::fprintf(stderr, "zor_fuzz FAILED: %s\n  call: %s\n", o.failure.c_str(), o.description.c_str());
        std::abort();
    }
    return 0;
}
