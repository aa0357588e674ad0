// The part of an object pool that does not depend on the type: chunks, spare batches, and the calling
// thread's list. An object taken on one thread and given on another goes to the second one's list; a thread
// holds fewer than 2N free objects, and hands N of them on in one batch, so there is one lock for every N
// operations.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>

#include "core/memory/allocator.h"
#include "core/memory/thread_scope.h"
#include "qsl/mutex.h"

namespace qorvex {

/// Whether objects come from pools; set before the first is made, while no other thread is in a scope.
/// Without pools each is a block of its own.
void SetPoolsEnabled(bool enabled);
bool ArePoolsEnabled();

/// Gives all chunks of all pools back. No pooled object may be left, and no thread but the caller inside a
/// scope.
void FreePoolChunks();

/// One pool, process-wide, made by the compiler and never destroyed.
class ObjectPool {
  public:
    static constexpr size_t kSmallestObject = 2 * sizeof(void*);

    static constexpr uint32_t kUnbounded = 0xFFFFFFFF;
    /// Numbers 1 to this are given out by hand.
    static constexpr uint32_t kFixedNumbers = 3;

    /// `number` is 0, for one of its own when it is first used, or a fixed one.
    constexpr ObjectPool(size_t object_size, size_t alignment, uint32_t batch, MemoryTag tag,
                         uint32_t max_chunks = kUnbounded, uint32_t number = 0)
        : stride_((object_size + alignment - 1) / alignment * alignment),
          alignment_(alignment),
          batch_(batch),
          max_chunks_(max_chunks),
          tag_(tag),
          index_(number) {}

    /// Null when the pool has as many chunks as it may have and this thread finds none of their objects free.
    void* Take() {
        PoolList* lists = t_thread_record.pool_lists;
        // The list of pools that are not in use yet is always empty.
        const uint32_t index = index_.load(std::memory_order_acquire);
        return lists && lists[index].head ? TakeFrom(lists[index]) : TakeSlowly();
    }
    void Give(void* object) {
        PoolList* lists = t_thread_record.pool_lists;
        const uint32_t index = index_.load(std::memory_order_acquire);
        lists&& index != kUnregistered ? GiveTo(lists[index], object) : GiveSlowly(object);
    }

    // The parts of Take and Give, for one who knows the list of the pool.
    static void* TakeFrom(PoolList& list) {
        FreeObject* object = list.head;
        list.head = object->next;
        --list.count;
        return object;
    }
    /// How many there are then; a batch is to be put aside.
    static uint32_t Add(PoolList& list, void* memory) {
        list.head = ::new (memory) FreeObject{list.head};
        return ++list.count;
    }
    void* TakeSlowly();
    void GiveSlowly(void* object);
    void PutAside(PoolList& list) QSL_EXCLUDES(mutex_);

  private:
    friend void FreePoolChunks();
    struct Chunk {
        Chunk* next;
    };
    /// A spare batch of N objects, chained through the first of them so that handing on allocates nothing.
    struct Batch {
        FreeObject head;
        Batch* below;
    };
    /// Also of a pool that finds no number left.
    static constexpr uint32_t kUnregistered = 0;

    void GiveTo(PoolList& list, void* memory) {
        if (Add(list, memory) == batch_) [[unlikely]]
            PutAside(list);
    }
    uint32_t Index();
    void TakeNumber() QSL_REQUIRES(mutex_);
    void Enlist() QSL_REQUIRES(mutex_);
    bool Refill(PoolList& list) QSL_EXCLUDES(mutex_);
    void AddChunk() QSL_REQUIRES(mutex_);
    uint32_t FreeChunks() QSL_EXCLUDES(mutex_);

    const size_t stride_;
    const size_t alignment_;
    const uint32_t batch_;
    const uint32_t max_chunks_;
    const MemoryTag tag_;
    std::atomic<uint32_t> index_;
    bool enlisted_ QSL_GUARDED_BY(mutex_) = false;
    bool asked_for_number_ QSL_GUARDED_BY(mutex_) = false;
    ObjectPool* next_pool_ = nullptr;
    qsl::Mutex mutex_;
    Chunk* chunks_ QSL_GUARDED_BY(mutex_) = nullptr;
    uint32_t chunk_count_ QSL_GUARDED_BY(mutex_) = 0;
    uint32_t fresh_count_ QSL_GUARDED_BY(mutex_) = 0;
    /// The objects of the newest chunk that were never taken.
    std::byte* fresh_ QSL_GUARDED_BY(mutex_) = nullptr;
    Batch* spare_ QSL_GUARDED_BY(mutex_) = nullptr;
};

}  // namespace qorvex
