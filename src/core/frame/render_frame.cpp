#include "core/frame/render_frame.h"

namespace qorvex {

void RenderFrame::Push(TaskPtr task) {
    {
        qsl::MutexLock lock(mutex_);
        tasks_.push_back(std::move(task));
    }
    task_arrived_.Broadcast();
}

void RenderFrame::PushClose(TaskPtr last) {
    TaskPtr close = MakeTask("CloseRenderFrame", [this](TaskFamilyHandle) { Close(); });
    {
        // Both at once: who waits is woken once, when there is nothing more to wait for. Waking it earlier
        // and letting it spin until then was several times slower where processors are virtual or few.
        qsl::MutexLock lock(mutex_);
        if (last) tasks_.push_back(std::move(last));
        tasks_.push_back(std::move(close));
    }
    task_arrived_.Broadcast();
}

void RenderFrame::Close() {
    // A frame that was discarded while this task was taken stays discarded.
    State recording = State::Recording;
    state_.compare_exchange_strong(recording, State::Closed, std::memory_order_acq_rel);
    --executed_count_;
}

void RenderFrame::Discard() {
    {
        qsl::MutexLock lock(mutex_);
        state_.store(State::Discarded, std::memory_order_release);
    }
    // A Paint that waits for the rest of this frame must not wait for ever.
    task_arrived_.Broadcast();
}

bool RenderFrame::ExecuteOne(TaskFamilyHandle family) {
    TaskQueue dropped;  // goes after the lock
    TaskPtr task;
    {
        qsl::MutexLock lock(mutex_);
        if (GetState() == State::Discarded)
            dropped.swap(tasks_);
        else
            task = tasks_.pop_front();
    }
    if (!task) return false;
    const int32_t before = executed_count_;
    task->Execute(family);
    ++executed_count_;
    return executed_count_ > before;
}

bool RenderFrame::ExecuteToCompletion(TaskFamilyHandle family) {
    TaskQueue dropped;
    qsl::MutexLock lock(mutex_);
    while (GetState() == State::Recording) {
        TaskPtr task = tasks_.pop_front();
        if (!task) {
            task_arrived_.Wait(lock);
            continue;
        }
        lock.Unlock();
        task->Execute(family);
        ++executed_count_;
        task.reset();
        lock.Lock();
    }
    if (GetState() == State::Discarded) dropped.swap(tasks_);
    return executed_count_ > 0;
}

}  // namespace qorvex
