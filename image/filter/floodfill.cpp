// Flood fill of 8-bit one-channel images, in place, from a seed; the
// filled region's area and bounding box go into a ConnectedComp record.
// No memory is allocated: everything lives in the caller's buffer.
//
// Both forms grow the region one run (a horizontal stretch of pixels) at a
// time.  A run whose neighbour rows are still to be scanned waits on a stack
// of entries {row, left, right, parentLeft, parentRight, dir}: its forward
// row is row - dir, its back row row + dir (the row it was found from), in
// which the span [parentLeft, parentRight] has been dealt with already.
//
// 4Con (pixels equal to the seed's value): runs are filled as they are
// found, so a pixel never qualifies twice and no visited map is needed.  The
// forward row is scanned under the whole run, the back row only outside the
// parent span; a run found there extends as far as it goes, past the span
// scanned.  The stack starts at the buffer's first multiple of 8 (see
// PlainStack for what happens when it fills).
//
// Gradient forms: a byte map of the ROI with a one-pixel frame, at the start
// of the buffer, marks visited pixels (the frame is marked, so runs stop at
// the edges); the stack follows it.  A neighbour joins the region when its
// value lies in the window [c - minDelta, c + maxDelta] of the region pixel
// c it is reached from.  A run is filled only when it leaves the stack,
// after its neighbour rows are scanned, so every window is taken on values
// before the fill.  The 8-connected form scans one pixel further on each
// side and lets a pixel join from any of the three pixels next to it in the
// run.  Runs found here may touch (a pixel can fail its left neighbour's
// window and still join from the row above), so a scan resumes right after
// a run, and the stack can outgrow the buffer: a run that finds the stack
// full is marked 2 in the map (visited, neighbours not yet scanned) and
// picked up by a sweep of the map once the stack has drained.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

struct Span {
    int32_t row, left, right, parentLeft, parentRight, dir;
};
static_assert(sizeof(Span) == 24, "six 32-bit words: the size the buffer is made for");

// Stack bytes for four pixels, and the slack that covers aligning the stack.
constexpr int64_t kStackBytesPerFourPixels = 24;
constexpr int64_t kSlack = 32;

// Buffer bytes for a ROI: the stack, plus the visited map of the gradient
// forms in front of it.  The product is formed in 64 bits (wrapping like
// the hardware would), divided toward zero, and handed back as its low 32
// bits.
[[maybe_unused]] Status bufferSize(ImageSize roi, int* pSize, bool withMap) {
    if (Status s = checkFirst(anyNull(pSize), badRoi(roi))) return s;
    const uint64_t pixels = uint64_t(roi.width) * uint64_t(roi.height);
    const int64_t stack = int64_t(uint64_t(kStackBytesPerFourPixels) * pixels) / 4;
    const uint64_t map = withMap ? (uint64_t(roi.width) + 2) * (uint64_t(roi.height) + 2) : 0;
    *pSize = int(uint32_t(map + uint64_t(stack) + uint64_t(kSlack)));
    return StatusOk;
}

[[maybe_unused]] Status checkFill(const uint8_t* pImage, int imageStep, ImageSize roi, ImagePoint seed,
                                  const ConnectedComp* pRegion, const uint8_t* pBuffer) {
    if (Status s = checkFirst(anyNull(pImage, pRegion, pBuffer), badRoi(roi))) return s;
    if (imageStep < roi.width) return StatusBadStep;
    if (seed.x < 0 || seed.x >= roi.width || seed.y < 0 || seed.y >= roi.height) return StatusOutOfRange;
    return StatusOk;
}

// The stack's part of a buffer whose first `front` bytes hold something
// else: from the next multiple of 8 to the end of the size given above.
struct StackArea {
    uint8_t* base;
    uint64_t bytes;
    StackArea(uint8_t* buffer, size_t front, ImageSize roi) {
        const uintptr_t at = reinterpret_cast<uintptr_t>(buffer + front);
        base = reinterpret_cast<uint8_t*>((at + 7) & ~uintptr_t(7));
        bytes = uint64_t(roi.width) * uint64_t(roi.height) * kStackBytesPerFourPixels / 4 + kSlack -
                (reinterpret_cast<uintptr_t>(base) - at);
    }
    size_t entries(size_t entryBytes) const {
        const uint64_t n = bytes / entryBytes;
        return n > SIZE_MAX ? SIZE_MAX : size_t(n);
    }
};

