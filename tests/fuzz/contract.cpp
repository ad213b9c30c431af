// The per-family table of the call decoder (see contract.h).
//
// Statuses: the codes each family's header comment in the manifest (and its
// checks) name, besides the common ones.  Rows for families still to land
// are given from their descriptions so far; check them when they arrive.
#include "tests/fuzz/contract.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstring>
#include <limits>

namespace zf {

const std::vector<Status> kCommonStatuses = {StatusOk, StatusNullPointer, StatusBadSize};

const std::vector<Status> kEveryStatus = {
    StatusOk, StatusBadArgument, StatusBadSize, StatusNullPointer, StatusNoMemory, StatusDivideByZero,
    StatusOutOfRange, StatusBadScaleFactor, StatusBadStep, StatusBadOrder, StatusBadFlag, StatusContextMismatch,
    StatusBadFlip, StatusBadInterpolation, StatusBadResizeFactor, StatusBadFilterOrder, StatusBadMaskSize,
    StatusBadAnchor, StatusStepBelowRow, StatusBadChannelIndex, StatusBadDivisor, StatusBadChannelOfInterest,
    StatusBadChannelCount, StatusZeroMask, StatusChannelOrder, StatusBankNotReady, StatusBadMelMode,
    StatusBadFrequencyRange, StatusBadLevelCount, StatusNotEvenStep, StatusBadStride, StatusBadMatrixShape,
    StatusWarnMisaligned, StatusWarnSqrtNegative, StatusWarnDivByZero, StatusWarnLnZero, StatusWarnLnNegative,
    StatusWarnNoOperation, StatusWarnOddSize};

bool matchesPattern(const std::string& name, const char* patterns) {
    if (!patterns) return false;
    auto glob = [](const char* p, size_t pn, const char* s) {
        // '*' matches any run; everything else literally
        const char* star = nullptr;
        const char* resume = nullptr;
        const char* end = p + pn;
        while (*s) {
            if (p < end && *p == '*') star = p++, resume = s;
            else if (p < end && *p == *s) ++p, ++s;
            else if (star) p = star + 1, s = ++resume;
            else return false;
        }
        while (p < end && *p == '*') ++p;
        return p == end;
    };
    const char* p = patterns;
    while (*p) {
        const char* bar = std::strchr(p, '|');
        const size_t n = bar ? size_t(bar - p) : std::strlen(p);
        if (glob(p, n, name.c_str())) return true;
        if (!bar) break;
        p = bar + 1;
    }
    return false;
}

const std::vector<FamilyRule>& familyRules() {
    static const std::vector<FamilyRule> rules = {
        {"frame/alloc-version", {}, {}, false, "zorsFree",
         "zorsMalloc_*|zoriMalloc_*"},
        {"image/pixel/copy", {StatusBadStep, StatusChannelOrder}},
        {"image/pixel/convert", {StatusBadStep}},
        {"image/geometry/mirror", {StatusBadFlip}},
        {"image/filter/linear", {StatusBadStep, StatusBadDivisor, StatusNoMemory}},
        {"image/filter/sobel", {StatusBadStep, StatusNotEvenStep, StatusBadArgument, StatusBadMaskSize, StatusNoMemory}},
        {"image/filter/rank", {StatusBadStep, StatusBadMaskSize, StatusBadAnchor, StatusNoMemory}},
        {"image/filter/morphology",
         {StatusBadStep, StatusStepBelowRow, StatusBadMaskSize, StatusZeroMask, StatusBadAnchor, StatusNoMemory}},
        {"image/filter/canny", {StatusBadStep, StatusNotEvenStep, StatusBadArgument}},
        {"signal/vector/init", {}},
        {"signal/vector/arith",
         {StatusDivideByZero, StatusBadScaleFactor, StatusBadChannelCount, StatusWarnMisaligned,
          StatusWarnSqrtNegative, StatusWarnLnZero, StatusWarnLnNegative}},
        {"signal/vector/stats", {}},
        {"signal/transform/window", {}},
        {"signal/transform/fft", {StatusBadOrder, StatusBadFlag, StatusContextMismatch, StatusNoMemory}},
        {"signal/transform/iir", {StatusBadFilterOrder, StatusDivideByZero, StatusContextMismatch, StatusNoMemory}},
        {"signal/transform/randgauss", {StatusContextMismatch, StatusNoMemory}},
        // The long-lag path through the spectrum needs work memory; without
        // it the direct sums run, equal to float rounding only.
        {"signal/transform/autocorr", {StatusNoMemory}, {}, true},
        {"signal/speech/melfbank",
         {StatusBadFrequencyRange, StatusBadMelMode, StatusBankNotReady, StatusNoMemory}},
        {"signal/speech/cepstral", {StatusNoMemory}},
        {"frame/adapters",
         {StatusBadStep, StatusBadMaskSize, StatusNoMemory, StatusBadStride, StatusBadMatrixShape,
          StatusDivideByZero},
         {StatusDivideByZero}},
        {"image/filter/floodfill", {StatusBadStep, StatusOutOfRange, StatusNoMemory}, {StatusNoMemory}},
        {"matrix/qr", {StatusBadStride, StatusBadMatrixShape, StatusDivideByZero}, {StatusDivideByZero}},
        {"image/stats/reductions", {StatusBadStep, StatusNotEvenStep, StatusBadChannelOfInterest}},
        {"image/stats/histogram", {StatusBadStep, StatusBadLevelCount}},
        {"image/stats/moments",
         {StatusContextMismatch, StatusBadStep, StatusStepBelowRow, StatusBadChannelIndex, StatusNoMemory}},
        {"image/pixel/arith", {StatusBadStep, StatusBadArgument}},
        {"signal/transform/dft2d",
         {StatusBadFlag, StatusContextMismatch, StatusBadStep, StatusNotEvenStep, StatusNoMemory}},
        {"image/geometry/resize",
         {StatusBadStep, StatusBadInterpolation, StatusBadResizeFactor, StatusWarnNoOperation, StatusNoMemory}},
        {"image/geometry/rotate",
         {StatusBadStep, StatusBadInterpolation, StatusWarnNoOperation, StatusNoMemory, StatusBadArgument}},
        {"image/geometry/warp",
         {StatusBadStep, StatusBadInterpolation, StatusWarnNoOperation, StatusNoMemory, StatusBadArgument}},
        // Full convolution's vector path needs work memory; without it the
        // direct sums run, with the same results.
        {"image/filter/smoothing",
         {StatusBadStep, StatusBadMaskSize, StatusBadAnchor, StatusBadArgument, StatusBadChannelCount,
          StatusBadDivisor, StatusNoMemory},
         {}, true},
        {"image/color/color", {StatusWarnOddSize}},
        {"image/color/jpeg", {StatusBadStep, StatusWarnDivByZero}},
    };
    return rules;
}

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInf = std::numeric_limits<double>::infinity();

int64_t clampCount(int64_t n) { return n < 0 ? 0 : n; }

// Elements of a vector of n that an object-made length gives; 1 when the
// object is missing or of another kind (the call fails its checks first).
int64_t fftLength(const CallView& v, const char* object) {
    const CallView* maker = v.object(object);
    if (!maker) return 1;
    const int64_t order = maker->i("order");
    return order >= 0 && order <= 30 ? int64_t(1) << order : 1;
}

int32_t objectField(const CallView& v, const char* object, size_t offset) {
    const void* p = v.objectMemory(object);
    if (!p || !v.object(object)) return 0;
    int32_t field;
    std::memcpy(&field, static_cast<const uint8_t*>(p) + offset, sizeof field);
    return field;
}

Border around(int64_t r) { return {r, r, r, r}; }

// A kernel of size k with anchor a reads k - 1 - a before and a after (the
// linear filters flip the kernel: their anchor counts from the other end).
Border neighbourhood(ImageSize k, ImagePoint a, bool flipped) {
    const int64_t w = k.width, h = k.height, x = a.x, y = a.y;
    if (flipped) return {w - 1 - x, x, h - 1 - y, y};
    return {x, w - 1 - x, y, h - 1 - y};
}

Shape strided(int64_t n, int64_t stride, int64_t elem) {
    Shape s = Shape::vector(n, elem);
    s.colStep = stride;
    return s;
}

Shape matrix(int64_t rows, int64_t cols, int64_t rowStep, int64_t colStep, int64_t elem) {
    Shape s;
    s.row1 = rows;
    s.col1 = cols;
    s.rowStep = rowStep;
    s.colStep = colStep;
    s.elemBytes = elem;
    return s;
}

// An image of w x h; one past the int range stays over every buffer limit
// (the pointer is then passed as null).
ImageSize beyondInt(int64_t w, int64_t h) {
    if (w > INT_MAX || h > INT_MAX) return ImageSize{INT_MAX, INT_MAX};
    return ImageSize{int32_t(w), int32_t(h)};
}

int64_t fbankLength(const CallView& v) {
    const CallView* maker = v.object("pFBank");
    if (!maker) return 1;
    int64_t n = 2;
    while (n < maker->i("winLen") && n < (int64_t(1) << 31)) n *= 2;
    return n + 2;  // the spectrum of a bank without a transform is shorter
}

}  // namespace

