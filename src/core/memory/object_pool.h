// The part of an object pool that does not depend on the type: chunks, spare batches, and the calling
// thread's list. An object taken on one thread and given on another goes to the second one's list; a thread
// holds fewer than 2N free objects, and hands the oldest N on in one batch, so there is one lock for every N
// operations.
#pragma once

#include <atomic>
#include <cstddef>
#include <cstdint>

#include "core/memory/allocator.h"
#include "core/memory/pool_cache.h"
#include "qsl/mutex.h"

namespace qorvex {

/// Whether objects come from pools; set before the first is made. Without pools each is a block of its own.
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

    constexpr ObjectPool(size_t object_size, size_t alignment, uint32_t batch, MemoryTag tag,
                         uint32_t max_chunks = kUnbounded)
        : object_size_(object_size),
          alignment_(alignment),
          batch_(batch),
          max_chunks_(max_chunks),
          tag_(tag) {}

    /// Null when the pool has as many chunks as it may have and this thread finds none of their objects free.
    void* Take();
    void Give(void* object);

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
    static constexpr int32_t kUnregistered = -1;

    /// The fast road: null when the thread is in no scope or the pool is not in use yet, or not at all.
    PoolList* ListOfThisThread();
    static void* TakeFrom(PoolList& list);
    void GiveTo(PoolList& list, void* object);
    void* TakeSlowly();
    void GiveSlowly(void* object);
    int32_t Index();
    void Register() QSL_REQUIRES(mutex_);
    bool Refill(PoolList& list) QSL_EXCLUDES(mutex_);
    void HandOn(PoolList& list) QSL_EXCLUDES(mutex_);
    FreeObject* AddChunk() QSL_REQUIRES(mutex_);
    uint32_t FreeChunks() QSL_EXCLUDES(mutex_);

    const size_t object_size_;
    const size_t alignment_;
    const uint32_t batch_;
    const uint32_t max_chunks_;
    const MemoryTag tag_;
    std::atomic<int32_t> index_{kUnregistered};
    ObjectPool* next_pool_ = nullptr;
    qsl::Mutex mutex_;
    Chunk* chunks_ QSL_GUARDED_BY(mutex_) = nullptr;
    uint32_t chunk_count_ QSL_GUARDED_BY(mutex_) = 0;
    Batch* spare_ QSL_GUARDED_BY(mutex_) = nullptr;
};

}  // namespace qorvex
