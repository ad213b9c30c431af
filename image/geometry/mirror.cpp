// Mirrors about the horizontal axis (0), the vertical axis (1) or both (2),
// into a destination or in place.
//
// Checks: pointers, then sizes, then the axis; no step is checked, a zero or
// negative one is used as given.  In place, pixels are exchanged in pairs:
// rows y and height-1-y (axis 0), pixels x and width-1-x of a row (axis 1),
// or pixel x of row y with pixel width-1-x of row height-1-y (axis 2, the
// odd middle row then reversed on its own).  The four-channel forms with
// alpha exchange the three colour elements only: each alpha stays at its
// position, so a moved pixel takes the alpha of the place it lands on.
//
// Integer work only: the SSE variant shares the generic entries.
#include "frame/variant.h"
#include "frame/status.h"
#include "image/pixel/pixel_rows.h"
#include "image/pixel/shuffle48.h"

#include <cstring>
#include <utility>

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

namespace zor { namespace ZOR_NS {
namespace {

// A pixel of C elements of type E, of which the first M move (M < C: alpha).
template <class E, int C, int M>
struct Px {
    using Elem = E;
    static constexpr int channels = C;
    static constexpr int moved = M;
    static constexpr int bytes = C * static_cast<int>(sizeof(E));
};

// ---- generic pixel-run kernels ----------------------------------------------------

// a[x] <-> b[x], x < n.
template <class P>
void swapForwardScalar(typename P::Elem* a, typename P::Elem* b, ptrdiff_t from, ptrdiff_t n) {
    for (ptrdiff_t x = from; x < n; ++x)
        for (int k = 0; k < P::moved; ++k) std::swap(a[x * P::channels + k], b[x * P::channels + k]);
}

// a[x] <-> b[n-1-x], x < n (for x from `from`, pairs below it being done).
template <class P>
void swapReversedScalar(typename P::Elem* a, typename P::Elem* b, ptrdiff_t from, ptrdiff_t n) {
    for (ptrdiff_t x = from; x < n; ++x)
        for (int k = 0; k < P::moved; ++k) std::swap(a[x * P::channels + k], b[(n - 1 - x) * P::channels + k]);
}

// d[x] = s[n-1-x], x < n.
template <class P>
void copyReversedScalar(typename P::Elem* d, const typename P::Elem* s, ptrdiff_t from, ptrdiff_t n) {
    for (ptrdiff_t x = from; x < n; ++x)
        for (int k = 0; k < P::channels; ++k) d[x * P::channels + k] = s[(n - 1 - x) * P::channels + k];
}

// ---- SIMD blocks ------------------------------------------------------------------

#if ZOR_SIMD >= 2
// Reversal of the pixels of one register (pixels of 1, 2, 4 or 8 bytes:
// lanes of that size), or of a 48-byte block in three 16-byte registers
// (pixels of 3, 6 or 12 bytes, SSSE3).  Reg is the register type, regs the
// registers of a block.
template <int PixelBytes>
struct Reverse {
    static constexpr bool available = false;
};

template <class Lane>
struct ReverseLanes {
    static constexpr bool available = true;
    static constexpr int regs = 1;
    using Reg = simd::Vec<uint8_t>;
    static void apply(const Reg (&in)[1], Reg (&out)[1]) {
        out[0] = simd::bitcast<uint8_t>(simd::reverseLanes(simd::bitcast<Lane>(in[0])));
    }
};
template <> struct Reverse<1> : ReverseLanes<uint8_t> {};
template <> struct Reverse<2> : ReverseLanes<uint16_t> {};
template <> struct Reverse<4> : ReverseLanes<uint32_t> {};
template <> struct Reverse<8> : ReverseLanes<uint64_t> {};

#if ZOR_SIMD >= 4
template <int PixelBytes>
struct ReverseMap {  // pixels of a 48-byte block in reverse order
    static constexpr int src(int j) {
        const int pixels = 48 / PixelBytes, p = j / PixelBytes, b = j % PixelBytes;
        return (pixels - 1 - p) * PixelBytes + b;
    }
};
template <int PixelBytes>
struct Reverse48 {
    static constexpr bool available = true;
    static constexpr int regs = 3;
    using Reg = Bytes16;
    static void apply(const Reg (&in)[3], Reg (&out)[3]) { Shuffle48<ReverseMap<PixelBytes>>::apply(in, out); }
};
template <> struct Reverse<3> : Reverse48<3> {};
template <> struct Reverse<6> : Reverse48<6> {};
template <> struct Reverse<12> : Reverse48<12> {};
#endif

// SIMD parts return the number of pixels (or pixel pairs) they handled.
template <class P>
ptrdiff_t swapReversedSimd(typename P::Elem* a, typename P::Elem* b, ptrdiff_t n) {
    using Rev = Reverse<P::bytes>;
    if constexpr (!Rev::available) {
        return 0;
    } else {
        using namespace simd;
        using Reg = typename Rev::Reg;
        constexpr int R = Rev::regs;
        constexpr ptrdiff_t per = Reg::kBytes * R / P::bytes;
        uint8_t* pa = reinterpret_cast<uint8_t*>(a);
        uint8_t* pb = reinterpret_cast<uint8_t*>(b);
        ptrdiff_t x = 0;
        for (; x + per <= n; x += per) {
            uint8_t* qa = pa + x * P::bytes;
            uint8_t* qb = pb + (n - x - per) * P::bytes;
            Reg va[R], vb[R], ra[R], rb[R];
            loadBlock(qa, va);
            loadBlock(qb, vb);
            Rev::apply(vb, ra);  // new content of qa
            Rev::apply(va, rb);
            if constexpr (P::moved < P::channels) {
                const Reg alpha = alphaBytes<sizeof(typename P::Elem), Reg::kBytes>();
                ra[0] = select(alpha, va[0], ra[0]);
                rb[0] = select(alpha, vb[0], rb[0]);
            }
            storeBlock(qa, ra);
            storeBlock(qb, rb);
        }
        return x;
    }
}

template <class P>
ptrdiff_t copyReversedSimd(typename P::Elem* d, const typename P::Elem* s, ptrdiff_t n) {
    using Rev = Reverse<P::bytes>;
    if constexpr (!Rev::available) {
        return 0;
    } else {
        using namespace simd;
        using Reg = typename Rev::Reg;
        constexpr int R = Rev::regs;
        constexpr ptrdiff_t per = Reg::kBytes * R / P::bytes;
        uint8_t* pd = reinterpret_cast<uint8_t*>(d);
        const uint8_t* ps = reinterpret_cast<const uint8_t*>(s);
        ptrdiff_t x = 0;
        for (; x + per <= n; x += per) {
            Reg v[R], r[R];
            loadBlock(ps + (n - x - per) * P::bytes, v);
            Rev::apply(v, r);
            storeBlock(pd + x * P::bytes, r);
        }
        return x;
    }
}

// Whole registers of two rows exchanged; alpha stays for AC4 pixels.
template <class P>
ptrdiff_t swapForwardSimd(typename P::Elem* a, typename P::Elem* b, ptrdiff_t n) {
    using namespace simd;
    using Reg = Vec<uint8_t>;
    constexpr bool alpha = P::moved < P::channels;
    // with alpha the blocks hold whole pixels; otherwise bytes are bytes
    const ptrdiff_t bytes = n * P::bytes;
    uint8_t* pa = reinterpret_cast<uint8_t*>(a);
    uint8_t* pb = reinterpret_cast<uint8_t*>(b);
    ptrdiff_t i = 0;
    for (; i + Reg::kBytes <= bytes; i += Reg::kBytes) {
        const Reg va = load<Reg>(pa + i), vb = load<Reg>(pb + i);
        if constexpr (alpha) {
            const Reg m = alphaBytes<sizeof(typename P::Elem)>();
            store(pa + i, select(m, va, vb));
            store(pb + i, select(m, vb, va));
        } else {
            store(pa + i, vb);
            store(pb + i, va);
        }
    }
    if constexpr (alpha) return i / P::bytes;
    // the remaining bytes of a pixel-free byte run
    for (; i < bytes; ++i) std::swap(pa[i], pb[i]);
    return n;
}
#endif

template <class P>
void swapForward(typename P::Elem* a, typename P::Elem* b, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    x = swapForwardSimd<P>(a, b, n);
#endif
    swapForwardScalar<P>(a, b, x, n);
}

template <class P>
void swapReversed(typename P::Elem* a, typename P::Elem* b, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    x = swapReversedSimd<P>(a, b, n);
#endif
    swapReversedScalar<P>(a, b, x, n);
}

template <class P>
void copyReversed(typename P::Elem* d, const typename P::Elem* s, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    x = copyReversedSimd<P>(d, s, n);
#endif
    copyReversedScalar<P>(d, s, x, n);
}

// ---- the forms --------------------------------------------------------------------

template <class P>
Status mirrorInPlace(typename P::Elem* p, int step, ImageSize roi, int flip) {
    if (Status s = checkFirst(anyNull(p), badRoi(roi))) return s;
    if (flip < 0 || flip > 2) return StatusBadFlip;
    const int w = roi.width, h = roi.height;
    const auto row = [&](int y) { return rowAt(p, step, y); };
    // axis 1 within one row: the left half against the right half
    const auto reverseRow = [&](typename P::Elem* r) {
        swapReversed<P>(r, r + static_cast<ptrdiff_t>(w - w / 2) * P::channels, w / 2);
    };
    switch (flip) {
    case 0:
        for (int y = 0; y < h / 2; ++y) swapForward<P>(row(y), row(h - 1 - y), w);
        break;
    case 1:
        for (int y = 0; y < h; ++y) reverseRow(row(y));
        break;
    default:
        for (int y = 0; y < h / 2; ++y) swapReversed<P>(row(y), row(h - 1 - y), w);
        if (h % 2) reverseRow(row((h - 1) / 2));
        break;
    }
    return StatusOk;
}

template <class P>
Status mirrorCopy(const typename P::Elem* pSrc, int srcStep, typename P::Elem* pDst, int dstStep, ImageSize roi,
                  int flip) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi))) return s;
    if (flip < 0 || flip > 2) return StatusBadFlip;
    const int w = roi.width, h = roi.height;
    for (int y = 0; y < h; ++y) {
        const typename P::Elem* s = rowAt(pSrc, srcStep, flip == 1 ? y : h - 1 - y);
        typename P::Elem* d = rowAt(pDst, dstStep, y);
        if (flip == 0) std::memcpy(d, s, static_cast<size_t>(w) * P::bytes);
        else copyReversed<P>(d, s, w);
    }
    return StatusOk;
}

}  // namespace

