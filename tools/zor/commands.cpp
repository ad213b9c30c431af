// The operations on the user's own files: resize, filter, edges, color, mfcc.
#include <cmath>
#include <cstdio>
#include <cstring>

#include "tools/zor/tool.h"

namespace ztool {
namespace {

// Prints the help text and returns 0, or complains about the positionals.
bool wantsHelp(const Options& o, const char* usage, size_t positionals) {
    if (o.help) {
        std::fputs(usage, stdout);
        return true;
    }
    if (o.positional.size() != positionals) {
        std::string u(usage);
        throw UserError("expected " + std::to_string(positionals) + " file names, got " +
                        std::to_string(o.positional.size()) + " (" + u.substr(0, u.find('\n')) + ")");
    }
    return false;
}

int intOption(const Options& o, const char* name, int fallback, int lo, int hi) {
    const double v = o.number(name, fallback);
    if (v != std::floor(v) || v < lo || v > hi)
        throw UserError(std::string("--") + name + " must be a whole number from " + std::to_string(lo) + " to " +
                        std::to_string(hi));
    return static_cast<int>(v);
}

// A centred integer kernel over the replicated border, one plane or three.
Image convolve(const Image& img, const std::vector<int32_t>& kernel, int size, int divisor) {
    const Image src = img.channels == 1 ? img : toRgb(img);
    const int r = size / 2;
    const Image padded = padReplicate(src, r);
    Image out(src.width, src.height, src.channels);
    const uint8_t* roi = padded.px.data() + r * padded.step() + r * src.channels;
    const ImageSize k{size, size};
    const ImagePoint anchor{r, r};
    if (src.channels == 1)
        ZT_CALL(zoriFilter_8u_C1R(roi, padded.step(), out.px.data(), out.step(), src.size(), kernel.data(), k, anchor,
                                  divisor));
    else
        ZT_CALL(zoriFilter_8u_C3R(roi, padded.step(), out.px.data(), out.step(), src.size(), kernel.data(), k, anchor,
                                  divisor));
    return out;
}

// Max or min over a size x size neighbourhood of one plane.
Image rank(const Image& plane, int size, bool dilate) {
    const int r = size / 2;
    const Image padded = padReplicate(plane, r);
    Image out(plane.width, plane.height, 1);
    const uint8_t* roi = padded.px.data() + r * padded.step() + r;
    const ImageSize m{size, size};
    const ImagePoint a{r, r};
    if (dilate)
        ZT_CALL(zoriFilterMax_8u_C1R(roi, padded.step(), out.px.data(), out.step(), plane.size(), m, a));
    else
        ZT_CALL(zoriFilterMin_8u_C1R(roi, padded.step(), out.px.data(), out.step(), plane.size(), m, a));
    return out;
}

}  // namespace

Image sharpen(const Image& img) { return convolve(img, {0, -1, 0, -1, 5, -1, 0, -1, 0}, 3, 1); }
Image blur(const Image& img) { return convolve(img, {1, 2, 1, 2, 4, 2, 1, 2, 1}, 3, 16); }
Image dilateOrErode(const Image& img, int size, bool dilate) {
    return perPlane(img, [&](const Image& p) { return rank(p, size, dilate); });
}

int cmdResize(const Args& args) {
    static const char* usage =
        "usage: zor resize IN OUT (--width W | --height H | --scale F) [--interp MODE]\n"
        "\n"
        "Resizes IN to W x H pixels (one of them alone keeps the aspect ratio) or by\n"
        "the factor F.  MODE: nearest, linear (default), cubic, super (area\n"
        "average, for shrinking) or lanczos.\n";
    const Options o = parseOptions(args);
    if (wantsHelp(o, usage, 2)) return 0;
    const Image in = readImage(o.positional[0]);
    double fx = o.number("scale", 0), fy = fx;
    if (o.has("width")) fx = o.number("width", 0) / in.width;
    if (o.has("height")) fy = o.number("height", 0) / in.height;
    if (!o.has("scale") && o.has("width") != o.has("height")) (o.has("width") ? fy : fx) = o.has("width") ? fx : fy;
    if (!(fx > 0) || !(fy > 0)) throw UserError("give --width, --height or --scale, each above 0");
    const std::string mode = o.get("interp", "linear");
    const int interp = mode == "nearest"   ? InterNearest
                       : mode == "linear"  ? InterLinear
                       : mode == "cubic"   ? InterCubic
                       : mode == "super"   ? InterSuper
                       : mode == "lanczos" ? InterLanczos
                                           : 0;
    if (!interp) throw UserError("--interp: unknown mode '" + mode + "' (nearest, linear, cubic, super, lanczos)");
    const int w = std::max(1, static_cast<int>(std::lround(in.width * fx)));
    const int h = std::max(1, static_cast<int>(std::lround(in.height * fy)));
    if (static_cast<double>(w) * h > 1e9)
        throw UserError("the result of " + std::to_string(w) + " x " + std::to_string(h) + " pixels is too large");
    const Image src = in.channels == 1 ? in : toRgb(in);
    Image out(w, h, src.channels);
    const ImageRect roi{0, 0, src.width, src.height};
    const double xf = static_cast<double>(w) / src.width, yf = static_cast<double>(h) / src.height;
    if (src.channels == 1)
        ZT_CALL(zoriResize_8u_C1R(src.px.data(), src.size(), src.step(), roi, out.px.data(), out.step(), out.size(), xf,
                                  yf, interp));
    else
        ZT_CALL(zoriResize_8u_C3R(src.px.data(), src.size(), src.step(), roi, out.px.data(), out.step(), out.size(), xf,
                                  yf, interp));
    writeImage(o.positional[1], out);
    std::printf("%s: %dx%d -> %s: %dx%d (%s)\n", o.positional[0].c_str(), in.width, in.height, o.positional[1].c_str(),
                w, h, mode.c_str());
    return 0;
}

int cmdFilter(const Args& args) {
    static const char* usage =
        "usage: zor filter IN OUT --op OP [--size N]\n"
        "\n"
        "OP: median (N x N median, N odd, default 3), sharpen (3x3), blur (3x3\n"
        "binomial), dilate or erode (N x N maximum or minimum, default 3).\n"
        "Pixels outside the image are taken as copies of its edge.\n";
    const Options o = parseOptions(args);
    if (wantsHelp(o, usage, 2)) return 0;
    const std::string op = o.get("op", "");
    const int size = intOption(o, "size", 3, 1, 255);
    const Image in = readImage(o.positional[0]);
    Image out;
    if (op == "median")
        out = median(in, size);
    else if (op == "sharpen")
        out = sharpen(in);
    else if (op == "blur")
        out = blur(in);
    else if (op == "dilate" || op == "erode")
        out = dilateOrErode(in, size, op == "dilate");
    else
        throw UserError(op.empty() ? "--op is required (median, sharpen, blur, dilate, erode)"
                                   : "--op: unknown operation '" + op + "' (median, sharpen, blur, dilate, erode)");
    writeImage(o.positional[1], out);
    return 0;
}

int cmdEdges(const Args& args) {
    static const char* usage =
        "usage: zor edges IN OUT [--method canny|sobel] [--mask 3|5] [--low L] [--high H]\n"
        "\n"
        "canny (default): 255 on edges, 0 elsewhere, from the Sobel derivatives\n"
        "with hysteresis thresholds L (default 60) and H (default 150) on\n"
        "|dx| + |dy|.  sobel: the gradient magnitude |dx| + |dy|, scaled to 8 bits.\n";
    const Options o = parseOptions(args);
    if (wantsHelp(o, usage, 2)) return 0;
    const int maskArg = intOption(o, "mask", 3, 3, 5);
    if (maskArg == 4) throw UserError("--mask must be 3 or 5");
    const int mask = maskArg == 3 ? MaskSize3x3 : MaskSize5x5;
    const std::string method = o.get("method", "canny");
    if (method != "canny" && method != "sobel") throw UserError("--method: '" + method + "' (canny or sobel)");
    const Gradient g = sobel(toGrey(readImage(o.positional[0])), mask);
    const float scale = mask == MaskSize5x5 ? 8.0f : 1.0f;  // a 5x5 mask answers about 8 times as strongly
    const Image out = method == "sobel" ? gradientMagnitude(g, mask)
                                        : canny(g, static_cast<float>(o.number("low", 60 * scale)),
                                                static_cast<float>(o.number("high", 150 * scale)));
    writeImage(o.positional[1], out);
    return 0;
}

int cmdColor(const Args& args) {
    static const char* usage =
        "usage: zor color IN OUT --to SPACE\n"
        "\n"
        "SPACE: grey, ycbcr, hsv or hls.  The three channels of the result are\n"
        "written as the R, G and B of OUT; with OUT ending in .pgm or --planes, as\n"
        "three grey images OUT-1, OUT-2, OUT-3 instead.\n";
    const Options o = parseOptions(args, {"planes"});
    if (wantsHelp(o, usage, 2)) return 0;
    const std::string to = o.get("to", "");
    const Image in = readImage(o.positional[0]);
    if (to == "grey" || to == "gray") {
        writeImage(o.positional[1], toGrey(in));
        return 0;
    }
    using Convert = Status(ZOR_CALL*)(const uint8_t*, int, uint8_t*, int, ImageSize);
    struct Space {
        const char* name;
        const char* call;
        Convert convert;
    };
    static const Space spaces[] = {{"ycbcr", "zoriRGBToYCbCr_8u_C3R", zoriRGBToYCbCr_8u_C3R},
                                   {"hsv", "zoriRGBToHSV_8u_C3R", zoriRGBToHSV_8u_C3R},
                                   {"hls", "zoriRGBToHLS_8u_C3R", zoriRGBToHLS_8u_C3R}};
    const Space* space = nullptr;
    for (const Space& s : spaces)
        if (to == s.name) space = &s;
    if (!space)
        throw UserError(to.empty() ? "--to is required (grey, ycbcr, hsv, hls)"
                                   : "--to: unknown space '" + to + "' (grey, ycbcr, hsv, hls)");
    const Image rgb = toRgb(in);
    Image out(in.width, in.height, 3);
    check(space->convert(rgb.px.data(), rgb.step(), out.px.data(), out.step(), rgb.size()), space->call);
    const std::string& path = o.positional[1];
    if (!o.has("planes") && path.size() > 4 && path.compare(path.size() - 4, 4, ".pgm") != 0) {
        writeImage(path, out);
        return 0;
    }
    const size_t dot = path.rfind('.');
    const std::string stem = dot == std::string::npos ? path : path.substr(0, dot);
    const std::string ext = dot == std::string::npos ? ".png" : path.substr(dot);
    for (int c = 0; c < 3; ++c) {
        Image plane(in.width, in.height, 1);
        ZT_CALL(zoriCopy_8u_C3C1R(out.px.data() + c, out.step(), plane.px.data(), plane.step(), in.size()));
        writeImage(stem + "-" + std::to_string(c + 1) + ext, plane);
    }
    return 0;
}

int cmdMfcc(const Args& args) {
    static const char* usage =
        "usage: zor mfcc IN.wav OUT.csv [--filters N] [--ceps N] [--win MS] [--hop MS]\n"
        "                              [--png PREFIX]\n"
        "\n"
        "Mel-frequency cepstral coefficients of a 16-bit PCM WAV: one line per\n"
        "frame of MS milliseconds (default 25) every MS (default 10), with N\n"
        "cepstra (default 13) from N mel filters (default 26) between 64 Hz and\n"
        "half the sampling rate.  --png also writes PREFIX-spectrogram.png,\n"
        "PREFIX-mel.png and PREFIX-mfcc.png.\n";
    const Options o = parseOptions(args);
    if (wantsHelp(o, usage, 2)) return 0;
    const int filters = intOption(o, "filters", 26, 2, 256);
    const int ceps = intOption(o, "ceps", 13, 1, filters);
    const Audio a = readWav(o.positional[0]);
    const Features f = speechFeatures(a, filters, ceps, o.number("win", 25), o.number("hop", 10));
    std::string csv;
    char cell[32];
    for (int t = 0; t < f.frames; ++t) {
        for (int k = 0; k < ceps; ++k) {
            std::snprintf(cell, sizeof cell, k ? ",%.6g" : "%.6g", static_cast<double>(f.mfcc.at(t, k)));
            csv += cell;
        }
        csv += '\n';
    }
    FILE* out = std::fopen(o.positional[1].c_str(), "wb");
    if (!out) throw UserError(o.positional[1] + ": cannot create (" + std::strerror(errno) + ")");
    std::fwrite(csv.data(), 1, csv.size(), out);
    if (std::fclose(out) != 0) throw UserError(o.positional[1] + ": write error");
    if (o.has("png")) {
        const std::string p = o.get("png", "");
        writeImage(p + "-spectrogram.png", heatMap(f.spectrum, 2, 1, false, 9));
        writeImage(p + "-mel.png", heatMap(f.mel, 2, 6, false, 9));
        writeImage(p + "-mfcc.png", heatMap(f.mfcc, 2, 12, true));
    }
    std::printf("%s: %d frames of %d cepstra from %d Hz audio -> %s\n", o.positional[0].c_str(), f.frames, ceps, a.rate,
                o.positional[1].c_str());
    return 0;
}

}  // namespace ztool
