// Bytes of one response: one block that the client fills and that parsers and decoders then read in place.
// Shared by count, so that the parsed page can keep its source without a copy. Written by one thread before
// it is finished, read-only afterwards.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

#include "core/memory/ref_counted.h"

namespace qorvex {

class ResourceBuffer : public AtomicRefCounted<ResourceBuffer, MemoryTag::Resources> {
  public:
    // One zero byte follows the data when `terminated`.
    explicit ResourceBuffer(bool terminated) : terminated_(terminated) {}
    ~ResourceBuffer();

    // Keeps the old contents up to the smaller size. The first size is taken as told; when it grows later it
    // grows by half, so that an answer in small pieces is not copied over and over.
    uint8_t* Resize(size_t size);
    std::span<const uint8_t> Bytes() const { return {data_, size_}; }
    std::string_view Text() const { return {reinterpret_cast<const char*>(data_), size_}; }

  private:
    uint8_t* data_ = nullptr;
    size_t size_ = 0;
    size_t capacity_ = 0;
    bool terminated_;
};

}  // namespace qorvex