// Area and bounding box of what was filled.
struct Region {
    int64_t area = 0;
    int minX, minY, maxX, maxY;
    Region(int x, int y) : minX(x), minY(y), maxX(x), maxY(y) {}
    void add(int row, int left, int right) {
        area += right - left + 1;
        minX = left < minX ? left : minX;
        maxX = right > maxX ? right : maxX;
        minY = row < minY ? row : minY;
        maxY = row > maxY ? row : maxY;
    }
    void write(ConnectedComp* r, uint8_t newVal) const {
        r->area = double(area);
        r->value[0] = newVal;
        r->value[1] = r->value[2] = 0;
        r->rect = ImageRect{minX, minY, maxX - minX + 1, maxY - minY + 1};
    }
};

// ---- runs of one value ---------------------------------------------------------

#if ZOR_SIMD >= 2
using Bytes = simd::Vec<uint8_t>;
constexpr uint32_t kAllLanes = ~uint32_t(0) >> (32 - Bytes::kLanes);
// Bit i set where lane i of the register at p equals v (want) or differs.
template <bool Want>
uint32_t lanesEqual(const uint8_t* p, Bytes v) {
    const uint32_t eq = uint32_t(simd::laneMask(simd::eq(simd::load<Bytes>(p), v)));
    return Want ? eq : ~eq & kAllLanes;
}
#endif

// The first x in [x, end) whose pixel equals v (Want) or differs from it
// (!Want); end when there is none.
template <bool Want>
int findRight(const uint8_t* row, int x, int end, uint8_t v) {
#if ZOR_SIMD >= 2
    const Bytes vv = simd::set1<Bytes>(v);
    for (; x + Bytes::kLanes <= end; x += Bytes::kLanes)
        if (const uint32_t hit = lanesEqual<Want>(row + x, vv)) return x + __builtin_ctz(hit);
#endif
    for (; x < end; ++x)
        if ((row[x] == v) == Want) return x;
    return end;
}

// The left end of the run of v that reaches x (row[x] is v or was filled
// from it): the smallest l <= x with row[l .. x - 1] all v.
[[maybe_unused]] int runStart(const uint8_t* row, int x, uint8_t v) {
#if ZOR_SIMD >= 2
    const Bytes vv = simd::set1<Bytes>(v);
    for (; x >= Bytes::kLanes; x -= Bytes::kLanes)
        if (const uint32_t miss = lanesEqual<false>(row + x - Bytes::kLanes, vv))
            return x - Bytes::kLanes + (31 - __builtin_clz(miss)) + 1;
#endif
    while (x > 0 && row[x - 1] == v) --x;
    return x;
}

// ---- 4Con ----------------------------------------------------------------------

// The 4Con stack.  Entries are Spans while they fit.  A region can outgrow
// that (rows of many short runs reached from both sides of the seed row, in
// a short wide ROI, say): then the entries are packed in place into 8 bytes
// each, with row, left, right and dir, and packed they stay.  Without its
// parent span an entry rescans the back row under the whole run, where the
// filled pixels no longer qualify: the same fill, a little more reading.
// Packed, the stack holds every run a region can have (runs of one row lie
// at least a pixel apart: ceil(w/2) a row at most, below 6 bytes a pixel
// over 8).  Only a ROI too large to pack (more than 3 * 2^30 pixels, whose
// buffer size no int can give) can still run out, and stops.
class PlainStack {
public:
    PlainStack(const StackArea& area, ImageSize roi)
        : area_(area), capacity_(area.entries(sizeof(Span))), columnBits_(bitsFor(roi.width - 1)),
          rowBits_(bitsFor(roi.height - 1)) {}

    bool empty() const { return top_ == 0; }

    bool push(const Span& s) {
        if (top_ == capacity_ && !pack()) return false;
        if (packed_) {
            const uint64_t v = encode(s);
            std::memcpy(area_.base + top_++ * sizeof v, &v, sizeof v);
        } else {
            std::memcpy(area_.base + top_++ * sizeof s, &s, sizeof s);
        }
        return true;
    }

