// Pixel movers that keep values: plain, masked and channel-layout copies,
// constant fills, channel reordering and the copy with replicated borders.
//
// Every element is moved as an unsigned word of its width (floats too, so
// that no bit pattern is altered on its way through a register).  Copies,
// fills and duplicates check pointers and sizes only: their steps are used
// as given, so a zero step repeats a row and a negative one walks upwards.
// Swap channels and the replicated-border copy also reject steps below 1.
//
// All of it is integer work: the SSE variant shares the generic entries.
#include "frame/variant.h"
#include "frame/status.h"
#include "image/pixel/pixel_rows.h"
#include "image/pixel/shuffle48.h"

#include <cstring>

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

#include "image/pixel/copy_kernels.h"

namespace zor { namespace ZOR_NS {
namespace {

template <int Bytes> struct WordOf;
template <> struct WordOf<1> { using type = uint8_t; };
template <> struct WordOf<2> { using type = uint16_t; };
template <> struct WordOf<4> { using type = uint32_t; };
template <class T> using Word = typename WordOf<sizeof(T)>::type;

template <class T> inline const Word<T>* words(const T* p) { return reinterpret_cast<const Word<T>*>(p); }
template <class T> inline Word<T>* words(T* p) { return reinterpret_cast<Word<T>*>(p); }

template <class F>
inline void eachRow(int rows, F&& f) {
    for (int y = 0; y < rows; ++y) f(y);
}

// ---- the forms ------------------------------------------------------------------

// Plain copy of width * C elements per row.
template <class T, int C>
Status copyPlain(const T* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roi) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi))) return s;
    const bool contiguous = packed(srcStep, roi, C * sizeof(T)) && srcStep == dstStep;
    const Rows r = rowsOf(roi, C, contiguous);
    const size_t bytes = static_cast<size_t>(r.elems) * sizeof(T);
    eachRow(r.count, [&](int y) { std::memcpy(rowAt(pDst, dstStep, y), rowAt(pSrc, srcStep, y), bytes); });
    return StatusOk;
}

// Copies between layouts of SC- and DC-element pixels, N elements each.
// The single-channel side (or either side of an AC4 conversion) decides
// whether rows can be merged: its step must be the row length and the other
// side's step the channel factor times it.
template <class T, int SC, int DC, int N>
Status copyPick(const T* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roi) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi))) return s;
    bool contiguous = false;
    if constexpr (SC == 1 || DC == 1)
        contiguous = packed(srcStep, roi, SC * sizeof(T)) && packed(dstStep, roi, DC * sizeof(T));
    const Rows r = rowsOf(roi, 1, contiguous);
    using E = Word<T>;
    eachRow(r.count, [&](int y) {
        const E* s = words(rowAt(pSrc, srcStep, y));
        E* d = words(rowAt(pDst, dstStep, y));
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 4
        if constexpr (DC == 1) x = pickOneSimd<E, SC>(s, d, r.elems);
        else if constexpr (SC == 4 && DC == 3) x = dropAlphaSimd<E>(s, d, r.elems);
        else if constexpr (SC == 3 && DC == 4) x = keepAlphaSimd<E>(s, d, r.elems);
#endif
        pickRow<E, SC, DC, N>(s + x * SC, d + x * DC, r.elems - x);
    });
    return StatusOk;
}

template <class T, int C>
Status copySplit(const T* pSrc, int srcStep, T* const* pDst, int dstStep, ImageSize roi) {
    if (pSrc == nullptr || pDst == nullptr) return StatusNullPointer;
    for (int k = 0; k < C; ++k)
        if (pDst[k] == nullptr) return StatusNullPointer;
    if (Status s = badRoi(roi)) return s;
    // 8-bit images merge rows only while the interleaved image is small
    // (below 160000 bytes): larger ones stream better row by row.
    bool contiguous = packed(dstStep, roi, sizeof(T)) && packed(srcStep, roi, C * sizeof(T));
    if (sizeof(T) == 1) contiguous = contiguous && int64_t(srcStep) * roi.height < 160000;
    const Rows r = rowsOf(roi, 1, contiguous);
    using E = Word<T>;
    eachRow(r.count, [&](int y) {
        const E* s = words(rowAt(pSrc, srcStep, y));
        E* planes[C];
        for (int k = 0; k < C; ++k) planes[k] = words(rowAt(pDst[k], dstStep, y));
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 4
        if constexpr (C == 3) x = split3Simd<E>(s, planes, r.elems);
        else x = split4Simd<E>(s, planes, r.elems);
#endif
        for (int k = 0; k < C; ++k) planes[k] += x;
        splitRow<E, C>(s + C * x, planes, r.elems - x);
    });
    return StatusOk;
}

