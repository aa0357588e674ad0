// Weak pointers. An object that can be watched owns a WeakBlock, made when the first watcher asks; the block
// outlives the object until the last watcher goes. The counts are atomic, so watchers may be dropped on any
// thread; whether the object is still there is asked on the object's own thread only.
//
// T declares `WeakBlock<Alloc>* GetWeakBlock()` (usually by holding a WeakSource).
#pragma once

#include <atomic>
#include <cstdint>
#include <utility>

#include "qsl/allocation.h"
#include "qsl/hash.h"

namespace qsl {

template <class Alloc>
class WeakBlock {
  public:
    static WeakBlock* Make() { return ::new (AllocateArray<WeakBlock, Alloc>(1)) WeakBlock(); }

    void AddRef() { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) DeallocateArray<WeakBlock, Alloc>(this, 1);
    }
    bool alive() const { return alive_.load(std::memory_order_acquire); }
    void Expire() { alive_.store(false, std::memory_order_release); }

  private:
    WeakBlock() = default;
    std::atomic<uint32_t> count_{1};
    std::atomic<bool> alive_{true};
};

/// The member of a watched object: makes its block on demand and expires it at the end.
template <class Alloc>
class WeakSource {
  public:
    WeakSource() = default;
    WeakSource(const WeakSource&) {}
    WeakSource& operator=(const WeakSource&) { return *this; }
    ~WeakSource() { Expire(); }

    WeakBlock<Alloc>* Get() {
        if (!block_) block_ = WeakBlock<Alloc>::Make();
        return block_;
    }
    /// From here on all watchers see nothing.
    void Expire() {
        if (!block_) return;
        block_->Expire();
        std::exchange(block_, nullptr)->Release();
    }

  private:
    WeakBlock<Alloc>* block_ = nullptr;
};

template <class T, class Alloc>
class WeakPtr {
  public:
    using TriviallyRelocatable = WeakPtr;

    WeakPtr() = default;
    WeakPtr(std::nullptr_t) {}
    WeakPtr(T* object) : object_(object), block_(object ? object->GetWeakBlock() : nullptr) { AddRef(); }
    WeakPtr(const WeakPtr& other) : object_(other.object_), block_(other.block_) { AddRef(); }
    WeakPtr(WeakPtr&& other) noexcept
        : object_(std::exchange(other.object_, nullptr)), block_(std::exchange(other.block_, nullptr)) {}
    template <class U>
    requires std::is_convertible_v<U*, T*> WeakPtr(const WeakPtr<U, Alloc>& other)
        : object_(other.object_), block_(other.block_) {
        AddRef();
    }
    ~WeakPtr() {
        if (block_) block_->Release();
    }
    WeakPtr& operator=(WeakPtr other) noexcept {
        std::swap(object_, other.object_);
        std::swap(block_, other.block_);
        return *this;
    }

    /// The object, or null once it has gone.
    T* get() const { return block_ && block_->alive() ? object_ : nullptr; }
    T* operator->() const { return get(); }
    explicit operator bool() const { return get() != nullptr; }
    bool expired() const { return !get(); }
    void reset() { *this = WeakPtr(); }

    /// Same object once, also after it has gone.
    friend bool operator==(const WeakPtr& a, const WeakPtr& b) { return a.block_ == b.block_; }
    friend bool operator==(const WeakPtr& a, const T* b) { return a.get() == b; }
    friend bool operator==(const WeakPtr& a, std::nullptr_t) { return !a.get(); }
    uint64_t HashValue() const { return HashPointer(block_); }

  private:
    template <class U, class A>
    friend class WeakPtr;

    void AddRef() {
        if (block_) block_->AddRef();
    }
    T* object_ = nullptr;
    WeakBlock<Alloc>* block_ = nullptr;
};

}  // namespace qsl
