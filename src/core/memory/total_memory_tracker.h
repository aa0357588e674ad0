// Wraps an allocator and keeps one running total of live bytes, weighted by tag. Nothing in the engine
// installs one: a client or a debug build puts it between the engine and its own allocator.
#pragma once

#include <atomic>
#include <cstdint>

#include <qorvex/allocator.h>

namespace qorvex {

/// Counts the plain operations; the aligned ones and virtual memory pass through uncounted.
class TotalMemoryTracker final : public IAllocator {
  public:
    /// Every tag weighs 1 at first. The wrapped allocator must outlive this.
    explicit TotalMemoryTracker(IAllocator& wrapped);

    /// A weight of 0 leaves the tag out of the total. Before the first allocation with the tag.
    void SetWeight(MemoryTag tag, uint32_t weight);
    /// The sum of size times weight over all live blocks.
    uint64_t GetTotal() const { return total_.load(std::memory_order_relaxed); }

    void* Allocate(size_t size, MemoryTag tag) override;
    void* Reallocate(void* ptr, size_t newSize, MemoryTag tag) override;
    void Deallocate(void* ptr, MemoryTag tag) override;
    void* AlignedAllocate(size_t size, size_t alignment, MemoryTag tag) override;
    void AlignedDeallocate(void* ptr, MemoryTag tag) override;
    void* AlignedReallocate(void* ptr, size_t newSize, size_t oldSize, size_t alignment,
                            MemoryTag tag) override;
    void* VirtualMemory(void* address, size_t size, unsigned operation, MemoryTag tag) override;

  private:
    void Count(size_t old_size, size_t new_size, MemoryTag tag);

    IAllocator& wrapped_;
    uint32_t weights_[kMemoryTagLimit];
    std::atomic<uint64_t> total_{0};
};

}  // namespace qorvex
