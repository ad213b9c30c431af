// Every export of the manifest, reached through the shared library: its stub
// is one jump through a bound slot of its own, and a call with all-zero
// arguments comes back with the status of a failed argument check.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <iterator>
#include <map>
#include <set>
#include <string>
#include <type_traits>

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

// Exports whose all-zero call is not a null-pointer failure, and why.
const std::map<std::string, Status> kZeroCallExceptions = {
    {"zorsAtan2_32f_A21", StatusBadSize},    // checks the length before the pointers
    {"zoriGetResizeFract", StatusBadSize},   // checks the values before the pointers
};

// A call with every argument zero: null pointers, zero sizes and values.
// What comes back depends on the result type: free functions accept null,
// allocators return null for a zero size, version getters (no arguments)
// return their record, and everything that takes a pointer fails its null
// check first.
template <class F>
struct ZeroCall;
template <class R, class... A>
struct ZeroCall<R(A...)> {
    template <class Export>
    static void check(const char* name, Export f) {
        SCOPED_TRACE(name);
        if constexpr (std::is_void_v<R>) {
            f(A{}...);
        } else if constexpr (std::is_pointer_v<R>) {
            EXPECT_EQ(f(A{}...) != nullptr, sizeof...(A) == 0);
        } else {
            const auto exception = kZeroCallExceptions.find(name);
            if (exception != kZeroCallExceptions.end()) {
                EXPECT_EQ(f(A{}...), exception->second);
            } else {
                ASSERT_TRUE((std::is_pointer_v<A> || ...)) << "takes no pointer: list its all-zero status";
                EXPECT_EQ(f(A{}...), StatusNullPointer);
            }
        }
    }
};

TEST(Exports, EachCalledWithZeroArguments) {
#define ZOR_FN(map, ret, name, params) ZeroCall<ret params>::check(#name, name);
#include "zor_manifest.h"
#undef ZOR_FN
    const std::set<std::string> exported(std::begin(kExportNames), std::end(kExportNames));
    for (const auto& exception : kZeroCallExceptions)
        EXPECT_EQ(exported.count(exception.first), 1u) << exception.first << " is not exported";
}

// 16-byte records by value: a 32-bit caller passes each in four stack words
// (aligned to 8 bytes in the record, not on the stack).
TEST(Exports, SetsSixteenByteComplexValues) {
    const Complex64s vs{-(int64_t{1} << 40) - 3, (int64_t{1} << 62) + 5};
    const Complex64f vf{-0.1, 3e300};
    Complex64s s[5] = {};
    Complex64f f[5] = {};
    ASSERT_EQ(zorsSet_64sc(vs, s, 4), StatusOk);
    ASSERT_EQ(zorsSet_64fc(vf, f, 4), StatusOk);
    for (int k = 0; k < 4; ++k) {
        EXPECT_EQ(s[k].re, vs.re);
        EXPECT_EQ(s[k].im, vs.im);
        EXPECT_EQ(f[k].re, vf.re);
        EXPECT_EQ(f[k].im, vf.im);
    }
    EXPECT_EQ(s[4].re | s[4].im, 0);
    EXPECT_TRUE(f[4].re == 0.0 && f[4].im == 0.0);
}

}  // namespace