// ---- exports -------------------------------------------------------------------------

Status ZOR_CALL zoriMirror_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
                                  int flip) {
    return mirrorCopy<Px<uint8_t, 3, 3>>(pSrc, srcStep, pDst, dstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_32s_C3R(const int32_t* pSrc, int srcStep, int32_t* pDst, int dstStep, ImageSize roiSize,
                                   int flip) {
    return mirrorCopy<Px<int32_t, 3, 3>>(pSrc, srcStep, pDst, dstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_8u_C1IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip) {
    return mirrorInPlace<Px<uint8_t, 1, 1>>(pSrcDst, srcDstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_8u_C3IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip) {
    return mirrorInPlace<Px<uint8_t, 3, 3>>(pSrcDst, srcDstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_8u_AC4IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip) {
    return mirrorInPlace<Px<uint8_t, 4, 3>>(pSrcDst, srcDstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_16u_C1IR(uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip) {
    return mirrorInPlace<Px<uint16_t, 1, 1>>(pSrcDst, srcDstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_16u_C3IR(uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip) {
    return mirrorInPlace<Px<uint16_t, 3, 3>>(pSrcDst, srcDstStep, roiSize, flip);
}
Status ZOR_CALL zoriMirror_16u_AC4IR(uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip) {
    return mirrorInPlace<Px<uint16_t, 4, 3>>(pSrcDst, srcDstStep, roiSize, flip);
}

}}  // namespace zor::ZOR_NS

#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
