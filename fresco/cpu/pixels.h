// Pixel memory: RGBA8, premultiplied, r in the low byte. Device coordinates are whole pixels of the frame; a
// layer's bitmap covers a rectangle of them.
#pragma once
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>

#include <fresco/geometry.h>
#include "fresco/core/heap.h"

namespace fresco::cpu {

// Half open: x1 and y1 are not part of it.
struct IRect {
    int x0 = 0, y0 = 0, x1 = 0, y1 = 0;

    int Width() const { return x1 - x0; }
    int Height() const { return y1 - y0; }
    bool IsEmpty() const { return x0 >= x1 || y0 >= y1; }
    bool operator==(const IRect&) const = default;
    bool Contains(const IRect& r) const { return r.x0 >= x0 && r.y0 >= y0 && r.x1 <= x1 && r.y1 <= y1; }
};

inline IRect Intersect(const IRect& a, const IRect& b) {
    const IRect r{std::max(a.x0, b.x0), std::max(a.y0, b.y0), std::min(a.x1, b.x1), std::min(a.y1, b.y1)};
    return r.IsEmpty() ? IRect{} : r;
}

inline IRect Unite(const IRect& a, const IRect& b) {
    if (a.IsEmpty()) return b;
    if (b.IsEmpty()) return a;
    return {std::min(a.x0, b.x0), std::min(a.y0, b.y0), std::max(a.x1, b.x1), std::max(a.y1, b.y1)};
}

// Rounds out; numbers far off the screen are held where int arithmetic stays safe.
inline IRect RoundOut(double x0, double y0, double x1, double y1) {
    constexpr double kFar = 1 << 24;
    const auto clamp = [=](double v) { return int(std::clamp(v, -kFar, kFar)); };
    if (!(x0 < x1) || !(y0 < y1)) return {};
    return {clamp(std::floor(x0)), clamp(std::floor(y0)), clamp(std::ceil(x1)), clamp(std::ceil(y1))};
}

// A view of pixels that covers `bounds` of the device.
struct Bitmap {
    uint8_t* data = nullptr;
    size_t pitch = 0;  // bytes
    IRect bounds;

    // Indexed by device x.
    uint32_t* Row(int y) const {
        return reinterpret_cast<uint32_t*>(data + size_t(y - bounds.y0) * pitch) - bounds.x0;
    }
};

// Owned pixels. Allocate fails softly and gives zeroed memory.
class PixelBuffer {
  public:
    PixelBuffer() = default;
    ~PixelBuffer() { Free(); }
    PixelBuffer(PixelBuffer&& other) noexcept { *this = std::move(other); }
    PixelBuffer& operator=(PixelBuffer&& other) noexcept {
        std::swap(pixels_, other.pixels_);
        std::swap(width_, other.width_);
        std::swap(height_, other.height_);
        std::swap(capacity_, other.capacity_);
        return *this;
    }
    PixelBuffer(const PixelBuffer&) = delete;
    PixelBuffer& operator=(const PixelBuffer&) = delete;

    bool Allocate(int width, int height) {
        Free();
        const size_t bytes = size_t(width) * size_t(height) * 4;
        pixels_ = static_cast<uint32_t*>(HeapAllocate(bytes, kAlignment));
        if (!pixels_) return false;
        std::memset(pixels_, 0, bytes);
        width_ = width, height_ = height, capacity_ = bytes / 4;
        return true;
    }
    // Another shape in the same memory, content as it is.
    void Reshape(int width, int height) { width_ = width, height_ = height; }
    void Free() {
        HeapFree(pixels_, kAlignment);
        pixels_ = nullptr;
        width_ = height_ = 0;
        capacity_ = 0;
    }
    uint32_t* pixels() const { return pixels_; }
    uint32_t* Row(int y) const { return pixels_ + size_t(y) * size_t(width_); }
    int width() const { return width_; }
    int height() const { return height_; }
    size_t bytes() const { return size_t(width_) * size_t(height_) * 4; }
    size_t capacity() const { return capacity_; }  // in pixels
    Bitmap View(int x, int y) const {
        return {reinterpret_cast<uint8_t*>(pixels_), size_t(width_) * 4, {x, y, x + width_, y + height_}};
    }

  private:
    static constexpr size_t kAlignment = 64;
    uint32_t* pixels_ = nullptr;
    int width_ = 0, height_ = 0;
    size_t capacity_ = 0;
};

// a * b / 255, rounded.
inline uint32_t MulDiv255(uint32_t a, uint32_t b) {
    const uint32_t t = a * b + 128;
    return (t + (t >> 8)) >> 8;
}

// All four channels of a pixel times a / 255.
inline uint32_t ScalePixel(uint32_t pixel, uint32_t a) {
    uint32_t rb = (pixel & 0x00FF00FF) * a + 0x00800080;
    uint32_t ga = ((pixel >> 8) & 0x00FF00FF) * a + 0x00800080;
    rb = (rb + ((rb >> 8) & 0x00FF00FF)) >> 8 & 0x00FF00FF;
    ga = (ga + ((ga >> 8) & 0x00FF00FF)) & 0xFF00FF00;
    return rb | ga;
}

inline uint32_t PackPixel(float r, float g, float b, float a) {
    const auto byte = [](float v) { return uint32_t(std::clamp(v, 0.0f, 1.0f) * 255.0f + 0.5f); };
    return byte(r) | byte(g) << 8 | byte(b) << 16 | byte(a) << 24;
}

}  // namespace fresco::cpu