template <class T, int C>
Status copyMerge(const T* const* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roi) {
    if (pSrc == nullptr || pDst == nullptr) return StatusNullPointer;
    for (int k = 0; k < C; ++k)
        if (pSrc[k] == nullptr) return StatusNullPointer;
    if (Status s = badRoi(roi)) return s;
    const bool contiguous = packed(srcStep, roi, sizeof(T)) && packed(dstStep, roi, C * sizeof(T));
    const Rows r = rowsOf(roi, 1, contiguous);
    using E = Word<T>;
    eachRow(r.count, [&](int y) {
        const E* planes[C];
        for (int k = 0; k < C; ++k) planes[k] = words(rowAt(pSrc[k], srcStep, y));
        E* d = words(rowAt(pDst, dstStep, y));
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 4
        if constexpr (C == 3) x = merge3Simd<E>(planes, d, r.elems);
        else x = merge4Simd<E>(planes, d, r.elems);
#endif
        for (int k = 0; k < C; ++k) planes[k] += x;
        mergeRow<E, C>(planes, d + C * x, r.elems - x);
    });
    return StatusOk;
}

template <class T>
Status setC1(T value, T* pDst, int dstStep, ImageSize roi) {
    if (Status s = checkFirst(anyNull(pDst), badRoi(roi))) return s;
    using E = Word<T>;
    E v;
    std::memcpy(&v, &value, sizeof v);  // the bits as given, whatever the type
    const Rows r = rowsOf(roi, 1, packed(dstStep, roi, sizeof(T)));
    eachRow(r.count, [&](int y) {
        E* d = words(rowAt(pDst, dstStep, y));
        if constexpr (sizeof(E) == 1) {
            std::memset(d, v, static_cast<size_t>(r.elems));
        } else {
            repeatFill(reinterpret_cast<uint8_t*>(d), r.elems * ptrdiff_t(sizeof(E)), [&](uint8_t* b, ptrdiff_t n) {
                E* w = reinterpret_cast<E*>(b);
                const ptrdiff_t count = n / ptrdiff_t(sizeof(E));
                ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
                x = fillRowSimd<E>(w, count, v);
#endif
                fillRow<E>(w + x, count - x, v);
            });
        }
    });
    return StatusOk;
}

template <class T>
Status setC3(const T* value, T* pDst, int dstStep, ImageSize roi) {
    if (Status s = checkFirst(anyNull(value, pDst), badRoi(roi))) return s;
    using E = Word<T>;
    const E v[3] = {Word<T>(value[0]), Word<T>(value[1]), Word<T>(value[2])};
    const Rows r = rowsOf(roi, 1, packed(dstStep, roi, 3 * sizeof(T)));
#if ZOR_SIMD >= 2
    if (streamsOutput(roi, 3 * sizeof(T))) {
        uint8_t pixel[3 * sizeof(E)];
        std::memcpy(pixel, v, sizeof pixel);
        eachRow(r.count, [&](int y) {
            fillStreamed(reinterpret_cast<uint8_t*>(rowAt(pDst, dstStep, y)), r.elems * ptrdiff_t(3 * sizeof(E)), pixel,
                         int(sizeof pixel));
        });
        simd::streamFence();
        return StatusOk;
    }
    // the pattern over three registers: 3 * kBytes is a whole number of pixels
    using V = simd::Vec<uint8_t>;
    alignas(64) E pattern[3 * V::kBytes / sizeof(E)];
    for (size_t i = 0; i < 3 * V::kBytes / sizeof(E); ++i) pattern[i] = v[i % 3];
    V p[3];
    simd::loadBlock(pattern, p);
#endif
    eachRow(r.count, [&](int y) {
        uint8_t* b = reinterpret_cast<uint8_t*>(rowAt(pDst, dstStep, y));
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
        x = fillPattern3(b, r.elems * ptrdiff_t(3 * sizeof(E)), p) / ptrdiff_t(3 * sizeof(E));
#endif
        fill3Row<E>(reinterpret_cast<E*>(b) + 3 * x, r.elems - x, v);
    });
    return StatusOk;
}

