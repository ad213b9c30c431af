// Processor classification from recorded cpuid results.
#include <gtest/gtest.h>

#include <cstring>

#include "frame/cpu.h"

using namespace zor::cpu;

namespace {

// Builds the cpuid results of an imagined processor.
struct Fake {
    CpuidRecords r;
    explicit Fake(const char* vendor = "GenuineIntel", uint32_t family = 6) {
        r.available = true;
        r.leaf0.eax = 4;
        std::memcpy(&r.leaf0.ebx, vendor + 0, 4);
        std::memcpy(&r.leaf0.edx, vendor + 4, 4);
        std::memcpy(&r.leaf0.ecx, vendor + 8, 4);
        r.leaf1.eax = (family & 0xF) << 8;
        r.leaf1.edx = 1u;  // x87 on chip
        r.ext0.eax = 0x80000008u;
    }
    Fake& mmx() { r.leaf1.edx |= 1u << 23; return *this; }
    Fake& sse() { r.leaf1.edx |= 1u << 25; return *this; }
    Fake& sse2() { r.leaf1.edx |= 1u << 26; return *this; }
    Fake& sse3() { r.leaf1.ecx |= 1u << 0; return *this; }
    Fake& ssse3() { r.leaf1.ecx |= 1u << 9; return *this; }
    Fake& x64() { r.ext1.edx |= 1u << 29; return *this; }
    Fake& cores(uint32_t n) { r.leaf4.eax = (n - 1) << 26; return *this; }
    Fake& logical(uint32_t n) { r.leaf1.edx |= 1u << 28; r.leaf1.ebx = n << 16; return *this; }
    Fake& maxLeaf(uint32_t n) { r.leaf0.eax = n; return *this; }
    Fake& maxExt(uint32_t n) { r.ext0.eax = n; return *this; }
    int type() const { return processorType(r); }
};

}  // namespace

TEST(ProcessorType, NoCpuidIsUnknown) {
    CpuidRecords none;
    EXPECT_EQ(processorType(none), CpuUnknown);
    EXPECT_EQ(coreCount(none), 1u);
}

TEST(ProcessorType, Family5) {
    EXPECT_EQ(Fake("GenuineIntel", 5).type(), CpuFamily5);
    EXPECT_EQ(Fake("GenuineIntel", 5).mmx().type(), CpuFamily5Mmx);
}

TEST(ProcessorType, Family6WithoutSse2) {
    EXPECT_EQ(Fake().type(), CpuFamily6);
    EXPECT_EQ(Fake().mmx().type(), CpuFamily6Mmx);
    EXPECT_EQ(Fake().mmx().sse().type(), CpuFamily6Sse);
}

TEST(ProcessorType, Family6Sse2AndSse3ByCoreCount) {
    EXPECT_EQ(Fake().mmx().sse().sse2().type(), CpuFamily6Sse2);
    EXPECT_EQ(Fake().sse().sse2().sse3().cores(1).type(), CpuFamily6Sse3);
    EXPECT_EQ(Fake().sse().sse2().sse3().cores(2).type(), CpuFamily6Sse3Multi);
}

TEST(ProcessorType, Ssse3ByCoreCount) {
    EXPECT_EQ(Fake().sse().sse2().sse3().ssse3().cores(2).type(), CpuSsse3);
    EXPECT_EQ(Fake().sse().sse2().sse3().ssse3().cores(4).type(), CpuSsse3Multi);
    // Below leaf 4 the core count is 1, whatever leaf 4 would say.
    EXPECT_EQ(Fake().sse().sse2().sse3().ssse3().cores(4).maxLeaf(3).type(), CpuSsse3);
}

TEST(ProcessorType, Family7) {
    EXPECT_EQ(Fake("GenuineIntel", 7).sse().sse2().type(), CpuFamily7);
}

