// Black-box checks through the shared library's exports only.
#include <gtest/gtest.h>

#include <cpuid.h>

#include <cstdint>
#include <cstring>
#include <string>

#include "zor.h"

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
    EXPECT_EQ(std::string(s->libraryName), "zors" + tag + "l.lib");
    EXPECT_EQ(std::string(i->libraryName), "zori" + tag + "l.lib");
    EXPECT_EQ(s->build, 412);
    EXPECT_EQ(i->build, 410);
    EXPECT_STREQ(s->buildDate, "Apr  5 2007");
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
    EXPECT_EQ(zorsMalloc_8u(0), nullptr);
    zorsFree(nullptr);
}

TEST(Api, HeaderIsValidC) { EXPECT_EQ(ztHeaderFromC(), 1); }
