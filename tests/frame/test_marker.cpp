// The marker-file probe: a file named after the module with the extension
// replaced by "xml" switches the alternate super-sampling on at load.
#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "frame/attach.h"

using zor::frame::altSuperSampling;
using zor::frame::probeMarkerFile;

namespace {
std::string tempDir() {
#if defined(_WIN32)
    const char* t = std::getenv("TEMP");
    return t ? t : ".";
#else
    const char* t = std::getenv("TMPDIR");
    return t ? t : "/tmp";
#endif
}

struct FlagRestore {
    int32_t saved = altSuperSampling;
    ~FlagRestore() { altSuperSampling = saved; }
};
}  // namespace

TEST(MarkerFile, ExistenceSetsTheFlag) {
    FlagRestore restore;
    const std::string dir = tempDir() + "/";
    const std::string marker = dir + "zor_marker_probe.xml";
    std::remove(marker.c_str());

    EXPECT_EQ(probeMarkerFile((dir + "zor_marker_probe.dll").c_str()), 0u);
    EXPECT_EQ(altSuperSampling, 0);

    std::FILE* f = std::fopen(marker.c_str(), "w");
    ASSERT_NE(f, nullptr);
    std::fclose(f);  // empty: the contents are never read
    EXPECT_EQ(probeMarkerFile((dir + "zor_marker_probe.dll").c_str()), 0u);
    EXPECT_EQ(altSuperSampling, 1);
    // Only the text after the last '.' is replaced.
    EXPECT_EQ(probeMarkerFile((dir + "zor_marker_probe.so").c_str()), 0u);
    EXPECT_EQ(altSuperSampling, 1);
    EXPECT_EQ(probeMarkerFile((dir + "zor_marker_probe.so.5").c_str()), 0u);
    EXPECT_EQ(altSuperSampling, 0);
    std::remove(marker.c_str());
}

TEST(MarkerFile, PathWithoutAUsableDot) {
    FlagRestore restore;
    altSuperSampling = 1;
    EXPECT_EQ(probeMarkerFile("nodot"), 0x80004005u);
    EXPECT_EQ(altSuperSampling, 0);
    altSuperSampling = 1;
    EXPECT_EQ(probeMarkerFile(".xml"), 0x80004005u);  // a '.' at index 0 does not count
    EXPECT_EQ(altSuperSampling, 0);
    EXPECT_EQ(probeMarkerFile(nullptr), 0x80004005u);
}
