// Intrusive counted pointer. T has AddRef() and Release(); an object is born with a count of 1, which
// `AdoptRef` takes over. Whether the count is atomic is T's decision.
#pragma once

#include <cstddef>
#include <type_traits>
#include <utility>

#include "qsl/hash.h"

namespace qsl {

template <class T>
class RefPtr {
  public:
    using TriviallyRelocatable = RefPtr;
    using element_type = T;

    RefPtr() = default;
    RefPtr(std::nullptr_t) {}
    RefPtr(T* object) : object_(object) { AddRef(); }
    RefPtr(const RefPtr& other) : object_(other.object_) { AddRef(); }
    RefPtr(RefPtr&& other) noexcept : object_(std::exchange(other.object_, nullptr)) {}
    template <class U>
    requires std::is_convertible_v<U*, T*> RefPtr(const RefPtr<U>& other) : object_(other.get()) { AddRef(); }
    template <class U>
    requires std::is_convertible_v<U*, T*> RefPtr(RefPtr<U>&& other)
    noexcept : object_(other.leak()) {}
    ~RefPtr() {
        if (object_) object_->Release();
    }

    RefPtr& operator=(RefPtr other) noexcept {
        swap(other);
        return *this;
    }

    /// Takes over a count that the caller holds.
    [[nodiscard]] static RefPtr Adopt(T* object) {
        RefPtr pointer;
        pointer.object_ = object;
        return pointer;
    }
    /// Hands the count to the caller.
    [[nodiscard]] T* leak() { return std::exchange(object_, nullptr); }

    T* get() const { return object_; }
    T* operator->() const { return object_; }
    T& operator*() const { return *object_; }
    explicit operator bool() const { return object_ != nullptr; }
    void reset() { RefPtr().swap(*this); }
    void swap(RefPtr& other) noexcept { std::swap(object_, other.object_); }

    friend bool operator==(const RefPtr& a, const RefPtr& b) { return a.object_ == b.object_; }
    friend bool operator==(const RefPtr& a, const T* b) { return a.object_ == b; }
    friend bool operator==(const RefPtr& a, std::nullptr_t) { return !a.object_; }

  private:
    void AddRef() {
        if (object_) object_->AddRef();
    }
    T* object_ = nullptr;
};

template <class T>
[[nodiscard]] RefPtr<T> AdoptRef(T* object) {
    return RefPtr<T>::Adopt(object);
}

template <class T>
struct DefaultHash<RefPtr<T>> {
    using Lookup = const T*;
    static uint64_t Hash(const T* key) { return HashPointer(key); }
    static bool Equal(const RefPtr<T>& a, const T* b) { return a.get() == b; }
};

}  // namespace qsl
