// Bytes in memory as a stream. They outlive it.
#pragma once

#include <fresco/stream_reader.h>

#include <algorithm>
#include <cstring>

namespace qorvex::layout {

class MemoryStream final : public fresco::IStreamReader {
  public:
    MemoryStream(const unsigned char* data, size_t size) : data_(data), size_(size) {}

    size_t GetSize() override { return size_; }
    size_t Read(size_t offset, void* destination, size_t size) override {
        if (offset >= size_) return 0;
        const size_t count = std::min(size, size_ - offset);
        std::memcpy(destination, data_ + offset, count);
        return count;
    }
    void Close() override {}
    const void* GetData() override { return data_; }

  private:
    const unsigned char* data_;
    size_t size_;
};

}  // namespace qorvex::layout
