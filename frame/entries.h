// Declares the entries of every export in namespace zor::ZOR_ENTRY_NS.
// The entry of export F for variant k is zor::vK::F, with F's exact
// signature and calling convention, so that the export stub can hand a call
// on with a single jump.  Included once per namespace: no include guard.
#include "zor.h"

#ifndef ZOR_ENTRY_NS
#  error "define ZOR_ENTRY_NS before including frame/entries.h"
#endif

namespace zor { namespace ZOR_ENTRY_NS {
#define ZOR_FN(map, ret, name, params) ret ZOR_CALL name params;
#include "zor_manifest.h"
#undef ZOR_FN
}}

#undef ZOR_ENTRY_NS
