// The process-wide allocator and what puts it behind containers and objects. The pointer is set before
// anything else when the library starts and cleared as the last thing when it ends; the engine keeps no
// memory of its own outside that span.
#pragma once

#include <cstddef>
#include <new>
#include <type_traits>
#include <utility>

#include <qorvex/allocator.h>

#include "qsl/relocate.h"

namespace qorvex {

inline constinit IAllocator* g_allocator = nullptr;

inline IAllocator* GetAllocator() {
    return g_allocator;
}
inline void SetAllocator(IAllocator* allocator) {
    g_allocator = allocator;
}

/// Whether blocks for T under this tag use the aligned operations: tasks always do, others when the type asks
/// for more than any plain block has.
template <class T, MemoryTag Tag>
inline constexpr bool kUsesAlignedBlocks = Tag == MemoryTag::Tasks || alignof(T) > alignof(std::max_align_t);
template <class T>
inline constexpr size_t kBlockAlignment = alignof(T) > 8 ? alignof(T) : 8;

template <class T, MemoryTag Tag>
T* AllocateRaw(size_t count) {
    void* memory;
    if constexpr (kUsesAlignedBlocks<T, Tag>)
        memory = GetAllocator()->AlignedAllocate(count * sizeof(T), kBlockAlignment<T>, Tag);
    else
        memory = GetAllocator()->Allocate(count * sizeof(T), Tag);
    return static_cast<T*>(memory);
}

template <class T, MemoryTag Tag>
void DeallocateRaw(T* memory) {
    if constexpr (kUsesAlignedBlocks<T, Tag>)
        GetAllocator()->AlignedDeallocate(memory, Tag);
    else
        GetAllocator()->Deallocate(memory, Tag);
}

/// Standard-allocator adapter over the process-wide allocator with a fixed tag; every string and container of
/// the engine uses it.
template <class T, MemoryTag Tag>
class TaggedStdAllocator {
  public:
    using value_type = T;
    template <class U>
    struct rebind {
        using other = TaggedStdAllocator<U, Tag>;
    };

    TaggedStdAllocator() = default;
    template <class U>
    TaggedStdAllocator(const TaggedStdAllocator<U, Tag>&) {}

    T* allocate(size_t count) { return AllocateRaw<T, Tag>(count); }
    void deallocate(T* memory, size_t) { DeallocateRaw<T, Tag>(memory); }
    /// Only for types that may be moved as bytes.
    T* reallocate(T* memory, size_t old_count, size_t count) {
        if constexpr (kUsesAlignedBlocks<T, Tag>)
            return static_cast<T*>(GetAllocator()->AlignedReallocate(
                memory, count * sizeof(T), old_count * sizeof(T), kBlockAlignment<T>, Tag));
        else
            return static_cast<T*>(GetAllocator()->Reallocate(memory, count * sizeof(T), Tag));
    }

    friend bool operator==(const TaggedStdAllocator&, const TaggedStdAllocator&) { return true; }
};

template <class T, MemoryTag Tag, class... Args>
[[nodiscard]] T* New(Args&&... args) {
    return qsl::ConstructAt<T>(AllocateRaw<T, Tag>(1), std::forward<Args>(args)...);
}

/// A derived object may be deleted through a base with a virtual destructor when the base is its first one,
/// so that both have the same address.
template <MemoryTag Tag, class T>
void Delete(T* object) {
    if (!object) return;
    std::destroy_at(object);
    DeallocateRaw<std::remove_const_t<T>, Tag>(const_cast<std::remove_const_t<T>*>(object));
}

/// Owns one object that was made with New and the same tag.
template <class T, MemoryTag Tag = MemoryTag::General>
class UniquePtr {
  public:
    using TriviallyRelocatable = UniquePtr;
    using element_type = T;

    UniquePtr() = default;
    UniquePtr(std::nullptr_t) {}
    explicit UniquePtr(T* object) : object_(object) {}
    UniquePtr(UniquePtr&& other) noexcept : object_(other.release()) {}
    template <class U>
    requires std::is_convertible_v<U*, T*> UniquePtr(UniquePtr<U, Tag>&& other)
    noexcept : object_(other.release()) {
        static_assert(std::is_same_v<U, T> || std::has_virtual_destructor_v<T>);
        static_assert(kUsesAlignedBlocks<U, Tag> == kUsesAlignedBlocks<T, Tag>);
    }
    ~UniquePtr() { Delete<Tag>(object_); }
    UniquePtr& operator=(UniquePtr&& other) noexcept {
        reset(other.release());
        return *this;
    }

    T* get() const { return object_; }
    T* operator->() const { return object_; }
    T& operator*() const { return *object_; }
    explicit operator bool() const { return object_ != nullptr; }
    [[nodiscard]] T* release() { return std::exchange(object_, nullptr); }
    void reset(T* object = nullptr) { Delete<Tag>(std::exchange(object_, object)); }
    void swap(UniquePtr& other) noexcept { std::swap(object_, other.object_); }

    friend bool operator==(const UniquePtr& a, const UniquePtr& b) { return a.object_ == b.object_; }
    friend bool operator==(const UniquePtr& a, const T* b) { return a.object_ == b; }
    friend bool operator==(const UniquePtr& a, std::nullptr_t) { return !a.object_; }

  private:
    T* object_ = nullptr;
};

template <class T, MemoryTag Tag = MemoryTag::General, class... Args>
[[nodiscard]] UniquePtr<T, Tag> MakeUnique(Args&&... args) {
    return UniquePtr<T, Tag>(New<T, Tag>(std::forward<Args>(args)...));
}

}  // namespace qorvex
