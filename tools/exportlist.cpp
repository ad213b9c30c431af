// Compiled with -S only, never linked: the compiler writes one line
// "#ZOREXPORT <name> <argument bytes>" per manifest row into the assembly
// listing, with the argument bytes as the target's standard-call convention
// counts them (each argument rounded up to a 4-byte word).
#include "zor.h"

template <class F>
struct ArgBytes;
template <class R, class... A>
struct ArgBytes<R(A...)> {
    static constexpr int value = (0 + ... + static_cast<int>((sizeof(A) + 3) / 4 * 4));
};

void zorExportList() {
#define ZOR_FN(map, ret, name, params) \
    __asm__ volatile("\n#ZOREXPORT " #name " %c0\n" ::"i"(ArgBytes<ret params>::value));
#include "zor_manifest.h"
#undef ZOR_FN
}
