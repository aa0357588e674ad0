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
    current_ = blocks_.size() - 1;
    return Allocate(size, alignment);
}

size_t TempAllocator::Mark() const {
    size_t used = 0;
    for (const Block& block : blocks_)
        used += block.used;
    return used;
}

void TempAllocator::Release(size_t mark) {
    // A mark on the border of two blocks lies at the end of the earlier one: the later one can go.
    uint32_t index = 0;
    while (index < current_ && mark > blocks_[index].used)
        mark -= blocks_[index++].used;
    for (uint32_t i = index + 1; i < blocks_.size(); ++i)
        GetAllocator()->Deallocate(blocks_[i].memory, MemoryTag::Temporary);
    blocks_.truncate(index + 1);
    blocks_[index].used = std::min(blocks_[index].used, mark);
    current_ = index;
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
