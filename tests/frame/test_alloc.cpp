// Allocators and version records, on every variant's entries.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "frame/memory.h"
#include "tests/support/variants.h"

namespace {

class Alloc : public zt::VariantTest {};
class Version : public zt::VariantTest {};

bool aligned32(const void* p) { return reinterpret_cast<uintptr_t>(p) % 32 == 0; }

// A substitute runtime allocator that records the sizes asked for and can fail.
size_t gLastRequest;
bool gFail;
void* recordingAlloc(size_t n) {
    gLastRequest = n;
    return gFail ? nullptr : std::malloc(n);
}

struct AllocatorSwap {
    explicit AllocatorSwap(bool fail) {
        gFail = fail;
        gLastRequest = 0;
        zor::mem::rawAlloc = recordingAlloc;
    }
    ~AllocatorSwap() { zor::mem::rawAlloc = std::malloc; }
};

}  // namespace

TEST_P(Alloc, SignalBlocksAreAlignedAndSized) {
    const auto& z = this->z();
    struct Case { void* (*get)(const zt::Api&, int); size_t bytes; };
    const Case cases[] = {
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_8u(n); }, 1},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_8s(n); }, 1},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_16u(n); }, 2},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_16s(n); }, 2},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_8sc(n); }, 2},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_32u(n); }, 4},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_32s(n); }, 4},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_32f(n); }, 4},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_16sc(n); }, 4},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_64s(n); }, 8},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_64f(n); }, 8},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_32sc(n); }, 8},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_32fc(n); }, 8},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_64sc(n); }, 16},
        {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_64fc(n); }, 16},
    };
    for (const Case& c : cases) {
        for (int n : {1, 3, 1000}) {
            size_t asked;
            void* p;
            {
                AllocatorSwap swap(false);
                p = c.get(z, n);
                asked = gLastRequest;
            }
            ASSERT_NE(p, nullptr);
            EXPECT_TRUE(aligned32(p));
            EXPECT_EQ(asked, c.bytes * n + zor::mem::kOverhead);
            // The raw block starts before the pointer, at least a pointer away,
            // and holds the whole block.
            const uint8_t* raw = static_cast<const uint8_t*>(zor::mem::rawAddressOf(p));
            const uint8_t* q = static_cast<const uint8_t*>(p);
            EXPECT_GE(q - raw, static_cast<ptrdiff_t>(sizeof(void*)));
            EXPECT_LE(q + c.bytes * n, raw + asked);
            std::memset(p, 0x5A, c.bytes * n);  // all of it is ours (the sanitizers watch)
            z.zorsFree(p);
        }
        EXPECT_EQ(c.get(z, 0), nullptr);
        EXPECT_EQ(c.get(z, -5), nullptr);
    }
    z.zorsFree(nullptr);
    z.zoriFree(nullptr);
}

TEST_P(Alloc, ByteCountWrapsIn32Bits) {
    // 2^29 doubles are 2^32 bytes: the count wraps and only the overhead is asked for.
    AllocatorSwap swap(false);
    double* p = z().zorsMalloc_64f(1 << 29);
    EXPECT_EQ(gLastRequest, zor::mem::kOverhead);
    z().zorsFree(p);
}

TEST_P(Alloc, RuntimeFailureGivesNull) {
    AllocatorSwap swap(true);
    EXPECT_EQ(z().zorsMalloc_32f(16), nullptr);
    int step = -1;
    EXPECT_EQ(z().zoriMalloc_8u_C3(11, 4, &step), nullptr);
    EXPECT_EQ(step, 64);  // the step is reported even when the block is not
}

