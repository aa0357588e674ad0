// What Vector and SmallVector share. Both hold a pointer, a 32-bit size and a 32-bit capacity; they differ in
// where the first items live, which is the derived class's `SetCapacity`.
//
// Invariant: [data_, data_ + size_) are live objects, up to data_ + capacity_ is raw memory.
#pragma once

#include <cstdint>
#include <cstdlib>
#include <initializer_list>
#include <iterator>
#include <span>

#include "qsl/relocate.h"

namespace qsl {

inline constexpr uint64_t kMaxVectorSize = 0xFFFFFFFFu;

/// Half as much again, at least one more, at least what is needed.
inline uint32_t GrownCapacity(uint32_t capacity, uint64_t needed) {
    // An allocator must not fail, so a list that no longer fits its 32-bit size has nowhere to go.
    if (needed > kMaxVectorSize) std::abort();
    uint64_t grown = capacity + (uint64_t{capacity} + 1) / 2;
    if (grown < needed) grown = needed;
    return static_cast<uint32_t>(grown < kMaxVectorSize ? grown : kMaxVectorSize);
}

template <class T, class Derived>
class VectorBase {
  public:
    using value_type = T;
    using size_type = uint32_t;
    using iterator = T*;
    using const_iterator = const T*;
    using reference = T&;
    using const_reference = const T&;

    T* data() { return data_; }
    const T* data() const { return data_; }
    uint32_t size() const { return size_; }
    uint32_t capacity() const { return capacity_; }
    bool empty() const { return size_ == 0; }

    T* begin() { return data_; }
    T* end() { return data_ + size_; }
    const T* begin() const { return data_; }
    const T* end() const { return data_ + size_; }
    auto rbegin() { return std::reverse_iterator<T*>(end()); }
    auto rend() { return std::reverse_iterator<T*>(begin()); }
    auto rbegin() const { return std::reverse_iterator<const T*>(end()); }
    auto rend() const { return std::reverse_iterator<const T*>(begin()); }

    T& operator[](size_t index) { return data_[index]; }
    const T& operator[](size_t index) const { return data_[index]; }
    T& front() { return data_[0]; }
    const T& front() const { return data_[0]; }
    T& back() { return data_[size_ - 1]; }
    const T& back() const { return data_[size_ - 1]; }

    void reserve(size_t capacity) {
        if (capacity <= capacity_) return;
        if (capacity > kMaxVectorSize) std::abort();
        self().SetCapacity(static_cast<uint32_t>(capacity));
    }

    void shrink_to_fit() {
        if (size_ < capacity_) self().SetCapacity(size_);
    }

    template <class... Args>
    T& emplace_back(Args&&... args) {
        if (size_ == capacity_) [[unlikely]]
            return EmplaceBackGrowing(std::forward<Args>(args)...);
        T* item = ConstructAt<T>(data_ + size_, std::forward<Args>(args)...);
        ++size_;
        return *item;
    }

    void push_back(const T& value) { emplace_back(value); }
    void push_back(T&& value) { emplace_back(std::move(value)); }

    void pop_back() {
        --size_;
        std::destroy_at(data_ + size_);
    }

    /// The last item, moved out.
    T take_back() {
        T value = std::move(back());
        pop_back();
        return value;
    }

    void clear() {
        std::destroy_n(data_, size_);
        size_ = 0;
    }

    void resize(size_t count) {
        if (count < size_) return truncate(count);
        GrowFor(count);
        std::uninitialized_value_construct_n(data_ + size_, count - size_);
        size_ = static_cast<uint32_t>(count);
    }

    void resize(size_t count, const T& value) {
        if (count < size_) return truncate(count);
        T copy = value;
        GrowFor(count);
        std::uninitialized_fill_n(data_ + size_, count - size_, copy);
        size_ = static_cast<uint32_t>(count);
    }

    void truncate(size_t count) {
        if (count >= size_) return;
        std::destroy_n(data_ + count, size_ - count);
        size_ = static_cast<uint32_t>(count);
    }

    template <class... Args>
    T* emplace(const T* position, Args&&... args) {
        const size_t index = static_cast<size_t>(position - data_);
        T value = Make(std::forward<Args>(args)...);
        return std::construct_at(OpenGap(index, 1), std::move(value));
    }

