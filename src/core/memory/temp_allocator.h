// Temporary memory: a linear arena per thread. Allocation moves a pointer; memory goes back all at once, when
// a TempMark leaves its scope. Valid only inside a ThreadScope.
#pragma once

#include <cstddef>
#include <cstdint>

#include "core/limits.h"
#include "core/memory/allocator.h"
#include "qsl/vector.h"

namespace qorvex {

/// One thread's arena. Blocks are filled in order; `current_` is the one being filled, and none behind it
/// exists.
class TempAllocator {
  public:
    TempAllocator();
    ~TempAllocator();
    TempAllocator(const TempAllocator&) = delete;
    TempAllocator& operator=(const TempAllocator&) = delete;

    void* Allocate(size_t size, size_t alignment) {
        Block& block = blocks_[current_];
        const uintptr_t top = reinterpret_cast<uintptr_t>(block.memory) + block.used;
        const size_t padding = (alignment - top % alignment) % alignment;
        if (block.used + padding + size <= block.capacity) [[likely]] {
            block.used += padding + size;
            return reinterpret_cast<void*>(top + padding);
        }
        return AllocateInNewBlock(size, alignment);
    }

    /// Bytes used in all blocks up to the current one.
    size_t Mark() const { return used_before_ + blocks_[current_].used; }
    /// Frees the blocks behind the one that the mark lies in and resets that one.
    void Release(size_t mark) {
        if (mark < used_before_ || (current_ && mark == used_before_)) [[unlikely]]
            return ReleaseBlocks(mark);
        Block& block = blocks_[current_];
        if (mark - used_before_ < block.used) block.used = mark - used_before_;
    }
    size_t BlockCount() const { return blocks_.size(); }

    TempAllocator* next_free = nullptr;
    uint32_t scope_count = 0;

  private:
    struct Block {
        std::byte* memory;
        size_t used;
        size_t capacity;
    };
    [[gnu::noinline]] void* AllocateInNewBlock(size_t size, size_t alignment);
    void AddBlock(size_t capacity);
    [[gnu::noinline]] void ReleaseBlocks(size_t mark);

    qsl::Vector<Block, TaggedStdAllocator<Block, MemoryTag::General>> blocks_;
    uint32_t current_ = 0;
    size_t used_before_ = 0;  ///< In the blocks before the current one.
};

/// The calling thread's arena.
TempAllocator& CurrentTempAllocator();

/// Gives back all temporary memory that was taken since it was made.
class TempMark {
  public:
    TempMark() : allocator_(CurrentTempAllocator()), mark_(allocator_.Mark()) {}
    ~TempMark() { allocator_.Release(mark_); }
    TempMark(const TempMark&) = delete;
    TempMark& operator=(const TempMark&) = delete;

  private:
    TempAllocator& allocator_;
    size_t mark_;
};

/// Standard-allocator adapter over temporary memory; it frees nothing.
template <class T>
class TempStdAllocator {
  public:
    using value_type = T;
    TempStdAllocator() = default;
    template <class U>
    TempStdAllocator(const TempStdAllocator<U>&) {}
    T* allocate(size_t count) {
        return static_cast<T*>(CurrentTempAllocator().Allocate(count * sizeof(T), alignof(T)));
    }
    void deallocate(T*, size_t) {}
    friend bool operator==(const TempStdAllocator&, const TempStdAllocator&) { return true; }
};

}  // namespace qorvex
