// Keeping variants apart at link time.
//
// Family sources are compiled once per variant with different instruction
// sets.  An inline function or template defined in a shared header would be
// emitted by several variants under one name, and the linker would keep just
// one copy: generic code could end up calling an SSSE3-compiled helper.
// Shared headers therefore wrap their inline code in
//
//     namespace zor { inline namespace ZOR_INLINE_NS { ... } }
//
// which gives every variant (and the non-variant frame code) its own names.
// The isolation test in tests/ checks every variant object for weak symbols
// that another variant also defines.
#pragma once

#define ZOR_CAT2_(a, b) a##b
#define ZOR_CAT_(a, b) ZOR_CAT2_(a, b)

#if defined(ZOR_VARIANT)
#  define ZOR_INLINE_NS ZOR_CAT_(isa, ZOR_VARIANT)
#else
#  define ZOR_INLINE_NS common
#endif
