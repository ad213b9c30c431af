// Mel filter bank: triangular filters evenly spaced on the mel scale,
// optionally fed through the bank's own real FFT and magnitude.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "signal/transform/fft_internal.h"

#include <cmath>
#include <cstdint>
#include <cstring>

// The vector conversions and magnitudes have no SSE-only entry: that
// column runs their generic code.  The wide columns call the SSSE3 ones
// (same bits; only the bank's own transform is wide).
#if !ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
#  define ZOR_ENTRY_NS v0
#  include "frame/entries.h"
#elif ZOR_VARIANT >= 5
#  define ZOR_ENTRY_NS v4
#  include "frame/entries.h"
#endif

namespace zor { namespace ZOR_NS {
namespace {

constexpr int kMelWeights = 1;
constexpr int kFreqWeights = 2;
constexpr int kSpectrum = 4;
constexpr int kRoundZero = 0;
constexpr int kRoundNear = 1;

#if !ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
namespace vec = zor::v0;
#elif ZOR_VARIANT >= 5
namespace vec = zor::v4;
#else
namespace vec = zor::ZOR_NS;
#endif

struct FBank {
    int32_t* bins;         // nFilter + 2 triangle corners
    float* lowWeights;     // rising sides, filter after filter
    float* highWeights;    // falling sides
    int32_t mode;
    int32_t fftLen;
    int32_t fftOrder;
    int32_t nFilter;
    int32_t capacity;
    float melMul;
    float melDiv;
    uint8_t initialised;
    void* fftSpec;
    float* spectrum;       // fftLen + 2 floats
    // where each filter's rows start in the weight tables
    int32_t* lowStart;
    int32_t* highStart;
};

void release(FBank* b) {
    if (!b) return;
    mem::alignedFree(b->bins);  // holds the row starts too
    mem::alignedFree(b->lowWeights);
    mem::alignedFree(b->highWeights);
    mem::alignedFree(b->spectrum);
    if (b->fftSpec) zorsFFTFree_R_32f(b->fftSpec);
    mem::alignedFree(b);
}

template <class T>
T* allocArray(int64_t count) {
    const int64_t bytes = count * static_cast<int64_t>(sizeof(T));
    if (bytes <= 0 || bytes > 0x7FFFFFFF) return nullptr;
    return static_cast<T*>(mem::alignedAlloc(static_cast<uint32_t>(bytes)));
}

// melMul ln(1 + f / melDiv), rounded to float
float melOf(double f, double melMul, double melDiv) {
    return toFloat(melMul * std::log(toDouble(1.0 + f / melDiv)));
}

Status build(FBank* b, float sampFreq, float lowFreq, float highFreq) {
    const int nf = b->nFilter;
    const double mul = b->melMul, div = b->melDiv;
    const float melLow = melOf(lowFreq, mul, div);
    const float melHigh = melOf(highFreq, mul, div);
    const double diff = toFloat(double(melHigh) - double(melLow));
    const double parts = static_cast<float>(nf + 1);
    const double toBin = toDouble(toDouble(double(b->fftLen) / double(sampFreq)) * div);

    // centre mels and their bin positions
    float* centre = allocArray<float>(nf + 2);
    float* pos = allocArray<float>(nf + 2);
    if (!centre || !pos) {
        mem::alignedFree(centre);
        mem::alignedFree(pos);
        return StatusNoMemory;
    }
    for (int k = 0; k < nf + 2; ++k) {
        centre[k] = toFloat(toDouble(k * diff) / parts + double(melLow));
        const float e = toFloat(std::exp(double(centre[k]) / mul) - 1.0);
        pos[k] = toFloat(toBin * double(e));
    }
    const bool melMode = (b->mode & 3) == kMelWeights;
    vec::zorsConvert_32f32s_Sfs(pos, b->bins, nf + 2, melMode ? kRoundZero : kRoundNear, 0);
    mem::alignedFree(pos);

    // Corners must be usable bins, in order (NaN frequencies or constants
    // pass the argument checks but give none).
    const int32_t* bins = b->bins;
    for (int k = 0; k < nf + 2; ++k)
        if (bins[k] < 0 || bins[k] > b->fftLen / 2 || (k > 0 && bins[k] < bins[k - 1])) {
            mem::alignedFree(centre);
            return StatusBadFrequencyRange;
        }

    int64_t lowTotal = 0, highTotal = 0;
    for (int k = 1; k <= nf; ++k) {
        b->lowStart[k - 1] = static_cast<int32_t>(lowTotal);
        b->highStart[k - 1] = static_cast<int32_t>(highTotal);
        lowTotal += bins[k] - bins[k - 1] + 1;
        highTotal += bins[k + 1] - bins[k];
    }
    // Weight tables past 2 GiB (windows near 2^30 samples) could never be
    // held by a 32-bit process; refuse them at once rather than fill them.
    if ((lowTotal + highTotal) * int64_t(sizeof(float)) > INT32_MAX) {
        mem::alignedFree(centre);
        return StatusNoMemory;
    }
    b->lowWeights = allocArray<float>(lowTotal);
    b->highWeights = allocArray<float>(highTotal > 0 ? highTotal : 1);
    if (!b->lowWeights || !b->highWeights) {
        mem::alignedFree(centre);
        return StatusNoMemory;
    }
    for (int k = 1; k <= nf; ++k) {
        const int a = bins[k - 1], c = bins[k], e = bins[k + 1];
        float* low = b->lowWeights + b->lowStart[k - 1];
        float* high = b->highWeights + b->highStart[k - 1];
        if (melMode) {
            const double m0 = centre[k - 1], m1 = centre[k], m2 = centre[k + 1];
            auto melBin = [&](int i) {
                return double(melOf(double(i) * double(sampFreq) / double(b->fftLen), mul, div));
            };
            low[0] = 0.0f;
            for (int i = a + 1; i <= c; ++i) low[i - a] = toFloat((melBin(i) - m0) / toDouble(m1 - m0));
            for (int i = c + 1; i <= e; ++i) high[i - c - 1] = toFloat((m2 - melBin(i)) / toDouble(m2 - m1));
        } else {
            for (int i = a; i <= c; ++i) low[i - a] = toFloat(double(i - a + 1) / double(c - a + 1));
            for (int i = c + 1; i <= e; ++i) high[i - c - 1] = toFloat(double(e + 1 - i) / double(e - c + 1));
        }
    }
    mem::alignedFree(centre);
    b->initialised = 1;
    return StatusOk;
}

// acc + w s in float arithmetic (the x87 unit rounds through stores)
inline float macFloat(float acc, float w, float s) {
#if ZOR_X87_MATH
    return toFloat(double(acc) + double(toFloat(double(w) * double(s))));
#else
    return acc + w * s;
#endif
}

}  // namespace

Status ZOR_CALL zorsMelFBankInitAlloc_32f(void** ppFBank, int* pFFTOrder, int winLen, float sampFreq,
                                          float lowFreq, float highFreq, int nFilter, float melMul,
                                          float melDiv, int mode) {
    if (Status s = anyNull(ppFBank, pFFTOrder)) return s;
    if (winLen <= 0 || nFilter <= 0 || sampFreq <= 0 || lowFreq <= 0) return StatusBadSize;
    if (highFreq < lowFreq || highFreq > sampFreq / 2) return StatusBadFrequencyRange;
    const int weights = mode & ~kSpectrum;
    if (weights != kMelWeights && weights != kFreqWeights) return StatusBadMelMode;
    int64_t fftLen = 2;
    int fftOrder = 1;
    while (fftLen < winLen) {
        fftLen *= 2;
        ++fftOrder;
    }
    if (fftOrder > 30) return StatusNoMemory;  // no transform of that length can exist

    FBank* b = allocArray<FBank>(1);
    if (!b) return StatusNoMemory;
    std::memset(b, 0, sizeof(FBank));
    b->mode = mode;
    b->fftLen = static_cast<int32_t>(fftLen);
    b->fftOrder = fftOrder;
    b->nFilter = b->capacity = nFilter;
    b->melMul = melMul;
    b->melDiv = melDiv;
    b->bins = allocArray<int32_t>(int64_t(nFilter) + 2 + 2 * int64_t(nFilter));
    Status st = b->bins ? StatusOk : StatusNoMemory;
    if (st == StatusOk) {
        b->lowStart = b->bins + nFilter + 2;
        b->highStart = b->lowStart + nFilter;
        if (mode & kSpectrum) {
            b->spectrum = allocArray<float>(fftLen + 2);
            if (!b->spectrum) st = StatusNoMemory;
            else st = zorsFFTInitAlloc_R_32f(&b->fftSpec, fftOrder, 8, 2);
        }
    }
    if (st == StatusOk) {
        DoublePrecisionScope precision;
        st = build(b, sampFreq, lowFreq, highFreq);
    }
    if (st != StatusOk) {
        release(b);
        return st;
    }
    *pFFTOrder = fftOrder;
    *ppFBank = b;
    return StatusOk;
}

Status ZOR_CALL zorsEvalFBank_32f(const float* pSrc, float* pDst, void* pFBank) {
    if (Status s = anyNull(pSrc, pDst, pFBank)) return s;
    FBank* b = static_cast<FBank*>(pFBank);
    if (!b->bins) return StatusNullPointer;
    if (!b->initialised) return StatusBankNotReady;
    const float* s = pSrc;
    if (b->mode & kSpectrum) {
        // The transform writes every one of the fftLen + 2 floats; the
        // magnitudes then replace the bins in place.
        // Lengths up to 1024 take the transform's own magnitudes, without
        // the CCS round trip through memory; same values.
        if (!realTransformMagnitudes(b->fftSpec, pSrc, b->spectrum)) {
            if (Status st = zorsFFTFwd_RToCCS_32f(pSrc, b->spectrum, b->fftSpec, nullptr)) return st;
            vec::zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(b->spectrum), b->spectrum,
                                    b->fftLen / 2 + 1);
        }
        s = b->spectrum;
    }
    // The rising and falling sums of a filter are independent chains: run
    // them side by side, each still in increasing i.
    const int32_t* bins = b->bins;
    for (int k = 1; k <= b->nFilter; ++k) {
        const int a = bins[k - 1], c = bins[k], e = bins[k + 1];
        const float* low = b->lowWeights + b->lowStart[k - 1];
        const float* high = b->highWeights + b->highStart[k - 1];
        const float* sl = s + a;
        const float* sh = s + c + 1;
        const int nl = c - a + 1, nh = e - c;
        const int both = nl < nh ? nl : nh;
        float rise = 0.0f, fall = 0.0f;
        int i = 0;
        for (; i < both; ++i) {
            rise = macFloat(rise, low[i], sl[i]);
            fall = macFloat(fall, high[i], sh[i]);
        }
        for (int j = i; j < nl; ++j) rise = macFloat(rise, low[j], sl[j]);
        for (int j = i; j < nh; ++j) fall = macFloat(fall, high[j], sh[j]);
        pDst[k - 1] = toFloat(double(rise) + double(fall));
    }
    return StatusOk;
}

Status ZOR_CALL zorsFBankFree_32f(void* pFBank) {
    if (!pFBank) return StatusNullPointer;
    release(static_cast<FBank*>(pFBank));
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
