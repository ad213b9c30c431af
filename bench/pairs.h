// Side-by-side workloads: every workload is registered twice, as
// "<workload>/zor" and "<workload>/peer", and the report pairs them up.
#pragma once

#include <benchmark/benchmark.h>

#include <string>

namespace zb {

struct PairRegistrar {
    PairRegistrar(const std::string& workload, void (*zor)(benchmark::State&),
                  void (*peer)(benchmark::State&), const std::string& peerName,
                  double target);
};

}  // namespace zb

// ZB_PAIR(Id, "workload", zorFn, peerFn, "peer description", target ratio)
// A target of 0 reports the ratio without a target.
#define ZB_PAIR(id, workload, zorFn, peerFn, peerName, target) \
    static const ::zb::PairRegistrar zb_pair_##id(workload, zorFn, peerFn, peerName, target)

// Plain peer loops with zor's rule (exactness-matched peers), compiled for
// the widest registers the compiler has; the clone the processor supports is
// chosen at load.
#if defined(__x86_64__) && defined(__GNUC__) && !defined(__clang__)
#  define ZB_WIDEST_CLONES __attribute__((target_clones("avx512f", "avx2", "default")))
#else
#  define ZB_WIDEST_CLONES
#endif
