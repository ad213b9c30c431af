// Allocators and version records.
//
// Allocation is the same on every processor: the allocators exist only in
// the generic variant and fill all five dispatch columns.  Each variant has
// its own pair of version records, so the records name the variant bound at
// load.
#include "frame/variant.h"
#include "frame/memory.h"

namespace zor { namespace ZOR_NS {

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
namespace {

// Signal blocks: length elements of Bytes bytes (the byte count wraps in
// 32 bits for absurd lengths, as documented for the allocator).
template <class T, uint32_t Bytes = sizeof(T)>
T* signalAlloc(int len) {
    if (len < 1) return nullptr;
    return static_cast<T*>(mem::alignedAlloc(static_cast<uint32_t>(len) * Bytes));
}

// Image blocks: rows padded to a multiple of 32 bytes.
template <class T, int Channels>
T* imageAlloc(int width, int height, int* pStep) {
    if (!pStep) return nullptr;
    if (width < 1 || height < 1) {
        *pStep = 0;
        return nullptr;
    }
    const uint32_t row = static_cast<uint32_t>(width) * (sizeof(T) * Channels);
    const uint32_t step = (row + mem::kAlign - 1) & ~(mem::kAlign - 1);
    *pStep = static_cast<int>(step);
    return static_cast<T*>(mem::alignedAlloc(step * static_cast<uint32_t>(height)));
}

}  // namespace

uint8_t* ZOR_CALL zorsMalloc_8u(int len) { return signalAlloc<uint8_t>(len); }
int8_t* ZOR_CALL zorsMalloc_8s(int len) { return signalAlloc<int8_t>(len); }
uint16_t* ZOR_CALL zorsMalloc_16u(int len) { return signalAlloc<uint16_t>(len); }
int16_t* ZOR_CALL zorsMalloc_16s(int len) { return signalAlloc<int16_t>(len); }
Complex8s* ZOR_CALL zorsMalloc_8sc(int len) { return signalAlloc<Complex8s>(len); }
uint32_t* ZOR_CALL zorsMalloc_32u(int len) { return signalAlloc<uint32_t>(len); }
int32_t* ZOR_CALL zorsMalloc_32s(int len) { return signalAlloc<int32_t>(len); }
float* ZOR_CALL zorsMalloc_32f(int len) { return signalAlloc<float>(len); }
Complex16s* ZOR_CALL zorsMalloc_16sc(int len) { return signalAlloc<Complex16s>(len); }
int64_t* ZOR_CALL zorsMalloc_64s(int len) { return signalAlloc<int64_t>(len); }
double* ZOR_CALL zorsMalloc_64f(int len) { return signalAlloc<double>(len); }
Complex32s* ZOR_CALL zorsMalloc_32sc(int len) { return signalAlloc<Complex32s>(len); }
Complex32f* ZOR_CALL zorsMalloc_32fc(int len) { return signalAlloc<Complex32f>(len); }
Complex64s* ZOR_CALL zorsMalloc_64sc(int len) { return signalAlloc<Complex64s>(len); }
Complex64f* ZOR_CALL zorsMalloc_64fc(int len) { return signalAlloc<Complex64f>(len); }
void ZOR_CALL zorsFree(void* ptr) { mem::alignedFree(ptr); }

uint8_t* ZOR_CALL zoriMalloc_8u_C1(int w, int h, int* s) { return imageAlloc<uint8_t, 1>(w, h, s); }
uint16_t* ZOR_CALL zoriMalloc_16u_C1(int w, int h, int* s) { return imageAlloc<uint16_t, 1>(w, h, s); }
int16_t* ZOR_CALL zoriMalloc_16s_C1(int w, int h, int* s) { return imageAlloc<int16_t, 1>(w, h, s); }
float* ZOR_CALL zoriMalloc_32f_C1(int w, int h, int* s) { return imageAlloc<float, 1>(w, h, s); }
uint8_t* ZOR_CALL zoriMalloc_8u_C4(int w, int h, int* s) { return imageAlloc<uint8_t, 4>(w, h, s); }
uint16_t* ZOR_CALL zoriMalloc_16u_C3(int w, int h, int* s) { return imageAlloc<uint16_t, 3>(w, h, s); }
int16_t* ZOR_CALL zoriMalloc_16s_C3(int w, int h, int* s) { return imageAlloc<int16_t, 3>(w, h, s); }
uint8_t* ZOR_CALL zoriMalloc_8u_C3(int w, int h, int* s) { return imageAlloc<uint8_t, 3>(w, h, s); }
float* ZOR_CALL zoriMalloc_32f_C3(int w, int h, int* s) { return imageAlloc<float, 3>(w, h, s); }
void ZOR_CALL zoriFree(void* ptr) { mem::alignedFree(ptr); }
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)

namespace {
#if ZOR_VARIANT == 0
#  define ZOR_TAG "g0"
#else
#  define ZOR_TAG "s" ZOR_STR_(ZOR_VARIANT)
#endif
#define ZOR_STR2_(x) #x
#define ZOR_STR_(x) ZOR_STR2_(x)

const LibraryVersion kSignalVersion = {5, 2, 108, 412, ZOR_TAG, "zors" ZOR_TAG "l.lib", "5.2",
                                       "Apr  5 2007"};
const LibraryVersion kImageVersion = {5, 2, 108, 410, ZOR_TAG, "zori" ZOR_TAG "l.lib", "5.2",
                                      "Apr  5 2007"};
}  // namespace

const LibraryVersion* ZOR_CALL zorsGetLibVersion(void) { return &kSignalVersion; }
const LibraryVersion* ZOR_CALL zoriGetLibVersion(void) { return &kImageVersion; }

}}  // namespace zor::ZOR_NS
