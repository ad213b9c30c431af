/* Loads zor, asks it what it bound to, and prints that: a first look at the
 * library from an ordinary C program. */
#include <stdio.h>

#include "zor.h"
#include "zor_ext.h"

int zorDemoProcessorType(void);
int zorDemoSelectedVariant(void);

static void printVersion(const char* what, const LibraryVersion* v) {
    printf("%-6s %d.%d.%d.%d  tag %-2s  %s  \"%s\"  built %s\n", what, v->major, v->minor,
           v->buildSeries, v->build, v->cpuTag, v->libraryName, v->versionText, v->buildDate);
}

int main(void) {
    static const char* const names[5] = {"generic x86", "SSE", "SSE2", "SSE3", "SSSE3"};
    const LibraryVersion* s = zorsGetLibVersion();
    const LibraryVersion* i = zoriGetLibVersion();
    int variant = zorDemoSelectedVariant();

    printVersion("signal", s);
    printVersion("image", i);
    printf("processor-type code %d, selected variant %d (%s)\n", zorDemoProcessorType(), variant,
           variant >= 0 && variant <= 4 ? names[variant] : "?");
#if defined(__x86_64__)
    printf("register width bound: %d bits (ZOR_MAX_WIDTH caps it)\n", zorGetBoundWidth());
#endif

    /* A round trip through the allocator: 32-byte aligned rows. */
    {
        int step = 0;
        uint8_t* img = zoriMalloc_8u_C3(640, 480, &step);
        printf("zoriMalloc_8u_C3(640, 480): step %d, aligned %s\n", step,
               img && ((uintptr_t)img % 32) == 0 ? "yes" : "no");
        zoriFree(img);
    }
    return 0;
}
