// Row kernels of the smoothing filters (image/filter/smoothing.cpp): sliding
// window sums, the binomial (Gauss) passes, the Wiener pixel rule and full
// convolution.  Samples are addressed per channel: a C3 row of w pixels is
// 3 w samples, and a neighbour one pixel to the right is `stride` (the
// channel count) samples on.
//
// Kernels are written once over a lane type W, which is a register
// simd::Vec<T> or a plain T: forLanes runs a body on whole registers and
// then on plain lanes for the rest, so the generic variant (no registers)
// and the tails run the same integer arithmetic, and every variant gives
// the same bytes.
//
// Include after frame/variant.h.
#pragma once

#include "frame/abi.h"
#include "frame/fpu.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <cstddef>
#include <cstdint>
#include <type_traits>

namespace zor { inline namespace ZOR_INLINE_NS { namespace smoothing {

using Bytes = simd::Vec<uint8_t>;
using Words = simd::Vec<uint16_t>;

// Lanes per step of forLanes<T>: a register's, or 1 without registers.
template <class T>
constexpr int kStep = [] {
    if constexpr (simd::kHas<T>) return simd::Vec<T>::kLanes;
    else return 1;
}();

// body(W{}, i) over [begin, end): W a register of T lanes while one fits,
// then a plain T.
template <class T, class Body>
inline void forLanes(ptrdiff_t begin, ptrdiff_t end, Body body) {
    ptrdiff_t i = begin;
    if constexpr (simd::kHas<T>) {
        using V = simd::Vec<T>;
        for (; i + V::kLanes <= end; i += V::kLanes) body(V{}, i);
    }
    for (; i < end; ++i) body(T{}, i);
}

// d[i] = f(W{}, i) saturated to bytes, i < n: f gives 16-bit lanes read as
// signed (a plain int in the tail).
template <class F>
inline void storeBytes(uint8_t* d, ptrdiff_t n, F f) {
    ptrdiff_t i = 0;
#if ZOR_SIMD >= 2
    for (; i + Bytes::kLanes <= n; i += Bytes::kLanes)
        simd::store(d + i, simd::narrowSatInOrder<uint8_t>(simd::bitcast<int16_t>(f(Words{}, i)),
                                                           simd::bitcast<int16_t>(f(Words{}, i + Words::kLanes))));
#endif
    for (; i < n; ++i) d[i] = saturate<uint8_t>(int(f(uint16_t{}, i)));
}

// The bytes at p as a lane of W: a 16-bit register or a plain lane.
template <class W>
inline W loadBytesAs(const uint8_t* p) {
#if ZOR_SIMD >= 2
    if constexpr (!std::is_arithmetic_v<W>) return simd::widenLoInOrder(simd::loadHalf<Bytes>(p));
    else
#endif
        return W(*p);
}

// ---- bytes down the columns ------------------------------------------------------

#if ZOR_SIMD >= 2
// The bytes of b as registers of unsigned U lanes, in order, each raised
// to the power P (1 or 2) at 16 bits, where a square of a byte still fits.
template <int P, class U>
inline void widenBytes(Bytes b, simd::Vec<U>* out) {
    if constexpr (sizeof(U) == 2) {
        out[0] = simd::widenLoInOrder(b);
        out[1] = simd::widenHiInOrder(b);
        if constexpr (P == 2) out[0] = out[0] * out[0], out[1] = out[1] * out[1];
    } else {
        using H = std::conditional_t<sizeof(U) == 4, uint16_t, uint32_t>;
        simd::Vec<H> half[sizeof(H)];
        widenBytes<P>(b, half);
        for (size_t k = 0; k < sizeof(H); ++k) {
            out[2 * k] = simd::widenLoInOrder(half[k]);
            out[2 * k + 1] = simd::widenHiInOrder(half[k]);
        }
    }
}
#endif

// col[i] = op(col[i], x) for i < n, x[r] the byte rows[r][i] as a lane of T
// (squared for P = 2).
template <class T, int P, int R, class Op>
void columnMap(T* col, ptrdiff_t n, const uint8_t* const (&rows)[R], Op op) {
    ptrdiff_t i = 0;
#if ZOR_SIMD >= 2
    {
        using W = simd::Vec<T>;
        constexpr int kParts = int(sizeof(T));  // registers of T per register of bytes
        for (; i + Bytes::kLanes <= n; i += Bytes::kLanes) {
            W x[R][kParts];
            for (int r = 0; r < R; ++r) widenBytes<P>(simd::load<Bytes>(rows[r] + i), x[r]);
            for (int k = 0; k < kParts; ++k) {
                W xk[R];
                for (int r = 0; r < R; ++r) xk[r] = x[r][k];
                T* c = col + i + k * W::kLanes;
                simd::store(c, W(op(simd::load<W>(c), xk)));
            }
        }
    }
#endif
    for (; i < n; ++i) {
        T x[R];
        for (int r = 0; r < R; ++r) x[r] = P == 2 ? T(T(rows[r][i]) * rows[r][i]) : T(rows[r][i]);
        col[i] = T(op(col[i], x));
    }
}

// ---- along the rows ------------------------------------------------------------------

// h[i] = c[i] + c[i + stride] + ... (taps lanes), i < n.  The common
// counts are constants of the loop: a run-time count is one more live
// register, which on 32-bit x86 put the loop's own pointer on the stack.
template <class T>
void windowSums(const T* c, T* h, ptrdiff_t n, int taps, int stride) {
    const auto sums = [&](auto count) {
        const int m = count ? int(count) : taps;
        forLanes<T>(0, n, [&](auto w, ptrdiff_t i) {
            using W = decltype(w);
            W acc = simd::load<W>(c + i);
            for (int k = 1; k < m; ++k) acc = W(acc + simd::load<W>(c + i + ptrdiff_t(k) * stride));
            simd::store(h + i, acc);
        });
    };
    switch (taps) {
    case 3: sums(std::integral_constant<int, 3>()); break;
    case 5: sums(std::integral_constant<int, 5>()); break;
    case 7: sums(std::integral_constant<int, 7>()); break;
    default: sums(std::integral_constant<int, 0>()); break;
    }
}

// The same in time independent of taps.  Up to a step of lanes directly;
// wider windows from g, the sums of L = kStep<T> taps: with s the stride,
//   h[i] = h[i - L s] + g[i + (taps - L) s] - g[i - L s],
// a recurrence one register long (L s samples back).  Without registers
// L = 1, g = c, and this is the running sum.  Sums wrap in T; the final
// ones fit.
//
// The recurrence runs in registers, S of them for stride S (1 or 3; the
// last S results are carried rather than reloaded, which would put a store
// and a load on every step's path); S = 0 walks lanes in memory.
template <int S, class T>
void recurrence(const T* g, T* h, ptrdiff_t n, ptrdiff_t back, ptrdiff_t ahead) {
    ptrdiff_t i = back;
    if constexpr (S > 0) {
        using W = std::conditional_t<simd::kHas<T>, simd::Vec<T>, T>;
        constexpr int L = kStep<T>;
        W last[S];
        if (i + back <= n)
            for (int r = 0; r < S; ++r) last[r] = simd::load<W>(h + r * L);
        for (; i + back <= n; i += back)
            for (int r = 0; r < S; ++r) {
                const ptrdiff_t k = i + r * L;
                last[r] = W(last[r] + simd::load<W>(g + k + ahead) - simd::load<W>(g + k - back));
                simd::store(h + k, last[r]);
            }
    }
    for (; i < n; ++i) h[i] = T(h[i - back] + g[i + ahead] - g[i - back]);
}

template <class T>
void slidingSums(const T* c, T* g, T* h, ptrdiff_t n, int taps, int stride) {
    constexpr int L = kStep<T>;
    if (taps <= L) {
        windowSums(c, h, n, taps, stride);
        return;
    }
    const ptrdiff_t back = ptrdiff_t(L) * stride, ahead = ptrdiff_t(taps - L) * stride;
    if constexpr (L == 1) g = const_cast<T*>(c);
    else windowSums(c, g, n + ahead, L, stride);
    windowSums(c, h, n < back ? n : back, taps, stride);
    if (stride == 1) recurrence<1>(g, h, n, back, ahead);
    else if (stride == 3) recurrence<3>(g, h, n, back, ahead);
    else recurrence<0>(g, h, n, back, ahead);
}

// ---- sliding box sums ------------------------------------------------------------------

// Sums of the bytes (P = 1) or their squares (P = 2) over a window of
// taps x rows pixels sliding down an image: column sums carried from row to
// row (one source row enters, one leaves), row sums by slidingSums.
// Scratch: lanesNeeded(outputs, taps, stride) lanes of T.
template <class T, int P>
class BoxSums {
public:
    static int64_t lanesNeeded(int64_t outputs, int taps, int stride) {
        const int64_t columns = outputs + int64_t(taps - 1) * stride;
        return 2 * columns + outputs;
    }
    BoxSums(T* scratch, ptrdiff_t outputs, int taps, int stride)
        : outputs_(outputs), columns_(outputs + ptrdiff_t(taps - 1) * stride), taps_(taps), stride_(stride),
          col_(scratch), spare_(scratch + columns_), sums_(spare_ + columns_) {}

