// Bases of counted objects. An object is born with a count of 1 and made with MakeRef, which takes that count
// over; the last Release destroys it and gives its memory back under its tag. `RefCounted` is for objects of
// one thread, `AtomicRefCounted` for those that several hold.
#pragma once

#include <atomic>
#include <cstdint>

#include "core/memory/allocator.h"
#include "qsl/ref_ptr.h"
#include "qsl/weak_ptr.h"

namespace qorvex {

using qsl::AdoptRef;
using qsl::RefPtr;

using WeakAllocator = TaggedStdAllocator<std::byte, MemoryTag::General>;
using WeakBlock = qsl::WeakBlock<WeakAllocator>;
using WeakSource = qsl::WeakSource<WeakAllocator>;
template <class T>
using WeakPtr = qsl::WeakPtr<T, WeakAllocator>;

/// T is the class whose objects are deleted: a hierarchy gives its root a virtual destructor.
template <class T, MemoryTag Tag>
class RefCounted {
  public:
    static constexpr MemoryTag kMemoryTag = Tag;
    RefCounted() = default;
    /// A copy is a new object with a count of its own.
    RefCounted(const RefCounted&) {}
    RefCounted& operator=(const RefCounted&) { return *this; }

    void AddRef() const { ++count_; }
    void Release() const {
        if (--count_ == 0) Delete<Tag>(static_cast<const T*>(this));
    }
    uint32_t RefCount() const { return count_; }
    bool HasOneRef() const { return count_ == 1; }

  protected:
    ~RefCounted() = default;

  private:
    mutable uint32_t count_ = 1;
};

template <class T, MemoryTag Tag>
class AtomicRefCounted {
  public:
    static constexpr MemoryTag kMemoryTag = Tag;
    AtomicRefCounted() = default;
    /// A copy is a new object with a count of its own.
    AtomicRefCounted(const AtomicRefCounted&) {}
    AtomicRefCounted& operator=(const AtomicRefCounted&) { return *this; }

    void AddRef() const { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() const {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) Delete<Tag>(static_cast<const T*>(this));
    }
    uint32_t RefCount() const { return count_.load(std::memory_order_relaxed); }
    /// With no other holder nobody else can raise the count, so a true answer stays true.
    bool HasOneRef() const { return count_.load(std::memory_order_acquire) == 1; }

  protected:
    ~AtomicRefCounted() = default;

  private:
    mutable std::atomic<uint32_t> count_{1};
};

template <class T, class... Args>
[[nodiscard]] RefPtr<T> MakeRef(Args&&... args) {
    return AdoptRef(New<T, T::kMemoryTag>(std::forward<Args>(args)...));
}

}  // namespace qorvex
