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
    AddBlock(std::max(limits::kTempBlockBytes, size + alignment));
    used_before_ += blocks_[current_].used;
    current_ = blocks_.size() - 1;
    return Allocate(size, alignment);
}

void TempAllocator::ReleaseBlocks(size_t mark) {
    // A mark on the border of two blocks lies at the end of the earlier one: the later one can go.
    while (current_ && mark <= used_before_) {
        GetAllocator()->Deallocate(blocks_[current_].memory, MemoryTag::Temporary);
        blocks_.pop_back();
        used_before_ -= blocks_[--current_].used;
    }
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
