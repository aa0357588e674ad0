#include "core/memory/thread_scope.h"

#include <atomic>

#include "core/memory/object_pool.h"

namespace qorvex {

constinit thread_local ThreadRecord t_thread_record;

namespace {

/// Process-wide stack of idle records. It is locked for a few instructions and only by outermost scopes, so
/// waiting would cost more than spinning.
template <class T>
class IdleStack {
  public:
    T* Take() {
        Lock();
        T* item = head_;
        if (item) head_ = item->next_free;
        Unlock();
        return item ? item : New<T, MemoryTag::General>();
    }
    void Give(T* item) {
        Lock();
        item->next_free = head_;
        head_ = item;
        Unlock();
    }
    template <class Visit>
    void ForEach(Visit&& visit) {
        Lock();
        for (T* item = head_; item; item = item->next_free)
            visit(*item);
        Unlock();
    }
    void FreeAll() {
        Lock();
        T* item = head_;
        head_ = nullptr;
        Unlock();
        while (item)
            Delete<MemoryTag::General>(std::exchange(item, item->next_free));
    }

  private:
    void Lock() {
        while (locked_.exchange(true, std::memory_order_acquire)) {
        }
    }
    void Unlock() { locked_.store(false, std::memory_order_release); }

    std::atomic<bool> locked_{false};
    T* head_ = nullptr;
};

constinit IdleStack<TempAllocator> g_idle_temp_allocators;
constinit IdleStack<PoolCache> g_idle_pool_caches;

}  // namespace

namespace detail {

void OpenOutermostScope() {
    ThreadRecord& record = t_thread_record;
    record.temp = g_idle_temp_allocators.Take();
    record.pools = g_idle_pool_caches.Take();
    record.pool_lists = ArePoolsEnabled() ? record.pools->lists : nullptr;
}

void CloseOutermostScope() {
    ThreadRecord& record = t_thread_record;
    // Whatever was taken without a mark ends with the scope.
    record.temp->Release(0);
    g_idle_temp_allocators.Give(std::exchange(record.temp, nullptr));
    record.pool_lists = nullptr;
    g_idle_pool_caches.Give(std::exchange(record.pools, nullptr));
}

}  // namespace detail

void ForgetPooledObjects() {
    const auto forget = [](PoolCache& cache) {
        for (PoolList& list : cache.lists)
            list = PoolList();
    };
    if (t_thread_record.pools) forget(*t_thread_record.pools);
    g_idle_pool_caches.ForEach(forget);
}

void FreeIdleThreadRecords() {
    g_idle_temp_allocators.FreeAll();
    g_idle_pool_caches.FreeAll();
}

}  // namespace qorvex
