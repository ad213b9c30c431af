// Variant selection, slot filling and the waterfall, with injected tables
// and processors, and the library's own table as bound at load.
#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <string>
#include <utility>
#include <vector>

#include "frame/attach.h"
#include "frame/dispatch.h"
#include "tests/support/variants.h"

using namespace zor::dispatch;
using zor::cpu::Regs;

namespace {

// ---- an injectable processor ------------------------------------------------
int gCodes[2];
int gCalls;
Regs gLeaf1;
int fakeType() { return gCodes[gCalls++ % 2]; }
Regs fakeLeaf1() { return gLeaf1; }

int select(int first, int second, uint32_t edx = 0, uint32_t ecx = 0) {
    gCodes[0] = first, gCodes[1] = second, gCalls = 0;
    gLeaf1 = Regs{0, 0, ecx, edx};
    return selectVariant(Selector{fakeType, fakeLeaf1});
}

constexpr uint32_t kX87 = 1u << 0, kSse = 1u << 25, kSse2 = 1u << 26;
constexpr uint32_t kSse3 = 1u << 0, kSsse3 = 1u << 9;

// ---- an injectable table: entries are distinguishable dummies ------------------
template <int Row, int Col>
void dummy() {}

struct FakeTable {
    static constexpr int kRowsN = 3;
    Entry slots[kRowsN] = {};
    Row rows[kRowsN] = {};
    template <int R, int... C>
    void fill(std::integer_sequence<int, C...>) { ((rows[R].slot = &slots[R], rows[R].entry[C] = dummy<R, C>), ...); }
    FakeTable() {
        fill<0>(std::make_integer_sequence<int, 5>());
        fill<1>(std::make_integer_sequence<int, 5>());
        fill<2>(std::make_integer_sequence<int, 5>());
    }
    Table table(int count = kRowsN) const { return Table{rows, count}; }
    // The column whose entries all slots hold, or -1.
    int boundColumn() const {
        for (int k = 0; k < 5; ++k) {
            bool all = true;
            for (int i = 0; i < kRowsN; ++i) all = all && slots[i] == rows[i].entry[k];
            if (all) return k;
        }
        return -1;
    }
};

std::vector<std::string> gReports;
void recordReport(const char* text, const char* caption) {
    gReports.push_back(std::string(caption) + "|" + text);
}

}  // namespace

// Codes of the processor-type table decide alone, whatever the flags say;
// only the second of two answers counts; unlisted codes fall back to the
// cpuid flags (the x87 flag, not SSE3, gives variant 3).
TEST(SelectVariant, CodeTableThenCpuidFlags) {
    const std::vector<std::pair<std::vector<int>, int>> rows = {
        {{1, 2, 3, 4}, 0}, {{5, 16, 17, 64}, 1}, {{6, 7, 9, 65}, 2}, {{8, 10, 32, 66}, 3}, {{33}, 4}};
    for (const auto& row : rows)
        for (int code : row.first) {
            EXPECT_EQ(variantForCode(code), row.second) << "code " << code;
            EXPECT_EQ(select(0, code, kX87 | kSse | kSse2, kSse3 | kSsse3), row.second);
        }
    EXPECT_EQ(select(33, 1), 0);
    EXPECT_EQ(gCalls, 2);
    for (int code : {0, 11, 12, 15, 18, 31, 34, 63, 67, 68, -1}) {
        EXPECT_EQ(variantForCode(code), -1) << code;
        const uint32_t flags[][3] = {{kX87 | kSse | kSse2, kSse3 | kSsse3, 4}, {kX87 | kSse | kSse2, kSse3, 3},
                                     {kX87, 0, 3}, {kSse | kSse2, kSse3, 2}, {kSse, 0, 1}, {0, 0, 0}};
        for (const auto& f : flags) EXPECT_EQ(select(code, code, f[0], f[1]), int(f[2])) << code << " " << f[0];
    }
}

namespace {
// Binds t for a processor answering code; returns initDispatch's result.
int bind(const FakeTable& t, int code, int* bound, char (&msg)[256], int count = FakeTable::kRowsN) {
    gReports.clear();
    select(code, code);
    gCalls = 0;
    std::memset(msg, 'x', 256);
    return initDispatch(t.table(count), Selector{fakeType, fakeLeaf1}, recordReport, msg, bound);
}
}  // namespace

