// A file or buffer of the client that the library reads piecemeal: fonts and, later, media.
#pragma once
#include <cstddef>
#include <cstdint>

namespace fresco {

// May be called from any thread, by one thread at a time.
class IStreamReader {
  public:
    virtual ~IStreamReader() = default;
    virtual size_t GetSize() = 0;
    // Copies up to `size` bytes from `offset` on; returns how many were copied.
    virtual size_t Read(size_t offset, void* destination, size_t size) = 0;
    // The last call on the reader; it may delete itself.
    virtual void Close() = 0;
    // All of it in place (a mapped file, an archive in memory), unchanged until Close: whoever needs the
    // whole copies nothing then, and what nobody looks at is never fetched. Null: it is to be read.
    virtual const void* GetData() { return nullptr; }
};

}  // namespace fresco