    Span pop() {
        --top_;
        Span s;
        if (!packed_) {
            std::memcpy(&s, area_.base + top_ * sizeof s, sizeof s);
            return s;
        }
        uint64_t v;
        std::memcpy(&v, area_.base + top_ * sizeof v, sizeof v);
        const uint64_t column = (uint64_t(1) << columnBits_) - 1;
        s.dir = v & 1 ? -1 : 1;
        s.right = int32_t((v >> 1) & column);
        s.left = int32_t((v >> (1 + columnBits_)) & column);
        s.row = int32_t(v >> (1 + 2 * columnBits_));
        s.parentLeft = s.right + 1;  // empty
        s.parentRight = s.right;
        return s;
    }

private:
    static int bitsFor(int maxValue) {
        int bits = 0;
        while (bits < 31 && (maxValue >> bits) != 0) ++bits;
        return bits;
    }
    uint64_t encode(const Span& s) const {
        return (((uint64_t(s.row) << columnBits_ | uint32_t(s.left)) << columnBits_ | uint32_t(s.right)) << 1) |
               (s.dir < 0 ? 1 : 0);
    }
    bool pack() {
        if (packed_ || 1 + rowBits_ + 2 * columnBits_ > 64) return false;
        for (size_t i = 0; i < top_; ++i) {  // entry i moves from byte 24 i down to 8 i
            Span s;
            std::memcpy(&s, area_.base + i * sizeof s, sizeof s);
            const uint64_t v = encode(s);
            std::memcpy(area_.base + i * sizeof v, &v, sizeof v);
        }
        packed_ = true;
        capacity_ = area_.entries(sizeof(uint64_t));
        return true;
    }

    StackArea area_;
    size_t capacity_, top_ = 0;
    int columnBits_, rowBits_;
    bool packed_ = false;
};

class PlainFill {
public:
    PlainFill(uint8_t* image, int step, ImageSize roi, uint8_t old, uint8_t newVal, uint8_t* buffer)
        : image_(image), step_(step), roi_(roi), old_(old), new_(newVal), stack_(StackArea(buffer, 0, roi), roi) {}

    // Fills the run of old pixels through (x, y): [left, right].
    void fillRun(int y, int x, int& left, int& right) {
        uint8_t* row = rowAt(image_, step_, y);
        left = runStart(row, x, old_);
        right = findRight<false>(row, x + 1, roi_.width, old_) - 1;
        std::memset(row + left, new_, size_t(right - left + 1));
    }

    // Fills every run of old pixels that meets row y within [from, to] and
    // pushes it with the parent span of e and direction dir.
    bool scan(int y, int from, int to, const Span& e, int dir) {
        const uint8_t* row = rowAt(image_, step_, y);
        for (int x = findRight<true>(row, from, to + 1, old_); x <= to;
             x = findRight<true>(row, x, to + 1, old_)) {
            int left, right;
            fillRun(y, x, left, right);
            if (!stack_.push(Span{y, left, right, e.left, e.right, dir})) return false;
            x = right + 2;  // right + 1 holds another value
        }
        return true;
    }

    bool run(const Span& seed, Region& region) {
        stack_.push(seed);
        while (!stack_.empty()) {
            const Span e = stack_.pop();
            region.add(e.row, e.left, e.right);
            const int forward = e.row - e.dir, back = e.row + e.dir;
            if (forward >= 0 && forward < roi_.height && !scan(forward, e.left, e.right, e, e.dir)) return false;
            if (!scan(back, e.left, e.parentLeft - 1, e, -e.dir) || !scan(back, e.parentRight + 1, e.right, e, -e.dir))
                return false;
        }
        return true;
    }

private:
    uint8_t* image_;
    int step_;
    ImageSize roi_;
    uint8_t old_, new_;
    PlainStack stack_;
};

[[maybe_unused]] Status fill4(uint8_t* image, int step, ImageSize roi, ImagePoint seed, uint8_t newVal,
                              ConnectedComp* pRegion, uint8_t* pBuffer) {
    const uint8_t old = rowAt(image, step, seed.y)[seed.x];
    if (old == newVal) return StatusOk;
    PlainFill fill(image, step, roi, old, newVal, pBuffer);
    int left, right;
    fill.fillRun(seed.y, seed.x, left, right);
    Region region(left, seed.y);
    if (roi.height == 1)
        region.add(seed.y, left, right);
    // an empty parent span: both neighbour rows are scanned under the whole run
    else if (!fill.run(Span{seed.y, left, right, right + 1, right, seed.y == roi.height - 1 ? -1 : 1}, region))
        return StatusNoMemory;
    region.write(pRegion, newVal);
    return StatusOk;
}

// ---- gradient forms ------------------------------------------------------------

constexpr uint8_t kVisited = 1, kDeferred = 2;