// Each variant tries its own column, then the ones below it, the generic
// one last; a gap in a column moves every export to the next column.
TEST(Waterfall, BindsTheFirstCompleteColumn) {
    char msg[256];
    int bound = -1;
    for (int code : {1, 5, 6, 8, 33}) {
        FakeTable t;
        ASSERT_EQ(bind(t, code, &bound, msg), 1);
        EXPECT_TRUE(bound == variantForCode(code) && t.boundColumn() == bound && gReports.empty() && msg[0] == 0);
    }
    FakeTable gap, last;
    gap.rows[1].entry[4] = nullptr;  // row 0 is written from column 4 first, then overwritten
    ASSERT_EQ(bind(gap, 33, &bound, msg), 1);
    EXPECT_TRUE(bound == 3 && gap.boundColumn() == 3);
    for (int k = 1; k < 5; ++k) last.rows[0].entry[k] = nullptr;
    ASSERT_EQ(bind(last, 33, &bound, msg), 1);
    EXPECT_TRUE(bound == 0 && last.boundColumn() == 0);
    FakeTable t;
    t.rows[2].entry[2] = nullptr;
    EXPECT_FALSE(fillSlots(t.table(), 2));  // what it wrote before the gap stays
    EXPECT_TRUE(t.slots[0] == t.rows[0].entry[2] && t.slots[1] == t.rows[1].entry[2] && t.slots[2] == nullptr);
    EXPECT_TRUE(fillSlots(t.table(0), 2));
}

// No complete column (or no table at all): the message, once, the rest of
// the buffer cleared, nothing bound.
TEST(Waterfall, NoCandidateShowsTheMessage) {
    FakeTable t, empty;
    t.rows[0].entry[0] = nullptr;
    t.rows[2].entry[1] = nullptr;
    char msg[256];
    int bound = -1;
    EXPECT_EQ(bind(t, 5, &bound, msg), 0);  // variant 1: tries 1, then 0
    EXPECT_EQ(bound, -1);
    ASSERT_EQ(gReports.size(), 1u);
    EXPECT_EQ(gReports[0], "Set zor library error| No zor matching to CPU was found during the Waterfall");
    EXPECT_STREQ(msg, " No zor matching to CPU was found during the Waterfall");
    for (size_t i = std::strlen(msg); i < sizeof msg; ++i) ASSERT_EQ(msg[i], '\0');
    EXPECT_EQ(bind(empty, 33, nullptr, msg, 0), 0);
    EXPECT_TRUE(gReports.size() == 1u && empty.boundColumn() == -1);
}

// Every row complete; every slot holds the selected variant's entry, or the
// wide one where the load overlaid it.
TEST(LibraryTable, CompleteAndBoundToTheSelectedVariant) {
    const Table t = libraryTable();
    ASSERT_EQ(t.count, kExportCount);
    const int v = selectVariant(liveSelector());
    EXPECT_EQ(zor::frame::boundVariant, v);
    const int w = wideColumn(zor::frame::boundWidth);
    for (int i = 0; i < t.count; ++i) {
        const Row& r = t.rows[i];
        for (int k = 0; k < 5; ++k) ASSERT_NE(r.entry[k], nullptr) << "row " << i << " col " << k;
        const bool wide = w >= 0 && r.entry[w] != r.entry[4];
        ASSERT_NE(r.slot, nullptr);
        EXPECT_EQ(*r.slot, wide ? r.entry[w] : r.entry[v]) << "row " << i;
    }
    // The exports answer with the bound variant's records, of a variant the processor runs.
    static const char* const tags[5] = {"g0", "s1", "s2", "s3", "s4"};
    EXPECT_TRUE(!std::strcmp(zorsGetLibVersion()->cpuTag, tags[v]) && !std::strcmp(zoriGetLibVersion()->cpuTag, tags[v]));
    EXPECT_TRUE(zt::variantSupported(v));
}

TEST(ProductTable, HoldsEveryProduct) {
    for (int j = 0; j < 256; ++j)
        for (int i = 0; i < 256; ++i)
            ASSERT_EQ(zor::frame::productTable[j * 256 + i], i * j) << i << " x " << j;
}

