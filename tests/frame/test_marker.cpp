// The marker-file probe: a file named after the module with the extension
// replaced by "xml" switches the alternate super-sampling on at load.
#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <string>

#include "frame/attach.h"

using zor::frame::altSuperSampling;
using zor::frame::probeMarkerFile;

namespace {
struct FlagRestore {
    int32_t saved = altSuperSampling;
    ~FlagRestore() { altSuperSampling = saved; }
};
}  // namespace

// The flag is cleared first and set only when the marker exists (empty: its
// contents are never read); only the text after the last '.' is replaced.
TEST(MarkerFile, ExistenceSetsTheFlag) {
    FlagRestore restore;
    const std::string probe = (std::filesystem::temp_directory_path() / "zor_marker_probe.").string();
    std::remove((probe + "xml").c_str());
    altSuperSampling = 1;
    EXPECT_EQ(probeMarkerFile((probe + "dll").c_str()), 0u);
    EXPECT_EQ(altSuperSampling, 0);
    std::FILE* f = std::fopen((probe + "xml").c_str(), "w");
    ASSERT_NE(f, nullptr);
    std::fclose(f);
    for (const char* ext : {"dll", "so", "so.5"}) {
        EXPECT_EQ(probeMarkerFile((probe + ext).c_str()), 0u);
        EXPECT_EQ(altSuperSampling, ext[2] != '.') << ext;  // "so.5" looks for "so.xml"
    }
    std::remove((probe + "xml").c_str());
}

// No '.' after the first character: a failure, and the flag cleared.
TEST(MarkerFile, PathWithoutAUsableDot) {
    FlagRestore restore;
    for (const char* path : {"nodot", ".xml", static_cast<const char*>(nullptr)}) {
        altSuperSampling = 1;
        EXPECT_EQ(probeMarkerFile(path), 0x80004005u);
        EXPECT_EQ(altSuperSampling, 0);
    }
}
