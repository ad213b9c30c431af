// The white-box suite binds the exports itself (the static library has no
// load hook), exactly as the shared library does when it is loaded.
#include <gtest/gtest.h>

#include <cstdio>

#include "frame/attach.h"

namespace {
void reportToStderr(const char* text, const char* caption) {
    std::fprintf(stderr, "%s:%s\n", caption, text);
}
}  // namespace

int main(int argc, char** argv) {
    ::testing::InitGoogleTest(&argc, argv);
    if (!zor::frame::processAttach(nullptr, reportToStderr)) return 2;
    return RUN_ALL_TESTS();
}
