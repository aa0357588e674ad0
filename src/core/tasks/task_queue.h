// First-in, first-out list of owned tasks, chained through the tasks themselves, so that queueing allocates
// nothing. Not locked: the owner's mutex guards it.
#pragma once

#include <cstdint>

#include "core/tasks/task.h"

namespace qorvex {

class TaskQueue {
  public:
    using TriviallyRelocatable = TaskQueue;

    TaskQueue() = default;
    TaskQueue(TaskQueue&& other) noexcept { swap(other); }
    TaskQueue& operator=(TaskQueue&& other) noexcept {
        TaskQueue gone(std::move(other));
        swap(gone);
        return *this;
    }
    /// Destroys what is left in it, in order, without running it.
    ~TaskQueue() {
        while (TaskPtr task = pop_front())
            task.reset();
    }

    bool empty() const { return size_ == 0; }
    uint32_t size() const { return size_; }

    void push_back(TaskPtr task) {
        Task* added = task.release();
        (size_ ? last_->next_ : first_) = added;
        last_ = added;
        ++size_;
    }

    /// The oldest task, null when there is none.
    TaskPtr pop_front() {
        if (!size_) return TaskPtr();
        Task* oldest = first_;
        first_ = oldest->next_;
        --size_;
        return TaskPtr(oldest);
    }

    /// Puts all tasks of `later` behind those of this queue.
    void append(TaskQueue& later) {
        if (later.empty()) return;
        (size_ ? last_->next_ : first_) = later.first_;
        last_ = later.last_;
        size_ += std::exchange(later.size_, 0);
        later.first_ = nullptr;
    }

    void swap(TaskQueue& other) noexcept {
        std::swap(first_, other.first_);
        std::swap(last_, other.last_);
        std::swap(size_, other.size_);
    }

  private:
    // Of a queue that is not empty; the last task's link is anything.
    Task* first_ = nullptr;
    Task* last_ = nullptr;
    uint32_t size_ = 0;
};

}  // namespace qorvex
