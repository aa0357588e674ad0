#include "core/tasks/task_queue.h"

namespace qorvex {

TaskQueue::~TaskQueue() {
    while (TaskPtr task = pop_front())
        task.reset();
    while (first_)
        Delete<MemoryTag::Tasks>(std::exchange(first_, first_->next));
    Delete<MemoryTag::Tasks>(spare_);
}

void TaskQueue::AddBlock() {
    Block* block = spare_ ? std::exchange(spare_, nullptr) : New<Block, MemoryTag::Tasks>();
    block->next = nullptr;
    if (last_)
        last_->next = block;
    else
        first_ = block;
    last_ = block;
    end_ = 0;
}

void TaskQueue::DropFirstBlock() {
    Block* drained = std::exchange(first_, first_->next);
    begin_ = 0;
    Delete<MemoryTag::Tasks>(std::exchange(spare_, drained));
}

}  // namespace qorvex
