#include "core/tasks/task_system.h"

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"

namespace qorvex {

TaskSystem::TaskSystem(const TaskSystemSettings& settings) : settings_(settings) {
    for (uint32_t number = 0; number < kTaskChannelCount; ++number) {
        const auto channel = static_cast<TaskChannels>(number);
        TaskChannel::OnTaskPushed announce;
        if (settings.on_work_available && channel == TaskChannels::Resources)
            announce = [this](uint32_t) { Announce(WorkType::Resources, kAllTaskFamilies); };
        if (settings.on_work_available && channel == TaskChannels::Layout &&
            settings.use_dedicated_layout_thread)
            announce = [this](uint32_t family) { Announce(WorkType::Layout, family); };
        const auto finish = [this, channel](uint32_t family, TaskPtr& task) {
            FinishTask(channel, family, task);
        };
        channels_[number].Start(channel, this, finish, std::move(announce));
    }
}

TaskSystem::~TaskSystem() = default;

void TaskSystem::Announce(WorkType type, uint32_t family) {
    bool& inside = t_thread_record.in_work_callback;
    const bool before = std::exchange(inside, true);
    settings_.on_work_available(settings_.user_data, type, family);
    inside = before;
}

void TaskSystem::OpenChannel(TaskChannels channel, uint32_t family) {
    ChannelOf(channel).Open(family);
}

void TaskSystem::CloseChannel(TaskChannels channel, uint32_t family) {
    ChannelOf(channel).Close(family);
}

void TaskSystem::DestroyFamily(uint32_t family) {
    LogTrace("Destroying task family ", family);
    for (TaskChannel& channel : channels_)
        channel.Close(family);

    // A task whose predecessor was just dropped would wait for ever, and hold what it owns as long. None of
    // the family runs any more, so nothing points to these tasks but others of the same list.
    ThreadScope scope;
    TempMark mark;
    TempVector<TaskPtr> dropped;
    qsl::MutexLock lock(mutex_);
    for (WaitingList* list : {&waiting_, &waiting_for_children_}) {
        list->erase_if([&](Waiting& entry) {
            if (entry.family != family) return false;
            dropped.push_back(std::move(entry.task));
            return true;
        });
    }
    lock.Unlock();
    dropped.clear();
    lock.Lock();
}

void TaskSystem::Push(uint32_t family, TaskChannels channel, TaskPtr task) {
    if (!task) return;
    // Before it is pushed only its creator touches a task, so one that waits for nothing needs no lock here.
    if (task->Waits()) [[unlikely]]
        return PushWaiting(family, channel, std::move(task));
    ChannelOf(channel).Put(family, std::move(task));
}

void TaskSystem::PushWaiting(uint32_t family, TaskChannels channel, TaskPtr task) {
    {
        qsl::MutexLock lock(mutex_);
        if (task->Waits()) {
            waiting_.push_back(Waiting{std::move(task), family, channel});
            return;
        }
    }
    ChannelOf(channel).Put(family, std::move(task));
}

void TaskSystem::AddDependent(Task& first, Task& second) {
    // The predecessor of `second` may already have been pushed and be ending on another thread.
    qsl::MutexLock lock(mutex_);
    first.Relations().dependents.push_back(&second);
    ++second.Relations().dependency_count;
}

void TaskSystem::AddChild(Task& parent, Task& child) {
    qsl::MutexLock lock(mutex_);
    child.Relations().parent = &parent;
    parent.Relations().child_count.fetch_add(1, std::memory_order_relaxed);
}

void TaskSystem::Run(TaskChannels channel, bool blocking, const std::atomic<uint32_t>* stop_flag,
                     uint32_t family) {
    ThreadScope scope;
    ChannelOf(channel).Run(blocking, stop_flag, family);
}

void TaskSystem::ExecuteWork(WorkType type, WorkExecutionMode mode, uint32_t family) {
    if (t_thread_record.in_work_callback) {
        LogError("Work can't be executed in the notification callstack. Execution canceled.");
        return;
    }
    const bool resources = type == WorkType::Resources;
    if (mode != WorkExecutionMode::RunUntilEmpty && mode != WorkExecutionMode::RunUntilStopped) {
        LogWarning("Trying to ExecuteWork on unknown WorkExecutionMode");
        return;
    }
    Run(resources ? TaskChannels::Resources : TaskChannels::Layout,
        mode == WorkExecutionMode::RunUntilStopped, nullptr, resources ? kAllTaskFamilies : family);
}

void TaskSystem::Stop() {
    LogTrace("Stopping task system and joining threads...");
    for (TaskChannel& channel : channels_)
        channel.Quit();
    running_.store(false, std::memory_order_release);
    LogTrace("Task system stopped");
}

void TaskSystem::FinishTask(TaskChannels channel, uint32_t family, TaskPtr& task) {
    // Only the running task itself adds to its children, so a count of zero is final.
    if (task->StandsAlone()) return;

    TempMark mark;
    TempVector<Waiting> ready;
    TempVector<Waiting> ended;
    {
        qsl::MutexLock lock(mutex_);
        if (task->HasChildren()) {
            waiting_for_children_.push_back(Waiting{std::move(task), family, channel});
            return;
        }
        Settle(*task);
        Collect(waiting_for_children_, ended);
        // The end of a parent may be what others wait for.
        for (uint32_t i = 0; i < ended.size(); ++i) {
            Settle(*ended[i].task);
            Collect(waiting_for_children_, ended);
        }
        Collect(waiting_, ready);
    }
    for (Waiting& entry : ready)
        ChannelOf(entry.channel).Put(entry.family, std::move(entry.task));
}

void TaskSystem::Settle(Task& task) {
    if (!task.relations_) return;
    task.ClearHandle();
    TaskRelations& relations = *task.relations_;
    for (Task* dependent : relations.dependents)
        --dependent->relations_->dependency_count;
    relations.dependents.clear();
    if (relations.parent) relations.parent->relations_->child_count.fetch_sub(1, std::memory_order_release);
    relations.parent = nullptr;
}

void TaskSystem::Collect(WaitingList& from, TempVector<Waiting>& to) {
    from.erase_if([&](Waiting& entry) {
        if (entry.task->Waits()) return false;
        to.push_back(std::move(entry));
        return true;
    });
}

}  // namespace qorvex