template <bool Eight>
class GradientFill {
public:
    GradientFill(uint8_t* image, int step, ImageSize roi, uint8_t newVal, int minDelta, int maxDelta,
                 uint8_t* buffer)
        : image_(image), step_(step), roi_(roi), new_(newVal), minDelta_(minDelta),
          width_(unsigned(minDelta + maxDelta)), mapStride_(size_t(roi.width) + 2), map_(buffer) {
        const StackArea area(buffer, mapStride_ * (size_t(roi.height) + 2), roi);
        stack_ = reinterpret_cast<Span*>(area.base);
        capacity_ = area.entries(sizeof(Span));
        std::memset(map_, kVisited, mapStride_);
        for (int y = 0; y < roi.height; ++y) {
            uint8_t* m = mapRow(y);
            m[-1] = m[roi.width] = kVisited;
            std::memset(m, 0, size_t(roi.width));
        }
        std::memset(mapRow(roi.height) - 1, kVisited, mapStride_);
    }

    void run(ImagePoint seed, Region& region) {
        uint8_t* m = mapRow(seed.y);
        m[seed.x] = kVisited;
        int left, right;
        growRun(seed.y, seed.x, left, right);
        push(Span{seed.y, left, right, right + 1, right, seed.y == roi_.height - 1 ? -1 : 1});
        for (;;) {
            while (top_ > 0) {
                const Span e = stack_[--top_];
                scanNeighbours(e);
                std::memset(rowAt(image_, step_, e.row) + e.left, new_, size_t(e.right - e.left + 1));
                region.add(e.row, e.left, e.right);
            }
            if (!deferred_) break;
            pushDeferred();
        }
    }

private:
    uint8_t* mapRow(int y) const { return map_ + size_t(y + 1) * mapStride_ + 1; }

    // n joins from c.
    bool inWindow(int c, int n) const { return unsigned(n + minDelta_ - c) <= width_; }
#if ZOR_SIMD >= 2
    // Lane i set when to[i] is unvisited and joins from from[i]: the window
    // [c - minDelta, c + maxDelta] with its ends saturated to the byte range.
    uint32_t joinLanes(const uint8_t* from, const uint8_t* to, const uint8_t* visited) const {
        const Bytes c = simd::load<Bytes>(from), n = simd::load<Bytes>(to);
        const Bytes in = simd::eq(simd::max(n, simd::subSat(c, minDeltas_)), n) &
                         simd::eq(simd::min(n, simd::addSat(c, maxDeltas_)), n);
        return uint32_t(simd::laneMask(in & simd::eq(simd::load<Bytes>(visited), simd::zero<Bytes>())));
    }
#endif

    // Extends the visited pixel (x, y) to its run: [left, right], a register
    // of pixels at a time while the run goes through them.
    void growRun(int y, int x, int& left, int& right) const {
        const uint8_t* row = rowAt(image_, step_, y);
        uint8_t* m = mapRow(y);
        left = right = x;
#if ZOR_SIMD >= 2
        constexpr int L = Bytes::kLanes;
        for (int n = L; n == L && right + 1 + L <= roi_.width; right += n) {  // lane i: right + 1 + i
            const uint32_t joins = joinLanes(row + right, row + right + 1, m + right + 1);
            n = joins == kAllLanes ? L : __builtin_ctz(~joins);
            std::memset(m + right + 1, kVisited, size_t(n));
        }
        for (int n = L; n == L && left - L >= 0; left -= n) {  // lane i: left - L + i
            const uint32_t joins = joinLanes(row + left - L + 1, row + left - L, m + left - L);
            n = joins == kAllLanes ? L : L - 1 - (31 - __builtin_clz(~joins & kAllLanes));
            std::memset(m + left - n, kVisited, size_t(n));
        }
#endif
        while (!m[left - 1] && inWindow(row[left], row[left - 1])) m[--left] = kVisited;
        while (!m[right + 1] && inWindow(row[right], row[right + 1])) m[++right] = kVisited;
    }

    void push(const Span& s) {
        if (top_ < capacity_) {
            stack_[top_++] = s;
            return;
        }
        std::memset(mapRow(s.row) + s.left, kDeferred, size_t(s.right - s.left + 1));
        deferred_ = true;
    }

    void scanNeighbours(const Span& e) {
        const int reach = Eight ? 1 : 0;
        const int forward = e.row - e.dir, back = e.row + e.dir;
        scan(forward, e.left - reach, e.right + reach, e, e.dir);
        scan(back, e.left - reach, e.parentLeft - 1, e, -e.dir);
        scan(back, e.parentRight + 1, e.right + reach, e, -e.dir);
    }

