#include "frame/memory.h"

#include <cstdlib>

namespace zor { namespace mem {

void* (*rawAlloc)(size_t) = std::malloc;
void (*rawFree)(void*) = std::free;

void* alignedAlloc(uint32_t bytes) {
    const uint32_t total = bytes + kOverhead;
    void* raw = rawAlloc(total);
    if (!raw) return nullptr;
    const uintptr_t base = reinterpret_cast<uintptr_t>(raw);
    const uintptr_t aligned = (base + kOverhead - 1) & ~uintptr_t(kAlign - 1);
    void* p = reinterpret_cast<void*>(aligned);
    static_cast<void**>(p)[-1] = raw;
    return p;
}

void alignedFree(void* p) {
    if (p) rawFree(rawAddressOf(p));
}

}}  // namespace zor::mem