TEST_P(Alloc, ImageSteps) {
    const auto& z = this->z();
    int step = -1;
    uint8_t* p = z.zoriMalloc_8u_C1(1, 1, &step);
    EXPECT_EQ(step, 32);
    ASSERT_NE(p, nullptr);
    EXPECT_TRUE(aligned32(p));
    z.zoriFree(p);

    p = z.zoriMalloc_8u_C1(33, 2, &step);
    EXPECT_EQ(step, 64);
    z.zoriFree(p);

    p = z.zoriMalloc_8u_C3(11, 3, &step);
    EXPECT_EQ(step, 64);
    std::memset(p, 1, 64 * 3);
    z.zoriFree(p);

    step = -1;
    EXPECT_EQ(z.zoriMalloc_8u_C1(0, 5, &step), nullptr);
    EXPECT_EQ(step, 0);
    step = -1;
    EXPECT_EQ(z.zoriMalloc_8u_C1(5, 0, &step), nullptr);
    EXPECT_EQ(step, 0);
    EXPECT_EQ(z.zoriMalloc_8u_C1(5, 5, nullptr), nullptr);

    struct Case { void* (*get)(const zt::Api&, int, int, int*); int bpp; };
    const Case cases[] = {
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_8u_C1(w, h, s); }, 1},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_16u_C1(w, h, s); }, 2},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_16s_C1(w, h, s); }, 2},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_32f_C1(w, h, s); }, 4},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_8u_C4(w, h, s); }, 4},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_16u_C3(w, h, s); }, 6},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_16s_C3(w, h, s); }, 6},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_8u_C3(w, h, s); }, 3},
        {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_32f_C3(w, h, s); }, 12},
    };
    for (const Case& c : cases)
        for (int w : {1, 7, 32, 100}) {
            size_t asked;
            void* q;
            {
                AllocatorSwap swap(false);
                q = c.get(z, w, 5, &step);
                asked = gLastRequest;
            }
            EXPECT_EQ(step, (c.bpp * w + 31) / 32 * 32) << "bpp " << c.bpp << " width " << w;
            EXPECT_EQ(asked, size_t(step) * 5 + zor::mem::kOverhead);
            ASSERT_NE(q, nullptr);
            EXPECT_TRUE(aligned32(q));
            z.zoriFree(q);
        }
}

TEST_P(Version, RecordsNameTheVariant) {
    // The wide columns keep the SSSE3 records: the tag tells the variant.
    static const char* const tags[7] = {"g0", "s1", "s2", "s3", "s4", "s4", "s4"};
    const char* tag = tags[variant()];
    const LibraryVersion* s = z().zorsGetLibVersion();
    const LibraryVersion* i = z().zoriGetLibVersion();
    for (const LibraryVersion* v : {s, i}) {
        EXPECT_EQ(v->major, 5);
        EXPECT_EQ(v->minor, 2);
        EXPECT_EQ(v->buildSeries, 108);
        EXPECT_EQ(std::memcmp(v->cpuTag, tag, 2), 0);
        EXPECT_EQ(v->cpuTag[2], '\0');
        EXPECT_EQ(v->cpuTag[3], '\0');
        EXPECT_STREQ(v->versionText, "5.2");
        EXPECT_STREQ(v->buildDate, "Apr  5 2007");
    }
    EXPECT_EQ(s->build, 412);
    EXPECT_EQ(i->build, 410);
    EXPECT_EQ(std::string(s->libraryName), std::string("zors") + tag + "l.lib");
    EXPECT_EQ(std::string(i->libraryName), std::string("zori") + tag + "l.lib");
    // Constant records: the same pointer every time.
    EXPECT_EQ(z().zorsGetLibVersion(), s);
}

TEST(VersionRecords, EachVariantHasItsOwn) {
    for (int a = 0; a < 5; ++a)
        for (int b = a + 1; b < 5; ++b) {
            EXPECT_NE(zt::api(a).zorsGetLibVersion(), zt::api(b).zorsGetLibVersion());
            EXPECT_NE(zt::api(a).zoriGetLibVersion(), zt::api(b).zoriGetLibVersion());
        }
}

ZT_ALL_VARIANTS(Alloc);
ZT_ALL_VARIANTS(Version);
