// The same calls from 8 threads at once: every export on every variant the
// processor runs, each thread with its own buffers and its own spec and
// state objects, all threads sharing read-only FFT specs.  Each result and
// output must equal what one thread alone got.  Run under ThreadSanitizer
// by `make test-tsan`.
//
//   zor_threads [--calls N] [--threads T]
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <string>
#include <thread>
#include <vector>

#include "tests/fuzz/whitebox.h"

namespace {

template <class T>
zf::Slot slot(T v) {
    zf::Slot s{};
    std::memcpy(s.raw, &v, sizeof v);
    return s;
}

int64_t invoke(const zf::Entries& entries, const char* name, std::vector<zf::Slot> args) {
    const zf::Export* e = zf::findExport(name);
    return e->invoke(entries[e->index], args.data());
}

// FFT specs of orders 0 to 10 of both kinds, made once and used by every
// thread; freed at the end.
struct SharedSpecs {
    const zf::Entries& entries;
    std::vector<std::pair<const char*, void*>> made;  // free function, spec
    std::map<std::string, std::map<int, void*>> byKind;

    explicit SharedSpecs(const zf::Entries& e) : entries(e) {
        const char* const kinds[2][3] = {{"FFT complex spec", "zorsFFTInitAlloc_C_32f", "zorsFFTFree_C_32f"},
                                         {"FFT real spec", "zorsFFTInitAlloc_R_32f", "zorsFFTFree_R_32f"}};
        for (const auto& kind : kinds)
            for (int order = 0; order <= 10; ++order) {
                void* spec = nullptr;
                if (invoke(entries, kind[1], {slot(&spec), slot(order), slot(8), slot(0)}) != StatusOk) continue;
                byKind[kind[0]][order] = spec;
                made.emplace_back(kind[2], spec);
            }
    }
    ~SharedSpecs() {
        for (const auto& m : made) invoke(entries, m.first, {slot(m.second)});
    }
};

}  // namespace

int main(int argc, char** argv) {
    int calls = 2000, threads = 8;
    for (int k = 1; k + 1 < argc; k += 2) {
        const std::string a = argv[k];
        if (a == "--calls") calls = std::atoi(argv[k + 1]);
        else if (a == "--threads") threads = std::atoi(argv[k + 1]);
    }
    const std::vector<zf::Entries> variants = zf::variantEntries();
    const SharedSpecs specs(variants[0]);
    zf::Options options;
    options.bufferLimit = size_t(1) << 20;
    options.shared = specs.byKind;

    // Call i is decoded from seed i alone, so any thread can make any call.
    auto make = [&](int i) {
        zf::Source src(uint64_t(i) * 2654435761u + 1, 10);
        return zf::Caller(variants, options).next(src);
    };
    std::vector<zf::Outcome> alone(calls);
    for (int i = 0; i < calls; ++i) alone[i] = make(i);

    std::vector<std::vector<std::string>> problems(threads);
    std::vector<std::thread> pool;
    for (int t = 0; t < threads; ++t)
        pool.emplace_back([&, t] {
            // each thread starts elsewhere in the list: different exports meet
            for (int j = 0; j < calls; ++j) {
                const int i = (j + t * calls / threads) % calls;
                const zf::Outcome o = make(i);
                std::string why;
                if (!o.failure.empty()) why = o.failure;
                else if (o.made != alone[i].made || o.outputHash != alone[i].outputHash)
                    why = "returned " + zf::statusName(o.result) + " and outputs other than alone (" +
                          zf::statusName(alone[i].result) + ")";  // (the hash holds the status, not pointers)
                if (!why.empty()) problems[t].push_back(why + "\n  call: " + o.description);
                if (problems[t].size() >= 5) break;
            }
        });
    for (std::thread& th : pool) th.join();

    int failures = 0;
    for (const auto& list : problems)
        for (const std::string& p : list) std::fprintf(stderr, "FAILED: %s\n", p.c_str()), ++failures;
    int failedAlone = 0;
    for (const zf::Outcome& o : alone) failedAlone += !o.failure.empty();
    std::printf("%d calls on each of %d threads against one thread: %d differed (%d failed alone)\n", calls, threads,
                failures, failedAlone);
    return failures ? 1 : 0;
}
