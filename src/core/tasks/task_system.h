// The five channels and the dependencies between tasks. The engine has no threads: the main thread runs
// channels inside its public operations, client threads inside ExecuteWork.
//
// Invariants: a task with unfinished dependencies or children is on no queue; lists of waiting tasks are
// touched with the mutex held, which may be held when a channel's mutex is taken, never the other way round.
#pragma once

#include <atomic>
#include <cstdint>

#include "core/memory/containers.h"
#include "core/tasks/task.h"
#include "core/tasks/task_channel.h"
#include "qsl/mutex.h"

namespace qorvex {

struct TaskSystemSettings {
    bool use_dedicated_layout_thread = false;
    OnWorkAvailableCallback on_work_available = nullptr;
    void* user_data = nullptr;
};

class TaskSystem {
  public:
    explicit TaskSystem(const TaskSystemSettings& settings);
    ~TaskSystem();
    TaskSystem(const TaskSystem&) = delete;
    TaskSystem& operator=(const TaskSystem&) = delete;

    /// Opening one that is open does nothing.
    void OpenChannel(TaskChannels channel, uint32_t family);
    void CloseChannel(TaskChannels channel, uint32_t family);
    /// Closes all channels of the family and drops what of it still waits.
    void DestroyFamily(uint32_t family);

    void Push(uint32_t family, TaskChannels channel, TaskPtr task);
    /// `second` runs after `first`. Before either is pushed; both belong to one family.
    void AddDependent(Task& first, Task& second);
    /// The parent does not end before the child has. Before the child is pushed and before the parent ends.
    void AddChild(Task& parent, Task& child);

    /// `stop_flag` may be null; the loop ends before the next task once it is not zero.
    void Run(TaskChannels channel, bool blocking, const std::atomic<uint32_t>* stop_flag, uint32_t family);
    /// The way in for client threads.
    void ExecuteWork(WorkType type, WorkExecutionMode mode, uint32_t family);
    /// Tasks of all families on the channel that are queued or running.
    uint32_t GetPendingTasks(TaskChannels channel) const {
        return channels_[static_cast<uint32_t>(channel)].GetPending();
    }
    /// Ends all run loops; the channels run nothing any more.
    void Stop();
    bool IsRunning() const { return running_.load(std::memory_order_acquire); }

  private:
    struct Waiting {
        using TriviallyRelocatable = Waiting;
        TaskPtr task;
        uint32_t family;
        TaskChannels channel;
    };
    using WaitingList = Vector<Waiting, MemoryTag::Tasks>;

    TaskChannel& ChannelOf(TaskChannels channel) { return channels_[static_cast<uint32_t>(channel)]; }
    void PushWaiting(uint32_t family, TaskChannels channel, TaskPtr task) QSL_EXCLUDES(mutex_);
    void FinishTask(TaskChannels channel, uint32_t family, TaskPtr& task) QSL_EXCLUDES(mutex_);
    void Settle(Task& task) QSL_REQUIRES(mutex_);
    static void Collect(WaitingList& from, TempVector<Waiting>& to);
    void Announce(WorkType type, uint32_t family);

    const TaskSystemSettings settings_;
    TaskChannel channels_[kTaskChannelCount];
    qsl::Mutex mutex_;
    WaitingList waiting_ QSL_GUARDED_BY(mutex_);
    WaitingList waiting_for_children_ QSL_GUARDED_BY(mutex_);
    std::atomic<bool> running_{true};
};

}  // namespace qorvex