// Channel order: checks, then rows, collapsed when both images are packed.
template <class T, int C>
Status swapChannels(const T* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roi, const int* order) {
    if (Status s = checkFirst(anyNull(pSrc, pDst, order), badRoi(roi), badSteps(srcStep, dstStep)))
        return s;
    const int o[3] = {order[0], order[1], order[2]};
    for (int k = 0; k < 3; ++k)
        if (o[k] < 0 || o[k] > 2) return StatusChannelOrder;
    const bool contiguous = packed(srcStep, roi, C * sizeof(T)) && srcStep == dstStep;
    const Rows r = rowsOf(roi, 1, contiguous);
    using E = Word<T>;
#if ZOR_SIMD >= 4
    using Shuffle = std::conditional_t<C == 3, SwapShuffle, SwapShuffle4>;
    const Shuffle sh(o, sizeof(T));
#endif
    eachRow(r.count, [&](int y) {
        const E* s = words(rowAt(pSrc, srcStep, y));
        E* d = words(rowAt(pDst, dstStep, y));
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 4
        const auto* sb = reinterpret_cast<const uint8_t*>(s);
        auto* db = reinterpret_cast<uint8_t*>(d);
        const ptrdiff_t bytes = r.elems * C * sizeof(E);
        if constexpr (C == 3) x = swap3Simd(sb, db, bytes, sh) / (C * sizeof(E));
        else x = swap4Simd(sb, db, bytes, sh) / (C * sizeof(E));
#endif
        swapRow<E>(s + C * x, d + C * x, r.elems - x, C, o);
    });
    return StatusOk;
}

template <class T, int C>
Status replicateBorder(const T* pSrc, int srcStep, ImageSize srcRoi, T* pDst, int dstStep, ImageSize dstRoi,
                       int top, int left) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badSteps(srcStep, dstStep))) return s;
    if (srcRoi.width < 1 || srcRoi.height < 1 || dstRoi.width < 1 || dstRoi.height < 1 || top < 0 ||
        left < 0 || int64_t(dstRoi.width) < int64_t(left) + srcRoi.width ||
        int64_t(dstRoi.height) < int64_t(top) + srcRoi.height)
        return StatusBadSize;
    using E = Word<T>;
    const ptrdiff_t right = dstRoi.width - left - srcRoi.width;
    const size_t srcBytes = static_cast<size_t>(srcRoi.width) * C * sizeof(E);
    const size_t dstBytes = static_cast<size_t>(dstRoi.width) * C * sizeof(E);
    for (int y = 0; y < srcRoi.height; ++y) {
        const E* s = words(rowAt(pSrc, srcStep, y));
        E* d = words(rowAt(pDst, dstStep, top + y));
        for (ptrdiff_t x = 0; x < left; ++x)
            for (int k = 0; k < C; ++k) d[x * C + k] = s[k];
        std::memcpy(d + left * C, s, srcBytes);
        E* tail = d + (left + srcRoi.width) * C;
        const E* last = s + (srcRoi.width - 1) * C;
        for (ptrdiff_t x = 0; x < right; ++x)
            for (int k = 0; k < C; ++k) tail[x * C + k] = last[k];
    }
    // Rows below repeat the last filled row, rows above the first; a step
    // shorter than a row makes them overlap, hence memmove.
    const T* lastRow = rowAt(pDst, dstStep, top + srcRoi.height - 1);
    for (int y = top + srcRoi.height; y < dstRoi.height; ++y) std::memmove(rowAt(pDst, dstStep, y), lastRow, dstBytes);
    const T* firstRow = rowAt(pDst, dstStep, top);
    for (int y = 0; y < top; ++y) std::memmove(rowAt(pDst, dstStep, y), firstRow, dstBytes);
    return StatusOk;
}

}  // namespace