TEST(ProcessorType, Family15) {
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().type(), CpuFamily15);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().type(), CpuFamily15Sse2);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().logical(2).type(), CpuFamily15Sse2Mt);
    // One logical processor is not multi-threaded even with the HTT flag.
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().logical(1).type(), CpuFamily15Sse2);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().ssse3().type(), CpuFamily15Ssse3);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().sse3().type(), CpuFamily15Sse3);
    // Without 64-bit SSE3 decides before SSSE3 is looked at.
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().sse3().ssse3().type(), CpuFamily15Sse3);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().sse3().x64().type(), CpuFamily15Sse3X64);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().sse3().x64().ssse3().cores(2).type(), CpuSsse3);
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().sse3().x64().ssse3().cores(3).type(),
              CpuSsse3Multi);
}

TEST(ProcessorType, SixtyFourBitNeedsTheExtendedLeaf) {
    // With the extended leaf 0x80000001 unreported the 64-bit flag is not read.
    EXPECT_EQ(Fake("GenuineIntel", 15).sse().sse2().sse3().x64().maxExt(0x80000000u).type(),
              CpuFamily15Sse3);
    EXPECT_EQ(features(Fake().x64().maxExt(0x80000000u).r).has64Bit, 0u);
    EXPECT_EQ(features(Fake().x64().r).has64Bit, 1u);
}

TEST(ProcessorType, OtherVendorsAndUnlistedFamilies) {
    for (const char* vendor : {"AuthenticAMD", "CentaurHauls", "GenuineIntel"}) {
        const uint32_t family = std::strcmp(vendor, "GenuineIntel") == 0 ? 3 : 6;
        SCOPED_TRACE(vendor);
        EXPECT_EQ(Fake(vendor, family).mmx().type(), CpuUnknown);
        EXPECT_EQ(Fake(vendor, family).sse().type(), CpuGenericSse);
        EXPECT_EQ(Fake(vendor, family).sse().sse2().type(), CpuGenericSse2);
        EXPECT_EQ(Fake(vendor, family).sse().sse2().sse3().type(), CpuGenericSse3);
        EXPECT_EQ(Fake(vendor, family).sse().sse2().sse3().ssse3().cores(1).type(), CpuSsse3);
        EXPECT_EQ(Fake(vendor, family).sse().sse2().sse3().ssse3().cores(8).type(), CpuSsse3Multi);
    }
    // An SSE2 processor of another vendor is 65 whatever its family.
    for (uint32_t family : {5u, 6u, 15u})
        EXPECT_EQ(Fake("AuthenticAMD", family).sse().sse2().type(), CpuGenericSse2);
}

TEST(FeatureRecord, Fields) {
    Fake f("GenuineIntel", 6);
    f.r.leaf1.eax |= 0x7A;  // model 7, stepping 10
    f.r.leaf2.eax = 0x11223344;
    f.r.leaf2.edx = 0x55667788;
    f.mmx().sse().sse2().logical(2).cores(3);
    const FeatureRecord fr = features(f.r);
    EXPECT_EQ(fr.family, 6u);
    EXPECT_EQ(fr.model, 7u);
    EXPECT_EQ(fr.stepping, 10u);
    EXPECT_EQ(fr.reserved, 0u);
    EXPECT_EQ(fr.featureWord, f.r.leaf1.edx);
    EXPECT_EQ(fr.cacheDescriptors[0], 0x11223344u);
    EXPECT_EQ(fr.cacheDescriptors[1], 0x55667788u);
    EXPECT_EQ(fr.hasMmx, 1u);
    EXPECT_EQ(fr.hasSse, 1u);
    EXPECT_EQ(fr.hasSse2, 1u);
    EXPECT_EQ(fr.hasSse3, 0u);
    EXPECT_EQ(fr.multiThreaded, 1u);
    EXPECT_EQ(fr.coresPerPackage, 3u);
}

TEST(ProcessorType, LiveReaderAgreesWithTheRecords) {
    const CpuidRecords r = readCpuid();
    ASSERT_TRUE(r.available);
    EXPECT_EQ(processorType(), processorType(r));
    // The vendor string is what leaf 0 reports, twelve printable characters.
    char vendor[13] = {0};
    std::memcpy(vendor + 0, &r.leaf0.ebx, 4);
    std::memcpy(vendor + 4, &r.leaf0.edx, 4);
    std::memcpy(vendor + 8, &r.leaf0.ecx, 4);
    for (char c : std::string(vendor)) EXPECT_TRUE(c >= ' ' && c <= '~');
}
