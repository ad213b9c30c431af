// Every export of the manifest, reached through the shared library: its stub
// is one jump through a bound slot of its own.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <set>
#include <string>

#if defined(_WIN32)
#  include <windows.h>
#else
#  include <dlfcn.h>
#endif

#include "zor.h"

namespace {

const char* const kExportNames[] = {
#define ZOR_FN(map, ret, name, params) #name,
#include "zor_manifest.h"
#undef ZOR_FN
};

// The address that the library's export table gives for a name.
const uint8_t* exportAddress(const char* name) {
#if defined(_WIN32)
    static const HMODULE lib = GetModuleHandleA("zor.dll");
    return reinterpret_cast<const uint8_t*>(GetProcAddress(lib, name));
#else
    // Looked up in the library itself, not in the program that links it.
    static void* const lib = dlopen("libzor.so.5", RTLD_NOW | RTLD_NOLOAD);
    return static_cast<const uint8_t*>(dlsym(lib, name));
#endif
}

TEST(Exports, EachIsOneJumpThroughABoundSlotOfItsOwn) {
    std::set<const void*> slots;
    for (const char* name : kExportNames) {
        SCOPED_TRACE(name);
        const uint8_t* code = exportAddress(name);
        ASSERT_NE(code, nullptr);
        // jmp *slot: ff 25, then the slot's address relative to the next
        // instruction (x86-64) or absolute (i386).
        ASSERT_EQ(code[0], 0xff);
        ASSERT_EQ(code[1], 0x25);
        int32_t operand;
        std::memcpy(&operand, code + 2, sizeof operand);
#if defined(__x86_64__)
        const auto slot = reinterpret_cast<void* const*>(code + 6 + operand);
#else
        const auto slot = reinterpret_cast<void* const*>(static_cast<uintptr_t>(static_cast<uint32_t>(operand)));
#endif
        EXPECT_NE(*slot, nullptr);
        EXPECT_TRUE(slots.insert(slot).second) << "slot shared with another export";
    }
}

}  // namespace
