// Small dense matrices of doubles: Householder QR decomposition, the
// least-squares solve from it, and a strided float vector times a constant.
//
// Matrices are addressed by byte strides: stride1 from row to row, stride2
// from element to element within a row (a vector has only stride2).
//
// Decomposition, step k of width (width - 1 for a square matrix, whose last
// column needs no reflection):
//   n   = sqrt(sum of a(i,k)^2, i >= k)          below the double epsilon: stop
//   u   = a(k,k) - n if a(k,k) <= 0 (+0 and -0 alike), else a(k,k) + n
//   v   = (1, a(k+1,k)/u, ...)                    kept in the buffer
//   tau = -2 / (1 + sum of v(i)^2, i > k)
//   every column j >= k:  s = tau (a(k,j) + sum v(i) a(i,j)),  a(i,j) += v(i) s
// and v below the diagonal of column k.  The solve applies the same
// reflections to b (rebuilding v and tau from the stored column) and then
// substitutes backwards through R.
//
// Every sum runs in index order and every operation is rounded to double in
// every variant (the 32-bit x87 variants store each result), so all variants
// give the same bits.  Square matrices of 3 to 6 rows have their own
// fully unrolled instances.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <cmath>
#include <cstddef>

namespace zor { namespace ZOR_NS {
namespace {

constexpr double kEpsilon = 2.220446049250313e-16;  // the 64-bit float epsilon

// Element (i, j) of a byte-strided matrix.
template <class T>
struct Strided {
    T* base;
    int stride1, stride2;
    T& operator()(int i, int j) const {
        using Byte = std::conditional_t<std::is_const_v<T>, const char, char>;
        return *reinterpret_cast<T*>(reinterpret_cast<Byte*>(base) + ptrdiff_t(i) * stride1 +
                                     ptrdiff_t(j) * stride2);
    }
    T& operator[](int i) const { return (*this)(0, i); }  // vectors: element i
};
template <class T>
Strided<T> vec(T* base, int stride2) { return {base, 0, stride2}; }

// Sizes known at compile time or at run time.
template <int W, int H>
struct Fixed {
    static constexpr int w = W, h = H;
};
struct Sizes {
    int w, h;
};

// Calls f with the sizes as constants for the small square matrices (their
// loops unroll completely), as values otherwise.
template <class F>
Status withSizes(int w, int h, F f) {
    if (w == h) switch (w) {
            case 3: return f(Fixed<3, 3>{});
            case 4: return f(Fixed<4, 4>{});
            case 5: return f(Fixed<5, 5>{});
            case 6: return f(Fixed<6, 6>{});
        }
    return f(Sizes{w, h});
}

template <class D>
int reflections(const D& d) { return d.w == d.h ? d.w - 1 : d.w; }

// x87: every result leaves the register as a double (range and rounding).
inline double mul(double a, double b) { return toDouble(a * b); }
inline double add(double a, double b) { return toDouble(a + b); }

Status badStride(int stride, int element) {
    return (stride < 1 || stride % element != 0) ? StatusBadStride : StatusOk;
}

Status checkMatrix(int width, int height, int s1, int s2) {
    if (Status s = checkFirst(badLength(width), badLength(height))) return s;
    if (Status s = checkFirst(badStride(s1, 8), badStride(s2, 8))) return s;
    return StatusOk;
}

// Step k's reflection of columns k .. width - 1.  Dense rows of 8 columns
// or more take neighbouring columns a register at a time (narrower ones lose
// more to loads that straddle the previous step's stores than they gain);
// each lane does the scalar column's operations in the scalar order.
template <class D>
void reflect(Strided<double> a, const double* v, double tau, int k, const D& d) {
    int j = k;
#if ZOR_SIMD >= 2
    using V = simd::Vec<double>;
    if (a.stride2 == sizeof(double) && d.w >= 8)
        for (; j + V::kLanes <= d.w; j += V::kLanes) {
            V dot = simd::load<V>(&a(k, j));
            for (int i = k + 1; i < d.h; ++i) dot = dot + simd::set1<V>(v[i]) * simd::load<V>(&a(i, j));
            const V s = simd::set1<V>(tau) * dot;
            simd::store(&a(k, j), simd::load<V>(&a(k, j)) + s);
            for (int i = k + 1; i < d.h; ++i)
                simd::store(&a(i, j), simd::load<V>(&a(i, j)) + simd::set1<V>(v[i]) * s);
        }
#endif
    for (; j < d.w; ++j) {
        double dot = a(k, j);
        for (int i = k + 1; i < d.h; ++i) dot = add(dot, mul(v[i], a(i, j)));
        const double s = mul(tau, dot);
        a(k, j) = add(a(k, j), s);
        for (int i = k + 1; i < d.h; ++i) a(i, j) = add(a(i, j), mul(v[i], s));
    }
}

template <class D>
Status decompose(Strided<const double> src, double* v, Strided<double> a, const D& d) {
    for (int i = 0; i < d.h; ++i)
        for (int j = 0; j < d.w; ++j) a(i, j) = src(i, j);
    for (int k = 0; k < reflections(d); ++k) {
        double squares = 0;
        for (int i = k; i < d.h; ++i) squares = add(squares, mul(a(i, k), a(i, k)));
        const double n = toDouble(std::sqrt(squares));
        if (n < kEpsilon) return StatusDivideByZero;
        const double u = a(k, k) <= 0 ? toDouble(a(k, k) - n) : add(a(k, k), n);
        double vv = 0;
        v[k] = 1;
        for (int i = k + 1; i < d.h; ++i) {
            v[i] = toDouble(a(i, k) / u);
            vv = add(vv, mul(v[i], v[i]));
        }
        reflect(a, v, toDouble(-2.0 / add(1.0, vv)), k, d);
        for (int i = k + 1; i < d.h; ++i) a(i, k) = v[i];
    }
    return StatusOk;
}

template <class D>
void solve(Strided<const double> qr, double* y, Strided<const double> b, Strided<double> x, const D& d) {
    for (int i = 0; i < d.h; ++i) y[i] = b[i];
    for (int k = 0; k < reflections(d); ++k) {
        double vv = 0, dot = y[k];
        for (int i = k + 1; i < d.h; ++i) {
            vv = add(vv, mul(qr(i, k), qr(i, k)));
            dot = add(dot, mul(qr(i, k), y[i]));
        }
        const double s = mul(toDouble(-2.0 / add(1.0, vv)), dot);
        y[k] = add(y[k], s);
        for (int i = k + 1; i < d.h; ++i) y[i] = add(y[i], mul(qr(i, k), s));
    }
    for (int j = d.w - 1; j >= 0; --j) {
        double sum = 0;
        for (int l = j + 1; l < d.w; ++l) sum = add(sum, mul(qr(j, l), x[l]));
        x[j] = toDouble(toDouble(y[j] - sum) / qr(j, j));
    }
}

}  // namespace

Status ZOR_CALL zormQRDecomp_m_64f(const double* pSrc, int srcStride1, int srcStride2, double* pBuffer,
                                   double* pDst, int dstStride1, int dstStride2, int width, int height) {
    if (Status s = anyNull(pSrc, pDst, pBuffer)) return s;
    if (Status s = checkMatrix(width, height, srcStride1, srcStride2)) return s;
    if (Status s = checkFirst(badStride(dstStride1, 8), badStride(dstStride2, 8))) return s;
    if (width > height) return StatusBadMatrixShape;
    DoublePrecisionScope precision;
    const Strided<const double> src{pSrc, srcStride1, srcStride2};
    const Strided<double> dst{pDst, dstStride1, dstStride2};
    return withSizes(width, height, [&](const auto& d) { return decompose(src, pBuffer, dst, d); });
}

Status ZOR_CALL zormQRBackSubst_mv_64f(const double* pSrc, int srcStride1, int srcStride2, double* pBuffer,
                                       const double* pSrc2, int src2Stride2, double* pDst, int dstStride2,
                                       int width, int height) {
    if (Status s = anyNull(pSrc, pSrc2, pDst, pBuffer)) return s;
    if (Status s = checkMatrix(width, height, srcStride1, srcStride2)) return s;
    if (Status s = checkFirst(badStride(src2Stride2, 8), badStride(dstStride2, 8))) return s;
    if (width > height) return StatusBadMatrixShape;
    DoublePrecisionScope precision;
    const Strided<const double> qr{pSrc, srcStride1, srcStride2};
    return withSizes(width, height, [&](const auto& d) {
        solve(qr, pBuffer, vec(pSrc2, src2Stride2), vec(pDst, dstStride2), d);
        return StatusOk;
    });
}

Status ZOR_CALL zormMul_vc_32f(const float* pSrc, int srcStride2, float val, float* pDst, int dstStride2,
                               int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (Status s = checkFirst(badStride(srcStride2, 4), badStride(dstStride2, 4))) return s;
    if (srcStride2 == 4 && dstStride2 == 4) {
        // The product of two floats is exact in double: one rounding to float
        // whichever unit computes it.
        simd::mapLanes(pSrc, pDst, len, [val](auto x) {
            if constexpr (std::is_same_v<decltype(x), float>) return toFloat(double(x) * val);
            else return x * simd::set1<decltype(x)>(val);
        });
        return StatusOk;
    }
    const auto src = vec(pSrc, srcStride2);
    const auto dst = vec(pDst, dstStride2);
    for (int i = 0; i < len; ++i) dst[i] = toFloat(double(src[i]) * val);
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
