#include "tests/fuzz/whitebox.h"

#include <cstdlib>

#include "frame/dispatch.h"
#include "frame/memory.h"
#include "tests/support/variants.h"

namespace zf {

std::vector<Entries> variantEntries() {
    const zor::dispatch::Table t = zor::dispatch::libraryTable();
    std::vector<Entries> all(5);
    for (int k = 0; k < 5; ++k) {
        if (!zt::variantSupported(k)) continue;
        for (int r = 0; r < t.count; ++r) all[k].push_back(reinterpret_cast<Entry>(t.rows[r].entry[k]));
    }
    return all;
}

CountingAllocator* CountingAllocator::current_ = nullptr;

CountingAllocator::CountingAllocator(size_t largest)
    : largest_(largest), savedAlloc_(zor::mem::rawAlloc), savedFree_(zor::mem::rawFree) {
    current_ = this;
    zor::mem::rawAlloc = &CountingAllocator::allocate;
    zor::mem::rawFree = &CountingAllocator::release;
}

CountingAllocator::~CountingAllocator() {
    zor::mem::rawAlloc = savedAlloc_;
    zor::mem::rawFree = savedFree_;
    current_ = nullptr;
}

void CountingAllocator::failAt(int64_t k) {
    if (k > 0) failed_ = false;  // (disarming keeps what happened readable)
    failAt_ = k > 0 ? taken_.load() + k : 0;
}

void* CountingAllocator::allocate(size_t bytes) {
    CountingAllocator& c = *current_;
    const int64_t n = ++c.taken_;
    if (c.failAt_.load() == n) {
        c.failed_ = true;
        return nullptr;
    }
    if (c.largest_ && bytes > c.largest_) {
        ++c.refusedLarge_;
        return nullptr;
    }
    void* p = std::malloc(bytes);
    if (p) ++c.live_;
    return p;
}

void CountingAllocator::release(void* p) {
    if (!p) return;
    --current_->live_;
    std::free(p);
}

}  // namespace zf
