#include "core/memory/object_pool.h"

#include <algorithm>

#include "core/logging/log.h"

namespace qorvex {
namespace {

/// All pools that ever had a chunk.
constinit std::atomic<ObjectPool*> g_pools{nullptr};
constinit std::atomic<uint32_t> g_pool_count{ObjectPool::kFixedNumbers};
constinit std::atomic<bool> g_pools_enabled{true};

constexpr size_t AlignUp(size_t size, size_t alignment) {
    return (size + alignment - 1) & ~(alignment - 1);
}

/// A new chunk is linked piece by piece: what is not used yet is not written to.
constexpr size_t kFreshBytes = 1024;

}  // namespace

void SetPoolsEnabled(bool enabled) {
    g_pools_enabled.store(enabled, std::memory_order_relaxed);
    ThreadRecord& record = t_thread_record;
    if (record.pools) record.pool_lists = enabled ? record.pools->lists : nullptr;
}
bool ArePoolsEnabled() {
    return g_pools_enabled.load(std::memory_order_relaxed);
}

uint32_t ObjectPool::Index() {
    const uint32_t index = index_.load(std::memory_order_acquire);
    if (index != kUnregistered) [[likely]]
        return index;
    qsl::MutexLock lock(mutex_);
    if (!asked_for_number_) TakeNumber();
    return index_.load(std::memory_order_relaxed);
}

void ObjectPool::TakeNumber() {
    asked_for_number_ = true;
    const uint32_t number = g_pool_count.fetch_add(1) + 1;
    if (number >= limits::kObjectPools) return AssertFailure("Too many object pools!");
    index_.store(number, std::memory_order_release);
}

void ObjectPool::Enlist() {
    enlisted_ = true;
    next_pool_ = g_pools.load();
    while (!g_pools.compare_exchange_weak(next_pool_, this)) {
    }
}

void* ObjectPool::TakeSlowly() {
    const uint32_t index = Index();
    if (!ArePoolsEnabled() || index == kUnregistered)
        return GetAllocator()->AlignedAllocate(stride_, alignment_, tag_);
    ThreadScope scope;
    PoolList& list = t_thread_record.pools->lists[index];
    return list.head || Refill(list) ? TakeFrom(list) : nullptr;
}

void ObjectPool::GiveSlowly(void* memory) {
    const uint32_t index = Index();
    if (!ArePoolsEnabled() || index == kUnregistered) return GetAllocator()->AlignedDeallocate(memory, tag_);
    ThreadScope scope;
    GiveTo(t_thread_record.pools->lists[index], memory);
}

bool ObjectPool::Refill(PoolList& list) {
    list.head = std::exchange(list.full, nullptr);
    list.count = batch_;
    if (list.head) return true;
    qsl::MutexLock lock(mutex_);
    if (spare_) {
        list.head = &std::exchange(spare_, spare_->below)->head;
        return true;
    }
    if (fresh_count_ == 0 && chunk_count_ < max_chunks_) AddChunk();
    list.count = std::min(fresh_count_, std::max(1u, static_cast<uint32_t>(kFreshBytes / stride_)));
    fresh_count_ -= list.count;
    for (uint32_t i = list.count; i-- > 0;)
        list.head = ::new (fresh_ + stride_ * i) FreeObject{list.head};
    fresh_ += stride_ * list.count;
    return list.head != nullptr;
}

void ObjectPool::PutAside(PoolList& list) {
    FreeObject* batch = std::exchange(list.full, std::exchange(list.head, nullptr));
    list.count = 0;
    if (!batch) return;
    qsl::MutexLock lock(mutex_);
    spare_ = ::new (static_cast<void*>(batch)) Batch{FreeObject{batch->next}, spare_};
}

void ObjectPool::AddChunk() {
    if (!enlisted_) Enlist();
    const size_t header = AlignUp(sizeof(Chunk), alignment_);
    auto* bytes =
        static_cast<std::byte*>(GetAllocator()->AlignedAllocate(header + stride_ * batch_, alignment_, tag_));
    LogTrace("Allocated object pool memory chunk!");
    chunks_ = ::new (bytes) Chunk{chunks_};
    ++chunk_count_;
    fresh_ = bytes + header;
    fresh_count_ = batch_;
}

uint32_t ObjectPool::FreeChunks() {
    qsl::MutexLock lock(mutex_);
    uint32_t freed = 0;
    for (; chunks_; ++freed)
        GetAllocator()->AlignedDeallocate(std::exchange(chunks_, chunks_->next), tag_);
    chunk_count_ = 0;
    fresh_count_ = 0;
    spare_ = nullptr;
    return freed;
}

void FreePoolChunks() {
    uint32_t freed = 0;
    for (ObjectPool* pool = g_pools.load(); pool; pool = pool->next_pool_)
        freed += pool->FreeChunks();
    ForgetPooledObjects();
    LogTrace("Deleted ", freed, " object pool memory chunks!");
}

}  // namespace qorvex
