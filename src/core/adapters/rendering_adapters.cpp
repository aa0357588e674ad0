#include "core/adapters/rendering_adapters.h"

#include <string_view>

#include "core/logging/log.h"

namespace qorvex {

void* FrescoAllocator::Allocate(size_t size, size_t alignment) {
    return allocator_.AlignedAllocate(size, alignment, MemoryTag::Rendering);
}

void FrescoAllocator::Deallocate(void* block, size_t) {
    if (block) allocator_.AlignedDeallocate(block, MemoryTag::Rendering);
}

void FrescoLogHandler::WriteLog(fresco::Logging::Severity severity, const char* text, size_t length) {
    const auto level = static_cast<Logging::Severity>(severity);
    // The engine's handlers count the terminator.
    if (handler_)
        handler_->WriteLog(level, text, static_cast<unsigned>(length + 1));
    else
        Log(level, std::string_view(text, length));
}

}  // namespace qorvex
