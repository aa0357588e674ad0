#include "core/memory/temp_allocator.h"

#include <algorithm>

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"

namespace qorvex {

TempAllocator::TempAllocator() {
    blocks_.reserve(64);
    AddBlock(limits::kTempBlockBytes);
    Fill(0, 0);
}

TempAllocator::~TempAllocator() {
    for (Block& block : blocks_)
        GetAllocator()->Deallocate(block.memory, MemoryTag::Temporary);
}

void TempAllocator::AddBlock(size_t capacity) {
    auto* memory = static_cast<std::byte*>(GetAllocator()->Allocate(capacity, MemoryTag::Temporary));
    blocks_.push_back({memory, capacity, 0});
}

void TempAllocator::Fill(uint32_t block, size_t used) {
    current_ = block;
    top_ = blocks_[block].Begin() + used;
    end_ = blocks_[block].Begin() + blocks_[block].capacity;
    origin_ = blocks_[block].Begin() - used_before_;
}

void* TempAllocator::AllocateInNewBlock(size_t size, size_t alignment) {
    const uint32_t next = current_ + 1;
    if (blocks_.size() > next && blocks_[next].capacity < size + alignment) {
        GetAllocator()->Deallocate(blocks_[next].memory, MemoryTag::Temporary);
        blocks_.pop_back();
    }
    if (blocks_.size() == next) AddBlock(std::max(limits::kTempBlockBytes, size + alignment));
    Block& full = blocks_[current_];
    full.used = top_ - full.Begin();
    used_before_ += full.used;
    Fill(next, 0);
    return Allocate(size, alignment);
}

void TempAllocator::ReleaseBlocks(size_t mark) {
    // A mark on the border of two blocks lies at the end of the earlier one: the later one can go.
    // One of them stays: marks at the end of a block would take and give one back each time.
    const auto drop_last = [this] {
        GetAllocator()->Deallocate(blocks_.back().memory, MemoryTag::Temporary);
        blocks_.pop_back();
    };
    size_t used = top_ - blocks_[current_].Begin();
    while (current_ && mark <= used_before_) {
        if (blocks_.size() > current_ + 1) drop_last();
        used = blocks_[--current_].used;
        used_before_ -= used;
    }
    if (blocks_.size() > current_ + 1 && blocks_.back().capacity != limits::kTempBlockBytes) drop_last();
    Fill(current_, std::min(used, mark - used_before_));
}

TempAllocator& CurrentTempAllocator() {
    ThreadRecord& record = t_thread_record;
    if (!record.temp) [[unlikely]] {
        AssertFailure("Temporary memory is used outside a thread scope!");
        // The record stays with the thread until it next leaves an outermost scope.
        detail::OpenOutermostScope();
    }
    return *record.temp;
}

}  // namespace qorvex
