// Double-ended queue of owned tasks in blocks of 64 pointers. A drained block is kept for the next push, so a
// queue in steady use allocates nothing. Not locked: the owner's mutex guards it.
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
    ~TaskQueue();

    bool empty() const { return size_ == 0; }
    uint32_t size() const { return size_; }

    void push_back(TaskPtr task) {
        if (!last_ || end_ == kBlockTasks) AddBlock();
        last_->tasks[end_++] = task.release();
        ++size_;
    }

    /// The oldest task, null when there is none.
    TaskPtr pop_front() {
        if (!size_) return TaskPtr();
        TaskPtr task(first_->tasks[begin_++]);
        if (--size_ == 0)
            begin_ = end_ = 0;
        else if (begin_ == kBlockTasks)
            DropFirstBlock();
        return task;
    }

    void swap(TaskQueue& other) noexcept {
        std::swap(first_, other.first_);
        std::swap(last_, other.last_);
        std::swap(spare_, other.spare_);
        std::swap(begin_, other.begin_);
        std::swap(end_, other.end_);
        std::swap(size_, other.size_);
    }

  private:
    static constexpr uint32_t kBlockTasks = 64;
    struct Block {
        Task* tasks[kBlockTasks];
        Block* next;
    };
    void AddBlock();
    void DropFirstBlock();

    Block* first_ = nullptr;
    Block* last_ = nullptr;
    Block* spare_ = nullptr;
    uint32_t begin_ = 0;  ///< In the first block.
    uint32_t end_ = 0;    ///< In the last block.
    uint32_t size_ = 0;
};

}  // namespace qorvex
