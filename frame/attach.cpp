#include "frame/attach.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>

#if defined(_WIN32)
#  include <io.h>
#  include <windows.h>
#else
#  include <unistd.h>
#endif

namespace zor { namespace frame {

uint16_t productTable[256 * 256];
int32_t altSuperSampling = 0;
int boundVariant = -1;
int boundWidth = 0;

namespace {
char messageBuffer[256];
}

bool buildProductTable() {
    for (int j = 0; j < 256; ++j)
        for (int i = 0; i < 256; ++i) productTable[j * 256 + i] = static_cast<uint16_t>(i * j);
    return true;
}

uint32_t probeMarkerFile(const char* modulePath) {
    altSuperSampling = 0;
    if (!modulePath) return 0x80004005u;
    char path[1024 + 4];
    std::strncpy(path, modulePath, 1024);
    path[1024] = '\0';
    int dot = static_cast<int>(std::strlen(path)) - 1;
    while (dot >= 1 && path[dot] != '.') --dot;
    if (dot < 1) return 0x80004005u;
    std::strcpy(path + dot + 1, "xml");
#if defined(_WIN32)
    const int fd = _open(path, _O_RDONLY);
    if (fd != -1) {
        altSuperSampling = 1;
        _close(fd);
    }
#else
    const int fd = open(path, O_RDONLY);
    if (fd != -1) {
        altSuperSampling = 1;
        close(fd);
    }
#endif
    return 0;
}

void reportLoadFailure(const char* text, const char* caption) {
#if defined(_WIN32)
    MessageBeep(MB_ICONHAND);
    MessageBoxA(nullptr, text, caption, MB_ICONHAND);
#else
    // A shared object cannot refuse its own load: say why and stop here.
    std::fprintf(stderr, "%s:%s\n", caption, text);
    std::abort();
#endif
}

int processAttach(const char* modulePath, dispatch::FailureReport report) {
    int bound = -1;
    if (!dispatch::initDispatch(dispatch::libraryTable(), dispatch::liveSelector(), report,
                                messageBuffer, &bound))
        return 0;
    boundVariant = bound;
    // The wide columns assume everything of the SSSE3 one.
    const int width = bound == 4 ? cpu::usableWidth() : 128;
    const int cap = dispatch::widthCap(std::getenv("ZOR_MAX_WIDTH"));
    boundWidth = dispatch::overlayWide(dispatch::libraryTable(), width < cap ? width : cap);
    if (!buildProductTable()) return 0;
    (void)probeMarkerFile(modulePath);
    return 1;
}

}}  // namespace zor::frame
