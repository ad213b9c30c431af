/* zor.h compiled as C: the records, codes and declarations are all valid C,
 * and a C caller reaches the exports. */
#include "zor.h"

#include <string.h>

int ztHeaderFromC(void) {
    const LibraryVersion* v = zorsGetLibVersion();
    ImageSize size = {4, 2};
    ImageRect rect = {0, 0, 4, 2};
    ImagePoint point = {1, 1};
    Complex32f c = {1.0f, -1.0f};
    int step = 0;
    uint8_t* img = zoriMalloc_8u_C1(size.width, size.height, &step);
    int ok = v != NULL && v->major == 5 && img != NULL && step == 32 && rect.width == 4 &&
             point.y == 1 && c.im < 0 && StatusOk == 0 && StatusNullPointer == -8 &&
             MaskSize3x3 == 33 && InterSuper == 8;
    memset(img, 0, (size_t)step * (size_t)size.height);
    zoriFree(img);
    return ok;
}
