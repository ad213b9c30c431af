// Row addressing shared by the image families: rowAt(base, step, row).
#pragma once

#include <cstddef>
#include <cstdint>
#include <type_traits>

#include "frame/abi.h"

namespace zor { inline namespace ZOR_INLINE_NS {

// Row `row` of an image: steps are signed byte distances used as given, so a
// zero step repeats the first row and a negative one walks upwards.
template <class T>
inline T* rowAt(T* base, int step, ptrdiff_t row) {
    using Byte = std::conditional_t<std::is_const_v<T>, const uint8_t, uint8_t>;
    return reinterpret_cast<T*>(reinterpret_cast<Byte*>(base) + row * step);
}

}}  // namespace zor::ZOR_INLINE_NS
