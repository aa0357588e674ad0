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
        const uintptr_t place = (top_ + alignment - 1) & ~(uintptr_t{alignment} - 1);
        if (place <= end_ && size <= end_ - place) [[likely]] {
            top_ = place + size;
            return reinterpret_cast<void*>(place);
        }
        return AllocateInNewBlock(size, alignment);
    }

    /// Bytes used in all blocks up to the current one.
    size_t Mark() const { return top_ - origin_; }
    /// Frees the blocks behind the one that the mark lies in and resets that one.
    void Release(size_t mark) {
        if (mark < used_before_ || (current_ && mark == used_before_)) [[unlikely]]
            return ReleaseBlocks(mark);
        if (origin_ + mark < top_) top_ = origin_ + mark;
    }
    size_t BlockCount() const { return blocks_.size(); }

    TempAllocator* next_free = nullptr;
    uint32_t scope_count = 0;

  private:
    struct Block {
        std::byte* memory;
        size_t capacity;
        size_t used;  ///< Once a later one is being filled.

        uintptr_t Begin() const { return reinterpret_cast<uintptr_t>(memory); }
    };
    [[gnu::noinline]] void* AllocateInNewBlock(size_t size, size_t alignment);
    void AddBlock(size_t capacity);
    void Fill(uint32_t block, size_t used);
    [[gnu::noinline]] void ReleaseBlocks(size_t mark);

    qsl::Vector<Block, TaggedStdAllocator<Block, MemoryTag::General>> blocks_;
    uintptr_t top_ = 0;
    uintptr_t end_ = 0;
    /// Where mark 0 would lie if the blocks before the current one stood in front of it without a gap.
    uintptr_t origin_ = 0;
    size_t used_before_ = 0;  ///< In the blocks before the current one.
    uint32_t current_ = 0;
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
