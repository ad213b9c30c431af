// The one export outside the manifest: which register width the bound
// entries use (x86-64 only; declared in include/zor_ext.h).
#include "zor_ext.h"

#include "frame/attach.h"

#if defined(__x86_64__)
extern "C" __attribute__((visibility("default"))) int zorGetBoundWidth(void) {
    return zor::frame::boundWidth;
}
#endif
