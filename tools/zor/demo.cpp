// zor demo: runs every family on the bundled photograph and speech clip and
// writes a gallery of PNGs with an index.html that explains each picture.
#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <fstream>
#include <sys/stat.h>

#include "tools/zor/demo.h"

#ifndef ZOR_DATA_DIR
#define ZOR_DATA_DIR "data"
#endif

namespace ztool {

std::vector<Step>& demoSteps() {
    static std::vector<Step> steps;
    return steps;
}

Gallery::Gallery(std::string dir, Image photo, Audio speech)
    : dir_(std::move(dir)), photo_(toRgb(photo)), grey_(toGrey(photo)), speech_(std::move(speech)) {}

const Features& Gallery::features() {
    if (!haveFeatures_) {
        features_ = speechFeatures(speech_, 40, 13);
        haveFeatures_ = true;
    }
    return features_;
}

void Gallery::save(const std::string& name, const Image& img, const std::string& caption) {
    writeImage(dir_ + "/" + name + ".png", img);
    outputs.push_back({name + ".png", caption});
}

void Gallery::note(const std::string& text) { notes.push_back(text); }

double psnr(const Image& a, const Image& b) {
    double se = 0;
    for (size_t i = 0; i < a.px.size(); ++i) {
        const double d = double(a.px[i]) - double(b.px[i]);
        se += d * d;
    }
    const double mse = se / static_cast<double>(a.px.size());
    return mse > 0 ? 10 * std::log10(255.0 * 255.0 / mse) : 99.0;
}

Image sideBySide(const std::vector<Image>& parts) {
    int w = 0, h = 0;
    for (const Image& p : parts) {
        w += p.width + (w ? 4 : 0);
        h = std::max(h, p.height);
    }
    Image out(w, h, 3, 255);
    int x0 = 0;
    for (const Image& part : parts) {
        const Image p = toRgb(part);
        for (int y = 0; y < p.height; ++y) std::copy(p.row(y), p.row(y) + p.step(), out.row(y) + 3 * x0);
        x0 += p.width + 4;
    }
    return out;
}

namespace {

std::string html(const std::string& s) {
    std::string o;
    for (char c : s) {
        if (c == '<')
            o += "&lt;";
        else if (c == '>')
            o += "&gt;";
        else if (c == '&')
            o += "&amp;";
        else
            o += c;
    }
    return o;
}

std::string fmt(const char* f, double v) {
    char b[64];
    std::snprintf(b, sizeof b, f, v);
    return b;
}

// ---- the steps of the families that are in the library ----------------------

ZT_DEMO_STEP(0, "input", "The inputs",
             "The photograph every image step starts from (its grey version where a step needs one channel).", "",
             [](Gallery& g) {
                 g.save("input", g.photo(), "Chelsea the cat, 451 x 300, CC0");
                 g.save("input-grey", g.grey(), "grey, weights 0.299, 0.587, 0.114");
             });

ZT_DEMO_STEP(10, "mirror", "Mirror",
             "The photograph mirrored about its vertical axis: pixels move whole, channels keep their order.",
             "zoriMirror_8u_C3R", [](Gallery& g) {
                 const Image& p = g.photo();
                 Image out(p.width, p.height, 3);
                 ZT_CALL(zoriMirror_8u_C3R(p.px.data(), p.step(), out.px.data(), out.step(), p.size(), 1));
                 g.save("mirror", out, "axis 1 (columns reversed)");
             });

ZT_DEMO_STEP(20, "sobel", "Sobel gradient",
             "|dx| + |dy| of the 3x3 Sobel derivatives of the grey image, divided by 4 and saturated to 8 bits.",
             "zoriFilterSobelVert_8u16s_C1R, zoriFilterSobelHoriz_8u16s_C1R, zorsAbs_16s, zorsAdd_16s_Sfs",
             [](Gallery& g) {
                 g.save("sobel", gradientMagnitude(sobel(g.grey(), MaskSize3x3), MaskSize3x3), "3x3, 8-bit magnitude");
             });

ZT_DEMO_STEP(21, "canny", "Canny edges",
             "Canny on the Sobel derivatives, thresholds 60 and 150 on |dx| + |dy|. The Vert filter gives left minus "
             "right: its result is negated before it goes in as dx, or the two diagonal direction classes swap.",
             "zoriFilterSobelVert_8u16s_C1R, zorsMulC_NR_16s_ISfs (-1), zoriCanny_16s8u_C1R", [](Gallery& g) {
                 Gradient grad = sobel(g.grey(), MaskSize3x3);
                 const Image right = canny(grad, 60, 150);
                 // The tempting chain: the Vert result straight in as dx.
                 ZT_CALL(zorsMulC_NR_16s_ISfs(-1, grad.dx.data(), static_cast<int>(grad.dx.size()), 0));
                 const Image naive = canny(grad, 60, 150);
                 Image diff(right.width, right.height, 3);
                 size_t edges = 0, differ = 0;
                 for (size_t i = 0; i < right.px.size(); ++i) {
                     const bool a = right.px[i], b = naive.px[i];
                     edges += a;
                     differ += a != b;
                     uint8_t* p = &diff.px[3 * i];
                     p[0] = b ? 255 : 0;  // white: both; red: only the naive chain
                     p[1] = a ? 255 : 0;  // cyan: only the right chain
                     p[2] = a ? 255 : 0;
                 }
                 g.save("canny", right, "edges (255) with dx = right minus left");
                 g.save("canny-chaining", diff,
                        "white: edge either way; cyan: only when dx is negated; red: only with the Vert result as dx");
                 g.note("Vert fed straight in as dx changes " + std::to_string(differ) + " of " +
                        std::to_string(edges) + " edge pixels (" +
                        fmt("%.1f", 100.0 * double(differ) / double(std::max<size_t>(edges, 1))) + " %)");
             });

ZT_DEMO_STEP(30, "median", "Median against salt-and-pepper noise",
             "About 3 % of the pixels set to black or white (Gaussian draws beyond 2.17 sigma), then a 3x3 median "
             "per channel: the isolated outliers go, the edges stay.",
             "zorsRandGauss_32f, zoriFilterMedian_8u_C1R, zoriCopy_8u_C3P3R, zoriCopy_8u_P3C3R", [](Gallery& g) {
                 Image noisy = g.photo();
                 const int n = noisy.width * noisy.height;
                 std::vector<float> draw(n);
                 void* rng = nullptr;
                 ZT_CALL(zorsRandGaussInitAlloc_32f(&rng, 0.0f, 1.0f, 2024));
                 const Status s = zorsRandGauss_32f(draw.data(), n, rng);
                 zorsRandGaussFree_32f(rng);
                 ZT_CALL(s);
                 for (int i = 0; i < n; ++i)
                     if (std::fabs(draw[i]) > 2.17f) std::fill_n(&noisy.px[3 * i], 3, draw[i] > 0 ? 255 : 0);
                 const Image clean = median(noisy, 3);
                 g.save("median-noisy", noisy, "with salt-and-pepper noise");
                 g.save("median-3x3", clean, "3x3 median of each channel");
                 g.note("PSNR against the photograph: noisy " + fmt("%.1f", psnr(g.photo(), noisy)) + " dB, median " +
                        fmt("%.1f", psnr(g.photo(), clean)) + " dB");
             });

// Erodes or dilates a binary image in place over a replicated border.
Image morph3x3(const Image& img, bool dilate) {
    Image padded = padReplicate(img, 1);
    uint8_t* roi = padded.px.data() + padded.step() + 1;
    if (dilate)
        ZT_CALL(zoriDilate3x3_8u_C1IR(roi, padded.step(), img.size()));
    else
        ZT_CALL(zoriErode3x3_8u_C1IR(roi, padded.step(), img.size()));
    Image out(img.width, img.height, 1);
    ZT_CALL(zoriCopy_8u_C1R(roi, padded.step(), out.px.data(), out.step(), img.size()));
    return out;
}

ZT_DEMO_STEP(40, "morphology", "Morphology",
             "The grey image thresholded at its mean, opened (3x3 erosion, then dilation) to drop specks, and its "
             "morphological gradient (dilation minus erosion) tracing the outlines.",
             "zoriCompareC_8u_C1R, zoriErode3x3_8u_C1IR, zoriDilate3x3_8u_C1IR, zoriSub_8u_C1RSfs", [](Gallery& g) {
                 const Image& grey = g.grey();
                 double sum = 0;
                 for (uint8_t v : grey.px) sum += v;
                 const uint8_t level = static_cast<uint8_t>(sum / static_cast<double>(grey.px.size()));
                 Image binary(grey.width, grey.height, 1);
                 ZT_CALL(zoriCompareC_8u_C1R(grey.px.data(), grey.step(), level, binary.px.data(), binary.step(),
                                             grey.size(), CmpGreater));
                 const Image opened = morph3x3(morph3x3(binary, false), true);
                 const Image dilated = morph3x3(opened, true), eroded = morph3x3(opened, false);
                 Image gradient(grey.width, grey.height, 1);
                 // Sub computes the second operand minus the first.
                 ZT_CALL(zoriSub_8u_C1RSfs(eroded.px.data(), eroded.step(), dilated.px.data(), dilated.step(),
                                           gradient.px.data(), gradient.step(), grey.size(), 0));
                 g.save("morph-binary", binary, "grey > " + std::to_string(level));
                 g.save("morph-open", opened, "opened, 3x3");
                 g.save("morph-gradient", gradient, "dilation minus erosion");
             });

ZT_DEMO_STEP(
    50, "floodfill", "Flood fill",
    "Three gradient fills (8-connected, a neighbour joins when it differs by at most 4, or 2 in the "
    "background, from the pixel it is reached from), painted over the photograph; the record gives each "
    "region's area and bounding box.",
    "zoriFloodFillGetSize_Grad, zoriFloodFill_Grad8Con_8u_C1IR, zoriThreshold_8u_C1R, zoriCompareC_8u_C1R",
    [](Gallery& g) {
        const Image& grey = g.grey();
        Image clipped(grey.width, grey.height, 1);  // 255 is kept for the fill value
        ZT_CALL(zoriThreshold_8u_C1R(grey.px.data(), grey.step(), clipped.px.data(), clipped.step(), grey.size(), 254,
                                     CmpGreater));
        int bytes = 0;
        ZT_CALL(zoriFloodFillGetSize_Grad(grey.size(), &bytes));
        std::vector<uint8_t> buffer(static_cast<size_t>(bytes));
        Image out = g.photo();
        const struct {
            double x, y;
            uint8_t delta, r, gr, b;
        } seeds[] = {{0.33, 0.37, 4, 60, 220, 60}, {0.58, 0.81, 4, 255, 60, 60}, {0.90, 0.90, 2, 60, 120, 255}};
        std::string record;
        for (const auto& s : seeds) {
            Image work = clipped;
            const ImagePoint seed{static_cast<int>(s.x * (grey.width - 1)), static_cast<int>(s.y * (grey.height - 1))};
            ConnectedComp region;
            ZT_CALL(zoriFloodFill_Grad8Con_8u_C1IR(work.px.data(), work.step(), grey.size(), seed, 255, s.delta,
                                                   s.delta, &region, buffer.data()));
            Image mask(grey.width, grey.height, 1);
            ZT_CALL(
                zoriCompareC_8u_C1R(work.px.data(), work.step(), 255, mask.px.data(), mask.step(), grey.size(), CmpEq));
            for (size_t i = 0; i < mask.px.size(); ++i) {
                if (!mask.px[i]) continue;
                uint8_t* p = &out.px[3 * i];
                p[0] = static_cast<uint8_t>((p[0] + s.r) / 2);
                p[1] = static_cast<uint8_t>((p[1] + s.gr) / 2);
                p[2] = static_cast<uint8_t>((p[2] + s.b) / 2);
            }
            record += (record.empty() ? "" : "; ") + std::string("seed (") + std::to_string(seed.x) + ", " +
                      std::to_string(seed.y) + "), +-" + std::to_string(s.delta) + ": area " +
                      std::to_string(static_cast<long>(region.area)) + ", box " + std::to_string(region.rect.width) +
                      " x " + std::to_string(region.rect.height) + " at (" + std::to_string(region.rect.x) + ", " +
                      std::to_string(region.rect.y) + ")";
        }
        g.save("floodfill", out, "three regions, 8-connected, windows +-4 and +-2");
        g.note(record);
    });

ZT_DEMO_STEP(60, "filter", "Linear filters",
             "User kernels through the integer filter: a 3x3 sharpening kernel (divisor 1, saturated) and a 3x3 "
             "binomial blur (divisor 16, rounded half up).",
             "zoriFilter_8u_C3R, zoriCopyReplicateBorder_8u_C3R", [](Gallery& g) {
                 g.save("filter-sharpen", sharpen(g.photo()), "[0 -1 0; -1 5 -1; 0 -1 0]");
                 g.save("filter-blur", blur(g.photo()), "[1 2 1; 2 4 2; 1 2 1] / 16");
             });

ZT_DEMO_STEP(70, "arith", "Pixel arithmetic and alpha",
             "The photograph composed over its mirror image with an alpha rising from left to right (Porter-Duff "
             "over), and the absolute difference of the grey image and its mirror: dark where the picture is "
             "symmetric.",
             "zoriCopy_8u_C3AC4R, zoriAlphaComp_8u_AC4R, zoriCopy_8u_AC4C3R, zoriAbsDiff_8u_C1R", [](Gallery& g) {
                 const Image& p = g.photo();
                 Image a(p.width, p.height, 4), b(p.width, p.height, 4, 255), over(p.width, p.height, 4);
                 ZT_CALL(zoriCopy_8u_C3AC4R(p.px.data(), p.step(), a.px.data(), a.step(), p.size()));
                 for (int y = 0; y < p.height; ++y)
                     for (int x = 0; x < p.width; ++x)
                         a.row(y)[4 * x + 3] = static_cast<uint8_t>(255 * x / std::max(1, p.width - 1));
                 Image mirrored(p.width, p.height, 3);
                 ZT_CALL(zoriMirror_8u_C3R(p.px.data(), p.step(), mirrored.px.data(), mirrored.step(), p.size(), 1));
                 ZT_CALL(zoriCopy_8u_C3AC4R(mirrored.px.data(), mirrored.step(), b.px.data(), b.step(), p.size()));
                 ZT_CALL(zoriAlphaComp_8u_AC4R(a.px.data(), a.step(), b.px.data(), b.step(), over.px.data(),
                                               over.step(), p.size(), AlphaOver));
                 Image blend(p.width, p.height, 3);
                 ZT_CALL(zoriCopy_8u_AC4C3R(over.px.data(), over.step(), blend.px.data(), blend.step(), p.size()));
                 const Image& grey = g.grey();
                 Image flipped(grey.width, grey.height, 1), diff(grey.width, grey.height, 1);
                 ZT_CALL(zoriCopy_8u_C1R(grey.px.data(), grey.step(), flipped.px.data(), flipped.step(), grey.size()));
                 ZT_CALL(zoriMirror_8u_C1IR(flipped.px.data(), flipped.step(), grey.size(), 1));
                 ZT_CALL(zoriAbsDiff_8u_C1R(grey.px.data(), grey.step(), flipped.px.data(), flipped.step(),
                                            diff.px.data(), diff.step(), grey.size()));
                 g.save("arith-over", blend, "photograph over its mirror, alpha 0 at the left, 255 at the right");
                 g.save("arith-absdiff", diff, "|grey - mirrored grey|");
             });

ZT_DEMO_STEP(80, "dft", "Image DFT",
             "Log magnitude of the two-dimensional DFT of the grey image (any size: here 451 x 300), centred on the "
             "zero frequency; the transform's packed CCS output unpacked by conjugate symmetry.",
             "zoriConvert_8u32f_C1R, zoriDFTInitAlloc_R_32f, zoriDFTFwd_RToPack_32f_C1R, zoriDFTInv_PackToR_32f_C1R",
             [](Gallery& g) {
                 const Image& grey = g.grey();
                 const int w = grey.width, h = grey.height, step = 4 * w;
                 std::vector<float> src(static_cast<size_t>(w) * h), pack(src.size()), back(src.size());
                 ZT_CALL(zoriConvert_8u32f_C1R(grey.px.data(), grey.step(), src.data(), step, grey.size()));
                 void* spec = nullptr;
                 ZT_CALL(zoriDFTInitAlloc_R_32f(&spec, grey.size(), 2, 0));  // the inverse divides by W H
                 Status s = zoriDFTFwd_RToPack_32f_C1R(src.data(), step, pack.data(), step, spec, nullptr);
                 if (s >= 0) s = zoriDFTInv_PackToR_32f_C1R(pack.data(), step, back.data(), step, spec, nullptr);
                 zoriDFTFree_R_32f(spec);
                 ZT_CALL(s);
                 auto P = [&](int col, int row) { return pack[static_cast<size_t>(row) * w + col]; };
                 // Y(u, v) for 0 <= v <= W/2 from the packed layout.
                 auto spectrum = [&](int u, int v, double& re, double& im) {
                     const bool edge = v == 0 || (w % 2 == 0 && v == w / 2);
                     if (!edge) {
                         re = P(2 * v - 1, u);
                         im = P(2 * v, u);
                         return;
                     }
                     const int col = v == 0 ? 0 : w - 1;
                     int uu = u;
                     double sign = 1;
                     if (uu > h / 2) {
                         uu = h - uu;
                         sign = -1;
                     }
                     if (uu == 0) {
                         re = P(col, 0), im = 0;
                     } else if (h % 2 == 0 && uu == h / 2) {
                         re = P(col, h - 1), im = 0;
                     } else {
                         re = P(col, 2 * uu - 1), im = sign * P(col, 2 * uu);
                     }
                 };
                 Plane mag(w, h);
                 for (int u = 0; u < h; ++u)
                     for (int v = 0; v < w; ++v) {
                         double re, im;
                         if (v <= w / 2) {
                             spectrum(u, v, re, im);
                         } else {
                             spectrum((h - u) % h, w - v, re, im);
                         }
                         // centred, low frequencies in the middle, row 0 at the top
                         mag.at((v + w / 2) % w, h - 1 - (u + h / 2) % h) =
                             static_cast<float>(std::log1p(std::sqrt(re * re + im * im)));
                     }
                 double err = 0;
                 for (size_t i = 0; i < src.size(); ++i) err = std::max(err, double(std::fabs(back[i] - src[i])));
                 g.save("dft-magnitude", heatMap(mag, 1, 1), "log(1 + |Y|), zero frequency in the centre");
                 g.note("forward then inverse gives the image back within " + fmt("%.2g", err) + " (of 255)");
             });

ZT_DEMO_STEP(90, "spectrogram", "Spectrogram",
             "Log magnitude of the real FFT of 25 ms frames every 10 ms of the speech clip, pre-emphasised and "
             "Hamming-windowed; time runs to the right, frequency (0 to half the sampling rate) upwards.",
             "zorsPreemphasize_32f, zorsWinHamming_32f_I, zorsFFTFwd_RToCCS_32f, zorsMagnitude_32fc, zorsLn_32f_I",
             [](Gallery& g) {
                 const Features& f = g.features();
                 g.save("spectrogram", heatMap(f.spectrum, 2, 1, false, 9),
                        std::to_string(f.frames) + " frames, " + std::to_string(f.spectrum.height) + " bins");
             });

ZT_DEMO_STEP(91, "mel", "Mel filter-bank energies",
             "The same frames through 40 triangular filters spaced evenly on the mel scale (64 Hz to half the "
             "sampling rate), log energies.",
             "zorsMelFBankInitAlloc_32f, zorsEvalFBank_32f, zorsThreshold_LTVal_32f_I, zorsLn_32f_I", [](Gallery& g) {
                 const Features& f = g.features();
                 g.save("mel", heatMap(f.mel, 2, 6, false, 9), "40 filters, filter 1 at the bottom");
             });

ZT_DEMO_STEP(92, "mfcc", "MFCCs",
             "Cepstral coefficients c1 to c13 of the log mel energies (cosine transform with a lifter of 22), blue "
             "negative, red positive.",
             "zorsDCTLifterInitAlloc_32f, zorsDCTLifter_32f", [](Gallery& g) {
                 const Features& f = g.features();
                 g.save("mfcc", heatMap(f.mfcc, 2, 12, true), "13 coefficients, c1 at the bottom");
             });

std::string versionLine() {
    const LibraryVersion* v = zoriGetLibVersion();
    return "zor " + std::string(v->versionText) + " build " + std::to_string(v->buildSeries) + "." +
           std::to_string(v->build) + ", variant " + v->cpuTag;
}

}  // namespace

int cmdDemo(const Args& args) {
    const Options o = parseOptions(args);
    if (o.help) {
        std::puts(
            "usage: zor demo [--out DIR] [--data DIR]\n\n"
            "Runs every family on the bundled photograph and speech clip (from --data,\n"
            "default " ZOR_DATA_DIR
            ") and writes one PNG per result and DIR/index.html\n"
            "(default DIR: gallery), printing what it wrote and how long each step took.");
        return 0;
    }
    if (!o.positional.empty()) throw UserError("unexpected argument '" + o.positional[0] + "'");
    const std::string dir = o.get("out", "gallery"), data = o.get("data", ZOR_DATA_DIR);
    mkdir(dir.c_str(), 0777);
    struct stat st;
    if (stat(dir.c_str(), &st) != 0 || !S_ISDIR(st.st_mode)) throw UserError(dir + ": cannot create the directory");
    Gallery g(dir, readImage(data + "/chelsea.png"), readWav(data + "/speech.wav"));

    std::vector<Step> steps = demoSteps();
    std::stable_sort(steps.begin(), steps.end(), [](const Step& a, const Step& b) { return a.order < b.order; });
    std::printf("%s\n", versionLine().c_str());
    std::string body;
    size_t images = 0;
    for (const Step& s : steps) {
        g.outputs.clear();
        g.notes.clear();
        const auto t0 = std::chrono::steady_clock::now();
        s.run(g);
        const double ms = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - t0).count();
        std::printf("%-12s %8.1f ms ", s.id, ms);
        for (size_t k = 0; k < g.outputs.size(); ++k) std::printf(" %s", g.outputs[k].file.c_str());
        std::printf("\n");
        for (const std::string& n : g.notes) std::printf("%-12s %11s  %s\n", "", "", n.c_str());
        images += g.outputs.size();
        body += "<section id=\"" + std::string(s.id) + "\">\n<h2>" + html(s.title) + "</h2>\n<p>" +
                html(s.explanation) + "</p>\n";
        if (*s.exports) body += "<p class=\"calls\">" + html(s.exports) + "</p>\n";
        body += "<div class=\"row\">\n";
        for (const auto& out : g.outputs)
            body += "<figure><img src=\"" + out.file + "\" alt=\"" + html(out.caption) + "\"><figcaption>" +
                    html(out.caption) + "</figcaption></figure>\n";
        body += "</div>\n";
        for (const std::string& n : g.notes) body += "<p class=\"note\">" + html(n) + "</p>\n";
        body += "<p class=\"time\">" + fmt("%.1f", ms) + " ms</p>\n</section>\n";
    }
    const std::string page =
        "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n<title>zor demo</title>\n<style>\n"
        "body { font-family: sans-serif; margin: 2em; max-width: 1400px; color: #222; }\n"
        "section { border-top: 1px solid #ccc; padding: 0.5em 0; }\n"
        "h2 { margin: 0.4em 0 0.2em; font-size: 1.2em; }\n"
        ".row { display: flex; flex-wrap: wrap; gap: 1em; align-items: flex-start; }\n"
        "figure { margin: 0; } figcaption { font-size: 0.85em; color: #555; max-width: 460px; }\n"
        "img { max-width: 100%; image-rendering: pixelated; border: 1px solid #ddd; }\n"
        ".calls { font-family: monospace; font-size: 0.85em; color: #246; }\n"
        ".note { font-size: 0.9em; } .time { font-size: 0.8em; color: #888; }\n"
        "#check { font-weight: bold; }\n"
        "</style>\n</head>\n<body>\n<h1>zor demo</h1>\n<p>" +
        html(versionLine()) +
        ". Every picture below was computed by the library's exports (named under each step) on the bundled "
        "photograph and speech clip; <code>make demo</code> writes this page again.</p>\n" +
        body +
        "<p id=\"check\">checking images...</p>\n"
        "<script>\n"
        "// Marks the page with the count of images that failed to load (a test reads it).\n"
        "addEventListener('load', () => {\n"
        "  const all = Array.from(document.images);\n"
        "  const broken = all.filter(i => !i.complete || i.naturalWidth === 0);\n"
        "  document.body.dataset.images = all.length;\n"
        "  document.body.dataset.broken = broken.length;\n"
        "  document.getElementById('check').textContent = broken.length\n"
        "    ? broken.length + ' of ' + all.length + ' images failed to load: ' +\n"
        "      broken.map(i => i.getAttribute('src')).join(', ')\n"
        "    : 'all ' + all.length + ' images loaded';\n"
        "});\n"
        "</script>\n</body>\n</html>\n";
    std::ofstream out(dir + "/index.html");
    out << page;
    if (!out) throw UserError(dir + "/index.html: write error");
    std::printf("wrote %zu images and %s/index.html\n", images, dir.c_str());
    return 0;
}

}  // namespace ztool
