// Processor identification: the processor-type code is a pure function of
// the cpuid results, so the classification is tested with recorded results
// and only readCpuid() touches the real instruction.
#pragma once

#include <cstdint>

namespace zor { namespace cpu {

struct Regs { uint32_t eax = 0, ebx = 0, ecx = 0, edx = 0; };

// What cpuid answered for the leaves the classification reads.
struct CpuidRecords {
    bool available = false;   // the identification flag (EFLAGS bit 21) toggles
    Regs leaf0;               // highest leaf and vendor
    Regs leaf1;               // signature and feature flags
    Regs leaf2;               // cache descriptors
    Regs leaf4;               // deterministic cache parameters, sub-leaf 0
    Regs ext0;                // 0x80000000: highest extended leaf
    Regs ext1;                // 0x80000001: extended features
};

struct FeatureRecord {
    uint32_t family = 0, stepping = 0, model = 0, reserved = 0;
    uint32_t featureWord = 0;
    uint32_t cacheDescriptors[2] = {0, 0};
    uint32_t hasMmx = 0, hasSse = 0, hasSse2 = 0, multiThreaded = 0;
    uint32_t hasSse3 = 0, has64Bit = 0, hasSsse3 = 0, coresPerPackage = 1;
};

enum ProcessorType : int {
    CpuUnknown = 0,
    CpuFamily5 = 1,
    CpuFamily5Mmx = 2,
    CpuFamily6 = 3,
    CpuFamily6Mmx = 4,
    CpuFamily6Sse = 5,
    CpuFamily15Sse2 = 6,
    CpuFamily15Sse2Mt = 7,
    CpuFamily15Sse3 = 8,
    CpuFamily6Sse2 = 9,
    CpuFamily6Sse3 = 10,
    CpuFamily6Sse3Multi = 11,
    CpuFamily7 = 16,
    CpuFamily15 = 17,
    CpuFamily15Sse3X64 = 32,
    CpuSsse3 = 33,
    CpuSsse3Multi = 34,
    CpuGenericSse = 64,
    CpuGenericSse2 = 65,
    CpuGenericSse3 = 66,
    CpuFamily15Ssse3 = 67,
};

// The vendor whose family numbering the classification follows.
extern const char kPrimaryVendor[13];

FeatureRecord features(const CpuidRecords& r);
uint32_t coreCount(const CpuidRecords& r);
int processorType(const CpuidRecords& r);

// The live processor.
bool cpuidAvailable();
Regs cpuid(uint32_t leaf, uint32_t subleaf = 0);
CpuidRecords readCpuid();
int processorType();   // processorType(readCpuid())

// ---- register widths beyond the five variants (x86-64) ------------------------
// The widest registers the processor has and the operating system saves,
// in bits: 512 for AVX-512 F, BW, DQ and VL with the opmask and upper
// register state enabled in XCR0, 256 for AVX2 with FMA and the AVX state
// enabled, else 128.  From cpuid leaf 1, leaf 7 (sub-leaf 0) and XCR0 (0
// when leaf 1 reports no OSXSAVE).
int usableWidth(const Regs& leaf1, const Regs& leaf7, uint64_t xcr0);
// The live processor.
int usableWidth();

}}  // namespace zor::cpu
