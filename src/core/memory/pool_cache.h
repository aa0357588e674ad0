// A thread's own lists of free pooled objects, one per pool. No lock guards them: they belong to whichever
// thread has the record in its scope.
#pragma once

#include <cstdint>

#include "core/limits.h"

namespace qorvex {

struct FreeObject {
    FreeObject* next;
};

/// The newest object is at the head. `split` is the object behind which the oldest N stand once the list has
/// grown beyond N, so that cutting off a batch walks nothing.
struct PoolList {
    FreeObject* head = nullptr;
    FreeObject* split = nullptr;
    uint32_t count = 0;
};

struct PoolCache {
    PoolList lists[limits::kObjectPools];
    PoolCache* next_free = nullptr;
    uint32_t scope_count = 0;
};

}  // namespace qorvex