#if !defined(_WIN32)
// On Linux the load cannot be refused: the message goes to standard error and
// the process stops.
TEST(LoadFailureDeathTest, ReportsAndAborts) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(zor::frame::reportLoadFailure(kFailureText, kFailureCaption),
                 "Set zor library error: No zor matching to CPU was found during the Waterfall");
}
#endif

// ---- the wide columns -----------------------------------------------------------

// 256 bits need OSXSAVE, AVX, FMA, AVX2 and the YMM state saved; 512 bits
// also AVX-512 F, DQ, BW and VL and the ZMM state saved.
TEST(WideColumns, WidthFromCpuidAndXcr0) {
    constexpr uint32_t kAvx = (1u << 27) | (1u << 28) | (1u << 12), kAvx2 = 1u << 5;  // leaf 1 ecx, leaf 7 ebx
    constexpr uint32_t kAvx512 = kAvx2 | (1u << 16) | (1u << 17) | (1u << 30) | (1u << 31);
    struct Case { uint32_t l1ecx, l7ebx; uint64_t xcr0; int width; };
    const Case cases[] = {{kAvx, kAvx2, 0x7, 256}, {kAvx, kAvx2, 0x3, 128}, {kAvx & ~(1u << 12), kAvx2, 0x7, 128},
                          {kAvx & ~(1u << 27), kAvx2, 0xE7, 128}, {kAvx, kAvx512, 0xE7, 512}, {kAvx, kAvx512, 0x27, 256},
                          {kAvx, kAvx512 & ~(1u << 16), 0xE7, 256}, {kAvx, kAvx512 & ~(1u << 17), 0xE7, 256},
                          {kAvx, kAvx512 & ~(1u << 30), 0xE7, 256}, {kAvx, kAvx512 & ~(1u << 31), 0xE7, 256},
                          {0, 0, 0, 128}};
    for (const Case& c : cases)
        EXPECT_EQ(zor::cpu::usableWidth(Regs{0, 0, c.l1ecx, 0}, Regs{0, c.l7ebx, 0, 0}, c.xcr0), c.width)
            << std::hex << c.l1ecx << " " << c.l7ebx << " " << c.xcr0;
}

TEST(WideColumns, CapFromTheEnvironment) {
    const std::pair<const char*, int> cases[] = {{nullptr, 512}, {"128", 128},  {"256", 256}, {"512", 512},
                                                 {"1024", 512},  {" 128", 512}, {"", 512}};
    for (const auto& c : cases) EXPECT_EQ(widthCap(c.first), c.second) << (c.first ? c.first : "unset");
}

// The overlay replaces only the slots whose wide entry differs from the
// SSSE3 one, and leaves the rest as the five-variant binding left them.
TEST(WideColumns, OverlayTouchesOnlyRowsWithWideEntries) {
    FakeTable t;
    ASSERT_TRUE(fillSlots(t.table(), 3));
    for (int i = 0; i < FakeTable::kRowsN; ++i)
        for (int k = 5; k < kColumns; ++k) t.rows[i].entry[k] = t.rows[i].entry[4];
    EXPECT_EQ(overlayWide(t.table(), 128), 128);
    EXPECT_EQ(t.boundColumn(), 3);
#if !defined(__x86_64__)
    EXPECT_EQ(overlayWide(t.table(), 512), 128);  // the 32-bit build has no wide column
#else
    t.rows[1].entry[5] = dummy<1, 5>;
    t.rows[1].entry[6] = dummy<1, 6>;
    t.rows[2].entry[6] = dummy<2, 6>;
    EXPECT_EQ(overlayWide(t.table(), 256), 256);
    EXPECT_TRUE((t.slots[0] == t.rows[0].entry[3] && t.slots[1] == dummy<1, 5> && t.slots[2] == t.rows[2].entry[3]));
    EXPECT_EQ(overlayWide(t.table(), 512), 512);
    EXPECT_TRUE((t.slots[0] == t.rows[0].entry[3] && t.slots[1] == dummy<1, 6> && t.slots[2] == dummy<2, 6>));
#endif
}