const std::vector<ParamRule>& paramRules() {
    static const std::vector<ParamRule> rules = [] {
        std::vector<ParamRule> r;
        auto add = [&r](const char* exports, const char* params) -> ParamRule& {
            r.emplace_back(exports, params);
            return r.back();
        };

        // ---- the allocators: byte counts that wrap 32 bits are left to the caller
        add("zorsMalloc_*", "len").atMost = 1 << 26;
        add("zoriMalloc_*", "width,height").atMost = 1 << 13;

        // ---- image/filter/linear: the flipped kernel reads around the ROI
        add("zoriFilter_*|zoriFilter32f_*", "pKernel").count = [](const CallView& v, int) {
            const ImageSize k = v.size("kernelSize");
            return k.width < 1 || k.height < 1 ? 0 : int64_t(k.width) * k.height;
        };
        add("zoriFilter_*|zoriFilter32f_*", "pSrc").border = [](const CallView& v) {
            return neighbourhood(v.size("kernelSize"), v.point("anchor"), true);
        };
        add("zoriFilter_*|zoriFilter32f_*", "kernelSize").hints = {1, 3, 5, 2, 4, 7, 9};
        add("zoriFilter_*|zoriFilter32f_*", "anchor").hints = {1, 0, 2, -1, 4};

        // ---- image/filter/sobel and the adapters over it
        add("zoriFilterSobelHoriz_8u_C1R|zoriFilterSobelHoriz_32f_C1R|zoriFilterSobelVert_32f_C1R|zoriSobel3x3_*",
            "pSrc")
            .border = [](const CallView&) { return around(1); };
        add("zoriFilterSobel*Mask_32f_C1R", "pSrc").border = [](const CallView& v) {
            return around(v.i("mask") == MaskSize3x3 ? 1 : 2);
        };
        add("zoriFilterSobelHoriz_8u16s_C1R|zoriFilterSobelVert_8u16s_C1R", "pSrc").border = [](const CallView& v) {
            return around(v.i("mask") == MaskSize5x5 ? 2 : 1);
        };
        add("zoriFilterSobel*Border_8u16s_C1R", "pBuffer").count = [](const CallView& v, int) {
            const int64_t n = v.companion("zoriFilterSobelHorizGetBufferSize_8u16s_C1R");
            return n < 0 ? 64 : n;
        };
        add("zoriFilterSobel*Border_32f_C1R", "pBuffer").count = [](const CallView& v, int) {
            const int64_t n = v.companion("zoriFilterSobelHorizGetBufferSize_32f_C1R");
            return n < 0 ? 64 : n;
        };

        // ---- image/filter/rank and morphology: the mask reads around the ROI
        add("zoriFilterMedian_*|zoriFilterMax_*|zoriFilterMin_*", "pSrc").border = [](const CallView& v) {
            return neighbourhood(v.size("maskSize"), v.point("anchor"), false);
        };
        add("zoriDilate3x3_*|zoriErode3x3_*", "pSrcDst").border = [](const CallView&) { return around(1); };
        add("zoriDilate_8u_C1IR|zoriErode_8u_C1IR", "pSrcDst").border = [](const CallView& v) {
            return neighbourhood(v.size("maskSize"), v.point("anchor"), false);
        };
        add("zoriDilate_8u_C1IR|zoriErode_8u_C1IR", "pMask").count = [](const CallView& v, int) {
            const ImageSize m = v.size("maskSize");
            return m.width < 1 || m.height < 1 ? 0 : int64_t(m.width) * m.height;
        };
        add("zoriFilterMedian_*|zoriFilterMax_*|zoriFilterMin_*|zoriDilate_*|zoriErode_*", "maskSize").hints =
            {3, 5, 1, 2, 4, 7};
        add("zoriFilterMedian_*|zoriFilterMax_*|zoriFilterMin_*|zoriDilate_*|zoriErode_*", "anchor").hints =
            {1, 0, 2, 3, -1};

        // ---- image/filter/canny: clears whole destination rows, up to the step
        add("zoriCanny_16s8u_C1R", "pBuffer").count = [](const CallView& v, int) {
            const int64_t n = v.companion("zoriCannyGetSize");
            return n < 0 ? 64 : n;
        };
        add("zoriCanny_16s8u_C1R", "pDstEdges").spansStep = true;
        add("zoriCanny_16s8u_C1R", "lowThreshold").hints = {10, 0, 10.9, 100, -1, kNaN};
        add("zoriCanny_16s8u_C1R", "highThreshold").hints = {50, 10, 5, 1e9, kInf, kNaN};

        // ---- image/filter/floodfill: the caller's buffer of the published size
        add("zoriFloodFill_4Con_8u_C1IR", "pBuffer").count = [](const CallView& v, int) {
            const int64_t n = v.companion("zoriFloodFillGetSize");
            return n < 0 ? 64 : n;
        };
        add("zoriFloodFill_Grad*", "pBuffer").count = [](const CallView& v, int) {
            const int64_t n = v.companion("zoriFloodFillGetSize_Grad");
            return n < 0 ? 64 : n;
        };
        add("zoriFloodFill_*", "seed").hints = {0, 1, 2, 3, 5, 8, -1};
        add("zoriFloodFill_*", "minDelta,maxDelta").hints = {0, 1, 2, 5, 20, 255};

        // ---- image/stats
        add("zoriMinMaxIndx_16u_C3CR", "pMinVal,pMaxVal,pMinIndex,pMaxIndex").nonNull = true;  // not checked
        add("zoriHistogramRange_8u_C1R|zoriHistogramRange_32f_C1R", "pHist").count = [](const CallView& v, int) {
            return clampCount(v.i("nLevels") - 1);
        };
        add("zoriHistogramRange_8u_C1R|zoriHistogramRange_32f_C1R", "pLevels").count = [](const CallView& v, int) {
            return clampCount(v.i("nLevels"));
        };
        // Levels out of order are counted by a scan of every bin per pixel:
        // bounded, so that a call's time stays within the smoke's budget.
        add("zoriHistogramRange_*", "nLevels").atMost = 1024;
        add("zoriHistogramRange_8u_C3R", "pHist").count = [](const CallView& v, int c) {
            return clampCount(v.value("nLevels", c) - 1);
        };
        add("zoriHistogramRange_8u_C3R", "pLevels").count = [](const CallView& v, int c) {
            return clampCount(v.value("nLevels", c));
        };

        // ---- signal/vector
        add("zorsDeinterleave_16s", "pSrc").count = [](const CallView& v, int) {
            return clampCount(v.i("channels")) * clampCount(v.i("len"));
        };
        add("zorsDeinterleave_16s", "pDst").planes = [](const CallView& v, int) { return v.i("channels"); };

        // ---- signal/transform/fft: lengths from the spec
        add("zorsFFTFwd_CToC_32f|zorsFFTInv_CToC_32f", "pSrcRe,pSrcIm,pDstRe,pDstIm").count =
            [](const CallView& v, int) { return fftLength(v, "pSpec"); };
        add("zorsFFTFwd_RToCCS_32f", "pSrc").count = [](const CallView& v, int) { return fftLength(v, "pSpec"); };
        add("zorsFFTFwd_RToCCS_32f", "pDst").count = [](const CallView& v, int) {
            return fftLength(v, "pSpec") + 2;
        };
        add("zorsFFTFwd_*|zorsFFTInv_*", "pBuffer").count = [](const CallView& v, int) {
            return int64_t(std::max(objectField(v, "pSpec", 24), 0));  // the spec's bufferSize
        };

        // ---- signal/transform/dft2d: image sizes from the spec
        add("zoriDFTFwd_*|zoriDFTInv_*", "pSrc,pDst").extent = [](const CallView& v) {
            const CallView* maker = v.object("pSpec");
            return maker ? maker->size("roiSize") : ImageSize{1, 1};
        };
        add("zoriDFTFwd_*|zoriDFTInv_*", "pBuffer").count = [](const CallView& v, int) {
            return int64_t(std::max(objectField(v, "pSpec", 28), 0));  // the record's bufferSize
        };
        add("zoriDFTInitAlloc_R_32f", "roiSize").hints = {8, 1, 2, 3, 5, 16, 31, 37, 64, 1 << 20, 1 << 30};

        // ---- signal/transform/iir
        add("zorsIIRInitAlloc_32f", "pTaps").count = [](const CallView& v, int) {
            return v.i("order") < 1 ? 2 : 2 * v.i("order") + 2;
        };
        add("zorsIIRInitAlloc_32f", "pDlyLine").count = [](const CallView& v, int) { return clampCount(v.i("order")); };
        add("zorsIIRInitAlloc_32f", "order").hints = {1, 2, 3, 4, 8, 0, -1, 100};

        // ---- signal/speech
        add("zorsEvalFBank_32f", "pSrc").count = [](const CallView& v, int) { return fbankLength(v); };
        add("zorsEvalFBank_32f", "pDst").count = [](const CallView& v, int) {
            const CallView* maker = v.object("pFBank");
            return maker ? clampCount(maker->i("nFilter")) : 1;
        };
        add("zorsMelFBankInitAlloc_32f", "winLen").hints = {256, 400, 1, 2, 512, 1 << 20, 1 << 30, INT_MAX};
        add("zorsMelFBankInitAlloc_32f", "sampFreq").hints = {16000, 8000, 1, 0, -1, kNaN, 1e30};
        add("zorsMelFBankInitAlloc_32f", "lowFreq").hints = {100, 64, 1, 0, 1e-30, kNaN};
        add("zorsMelFBankInitAlloc_32f", "highFreq").hints = {8000, 4000, 3999.9, 100, 7999, kNaN, kInf};
        add("zorsMelFBankInitAlloc_32f", "nFilter").hints = {24, 1, 40, 2, 0, 1 << 20, INT_MAX};
        add("zorsMelFBankInitAlloc_32f", "melMul").hints = {2595, 1127, 1, 0, -1, kNaN};
        add("zorsMelFBankInitAlloc_32f", "melDiv").hints = {700, 1, 0, -700, kNaN};
        add("zorsDCTLifter_32f", "pSrc").count = [](const CallView& v, int) {
            const CallView* maker = v.object("pDCTLifter");
            return maker ? clampCount(maker->i("lenDCT")) : 1;
        };
        add("zorsDCTLifter_32f", "pDst").count = [](const CallView& v, int) {
            const CallView* maker = v.object("pDCTLifter");
            return maker ? clampCount(maker->i("lenCeps")) + 1 : 1;  // room for c0
        };
        add("zorsDCTLifterInitAlloc_32f", "lenDCT").hints = {24, 13, 1, 2, 100, 1 << 15, INT_MAX};
        add("zorsDCTLifterInitAlloc_32f", "lenCeps").hints = {13, 12, 1, 24, 1 << 15, INT_MAX};
        add("zorsDCTLifterInitAlloc_32f", "nLifter").hints = {22, 1, 0, 2, -1, INT_MAX};
        add("zorsNormEnergy_32f", "step").role = Role::Count;  // elements between frame energies
        add("zorsNormEnergy_32f", "pSrcDst").count = [](const CallView& v, int) {
            return v.i("step") < 1 || v.i("height") < 1 ? 0 : (v.i("height") - 1) * v.i("step") + 1;
        };
        // Lags are not checked: the source holds len + upperLag samples, lags from 0.
        add("zorsAutoCorrLagMax_Fwd_16s", "pSrc").count = [](const CallView& v, int) {
            return clampCount(v.i("len")) + clampCount(v.i("upperLag"));
        };
        {
            ParamRule& lag = add("zorsAutoCorrLagMax_Fwd_16s", "lowerLag,upperLag");
            lag.atLeast = 0;
            lag.hints = {0, 1, 2, 5, 20, 100};
        }

        // ---- matrix/qr and its 3 x 3 adapters
        add("zormQRDecomp_m_64f|zormQRBackSubst_mv_64f", "pBuffer").count = [](const CallView& v, int) {
            return clampCount(v.i("height"));
        };
        add("zormQRBackSubst_mv_64f", "pSrc2").shape = [](const CallView& v, int) {
            return strided(clampCount(v.i("height")), v.i("src2Stride2"), 8);
        };
        add("zormQRBackSubst_mv_64f", "pDst").shape = [](const CallView& v, int) {
            return strided(clampCount(v.i("width")), v.i("dstStride2"), 8);
        };
        add("zormQRDecomp_m_64f_3x3", "pSrc").shape = [](const CallView& v, int) {
            return matrix(3, 3, v.i("srcStride1"), 8, 8);
        };
        add("zormQRDecomp_m_64f_3x3", "pDst").shape = [](const CallView& v, int) {
            return matrix(3, 3, v.i("dstStride1"), 8, 8);
        };
        add("zormQRBackSubst_mv_64f_3x3", "pSrc").shape = [](const CallView& v, int) {
            return matrix(3, 3, v.i("srcStride1"), 8, 8);
        };
        add("zormQR*_3x3", "pBuffer,pSrc2,pDst").count = [](const CallView&, int) { return int64_t(3); };
        // ---- image/geometry/resize
        add("zoriResize_*|zoriResizeShift_*|zoriResizeCenter_*", "interpolation").hints = {1, 2, 4, 8, 16, 0, 3, -1};
        add("zoriResize_*|zoriGetResizeFract|zoriResizeCenter_*", "xFactor,yFactor").hints =
            {0.5, 2, 1, 0.25, 0.3, 1.7, 3, 1e-9, 1e9, 0, -1, kNaN, kInf};
        add("zoriResizeShift_*", "xFr,yFr").hints = {0.5, 2, 1, 0, 0.3, 3, -1, kNaN, kInf};
        // The 8u exports read the row after the image in super-sampling an
        // odd ROI height; where that row cannot be read they resize from a
        // copy whose allocation is not checked (and where srcStep is below
        // the row's bytes they read it anyway).  The decoder therefore always
        // gives a super-sampled 8u source one readable row (of srcStep bytes)
        // below the image: the unchecked copy is never asked for, so no
        // refused allocation can reach it.
        {
            ParamRule& guard = add("zoriResize_8u_*|zoriResizeShift_8u_*|zoriResizeCenter_8u_*", "pSrc");
            guard.border = [](const CallView& v) {
                return Border{0, 0, 0, v.i("interpolation") == InterSuper ? 1 : 0};
            };
            guard.spansStep = true;
        }
        // With the marker file present at load, zoriResize_8u_C3R's
        // SSE2-and-up entries take the alternate super-sampling, which
        // checks no argument and keeps 16-bit span indices: sides beyond
        // 65534 pixels are outside its contract, so none are drawn.
        add("zoriResize_8u_C3R", "srcSize,srcRoi,dstRoiSize").atMost = 65534;

        // ---- image/geometry/rotate and warp: pDst is the image origin, dstRoi
        // a rectangle in it (clipped to x >= 0, y >= 0)
        add("zoriRotate*|zoriWarp*", "pDst").extent = [](const CallView& v) {
            const ImageRect r = v.rect("dstRoi");
            const int64_t w = int64_t(r.x) + r.width, h = int64_t(r.y) + r.height;
            if (r.width < 1 || r.height < 1 || w < 1 || h < 1) return ImageSize{0, 0};  // nothing to write
            return beyondInt(w, h);
        };
        add("zoriRotate*|zoriWarp*", "interpolation").hints = {1, 2, 4, 0, 3, 8, -1};
        add("zoriRotate*|zoriGetRotate*|zoriAddRotate*", "angle").hints = {30, 0, 90, 180, 270, -90, 45, 720.5,
                                                                          kNaN, kInf};
        add("zoriWarp*|zoriGetAffineBound", "coeffs").hints = {1, 0, 0, 1, 2, -1, 3, 5, 100};
        add("zoriGet*Transform", "quad").hints = {0, 10, 20, 1, 5, 30, -3, 100};

        // ---- image/filter/smoothing: neighbourhoods read around the ROI
        add("zoriFilterBox_*|zoriFilterWiener_*", "pSrc").border = [](const CallView& v) {
            return neighbourhood(v.size("maskSize"), v.point("anchor"), false);
        };
        add("zoriFilterGauss_*|zoriFilterLowpass_*|zoriFilterHipass_*", "pSrc").border = [](const CallView& v) {
            return around(v.i("mask") == MaskSize5x5 ? 2 : 1);
        };
        add("zoriFilterBox_*|zoriFilterWiener*", "maskSize").hints = {3, 5, 1, 2, 4, 7, 0, -1};
        add("zoriFilterBox_*|zoriFilterWiener*", "anchor").hints = {1, 0, 2, 3, -1};
        add("zoriFilterWiener_8u_C1R", "pBuffer").count = [](const CallView& v, int) {
            const int64_t n = v.companion("zoriFilterWienerGetBufferSize");
            return n < 0 ? 64 : n;
        };
        add("zoriConvFull_*", "pDst").extent = [](const CallView& v) {
            const ImageSize a = v.size("src1Size"), b = v.size("src2Size");
            const int64_t w = int64_t(a.width) + b.width - 1, h = int64_t(a.height) + b.height - 1;
            if (a.width < 1 || a.height < 1 || b.width < 1 || b.height < 1) return ImageSize{0, 0};
            return beyondInt(w, h);
        };

        // ---- image/color: 4:2:0 planes, each with its own step (steps are
        // not checked: any value is used as given, and the planes are laid
        // out for it)
        auto plane420 = [](const char* steps) {
            return [steps](const CallView& v, int plane) {
                const ImageSize roi = v.size("roiSize");
                Shape s;
                if (roi.width < 1 || roi.height < 1) return Shape::vector(0, 1);
                const int64_t w = plane <= 0 ? roi.width : (int64_t(roi.width) + 1) / 2;
                const int64_t h = plane <= 0 ? roi.height : (int64_t(roi.height) + 1) / 2;
                s.row1 = h;
                s.col1 = w;
                s.rowStep = v.value(steps, plane < 0 ? 0 : plane);
                s.colStep = s.elemBytes = 1;
                return s;
            };
        };
        add("zoriBGRToYCbCr420_8u_C3P3R", "pDst").shape = plane420("dstStep");
        add("zoriYCbCr420ToBGR_8u_P3C3R", "pSrc").shape = plane420("srcStep");
        add("zoriBGRToYCbCr420_8u_C3P3R|zoriYCbCr420ToBGR_8u_P3C3R", "srcStep,dstStep").hints =
            {16, 8, 32, 64, 7, 1, 0, -16, 3000};
        add("zoriColorToGray_*", "coeffs").hints = {0, 1, 2, -1, 4096, 100000};

        // ---- image/color/jpeg: fixed blocks and tables
        add("zoriSampleDownH2V2_JPEG_8u_C1R", "pSrc").extent = [](const CallView& v) {
            // the destination size governs the loop: 2 x 2 source pixels each
            const ImageSize s = v.size("srcRoiSize"), d = v.size("dstRoiSize");
            const int64_t w = std::max<int64_t>(s.width, 2 * int64_t(d.width));
            const int64_t h = std::max<int64_t>(s.height, 2 * int64_t(d.height));
            return beyondInt(w, h);
        };
        add("zoriBGRToYCbCr422LS_MCU_8u16s_C3P3R", "pSrc").extent = [](const CallView&) {
            return ImageSize{16, 8};
        };
        add("zoriJoin422LS_MCU_16s8u_P3C2R", "pDst").extent = [](const CallView&) { return ImageSize{16, 8}; };
        add("zoriBGRToYCbCr422LS_MCU_8u16s_C3P3R|zoriJoin422LS_MCU_16s8u_P3C2R", "pDstMCU,pSrcMCU").count =
            [](const CallView&, int plane) { return int64_t(plane == 0 ? 128 : 64); };
        add("zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R", "pSrc").extent = [](const CallView&) { return ImageSize{8, 8}; };
        add("zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R", "pDst").extent = [](const CallView&) { return ImageSize{8, 8}; };
        add("zoriDCTQuant*|zoriQuantFwdTableInit_JPEG_8u16u",
            "pDst,pSrc,pQuantFwdTable,pQuantInvTable,pQuantRawTable")
            .count = [](const CallView&, int) { return int64_t(64); };
        return r;
    }();
    return rules;
}

