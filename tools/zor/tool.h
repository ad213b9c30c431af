// The zor command-line tool: what its parts share.  The tool reaches the
// library through the public header only (the one that is installed).
#pragma once

#include <cstdint>
#include <functional>
#include <stdexcept>
#include <string>
#include <vector>

#include "zor.h"

namespace ztool {

// A failure the user can act on: printed as one line, exit status 1.
struct UserError : std::runtime_error {
    using std::runtime_error::runtime_error;
};

// "StatusBadSize" for -6; "status 123" for a code the header does not name.
std::string statusName(Status s);
// Throws a UserError naming the call and the status when s is an error.
void check(Status s, const char* call);
#define ZT_CALL(call) ::ztool::check((call), #call)

// ---- images: interleaved 8-bit pixels, rows packed ------------------------
struct Image {
    int width = 0, height = 0, channels = 0;
    std::vector<uint8_t> px;

    Image() = default;
    Image(int w, int h, int c, uint8_t fill = 0)
        : width(w), height(h), channels(c), px(static_cast<size_t>(w) * h * c, fill) {}
    int step() const { return width * channels; }
    ImageSize size() const { return {width, height}; }
    uint8_t* row(int y) { return px.data() + static_cast<size_t>(y) * step(); }
    const uint8_t* row(int y) const { return px.data() + static_cast<size_t>(y) * step(); }
};

// A float plane (spectra, heat maps), rows packed.
struct Plane {
    int width = 0, height = 0;
    std::vector<float> v;
    Plane() = default;
    Plane(int w, int h) : width(w), height(h), v(static_cast<size_t>(w) * h, 0.0f) {}
    float& at(int x, int y) { return v[static_cast<size_t>(y) * width + x]; }
    float at(int x, int y) const { return v[static_cast<size_t>(y) * width + x]; }
};

// PNG (8-bit grey, grey+alpha, RGB, RGBA; palettes and 16 bits are reduced
// to 8 bits) and binary PPM/PGM (P6/P5, maxval 255).
Image readImage(const std::string& path);
// The format follows the extension: .png, .ppm (3 channels), .pgm (1 channel).
void writeImage(const std::string& path, const Image& img);

// ---- audio: 16-bit PCM WAV; several channels are mixed down to one --------
struct Audio {
    int rate = 0;
    std::vector<int16_t> samples;
};
Audio readWav(const std::string& path);
void writeWav(const std::string& path, const Audio& a);

// ---- operations shared by the commands and the demo (ops.cpp) -------------
Image toGrey(const Image& img);
Image toRgb(const Image& img);
// The image inside a frame of `border` pixels replicating its edges: what
// the neighbourhood filters read around their ROI.
Image padReplicate(const Image& img, int border);
// Sobel derivatives of a grey image, in the convention Canny expects:
// dx = right minus left, dy = lower minus upper.
struct Gradient {
    int width = 0, height = 0;
    std::vector<int16_t> dx, dy;
};
Gradient sobel(const Image& grey, int mask);
// |dx| + |dy|, divided by 4 (3x3) or 48 (5x5) and saturated to 8 bits.
Image gradientMagnitude(const Gradient& g, int mask);
Image canny(const Gradient& g, float low, float high);
// A one-channel operation applied to each channel of an RGB image.
Image perPlane(const Image& img, const std::function<Image(const Image&)>& one);
Image median(const Image& img, int size);
// MFCC front end over frames of winMs every hopMs.
struct Features {
    Plane spectrum;  // log magnitude, one column per frame, bin 0 at the bottom row
    Plane mel;       // log mel energies, filter 1 at the bottom row
    Plane mfcc;      // cepstra 1..nCeps, c1 at the bottom row
    int frames = 0;
};
Features speechFeatures(const Audio& a, int nFilter, int nCeps, double winMs = 25, double hopMs = 10);

// ---- rendering (render.cpp) ----------------------------------------------
// A heat map of the plane, row 0 at the bottom, each cell scaled by (xScale,
// yScale); values mapped linearly between the plane's 1st and 99.5th
// percentiles, the lower one raised to show at most `range` below the upper
// one when range > 0 (log spectra: silence would take the whole scale).
Image heatMap(const Plane& p, int xScale, int yScale, bool diverging = false, double range = 0);
// A line plot of up to three series (red, green, blue) on a white ground.
Image plotSeries(const std::vector<std::vector<double>>& series, int width, int height);

// ---- commands --------------------------------------------------------------
using Args = std::vector<std::string>;
int cmdInfo(const Args& args);
int cmdDemo(const Args& args);
int cmdBench(const Args& args);
int cmdIdentify(const Args& args);
int cmdResize(const Args& args);
int cmdFilter(const Args& args);
int cmdEdges(const Args& args);
int cmdColor(const Args& args);
int cmdMfcc(const Args& args);

// Small helpers for option parsing: "--name value" pairs after positionals.
struct Options {
    std::vector<std::string> positional;
    std::vector<std::pair<std::string, std::string>> named;
    bool help = false;
    std::string get(const std::string& name, const std::string& fallback) const;
    double number(const std::string& name, double fallback) const;
    bool has(const std::string& name) const;
};
// flags: options that take no value.
Options parseOptions(const Args& args, const std::vector<std::string>& flags = {});

}  // namespace ztool
