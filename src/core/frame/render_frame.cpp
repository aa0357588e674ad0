#include "core/frame/render_frame.h"

#include "qsl/relax.h"

namespace qorvex {

namespace {

// How often Paint looks for the tasks of a frame that is being recorded before it sleeps: 10 to 50 us, which
// is what small interfaces take to record. A thread that sleeps wakes some 5 us late and costs its waker as
// much, while a render thread that waits for this frame has nothing better to do.
constexpr int kLooksBeforeSleep = 1000;

}  // namespace

void RenderFrame::Push(TaskPtr task) {
    {
        qsl::MutexLock lock(mutex_);
        tasks_.push_back(std::move(task));
        arrivals_.fetch_add(1, std::memory_order_release);
    }
    task_arrived_.Broadcast();
}

void RenderFrame::Announce() {
    {
        qsl::MutexLock lock(mutex_);
        announced_ = true;
    }
    task_arrived_.Broadcast();
}

void RenderFrame::PushClose(TaskPtr last) {
    TaskPtr close = MakeTask("CloseRenderFrame", [this](TaskFamilyHandle) { Close(); });
    {
        // Both at once: who waits takes the lock once and is not in the way of the second.
        qsl::MutexLock lock(mutex_);
        if (last) tasks_.push_back(std::move(last));
        tasks_.push_back(std::move(close));
        arrivals_.fetch_add(1, std::memory_order_release);
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

void RenderFrame::WaitForTask(qsl::MutexLock& lock) {
    if (!std::exchange(announced_, false)) return task_arrived_.Wait(lock);
    const uint32_t arrivals = arrivals_.load(std::memory_order_relaxed);
    mutex_.Unlock();
    for (int i = 0; i < kLooksBeforeSleep; ++i) {
        if (arrivals_.load(std::memory_order_acquire) != arrivals || GetState() != State::Recording) break;
        qsl::Relax();
    }
    mutex_.Lock();
}

bool RenderFrame::ExecuteToCompletion(TaskFamilyHandle family) {
    TaskQueue dropped;
    qsl::MutexLock lock(mutex_);
    while (GetState() == State::Recording) {
        TaskPtr task = tasks_.pop_front();
        if (!task) {
            WaitForTask(lock);
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
