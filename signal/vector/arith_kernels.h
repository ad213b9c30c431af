// Kernels of the vector arithmetic (signal/vector/arith.cpp) beyond the
// elementwise maps: square root, the logarithm and arctangent approximations
// with their tables, the double-precision results (magnitudes, power
// spectrum, normalisation), the descending sort and the two-channel
// deinterleave.  Included by arith.cpp only, after frame/variant.h.
#pragma once

#include "frame/fpu.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <limits>

namespace zor { namespace ZOR_NS {
namespace {

inline uint32_t bitsOf(float x) {
    uint32_t u;
    std::memcpy(&u, &x, 4);
    return u;
}
inline float floatOf(uint32_t u) {
    float x;
    std::memcpy(&x, &u, 4);
    return x;
}

// The quiet NaN that square root and logarithm leave for negative inputs.
constexpr uint32_t kNegNaN = 0xFFC00000u;

// ---- square root and logarithm -------------------------------------------------

void sqrtInPlace(float* p, int n, bool& negative) {
    int i = 0;
#if ZOR_SIMD >= 1
    using namespace simd;
    using V = Vec<float>;
    const V z = zero<V>(), nan = set1<V>(floatOf(kNegNaN));
    V allGood = ~z;
    for (; i + V::kLanes <= n; i += V::kLanes) {
        const V x = load<V>(p + i);
        const V good = ge(x, z);  // neither negative nor NaN
        allGood = allGood & good;
        store(p + i, select(good, sqrt(x), nan));
    }
    if (!allTrue(allGood)) negative = true;
#endif
    for (; i < n; ++i) {
        if (p[i] >= 0.0f) {
            p[i] = std::sqrt(p[i]);  // +-0 stays as it is
        } else {
            p[i] = floatOf(kNegNaN);
            negative = true;
        }
    }
}

// One element of the logarithm with its special cases; `first` records the
// first special condition of the vector.
inline float lnElement(float x, Status& first) {
    const uint32_t u = bitsOf(x);
    if (u & 0x80000000u) {  // every negative number, -0.0 and negative NaNs
        if (first == StatusOk) first = StatusWarnLnNegative;
        return floatOf(kNegNaN);
    }
    if (u > 0x7F800000u) return floatOf(u | 0x00400000u);  // NaN: quieted
    if (u == 0) {
        if (first == StatusOk) first = StatusWarnLnZero;
        return -std::numeric_limits<float>::infinity();
    }
    return toFloat(std::log(static_cast<double>(x)));
}

// The logarithm and the arctangent run as table-driven approximations in
// double whose relative error has a proven bound far below the float
// precision.  The float that the standard library's result (correct to
// within an ulp) rounds to is then known, unless the approximation lies
// within that bound of a rounding midpoint between two floats: such
// elements (about one in ten thousand) are recomputed with the library.

#if ZOR_SIMD >= 2
// Both kernels work on a register of floats as two registers of doubles
// (widenLo/widenHi and narrowSat, whose lane order is the same at every
// width), with table rows looked up per element (gatherRowsLo/gatherRowsHi,
// gatherLo/gatherHi).
using F = simd::Vec<float>;
using I = simd::Vec<int32_t>;
using D = simd::Vec<double>;

// Lanes (of the doubles lo and hi, as widenLo/widenHi of a float register
// order them, normal-range float values) that lie within Margin double ulps
// of a float rounding midpoint.  A double rounds to float by its 29 low
// mantissa bits: the midpoints are where those read 2^28, so the low 32
// bits of each double decide.  The midpoint below a power of two (whose
// float neighbour below is closer) lies 2^27 ulps away, beyond any Margin
// used here.
template <int Margin>
inline I nearMidpoint(D lo, D hi) {
    using namespace simd;
    static_assert(Margin > 0 && Margin < (1 << 26), "margin must stay inside one float ulp");
    const I low = concatEven(bitcast<int32_t>(lo), bitcast<int32_t>(hi));
    const I off = (low + set1<I>(Margin - (1 << 28))) & set1<I>(0x1FFFFFFF);
    return lt(off, set1<I>(2 * Margin));
}

// ---- logarithm ----
//
// x = 2^e m with m within 2^-9 of c = 1 + k/256 (m may be just below 1, the
// rounding to the nearest c having carried into the exponent), so that
// log x = e log 2 + log c + log(1 + r), r = (m - c)/c, |r| <= 2^-9, and
// log(1 + r) = r - r^2/2 + r^3/3 - r^4/4 to within |r|^5/5.
//
// Error: where e = k = 0 the result is log(1 + r) itself, to within
// |r|^4/5 < 2^-38.3 relative.  Elsewhere |log x| >= 2^-10 and the truncation
// is below 2^-47.3, 2^-37.3 relative; e log 2 + log c, exact where it
// cancels (e = -1, c near 2: Sterbenz), adds a few 2^-53 relative.  So the
// approximation is within 2^-37.2 |log x|: 2^15.8 double ulps.  With the
// library's own ulp, a margin of 2^17 ulps is safe with room to spare.
constexpr int kLnMargin = 1 << 17;

constexpr double kLogC[256] = {
    0x0.0p+0, 0x1.ff00aa2b10bc0p-9, 0x1.fe02a6b106789p-8, 0x1.7dc475f810a77p-7,
    0x1.fc0a8b0fc03e4p-7, 0x1.3cea44346a575p-6, 0x1.7b91b07d5b11bp-6, 0x1.b9fc027af9198p-6,
    0x1.f829b0e783300p-6, 0x1.1b0d98923d980p-5, 0x1.39e87b9febd60p-5, 0x1.58a5bafc8e4d5p-5,
    0x1.77458f632dcfcp-5, 0x1.95c830ec8e3ebp-5, 0x1.b42dd711971bfp-5, 0x1.d276b8adb0b52p-5,
    0x1.f0a30c01162a6p-5, 0x1.075983598e471p-4, 0x1.16536eea37ae1p-4, 0x1.253f62f0a1417p-4,
    0x1.341d7961bd1d1p-4, 0x1.42edcbea646f0p-4, 0x1.51b073f06183fp-4, 0x1.60658a93750c4p-4,
    0x1.6f0d28ae56b4cp-4, 0x1.7da766d7b12cdp-4, 0x1.8c345d6319b21p-4, 0x1.9ab42462033adp-4,
    0x1.a926d3a4ad563p-4, 0x1.b78c82bb0eda1p-4, 0x1.c5e548f5bc743p-4, 0x1.d4313d66cb35dp-4,
    0x1.e27076e2af2e6p-4, 0x1.f0a30c01162a6p-4, 0x1.fec9131dbeabbp-4, 0x1.0671512ca596ep-3,
    0x1.0d77e7cd08e59p-3, 0x1.14785846742acp-3, 0x1.1b72ad52f67a0p-3, 0x1.2266f190a5acbp-3,
    0x1.29552f81ff523p-3, 0x1.303d718e47fd3p-3, 0x1.371fc201e8f74p-3, 0x1.3dfc2b0ecc62ap-3,
    0x1.44d2b6ccb7d1ep-3, 0x1.4ba36f39a55e5p-3, 0x1.526e5e3a1b438p-3, 0x1.59338d9982086p-3,
    0x1.5ff3070a793d4p-3, 0x1.66acd4272ad51p-3, 0x1.6d60fe719d21dp-3, 0x1.740f8f54037a5p-3,
    0x1.7ab890210d909p-3, 0x1.815c0a14357ebp-3, 0x1.87fa06520c911p-3, 0x1.8e928de886d41p-3,
    0x1.9525a9cf456b4p-3, 0x1.9bb362e7dfb83p-3, 0x1.a23bc1fe2b563p-3, 0x1.a8becfc882f19p-3,
    0x1.af3c94e80bff3p-3, 0x1.b5b519e8fb5a4p-3, 0x1.bc286742d8cd6p-3, 0x1.c2968558c18c1p-3,
    0x1.c8ff7c79a9a22p-3, 0x1.cf6354e09c5dcp-3, 0x1.d5c216b4fbb91p-3, 0x1.dc1bca0abec7dp-3,
    0x1.e27076e2af2e6p-3, 0x1.e8c0252aa5a60p-3, 0x1.ef0adcbdc5936p-3, 0x1.f550a564b7b37p-3,
    0x1.fb9186d5e3e2bp-3, 0x1.00e6c45ad501dp-2, 0x1.0402594b4d041p-2, 0x1.071b85fcd590dp-2,
    0x1.0a324e27390e3p-2, 0x1.0d46b579ab74bp-2, 0x1.1058bf9ae4ad5p-2, 0x1.136870293a8b0p-2,
    0x1.1675cababa60ep-2, 0x1.1980d2dd4236fp-2, 0x1.1c898c16999fbp-2, 0x1.1f8ff9e48a2f3p-2,
    0x1.22941fbcf7966p-2, 0x1.2596010df763ap-2, 0x1.2895a13de86a3p-2, 0x1.2b9303ab89d25p-2,
    0x1.2e8e2bae11d31p-2, 0x1.31871c9544185p-2, 0x1.347dd9a987d55p-2, 0x1.3772662bfd85bp-2,
    0x1.3a64c556945eap-2, 0x1.3d54fa5c1f710p-2, 0x1.404308686a7e4p-2, 0x1.432ef2a04e814p-2,
    0x1.4618bc21c5ec2p-2, 0x1.49006804009d1p-2, 0x1.4be5f957778a1p-2, 0x1.4ec973260026ap-2,
    0x1.51aad872df82dp-2, 0x1.548a2c3add263p-2, 0x1.5767717455a6cp-2, 0x1.5a42ab0f4cfe2p-2,
    0x1.5d1bdbf5809cap-2, 0x1.5ff3070a793d4p-2, 0x1.62c82f2b9c795p-2, 0x1.659b57303e1f3p-2,
    0x1.686c81e9b14afp-2, 0x1.6b3bb2235943ep-2, 0x1.6e08eaa2ba1e4p-2, 0x1.70d42e2789236p-2,
    0x1.739d7f6bbd007p-2, 0x1.7664e1239dbcfp-2, 0x1.792a55fdd47a2p-2, 0x1.7bede0a37afc0p-2,
    0x1.7eaf83b82afc3p-2, 0x1.816f41da0d496p-2, 0x1.842d1da1e8b17p-2, 0x1.86e919a330ba0p-2,
    0x1.89a3386c1425bp-2, 0x1.8c5b7c858b48bp-2, 0x1.8f11e873662c7p-2, 0x1.91c67eb45a83ep-2,
    0x1.947941c2116fbp-2, 0x1.972a341135158p-2, 0x1.99d958117e08bp-2, 0x1.9c86b02dc0863p-2,
    0x1.9f323ecbf984cp-2, 0x1.a1dc064d5b995p-2, 0x1.a484090e5bb0ap-2, 0x1.a72a4966bd9eap-2,
    0x1.a9cec9a9a084ap-2, 0x1.ac718c258b0e4p-2, 0x1.af1293247786bp-2, 0x1.b1b1e0ebdfc5bp-2,
    0x1.b44f77bcc8f63p-2, 0x1.b6eb59d3cf35ep-2, 0x1.b9858969310fbp-2, 0x1.bc1e08b0dad0ap-2,
    0x1.beb4d9da71b7cp-2, 0x1.c149ff115f027p-2, 0x1.c3dd7a7cdad4dp-2, 0x1.c66f4e3ff6ff8p-2,
    0x1.c8ff7c79a9a22p-2, 0x1.cb8e0744d7acap-2, 0x1.ce1af0b85f3ebp-2, 0x1.d0a63ae721e64p-2,
    0x1.d32fe7e00ebd5p-2, 0x1.d5b7f9ae2c684p-2, 0x1.d83e7258a2f3ep-2, 0x1.dac353e2c5954p-2,
    0x1.dd46a04c1c4a1p-2, 0x1.dfc859906d5b5p-2, 0x1.e24881a7c6c26p-2, 0x1.e4c71a8687704p-2,
    0x1.e744261d68788p-2, 0x1.e9bfa659861f5p-2, 0x1.ec399d2468cc0p-2, 0x1.eeb20c640ddf4p-2,
    0x1.f128f5faf06edp-2, 0x1.f39e5bc811e5cp-2, 0x1.f6123fa7028acp-2, 0x1.f884a36fe9ec2p-2,
    0x1.faf588f78f31fp-2, 0x1.fd64f20f61572p-2, 0x1.ffd2e0857f498p-2, 0x1.011fab125ff8ap-1,
    0x1.02552a5a5d0ffp-1, 0x1.0389eefce633bp-1, 0x1.04bdf9da926d2p-1, 0x1.05f14bd26459cp-1,
    0x1.0723e5c1cdf40p-1, 0x1.0855c884b450ep-1, 0x1.0986f4f573521p-1, 0x1.0ab76bece14d2p-1,
    0x1.0be72e4252a83p-1, 0x1.0d163ccb9d6b8p-1, 0x1.0e44985d1cc8cp-1, 0x1.0f7241c9b497dp-1,
    0x1.109f39e2d4c97p-1, 0x1.11cb81787ccf8p-1, 0x1.12f719593efbcp-1, 0x1.1422025243d45p-1,
    0x1.154c3d2f4d5eap-1, 0x1.1675cababa60ep-1, 0x1.179eabbd899a1p-1, 0x1.18c6e0ff5cf06p-1,
    0x1.19ee6b467c96fp-1, 0x1.1b154b57da29fp-1, 0x1.1c3b81f713c25p-1, 0x1.1d610fe677003p-1,
    0x1.1e85f5e7040d0p-1, 0x1.1faa34b87094cp-1, 0x1.20cdcd192ab6ep-1, 0x1.21f0bfc65beecp-1,
    0x1.23130d7bebf43p-1, 0x1.2434b6f483934p-1, 0x1.2555bce98f7cbp-1, 0x1.26762013430e0p-1,
    0x1.2795e1289b11bp-1, 0x1.28b500df60783p-1, 0x1.29d37fec2b08bp-1, 0x1.2af15f02640adp-1,
    0x1.2c0e9ed448e8cp-1, 0x1.2d2b4012edc9ep-1, 0x1.2e47436e40268p-1, 0x1.2f62a99509546p-1,
    0x1.307d7334f10bep-1, 0x1.3197a0fa7fe6ap-1, 0x1.32b1339121d71p-1, 0x1.33ca2ba328995p-1,
    0x1.34e289d9ce1d3p-1, 0x1.35fa4edd36ea0p-1, 0x1.37117b54747b6p-1, 0x1.38280fe58797fp-1,
    0x1.393e0d3562a1ap-1, 0x1.3a5373e7ebdfap-1, 0x1.3b68449fffc23p-1, 0x1.3c7c7fff73206p-1,
    0x1.3d9026a7156fbp-1, 0x1.3ea33936b2f5cp-1, 0x1.3fb5b84d16f42p-1, 0x1.40c7a4880dce9p-1,
    0x1.41d8fe84672aep-1, 0x1.42e9c6ddf80bfp-1, 0x1.43f9fe2f9ce67p-1, 0x1.4509a5133bb0ap-1,
    0x1.4618bc21c5ec2p-1, 0x1.472743f33aaadp-1, 0x1.48353d1ea88dfp-1, 0x1.4942a83a2fc07p-1,
    0x1.4a4f85db03ebbp-1, 0x1.4b5bd6956e274p-1, 0x1.4c679afccee3ap-1, 0x1.4d72d3a39fd00p-1,
    0x1.4e7d811b75bb1p-1, 0x1.4f87a3f5026e9p-1, 0x1.50913cc01686bp-1, 0x1.519a4c0ba3446p-1,
    0x1.52a2d265bc5abp-1, 0x1.53aad05b99b7dp-1, 0x1.54b2467999498p-1, 0x1.55b9354b40bcdp-1,
    0x1.56bf9d5b3f399p-1, 0x1.57c57f336f191p-1, 0x1.58cadb5cd7989p-1, 0x1.59cfb25fae87ep-1,
    0x1.5ad404c359f2dp-1, 0x1.5bd7d30e71c73p-1, 0x1.5cdb1dc6c1765p-1, 0x1.5ddde57149923p-1,
    0x1.5ee02a9241675p-1, 0x1.5fe1edad18919p-1, 0x1.60e32f44788d9p-1, 0x1.61e3efda46467p-1,
};
constexpr double kLn2 = 0x1.62e42fefa39efp-1;

struct LnRow {
    double inv, logc;
};
struct LnTable {
    alignas(16) LnRow row[256];
};
constexpr LnTable makeLnTable() {
    LnTable t{};
    for (int k = 0; k < 256; ++k) t.row[k] = LnRow{1.0 / (1.0 + k / 256.0), kLogC[k]};
    return t;
}
// 1/c rounds the same at compile time on every platform (IEEE division).
constexpr LnTable kLnTable = makeLnTable();

// log x for the lanes of d that widenLo (widenHi with Upper) takes: e as
// integers, d = m - c (exact in float), the table rows (rows[l] = 2k, in
// doubles) of the register's lanes.  The polynomial is evaluated in a split
// form for a shorter dependency chain.
template <bool Upper>
inline D lnHalf(I e, F d, const int32_t* rows) {
    using namespace simd;
    D inv, logc;
    if constexpr (Upper) gatherRowsHi(&kLnTable.row[0].inv, rows, inv, logc);
    else gatherRowsLo(&kLnTable.row[0].inv, rows, inv, logc);
    const D r = (Upper ? widenHi(d) : widenLo(d)) * inv;
    const D hi = (Upper ? toDoubleHi(e) : toDoubleLo(e)) * set1<D>(kLn2) + logc;
    const D r2 = r * r;
    // r + r2 (a + b) with a = r/3 - 1/2 and b = -r2/4 computed side by side.
    const D a = r * set1<D>(1.0 / 3) + set1<D>(-0.5);
    const D b = r2 * set1<D>(-0.25);
    return (hi + r) + r2 * (a + b);
}

// The table rows of q[0 .. F::kLanes - 1] (2k: the index of the row's first
// double), formed in general registers: they start the longest dependency
// chain of the loop, and that way they need neither the vector unit nor a
// transfer out of it.
inline void lnRowsOf(const float* q, int32_t (&rows)[F::kLanes]) {
    for (int l = 0; l < F::kLanes; ++l) {
        uint32_t u;
        std::memcpy(&u, q + l, 4);
        rows[l] = static_cast<int32_t>(((u + 0x4000u) >> 14) & 0x1FEu);
    }
}

// The logarithms of q[0 .. F::kLanes - 1] in place, unless one of them is
// not a positive normal finite float or lies near a rounding midpoint: then
// false and nothing is written.
inline bool lnBlock(float* q) {
    using namespace simd;
    const I one = set1<I>(0x3F800000);
    const I u = loadFrom<I>(q);
    // Round the mantissa to 8 bits: a carry moves into the exponent.
    // Lanes other than positive normal finite floats compute garbage
    // harmlessly (inside the table) and are redone element by element.
    const I t = u + set1<I>(0x4000);
    const I expo = t & set1<I>(0x7F800000);
    const I kbits = t & set1<I>(0x007F8000);
    const F m = bitcast<float>(u - expo + one);
    const F d = m - bitcast<float>(kbits | one);
    const I e = shr<23>(expo) - set1<I>(127);
    int32_t rows[F::kLanes];
    lnRowsOf(q, rows);
    const D y0 = lnHalf<false>(e, d, rows);
    const D y1 = lnHalf<true>(e, d, rows);
    // Not a positive normal finite float: u outside [0x00800000,
    // 0x7F800000), tested as one signed compare.
    const I special = gt(u + set1<I>(0x7F800000), set1<I>(-0x01000001));
    if (anyTrue(special | nearMidpoint<kLnMargin>(y0, y1))) return false;
    store(q, narrowSat<float>(y0, y1));
    return true;
}
#endif

[[maybe_unused]] Status lnInPlace(float* p, int n) {
    Status first = StatusOk;
    int i = 0;
#if ZOR_SIMD >= 2
    constexpr int kLanes = F::kLanes;
    for (; i + kLanes <= n; i += kLanes)
        if (!lnBlock(p + i))
            for (int j = i; j < i + kLanes; ++j) p[j] = lnElement(p[j], first);
    // The last elements as a block padded with ones, so that short vectors
    // avoid the library too.
    if (i < n) {
        float q[kLanes];
        for (float& x : q) x = 1.0f;
        std::memcpy(q, p + i, sizeof(float) * size_t(n - i));
        if (lnBlock(q)) {
            std::memcpy(p + i, q, sizeof(float) * size_t(n - i));
            i = n;
        }
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) p[i] = lnElement(p[i], first);
    return first;
}

// ---- arctangent -----------------------------------------------------------------

inline float atan2Element(float y, float x) {
    return toFloat(std::atan2(static_cast<double>(y), static_cast<double>(x)));
}

#if ZOR_SIMD >= 2
// With num = min(|y|, |x|), den = max(|y|, |x|), t = num/den in [0, 1] and
// c = k/64 within 2^-6.9 of t (k from a float estimate of t):
//   atan(t) = atan(c) + atan(z),  z = (num - c den) / (den + c num),
// where num - c den and den + c num are exact in double, so z is the
// correctly rounded quotient, |z| <= 2^-6.9, and atan(z) = z - z^3/3 + z^5/5
// to within |z|^7/7, 2^-44.2 relative.  The octant (|y| > |x|) and the side
// (x < 0) select base and sign:
//   atan2(|y|, x) = base + sigma atan(t) = T + atan(sigma z),
// with T = base + sigma atan(c) from a table per octant and k, and sigma
// applied to num and c; the sign of y is applied last (atan2 is odd
// in y).  T is within 2^-52 relative and never cancels against atan(z) by
// more than a factor 3: the whole is within 2^-43.5 relative, 2^9.5 double
// ulps; margin 2^13.
constexpr int kPhaseMargin = 1 << 13;

constexpr double kAtanK[65] = {
    0x0.0p+0, 0x1.fff555bbb729bp-7, 0x1.ffd55bba97625p-6, 0x1.7fb818430da2ap-5,
    0x1.ff55bb72cfdeap-5, 0x1.3f59f0e7c559dp-4, 0x1.7ee182602f10fp-4, 0x1.be39ebe6f07c3p-4,
    0x1.fd5ba9aac2f6ep-4, 0x1.1e1fafb043727p-3, 0x1.3d6eee8c6626cp-3, 0x1.5c9811e3ec26ap-3,
    0x1.7b97b4bce5b02p-3, 0x1.9a6a8e96c8626p-3, 0x1.b90d7529260a2p-3, 0x1.d77d5df205736p-3,
    0x1.f5b75f92c80ddp-3, 0x1.09dc597d86362p-2, 0x1.18bf5a30bf178p-2, 0x1.278372057ef46p-2,
    0x1.362773707ebccp-2, 0x1.44aa436c2af0ap-2, 0x1.530ad9951cd4ap-2, 0x1.614840309cfe2p-2,
    0x1.6f61941e4def1p-2, 0x1.7d5604b63b3f7p-2, 0x1.8b24d394a1b25p-2, 0x1.98cd5454d6b18p-2,
    0x1.a64eec3cc23fdp-2, 0x1.b3a911da65c6cp-2, 0x1.c0db4c94ec9f0p-2, 0x1.cde53432c1351p-2,
    0x1.dac670561bb4fp-2, 0x1.e77eb7f175a34p-2, 0x1.f40dd0b541418p-2, 0x1.0039c73c1a40cp-1,
    0x1.0657e94db30d0p-1, 0x1.0c6145b5b43dap-1, 0x1.1255d9bfbd2a9p-1, 0x1.1835a88be7c13p-1,
    0x1.1e00babdefeb4p-1, 0x1.23b71e2cc9e6ap-1, 0x1.2958e59308e31p-1, 0x1.2ee628406cbcap-1,
    0x1.345f01cce37bbp-1, 0x1.39c391cd4171ap-1, 0x1.3f13fb89e96f4p-1, 0x1.445065b795b56p-1,
    0x1.4978fa3269ee1p-1, 0x1.4e8de5bb6ec04p-1, 0x1.538f57b89061fp-1, 0x1.587d81f732fbbp-1,
    0x1.5d58987169b18p-1, 0x1.6220d115d7b8ep-1, 0x1.66d663923e087p-1, 0x1.6b798920b3d99p-1,
    0x1.700a7c5784634p-1, 0x1.748978fba8e0fp-1, 0x1.78f6bbd5d315ep-1, 0x1.7d528289fa093p-1,
    0x1.819d0b7158a4dp-1, 0x1.85d69576cc2c5p-1, 0x1.89ff5ff57f1f8p-1, 0x1.8e17aa99cc05ep-1,
    0x1.921fb54442d18p-1,
};
constexpr double kPi = 0x1.921fb54442d18p+1, kHalfPi = 0x1.921fb54442d18p+0;

// T for row (steep + 2 left) * 128 + k: steep for |y| > |x|, left for x < 0.
// Rows with k above 64 are never used for results (zero); they keep the
// loads of lanes that are recomputed anyway inside the table.
struct PhaseTable {
    alignas(16) double base[4 * 128];
};
constexpr PhaseTable makePhaseTable() {
    PhaseTable t{};
    for (int oct = 0; oct < 4; ++oct) {
        const bool steep = oct & 1, left = oct & 2;
        const double base = steep ? kHalfPi : left ? kPi : 0.0;
        const double sigma = steep != left ? -1.0 : 1.0;
        for (int k = 0; k <= 64; ++k) t.base[oct * 128 + k] = base + sigma * kAtanK[k];
    }
    return t;
}
constexpr PhaseTable kPhaseTable = makePhaseTable();

// The loop runs in two passes over chunks of kPhaseChunk elements: the
// first forms, per register of elements, everything that needs only float
// work (octant, table row, the float operands of z, whether the magnitudes
// are in range) into a stack buffer; the second does the double-precision
// work from there.  Split so, each pass's dependency chain is short enough
// for several registers to be in flight at once, and the table rows are in
// memory long before they are needed: the table loads go lane by lane from
// general registers, much faster than a native gather.
constexpr int kPhaseChunk = 256;

// What the first pass leaves for one register of elements, read back by
// the second a half register of doubles at a time, in element order.
struct PhaseStaged {
    float snum[F::kLanes], den[F::kLanes], sc[F::kLanes];  // sigma num, den, sigma c
    int32_t row[F::kLanes];
    F inRange;  // both magnitudes in [2^-60, 2^60)
};

inline void phaseStage(const float* py, const float* px, PhaseStaged& s) {
    using namespace simd;
    const I signBit = set1<I>(INT32_MIN);
    const I yb = loadFrom<I>(py), xb = loadFrom<I>(px);
    const I ya = andNot(signBit, yb), xa = andNot(signBit, xb);
    // A NaN in either makes num (x's) or den (y's) NaN.
    const F num = min(bitcast<float>(ya), bitcast<float>(xa));
    const F den = max(bitcast<float>(xa), bitcast<float>(ya));
    // t + 2^17 rounds t to a multiple of 1/64: the low bits hold k, and
    // subtracting 2^17 again leaves c = k/64 exactly.  The reciprocal
    // estimate (12 bits) keeps |t - c| <= 2^-7 + 2^-11.4 and k <= 64.
    const F tk = num * recipApprox(den) + set1<F>(0x1p17f);
    const I steep = gt(ya, xa);  // positive floats order as integers
    const I left = shr<31>(xb);
    const I row = (bitcast<int32_t>(tk) & set1<I>(127)) |
                  ((steep & set1<I>(128)) | (left & set1<I>(256)));
    const F sigma = bitcast<float>(shl<31>(steep ^ left));
    store(s.snum, num ^ sigma);
    store(s.den, den);
    store(s.sc, (tk - set1<F>(0x1p17f)) ^ sigma);
    // Zeros, infinities, NaNs and extreme ratios (a result below the normal
    // floats, a reciprocal estimate out of range) are left to the library,
    // like results near a rounding midpoint.
    s.inRange = ge(num, set1<F>(0x1p-60f)) & lt(den, set1<F>(0x1p60f));
    storeTo(s.row, row);
}

// atan(z) plus T for the elements from first on (a register of doubles of
// them), from snum = sigma num, den and sc = sigma c as floats (widened
// exactly) and the table rows.
inline D phaseLanes(const PhaseStaged& s, int first) {
    using namespace simd;
    const D c = loadWidened<D>(s.sc + first), nd = loadWidened<D>(s.snum + first), dd = loadWidened<D>(s.den + first);
    const D z = (nd - c * dd) / (dd + c * nd);
    const D z2 = z * z;
    const D q = z2 * set1<D>(1.0 / 5) + set1<D>(-1.0 / 3);
    const D t = gather<D>(kPhaseTable.base, s.row + first);
    return (t + z) + (z * z2) * q;
}

// One register of elements by the library: kept out of the loop, whose
// registers a call would clobber.
[[gnu::noinline]] void atan2Elements(const float* py, const float* px, float* d) {
    for (int j = 0; j < F::kLanes; ++j) d[j] = atan2Element(py[j], px[j]);
}
#endif

// dst = atan2(y, x), rounded to float.
[[maybe_unused]] void atan2Vec(const float* py, const float* px, float* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
    constexpr int kLanes = F::kLanes;
    const I signBit = set1<I>(INT32_MIN);
    PhaseStaged staged[kPhaseChunk / kLanes];
    while (i + kLanes <= n) {
        const int blocks = std::min(kPhaseChunk, n - i) / kLanes;
        for (int b = 0; b < blocks; ++b) phaseStage(py + i + b * kLanes, px + i + b * kLanes, staged[b]);
        for (int b = 0; b < blocks; ++b, i += kLanes) {
            const D r0 = phaseLanes(staged[b], 0);
            const D r1 = phaseLanes(staged[b], D::kLanes);
            // nearMidpoint orders its lanes per 16-byte block, inRange in
            // element order: they only meet in this test of all lanes.
            if (allTrue(andNot(bitcast<float>(nearMidpoint<kPhaseMargin>(r0, r1)), staged[b].inRange)))
                storeTo(d + i, narrowInOrder<float>(r0, r1) | bitcast<float>(loadFrom<I>(py + i) & signBit));
            else
                atan2Elements(py + i, px + i, d + i);
        }
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) d[i] = atan2Element(py[i], px[i]);
}

// ---- double-precision elementwise results --------------------------------------

// dst = sqrt(re^2 + im^2) or re^2 + im^2, each in double, rounded once.
#if ZOR_SIMD >= 2
// One register of results from registers of re and im (any width: widened
// halves narrowed back keep the lane order).
template <bool Root, class F>
inline F squaresSumLanes(F re, F im) {
    using namespace simd;
    const auto sum = [](auto a, auto b) {
        const auto s = a * a + b * b;
        if constexpr (Root) return sqrt(s);
        else return s;
    };
    return narrowSat<float>(sum(widenLo(re), widenLo(im)), sum(widenHi(re), widenHi(im)));
}
#endif

template <bool Root>
void squaresSum(const float* re, const float* im, float* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
    using F = Vec<float>;
    for (; i + F::kLanes <= n; i += F::kLanes)
        store(d + i, squaresSumLanes<Root>(load<F>(re + i), load<F>(im + i)));
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) {
        const double a = re[i], b = im[i];
        const double s = toDouble(a * a + b * b);
        d[i] = toFloat(Root ? std::sqrt(s) : s);
    }
}

[[maybe_unused]] void magnitudeComplex(const Complex32f* src, float* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    // the (re, im) pairs taken apart into a register of each, in lane order
    using namespace simd;
    using F = Vec<float>;
    const float* p = reinterpret_cast<const float*>(src);
    for (; i + F::kLanes <= n; i += F::kLanes) {
        const float* q = p + 2 * static_cast<ptrdiff_t>(i);
        F re, im;
        deinterleave(load<F>(q), load<F>(q + F::kLanes), re, im);
        store(d + i, squaresSumLanes<true>(re, im));
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) {
        const double a = src[i].re, b = src[i].im;
        d[i] = toFloat(std::sqrt(toDouble(a * a + b * b)));
    }
}

// dst = (src - sub) * rcp, both steps in double.
[[maybe_unused]] void normalizeVec(const float* s, float* d, int n, float sub, double rcp) {
    int i = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
    using F = Vec<float>;
    using D = Vec<double>;
    const D vs = set1<D>(sub), vr = set1<D>(rcp);
    for (; i + F::kLanes <= n; i += F::kLanes) {
        const F x = load<F>(s + i);
        store(d + i, narrowSat<float>((widenLo(x) - vs) * vr, (widenHi(x) - vs) * vr));
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) d[i] = toFloat(toDouble(static_cast<double>(s[i]) - sub) * rcp);
}

// ---- sort -------------------------------------------------------------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_ALL)
inline void swapAt(float* a, int i, int j) {
    const float t = a[i];
    a[i] = a[j];
    a[j] = t;
}

// The partition of a descending quicksort about pivot, as the classic
// two-scan loop
//     i = lo, j = hi;
//     for (;;) { do ++i; while (a[i] > pivot); do --j; while (pivot > a[j]);
//                if (i >= j) break; swap(a[i], a[j]); }
// does it, same swaps and same j (so equal elements such as -0 and +0 end
// where that loop leaves them), returning j.  Between the last pair swapped
// (l, r) the scans meet only original values, and l, r themselves (holding
// swapped values) stop the opposite scan; so the stops are found in blocks
// with branch-free loops, and the next i is min(next left stop, r), the
// next j max(next right stop, l).  Blocks are clipped at r and l so that
// they read original values only.
inline int partitionDescend(float* a, int lo, int hi, float pivot) {
    constexpr int kBlock = 64;
    int lstop[kBlock], rstop[kBlock];
    int ln = 0, lk = 0, rn = 0, rk = 0;
    int lscan = lo + 1, rscan = hi - 1;  // next positions to scan
    int l = lo, r = hi;                  // last swapped pair
    for (;;) {
        while (lk == ln && lscan < r) {
            const int end = lscan + kBlock < r ? lscan + kBlock : r;
            lk = ln = 0;
            for (int p = lscan; p < end; ++p) {
                lstop[ln] = p;
                ln += !(a[p] > pivot);
            }
            lscan = end;
        }
        while (rk == rn && rscan > l) {
            const int end = rscan - kBlock > l ? rscan - kBlock : l;
            rk = rn = 0;
            for (int q = rscan; q > end; --q) {
                rstop[rn] = q;
                rn += !(pivot > a[q]);
            }
            rscan = end;
        }
        const int i = lk < ln && lstop[lk] < r ? lstop[lk] : r;
        const int j = rk < rn && rstop[rk] > l ? rstop[rk] : l;
        if (i >= j) return j;
        swapAt(a, i, j);
        l = i;
        r = j;
        ++lk;
        ++rk;
    }
}

// Descending quicksort without recursion: median-of-three pivot, the larger
// part stacked and the smaller one done first (so 32 entries cover any int
// length), short runs finished by selection sort.
void sortDescend(float* a, int n) {
    struct Range { int lo, hi; };
    Range stack[32];
    int top = 0;
    int lo = 0, hi = n - 1;
    for (;;) {
        while (hi - lo + 1 > 9) {
            const int mid = lo + (hi - lo) / 2;
            if (a[mid] > a[lo]) swapAt(a, lo, mid);
            if (a[hi] > a[mid]) {
                swapAt(a, mid, hi);
                if (a[mid] > a[lo]) swapAt(a, lo, mid);
            }
            const int j = partitionDescend(a, lo, hi, a[mid]);
            // [lo, j] holds the larger elements, [j + 1, hi] the smaller.
            if (j - lo < hi - j) {
                stack[top++] = Range{j + 1, hi};
                hi = j;
            } else {
                stack[top++] = Range{lo, j};
                lo = j + 1;
            }
        }
        // Selection sort: the smallest remaining element goes to the end.
        for (int end = hi; end > lo; --end) {
            int m = lo;
            float v = a[lo];
            for (int k = lo + 1; k <= end; ++k) {
                const float x = a[k];
                const bool smaller = x < v;  // selects, not branches: the outcome is random
                v = smaller ? x : v;
                m = smaller ? k : m;
            }
            a[m] = a[end];
            a[end] = v;
        }
        if (top == 0) break;
        --top;
        lo = stack[top].lo;
        hi = stack[top].hi;
    }
}
#endif

// ---- deinterleave -------------------------------------------------------------------

[[maybe_unused]] void deinterleave2(const int16_t* s, int16_t* d0, int16_t* d1, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    // pairs counted out per 16-byte register
    using namespace simd;
    using V = Vec<int16_t, 16>;
    for (; i + V::kLanes <= n; i += V::kLanes) {
        const int16_t* p = s + 2 * static_cast<ptrdiff_t>(i);
        const auto a = bitcast<int32_t>(load<V>(p)), b = bitcast<int32_t>(load<V>(p + V::kLanes));
        // Even elements are the low halves of the 32-bit lanes, odd ones the high.
        store(d0 + i, narrowTrunc<int16_t>(a, b));
        store(d1 + i, narrowSat<int16_t>(shr<16>(a), shr<16>(b)));
    }
#endif
    for (; i < n; ++i) {
        d0[i] = s[2 * static_cast<ptrdiff_t>(i)];
        d1[i] = s[2 * static_cast<ptrdiff_t>(i) + 1];
    }
}

}  // namespace
}}  // namespace zor::ZOR_NS
