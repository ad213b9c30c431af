#include "frame/dispatch.h"

#include <cstring>

namespace zor { namespace dispatch {

const int32_t kPreference[5][6] = {
    {0, 5, 0, 0, 0, 0},
    {1, 0, 5, 0, 0, 0},
    {2, 1, 0, 5, 0, 0},
    {3, 2, 1, 0, 5, 0},
    {4, 3, 2, 1, 0, 5},
};

const char kFailureCaption[] = "Set zor library error";
const char kFailureText[] = " No zor matching to CPU was found during the Waterfall";

int variantForCode(int code) {
    switch (code) {
    case 1: case 2: case 3: case 4:
        return 0;
    case 5: case 16: case 17: case 64:
        return 1;
    case 6: case 7: case 9: case 65:
        return 2;
    case 8: case 10: case 32: case 66:
        return 3;
    case 33:
        return 4;
    default:
        return -1;
    }
}

int fallbackVariant(const cpu::Regs& leaf1) {
    if (leaf1.ecx & (1u << 9)) return 4;   // SSSE3
    if (leaf1.edx & (1u << 0)) return 3;   // the on-chip x87 flag, not SSE3: deliberate
    if (leaf1.edx & (1u << 26)) return 2;  // SSE2
    if (leaf1.edx & (1u << 25)) return 1;  // SSE
    return 0;
}

namespace {
int liveProcessorType() { return cpu::processorType(); }
cpu::Regs liveLeaf1() { return cpu::cpuid(1, 0); }
}  // namespace

Selector liveSelector() { return Selector{liveProcessorType, liveLeaf1}; }

int selectVariant(const Selector& s) {
    (void)s.processorType();  // asked twice; only the second answer counts
    const int code = s.processorType();
    const int v = variantForCode(code);
    return v >= 0 ? v : fallbackVariant(s.leaf1());
}

bool fillSlots(const Table& t, int k) {
    if (t.count < 1) return true;
    for (int32_t i = 0; i < t.count; ++i) {
        const Entry e = t.rows[i].entry[k];
        if (!e) return false;
        *t.rows[i].slot = e;
    }
    return true;
}

int initDispatch(const Table& t, const Selector& s, FailureReport report,
                 char (&msg)[256], int* bound) {
    std::memset(msg, 0, sizeof msg);
    const int v = selectVariant(s);
    if (t.count >= 1 && v >= 0 && v <= 4) {
        for (int i = 0; i < 6 && kPreference[v][i] < 5; ++i) {
            const int k = kPreference[v][i];
            if (fillSlots(t, k)) {
                if (bound) *bound = k;
                return 1;
            }
        }
    }
    std::strcpy(msg, kFailureText);
    if (report) report(msg, kFailureCaption);
    return 0;
}

int widthCap(const char* env) {
    if (env && std::strcmp(env, "128") == 0) return 128;
    if (env && std::strcmp(env, "256") == 0) return 256;
    return 512;
}

int wideColumn(int widthBits) {
    if (widthBits >= 512 && kColumns > 6) return 6;
    if (widthBits >= 256 && kColumns > 5) return 5;
    return -1;
}

int overlayWide(const Table& t, int widthBits) {
    const int k = wideColumn(widthBits);
    if (k < 0) return 128;
    for (int32_t i = 0; i < t.count; ++i) {
        const Row& r = t.rows[i];
        if (r.entry[k] && r.entry[k] != r.entry[4]) *r.slot = r.entry[k];
    }
    return k == 6 ? 512 : 256;
}

}}  // namespace zor::dispatch
