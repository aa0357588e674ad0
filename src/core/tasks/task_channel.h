// One of the five work queues, divided by task family, and the loop in which client threads take tasks from
// it.
//
// Invariants: everything below the mutex is touched with it held; a task runs with no lock of this room held;
// the task system's mutex may be held when this one is taken, never the other way round. Tasks that a thread
// has taken count as in flight; it gives those that it has not begun back to the front of their queue before
// anybody could miss them: when its loop ends, when a loop nests inside it, and when somebody closes.
#pragma once

#include <atomic>
#include <cstdint>

#include "core/memory/containers.h"
#include "core/memory/temp_allocator.h"
#include "core/tasks/task_queue.h"
#include "qsl/mutex.h"

namespace qorvex {

/// Each on cache lines of its own: different threads serve them.
class alignas(64) TaskChannel {
  public:
    /// Told of each task that has run, with no lock held; may keep the task.
    using OnTaskFinished = Function<void(uint32_t family, TaskPtr& task), MemoryTag::Tasks>;
    /// Announces new work of a family to the client. Called with the channel's mutex held.
    using OnTaskPushed = Function<void(uint32_t family), MemoryTag::Tasks>;

    void Start(TaskChannels number, TaskSystem* system, OnTaskFinished on_finished, OnTaskPushed on_pushed);

    void Open(uint32_t family) QSL_EXCLUDES(mutex_);
    /// Waits for tasks of the family that other threads are running, and destroys the rest without running
    /// it.
    void Close(uint32_t family) QSL_EXCLUDES(mutex_);
    /// A task for a family that is not open is destroyed.
    void Put(uint32_t family, TaskPtr&& task) QSL_EXCLUDES(mutex_);
    /// Runs tasks of one family, or of all, until there are none, or, when blocking, until the channel quits
    /// or the flag is set.
    void Run(bool blocking, const std::atomic<uint32_t>* stop_flag, uint32_t family) QSL_EXCLUDES(mutex_);
    void Quit() QSL_EXCLUDES(mutex_);
    /// Tasks that are queued or running. A task that another one pushes counts before that one stops
    /// counting.
    uint32_t GetPending() const QSL_EXCLUDES(mutex_);

  private:
    struct FamilyQueue {
        using TriviallyRelocatable = FamilyQueue;
        uint32_t family;
        TaskQueue queue;
        /// Apart, because waiters must not move with the entry.
        UniquePtr<qsl::Condition, MemoryTag::Tasks> idle;
        int32_t in_flight = 0;
        /// Threads that wait on `idle`.
        uint32_t closers = 0;
        uint32_t workers = 0;

        /// What waits in a queue that somebody is about to drop is not begun any more.
        bool HasWork() const { return !queue.empty() && !closers; }
    };
    class RunFrame;

    /// What only the main thread serves it takes at once, with one lock; a client thread leaves the rest of
    /// what waits to its fellows.
    bool IsTakenWhole() const { return number_ < TaskChannels::Layout; }
    void Take(FamilyQueue& queue, bool whole, RunFrame& frame) QSL_REQUIRES(mutex_);
    void GiveBack(RunFrame& frame) QSL_REQUIRES(mutex_);
    void GiveBackOnThisThread() QSL_REQUIRES(mutex_);
    void End(uint32_t family, TaskPtr task) QSL_EXCLUDES(mutex_);
    uint32_t ExecuteTaken(RunFrame& frame, const std::atomic<uint32_t>* stop_flag) QSL_EXCLUDES(mutex_);
    FamilyQueue* Find(uint32_t family) QSL_REQUIRES(mutex_) {
        for (FamilyQueue& queue : families_)
            if (queue.family == family) return &queue;
        return nullptr;
    }
    FamilyQueue* Choose(uint32_t family) QSL_REQUIRES(mutex_);
    void Register(uint32_t family, int change) QSL_REQUIRES(mutex_);
    void Announce(const FamilyQueue& queue) QSL_REQUIRES(mutex_);
    void Wake() QSL_EXCLUDES(mutex_);
    [[gnu::cold]] static void Drop(uint32_t family, TaskPtr task);
    bool HasWorkers(const FamilyQueue& queue) const QSL_REQUIRES(mutex_);
    void Leave(uint32_t family, bool stopped) QSL_REQUIRES(mutex_);
    void NoteFinished(uint32_t family, uint32_t count) QSL_REQUIRES(mutex_);
    void WaitForWork(qsl::MutexLock& lock, uint32_t family) QSL_REQUIRES(mutex_);
    bool IsAnnounced() const { return static_cast<bool>(on_pushed_); }

    TaskChannels number_ = TaskChannels::Main;
    TaskSystem* system_ = nullptr;
    OnTaskFinished on_finished_;
    OnTaskPushed on_pushed_;

    mutable qsl::Mutex mutex_;
    qsl::Condition work_;
    Vector<FamilyQueue, MemoryTag::Tasks> families_ QSL_GUARDED_BY(mutex_);
    uint32_t next_queue_ QSL_GUARDED_BY(mutex_) = 0;
    /// Threads in a loop over all families; they count as workers of each.
    uint32_t all_workers_ QSL_GUARDED_BY(mutex_) = 0;
    uint32_t waiters_ QSL_GUARDED_BY(mutex_) = 0;
    uint32_t choosy_waiters_ QSL_GUARDED_BY(mutex_) = 0;
    std::atomic<bool> quit_{false};
    /// Not zero: who has taken tasks gives them back before beginning the next.
    std::atomic<uint32_t> interrupts_{0};
};

}  // namespace qorvex
