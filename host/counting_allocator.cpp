#include "counting_allocator.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>

namespace qorvex::host {

// Stands right before each block.
struct CountingAllocator::Header {
    void* raw;  // what malloc gave
    std::uint64_t size;
    std::uint32_t tag;
    std::uint32_t aligned;
};

namespace {
constexpr std::size_t kPlainAlignment = alignof(std::max_align_t);
}

void* CountingAllocator::Make(std::size_t size, std::size_t alignment, MemoryTag tag, bool aligned) {
    alignment = std::max(alignment, kPlainAlignment);
    char* raw = static_cast<char*>(std::malloc(size + sizeof(Header) + alignment));
    // The engine does not look for null: a game that is out of memory ends here.
    if (!raw) std::abort();
    const auto first = reinterpret_cast<std::uintptr_t>(raw) + sizeof(Header);
    char* block = raw + sizeof(Header) + (alignment - first % alignment) % alignment;
    const Header header{raw, size, static_cast<std::uint32_t>(tag), aligned};
    std::memcpy(block - sizeof(Header), &header, sizeof(Header));
    Counters& counters = counters_[header.tag % kMemoryTagLimit];
    counters.blocks.fetch_add(1, std::memory_order_relaxed);
    counters.bytes.fetch_add(size, std::memory_order_relaxed);
    counters.allocations.fetch_add(1, std::memory_order_relaxed);
    return block;
}

void CountingAllocator::Release(void* ptr, MemoryTag tag, bool aligned) {
    if (!ptr) return;
    Header header;
    std::memcpy(&header, static_cast<char*>(ptr) - sizeof(Header), sizeof(Header));
    if (header.tag != static_cast<std::uint32_t>(tag) ||
        header.aligned != static_cast<std::uint32_t>(aligned)) {
        mismatches_.fetch_add(1, std::memory_order_relaxed);
    }
    Counters& counters = counters_[header.tag % kMemoryTagLimit];
    counters.blocks.fetch_sub(1, std::memory_order_relaxed);
    counters.bytes.fetch_sub(header.size, std::memory_order_relaxed);
    std::free(header.raw);
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
    return {counters.blocks.load(std::memory_order_relaxed), counters.bytes.load(std::memory_order_relaxed),
            counters.allocations.load(std::memory_order_relaxed)};
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
