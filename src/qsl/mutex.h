// Mutex, lock and condition variable that clang's thread-safety analysis understands: a member marked
// QSL_GUARDED_BY(mutex_) may only be touched with the lock held, and the compiler says so when it is not.
#pragma once

#include <condition_variable>
#include <mutex>

#if defined(__clang__)
#define QSL_THREAD_ATTRIBUTE(x) __attribute__((x))
#else
#define QSL_THREAD_ATTRIBUTE(x)
#endif
#define QSL_CAPABILITY(name) QSL_THREAD_ATTRIBUTE(capability(name))
#define QSL_SCOPED_CAPABILITY QSL_THREAD_ATTRIBUTE(scoped_lockable)
#define QSL_GUARDED_BY(mutex) QSL_THREAD_ATTRIBUTE(guarded_by(mutex))
#define QSL_REQUIRES(...) QSL_THREAD_ATTRIBUTE(requires_capability(__VA_ARGS__))
#define QSL_EXCLUDES(...) QSL_THREAD_ATTRIBUTE(locks_excluded(__VA_ARGS__))
#define QSL_ACQUIRE(...) QSL_THREAD_ATTRIBUTE(acquire_capability(__VA_ARGS__))
#define QSL_RELEASE(...) QSL_THREAD_ATTRIBUTE(release_capability(__VA_ARGS__))

namespace qsl {

class QSL_CAPABILITY("mutex") Mutex {
  public:
    void Lock() QSL_ACQUIRE() { mutex_.lock(); }
    void Unlock() QSL_RELEASE() { mutex_.unlock(); }

  private:
    friend class MutexLock;
    std::mutex mutex_;
};

/// Holds a mutex for its scope; may let go of it in between.
class QSL_SCOPED_CAPABILITY MutexLock {
  public:
    explicit MutexLock(Mutex& mutex) QSL_ACQUIRE(mutex) : lock_(mutex.mutex_) {}
    ~MutexLock() QSL_RELEASE() {}
    MutexLock(const MutexLock&) = delete;
    MutexLock& operator=(const MutexLock&) = delete;

    void Lock() QSL_ACQUIRE() { lock_.lock(); }
    void Unlock() QSL_RELEASE() { lock_.unlock(); }

  private:
    friend class Condition;
    std::unique_lock<std::mutex> lock_;
};

/// Something to wait for. Waits may end without a signal: ask again.
class Condition {
  public:
    void Wait(MutexLock& lock) { condition_.wait(lock.lock_); }
    void Signal() { condition_.notify_one(); }
    void Broadcast() { condition_.notify_all(); }

  private:
    std::condition_variable condition_;
};

}  // namespace qsl
