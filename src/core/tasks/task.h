// A task: a named function that some thread of the client will run, owned by exactly one holder at any time:
// its creator, the list of those that wait, a queue, the thread that runs it. That thread destroys it.
//
// Tasks that depend on one another or are parent and child belong to one family, so that closing the family
// takes all of them away together.
#pragma once

#include <atomic>
#include <cstdint>
#include <iterator>
#include <memory>
#include <type_traits>
#include <utility>

#include <qorvex/work.h>

#include "core/memory/allocator.h"
#include "qsl/small_vector.h"

namespace qorvex {

class Task;
class TaskSystem;

struct TaskDeleter {
    void operator()(Task* task) const { Destroy(task); }
    static void Destroy(Task* task);

  private:
    static void DestroySlowly(Task* task);
};
using TaskPtr = std::unique_ptr<Task, TaskDeleter>;

/// The numbers stand in log lines.
enum class TaskChannels : uint32_t {
    Main = 0,            ///< Main thread, in Advance: results that must reach the document or the client.
    AfterAPICall = 1,    ///< Main thread, at the end of each public operation of a view.
    ResourceEvents = 2,  ///< Main thread, in a view's Advance: finished loads.
    Layout = 3,     ///< A client thread, or the main thread of a synchronous view: a frame's layout side.
    Resources = 4,  ///< Client threads: parsing, decoding, fonts.
};
inline constexpr uint32_t kTaskChannelCount = 5;

/// Where the tasks of one system, view or service go.
struct TaskFamilyHandle {
    uint32_t family = 0;
    TaskSystem* system = nullptr;

    void Push(TaskChannels channel, TaskPtr task) const;
};

/// Held by whoever wants to know whether a task is still to end; must outlive the task. The task clears it.
struct TaskHandle {
    std::atomic<Task*> task{nullptr};
};

/// What few tasks have, apart from the task: one without it fills a cache line together with a function that
/// captures three words.
struct TaskRelations {
    /// Change under the task system's mutex; read without it where zero is final.
    std::atomic<uint32_t> child_count{0};
    uint32_t dependency_count = 0;
    Task* parent = nullptr;
    TaskHandle* handle = nullptr;
    /// Those that wait for the task.
    qsl::SmallVector<Task*, 2, TaggedStdAllocator<Task*, MemoryTag::Tasks>> dependents;
    uint8_t block = 0;

    bool HasChildren() const { return child_count.load(std::memory_order_acquire) != 0; }
};

class alignas(8) Task {
  public:
    explicit Task(const char* name) : id_(NextId()), name_(name) {}
    Task(const Task&) = delete;
    Task& operator=(const Task&) = delete;

    virtual void Execute(const TaskFamilyHandle& family) = 0;
    virtual ~Task() {
        if (relations_) DropRelations();
    }

    int32_t id() const { return id_; }
    const char* name() const { return name_; }
    void SetHandle(TaskHandle* handle);

  protected:
    /// Of a class: a task of it that has no relations needs no destructor.
    static constexpr bool kHoldsNothing = false;

  private:
    friend class TaskChannel;
    friend class TaskQueue;
    friend class TaskSystem;
    friend struct TaskDeleter;
    template <class Made, class... Args>
    friend TaskPtr NewTask(Args&&... args);

    /// From the process-wide counter, by the block: a thread that makes many tasks does not fight over it.
    static int32_t NextId() {
        IdBlock& block = t_ids_;
        if (block.next == block.end) block.Refill();
        return block.next++;
    }
    struct IdBlock {
        int32_t next = 0;
        int32_t end = 0;
        void Refill();
    };
    TaskRelations& Relations();
    void DropRelations();
    void ClearHandle();
    /// Nothing waits for this task and it waits for nothing: it ends without telling anybody.
    bool StandsAlone() const { return !relations_; }
    bool HasChildren() const { return relations_ && relations_->HasChildren(); }
    bool Waits() const { return relations_ && (relations_->dependency_count || relations_->HasChildren()); }

    static constinit thread_local IdBlock t_ids_;

    const int32_t id_;
    uint8_t block_ = 0;
    /// The same, or 0 for a class that holds something: the task then needs its destructor in any case.
    uint8_t plain_block_ = 0;
    const char* const name_;  ///< A literal.
    Task* next_ = nullptr;    ///< In the queue that owns this task.
    TaskRelations* relations_ = nullptr;
};

namespace detail {
template <class F>
void CallTaskFunction(F& function, const TaskFamilyHandle& family) {
    if constexpr (std::is_invocable_v<F&, TaskFamilyHandle>)
        function(family);
    else
        function();
}
}  // namespace detail

template <class F>
class TaskFunc final : public Task {
  public:
    TaskFunc(const char* name, F function) : Task(name), function_(std::move(function)) {}
    void Execute(const TaskFamilyHandle& family) override { detail::CallTaskFunction(function_, family); }

  private:
    template <class Made, class... Args>
    friend TaskPtr NewTask(Args&&... args);
    static constexpr bool kHoldsNothing = std::is_trivially_destructible_v<F>;

    F function_;
};

/// The second callable runs when the task goes, also when it was never run.
template <class F, class G>
class TaskFuncFinalizer final : public Task {
  public:
    TaskFuncFinalizer(const char* name, F function, G finalizer)
        : Task(name), function_(std::move(function)), finalizer_(std::move(finalizer)) {}
    ~TaskFuncFinalizer() override { finalizer_(); }
    void Execute(const TaskFamilyHandle& family) override { detail::CallTaskFunction(function_, family); }

  private:
    F function_;
    G finalizer_;
};

/// Memory of tasks: most are small and short-lived, so blocks of a few sizes are kept for the next ones. A
/// block is known by its size's place in the table plus one; 0 stands for a block of its own.
inline constexpr size_t kTaskBlockSizes[] = {64, 128, 256};
constexpr uint8_t TaskBlockFor(size_t size) {
    uint8_t block = 0;
    while (block < std::size(kTaskBlockSizes) && kTaskBlockSizes[block] < size)
        ++block;
    return block < std::size(kTaskBlockSizes) ? block + 1 : 0;
}
struct TaskMemory {
    void* memory;
    uint8_t block;
};
/// `size` is at most that of the block. A block of its own is what it gets when no kept one is to be had.
template <uint8_t block>
[[nodiscard]] TaskMemory AllocateTask(size_t size);
void DeallocateTask(void* memory, uint8_t block);

template <class Made, class... Args>
[[nodiscard]] TaskPtr NewTask(Args&&... args) {
    static_assert(alignof(Made) <= alignof(Task));
    const TaskMemory place = AllocateTask<TaskBlockFor(sizeof(Made))>(sizeof(Made));
    // Task is the first base, so both have the same address.
    Task* task = qsl::ConstructAt<Made>(place.memory, std::forward<Args>(args)...);
    task->block_ = place.block;
    task->plain_block_ = Made::kHoldsNothing ? place.block : 0;
    return TaskPtr(task);
}

/// `function` takes the TaskFamilyHandle of the queue it came from, or nothing.
template <class F>
[[nodiscard]] TaskPtr MakeTask(const char* name, F&& function) {
    return NewTask<TaskFunc<std::decay_t<F>>>(name, std::forward<F>(function));
}

template <class F, class G>
[[nodiscard]] TaskPtr MakeTask(const char* name, F&& function, G&& finalizer) {
    using Made = TaskFuncFinalizer<std::decay_t<F>, std::decay_t<G>>;
    return NewTask<Made>(name, std::forward<F>(function), std::forward<G>(finalizer));
}

}  // namespace qorvex
