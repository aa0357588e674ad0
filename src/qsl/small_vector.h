// Vector with room for N items inside the object; it allocates only beyond them.
#pragma once

#include "qsl/allocation.h"
#include "qsl/vector_base.h"

namespace qsl {

template <class T, uint32_t N, class Alloc = std::allocator<T>>
class SmallVector : public VectorBase<T, SmallVector<T, N, Alloc>> {
    using Base = VectorBase<T, SmallVector>;
    friend Base;
    static_assert(N > 0);

  public:
    SmallVector() : Base(Inline(), N) {}
    explicit SmallVector(size_t count) : SmallVector() { this->resize(count); }
    SmallVector(size_t count, const T& value) : SmallVector() { this->resize(count, value); }
    SmallVector(std::initializer_list<T> items) : SmallVector() { this->append(items.begin(), items.end()); }
    template <std::forward_iterator It>
    SmallVector(It first, It last) : SmallVector() {
        this->append(first, last);
    }
    SmallVector(const SmallVector& other) : SmallVector() { this->append(other.begin(), other.end()); }
    SmallVector(SmallVector&& other) noexcept : SmallVector() { TakeFrom(other); }
    ~SmallVector() { Release(); }

    SmallVector& operator=(const SmallVector& other) {
        if (this != &other) this->assign(other.begin(), other.end());
        return *this;
    }
    SmallVector& operator=(SmallVector&& other) noexcept {
        if (this != &other) {
            Release();
            Reset();
            TakeFrom(other);
        }
        return *this;
    }

    void swap(SmallVector& other) noexcept { std::swap(*this, other); }

    bool is_inline() const { return this->data_ == reinterpret_cast<const T*>(room_); }

  private:
    T* Inline() { return reinterpret_cast<T*>(room_); }

    void Reset() {
        this->data_ = Inline();
        this->size_ = 0;
        this->capacity_ = N;
    }

    void Release() {
        std::destroy_n(this->data_, this->size_);
        if (!is_inline()) DeallocateArray<T, Alloc>(this->data_, this->capacity_);
    }

    void TakeFrom(SmallVector& other) {
        if (other.is_inline()) {
            RelocateDisjoint(other.data_, other.size_, this->data_);
            this->size_ = std::exchange(other.size_, 0);
            return;
        }
        this->data_ = other.data_;
        this->size_ = other.size_;
        this->capacity_ = other.capacity_;
        other.Reset();
    }

    [[gnu::noinline]] void SetCapacity(uint32_t capacity) {
        const bool inside = capacity <= N;
        if (inside && is_inline()) return;
        T* memory = inside ? Inline() : AllocateArray<T, Alloc>(capacity);
        RelocateDisjoint(this->data_, this->size_, memory);
        if (!is_inline()) DeallocateArray<T, Alloc>(this->data_, this->capacity_);
        this->data_ = memory;
        this->capacity_ = inside ? N : capacity;
    }

    alignas(T) unsigned char room_[N * sizeof(T)];
};

}  // namespace qsl
