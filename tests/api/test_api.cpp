// Black-box checks through the shared library's exports only.
#include <gtest/gtest.h>

#include <cpuid.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include "zor.h"
#include "zor_ext.h"

extern "C" int ztHeaderFromC(void);

namespace {
// Whether the processor has the instruction set a variant tag stands for.
bool processorRuns(const std::string& tag) {
    unsigned a = 0, b = 0, c = 0, d = 0;
    __get_cpuid(1, &a, &b, &c, &d);
    if (tag == "g0") return true;
    if (tag == "s1") return d & (1u << 25);
    if (tag == "s2") return d & (1u << 26);
    if (tag == "s3") return c & 1u;
    if (tag == "s4") return c & (1u << 9);
    return false;
}
}  // namespace

TEST(Api, VersionRecordsOfTheBoundVariant) {
    const LibraryVersion* s = zorsGetLibVersion();
    const LibraryVersion* i = zoriGetLibVersion();
    ASSERT_NE(s, nullptr);
    ASSERT_NE(i, nullptr);
    const std::string tag(s->cpuTag);
    EXPECT_EQ(tag, std::string(i->cpuTag));
    EXPECT_TRUE(processorRuns(tag)) << tag;
    // Every SSSE3 processor that these machines have (current x86-64 parts of
    // either vendor) is classified so that the top variant is selected.
    unsigned a = 0, b = 0, c = 0, d = 0;
    __get_cpuid(1, &a, &b, &c, &d);
    if (c & (1u << 9)) {
        EXPECT_EQ(tag, "s4");
    }
}

TEST(Api, AllocateWriteFree) {
    float* v = zorsMalloc_32f(1001);
    ASSERT_NE(v, nullptr);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(v) % 32, 0u);
    for (int k = 0; k < 1001; ++k) v[k] = static_cast<float>(k);
    zorsFree(v);
    int step = 0;
    uint16_t* img = zoriMalloc_16u_C3(11, 3, &step);
    ASSERT_NE(img, nullptr);
    EXPECT_EQ(step, 96);
    std::memset(img, 0, static_cast<size_t>(step) * 3);
    zoriFree(img);
}

TEST(Api, HeaderIsValidC) { EXPECT_EQ(ztHeaderFromC(), 1); }

#if defined(__x86_64__)
// The width the load bound: what the processor and the operating system
// allow (AVX2 with FMA for 256, AVX-512 F/BW/DQ/VL for 512, each with its
// register state enabled in XCR0), capped by ZOR_MAX_WIDTH.
TEST(Api, BoundWidth) {
    unsigned a = 0, b = 0, c = 0, d = 0, b7 = 0;
    __get_cpuid(1, &a, &b, &c, &d);
    const bool xsave = c & (1u << 27);
    unsigned xlo = 0, xhi = 0;
    if (xsave) __asm__("xgetbv" : "=a"(xlo), "=d"(xhi) : "c"(0));
    __get_cpuid_count(7, 0, &a, &b7, &c, &d);
    unsigned c1 = 0;
    __get_cpuid(1, &a, &b, &c1, &d);
    int usable = 128;
    if (xsave && (c1 & (1u << 28)) && (c1 & (1u << 12)) && (xlo & 6) == 6 && (b7 & (1u << 5))) {
        usable = 256;
        const unsigned avx512 = (1u << 16) | (1u << 17) | (1u << 30) | (1u << 31);
        if ((b7 & avx512) == avx512 && (xlo & 0xE6) == 0xE6) usable = 512;
    }
    const char* env = std::getenv("ZOR_MAX_WIDTH");
    const int cap = !env ? 512 : std::string(env) == "128" ? 128 : std::string(env) == "256" ? 256 : 512;
    EXPECT_EQ(zorGetBoundWidth(), usable < cap ? usable : cap);
}
#endif
