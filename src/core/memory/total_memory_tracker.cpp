#include "core/memory/total_memory_tracker.h"

#include <algorithm>
#include <cstddef>

namespace qorvex {
namespace {

/// The size word in front of a block takes as much room as keeps the block aligned for any type.
constexpr size_t kHeader = alignof(std::max_align_t);
static_assert(kHeader >= sizeof(size_t));

size_t& SizeOf(void* block) {
    return *static_cast<size_t*>(block);
}
void* UserOf(void* block) {
    return static_cast<std::byte*>(block) + kHeader;
}
void* BlockOf(void* user) {
    return static_cast<std::byte*>(user) - kHeader;
}

}  // namespace

TotalMemoryTracker::TotalMemoryTracker(IAllocator& wrapped) : wrapped_(wrapped) {
    std::fill(std::begin(weights_), std::end(weights_), 1u);
}

void TotalMemoryTracker::SetWeight(MemoryTag tag, uint32_t weight) {
    const auto index = static_cast<uint32_t>(tag);
    if (index < kMemoryTagLimit) weights_[index] = weight;
}

void TotalMemoryTracker::Count(size_t old_size, size_t new_size, MemoryTag tag) {
    const auto index = static_cast<uint32_t>(tag);
    if (index >= kMemoryTagLimit) return;
    // Unsigned arithmetic wraps, so a shrinking block takes away what it lost.
    total_.fetch_add((uint64_t{new_size} - uint64_t{old_size}) * weights_[index], std::memory_order_relaxed);
}

void* TotalMemoryTracker::Allocate(size_t size, MemoryTag tag) {
    return Reallocate(nullptr, size, tag);
}

void* TotalMemoryTracker::Reallocate(void* ptr, size_t newSize, MemoryTag tag) {
    void* block;
    if (ptr) {
        const size_t old_size = SizeOf(BlockOf(ptr));
        block = wrapped_.Reallocate(BlockOf(ptr), newSize + kHeader, tag);
        Count(old_size, newSize, tag);
    } else {
        block = wrapped_.Allocate(newSize + kHeader, tag);
        Count(0, newSize, tag);
    }
    SizeOf(block) = newSize;
    return UserOf(block);
}

void TotalMemoryTracker::Deallocate(void* ptr, MemoryTag tag) {
    if (!ptr) return;
    Count(SizeOf(BlockOf(ptr)), 0, tag);
    wrapped_.Deallocate(BlockOf(ptr), tag);
}

void* TotalMemoryTracker::AlignedAllocate(size_t size, size_t alignment, MemoryTag tag) {
    return wrapped_.AlignedAllocate(size, alignment, tag);
}

void TotalMemoryTracker::AlignedDeallocate(void* ptr, MemoryTag tag) {
    wrapped_.AlignedDeallocate(ptr, tag);
}

void* TotalMemoryTracker::AlignedReallocate(void* ptr, size_t newSize, size_t oldSize, size_t alignment,
                                            MemoryTag tag) {
    return wrapped_.AlignedReallocate(ptr, newSize, oldSize, alignment, tag);
}

void* TotalMemoryTracker::VirtualMemory(void* address, size_t size, unsigned operation, MemoryTag tag) {
    return wrapped_.VirtualMemory(address, size, operation, tag);
}

}  // namespace qorvex
