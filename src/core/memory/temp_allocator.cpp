#include "core/memory/temp_allocator.h"

#include <algorithm>

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"

namespace qorvex {

TempAllocator::TempAllocator() {
    blocks_.reserve(64);
    AddBlock(limits::kTempBlockBytes);
}

TempAllocator::~TempAllocator() {
    for (Block& block : blocks_)
        GetAllocator()->Deallocate(block.memory, MemoryTag::Temporary);
}

void TempAllocator::AddBlock(size_t capacity) {
    auto* memory = static_cast<std::byte*>(GetAllocator()->Allocate(capacity, MemoryTag::Temporary));
    blocks_.push_back({memory, 0, capacity});
}

void* TempAllocator::AllocateInNewBlock(size_t size, size_t alignment) {
    const size_t next = current_ + 1;
    if (blocks_.size() > next && blocks_[next].capacity < size + alignment) {
        GetAllocator()->Deallocate(blocks_[next].memory, MemoryTag::Temporary);
        blocks_.pop_back();
    }
    if (blocks_.size() == next) AddBlock(std::max(limits::kTempBlockBytes, size + alignment));
    blocks_[next].used = 0;
    used_before_ += blocks_[current_].used;
    current_ = static_cast<uint32_t>(next);
    return Allocate(size, alignment);
}

void TempAllocator::ReleaseBlocks(size_t mark) {
    // A mark on the border of two blocks lies at the end of the earlier one: the later one can go.
    // One of them stays: marks at the end of a block would take and give one back each time.
    const auto drop_last = [this] {
        GetAllocator()->Deallocate(blocks_.back().memory, MemoryTag::Temporary);
        blocks_.pop_back();
    };
    while (current_ && mark <= used_before_) {
        if (blocks_.size() > current_ + 1) drop_last();
        used_before_ -= blocks_[--current_].used;
    }
    if (blocks_.size() > current_ + 1 && blocks_.back().capacity != limits::kTempBlockBytes) drop_last();
    blocks_[current_].used = std::min(blocks_[current_].used, mark - used_before_);
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
