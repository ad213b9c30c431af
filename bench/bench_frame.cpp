// The frame's own workload: aligned allocation.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include "bench/pairs.h"
#include "zor.h"

namespace {

void zorAllocFree(benchmark::State& state) {
    for (auto _ : state) {
        float* p = zorsMalloc_32f(16384);
        benchmark::DoNotOptimize(p);
        zorsFree(p);
    }
}

void cvAllocFree(benchmark::State& state) {
    for (auto _ : state) {
        void* p = cv::fastMalloc(16384 * sizeof(float));
        benchmark::DoNotOptimize(p);
        cv::fastFree(p);
    }
}

}  // namespace

ZB_PAIR(alloc, "zorsMalloc_32f+zorsFree 64 KiB", zorAllocFree, cvAllocFree,
        "cv::fastMalloc+cv::fastFree", 0);
