// Load-time binding of the exports to one code variant.
//
// Every export is a stub that jumps through its slot.  The dispatch table has
// one row per export: the slot's address and the entries of the five code
// variants (seven on x86-64, with the two wide columns).  At load the frame
// selects a variant for the processor and copies that column into the slots,
// trying lower variants when a column has a gap; on x86-64 it then overlays
// the slots of the exports that have a wide entry, as far as the processor,
// the operating system and ZOR_MAX_WIDTH allow.
#pragma once

#include <cstdint>

#include "frame/cpu.h"
#include "zor.h"

namespace zor { namespace dispatch {

using Entry = void (*)();

#if defined(__x86_64__)
constexpr int kColumns = 7;
#else
constexpr int kColumns = 5;
#endif

struct Row {
    Entry* slot;
    Entry entry[kColumns];
};

struct Table {
    const Row* rows;
    int32_t count;
};

// Row index of each export, in manifest order.
enum ExportIndex : int {
#define ZOR_FN(map, ret, name, params) Idx_##name,
#include "zor_manifest.h"
#undef ZOR_FN
    kExportCount
};

// The library's own table (one row per export, manifest order).
Table libraryTable();

// Order in which variants are tried once one is selected; 5 ends a row.
extern const int32_t kPreference[5][6];

// Variant for a processor-type code, or -1 when the code is not listed.
int variantForCode(int code);
// The cpuid fallback for unlisted codes, from leaf 1.
int fallbackVariant(const cpu::Regs& leaf1);

struct Selector {
    int (*processorType)();
    cpu::Regs (*leaf1)();
};
Selector liveSelector();

// Asks the processor type twice (the first answer is discarded) and maps it.
int selectVariant(const Selector& s);

// Copies column k into the slots; fails at the first missing entry, keeping
// whatever slots were already written.
bool fillSlots(const Table& t, int k);

using FailureReport = void (*)(const char* text, const char* caption);

extern const char kFailureCaption[];
extern const char kFailureText[];

// The waterfall.  On success returns 1 and stores the bound variant in
// *bound; otherwise writes the failure text into msg (256 bytes), calls
// report and returns 0.
int initDispatch(const Table& t, const Selector& s, FailureReport report,
                 char (&msg)[256], int* bound);

// ---- the wide columns (x86-64) --------------------------------------------------

// The register width in bits that ZOR_MAX_WIDTH ("128", "256" or "512")
// allows; 512 when it is unset, and for anything else.
int widthCap(const char* env);

// The column of the entries for a register width (5 for 256, 6 for 512),
// -1 for 128.
int wideColumn(int widthBits);

// Copies the wide entries of the column for widthBits (each row whose entry
// there differs from its SSSE3 entry) over the bound slots; the other slots
// keep the five-variant binding.  Returns the width bound: 128 when there
// is no such column.
int overlayWide(const Table& t, int widthBits);

}}  // namespace zor::dispatch
