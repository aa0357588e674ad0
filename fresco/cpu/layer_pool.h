// Pixels of layers. Buffers wait here zeroed, so that opening a layer costs nothing and giving one back costs
// what was drawn on it.
#pragma once
#include <mutex>

#include "fresco/cpu/pixels.h"

namespace fresco::cpu {

// Threads that paint one frame share the pool.
class LayerPool {
  public:
    // Zeroed pixels; false when there is no memory or the layers in use would pass the limit.
    bool Take(int width, int height, PixelBuffer* buffer);
    // The pixels are zero again.
    void GiveBack(PixelBuffer buffer);
    void SetLimits(size_t count, size_t bytes);
    size_t maxCount() const { return maxCount_; }
    size_t maxBytes() const { return maxBytes_; }
    void Clear() { free_.clear(); }

  private:
    // All open layers together: 60 times a Full HD frame.
    static constexpr size_t kMaxBytesInUse = size_t(512) << 20;

    void Trim();

    std::mutex mutex_;
    Vector<PixelBuffer> free_;
    size_t inUse_ = 0;
    size_t maxCount_ = 8;
    size_t maxBytes_ = size_t(64) << 20;
};

}  // namespace fresco::cpu
