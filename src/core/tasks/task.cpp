#include "core/tasks/task.h"

#include "core/tasks/task_system.h"

namespace qorvex {

namespace {

constexpr int32_t kIdsPerBlock = 64;
constinit std::atomic<int32_t> g_next_id{0};

}  // namespace

constinit thread_local Task::IdBlock Task::t_ids_;

void Task::IdBlock::Refill() {
    next = g_next_id.fetch_add(kIdsPerBlock, std::memory_order_relaxed);
    end = next + kIdsPerBlock;
}

Task::~Task() {
    ClearHandle();
}

void Task::SetHandle(TaskHandle* handle) {
    ClearHandle();
    handle_ = handle;
    if (handle) handle->task.store(this, std::memory_order_release);
}

void Task::ClearHandle() {
    // The record may have been given to a newer task since.
    Task* self = this;
    if (handle_) handle_->task.compare_exchange_strong(self, nullptr, std::memory_order_acq_rel);
    handle_ = nullptr;
}

void TaskFamilyHandle::Push(TaskChannels channel, TaskPtr task) const {
    system->Push(family, channel, std::move(task));
}

}  // namespace qorvex
