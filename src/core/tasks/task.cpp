#include "core/tasks/task.h"

#include "core/memory/object_pool.h"
#include "core/memory/thread_scope.h"
#include "core/tasks/task_system.h"

namespace qorvex {

namespace {

constexpr int32_t kIdsPerBlock = 64;
constinit std::atomic<int32_t> g_next_id{0};

/// Blocks that are kept at most, per size: some 450 KiB in all. What a burst needs beyond them goes back.
constexpr uint32_t kPoolBatch = 64;
constexpr uint32_t kPoolChunks = 16;
constexpr size_t kTaskAlignment = 8;
constexpr size_t kCacheLine = 64;

constexpr ObjectPool PoolFor(uint8_t block) {
    return ObjectPool(kTaskBlockSizes[block - 1], kCacheLine, kPoolBatch, MemoryTag::Tasks, kPoolChunks,
                      block);
}
/// The number of a block is that of its pool, so that the thread's list of it is found without the pool.
constinit ObjectPool g_pools[] = {PoolFor(1), PoolFor(2), PoolFor(3)};
static_assert(std::size(g_pools) == std::size(kTaskBlockSizes) &&
              std::size(g_pools) == ObjectPool::kFixedNumbers);

}  // namespace

constinit thread_local Task::IdBlock Task::t_ids_;

void Task::IdBlock::Refill() {
    next = g_next_id.fetch_add(kIdsPerBlock, std::memory_order_relaxed);
    end = next + kIdsPerBlock;
}

TaskRelations& Task::Relations() {
    if (!relations_) {
        const TaskMemory place = AllocateTask<TaskBlockFor(sizeof(TaskRelations))>(sizeof(TaskRelations));
        relations_ = std::construct_at(static_cast<TaskRelations*>(place.memory));
        relations_->block = place.block;
    }
    return *relations_;
}

void Task::DropRelations() {
    ClearHandle();
    const uint8_t block = relations_->block;
    std::destroy_at(relations_);
    DeallocateTask(relations_, block);
}

void Task::SetHandle(TaskHandle* handle) {
    ClearHandle();
    Relations().handle = handle;
    if (handle) handle->task.store(this, std::memory_order_release);
}

void Task::ClearHandle() {
    if (!relations_ || !relations_->handle) return;
    // The record may have been given to a newer task since.
    Task* self = this;
    relations_->handle->task.compare_exchange_strong(self, nullptr, std::memory_order_acq_rel);
    relations_->handle = nullptr;
}

// What is rare stands in functions of its own: the rest then runs without a stack frame.
[[gnu::cold, gnu::noinline]] static TaskMemory AllocateSlowly(size_t size, uint8_t block) {
    if (block) {
        if (void* memory = g_pools[block - 1].TakeSlowly()) return {memory, block};
    }
    return {GetAllocator()->AlignedAllocate(size, kTaskAlignment, MemoryTag::Tasks), 0};
}

[[gnu::cold, gnu::noinline]] static void DeallocateSlowly(void* memory, uint8_t block) {
    if (block)
        g_pools[block - 1].GiveSlowly(memory);
    else
        GetAllocator()->AlignedDeallocate(memory, MemoryTag::Tasks);
}

[[gnu::noinline]] static void PutAside(PoolList& list, uint8_t block) {
    g_pools[block - 1].PutAside(list);
}

template <uint8_t block>
TaskMemory AllocateTask(size_t size) {
    PoolList* lists = t_thread_record.pool_lists;
    if (block && lists && lists[block].head) [[likely]]
        return {ObjectPool::TakeFrom(lists[block]), block};
    return AllocateSlowly(size, block);
}
template TaskMemory AllocateTask<0>(size_t);
template TaskMemory AllocateTask<1>(size_t);
template TaskMemory AllocateTask<2>(size_t);
template TaskMemory AllocateTask<3>(size_t);

void DeallocateTask(void* memory, uint8_t block) {
    PoolList* lists = t_thread_record.pool_lists;
    if (!block || !lists) [[unlikely]]
        return DeallocateSlowly(memory, block);
    PoolList& list = lists[block];
    if (ObjectPool::Add(list, memory) == kPoolBatch) [[unlikely]]
        PutAside(list, block);
}

void TaskDeleter::Destroy(Task* task) {
    const uint8_t block = task->plain_block_;
    if (!block || task->relations_) return DestroySlowly(task);
    DeallocateTask(task, block);
}

void TaskDeleter::DestroySlowly(Task* task) {
    const uint8_t block = task->block_;
    if (!task->plain_block_ || task->relations_) std::destroy_at(task);
    DeallocateTask(task, block);
}

void TaskFamilyHandle::Push(TaskChannels channel, TaskPtr task) const {
    system->Push(family, channel, std::move(task));
}

}  // namespace qorvex
