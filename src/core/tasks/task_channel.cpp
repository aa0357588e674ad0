#include "core/tasks/task_channel.h"

#include "core/logging/log.h"
#include "core/tasks/task_system.h"

namespace qorvex {

/// The tasks that this thread has taken: one of them runs, the rest waits here. Loops nest, so the frames of
/// a thread form a chain; a family that is closed from inside one of its own tasks must not wait for that
/// one.
class TaskChannel::RunFrame {
  public:
    RunFrame(const TaskChannel* channel, uint32_t family)
        : channel_(channel), family_(family), outer_(innermost_) {
        innermost_ = this;
    }
    ~RunFrame() { innermost_ = outer_; }

    uint32_t family() const { return family_; }
    TaskQueue& rest() { return rest_; }

    static int32_t CountOnThisThread(const TaskChannel* channel, uint32_t family) {
        int32_t count = 0;
        for (const RunFrame* frame = innermost_; frame; frame = frame->outer_)
            count += frame->channel_ == channel && frame->family_ == family;
        return count;
    }
    /// Of the frames of one channel only the innermost may have a rest, since each took after the one around
    /// it had given back.
    static RunFrame* InnermostOf(const TaskChannel* channel) {
        RunFrame* frame = innermost_;
        while (frame && frame->channel_ != channel)
            frame = frame->outer_;
        return frame;
    }

