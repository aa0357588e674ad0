#include "counting_allocator.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

#if defined(__linux__)
#include <sys/mman.h>
#include <unistd.h>
#endif

namespace qorvex::host {

// Stands right before each block, in what keeps the block aligned in any case.
struct CountingAllocator::Header {
    std::uint64_t size;
    std::uint32_t offset;  // of the block in what malloc gave
    std::uint16_t tag;
    bool aligned;
};

namespace {
constexpr std::size_t kPlainAlignment = alignof(std::max_align_t);
}

void* CountingAllocator::Make(std::size_t size, std::size_t alignment, MemoryTag tag, bool aligned) {
    static_assert(sizeof(Header) == kPlainAlignment);
    const std::size_t padding = alignment > kPlainAlignment ? alignment - kPlainAlignment : 0;
    char* raw = static_cast<char*>(std::malloc(size + sizeof(Header) + padding));
    // The engine does not look for null: a game that is out of memory ends here.
    if (!raw) std::abort();
    if (reinterpret_cast<std::uintptr_t>(raw) >= heap_end_.load(std::memory_order_relaxed)) WarmHeap(raw);
    char* block = raw + sizeof(Header);
    if (padding) block += (alignment - reinterpret_cast<std::uintptr_t>(block) % alignment) % alignment;
    const Header header{size, static_cast<std::uint32_t>(block - raw), static_cast<std::uint16_t>(tag),
                        aligned};
    std::memcpy(block - sizeof(Header), &header, sizeof(Header));
    Counters& counters = counters_[header.tag % kMemoryTagLimit];
    counters.allocations.fetch_add(1, std::memory_order_relaxed);
    counters.bytes.fetch_add(size, std::memory_order_relaxed);
    return block;
}

// The C library lets its heap grow by some 130 KB. To have all of these pages at once costs a fraction of
// what it costs to fault them in one by one.
void CountingAllocator::WarmHeap([[maybe_unused]] const void* block) {
#if defined(__linux__) && defined(MADV_POPULATE_WRITE)
    constexpr std::uintptr_t kPage = 4096, kMostBytes = 1 << 20;
    const auto first = reinterpret_cast<std::uintptr_t>(block) & ~(kPage - 1);
    const auto end = reinterpret_cast<std::uintptr_t>(sbrk(0)) & ~(kPage - 1);
    // Large blocks and those of other threads lie elsewhere.
    if (first >= end || end - first > kMostBytes) return;
    madvise(reinterpret_cast<void*>(first), end - first, MADV_POPULATE_WRITE);
    heap_end_.store(end, std::memory_order_relaxed);
#endif
}

void CountingAllocator::Release(void* ptr, MemoryTag tag, bool aligned) {
    if (!ptr) return;
    Header header;
    std::memcpy(&header, static_cast<char*>(ptr) - sizeof(Header), sizeof(Header));
    if (header.tag != static_cast<std::uint32_t>(tag) || header.aligned != aligned)
        mismatches_.fetch_add(1, std::memory_order_relaxed);
    Counters& counters = counters_[header.tag % kMemoryTagLimit];
    counters.releases.fetch_add(1, std::memory_order_release);
    counters.bytes.fetch_sub(header.size, std::memory_order_relaxed);
    std::free(static_cast<char*>(ptr) - header.offset);
}

void* CountingAllocator::Allocate(std::size_t size, MemoryTag tag) {
    return Make(size, kPlainAlignment, tag, false);
}

void* CountingAllocator::Reallocate(void* ptr, std::size_t newSize, MemoryTag tag) {
    void* block = Make(newSize, kPlainAlignment, tag, false);
    if (ptr) {
        Header header;
        std::memcpy(&header, static_cast<char*>(ptr) - sizeof(Header), sizeof(Header));
        std::memcpy(block, ptr, std::min<std::size_t>(header.size, newSize));
        Release(ptr, tag, false);
    }
    return block;
}

void CountingAllocator::Deallocate(void* ptr, MemoryTag tag) {
    Release(ptr, tag, false);
}

void* CountingAllocator::AlignedAllocate(std::size_t size, std::size_t alignment, MemoryTag tag) {
    return Make(size, alignment, tag, true);
}

void CountingAllocator::AlignedDeallocate(void* ptr, MemoryTag tag) {
    Release(ptr, tag, true);
}

void* CountingAllocator::AlignedReallocate(void* ptr, std::size_t newSize, std::size_t oldSize,
                                           std::size_t alignment, MemoryTag tag) {
    void* block = Make(newSize, alignment, tag, true);
    if (ptr) {
        std::memcpy(block, ptr, std::min(oldSize, newSize));
        Release(ptr, tag, true);
    }
    return block;
}

CountingAllocator::Count CountingAllocator::ForTag(MemoryTag tag) const {
    const Counters& counters = counters_[static_cast<std::uint32_t>(tag) % kMemoryTagLimit];
    // In this order no block that other threads make and release meanwhile counts as released alone.
    const std::uint64_t releases = counters.releases.load(std::memory_order_acquire);
    const std::uint64_t allocations = counters.allocations.load(std::memory_order_relaxed);
    return {allocations - releases, counters.bytes.load(std::memory_order_relaxed), allocations};
}

CountingAllocator::Count CountingAllocator::Total() const {
    Count total;
    for (std::uint32_t tag = 0; tag < kMemoryTagLimit; ++tag) {
        const Count count = ForTag(static_cast<MemoryTag>(tag));
        total.blocks += count.blocks;
        total.bytes += count.bytes;
        total.allocations += count.allocations;
    }
    return total;
}

}  // namespace qorvex::host
