// A thread's own lists of free pooled objects, one per pool. No lock guards them: they belong to whichever
// thread has the record in its scope.
#pragma once

#include <cstdint>

#include "core/limits.h"

namespace qorvex {

struct FreeObject {
    FreeObject* next;
};

/// Fewer than N objects, the newest at the head, and a full batch of N or none: neither taking one object nor
/// giving one back walks a list, and a thread at the border of a batch does not take and give batches.
struct PoolList {
    FreeObject* head = nullptr;
    FreeObject* full = nullptr;
    uint32_t count = 0;  ///< Of those at the head.
};

struct PoolCache {
    PoolList lists[limits::kObjectPools];
    PoolCache* next_free = nullptr;
    uint32_t scope_count = 0;
};

}  // namespace qorvex
