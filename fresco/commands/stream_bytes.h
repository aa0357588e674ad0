// The bytes of a stream while it is written. Room that is asked for is not cleared: the caller writes all of
// it.
#pragma once
#include <cstdint>
#include <cstring>

#include "fresco/core/heap.h"

namespace fresco {

class StreamBytes {
  public:
    StreamBytes() = default;
    StreamBytes(const StreamBytes&) = delete;
    StreamBytes& operator=(const StreamBytes&) = delete;
    ~StreamBytes() {
        if (data_) HeapFree(data_, kAlignment);
    }

    const uint8_t* data() const { return data_; }
    uint8_t* data() { return data_; }
    size_t size() const { return size_; }
    size_t capacity() const { return capacity_; }
    bool empty() const { return size_ == 0; }
    void clear() { size_ = 0; }
    void reserve(size_t capacity) {
        if (capacity > capacity_) Enlarge(capacity);
    }
    // Room for `count` more bytes at the end.
    uint8_t* Extend(size_t count) {
        if (count > capacity_ - size_) Enlarge(size_ + count > 2 * capacity_ ? size_ + count : 2 * capacity_);
        uint8_t* room = data_ + size_;
        size_ += count;
        return room;
    }

  private:
    static constexpr size_t kAlignment = alignof(uint64_t);

    void Enlarge(size_t capacity) {
        auto* larger = static_cast<uint8_t*>(HeapAllocate(capacity, kAlignment));
        if (!larger) HeapExhausted(capacity);
        if (size_) std::memcpy(larger, data_, size_);
        if (data_) HeapFree(data_, kAlignment);
        data_ = larger;
        capacity_ = capacity;
    }

    uint8_t* data_ = nullptr;
    size_t size_ = 0;
    size_t capacity_ = 0;
};

}  // namespace fresco
