// Typed pools for small objects that are made by the thousand.
//
// MTPoolObject is shared by all threads; a class derives from it (`class Frame : public MTPoolObject<Frame,
// ...>`) or a pool is named beside the class. PoolObject belongs to one thread and one owner, and goes with
// it.
#pragma once

#include <utility>

#include "core/memory/object_pool.h"

namespace qorvex {

/// An object is destroyed when it is given back and made anew when it is taken.
struct MTPoolObjectReconstructPolicy {
    template <class T, class... Args>
    static T* Make(void* memory, Args&&... args) {
        return qsl::ConstructAt<T>(memory, std::forward<Args>(args)...);
    }
    template <class T>
    static void Recycle(T* object) {
        std::destroy_at(object);
    }
};

/// `N` objects make a chunk, and a batch between threads.
template <class T, MemoryTag Tag, uint32_t N, class Policy = MTPoolObjectReconstructPolicy>
class MTPoolObject {
  public:
    using PoolType = MTPoolObject;

    template <class... Args>
    [[nodiscard]] static T* Take(Args&&... args) {
        return Policy::template Make<T>(pool_.Take(), std::forward<Args>(args)...);
    }
    static void Give(T* object) {
        Policy::Recycle(object);
        pool_.Give(object);
    }

  private:
    static constexpr size_t Alignment() {
        static_assert(sizeof(T) >= ObjectPool::kSmallestObject && alignof(T) <= alignof(std::max_align_t));
        return alignof(T) > 8 ? alignof(T) : 8;
    }
    static inline constinit ObjectPool pool_{sizeof(T), Alignment(), N, Tag};
};

/// The pool that a class derives from.
template <class T>
using Pool = typename T::PoolType;

/// Chunks of N objects of one owner on one thread. All objects are given back before the pool goes.
template <class T, MemoryTag Tag, uint32_t N>
class PoolObject {
  public:
    PoolObject() = default;
    PoolObject(const PoolObject&) = delete;
    PoolObject& operator=(const PoolObject&) = delete;
    ~PoolObject() {
        while (chunks_)
            Delete<Tag>(std::exchange(chunks_, chunks_->next));
    }

    template <class... Args>
    [[nodiscard]] T* Take(Args&&... args) {
        if (!free_) AddChunk();
        FreeObject* memory = std::exchange(free_, free_->next);
        return qsl::ConstructAt<T>(memory, std::forward<Args>(args)...);
    }
    void Give(T* object) {
        std::destroy_at(object);
        free_ = ::new (static_cast<void*>(object)) FreeObject{free_};
    }

  private:
    static_assert(sizeof(T) >= sizeof(FreeObject));
    struct Chunk {
        Chunk* next;
        alignas(T) std::byte objects[N][sizeof(T)];
    };
    void AddChunk() {
        auto* chunk = ::new (AllocateRaw<Chunk, Tag>(1)) Chunk;
        chunk->next = std::exchange(chunks_, chunk);
        for (uint32_t i = N; i-- > 0;)
            free_ = ::new (static_cast<void*>(chunk->objects[i])) FreeObject{free_};
    }

    Chunk* chunks_ = nullptr;
    FreeObject* free_ = nullptr;
};

}  // namespace qorvex
