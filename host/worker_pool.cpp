#include "worker_pool.h"

#include <qorvex/library.h>

#include <algorithm>

namespace qorvex::host {

void WorkerPool::OnWorkAvailable(void* pool, WorkType type, std::uint32_t family) {
    auto* self = static_cast<WorkerPool*>(pool);
    const std::lock_guard lock(self->mutex_);
    Lane& lane = type == WorkType::Layout ? self->layout_ : self->resources_;
    // One entry a family is enough: whoever takes it runs the family's queue to its end.
    if (type == WorkType::Resources ||
        std::find(lane.families.begin(), lane.families.end(), family) == lane.families.end()) {
        lane.families.push_back(family);
    }
    lane.arrived.notify_one();
}

void WorkerPool::Start(Library* library) {
    library_ = library;
    if (settings_.layout_thread) threads_.emplace_back([this] { Serve(layout_); });
    for (std::uint32_t i = 0; i < settings_.resource_threads; ++i) {
        threads_.emplace_back([this] { Serve(resources_); });
    }
}

void WorkerPool::Serve(Lane& lane) {
    std::unique_lock lock(mutex_);
    for (;;) {
        lane.arrived.wait(lock, [&] { return stopping_ || !lane.families.empty(); });
        if (stopping_) return;
        const std::uint32_t family = lane.families.front();
        lane.families.pop_front();
        ++busy_;
        lock.unlock();
        library_->ExecuteWork(lane.type, WorkExecutionMode::RunUntilEmpty, family);
        lock.lock();
        --busy_;
        if (IsIdle()) idle_.notify_all();
    }
}

bool WorkerPool::IsIdle() const {
    const bool resources_served = settings_.resource_threads > 0;
    const bool layout_served = settings_.layout_thread;
    return busy_ == 0 && (!resources_served || resources_.families.empty()) &&
           (!layout_served || layout_.families.empty());
}

void WorkerPool::WaitUntilIdle() {
    std::unique_lock lock(mutex_);
    idle_.wait(lock, [this] { return stopping_ || IsIdle(); });
}

void WorkerPool::RunResources() {
    if (settings_.resource_threads > 0) return;
    {
        const std::lock_guard lock(mutex_);
        resources_.families.clear();
    }
    library_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, kAllTaskFamilies);
}

void WorkerPool::Stop() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
        resources_.arrived.notify_all();
        layout_.arrived.notify_all();
        idle_.notify_all();
    }
    for (std::thread& thread : threads_)
        thread.join();
    threads_.clear();
}

}  // namespace qorvex::host
