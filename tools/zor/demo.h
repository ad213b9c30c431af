// The demo gallery: a table of steps, each of which runs one family on the
// bundled inputs and saves what it made.  A family adds its step with one
// ZT_DEMO_STEP in demo.cpp, or in a file of its own under tools/zor/steps/.
#pragma once

#include <functional>
#include <string>
#include <vector>

#include "tools/zor/tool.h"

namespace ztool {

class Gallery {
public:
    Gallery(std::string dir, Image photo, Audio speech);
    const Image& photo() const { return photo_; }  // RGB
    const Image& grey() const { return grey_; }
    const Audio& speech() const { return speech_; }
    // The speech features, computed once for the steps that show them.
    const Features& features();
    // Writes dir/<name>.png and records it with its caption.
    void save(const std::string& name, const Image& img, const std::string& caption);
    // A line of numbers the step found, shown under its pictures and printed.
    void note(const std::string& text);

    struct Output {
        std::string file, caption;
    };
    std::vector<Output> outputs;  // of the running step
    std::vector<std::string> notes;
    const std::string& dir() const { return dir_; }

private:
    std::string dir_;
    Image photo_, grey_;
    Audio speech_;
    Features features_;
    bool haveFeatures_ = false;
};

struct Step {
    int order;  // place in the gallery
    const char* id;
    const char* title;
    const char* explanation;  // the one line under the pictures
    const char* exports;      // the exports it calls, as shown
    std::function<void(Gallery&)> run;
};

std::vector<Step>& demoSteps();
struct StepRegistrar {
    explicit StepRegistrar(Step s) { demoSteps().push_back(std::move(s)); }
};
#define ZT_DEMO_CAT2(a, b) a##b
#define ZT_DEMO_CAT(a, b) ZT_DEMO_CAT2(a, b)
#define ZT_DEMO_STEP(...) \
    static const ::ztool::StepRegistrar ZT_DEMO_CAT(zt_demo_step_, __LINE__)(::ztool::Step{__VA_ARGS__})

// Helpers for steps.
Image sharpen(const Image& img);
Image blur(const Image& img);
Image dilateOrErode(const Image& img, int size, bool dilate);
// Peak signal-to-noise ratio in dB of b against a (same size and layout).
double psnr(const Image& a, const Image& b);
// Side by side, with a 4-pixel white gap; grey parts become RGB.
Image sideBySide(const std::vector<Image>& parts);

}  // namespace ztool
