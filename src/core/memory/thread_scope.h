// What a thread has while it is inside the engine: temporary memory and a cache of pooled objects. Both come
// from process-wide free lists with the outermost scope and go back with it, so a pool of threads shares a
// few. Every public operation opens a scope; a nested one costs two increments.
#pragma once

#include "core/memory/pool_cache.h"
#include "core/memory/temp_allocator.h"

namespace qorvex {

/// Thread-local; stays with the thread.
struct ThreadRecord {
    TempAllocator* temp = nullptr;
    PoolCache* pools = nullptr;
    /// The lists of `pools`, null as well while objects do not come from pools.
    PoolList* pool_lists = nullptr;
    /// Inside a callback that announces work, where running work is refused.
    bool in_work_callback = false;
};

extern constinit thread_local ThreadRecord t_thread_record;

namespace detail {
void OpenOutermostScope();
void CloseOutermostScope();
}  // namespace detail

inline void OpenThreadScope() {
    ThreadRecord& record = t_thread_record;
    if (!record.temp) [[unlikely]]
        detail::OpenOutermostScope();
    ++record.temp->scope_count;
    ++record.pools->scope_count;
}

inline void CloseThreadScope() {
    ThreadRecord& record = t_thread_record;
    --record.pools->scope_count;
    if (--record.temp->scope_count == 0) [[unlikely]]
        detail::CloseOutermostScope();
}

class ThreadScope {
  public:
    ThreadScope() { OpenThreadScope(); }
    ~ThreadScope() { CloseThreadScope(); }
    ThreadScope(const ThreadScope&) = delete;
    ThreadScope& operator=(const ThreadScope&) = delete;
};

/// Empties the lists of free objects of the calling thread and of all idle records.
void ForgetPooledObjects();

/// Frees the records that no thread holds; for the end of the library.
void FreeIdleThreadRecords();

}  // namespace qorvex
