// The client's memory. Every byte that this library holds comes from the allocator that
// `RenderingLibraryParams` names; it must be safe to call from any thread.
#pragma once
#include <cstddef>

namespace fresco {

class IAllocator {
  public:
    virtual ~IAllocator() = default;
    // `alignment` is a power of two. Null means that there is no memory.
    virtual void* Allocate(size_t size, size_t alignment) = 0;
    // `alignment` is the one that the block was asked for with; null is allowed.
    virtual void Deallocate(void* block, size_t alignment) = 0;
};

}  // namespace fresco
