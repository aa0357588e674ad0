// What is process-wide: the allocator, the log handler, id counters and the pool of command buffers.
#pragma once
#include <fresco/allocator.h>
#include <fresco/logging.h>

namespace fresco {

bool DebugNamesEnabled();

}  // namespace fresco
