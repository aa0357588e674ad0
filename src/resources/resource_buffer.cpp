#include "resources/resource_buffer.h"

#include <algorithm>

namespace qorvex {

ResourceBuffer::~ResourceBuffer() {
    if (data_) GetAllocator()->Deallocate(data_, MemoryTag::Resources);
}

uint8_t* ResourceBuffer::Resize(size_t size) {
    const size_t needed = size + (terminated_ ? 1 : 0);
    if (needed > capacity_) {
        capacity_ = std::max(needed, capacity_ + capacity_ / 2);
        data_ = static_cast<uint8_t*>(GetAllocator()->Reallocate(data_, capacity_, MemoryTag::Resources));
    }
    if (terminated_) data_[size] = 0;
    size_ = size;
    return data_;
}

}  // namespace qorvex