    // Every unvisited pixel of row y within [from, to] that joins from the
    // run of e, grown to its run and pushed.
    void scan(int y, int from, int to, const Span& e, int dir) {
        if (y < 0 || y >= roi_.height) return;
        from = from < 0 ? 0 : from;
        to = to >= roi_.width ? roi_.width - 1 : to;
        const uint8_t* row = rowAt(image_, step_, y);
        const uint8_t* parent = rowAt(image_, step_, e.row);
        uint8_t* m = mapRow(y);
        for (int x = from; x <= to; ++x) {
            if (m[x] || !joins(parent, x, e, row[x])) continue;
            m[x] = kVisited;
            int left, right;
            growRun(y, x, left, right);
            push(Span{y, left, right, e.left, e.right, dir});
            x = right;  // right + 1 failed right's window but may join from the parent run
        }
    }

    bool joins(const uint8_t* parent, int x, const Span& e, int n) const {
        if (!Eight) return inWindow(parent[x], n);
        const int lo = x - 1 < e.left ? e.left : x - 1, hi = x + 1 > e.right ? e.right : x + 1;
        for (int p = lo; p <= hi; ++p)
            if (inWindow(parent[p], n)) return true;
        return false;
    }

    // Pushes the deferred runs (as many as fit), each with an empty parent
    // span so that both its neighbour rows are scanned.
    void pushDeferred() {
        deferred_ = false;
        for (int y = 0; y < roi_.height; ++y) {
            uint8_t* m = mapRow(y);
            for (int x = 0; x < roi_.width; ++x) {
                if (m[x] != kDeferred) continue;
                if (top_ == capacity_) {
                    deferred_ = true;
                    return;
                }
                const int left = x;
                while (m[x + 1] == kDeferred) ++x;
                std::memset(m + left, kVisited, size_t(x - left + 1));
                stack_[top_++] = Span{y, left, x, x + 1, x, 1};
            }
        }
    }

    uint8_t* image_;
    int step_;
    ImageSize roi_;
    uint8_t new_;
    int minDelta_;
    unsigned width_;  // minDelta + maxDelta
#if ZOR_SIMD >= 2
    Bytes minDeltas_ = simd::set1<Bytes>(uint8_t(minDelta_)), maxDeltas_ = simd::set1<Bytes>(uint8_t(width_ - minDelta_));
#endif
    size_t mapStride_;
    uint8_t* map_;
    Span* stack_;
    size_t capacity_, top_ = 0;
    bool deferred_ = false;
};

template <bool Eight>
Status fillGradient(uint8_t* pImage, int imageStep, ImageSize roi, ImagePoint seed, uint8_t newVal,
                    uint8_t minDelta, uint8_t maxDelta, ConnectedComp* pRegion, uint8_t* pBuffer) {
    if (Status s = checkFill(pImage, imageStep, roi, seed, pRegion, pBuffer)) return s;
    GradientFill<Eight> fill(pImage, imageStep, roi, newVal, minDelta, maxDelta, pBuffer);
    Region region(seed.x, seed.y);
    fill.run(seed, region);
    region.write(pRegion, newVal);
    return StatusOk;
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zoriFloodFillGetSize(ImageSize roiSize, int* pSize) { return bufferSize(roiSize, pSize, false); }
Status ZOR_CALL zoriFloodFillGetSize_Grad(ImageSize roiSize, int* pSize) { return bufferSize(roiSize, pSize, true); }
#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zoriFloodFill_4Con_8u_C1IR(uint8_t* pImage, int imageStep, ImageSize roiSize, ImagePoint seed,
                                           uint8_t newVal, ConnectedComp* pRegion, uint8_t* pBuffer) {
    if (Status s = checkFill(pImage, imageStep, roiSize, seed, pRegion, pBuffer)) return s;
    return fill4(pImage, imageStep, roiSize, seed, newVal, pRegion, pBuffer);
}

Status ZOR_CALL zoriFloodFill_Grad4Con_8u_C1IR(uint8_t* pImage, int imageStep, ImageSize roiSize, ImagePoint seed,
                                               uint8_t newVal, uint8_t minDelta, uint8_t maxDelta,
                                               ConnectedComp* pRegion, uint8_t* pBuffer) {
    return fillGradient<false>(pImage, imageStep, roiSize, seed, newVal, minDelta, maxDelta, pRegion, pBuffer);
}

Status ZOR_CALL zoriFloodFill_Grad8Con_8u_C1IR(uint8_t* pImage, int imageStep, ImageSize roiSize, ImagePoint seed,
                                               uint8_t newVal, uint8_t minDelta, uint8_t maxDelta,
                                               ConnectedComp* pRegion, uint8_t* pBuffer) {
    return fillGradient<true>(pImage, imageStep, roiSize, seed, newVal, minDelta, maxDelta, pRegion, pBuffer);
}
#endif

}}  // namespace zor::ZOR_NS
