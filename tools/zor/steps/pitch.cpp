// Demo step of the IIR filter and the autocorrelation: the speech clip
// low-passed, and its pitch per frame from the autocorrelation peak.
#include <algorithm>
#include <cmath>
#include <cstdio>

#include "tools/zor/demo.h"

namespace ztool {
namespace {

// Second-order Butterworth low-pass at fc (bilinear transform): b0 b1 b2 a0 a1 a2.
std::vector<float> butterworthLowpass(double fc, double rate) {
    const double k = std::tan(3.141592653589793 * fc / rate), q = std::sqrt(2.0);
    const double norm = 1 / (1 + q * k + k * k);
    const double b0 = k * k * norm;
    return {float(b0), float(2 * b0), float(b0), 1.0f, float(2 * (k * k - 1) * norm),
            float((1 - q * k + k * k) * norm)};
}

ZT_DEMO_STEP(93, "pitch", "Low-pass filter and pitch",
             "The clip through a second-order Butterworth low-pass at 900 Hz (IIR), 40 ms of it drawn before (red) "
             "and after (blue); then, every 10 ms, the autocorrelation of a 40 ms frame of the filtered clip, whose "
             "highest peak between lags of 2.5 and 15 ms (past its first dip below zero) gives the pitch of voiced frames.",
             "zorsIIRInitAlloc_32f, zorsIIR_32f, zorsAutoCorr_32f", [](Gallery& g) {
                 const Audio& a = g.speech();
                 const int n = static_cast<int>(a.samples.size());
                 std::vector<float> x(n), y(n);
                 for (int i = 0; i < n; ++i) x[i] = a.samples[i];
                 const std::vector<float> taps = butterworthLowpass(900, a.rate);
                 void* iir = nullptr;
                 ZT_CALL(zorsIIRInitAlloc_32f(&iir, taps.data(), 2, nullptr));
                 const Status s = zorsIIR_32f(x.data(), y.data(), n, iir);
                 zorsIIRFree_32f(iir);
                 ZT_CALL(s);

                 const int frame = a.rate / 25, hop = a.rate / 100;
                 const int lagLo = a.rate / 400, lagHi = a.rate * 3 / 200;
                 double loudest = 0;
                 for (float v : y) loudest = std::max(loudest, double(v) * v);
                 std::vector<float> r(lagHi + 1);
                 std::vector<double> track;
                 int voiced = 0, excerpt = -1;
                 double sum = 0;
                 for (int start = 0; start + frame <= n; start += hop) {
                     ZT_CALL(zorsAutoCorr_32f(y.data() + start, frame, r.data(), lagHi + 1));
                     // The peak is sought past the first dip below zero, so
                     // that the slope near lag 0 is not taken for it.
                     int from = lagLo;
                     while (from < lagHi && r[from] > 0) ++from;
                     const int best = int(std::max_element(r.begin() + from, r.end()) - r.begin());
                     // Voiced: loud enough, and strongly periodic.
                     const bool isVoiced = r[0] > 0.01 * loudest * frame && r[best] > 0.4 * r[0];
                     const double f0 = isVoiced ? double(a.rate) / best : 0;
                     track.push_back(f0);
                     if (isVoiced) {
                         ++voiced, sum += f0;
                         if (excerpt < 0) excerpt = start;
                     }
                 }
                 if (excerpt < 0) excerpt = 0;
                 if (track.empty()) track.push_back(0);
                 std::vector<std::vector<double>> wave(3);
                 double peak = 1;
                 for (int i = excerpt; i < std::min(n, excerpt + frame); ++i) peak = std::max(peak, double(std::fabs(x[i])));
                 for (int i = excerpt; i < std::min(n, excerpt + frame); ++i) {
                     wave[0].push_back(x[i] + peak);
                     wave[2].push_back(y[i] + peak);
                 }
                 g.save("pitch-wave", plotSeries(wave, 640, 200),
                        "40 ms from " + std::to_string(excerpt * 1000 / a.rate) + " ms: clip (red), low-passed (blue)");
                 g.save("pitch-track", plotSeries({track}, 640, 200),
                        "pitch per 10 ms, 0 where unvoiced; top of the plot: " +
                            std::to_string(std::lround(*std::max_element(track.begin(), track.end()))) + " Hz");
                 char line[160];
                 std::snprintf(line, sizeof line, "%d of %zu frames voiced, mean pitch %.0f Hz", voiced, track.size(),
                               voiced ? sum / voiced : 0.0);
                 g.note(line);
             });

}  // namespace
}  // namespace ztool
