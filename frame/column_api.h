// One column of the dispatch table as the whole library, typed exactly like
// the exports: columnApi(k).zoriFoo(...) runs column k's entry whatever the
// load-time binding chose.  The white-box tests and the variant bench call
// the variants through it.
#pragma once

#include "frame/dispatch.h"
#include "zor.h"

namespace zor { namespace dispatch {

struct ColumnApi {
#define ZOR_FN(map, ret, name, params) ret(ZOR_CALL* name) params;
#include "zor_manifest.h"
#undef ZOR_FN
};

inline ColumnApi columnApi(int k) {
    const Table t = libraryTable();
    ColumnApi a{};
#define ZOR_FN(map, ret, name, params) \
    a.name = reinterpret_cast<decltype(a.name)>(t.rows[Idx_##name].entry[k]);
#include "zor_manifest.h"
#undef ZOR_FN
    return a;
}

}}  // namespace zor::dispatch
