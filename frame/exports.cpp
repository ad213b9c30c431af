// The export stubs, their slots and the dispatch table, all expanded from the
// manifest.
//
// A stub is a naked function whose whole body is one indirect jump through
// its slot: the caller's arguments and return address stay where they are,
// so the bound entry (which has the export's exact signature and calling
// convention) runs as if it had been called directly.
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

#define ZOR_STR2_(x) #x
#define ZOR_STR_(x) ZOR_STR2_(x)
#define ZOR_SYM_(s) ZOR_STR_(__USER_LABEL_PREFIX__) s

#if defined(__x86_64__)
#  define ZOR_JUMP_(name) __asm__("jmp *" ZOR_SYM_("zor_slot_" #name) "(%rip)");
#elif defined(__i386__)
#  define ZOR_JUMP_(name) __asm__("jmp *" ZOR_SYM_("zor_slot_" #name));
#else
#  error "zor's export stubs are written for x86"
#endif

// The stubs never name their parameters: the jump leaves them to the entry.
#pragma GCC diagnostic ignored "-Wunused-parameter"
extern "C" {
#define ZOR_FN(map, ret, name, params) \
    __attribute__((naked)) ret ZOR_CALL name params { ZOR_JUMP_(name) }
#include "zor_manifest.h"
#undef ZOR_FN
}

#include "frame/columns.h"

#define ZOR_COL_(k, name) reinterpret_cast<Entry>(&zor::v##k::name)
#define ZOR_ROW_(m0, m1, m2, m3, m4, name)                                       \
    {&zor_slot_##name,                                                           \
     {ZOR_COL_(m0, name), ZOR_COL_(m1, name), ZOR_COL_(m2, name), ZOR_COL_(m3, name), \
      ZOR_COL_(m4, name)}},

namespace {
const zor::dispatch::Row kRows[] = {
// (map is already expanded to five column digits when ZOR_ROW_ is rescanned)
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
