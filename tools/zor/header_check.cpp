// The generated header declares exactly what the manifest does: the same
// names with the same types, calling convention included.
#include <type_traits>

#include "public/zor.h"

#define ZOR_FN(map, ret, name, params)                                         \
    static_assert(std::is_same<decltype(&name), ret(ZOR_CALL*) params>::value, \
                  #name ": the generated header differs from the manifest");
#include "zor_manifest.h"
#undef ZOR_FN