// ---- exports --------------------------------------------------------------------

#define ZOR_COPY_PLAIN(name, T, C)                                                                  \
    Status ZOR_CALL name(const T* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roiSize) {     \
        return copyPlain<T, C>(pSrc, srcStep, pDst, dstStep, roiSize);                              \
    }
ZOR_COPY_PLAIN(zoriCopy_8u_C1R, uint8_t, 1)
ZOR_COPY_PLAIN(zoriCopy_16s_C1R, int16_t, 1)
ZOR_COPY_PLAIN(zoriCopy_32f_C1R, float, 1)
ZOR_COPY_PLAIN(zoriCopy_8u_C3R, uint8_t, 3)
ZOR_COPY_PLAIN(zoriCopy_16s_C3R, int16_t, 3)
ZOR_COPY_PLAIN(zoriCopy_32f_C3R, float, 3)
ZOR_COPY_PLAIN(zoriCopy_8u_C4R, uint8_t, 4)
ZOR_COPY_PLAIN(zoriCopy_16s_C4R, int16_t, 4)
#undef ZOR_COPY_PLAIN

#define ZOR_COPY_PICK(name, T, SC, DC, N)                                                           \
    Status ZOR_CALL name(const T* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roiSize) {     \
        return copyPick<T, SC, DC, N>(pSrc, srcStep, pDst, dstStep, roiSize);                       \
    }
ZOR_COPY_PICK(zoriCopy_8u_C3C1R, uint8_t, 3, 1, 1)
ZOR_COPY_PICK(zoriCopy_16s_C3C1R, int16_t, 3, 1, 1)
ZOR_COPY_PICK(zoriCopy_8u_C4C1R, uint8_t, 4, 1, 1)
ZOR_COPY_PICK(zoriCopy_16s_C4C1R, int16_t, 4, 1, 1)
ZOR_COPY_PICK(zoriCopy_8u_C1C3R, uint8_t, 1, 3, 1)
ZOR_COPY_PICK(zoriCopy_16s_C1C3R, int16_t, 1, 3, 1)
ZOR_COPY_PICK(zoriCopy_8u_C1C4R, uint8_t, 1, 4, 1)
ZOR_COPY_PICK(zoriCopy_16s_C1C4R, int16_t, 1, 4, 1)
ZOR_COPY_PICK(zoriCopy_8u_C3AC4R, uint8_t, 3, 4, 3)
ZOR_COPY_PICK(zoriCopy_16s_C3AC4R, int16_t, 3, 4, 3)
ZOR_COPY_PICK(zoriCopy_8u_AC4C3R, uint8_t, 4, 3, 3)
ZOR_COPY_PICK(zoriCopy_16s_AC4C3R, int16_t, 4, 3, 3)
#undef ZOR_COPY_PICK

Status ZOR_CALL zoriCopy_8u_C3MR(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
                                 const uint8_t* pMask, int maskStep) {
    if (Status s = checkFirst(anyNull(pSrc, pDst, pMask), badRoi(roiSize))) return s;
    for (int y = 0; y < roiSize.height; ++y) {
        const uint8_t* s = rowAt(pSrc, srcStep, y);
        uint8_t* d = rowAt(pDst, dstStep, y);
        const uint8_t* m = rowAt(pMask, maskStep, y);
        int x = 0;
#if ZOR_SIMD >= 4
        for (; x + 16 <= roiSize.width; x += 16) {
            Bytes16 fresh[3];
            simd::loadBlock(s + 3 * x, fresh);
            maskedStore48(d + 3 * x, m + x, fresh);
        }
#endif
        for (; x < roiSize.width; ++x)
            if (m[x]) {
                d[3 * x] = s[3 * x];
                d[3 * x + 1] = s[3 * x + 1];
                d[3 * x + 2] = s[3 * x + 2];
            }
    }
    return StatusOk;
}

