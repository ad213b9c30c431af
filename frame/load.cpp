// The module's load hook: only linked into the shared library (tests bind
// the slots themselves through processAttach).
#include "frame/attach.h"

#if defined(_WIN32)
#  include <windows.h>

extern "C" BOOL WINAPI DllMain(HINSTANCE instance, DWORD reason, LPVOID) {
    if (reason != DLL_PROCESS_ATTACH) return TRUE;
    char path[1024] = {0};
    const DWORD n = GetModuleFileNameA(instance, path, sizeof path);
    return zor::frame::processAttach(n ? path : nullptr) ? TRUE : FALSE;
}

#else
#  include <dlfcn.h>

namespace {
__attribute__((constructor)) void zorLoad() {
    Dl_info info{};
    const char* path = nullptr;
    if (dladdr(reinterpret_cast<void*>(&zorLoad), &info) && info.dli_fname) path = info.dli_fname;
    // processAttach aborts the process when no variant can be bound.
    (void)zor::frame::processAttach(path);
}
}  // namespace
#endif