const std::vector<ObjectKind>& objectKinds() {
    static const std::vector<ObjectKind> kinds = {
        {"FFT complex spec", "zorsFFTInitAlloc_C_32f", "zorsFFTFree_C_32f", "zorsFFTFwd_CToC_32f|zorsFFTInv_CToC_32f", true},
        {"FFT real spec", "zorsFFTInitAlloc_R_32f", "zorsFFTFree_R_32f", "zorsFFTFwd_RToCCS_32f", true},
        {"image DFT spec", "zoriDFTInitAlloc_R_32f", "zoriDFTFree_R_32f",
         "zoriDFTFwd_RToPack_32f_C1R|zoriDFTInv_PackToR_32f_C1R", true},
        {"IIR state", "zorsIIRInitAlloc_32f", "zorsIIRFree_32f", "zorsIIR_32f", true},
        {"Gaussian generator", "zorsRandGaussInitAlloc_32f", "zorsRandGaussFree_32f", "zorsRandGauss_32f", true},
        {"moment state", "zoriMomentInitAlloc_64f", "zoriMomentFree_64f",
         "zoriMoments64f_32f_C1R|zoriGetSpatialMoment_64f", true},
        // No identifier: a misused pointer goes undetected, so only banks
        // and lifters made for them are passed.
        {"mel filter bank", "zorsMelFBankInitAlloc_32f", "zorsFBankFree_32f", "zorsEvalFBank_32f", false},
        {"DCT lifter", "zorsDCTLifterInitAlloc_32f", "zorsDCTLifterFree_32f", "zorsDCTLifter_32f", false},
    };
    return kinds;
}