  private:
    static thread_local RunFrame* innermost_;
    const TaskChannel* channel_;
    uint32_t family_;
    TaskQueue rest_;
    RunFrame* outer_;
};

constinit thread_local TaskChannel::RunFrame* TaskChannel::RunFrame::innermost_ = nullptr;

static bool IsStopped(const std::atomic<uint32_t>* stop_flag) {
    return stop_flag && stop_flag->load(std::memory_order_acquire) != 0;
}

void TaskChannel::Start(TaskChannels number, TaskSystem* system, OnTaskFinished on_finished,
                        OnTaskPushed on_pushed) {
    number_ = number;
    system_ = system;
    on_finished_ = std::move(on_finished);
    on_pushed_ = std::move(on_pushed);
}

void TaskChannel::Open(uint32_t family) {
    qsl::MutexLock lock(mutex_);
    if (Find(family)) return;
    families_.push_back(FamilyQueue{family, {}, MakeUnique<qsl::Condition, MemoryTag::Tasks>()});
}

void TaskChannel::Close(uint32_t family) {
    TaskQueue left;
    bool wake;
    UniquePtr<qsl::Condition, MemoryTag::Tasks> idle;
    {
        qsl::MutexLock lock(mutex_);
        GiveBackOnThisThread();
        const int32_t own = RunFrame::CountOnThisThread(this, family);
        FamilyQueue* queue;
        while ((queue = Find(family)) && queue->in_flight > own) {
            LogDebug("Waiting for in-progress tasks on channel on family ", family);
            ++queue->closers;
            interrupts_.fetch_add(1, std::memory_order_relaxed);
            queue->idle->Wait(lock);
            interrupts_.fetch_sub(1, std::memory_order_relaxed);
            if ((queue = Find(family))) --queue->closers;
        }
        if (!queue) return;
        left.swap(queue->queue);
        idle = std::move(queue->idle);
        families_.erase(queue);
        wake = choosy_waiters_ > 0;
        if (next_queue_ >= families_.size()) next_queue_ = families_.empty() ? 0 : families_.size() - 1;
    }
    // Who waited for this family finds it closed, and leaves.
    if (wake) work_.Broadcast();
    // What a task owns may come back here when it goes, so the tasks go after the lock.
}

void TaskChannel::Put(uint32_t family, TaskPtr&& task) {
    bool waited_for;
    {
        qsl::MutexLock lock(mutex_);
        FamilyQueue* queue = Find(family);
        if (!queue) [[unlikely]] {
            lock.Unlock();
            Drop(family, std::move(task));
            return lock.Lock();
        }
        queue->queue.push_back(std::move(task));
        waited_for = waiters_ > 0;
        if (IsAnnounced()) [[unlikely]]
            Announce(*queue);
    }
    if (waited_for) [[unlikely]]
        Wake();
}

void TaskChannel::Announce(const FamilyQueue& queue) {
    if (!HasWorkers(queue) || number_ == TaskChannels::Resources) on_pushed_(queue.family);
}

void TaskChannel::Wake() {
    bool wake_all;
    {
        qsl::MutexLock lock(mutex_);
        // One signal could reach a thread that waits for another family and be lost with it.
        wake_all = choosy_waiters_ && waiters_ > 1;
    }
    wake_all ? work_.Broadcast() : work_.Signal();
}

void TaskChannel::Drop(uint32_t family, TaskPtr task) {
    LogDebug("Trying to push task '", task->name(), "' to closed channel in family ", family,
             " dropping task!");
}

void TaskChannel::Run(bool blocking, const std::atomic<uint32_t>* stop_flag, uint32_t family) {
    qsl::MutexLock lock(mutex_);
    GiveBackOnThisThread();
    Register(family, +1);
    while (!IsStopped(stop_flag)) {
        if (quit_.load(std::memory_order_relaxed)) return Leave(family, false);
        FamilyQueue* queue = Choose(family);
        if (!queue && family != kAllTaskFamilies && !Find(family)) {
            // The placeholder is part of the text.
            LogDebug("Trying to do tasks on a family (%d) channel that is closed", family);
            return Leave(family, false);
        }
        if (!queue) {
            if (!blocking) return Leave(family, false);
            WaitForWork(lock, family);
            continue;
        }
        RunFrame frame(this, queue->family);
        Take(*queue, IsTakenWhole() && family != kAllTaskFamilies, frame);
        lock.Unlock();
        const uint32_t done = ExecuteTaken(frame, stop_flag);
        lock.Lock();
        GiveBack(frame);
        NoteFinished(frame.family(), done);
    }
    Leave(family, true);
}

void TaskChannel::Take(FamilyQueue& queue, bool whole, RunFrame& frame) {
    if (whole)
        frame.rest().swap(queue.queue);
    else
        frame.rest().push_back(queue.queue.pop_front());
    queue.in_flight += static_cast<int32_t>(frame.rest().size());
}

void TaskChannel::GiveBack(RunFrame& frame) {
    if (frame.rest().empty()) return;
    // Whoever closes the family waits for what is in flight, so it is still there.
    FamilyQueue* queue = Find(frame.family());
    queue->in_flight -= static_cast<int32_t>(frame.rest().size());
    frame.rest().append(queue->queue);
    queue->queue.swap(frame.rest());
}

void TaskChannel::GiveBackOnThisThread() {
    if (RunFrame* frame = RunFrame::InnermostOf(this)) GiveBack(*frame);
}

uint32_t TaskChannel::ExecuteTaken(RunFrame& frame, const std::atomic<uint32_t>* stop_flag) {
    const TaskFamilyHandle family{frame.family(), system_};
    TempAllocator& temporary = CurrentTempAllocator();
    const size_t mark = temporary.Mark();
    const bool tells_end = static_cast<bool>(on_finished_);
    uint32_t done = 0;
    // A task goes before it stops counting as in flight: once a family is closed nothing of it is left.
    do {
        TaskPtr task = frame.rest().pop_front();
        LogTrace("Executing task ", task->name());
        task->Execute(family);
        // A task that nobody waits for, like most, ends without asking.
        if (task->StandsAlone() && tells_end) [[likely]]
            task.reset();
        else
            End(family.family, std::move(task));
        if (temporary.Mark() != mark) temporary.Release(mark);
        ++done;
    } while (!frame.rest().empty() && !IsStopped(stop_flag) && !interrupts_.load(std::memory_order_relaxed));
    return done;
}

void TaskChannel::End(uint32_t family, TaskPtr task) {
    on_finished_(family, task);
}

uint32_t TaskChannel::GetPending() const {
    qsl::MutexLock lock(mutex_);
    uint32_t pending = 0;
    for (const FamilyQueue& queue : families_)
        pending += queue.queue.size() + static_cast<uint32_t>(queue.in_flight);
    return pending;
}

void TaskChannel::Quit() {
    {
        qsl::MutexLock lock(mutex_);
        quit_.exchange(true);
        interrupts_.fetch_add(1, std::memory_order_relaxed);
    }
    work_.Broadcast();
}

TaskChannel::FamilyQueue* TaskChannel::Choose(uint32_t family) {
    if (family != kAllTaskFamilies) {
        FamilyQueue* queue = Find(family);
        return queue && queue->HasWork() ? queue : nullptr;
    }
    for (uint32_t looked = 0; looked < families_.size(); ++looked) {
        FamilyQueue& queue = families_[next_queue_];
        next_queue_ = next_queue_ + 1 == families_.size() ? 0 : next_queue_ + 1;
        if (queue.HasWork()) return &queue;
    }
    return nullptr;
}

void TaskChannel::Register(uint32_t family, int change) {
    if (!IsAnnounced()) return;
    if (family == kAllTaskFamilies) {
        all_workers_ += change;
        return;
    }
    FamilyQueue* queue = Find(family);
    // A family that was closed and opened again in between does not know this thread.
    if (queue && (change > 0 || queue->workers)) queue->workers += change;
}

bool TaskChannel::HasWorkers(const FamilyQueue& queue) const {
    return queue.workers || all_workers_;
}

void TaskChannel::Leave(uint32_t family, bool stopped) {
    Register(family, -1);
    // Work that came while this thread was there was not announced, and now nobody may be left to see it.
    if (!stopped || !IsAnnounced()) return;
    for (const FamilyQueue& queue : families_) {
        const bool served = family == kAllTaskFamilies || family == queue.family;
        if (served && !queue.queue.empty() && !HasWorkers(queue)) on_pushed_(queue.family);
    }
}

void TaskChannel::NoteFinished(uint32_t family, uint32_t count) {
    FamilyQueue* queue = Find(family);
    if (!queue) {
        LogWarning("A family (%d) channel was closed while there were still tasks in-flight!", family);
        return;
    }
    queue->in_flight -= static_cast<int32_t>(count);
    // Not only at zero: one that closes from inside its own task waits for all others but itself.
    if (queue->closers) queue->idle->Broadcast();
}

void TaskChannel::WaitForWork(qsl::MutexLock& lock, uint32_t family) {
    const uint32_t choosy = family == kAllTaskFamilies ? 0 : 1;
    ++waiters_;
    choosy_waiters_ += choosy;
    work_.Wait(lock);
    --waiters_;
    choosy_waiters_ -= choosy;
}

}  // namespace qorvex
