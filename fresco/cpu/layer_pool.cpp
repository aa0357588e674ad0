#include "fresco/cpu/layer_pool.h"

namespace fresco::cpu {

bool LayerPool::Take(int width, int height, PixelBuffer* buffer) {
    const std::lock_guard<std::mutex> lock(mutex_);
    const size_t pixels = size_t(width) * size_t(height);
    if (inUse_ + pixels * 4 > kMaxBytesInUse) return false;
    size_t best = free_.size();
    for (size_t i = 0; i < free_.size(); ++i) {
        // A buffer far larger than needed is left for a layer of its size.
        const size_t capacity = free_[i].capacity();
        if (capacity < pixels || capacity > pixels * 4 + 65536) continue;
        if (best == free_.size() || capacity < free_[best].capacity()) best = i;
    }
    if (best < free_.size()) {
        *buffer = std::move(free_[best]);
        std::swap(free_[best], free_.back());
        free_.pop_back();
        buffer->Reshape(width, height);
    } else if (!buffer->Allocate(width, height)) {
        return false;
    }
    inUse_ += pixels * 4;
    return true;
}

void LayerPool::GiveBack(PixelBuffer buffer) {
    const std::lock_guard<std::mutex> lock(mutex_);
    inUse_ -= std::min(inUse_, buffer.bytes());
    free_.push_back(std::move(buffer));
    Trim();
}

void LayerPool::SetLimits(size_t count, size_t bytes) {
    maxCount_ = count;
    maxBytes_ = bytes;
    Trim();
}

void LayerPool::Trim() {
    size_t bytes = 0;
    for (const PixelBuffer& buffer : free_)
        bytes += buffer.capacity() * 4;
    while (!free_.empty() && (free_.size() > maxCount_ || bytes > maxBytes_)) {
        bytes -= free_.front().capacity() * 4;
        free_.erase(free_.begin());
    }
}

}  // namespace fresco::cpu
