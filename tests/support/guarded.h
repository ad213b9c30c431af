// Memory against page-protected guards: a primitive that reads or writes one
// byte before or after what it was given faults at once.
//
// GuardedBuffer places `bytes` bytes flush against an inaccessible page, after
// the data (Guard::After, the default) or before it (Guard::Before); the
// other side is guarded too, a page further away.
//
// GuardedImage lays out an image inside such a buffer: a region of interest
// of width x height elements (channels included), an optional border of
// `border` pixels around it that a neighbourhood filter may read, and
// `pad` spare bytes at the end of each row.  The first row of the border (or
// of the ROI) starts right after a guard, or the last row ends right before
// one; padding and border bytes carry a fill pattern, so writes outside the
// ROI show up in outsideIntact().
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace zt {

enum class Guard { After, Before };

class GuardedBuffer {
public:
    explicit GuardedBuffer(size_t bytes, Guard where = Guard::After);
    ~GuardedBuffer();
    GuardedBuffer(const GuardedBuffer&) = delete;
    GuardedBuffer& operator=(const GuardedBuffer&) = delete;

    uint8_t* data() const { return data_; }
    size_t size() const { return bytes_; }
    template <class T>
    T* as() const { return reinterpret_cast<T*>(data_); }

private:
    uint8_t* base_ = nullptr;   // whole mapping
    size_t mapped_ = 0;
    uint8_t* data_ = nullptr;
    size_t bytes_ = 0;
};

template <class T>
class GuardedImage {
public:
    // width counts elements per row (pixels x channels).
    GuardedImage(int width, int height, int border = 0, int pad = 0, Guard where = Guard::After,
                 int channels = 1)
        : width_(width), height_(height), border_(border), channels_(channels),
          step_(static_cast<int>((width + 2 * border * channels) * sizeof(T)) + pad),
          buf_(bytesNeeded(width, height, border, pad, channels), where) {
        std::memset(buf_.data(), kFill, buf_.size());
    }

    static constexpr uint8_t kFill = 0xA5;

    int step() const { return step_; }
    int width() const { return width_; }
    int height() const { return height_; }
    // First element of the ROI.
    T* roi() const { return at(0, 0); }
    // Element x (channels included) of row y of the ROI; border coordinates
    // are negative or past the ROI.
    T* at(int x, int y) const {
        uint8_t* p = buf_.data() + static_cast<ptrdiff_t>(y + border_) * step_ +
                     static_cast<ptrdiff_t>(x + border_ * channels_) * sizeof(T);
        return reinterpret_cast<T*>(p);
    }

    // Fills every element, border included, from f(x, y).
    template <class F>
    void fill(F f) {
        for (int y = -border_; y < height_ + border_; ++y)
            for (int x = -border_ * channels_; x < width_ + border_ * channels_; ++x)
                *at(x, y) = static_cast<T>(f(x, y));
    }

    // Restores the fill pattern everywhere outside the ROI.
    void markOutside() {
        for (size_t i = 0; i < buf_.size(); ++i)
            if (!inRoi(i)) buf_.data()[i] = kFill;
    }
    // True when no byte outside the ROI differs from the fill pattern.
    bool outsideIntact() const {
        for (size_t i = 0; i < buf_.size(); ++i)
            if (!inRoi(i) && buf_.data()[i] != kFill) return false;
        return true;
    }

private:
    static size_t bytesNeeded(int width, int height, int border, int pad, int channels) {
        const size_t row = (width + 2 * border * channels) * sizeof(T);
        const size_t rows = static_cast<size_t>(height + 2 * border);
        return (rows - 1) * (row + pad) + row;
    }
    bool inRoi(size_t offset) const {
        const ptrdiff_t row = static_cast<ptrdiff_t>(offset / step_) - border_;
        const ptrdiff_t col = static_cast<ptrdiff_t>(offset % step_) -
                              static_cast<ptrdiff_t>(border_ * channels_ * sizeof(T));
        return row >= 0 && row < height_ && col >= 0 &&
               col < static_cast<ptrdiff_t>(width_ * sizeof(T));
    }

    int width_, height_, border_, channels_, step_;
    GuardedBuffer buf_;
};

}  // namespace zt
