// Allocators and version records, on every variant's entries.
#include <gtest/gtest.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

#include "frame/memory.h"
#include "tests/support/variants.h"

namespace {

class Alloc : public zt::VariantTest {};
class Version : public zt::VariantTest {};

bool aligned32(const void* p) { return reinterpret_cast<uintptr_t>(p) % 32 == 0; }

// A substitute runtime allocator that records the size asked for and can fail.
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
    struct Case { void* (*get)(const zt::Api&, int); size_t bytes; };
#define ZT_SIGNAL(type, bytes) {[](const zt::Api& a, int n) -> void* { return a.zorsMalloc_##type(n); }, bytes}
    const Case cases[] = {ZT_SIGNAL(8u, 1),   ZT_SIGNAL(8s, 1),   ZT_SIGNAL(16u, 2),  ZT_SIGNAL(16s, 2),
                          ZT_SIGNAL(8sc, 2),  ZT_SIGNAL(32u, 4),  ZT_SIGNAL(32s, 4),  ZT_SIGNAL(32f, 4),
                          ZT_SIGNAL(16sc, 4), ZT_SIGNAL(64s, 8),  ZT_SIGNAL(64f, 8),  ZT_SIGNAL(32sc, 8),
                          ZT_SIGNAL(32fc, 8), ZT_SIGNAL(64sc, 16), ZT_SIGNAL(64fc, 16)};
#undef ZT_SIGNAL
    for (const Case& c : cases) {
        for (int n : {1, 3, 1000}) {
            AllocatorSwap swap(false);
            void* p = c.get(z(), n);
            ASSERT_NE(p, nullptr);
            EXPECT_TRUE(aligned32(p));
            EXPECT_EQ(gLastRequest, c.bytes * n + zor::mem::kOverhead);
            // The word before the block holds the raw block, which starts at
            // least a pointer before it and holds the whole block.
            const uint8_t* raw = static_cast<const uint8_t*>(zor::mem::rawAddressOf(p));
            const uint8_t* q = static_cast<const uint8_t*>(p);
            EXPECT_GE(q - raw, static_cast<ptrdiff_t>(sizeof(void*)));
            EXPECT_LE(q + c.bytes * n, raw + gLastRequest);
            std::memset(p, 0x5A, c.bytes * n);  // all of it is ours (the sanitizers watch)
            z().zorsFree(p);
        }
        EXPECT_EQ(c.get(z(), 0), nullptr);
        EXPECT_EQ(c.get(z(), -5), nullptr);
    }
    z().zorsFree(nullptr);
    z().zoriFree(nullptr);
    // 2^29 doubles are 2^32 bytes: the count wraps and only the overhead is asked for.
    AllocatorSwap swap(false);
    z().zorsFree(z().zorsMalloc_64f(1 << 29));
    EXPECT_EQ(gLastRequest, zor::mem::kOverhead);
}

TEST_P(Alloc, RuntimeFailureGivesNull) {
    AllocatorSwap swap(true);
    EXPECT_EQ(z().zorsMalloc_32f(16), nullptr);
    int step = -1;
    EXPECT_EQ(z().zoriMalloc_8u_C3(11, 4, &step), nullptr);
    EXPECT_EQ(step, 64);  // the step is reported even when the block is not
}

// Rows padded to 32 bytes; an empty image reports step 0; no step pointer, no block.
TEST_P(Alloc, ImageSteps) {
    struct Case { void* (*get)(const zt::Api&, int, int, int*); int bpp; };
#define ZT_IMAGE(type, bpp) {[](const zt::Api& a, int w, int h, int* s) -> void* { return a.zoriMalloc_##type(w, h, s); }, bpp}
    const Case cases[] = {ZT_IMAGE(8u_C1, 1),  ZT_IMAGE(16u_C1, 2), ZT_IMAGE(16s_C1, 2),
                          ZT_IMAGE(32f_C1, 4), ZT_IMAGE(8u_C4, 4),  ZT_IMAGE(16u_C3, 6),
                          ZT_IMAGE(16s_C3, 6), ZT_IMAGE(8u_C3, 3),  ZT_IMAGE(32f_C3, 12)};
#undef ZT_IMAGE
    int step = -1;
    for (const Case& c : cases) {
        for (int w : {1, 7, 32, 100}) {
            AllocatorSwap swap(false);
            void* q = c.get(z(), w, 5, &step);
            EXPECT_EQ(step, (c.bpp * w + 31) / 32 * 32) << "bpp " << c.bpp << " width " << w;
            EXPECT_EQ(gLastRequest, size_t(step) * 5 + zor::mem::kOverhead);
            ASSERT_NE(q, nullptr);
            EXPECT_TRUE(aligned32(q));
            std::memset(q, 1, size_t(step) * 5);
            z().zoriFree(q);
        }
        for (const auto& wh : {std::make_pair(0, 5), std::make_pair(5, 0)}) {
            step = -1;
            EXPECT_EQ(c.get(z(), wh.first, wh.second, &step), nullptr);
            EXPECT_EQ(step, 0);
        }
        EXPECT_EQ(c.get(z(), 5, 5, nullptr), nullptr);
    }
}

TEST_P(Version, RecordsNameTheVariant) {
    // The wide columns keep the SSSE3 records: the tag tells the variant.
    static const char* const tags[7] = {"g0", "s1", "s2", "s3", "s4", "s4", "s4"};
    const std::string tag = tags[variant()];
    const LibraryVersion* s = z().zorsGetLibVersion();
    const LibraryVersion* i = z().zoriGetLibVersion();
    for (const LibraryVersion* v : {s, i}) {
        EXPECT_TRUE(v->major == 5 && v->minor == 2 && v->buildSeries == 108);
        EXPECT_EQ(std::memcmp(v->cpuTag, tag.c_str(), 3), 0);
        EXPECT_EQ(v->cpuTag[3], '\0');
        EXPECT_STREQ(v->versionText, "5.2");
        EXPECT_STREQ(v->buildDate, "Apr  5 2007");
    }
    EXPECT_TRUE(s->build == 412 && i->build == 410);
    EXPECT_EQ(s->libraryName, "zors" + tag + "l.lib");
    EXPECT_EQ(i->libraryName, "zori" + tag + "l.lib");
    EXPECT_EQ(z().zorsGetLibVersion(), s);  // constant records: the same pointer every time
}

ZT_ALL_VARIANTS(Alloc);
ZT_ALL_VARIANTS(Version);
