#include "core/memory/object_pool.h"

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"

namespace qorvex {
namespace {

constinit std::atomic<bool> g_pools_enabled{true};
/// All pools that were ever used; the number of a pool is its place in each thread's cache.
constinit std::atomic<ObjectPool*> g_pools{nullptr};
constinit std::atomic<int32_t> g_pool_count{0};

size_t AlignUp(size_t size, size_t alignment) {
    return (size + alignment - 1) & ~(alignment - 1);
}

}  // namespace

void SetPoolsEnabled(bool enabled) {
    g_pools_enabled.store(enabled, std::memory_order_relaxed);
}
bool ArePoolsEnabled() {
    return g_pools_enabled.load(std::memory_order_relaxed);
}

int32_t ObjectPool::Index() {
    const int32_t index = index_.load(std::memory_order_acquire);
    if (index != kUnregistered) [[likely]]
        return index;
    qsl::MutexLock lock(mutex_);
    if (index_.load(std::memory_order_relaxed) == kUnregistered) Register();
    return index_.load(std::memory_order_relaxed);
}

void ObjectPool::Register() {
    const int32_t index = g_pool_count.fetch_add(1);
    if (index >= static_cast<int32_t>(limits::kObjectPools)) AssertFailure("Too many object pools!");
    next_pool_ = g_pools.load();
    while (!g_pools.compare_exchange_weak(next_pool_, this)) {
    }
    index_.store(index, std::memory_order_release);
}

PoolList* ObjectPool::ListOfThisThread() {
    PoolCache* pools = t_thread_record.pools;
    const auto index = static_cast<uint32_t>(index_.load(std::memory_order_acquire));
    return pools && index < limits::kObjectPools && ArePoolsEnabled() ? &pools->lists[index] : nullptr;
}

void* ObjectPool::Take() {
    PoolList* list = ListOfThisThread();
    return list && list->head ? TakeFrom(*list) : TakeSlowly();
}

void* ObjectPool::TakeFrom(PoolList& list) {
    FreeObject* object = list.head;
    list.head = object->next;
    if (object == list.split) list.split = nullptr;
    --list.count;
    return object;
}

void* ObjectPool::TakeSlowly() {
    const auto index = static_cast<size_t>(Index());
    if (!ArePoolsEnabled() || index >= limits::kObjectPools)
        return GetAllocator()->AlignedAllocate(object_size_, alignment_, tag_);
    ThreadScope scope;
    PoolList& list = t_thread_record.pools->lists[index];
    return list.head || Refill(list) ? TakeFrom(list) : nullptr;
}

void ObjectPool::Give(void* memory) {
    PoolList* list = ListOfThisThread();
    list ? GiveTo(*list, memory) : GiveSlowly(memory);
}

void ObjectPool::GiveTo(PoolList& list, void* memory) {
    auto* object = ::new (memory) FreeObject{list.head};
    list.head = object;
    ++list.count;
    if (list.count == batch_ + 1) list.split = object;
    if (list.count == 2 * batch_) HandOn(list);
}

void ObjectPool::GiveSlowly(void* memory) {
    const auto index = static_cast<size_t>(Index());
    if (!ArePoolsEnabled() || index >= limits::kObjectPools)
        return GetAllocator()->AlignedDeallocate(memory, tag_);
    ThreadScope scope;
    GiveTo(t_thread_record.pools->lists[index], memory);
}

bool ObjectPool::Refill(PoolList& list) {
    qsl::MutexLock lock(mutex_);
    FreeObject* objects = nullptr;
    if (spare_) {
        Batch* batch = std::exchange(spare_, spare_->below);
        objects = &batch->head;
    } else if (chunk_count_ < max_chunks_) {
        objects = AddChunk();
    } else {
        return false;
    }
    list = PoolList{objects, nullptr, batch_};
    return true;
}

void ObjectPool::HandOn(PoolList& list) {
    // Behind the split stand the oldest; with batches of one the split is the newest itself.
    FreeObject* oldest = std::exchange(list.split->next, nullptr);
    list.split = nullptr;
    list.count = batch_;
    qsl::MutexLock lock(mutex_);
    spare_ = ::new (static_cast<void*>(oldest)) Batch{FreeObject{oldest->next}, spare_};
}

FreeObject* ObjectPool::AddChunk() {
    const size_t stride = AlignUp(object_size_, alignment_);
    const size_t header = AlignUp(sizeof(Chunk), alignment_);
    auto* bytes =
        static_cast<std::byte*>(GetAllocator()->AlignedAllocate(header + stride * batch_, alignment_, tag_));
    LogTrace("Allocated object pool memory chunk!");
    chunks_ = ::new (bytes) Chunk{chunks_};
    ++chunk_count_;
    FreeObject* head = nullptr;
    for (uint32_t i = batch_; i-- > 0;)
        head = ::new (bytes + header + stride * i) FreeObject{head};
    return head;
}

uint32_t ObjectPool::FreeChunks() {
    qsl::MutexLock lock(mutex_);
    uint32_t freed = 0;
    for (; chunks_; ++freed)
        GetAllocator()->AlignedDeallocate(std::exchange(chunks_, chunks_->next), tag_);
    chunk_count_ = 0;
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
