// For programs linked with the static library: every code variant's entries
// (not only the one bound at load) and a counting, failing allocator
// installed in the library's hook.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "tests/fuzz/calls.h"

namespace zf {

// Entries of every variant the processor runs (empty for the others).
std::vector<Entries> variantEntries();

// Counts the blocks the library takes and returns through its allocator
// hook, and fails the k-th block when asked to; largest bounds a block, as
// on a machine with less memory (0: no bound).  One at a time.
class CountingAllocator final : public AllocationCounter {
public:
    explicit CountingAllocator(size_t largest = 0);
    ~CountingAllocator() override;

    int64_t live() const override { return live_.load(); }
    int64_t taken() const override { return taken_.load(); }
    void failAt(int64_t k) override;
    bool failed() const override { return failed_.load(); }
    int64_t refusedLarge() const { return refusedLarge_.load(); }

private:
    static void* allocate(size_t bytes);
    static void release(void* p);
    static CountingAllocator* current_;
    size_t largest_;
    std::atomic<int64_t> live_{0}, taken_{0}, failAt_{0}, refusedLarge_{0};
    std::atomic<bool> failed_{false};
    void* (*savedAlloc_)(size_t);
    void (*savedFree_)(void*);
};

}  // namespace zf
