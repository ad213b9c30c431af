// The aligned allocator behind every allocating export and every work buffer
// that a primitive takes for itself.
//
// A block is obtained from the runtime's allocator with room for 32 bytes of
// alignment slack plus one pointer; the returned address is the raw address
// plus at least one pointer, rounded down to a multiple of 32, and the raw
// address sits in the pointer-sized word just before it.  On 32-bit Windows
// that is the classic "size + 36, (raw + 35) & ~31" layout.
#pragma once

#include <cstddef>
#include <cstdint>

namespace zor { namespace mem {

constexpr uint32_t kAlign = 32;
constexpr uint32_t kOverhead = kAlign + sizeof(void*);

// The runtime's allocate and free, reached through writable pointers so that
// tests can substitute a failing allocator.
extern void* (*rawAlloc)(size_t);
extern void (*rawFree)(void*);

// bytes + kOverhead is formed in 32-bit arithmetic and wraps for sizes near
// the top of the 32-bit range; callers that care check their sizes first.
void* alignedAlloc(uint32_t bytes);
void alignedFree(void* p);

// The raw address kept before an aligned block.
inline void* rawAddressOf(const void* p) {
    return static_cast<void* const*>(p)[-1];
}

}}  // namespace zor::mem
