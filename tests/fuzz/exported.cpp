// The calls through the library's exports (the black-box driver).
#include "tests/fuzz/calls.h"

namespace zf {

Entries exportedEntries() {
    return {
#define ZOR_FN(map, ret, name, params) reinterpret_cast<Entry>(&name),
#include "zor_manifest.h"
#undef ZOR_FN
    };
}

}  // namespace zf
