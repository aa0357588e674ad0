// Free list of equal objects in chunks, for the per-node records of a layout tree: they stay off the general
// allocator and close together.
//
// Invariant: every slot is a live object, a link of the free list, or has never been touched. Chunks go with
// the pool.
#pragma once

#include "core/memory/containers.h"

#include <new>

namespace qorvex::layout {

template <typename T>
class ObjectPool {
  public:
    ObjectPool() = default;
    ObjectPool(const ObjectPool&) = delete;
    ObjectPool& operator=(const ObjectPool&) = delete;
    ~ObjectPool() {
        for (Slot* chunk : chunks_)
            GetAllocator()->AlignedDeallocate(chunk, MemoryTag::LayoutNodes);
    }

    T* Make() {
        Slot* slot = free_;
        if (slot != nullptr) {
            free_ = slot->next;
        } else {
            if (fresh_ == end_) AddChunk();
            slot = fresh_++;
        }
        return new (slot->bytes) T();
    }
    void Recycle(T* object) {
        object->~T();
        Slot* slot = reinterpret_cast<Slot*>(object);
        slot->next = free_;
        free_ = slot;
    }

  private:
    union Slot {
        Slot* next;
        alignas(T) unsigned char bytes[sizeof(T)];
    };
    // 64 nodes fill some 50 KB: a page of a few hundred nodes asks the allocator a handful of times.
    static constexpr uint32_t kChunk = 64;

    void AddChunk() {
        auto* chunk = static_cast<Slot*>(
            GetAllocator()->AlignedAllocate(sizeof(Slot) * kChunk, alignof(Slot), MemoryTag::LayoutNodes));
        chunks_.push_back(chunk);
        fresh_ = chunk;
        end_ = chunk + kChunk;
    }

    Vector<Slot*, MemoryTag::LayoutNodes> chunks_;
    Slot* free_ = nullptr;
    // What is left of the last chunk, in ascending order, as a tree is built.
    Slot* fresh_ = nullptr;
    Slot* end_ = nullptr;
};

}  // namespace qorvex::layout