    // Column sums of `rows` rows from top (their first sample).
    void start(const uint8_t* top, int step, int rows) {
        const uint8_t* const first[1] = {top};
        columnMap<T, P>(col_, columns_, first, [](auto, const auto& x) { return x[0]; });
        for (int r = 1; r < rows; ++r) {
            const uint8_t* const next[1] = {rowAt(top, step, r)};
            columnMap<T, P>(col_, columns_, next, [](auto c, const auto& x) { return c + x[0]; });
        }
    }
    // One row down: `entering` joins the window, `leaving` drops out.
    void slide(const uint8_t* entering, const uint8_t* leaving) {
        const uint8_t* const rows[2] = {entering, leaving};
        columnMap<T, P>(col_, columns_, rows, [](auto c, const auto& x) { return c + x[0] - x[1]; });
    }
    const T* columns() const { return col_; }
    // The window sums of the current row, one per output sample.
    const T* rowSums() {
        slidingSums(col_, spare_, sums_, outputs_, taps_, stride_);
        return sums_;
    }

private:
    ptrdiff_t outputs_, columns_;
    int taps_, stride_;
    T* col_;
    T* spare_;
    T* sums_;
};

// Slides the BoxSums down the ROI, rowDone(y) at every output row y; top is
// the first sample of the neighbourhood of ROI pixel (0, 0).
template <class RowDone, class... Sums>
void slideBoxes(const uint8_t* top, int step, int rows, int maskRows, RowDone rowDone, Sums&... sums) {
    (sums.start(top, step, maskRows), ...);
    for (int y = 0; y < rows; ++y) {
        if (y > 0) (sums.slide(rowAt(top, step, ptrdiff_t(y) + maskRows - 1), rowAt(top, step, y - 1)), ...);
        rowDone(y);
    }
}

// (h + N/2) / N for window sums h <= 255 N of N <= 256 pixels, in 16-bit
// lanes: q = mulHi(x, m) with m = floor(65536 / N) (65535 for N = 1) is the
// quotient or one less (x / N - x m / 65536 < x / 65536 < 1), and the
// remainder x - q N (below 2 N) tells which.
struct BoxMean {
    uint16_t n, half, m;
    explicit BoxMean(int count)
        : n(uint16_t(count)), half(uint16_t(count / 2)), m(uint16_t(count == 1 ? 65535 : 65536 / count)) {}

