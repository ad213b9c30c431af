// The argument sets the tests use, recorded for the fuzzer's seed corpus.
#pragma once

#include "tests/support/variants.h"

namespace zt {

// A copy of `real` whose entries record each distinct call into `path`
// ("name param=value ...") before they run.
Api recordingApi(const Api& real, const char* path);

}  // namespace zt
