#include "core/tasks/task.h"

#include "core/memory/object_pool.h"
#include "core/tasks/task_system.h"

namespace qorvex {

namespace {

constexpr int32_t kIdsPerBlock = 64;
constinit std::atomic<int32_t> g_next_id{0};

/// Blocks that are kept at most, per size: some 400 KiB in all. What a burst needs beyond them goes back.
constexpr uint32_t kPoolBatch = 64;
constexpr uint32_t kPoolChunks = 16;
constexpr size_t kTaskAlignment = 8;

constexpr ObjectPool PoolFor(size_t size) {
    return ObjectPool(size, kTaskAlignment, kPoolBatch, MemoryTag::Tasks, kPoolChunks);
}
constinit ObjectPool g_pools[] = {PoolFor(kTaskBlockSizes[0]), PoolFor(kTaskBlockSizes[1]),
                                  PoolFor(kTaskBlockSizes[2])};
static_assert(std::size(g_pools) == std::size(kTaskBlockSizes));

}  // namespace

constinit thread_local Task::IdBlock Task::t_ids_;

void Task::IdBlock::Refill() {
    next = g_next_id.fetch_add(kIdsPerBlock, std::memory_order_relaxed);
    end = next + kIdsPerBlock;
}

void Task::SetHandle(TaskHandle* handle) {
    ClearHandle();
    handle_ = handle;
    if (handle) handle->task.store(this, std::memory_order_release);
}

void Task::ClearHandleSlowly() {
    // The record may have been given to a newer task since.
    Task* self = this;
    handle_->task.compare_exchange_strong(self, nullptr, std::memory_order_acq_rel);
    handle_ = nullptr;
}

void* AllocateTask(size_t size, uint8_t& block) {
    if (block) {
        if (void* memory = g_pools[block - 1].Take()) return memory;
        block = 0;
    }
    return GetAllocator()->AlignedAllocate(size, kTaskAlignment, MemoryTag::Tasks);
}

void DeallocateTask(void* memory, uint8_t block) {
    if (block)
        g_pools[block - 1].Give(memory);
    else
        GetAllocator()->AlignedDeallocate(memory, MemoryTag::Tasks);
}

void TaskDeleter::operator()(Task* task) const {
    const uint8_t block = task->block_;
    std::destroy_at(task);
    DeallocateTask(task, block);
}

void TaskFamilyHandle::Push(TaskChannels channel, TaskPtr task) const {
    system->Push(family, channel, std::move(task));
}

}  // namespace qorvex
