#include "frame/cpu.h"

#include <cstring>

#if defined(__GNUC__)
#  include <cpuid.h>
#endif

namespace zor { namespace cpu {

const char kPrimaryVendor[13] = "GenuineIntel";

namespace {
inline uint32_t bit(uint32_t word, int n) { return (word >> n) & 1u; }

bool isPrimaryVendor(const Regs& leaf0) {
    char v[12];
    std::memcpy(v + 0, &leaf0.ebx, 4);
    std::memcpy(v + 4, &leaf0.edx, 4);
    std::memcpy(v + 8, &leaf0.ecx, 4);
    return std::memcmp(v, kPrimaryVendor, 12) == 0;
}
}  // namespace

uint32_t coreCount(const CpuidRecords& r) {
    if (!r.available || r.leaf0.eax < 4) return 1;
    return (r.leaf4.eax >> 26) + 1;
}

FeatureRecord features(const CpuidRecords& r) {
    FeatureRecord f;
    const Regs& l1 = r.leaf1;
    f.family = (l1.eax >> 8) & 0xF;
    f.stepping = l1.eax & 0xF;
    f.model = (l1.eax >> 4) & 0xF;
    f.featureWord = l1.edx;
    f.cacheDescriptors[0] = r.leaf2.eax;
    f.cacheDescriptors[1] = r.leaf2.edx;
    f.hasMmx = bit(l1.edx, 23);
    f.hasSse = bit(l1.edx, 25);
    f.hasSse2 = bit(l1.edx, 26);
    f.multiThreaded = (bit(l1.edx, 28) && ((l1.ebx >> 16) & 0xFF) > 1) ? 1 : 0;
    f.hasSse3 = bit(l1.ecx, 0);
    f.has64Bit = r.ext0.eax >= 0x80000001u ? bit(r.ext1.edx, 29) : 0;
    f.hasSsse3 = bit(l1.ecx, 9);
    f.coresPerPackage = coreCount(r);
    return f;
}

int processorType(const CpuidRecords& r) {
    if (!r.available) return CpuUnknown;
    const FeatureRecord f = features(r);
    const uint32_t cores = f.coresPerPackage;

    if (isPrimaryVendor(r.leaf0)) {
        switch (f.family) {
        case 7:
            return CpuFamily7;
        case 31:  // the family field has four bits: never taken, kept as documented
            return CpuFamily15;
        case 15:
            if (!f.hasSse2) return CpuFamily15;
            if (!f.hasSse3) {
                if (f.hasSsse3) return CpuFamily15Ssse3;
                return f.multiThreaded ? CpuFamily15Sse2Mt : CpuFamily15Sse2;
            }
            if (!f.has64Bit) return CpuFamily15Sse3;
            if (!f.hasSsse3) return CpuFamily15Sse3X64;
            return cores < 3 ? CpuSsse3 : CpuSsse3Multi;
        case 5:
            return f.hasMmx ? CpuFamily5Mmx : CpuFamily5;
        case 6:
            if (!f.hasSse2) {
                if (f.hasSse) return CpuFamily6Sse;
                return f.hasMmx ? CpuFamily6Mmx : CpuFamily6;
            }
            if (!f.hasSsse3) {
                if (!f.hasSse3) return CpuFamily6Sse2;
                return cores < 2 ? CpuFamily6Sse3 : CpuFamily6Sse3Multi;
            }
            return cores < 3 ? CpuSsse3 : CpuSsse3Multi;
        default:
            break;  // an unlisted family is classified like another vendor's
        }
    }
    if (!f.hasSsse3) {
        if (f.hasSse3) return CpuGenericSse3;
        if (f.hasSse2) return CpuGenericSse2;
        if (f.hasSse) return CpuGenericSse;
        return CpuUnknown;
    }
    return cores < 3 ? CpuSsse3 : CpuSsse3Multi;
}

bool cpuidAvailable() {
#if defined(__x86_64__)
    return true;  // every x86-64 processor has cpuid
#elif defined(__i386__)
    // Toggle the identification flag and see whether it sticks.
    uint32_t before, after;
    __asm__ volatile(
        "pushfl\n\t"
        "pushfl\n\t"
        "popl %0\n\t"
        "movl %0, %1\n\t"
        "xorl $0x200000, %1\n\t"
        "pushl %1\n\t"
        "popfl\n\t"
        "pushfl\n\t"
        "popl %1\n\t"
        "popfl\n\t"
        : "=&r"(before), "=&r"(after)
        :
        : "cc");
    return ((before ^ after) & 0x200000u) != 0;
#else
    return false;
#endif
}

Regs cpuid(uint32_t leaf, uint32_t subleaf) {
    Regs r;
#if defined(__GNUC__) && (defined(__x86_64__) || defined(__i386__))
    __cpuid_count(leaf, subleaf, r.eax, r.ebx, r.ecx, r.edx);
#else
    (void)leaf;
    (void)subleaf;
#endif
    return r;
}

CpuidRecords readCpuid() {
    CpuidRecords r;
    r.available = cpuidAvailable();
    if (!r.available) return r;
    r.leaf0 = cpuid(0);
    if (r.leaf0.eax >= 1) r.leaf1 = cpuid(1);
    if (r.leaf0.eax >= 2) r.leaf2 = cpuid(2);
    if (r.leaf0.eax >= 4) r.leaf4 = cpuid(4, 0);
    r.ext0 = cpuid(0x80000000u);
    if (r.ext0.eax >= 0x80000001u) r.ext1 = cpuid(0x80000001u);
    return r;
}

int processorType() { return processorType(readCpuid()); }

int usableWidth(const Regs& leaf1, const Regs& leaf7, uint64_t xcr0) {
    const bool osxsave = bit(leaf1.ecx, 27), avx = bit(leaf1.ecx, 28), fma = bit(leaf1.ecx, 12);
    const bool avxState = (xcr0 & 0x6) == 0x6;        // XMM and YMM state
    const bool zmmState = (xcr0 & 0xE6) == 0xE6;      // and opmask, ZMM0-15 upper, ZMM16-31
    if (!osxsave || !avx || !fma || !avxState || !bit(leaf7.ebx, 5)) return 128;  // AVX2
    const bool avx512 = bit(leaf7.ebx, 16) && bit(leaf7.ebx, 17) && bit(leaf7.ebx, 30) && bit(leaf7.ebx, 31);
    return avx512 && zmmState ? 512 : 256;
}

int usableWidth() {
#if defined(__GNUC__) && (defined(__x86_64__) || defined(__i386__))
    if (!cpuidAvailable() || cpuid(0).eax < 7) return 128;
    const Regs l1 = cpuid(1), l7 = cpuid(7, 0);
    uint64_t xcr0 = 0;
    if (bit(l1.ecx, 27)) {
        uint32_t lo, hi;
        __asm__ volatile("xgetbv" : "=a"(lo), "=d"(hi) : "c"(0));
        xcr0 = (uint64_t(hi) << 32) | lo;
    }
    return usableWidth(l1, l7, xcr0);
#else
    return 128;
#endif
}

}}  // namespace zor::cpu
