// Growable array: 16 bytes, no allocation while empty, grows by half, moves simple types as bytes.
#pragma once

#include "qsl/allocation.h"
#include "qsl/vector_base.h"

namespace qsl {

template <class T, class Alloc = std::allocator<T>>
class Vector : public VectorBase<T, Vector<T, Alloc>> {
    using Base = VectorBase<T, Vector>;
    friend Base;

  public:
    using TriviallyRelocatable = Vector;

    Vector() : Base(nullptr, 0) {}
    explicit Vector(size_t count) : Vector() { this->resize(count); }
    Vector(size_t count, const T& value) : Vector() { this->resize(count, value); }
    Vector(std::initializer_list<T> items) : Vector() { this->append(items.begin(), items.end()); }
    template <std::forward_iterator It>
    Vector(It first, It last) : Vector() {
        this->append(first, last);
    }
    Vector(const Vector& other) : Vector() {
        this->reserve(other.size());
        this->append(other.begin(), other.end());
    }
    Vector(Vector&& other) noexcept : Vector() { swap(other); }
    ~Vector() { Release(); }

    Vector& operator=(const Vector& other) {
        if (this != &other) this->assign(other.begin(), other.end());
        return *this;
    }
    Vector& operator=(Vector&& other) noexcept {
        if (this != &other) {
            Release();
            this->data_ = std::exchange(other.data_, nullptr);
            this->size_ = std::exchange(other.size_, 0);
            this->capacity_ = std::exchange(other.capacity_, 0);
        }
        return *this;
    }

    void swap(Vector& other) noexcept {
        std::swap(this->data_, other.data_);
        std::swap(this->size_, other.size_);
        std::swap(this->capacity_, other.capacity_);
    }

  private:
    void Release() {
        std::destroy_n(this->data_, this->size_);
        if (this->data_) DeallocateArray<T, Alloc>(this->data_, this->capacity_);
    }

    [[gnu::noinline]] void SetCapacity(uint32_t capacity) {
        T* memory = nullptr;
        if constexpr (kTriviallyRelocatable<T> && CanReallocate<Alloc, T>) {
            if (this->data_ && capacity) {
                this->data_ = Rebind<Alloc, T>().reallocate(this->data_, this->capacity_, capacity);
                this->capacity_ = capacity;
                return;
            }
        }
        if (capacity) memory = AllocateArray<T, Alloc>(capacity);
        RelocateDisjoint(this->data_, this->size_, memory);
        if (this->data_) DeallocateArray<T, Alloc>(this->data_, this->capacity_);
        this->data_ = memory;
        this->capacity_ = capacity;
    }
};

}  // namespace qsl
