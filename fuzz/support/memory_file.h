// A file that stands in memory, as a client's stream.
#pragma once

#include <fresco/stream_reader.h>

#include <algorithm>
#include <cstdint>
#include <cstring>

namespace qorvex::fuzz {

/// Read by itself it may be a local; handed over, it is from the heap and goes when it is closed.
class MemoryFile final : public fresco::IStreamReader {
  public:
    MemoryFile(const uint8_t* data, size_t size) : data_(data), size_(size) {}
    size_t GetSize() override { return size_; }
    size_t Read(size_t offset, void* destination, size_t size) override {
        size = offset < size_ ? std::min(size, size_ - offset) : 0;
        if (size) std::memcpy(destination, data_ + offset, size);
        return size;
    }
    void Close() override { delete this; }

  private:
    const uint8_t* data_;
    size_t size_;
};

}  // namespace qorvex::fuzz
