#include "tests/support/guarded.h"

#include <cstdlib>
#include <new>

#if defined(_WIN32)
#  include <windows.h>
#else
#  include <sys/mman.h>
#  include <unistd.h>
#endif

namespace zt {

namespace {
size_t pageSize() {
#if defined(_WIN32)
    SYSTEM_INFO si;
    GetSystemInfo(&si);
    return si.dwPageSize;
#else
    return static_cast<size_t>(sysconf(_SC_PAGESIZE));
#endif
}

uint8_t* mapPages(size_t bytes) {
#if defined(_WIN32)
    return static_cast<uint8_t*>(VirtualAlloc(nullptr, bytes, MEM_RESERVE | MEM_COMMIT, PAGE_READWRITE));
#else
    void* p = mmap(nullptr, bytes, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    return p == MAP_FAILED ? nullptr : static_cast<uint8_t*>(p);
#endif
}

void protect(uint8_t* p, size_t bytes) {
#if defined(_WIN32)
    DWORD old;
    VirtualProtect(p, bytes, PAGE_NOACCESS, &old);
#else
    mprotect(p, bytes, PROT_NONE);
#endif
}

void unmap(uint8_t* p, size_t bytes) {
#if defined(_WIN32)
    (void)bytes;
    VirtualFree(p, 0, MEM_RELEASE);
#else
    munmap(p, bytes);
#endif
}
}  // namespace

GuardedBuffer::GuardedBuffer(size_t bytes, Guard where) : bytes_(bytes) {
    const size_t page = pageSize();
    const size_t dataPages = (bytes + page - 1) / page;
    // guard | data pages (plus one spare, so a zero-byte buffer still has a
    // page to point into) | guard
    mapped_ = (dataPages + 3) * page;
    base_ = mapPages(mapped_);
    if (!base_) throw std::bad_alloc();
    protect(base_, page);
    protect(base_ + mapped_ - page, page);
    uint8_t* first = base_ + page;
    uint8_t* end = base_ + mapped_ - page;
    data_ = where == Guard::Before ? first : end - bytes;
}

GuardedBuffer::~GuardedBuffer() { unmap(base_, mapped_); }

}  // namespace zt
