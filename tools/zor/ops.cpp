// Library pipelines that the commands and the demo share.  Everything here
// is a chain of zor exports; the tool adds only buffers and bookkeeping.
#include <algorithm>
#include <cmath>
#include <memory>

#include "tools/zor/tool.h"

namespace ztool {
namespace {

// Releases a library object when the scope ends.
struct Owned {
    void* p = nullptr;
    Status (*release)(void*) = nullptr;
    ~Owned() {
        if (p) release(p);
    }
};

}  // namespace

Image toGrey(const Image& img) {
    if (img.channels == 1) return img;
    const Image rgb = toRgb(img);
    Image grey(img.width, img.height, 1);
    ZT_CALL(zoriRGBToGray_8u_C3C1R(rgb.px.data(), rgb.step(), grey.px.data(), grey.step(), img.size()));
    return grey;
}

Image toRgb(const Image& img) {
    if (img.channels == 3) return img;
    Image rgb(img.width, img.height, 3);
    if (img.channels == 1)
        ZT_CALL(zoriDup_8u_C1C3R(img.px.data(), img.step(), rgb.px.data(), rgb.step(), img.size()));
    else
        ZT_CALL(zoriCopy_8u_AC4C3R(img.px.data(), img.step(), rgb.px.data(), rgb.step(), img.size()));
    return rgb;
}

Image padReplicate(const Image& img, int border) {
    Image out(img.width + 2 * border, img.height + 2 * border, img.channels);
    if (img.channels == 1)
        ZT_CALL(zoriCopyReplicateBorder_8u_C1R(img.px.data(), img.step(), img.size(), out.px.data(), out.step(),
                                               out.size(), border, border));
    else if (img.channels == 3)
        ZT_CALL(zoriCopyReplicateBorder_8u_C3R(img.px.data(), img.step(), img.size(), out.px.data(), out.step(),
                                               out.size(), border, border));
    else
        throw UserError("cannot pad a " + std::to_string(img.channels) + "-channel image");
    return out;
}

Gradient sobel(const Image& grey, int mask) {
    const int border = mask == MaskSize5x5 ? 2 : 1;
    const Image padded = padReplicate(grey, border);
    const uint8_t* roi = padded.px.data() + border * padded.step() + border;
    Gradient g;
    g.width = grey.width;
    g.height = grey.height;
    const int n = grey.width * grey.height;
    g.dx.resize(n);
    g.dy.resize(n);
    const int step = 2 * grey.width;
    ZT_CALL(zoriFilterSobelVert_8u16s_C1R(roi, padded.step(), g.dx.data(), step, grey.size(), mask));
    ZT_CALL(zoriFilterSobelHoriz_8u16s_C1R(roi, padded.step(), g.dy.data(), step, grey.size(), mask));
    // The Vert filter gives left minus right; Canny's direction classes are
    // those of right minus left (with dy = lower minus upper, which the Horiz
    // filter gives).  Negating dx keeps |dx| and restores the sign of the
    // product dx * dy that tells the two diagonals apart.
    ZT_CALL(zorsMulC_NR_16s_ISfs(-1, g.dx.data(), n, 0));
    return g;
}

Image gradientMagnitude(const Gradient& g, int mask) {
    const int n = g.width * g.height;
    std::vector<int16_t> ax(n), ay(n), sum(n);
    std::vector<float> f(n);
    ZT_CALL(zorsAbs_16s(g.dx.data(), ax.data(), n));
    ZT_CALL(zorsAbs_16s(g.dy.data(), ay.data(), n));
    // |dx| + |dy| of a 3x3 mask reaches 2040, of a 5x5 one 24480: scale by
    // 1/4 or 1/32 and let the conversion saturate the strongest edges.
    ZT_CALL(zorsAdd_16s_Sfs(ax.data(), ay.data(), sum.data(), n, mask == MaskSize5x5 ? 5 : 2));
    ZT_CALL(zorsConvert_16s32f(sum.data(), f.data(), n));
    Image out(g.width, g.height, 1);
    ZT_CALL(zorsConvert_32f8u_Sfs(f.data(), out.px.data(), n, RoundNear, 0));
    return out;
}

Image canny(const Gradient& g, float low, float high) {
    const ImageSize size{g.width, g.height};
    int bytes = 0;
    ZT_CALL(zoriCannyGetSize(size, &bytes));
    std::vector<uint8_t> buffer(static_cast<size_t>(bytes));
    Image edges(g.width, g.height, 1);
    ZT_CALL(zoriCanny_16s8u_C1R(g.dx.data(), 2 * g.width, g.dy.data(), 2 * g.width, edges.px.data(), edges.step(), size,
                                low, high, buffer.data()));
    return edges;
}

Image perPlane(const Image& img, const std::function<Image(const Image&)>& one) {
    if (img.channels == 1) return one(img);
    const Image rgb = toRgb(img);
    Image planes[3] = {Image(img.width, img.height, 1), Image(img.width, img.height, 1),
                       Image(img.width, img.height, 1)};
    uint8_t* p[3] = {planes[0].px.data(), planes[1].px.data(), planes[2].px.data()};
    ZT_CALL(zoriCopy_8u_C3P3R(rgb.px.data(), rgb.step(), p, img.width, img.size()));
    for (Image& plane : planes) plane = one(plane);
    const uint8_t* q[3] = {planes[0].px.data(), planes[1].px.data(), planes[2].px.data()};
    Image out(img.width, img.height, 3);
    ZT_CALL(zoriCopy_8u_P3C3R(q, img.width, out.px.data(), out.step(), img.size()));
    return out;
}

Image median(const Image& img, int size) {
    if (size < 1 || size % 2 == 0) throw UserError("median size must be odd, not " + std::to_string(size));
    const int r = size / 2;
    return perPlane(img, [&](const Image& one) {
        const Image padded = padReplicate(one, r);
        Image out(one.width, one.height, 1);
        ZT_CALL(zoriFilterMedian_8u_C1R(padded.px.data() + r * padded.step() + r, padded.step(), out.px.data(),
                                        out.step(), one.size(), ImageSize{size, size}, ImagePoint{r, r}));
        return out;
    });
}

Features speechFeatures(const Audio& a, int nFilter, int nCeps, double winMs, double hopMs) {
    const int win = static_cast<int>(std::lround(a.rate * winMs / 1000));
    const int hop = static_cast<int>(std::lround(a.rate * hopMs / 1000));
    const int n = static_cast<int>(a.samples.size());
    if (win < 2 || hop < 1) throw UserError("frames of " + std::to_string(win) + " samples are too short");
    if (n < win)
        throw UserError("the clip holds " + std::to_string(n) + " samples, less than one frame of " +
                        std::to_string(win));
    Features out;
    out.frames = (n - win) / hop + 1;

    std::vector<float> x(n);
    ZT_CALL(zorsConvert_16s32f(a.samples.data(), x.data(), n));

    // The bank owns a real FFT (mode 4) and takes the windowed frame; mode 1:
    // triangles on the mel scale.
    Owned bank{nullptr, zorsFBankFree_32f};
    int order = 0;
    ZT_CALL(zorsMelFBankInitAlloc_32f(&bank.p, &order, win, static_cast<float>(a.rate), 64.0f,
                                      static_cast<float>(a.rate) / 2, nFilter, 2595.0f, 700.0f, 1 | 4));
    const int fftLen = 1 << order, bins = fftLen / 2 + 1;
    Owned fft{nullptr, zorsFFTFree_R_32f};
    ZT_CALL(zorsFFTInitAlloc_R_32f(&fft.p, order, 8, 0));
    Owned dct{nullptr, zorsDCTLifterFree_32f};
    ZT_CALL(zorsDCTLifterInitAlloc_32f(&dct.p, nFilter, nCeps, 22, 1.0f));

    std::vector<float> window(win), frame(fftLen), ccs(fftLen + 2), mag(bins), energy(nFilter), ceps(nCeps);
    ZT_CALL(zorsSet_32f(1.0f, window.data(), win));
    ZT_CALL(zorsWinHamming_32f_I(window.data(), win));
    out.spectrum = Plane(out.frames, bins);
    out.mel = Plane(out.frames, nFilter);
    out.mfcc = Plane(out.frames, nCeps);
    for (int f = 0; f < out.frames; ++f) {
        ZT_CALL(zorsCopyWithPadding_32f(x.data() + f * hop, win, frame.data(), fftLen));
        ZT_CALL(zorsPreemphasize_32f(frame.data(), win, 0.97f));
        ZT_CALL(zorsMul_32f_I(window.data(), frame.data(), win));
        ZT_CALL(zorsFFTFwd_RToCCS_32f(frame.data(), ccs.data(), fft.p, nullptr));
        ZT_CALL(zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(ccs.data()), mag.data(), bins));
        ZT_CALL(zorsThreshold_LTVal_32f_I(mag.data(), bins, 1e-3f, 1e-3f));
        ZT_CALL(zorsLn_32f_I(mag.data(), bins));
        ZT_CALL(zorsEvalFBank_32f(frame.data(), energy.data(), bank.p));
        ZT_CALL(zorsThreshold_LTVal_32f_I(energy.data(), nFilter, 1e-3f, 1e-3f));
        ZT_CALL(zorsLn_32f_I(energy.data(), nFilter));
        ZT_CALL(zorsDCTLifter_32f(energy.data(), ceps.data(), dct.p));
        for (int k = 0; k < bins; ++k) out.spectrum.at(f, k) = mag[k];
        for (int k = 0; k < nFilter; ++k) out.mel.at(f, k) = energy[k];
        for (int k = 0; k < nCeps; ++k) out.mfcc.at(f, k) = ceps[k];
    }
    return out;
}

}  // namespace ztool