const std::map<std::string, std::vector<double>>& nameHints() {
    static const std::map<std::string, std::vector<double>> hints = {
        {"mask", {MaskSize3x3, MaskSize5x5, 44, 0, 35, 53, 3}},
        {"flip", {0, 1, 2, 3, -1}},
        {"borderType", {0, 1, 2, 3, 4, 5, -1}},
        {"flag", {8, 1, 2, 4, 0, 3, 16}},
        {"hint", {0, 1, 2, -1}},
        {"order", {4, 0, 1, 2, 3, 5, 8, 10, 11, 12, 13, 16, 20, 30, 31, -1}},
        {"scaleFactor", {0, 1, 2, -1, -2, 3, 7, 8, 15, 16, 17, 31, 32, 33, 63, 64, -7, -8, -15, -16, -31, -32,
                         INT_MIN, INT_MAX}},
        {"rndMode", {RoundNear, RoundZero, 2, -1, 7}},
        {"roundMode", {1, 0, 2, -1}},
        {"cmpOp", {CmpLess, CmpLessEq, CmpEq, CmpGreaterEq, CmpGreater, 5, -1}},
        {"relOp", {CmpLess, CmpGreater, CmpEq, 5, -1}},
        {"alphaType", {AlphaOver, AlphaIn, AlphaOut, AlphaATop, AlphaXor, AlphaPlus, 6, -1}},
        {"coi", {1, 2, 3, 0, 4, -1}},
        {"divisor", {1, 2, 4, 3, 0, -1, -2, INT_MIN, 256, 7, 1 << 30}},
        {"channels", {2, 1, 3, 4, 8, 0, -1}},
        {"mode", {1, 2, 5, 6, 0, 3, 4, 8}},
        {"nLevels", {2, 3, 5, 17, 257, 256, 1, 0, -1}},
        {"dstOrder", {0, 1, 2, 3, -1}},
        {"value", {0, 1, 2, 15, 16, 255}},
        {"centerWeight", {0, 128, 255, 256, 257}},
        {"layout", {0, 1}},
        {"nChannel", {0, 1, -1, 2}},
        {"mOrd", {0, 1, 2, 3, 4, -1}},
        {"nOrd", {0, 1, 2, 3, 4, -1}},
        {"topBorderHeight", {0, 1, 2, 3}},
        {"leftBorderWidth", {0, 1, 2, 3}},
        {"val", {0.97, 1, 0, -1, 0.5, 2}},
        {"vDiv", {1, 2, 0, 1e-39, -3}},
        {"level", {0, 1, -1, 0.5}},
        {"stdDev", {1, 0, -1, 1e30}},
    };
    return hints;
}

}  // namespace zf
