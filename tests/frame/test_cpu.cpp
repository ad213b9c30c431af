// Processor classification from recorded cpuid results.
#include <gtest/gtest.h>

#include <cstring>

#include "frame/cpu.h"

using namespace zor::cpu;

namespace {

// Builds the cpuid results of an imagined processor.
struct Fake {
    CpuidRecords r;
    explicit Fake(uint32_t family = 6, const char* vendor = "GenuineIntel") {
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
    Fake& sse2() { r.leaf1.edx |= 3u << 25; return *this; }  // with SSE
    Fake& sse3() { r.leaf1.ecx |= 1u << 0; return sse2(); }
    Fake& ssse3() { r.leaf1.ecx |= 1u << 9; return *this; }
    Fake& x64() { r.ext1.edx |= 1u << 29; return *this; }
    Fake& cores(uint32_t n) { r.leaf4.eax = (n - 1) << 26; return *this; }
    Fake& logical(uint32_t n) { r.leaf1.edx |= 1u << 28; r.leaf1.ebx = n << 16; return *this; }
    Fake& maxLeaf(uint32_t n) { r.leaf0.eax = n; return *this; }
    Fake& maxExt(uint32_t n) { r.ext0.eax = n; return *this; }
    int type() const { return processorType(r); }
};

}  // namespace

TEST(ProcessorType, PrimaryVendorFamiliesByFeaturesAndCores) {
    const std::pair<Fake, int> rows[] = {
        {Fake(5), CpuFamily5},
        {Fake(5).mmx(), CpuFamily5Mmx},
        {Fake(), CpuFamily6},
        {Fake().mmx(), CpuFamily6Mmx},
        {Fake().mmx().sse(), CpuFamily6Sse},
        {Fake().mmx().sse2(), CpuFamily6Sse2},
        {Fake().sse3().cores(1), CpuFamily6Sse3},
        {Fake().sse3().cores(2), CpuFamily6Sse3Multi},
        {Fake().sse3().ssse3().cores(2), CpuSsse3},
        {Fake().sse3().ssse3().cores(4), CpuSsse3Multi},
        {Fake().sse3().ssse3().cores(4).maxLeaf(3), CpuSsse3},  // below leaf 4: one core
        {Fake(7).sse2(), CpuFamily7},
        {Fake(15).sse(), CpuFamily15},
        {Fake(15).sse2(), CpuFamily15Sse2},
        {Fake(15).sse2().logical(2), CpuFamily15Sse2Mt},
        {Fake(15).sse2().logical(1), CpuFamily15Sse2},  // the HTT flag with one logical processor
        {Fake(15).sse2().ssse3(), CpuFamily15Ssse3},
        {Fake(15).sse3(), CpuFamily15Sse3},
        {Fake(15).sse3().ssse3(), CpuFamily15Sse3},  // without 64-bit, SSE3 decides first
        {Fake(15).sse3().x64(), CpuFamily15Sse3X64},
        {Fake(15).sse3().x64().maxExt(0x80000000u), CpuFamily15Sse3},  // 64-bit flag unreported
        {Fake(15).sse3().x64().ssse3().cores(2), CpuSsse3},
        {Fake(15).sse3().x64().ssse3().cores(3), CpuSsse3Multi},
    };
    for (const auto& row : rows) EXPECT_EQ(row.first.type(), row.second) << "row " << &row - rows;
    EXPECT_EQ(processorType(CpuidRecords{}), CpuUnknown);  // no cpuid
    EXPECT_EQ(coreCount(CpuidRecords{}), 1u);
}

// Other vendors, and unlisted families of the primary one, go by the flags alone.
TEST(ProcessorType, OtherVendorsAndUnlistedFamilies) {
    for (const auto& vendor : {std::make_pair("AuthenticAMD", 6u), std::make_pair("CentaurHauls", 15u),
                               std::make_pair("GenuineIntel", 3u)}) {
        SCOPED_TRACE(vendor.first);
        const Fake f(vendor.second, vendor.first);
        EXPECT_EQ(Fake(f).mmx().type(), CpuUnknown);
        EXPECT_EQ(Fake(f).sse().type(), CpuGenericSse);
        EXPECT_EQ(Fake(f).sse2().type(), CpuGenericSse2);
        EXPECT_EQ(Fake(f).sse3().type(), CpuGenericSse3);
        EXPECT_EQ(Fake(f).sse3().ssse3().cores(1).type(), CpuSsse3);
        EXPECT_EQ(Fake(f).sse3().ssse3().cores(8).type(), CpuSsse3Multi);
    }
}

TEST(FeatureRecord, Fields) {
    Fake f(6);
    f.r.leaf1.eax |= 0x7A;  // model 7, stepping 10
    f.r.leaf2.eax = 0x11223344;
    f.r.leaf2.edx = 0x55667788;
    f.mmx().sse2().logical(2).cores(3).x64();
    const FeatureRecord r = features(f.r);
    const uint32_t got[] = {r.family, r.model, r.stepping, r.reserved, r.featureWord, r.cacheDescriptors[0],
                            r.cacheDescriptors[1], r.hasMmx, r.hasSse, r.hasSse2, r.hasSse3, r.hasSsse3,
                            r.has64Bit, r.multiThreaded, r.coresPerPackage};
    const uint32_t want[] = {6, 7, 10, 0, f.r.leaf1.edx, 0x11223344, 0x55667788, 1, 1, 1, 0, 0, 1, 1, 3};
    for (size_t k = 0; k < sizeof got / sizeof got[0]; ++k) EXPECT_EQ(got[k], want[k]) << "field " << k;
    EXPECT_EQ(features(f.maxExt(0x80000000u).r).has64Bit, 0u);
}

// The 32-bit probe (toggling the identification flag) finds cpuid.
TEST(ProcessorType, LiveCpuidIsAvailable) { EXPECT_TRUE(readCpuid().available); }
