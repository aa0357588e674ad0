#include "resources/resource_buffer.h"

namespace qorvex {

ResourceBuffer::~ResourceBuffer() {
    if (data_) GetAllocator()->Deallocate(data_, MemoryTag::Resources);
}

uint8_t* ResourceBuffer::Resize(size_t size) {
    const size_t needed = size + (terminated_ ? 1 : 0);
    if (needed == 0) {
        if (data_) GetAllocator()->Deallocate(data_, MemoryTag::Resources);
        data_ = nullptr;
    } else {
        data_ = static_cast<uint8_t*>(GetAllocator()->Reallocate(data_, needed, MemoryTag::Resources));
        if (terminated_) data_[size] = 0;
    }
    size_ = size;
    return data_;
}

}  // namespace qorvex
