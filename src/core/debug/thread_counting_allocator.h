// The client's allocator with a counter per thread in front, for frame statistics. Installed only on request:
// it costs each allocation one more call.
#pragma once

#include <qorvex/allocator.h>

namespace qorvex {

class ThreadCountingAllocator final : public IAllocator {
  public:
    explicit ThreadCountingAllocator(IAllocator& client) : client_(client) {}

    // Requests of the calling thread so far, through any object of this class.
    static uint64_t CountOnThisThread() { return count_; }
    IAllocator& GetClient() const { return client_; }

    void* Allocate(size_t size, MemoryTag tag) override {
        ++count_;
        return client_.Allocate(size, tag);
    }
    void* Reallocate(void* ptr, size_t new_size, MemoryTag tag) override {
        ++count_;
        return client_.Reallocate(ptr, new_size, tag);
    }
    void Deallocate(void* ptr, MemoryTag tag) override { client_.Deallocate(ptr, tag); }
    void* AlignedAllocate(size_t size, size_t alignment, MemoryTag tag) override {
        ++count_;
        return client_.AlignedAllocate(size, alignment, tag);
    }
    void AlignedDeallocate(void* ptr, MemoryTag tag) override { client_.AlignedDeallocate(ptr, tag); }
    void* AlignedReallocate(void* ptr, size_t new_size, size_t old_size, size_t alignment,
                            MemoryTag tag) override {
        ++count_;
        return client_.AlignedReallocate(ptr, new_size, old_size, alignment, tag);
    }
    void* VirtualMemory(void* address, size_t size, unsigned operation, MemoryTag tag) override {
        return client_.VirtualMemory(address, size, operation, tag);
    }

  private:
    static inline constinit thread_local uint64_t count_ = 0;
    IAllocator& client_;
};

}  // namespace qorvex
