#include "core/frame/render_frame.h"

namespace qorvex {

void RenderFrame::Push(TaskPtr task) {
    {
        std::lock_guard<std::mutex> lock(mutex_);
        tasks_.push_back(std::move(task));
    }
    task_arrived_.notify_all();
}

void RenderFrame::PushClose() {
    Push(MakeTask("CloseRenderFrame", [this](TaskFamilyHandle) { Close(); }));
}

void RenderFrame::Close() {
    // A frame that was discarded while this task was taken stays discarded.
    State recording = State::Recording;
    state_.compare_exchange_strong(recording, State::Closed, std::memory_order_acq_rel);
    --executed_count_;
}

void RenderFrame::Discard() {
    {
        std::lock_guard<std::mutex> lock(mutex_);
        state_.store(State::Discarded, std::memory_order_release);
    }
    // A Paint that waits for the rest of this frame must not wait for ever.
    task_arrived_.notify_all();
}

TaskPtr RenderFrame::TakeFront(std::unique_lock<std::mutex>&) {
    return tasks_.empty() ? TaskPtr() : tasks_.pop_front();
}

void RenderFrame::DropAll(std::unique_lock<std::mutex>& lock) {
    while (TaskPtr task = TakeFront(lock)) {
        lock.unlock();
        task.reset();
        lock.lock();
    }
}

bool RenderFrame::ExecuteOne(TaskFamilyHandle family) {
    std::unique_lock<std::mutex> lock(mutex_);
    if (GetState() == State::Discarded) {
        DropAll(lock);
        return false;
    }
    TaskPtr task = TakeFront(lock);
    if (!task) return false;
    lock.unlock();
    const int32_t before = executed_count_;
    task->Execute(family);
    ++executed_count_;
    return executed_count_ > before;
}

bool RenderFrame::ExecuteToCompletion(TaskFamilyHandle family) {
    std::unique_lock<std::mutex> lock(mutex_);
    for (;;) {
        if (GetState() == State::Discarded) {
            DropAll(lock);
            break;
        }
        if (GetState() == State::Closed) break;
        TaskPtr task = TakeFront(lock);
        if (!task) {
            task_arrived_.wait(lock);
            continue;
        }
        lock.unlock();
        task->Execute(family);
        ++executed_count_;
        task.reset();
        lock.lock();
    }
    return executed_count_ > 0;
}

}  // namespace qorvex
