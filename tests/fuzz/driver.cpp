// Random calls of every export through the library's exports (libzor.so,
// zor.dll under wine): the fuzz target's decoder fed by a seeded generator.
//
//   zor_calls [--seed S] [--calls N] [--tame T] [--slow]   random calls
//             [--memory MB] [--limit BYTES]                address space, buffer bound
//   zor_calls --replay FILE...                             fuzzer inputs
//   zor_calls --encode RECORDED OUTDIR                     seed corpus from
//                                                          recorded test calls
//   zor_calls --list                                       how each parameter is made
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <map>
#include <string>
#include <vector>

#include "tests/fuzz/calls.h"

#if !defined(_WIN32)
#include <sys/resource.h>
#endif

namespace {

const char* roleName(zf::Role r) {
    static const char* const names[] = {"count", "step", "stride", "code", "real", "extent", "point", "rect",
                                        "data", "result", "values", "planes", "object", "object out", "block",
                                        "unknown"};
    return names[int(r)];
}

int list() {
    for (const zf::Export& e : zf::exports()) {
        std::printf("%s [%s]%s%s\n", e.name.c_str(), e.family.c_str(), e.skipReason.empty() ? "" : "  NOT CALLED: ",
                    e.skipReason.c_str());
        for (const zf::Param& p : e.params)
            std::printf("    %-20s %s\n", p.name.c_str(), roleName(p.role));
    }
    return 0;
}

int encode(const char* recorded, const char* outdir) {
    std::ifstream in(recorded);
    std::string line;
    int written = 0, skipped = 0;
    while (std::getline(in, line)) {
        zf::Encoder e;
        if (!zf::encodeCall(line, e)) {
            ++skipped;
            continue;
        }
        uint64_t h = 0xCBF29CE484222325ULL;
        for (uint8_t b : e.bytes) h = (h ^ b) * 0x100000001B3ULL;
        char name[64];
        std::snprintf(name, sizeof name, "/seed-%016llx", static_cast<unsigned long long>(h));
        std::ofstream out(std::string(outdir) + name, std::ios::binary);
        out.write(reinterpret_cast<const char*>(e.bytes.data()), std::streamsize(e.bytes.size()));
        ++written;
    }
    std::printf("seed corpus: %d inputs written to %s (%d lines not used)\n", written, outdir, skipped);
    return written ? 0 : 1;
}

void report(const zf::Outcome& o) {
    std::fprintf(stderr, "FAILED: %s\n  call: %s\n", o.failure.c_str(), o.description.c_str());
}

}  // namespace

int main(int argc, char** argv) {
    uint64_t seed = 1, calls = 100000, memoryMB = 4096;
    int tame = 0;
    zf::Options options;
    std::vector<const char*> replay;
    for (int k = 1; k < argc; ++k) {
        const std::string a = argv[k];
        auto value = [&] { return k + 1 < argc ? argv[++k] : ""; };
        if (a == "--list") return list();
        if (a == "--encode" && k + 2 < argc) return encode(argv[k + 1], argv[k + 2]);
        if (a == "--seed") seed = std::strtoull(value(), nullptr, 0);
        else if (a == "--calls") calls = std::strtoull(value(), nullptr, 0);
        else if (a == "--tame") tame = std::atoi(value());
        else if (a == "--slow") options.reportSlow = true;
        else if (a == "--memory") memoryMB = std::strtoull(value(), nullptr, 0);
        else if (a == "--limit") options.bufferLimit = std::strtoull(value(), nullptr, 0);
        else if (a == "--trace") options.trace = true;
        else if (a == "--replay") {
            while (k + 1 < argc) replay.push_back(argv[++k]);
        } else {
            std::fprintf(stderr, "unknown argument %s\n", a.c_str());
            return 2;
        }
    }

    // Objects the contract accepts can be too large for the machine (an FFT
    // of order 30): with the address space bounded they must fail with
    // StatusNoMemory rather than take it all.  (The sanitizers reserve their
    // shadow memory up front; their allocator bound comes from their options.)
#if !defined(_WIN32) && !defined(__SANITIZE_ADDRESS__) && !defined(__SANITIZE_THREAD__)
    if (memoryMB) {
        const rlimit bound = {rlim_t(memoryMB) << 20, rlim_t(memoryMB) << 20};
        setrlimit(RLIMIT_AS, &bound);
    }
#endif
    zf::Caller caller({zf::exportedEntries()}, options);
    int failures = 0;
    if (!replay.empty()) {
        for (const char* file : replay) {
            std::ifstream in(file, std::ios::binary);
            const std::vector<uint8_t> bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
            zf::Source src(bytes.data(), bytes.size());
            const zf::Outcome o = caller.run(src);
            if (!o.failure.empty()) report(o), ++failures;
        }
        std::printf("%zu inputs replayed, %d failed\n", replay.size(), failures);
        return failures ? 1 : 0;
    }

    int skipped = 0;
    for (const zf::Export& e : zf::exports())
        if (!e.skipReason.empty()) {
            std::printf("not called: %s (%s)\n", e.name.c_str(), e.skipReason.c_str());
            ++skipped;
        }
    const auto t0 = std::chrono::steady_clock::now();
    zf::Source src(seed, tame);
    uint64_t made = 0, ok = 0;
    std::map<std::string, uint64_t> succeeded;  // export -> calls that returned no error
    while (made < calls) {
        const zf::Outcome o = caller.next(src);
        if (!o.made) continue;
        ++made;
        if (o.result >= 0) ++ok;
        if (!o.failure.empty()) {
            report(o);
            if (++failures >= 20) break;
        }
    }
    const double seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - t0).count();
    std::printf("%llu calls of %zu exports (%d not callable) in %.1f s, %llu without error, seed %llu: %d failed\n",
                static_cast<unsigned long long>(made), zf::exports().size(), skipped, seconds,
                static_cast<unsigned long long>(ok), static_cast<unsigned long long>(seed), failures);
    return failures ? 1 : 0;
}
