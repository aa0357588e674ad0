// One frame on its way to the render thread: a queue of tasks that the main thread and the layout side fill
// in order and the render thread drains, while it is being filled if it likes.
//
// Invariants: tasks run in order of arrival, on one thread, with no lock held; CloseRenderFrame is the last
// task to arrive, so a closed frame is empty; a discarded frame runs nothing more, but every task it held is
// destroyed, which runs the finalizers that release buffers.
#pragma once

#include <atomic>

#include "core/memory/containers.h"
#include "core/memory/pool.h"
#include "core/tasks/task.h"
#include "core/tasks/task_queue.h"
#include "qsl/mutex.h"

namespace qorvex {

class RenderFrame : public MTPoolObject<RenderFrame, MemoryTag::Rendering, 4> {
  public:
    enum class State : uint32_t { Recording = 0, Closed = 1, Discarded = 2 };

    static RefPtr<RenderFrame> Create() { return AdoptRef(Take()); }
    void AddRef() { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() {
        if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) Give(this);
    }

    // Any thread.
    void Push(TaskPtr task);
    // The last task of every frame is the one that closes it; with another one before it if there is one.
    void PushClose(TaskPtr last = TaskPtr());
    State GetState() const { return state_.load(std::memory_order_acquire); }
    void Discard();

    // Render thread. One task, if there is one; true when it counted as drawing.
    bool ExecuteOne(TaskFamilyHandle family);
    // Waits for tasks until the frame is closed or discarded; true when something was drawn.
    bool ExecuteToCompletion(TaskFamilyHandle family);

  private:
    void Close();

    std::atomic<uint32_t> count_{1};
    qsl::Mutex mutex_;
    qsl::Condition task_arrived_;
    TaskQueue tasks_ QSL_GUARDED_BY(mutex_);
    std::atomic<State> state_{State::Recording};
    int32_t executed_count_ = 0;  // without CloseRenderFrame; render thread only
};

using RenderFramePtr = RefPtr<RenderFrame>;

}  // namespace qorvex