Status ZOR_CALL zoriCopy_8u_C3P3R(const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3], int dstStep,
                                  ImageSize roiSize) {
    return copySplit<uint8_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriCopy_16s_C3P3R(const int16_t* pSrc, int srcStep, int16_t* const pDst[3], int dstStep,
                                   ImageSize roiSize) {
    return copySplit<int16_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriCopy_8u_C4P4R(const uint8_t* pSrc, int srcStep, uint8_t* const pDst[4], int dstStep,
                                  ImageSize roiSize) {
    return copySplit<uint8_t, 4>(pSrc, srcStep, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriCopy_16s_C4P4R(const int16_t* pSrc, int srcStep, int16_t* const pDst[4], int dstStep,
                                   ImageSize roiSize) {
    return copySplit<int16_t, 4>(pSrc, srcStep, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriCopy_8u_P3C3R(const uint8_t* const pSrc[3], int srcStep, uint8_t* pDst, int dstStep,
                                  ImageSize roiSize) {
    return copyMerge<uint8_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriCopy_16s_P3C3R(const int16_t* const pSrc[3], int srcStep, int16_t* pDst, int dstStep,
                                   ImageSize roiSize) {
    return copyMerge<int16_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriCopy_8u_P4C4R(const uint8_t* const pSrc[4], int srcStep, uint8_t* pDst, int dstStep,
                                  ImageSize roiSize) {
    return copyMerge<uint8_t, 4>(pSrc, srcStep, pDst, dstStep, roiSize);
}

Status ZOR_CALL zoriDup_8u_C1C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roiSize))) return s;
    const bool contiguous = packed(srcStep, roiSize, 1) && packed(dstStep, roiSize, 3);
    const Rows r = rowsOf(roiSize, 1, contiguous);
    eachRow(r.count, [&](int y) {
        const uint8_t* s = rowAt(pSrc, srcStep, y);
        uint8_t* d = rowAt(pDst, dstStep, y);
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 4
        for (; x + 16 <= r.elems; x += 16) {
            const Bytes16 v = simd::load<Bytes16>(s + x);
            const Bytes16 in[3] = {v, v, v};
            Bytes16 out[3];
            Shuffle48<DupMap>::apply(in, out);
            simd::storeBlock(d + 3 * x, out);
        }
#endif
        for (; x < r.elems; ++x) d[3 * x] = d[3 * x + 1] = d[3 * x + 2] = s[x];
    });
    return StatusOk;
}

Status ZOR_CALL zoriSet_8u_C1R(uint8_t value, uint8_t* pDst, int dstStep, ImageSize roiSize) {
    return setC1<uint8_t>(value, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriSet_16s_C1R(int16_t value, int16_t* pDst, int dstStep, ImageSize roiSize) {
    return setC1<int16_t>(value, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriSet_32s_C1R(int32_t value, int32_t* pDst, int dstStep, ImageSize roiSize) {
    return setC1<int32_t>(value, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriSet_32f_C1R(float value, float* pDst, int dstStep, ImageSize roiSize) {
    // the same operation as the 32s form: the word is taken straight from the
    // argument, never through a floating-point register
    uint32_t bits;
    std::memcpy(&bits, &value, sizeof bits);
    return setC1<uint32_t>(bits, reinterpret_cast<uint32_t*>(pDst), dstStep, roiSize);
}
Status ZOR_CALL zoriSet_8u_C3R(const uint8_t* value, uint8_t* pDst, int dstStep, ImageSize roiSize) {
    return setC3<uint8_t>(value, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriSet_16s_C3R(const int16_t* value, int16_t* pDst, int dstStep, ImageSize roiSize) {
    return setC3<int16_t>(value, pDst, dstStep, roiSize);
}
Status ZOR_CALL zoriSet_8u_C3MR(const uint8_t* value, uint8_t* pDst, int dstStep, ImageSize roiSize,
                                const uint8_t* pMask, int maskStep) {
    if (Status s = checkFirst(anyNull(value, pDst, pMask), badRoi(roiSize))) return s;
    const uint8_t v0 = value[0], v1 = value[1], v2 = value[2];
#if ZOR_SIMD >= 4
    alignas(16) uint8_t pattern[48];
    for (int i = 0; i < 48; ++i) pattern[i] = value[i % 3];
    Bytes16 fresh[3];
    simd::loadBlock(pattern, fresh);
#endif
    for (int y = 0; y < roiSize.height; ++y) {
        uint8_t* d = rowAt(pDst, dstStep, y);
        const uint8_t* m = rowAt(pMask, maskStep, y);
        int x = 0;
#if ZOR_SIMD >= 4
        for (; x + 16 <= roiSize.width; x += 16) maskedStore48(d + 3 * x, m + x, fresh);
#endif
        for (; x < roiSize.width; ++x)
            if (m[x]) {
                d[3 * x] = v0;
                d[3 * x + 1] = v1;
                d[3 * x + 2] = v2;
            }
    }
    return StatusOk;
}

Status ZOR_CALL zoriSwapChannels_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                        ImageSize roiSize, const int* dstOrder) {
    return swapChannels<uint8_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize, dstOrder);
}
Status ZOR_CALL zoriSwapChannels_16u_C3R(const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                         ImageSize roiSize, const int* dstOrder) {
    return swapChannels<uint16_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize, dstOrder);
}
Status ZOR_CALL zoriSwapChannels_8u_AC4R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                         ImageSize roiSize, const int* dstOrder) {
    return swapChannels<uint8_t, 4>(pSrc, srcStep, pDst, dstStep, roiSize, dstOrder);
}
Status ZOR_CALL zoriSwapChannels_16u_AC4R(const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                          ImageSize roiSize, const int* dstOrder) {
    return swapChannels<uint16_t, 4>(pSrc, srcStep, pDst, dstStep, roiSize, dstOrder);
}
Status ZOR_CALL zoriSwapChannels_8u_C3IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, const int* dstOrder) {
    // one image as source and destination: every 48-byte block (and every
    // pixel of the tail) is read whole before it is written
    return swapChannels<uint8_t, 3>(pSrcDst, srcDstStep, pSrcDst, srcDstStep, roiSize, dstOrder);
}

Status ZOR_CALL zoriCopyReplicateBorder_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize srcRoiSize, uint8_t* pDst,
                                               int dstStep, ImageSize dstRoiSize, int topBorderHeight,
                                               int leftBorderWidth) {
    return replicateBorder<uint8_t, 1>(pSrc, srcStep, srcRoiSize, pDst, dstStep, dstRoiSize, topBorderHeight,
                                       leftBorderWidth);
}
Status ZOR_CALL zoriCopyReplicateBorder_8u_C3R(const uint8_t* pSrc, int srcStep, ImageSize srcRoiSize, uint8_t* pDst,
                                               int dstStep, ImageSize dstRoiSize, int topBorderHeight,
                                               int leftBorderWidth) {
    return replicateBorder<uint8_t, 3>(pSrc, srcStep, srcRoiSize, pDst, dstStep, dstRoiSize, topBorderHeight,
                                       leftBorderWidth);
}
Status ZOR_CALL zoriCopyReplicateBorder_16s_C1R(const int16_t* pSrc, int srcStep, ImageSize srcRoiSize, int16_t* pDst,
                                                int dstStep, ImageSize dstRoiSize, int topBorderHeight,
                                                int leftBorderWidth) {
    return replicateBorder<int16_t, 1>(pSrc, srcStep, srcRoiSize, pDst, dstStep, dstRoiSize, topBorderHeight,
                                       leftBorderWidth);
}

}}  // namespace zor::ZOR_NS

#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
