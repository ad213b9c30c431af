// The export slots and the dispatch table, expanded from the manifest.
//
// Each export is a stub in frame/stubs.S that jumps through its slot
// zor_slot_<name>; the load-time binding copies one column of the table
// below into the slots.
#include "frame/dispatch.h"

#define ZOR_ENTRY_NS v0
#include "frame/entries.h"
#define ZOR_ENTRY_NS v1
#include "frame/entries.h"
#define ZOR_ENTRY_NS v2
#include "frame/entries.h"
#define ZOR_ENTRY_NS v3
#include "frame/entries.h"
#define ZOR_ENTRY_NS v4
#include "frame/entries.h"
#if defined(__x86_64__)
#  define ZOR_ENTRY_NS v5
#  include "frame/entries.h"
#  define ZOR_ENTRY_NS v6
#  include "frame/entries.h"
#endif

using zor::dispatch::Entry;

#if defined(_WIN32)
#  define ZOR_HIDDEN
#else
#  define ZOR_HIDDEN __attribute__((visibility("hidden")))
#endif

// Slots: null until the load-time binding fills them.
extern "C" {
#define ZOR_FN(map, ret, name, params) ZOR_HIDDEN Entry zor_slot_##name = nullptr;
#include "zor_manifest.h"
#undef ZOR_FN
}

#include "frame/columns.h"

#define ZOR_COL_(k, name) reinterpret_cast<Entry>(&zor::v##k::name)
#if defined(__x86_64__)
#  define ZOR_WIDE_COLS_(m5, m6, name) , ZOR_COL_(m5, name), ZOR_COL_(m6, name)
#else
#  define ZOR_WIDE_COLS_(m5, m6, name)  // five columns
#endif
#define ZOR_ROW_(m0, m1, m2, m3, m4, m5, m6, name)                               \
    {&zor_slot_##name,                                                           \
     {ZOR_COL_(m0, name), ZOR_COL_(m1, name), ZOR_COL_(m2, name), ZOR_COL_(m3, name), \
      ZOR_COL_(m4, name) ZOR_WIDE_COLS_(m5, m6, name)}},

namespace {
const zor::dispatch::Row kRows[] = {
// (map is already expanded to seven column digits when ZOR_ROW_ is rescanned)
#define ZOR_FN(map, ret, name, params) ZOR_ROW_(map, name)
#include "zor_manifest.h"
#undef ZOR_FN
};
static_assert(sizeof kRows / sizeof kRows[0] == zor::dispatch::kExportCount,
              "one dispatch row per export");
}  // namespace

namespace zor { namespace dispatch {
Table libraryTable() { return Table{kRows, static_cast<int32_t>(kExportCount)}; }
}}  // namespace zor::dispatch
