#pragma once

#include <qorvex/allocator.h>

#include <array>
#include <atomic>
#include <cstddef>
#include <cstdint>

namespace qorvex::host {

// malloc that counts per tag and checks each release against its allocation. Any thread, no lock.
class CountingAllocator final : public IAllocator {
  public:
    struct Count {
        std::uint64_t blocks = 0;       // live
        std::uint64_t bytes = 0;        // live, as requested
        std::uint64_t allocations = 0;  // ever made
    };

    void* Allocate(std::size_t size, MemoryTag tag) override;
    void* Reallocate(void* ptr, std::size_t newSize, MemoryTag tag) override;
    void Deallocate(void* ptr, MemoryTag tag) override;
    void* AlignedAllocate(std::size_t size, std::size_t alignment, MemoryTag tag) override;
    void AlignedDeallocate(void* ptr, MemoryTag tag) override;
    void* AlignedReallocate(void* ptr, std::size_t newSize, std::size_t oldSize, std::size_t alignment,
                            MemoryTag tag) override;

    [[nodiscard]] Count ForTag(MemoryTag tag) const;
    [[nodiscard]] Count Total() const;
    // Releases with another tag or operation than the block was made with. Must be 0.
    [[nodiscard]] std::uint64_t Mismatches() const { return mismatches_.load(std::memory_order_relaxed); }

  private:
    struct Counters {
        std::atomic<std::uint64_t> bytes{0};
        std::atomic<std::uint64_t> allocations{0};
        std::atomic<std::uint64_t> releases{0};
    };
    struct Header;

    void* Make(std::size_t size, std::size_t alignment, MemoryTag tag, bool aligned);
    void Release(void* ptr, MemoryTag tag, bool aligned);
    void WarmHeap(const void* block);

    std::array<Counters, kMemoryTagLimit> counters_;
    std::atomic<std::uint64_t> mismatches_{0};
    /// What lies below it in the C library's heap is in memory.
    std::atomic<std::uintptr_t> heap_end_{0};
};

}  // namespace qorvex::host
