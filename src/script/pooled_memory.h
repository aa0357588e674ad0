// Memory for small objects that script makes and drops by the thousand: events, rectangles, token lists.
#pragma once

#include <cstddef>

#include "core/memory/object_pool.h"

namespace qorvex::script {

// A pool for a class and the classes that derive from it, up to `kBytes` an object; larger ones are blocks of
// their own. For use in operator new and the sized operator delete of that class.
template <class T, size_t kBytes, uint32_t kBatch = 32>
class PooledMemory {
  public:
    [[nodiscard]] static void* Take(size_t size) {
        return size <= kBytes ? pool_.Take() : GetAllocator()->Allocate(size, MemoryTag::DOM);
    }
    static void Give(void* memory, size_t size) {
        if (size <= kBytes) return pool_.Give(memory);
        GetAllocator()->Deallocate(memory, MemoryTag::DOM);
    }

  private:
    static constexpr size_t kAlignment =
        kBytes % alignof(std::max_align_t) == 0 ? alignof(std::max_align_t) : 8;
    static inline constinit ObjectPool pool_{kBytes, kAlignment, kBatch, MemoryTag::DOM};
};

// The two operators in a class's public section.
#define QORVEX_POOLED(Name, bytes)                                       \
    static void* operator new(size_t size) {                             \
        return ::qorvex::script::PooledMemory<Name, bytes>::Take(size);  \
    }                                                                    \
    static void operator delete(void* memory, size_t size) {             \
        ::qorvex::script::PooledMemory<Name, bytes>::Give(memory, size); \
    }

}  // namespace qorvex::script
