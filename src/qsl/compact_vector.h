// List of pointers in one word: for the child lists of trees, most of which hold nothing or one item. A
// single item lies in the word itself; more of them lie in a block, which stays when items go.
//
// T is a counted pointer or the like: the size of a pointer, movable as bytes, to objects at even addresses,
// and null only in a list whose items are taken out one by one before it is cleared.
#pragma once

#include <bit>
#include <cstdint>
#include <cstring>

#include "qsl/allocation.h"
#include "qsl/vector_base.h"

namespace qsl {

template <class T, class Alloc = std::allocator<T>>
class CompactVector {
    static_assert(sizeof(T) == sizeof(void*) && kTriviallyRelocatable<T>);

  public:
    using TriviallyRelocatable = CompactVector;
    using value_type = T;
    using iterator = T*;
    using const_iterator = const T*;

    CompactVector() = default;
    CompactVector(const CompactVector& other) { Append(other.begin(), other.size()); }
    CompactVector(CompactVector&& other) noexcept { swap(other); }
    ~CompactVector() { Release(); }

    CompactVector& operator=(const CompactVector& other) {
        if (this == &other) return *this;
        clear();
        Append(other.begin(), other.size());
        return *this;
    }
    CompactVector& operator=(CompactVector&& other) noexcept {
        if (this == &other) return *this;
        Release();
        SetWord(other.Word());
        other.SetWord(0);
        return *this;
    }

    T* data() { return HasBlock() ? Items() : Inside(); }
    const T* data() const { return const_cast<CompactVector*>(this)->data(); }
    uint32_t size() const { return HasBlock() ? Head().size : Word() != 0; }
    bool empty() const { return size() == 0; }

    T* begin() { return data(); }
    T* end() { return data() + size(); }
    const T* begin() const { return data(); }
    const T* end() const { return data() + size(); }
    T& operator[](size_t index) { return data()[index]; }
    const T& operator[](size_t index) const { return data()[index]; }
    T& front() { return *data(); }
    const T& front() const { return *data(); }
    T& back() { return data()[size() - 1]; }
    const T& back() const { return data()[size() - 1]; }

    void push_back(T item) { insert(end(), std::move(item)); }

    T* insert(const T* position, T item) {
        const uint32_t count = size(), index = static_cast<uint32_t>(position - data());
        Reserve(uint64_t{count} + 1);
        T* place = data() + index;
        RelocateOverlapping(place, count - index, place + 1);
        if (HasBlock()) Head().size = count + 1;
        return std::construct_at(place, std::move(item));
    }

    T* erase(const T* position) {
        const uint32_t count = size(), index = static_cast<uint32_t>(position - data());
        T* place = data() + index;
        // The last reference may go with it, and what dies then must find the list whole.
        const T gone = std::move(*place);
        if (!HasBlock()) {
            SetWord(0);
            return end();
        }
        RelocateOverlapping(place + 1, count - index - 1, place);
        Head().size = count - 1;
        return place;
    }

    void clear() {
        std::destroy_n(data(), size());
        if (HasBlock())
            Head().size = 0;
        else
            SetWord(0);
    }

    void swap(CompactVector& other) noexcept {
        const uintptr_t word = Word();
        SetWord(other.Word());
        other.SetWord(word);
    }

  private:
    // Stands in the first place of the block.
    struct BlockHead {
        uint32_t size;
        uint32_t capacity;
    };
    static_assert(sizeof(BlockHead) <= sizeof(T));
    static constexpr uintptr_t kBlockMark = 1;

    uintptr_t Word() const {
        uintptr_t word;
        std::memcpy(&word, word_, sizeof(word));
        return word;
    }
    void SetWord(uintptr_t word) { std::memcpy(word_, &word, sizeof(word)); }
    bool HasBlock() const { return (word_[0] & kBlockMark) != 0; }
    T* Block() const { return reinterpret_cast<T*>(Word() - kBlockMark); }
    T* Items() const { return Block() + 1; }
    T* Inside() { return reinterpret_cast<T*>(word_); }
    BlockHead& Head() const { return *reinterpret_cast<BlockHead*>(Block()); }

    void Release() {
        std::destroy_n(data(), size());
        if (HasBlock()) DeallocateArray<T, Alloc>(Block(), size_t{Head().capacity} + 1);
    }

    void Append(const T* items, uint32_t count) {
        if (count == 0) return;
        Reserve(uint64_t{size()} + count);
        std::uninitialized_copy_n(items, count, data() + size());
        if (HasBlock()) Head().size += count;
    }

    void Reserve(uint64_t count) {
        const uint32_t capacity = HasBlock() ? Head().capacity : 1;
        if (count > capacity) Grow(GrownCapacity(capacity, count));
    }
    [[gnu::noinline]] void Grow(uint32_t capacity) {
        const uint32_t count = size();
        T* block = AllocateArray<T, Alloc>(size_t{capacity} + 1);
        ::new (static_cast<void*>(block)) BlockHead{count, capacity};
        RelocateDisjoint(data(), count, block + 1);
        if (HasBlock()) DeallocateArray<T, Alloc>(Block(), size_t{Head().capacity} + 1);
        SetWord(reinterpret_cast<uintptr_t>(block) | kBlockMark);
    }

    static_assert(std::endian::native == std::endian::little, "the mark is looked for in the first byte");
    alignas(T) unsigned char word_[sizeof(T)] = {};
};

}  // namespace qsl