    template <class W>
    auto operator()(W h) const {
#if ZOR_SIMD >= 2
        if constexpr (!std::is_arithmetic_v<W>) {
            const W x = h + simd::set1<W>(half);
            const W q = simd::mulHi(x, simd::set1<W>(m));
            const W r = x - q * simd::set1<W>(n);
            const auto over = simd::gt(simd::bitcast<int16_t>(r), simd::set1<simd::Vec<int16_t>>(int16_t(n - 1)));
            return q - simd::bitcast<uint16_t>(over);  // all ones is -1
        } else
#endif
            return int((h + half) / n);
    }
};

// ---- Gauss -----------------------------------------------------------------------

// Binomial weights [1 2 1] or [1 4 6 4 1] over five or three lanes.
template <int Taps, class W>
inline W binomial(const W (&x)[Taps]) {
    if constexpr (Taps == 3) return W(x[0] + x[2] + simd::shl<1>(x[1]));
    else return W(x[0] + x[4] + simd::shl<2>(W(x[1] + x[2] + x[3])) + simd::shl<1>(x[2]));
}

// The Gauss filter of rows output rows, top the first sample of the
// neighbourhood of ROI pixel (0, 0).  Each source row is widened to 16 bits
// once, into a ring of Taps rows; per output row the vertical pass over the
// ring goes into col, then the horizontal pass, rounded and shifted by
// 2 log2(weight sum), into the destination.  Scratch: (Taps + 1) (outputs
// + (Taps - 1) stride) lanes.  The stride between taps (the channel count)
// is a constant, so the taps of the horizontal pass are offsets from one
// address rather than a pointer each, which the general registers of the
// 32-bit build cannot all hold.
template <int Taps, int stride>
void gaussRows(const uint8_t* top, int step, int rows, uint16_t* scratch, ptrdiff_t outputs, uint8_t* dst,
               int dstStep) {
    const ptrdiff_t columns = outputs + ptrdiff_t(Taps - 1) * stride;
    uint16_t* col = scratch + Taps * columns;
    auto slot = [&](int r) { return scratch + (r % Taps) * columns; };
    auto widen = [&](int r) {
        const uint8_t* const row[1] = {rowAt(top, step, r)};
        columnMap<uint16_t, 1>(slot(r), columns, row, [](auto, const auto& x) { return x[0]; });
    };
    for (int r = 0; r < Taps - 1; ++r) widen(r);
    constexpr int kShift = Taps == 3 ? 4 : 8;
    for (int y = 0; y < rows; ++y) {
        widen(y + Taps - 1);
        const uint16_t* ring[Taps];
        for (int k = 0; k < Taps; ++k) ring[k] = slot(y + k);
        forLanes<uint16_t>(0, columns, [&](auto w, ptrdiff_t i) {
            using W = decltype(w);
            W x[Taps];
            for (int k = 0; k < Taps; ++k) x[k] = simd::load<W>(ring[k] + i);
            simd::store(col + i, binomial<Taps>(x));
        });
        storeBytes(rowAt(dst, dstStep, y), outputs, [&](auto w, ptrdiff_t i) {
            using W = decltype(w);
            W x[Taps];
            for (int k = 0; k < Taps; ++k) x[k] = simd::load<W>(col + i + ptrdiff_t(k) * stride);
            return simd::shr<kShift>(W(binomial<Taps>(x) + simd::set1<W>(1 << (kShift - 1))));
        });
    }
}

// ---- Wiener ------------------------------------------------------------------------

// dst for window sum S, sum of squares Q, centre pixel p, all exact in
// double: D = N Q - S^2, g = max(D - nN2, 0) / max(D, nN2) (0 where both
// are 0), floor((S + g (N p - S)) / N + 0.5).  V is double or a register of
// doubles; the division never sees 0 / 0.
template <class V>
inline V wienerValue(V s, V q, V p, V count, V noiseN2) {
    const V zero = simd::zero<V>(), one = simd::set1<V>(1.0);
    const V d = count * q - s * s;
    const V den = simd::max(d, noiseN2);
    const auto positive = simd::gt(den, zero);
    const V gain = simd::select(positive, simd::max(d - noiseN2, zero) / simd::select(positive, den, one), zero);
    return (s + gain * (count * p - s)) / count + simd::set1<V>(0.5);
}

// One row of pixels with 32-bit window sums below 2^31 (registers) or any
// sums (plain lanes).
template <class T>
void wienerRow(const T* s, const T* q, const uint8_t* p, uint8_t* d, ptrdiff_t n, double count, double noiseN2) {
    ptrdiff_t i = 0;
#if ZOR_SIMD >= 2
    if constexpr (std::is_same_v<T, uint32_t>) {
        using D = simd::Vec<double>;
        using I = simd::Vec<int32_t>;
        const D c = simd::set1<D>(count), nn = simd::set1<D>(noiseN2);
        for (; i + Bytes::kLanes <= n; i += Bytes::kLanes) {
            simd::Vec<uint32_t> pix[4];
            widenBytes<1>(simd::load<Bytes>(p + i), pix);
            I out[4];
            for (int k = 0; k < 4; ++k) {
                const I sk = simd::load<I>(reinterpret_cast<const int32_t*>(s + i) + 4 * k);
                const I qk = simd::load<I>(reinterpret_cast<const int32_t*>(q + i) + 4 * k);
                const I pk = simd::bitcast<int32_t>(pix[k]);
                const D lo = wienerValue(simd::toDoubleLo(sk), simd::toDoubleLo(qk), simd::toDoubleLo(pk), c, nn);
                const D hi = wienerValue(simd::toDoubleHi(sk), simd::toDoubleHi(qk), simd::toDoubleHi(pk), c, nn);
                out[k] = simd::toInt32Trunc(lo, hi);
            }
            simd::store(d + i, simd::narrowSat<uint8_t>(simd::narrowSat<int16_t>(out[0], out[1]),
                                                        simd::narrowSat<int16_t>(out[2], out[3])));
        }
    }
#endif
    DoublePrecisionScope precision;
    for (; i < n; ++i) {
        const double v = toDouble(wienerValue(double(s[i]), double(q[i]), double(p[i]), count, noiseN2));
        d[i] = v >= 255.0 ? 255 : v > 0.0 ? uint8_t(int(v)) : 0;
    }
}

// D = N Q - S^2 exactly (N below 2^23, so every term fits 64 bits).
inline uint64_t varianceNumerator(uint64_t s, uint64_t q, uint64_t count) { return count * q - s * s; }

// ---- full convolution ---------------------------------------------------------------------

// Images as (pointer to row 0, step, size).
template <class T>
struct Image {
    const T* p;
    int step;
    ImageSize size;
    const T* row(ptrdiff_t y) const { return rowAt(p, step, y); }
};

// The rows j of the second image that meet output row y: the first image's
// row y - j must exist.
struct RowSpan {
    int first, last;
};
inline RowSpan rowsMeeting(int y, int h1, int h2) {
    return {y - h1 + 1 > 0 ? y - h1 + 1 : 0, y < h2 - 1 ? y : h2 - 1};
}

// The defining sum of one output sample, terms in order of j then i
// ascending (Acc double: rounded at each addition; int64_t: exact).
template <class Acc, class T>
Acc convSample(const Image<T>& a, const Image<T>& k, int x, int y) {
    const RowSpan rows = rowsMeeting(y, a.size.height, k.size.height);
    const int iFirst = x - a.size.width + 1 > 0 ? x - a.size.width + 1 : 0;
    const int iLast = x < k.size.width - 1 ? x : k.size.width - 1;
    Acc s = 0;
    for (int j = rows.first; j <= rows.last; ++j) {
        const T* kr = k.row(j);
        const T* ar = a.row(y - j);
        for (int i = iFirst; i <= iLast; ++i) {
            if constexpr (std::is_same_v<Acc, double>) s = toDouble(s + double(kr[i]) * double(ar[x - i]));
            else s += Acc(kr[i]) * Acc(ar[x - i]);
        }
    }
    return s;
}

// A ring of the first image's rows, zero-padded left and right, as lanes of
// L: row r sits in slot r mod count, pixel x at index x (pixels -left ..
// width + right - 1 exist).
template <class L>
struct PaddedRows {
    L* base;
    ptrdiff_t left, width, right, count;
    ptrdiff_t stride() const { return left + width + right; }
    L* slot(ptrdiff_t r) const { return base + (r % count) * stride() + left; }
    template <class T>
    void put(const T* src, ptrdiff_t r) const {
        L* p = slot(r);
        for (ptrdiff_t x = -left; x < 0; ++x) p[x] = L(0);
        for (ptrdiff_t x = 0; x < width; ++x) p[x] = L(src[x]);
        for (ptrdiff_t x = width; x < width + right; ++x) p[x] = L(0);
    }
};

#if ZOR_SIMD >= 2
// Float convolution, kRegs registers of double lanes of output a block:
// every lane sums the same terms in the same order as convSample (a term
// with a padding pixel is +-0 times a finite kernel value and changes no
// sum, which starts at +0 and so never is -0).
template <int kRegs>
void convRowFloat(const PaddedRows<double>& ring, const Image<float>& k, int y, int h1, float* d, int width) {
    using D = simd::Vec<double>;
    constexpr int kBlock = kRegs * D::kLanes;
    const RowSpan rows = rowsMeeting(y, h1, k.size.height);
    for (int x0 = 0; x0 < width; x0 += kBlock) {
        const int x = x0 + kBlock <= width ? x0 : width - kBlock;  // the last block overlaps
        D acc[kRegs];
        for (D& a : acc) a = simd::zero<D>();
        for (int j = rows.first; j <= rows.last; ++j) {
            const float* kr = k.row(j);
            const double* ar = ring.slot(y - j) + x;
            for (int i = 0; i < k.size.width; ++i) {
                const D kv = simd::set1<D>(double(kr[i]));
                const double* at = ar - i;
#if !defined(__x86_64__)
                // Each tap loads its own operands: left to itself the
                // compiler keeps loads for the next taps, which needs more
                // than the eight registers of the 32-bit build (it spilled
                // them to the stack, 1.5 times the x86-64 time).
                __asm__("" : "+r"(at));
#endif
                for (int r = 0; r < kRegs; ++r) acc[r] += kv * simd::load<D>(at + r * D::kLanes);
            }
        }
        for (int r = 0; r < kRegs; r += 2) {
            simd::store(d + x + r * D::kLanes, simd::narrowSat<float>(acc[r], acc[r + 1]));
        }
    }
}

// Integer convolution of 8-bit images: kernel pixel pairs (i, i + 1) of a
// row times neighbouring padded pixels, summed by pairs into 32-bit lanes.
// pairs: per kernel row, (k[i] | k[i + 1] << 16) for even i (0 past the
// width).  The padding holds kernel width + 1 zeros on the left.
inline void convRowBytes(const PaddedRows<int16_t>& ring, const int32_t* pairs, int pairCount, ImageSize ks,
                         int y, int h1, int32_t* sums, int width) {
    using I16 = simd::Vec<int16_t>;
    using I32 = simd::Vec<int32_t>;
    const RowSpan rows = rowsMeeting(y, h1, ks.height);
    for (int x0 = 0; x0 < width; x0 += I16::kLanes) {
        const int x = x0 + I16::kLanes <= width ? x0 : width - I16::kLanes;
        I32 lo = simd::zero<I32>(), hi = simd::zero<I32>();
        for (int j = rows.first; j <= rows.last; ++j) {
            const int16_t* ar = ring.slot(y - j) + x;
            const int32_t* kp = pairs + ptrdiff_t(j) * pairCount;
            for (int t = 0; t < pairCount; ++t) {
                const I16 c = simd::bitcast<int16_t>(simd::set1<I32>(kp[t]));
                const I16 at = simd::load<I16>(ar - 2 * t), before = simd::load<I16>(ar - 2 * t - 1);
                lo += simd::mulAddPairs(simd::zipLo(at, before), c);
                hi += simd::mulAddPairs(simd::zipHi(at, before), c);
            }
        }
        simd::store(sums + x, lo);
        simd::store(sums + x + I32::kLanes, hi);
    }
}
#endif

// floor(s / divisor + 1/2) saturated to a byte, s >= 0.
inline uint8_t divideHalfUp(int64_t s, int divisor) {
    if (divisor < 0) return 0;
    return saturate<uint8_t>((2 * s + divisor) / (2 * int64_t(divisor)));
}

// The same for a row of 32-bit sums below 2^31: exact in double, as the
// quotients that matter (below 2^20) floor correctly from the rounded
// division.
inline void divideRow(const int32_t* s, uint8_t* d, ptrdiff_t n, int divisor) {
    ptrdiff_t i = 0;
#if ZOR_SIMD >= 2
    if (divisor > 0) {
        using D = simd::Vec<double>;
        using I = simd::Vec<int32_t>;
        const D two = simd::set1<D>(2.0), dv = simd::set1<D>(double(divisor));
        const D den = simd::set1<D>(2.0 * divisor), top = simd::set1<D>(256.0);
        auto quotient = [&](D v) { return simd::min((two * v + dv) / den, top); };
        for (; i + Bytes::kLanes <= n; i += Bytes::kLanes) {
            I q[4];
            for (int k = 0; k < 4; ++k) {
                const I v = simd::load<I>(s + i + k * I::kLanes);
                q[k] = simd::toInt32Trunc(quotient(simd::toDoubleLo(v)), quotient(simd::toDoubleHi(v)));
            }
            simd::store(d + i, simd::narrowSat<uint8_t>(simd::narrowSat<int16_t>(q[0], q[1]),
                                                        simd::narrowSat<int16_t>(q[2], q[3])));
        }
    }
#endif
    for (; i < n; ++i) d[i] = divideHalfUp(s[i], divisor);
}

}}}  // namespace zor::ZOR_INLINE_NS::smoothing