    T* insert(const T* position, const T& value) { return emplace(position, value); }
    T* insert(const T* position, T&& value) { return emplace(position, std::move(value)); }

    /// The range must not lie inside this vector.
    template <std::forward_iterator It>
    T* insert(const T* position, It first, It last) {
        const size_t count = static_cast<size_t>(std::distance(first, last));
        T* gap = OpenGap(static_cast<size_t>(position - data_), count);
        std::uninitialized_copy(first, last, gap);
        return gap;
    }

    /// The range must not lie inside this vector.
    template <std::forward_iterator It>
    void append(It first, It last) {
        insert(end(), first, last);
    }
    void append(std::span<const T> items) { insert(end(), items.begin(), items.end()); }

    template <std::forward_iterator It>
    void assign(It first, It last) {
        clear();
        append(first, last);
    }
    void assign(size_t count, const T& value) {
        T copy = value;
        clear();
        resize(count, copy);
    }

    T* erase(const T* position) { return erase(position, position + 1); }

    T* erase(const T* first, const T* last) {
        T* gap = data_ + (first - data_);
        const size_t count = static_cast<size_t>(last - first);
        if (!count) return gap;
        std::destroy_n(gap, count);
        RelocateOverlapping(gap + count, static_cast<size_t>(end() - (gap + count)), gap);
        size_ -= static_cast<uint32_t>(count);
        return gap;
    }

    /// Removes one item in constant time: the last item takes its place.
    void erase_unordered(size_t index) {
        if (index + 1 != size_) data_[index] = std::move(back());
        pop_back();
    }

    /// Keeps the order of what stays; returns how many items went.
    template <class Predicate>
    size_t erase_if(Predicate&& goes) {
        T* kept = begin();
        for (T* item = begin(); item != end(); ++item) {
            if (goes(*item)) continue;
            if (kept != item) *kept = std::move(*item);
            ++kept;
        }
        const size_t gone = static_cast<size_t>(end() - kept);
        truncate(static_cast<size_t>(kept - begin()));
        return gone;
    }

    template <class Value>
    T* find(const Value& value) {
        T* item = begin();
        while (item != end() && !(*item == value))
            ++item;
        return item;
    }
    template <class Value>
    const T* find(const Value& value) const {
        return const_cast<VectorBase*>(this)->find(value);
    }
    template <class Value>
    bool contains(const Value& value) const {
        return find(value) != end();
    }

    friend bool operator==(const Derived& a, const Derived& b) {
        if (a.size() != b.size()) return false;
        for (uint32_t i = 0; i < a.size(); ++i)
            if (!(a[i] == b[i])) return false;
        return true;
    }

  protected:
    VectorBase(T* data, uint32_t capacity) : data_(data), capacity_(capacity) {}
    ~VectorBase() = default;

    Derived& self() { return static_cast<Derived&>(*this); }

    template <class... Args>
    static T Make(Args&&... args) {
        if constexpr (std::is_constructible_v<T, Args...>)
            return T(std::forward<Args>(args)...);
        else
            return T{std::forward<Args>(args)...};
    }

    void GrowFor(uint64_t count) {
        if (count > capacity_) self().SetCapacity(GrownCapacity(capacity_, count));
    }

    /// Raw memory for `count` items at `index`, already counted in the size.
    T* OpenGap(size_t index, size_t count) {
        GrowFor(uint64_t{size_} + count);
        if (count) RelocateOverlapping(data_ + index, size_ - index, data_ + index + count);
        size_ += static_cast<uint32_t>(count);
        return data_ + index;
    }

    template <class... Args>
    [[gnu::noinline]] T& EmplaceBackGrowing(Args&&... args) {
        // The arguments may refer to an item of this vector: build the new one before the others move.
        T value = Make(std::forward<Args>(args)...);
        GrowFor(uint64_t{size_} + 1);
        T* item = std::construct_at(data_ + size_, std::move(value));
        ++size_;
        return *item;
    }

    T* data_;
    uint32_t size_ = 0;
    uint32_t capacity_;
};

}  // namespace qsl
