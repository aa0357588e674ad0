#pragma once

#include <qorvex/work.h>

#include <condition_variable>
#include <cstdint>
#include <deque>
#include <mutex>
#include <thread>
#include <vector>

namespace qorvex {
class Library;
}

namespace qorvex::host {

// Threads that serve Library::ExecuteWork: one for layout, any number for resources. Give OnWorkAvailable to
// the library as its callback with the pool as user data, then call Start. No thread polls: each sleeps until
// work is announced, runs it until the queue is empty, and sleeps again.
//
// With no resource thread, the owner runs resource work itself through RunResources.
class WorkerPool {
  public:
    struct Settings {
        std::uint32_t resource_threads = 2;
        bool layout_thread = true;
    };

    explicit WorkerPool(Settings settings) : settings_(settings) {}
    ~WorkerPool() { Stop(); }
    WorkerPool(const WorkerPool&) = delete;
    WorkerPool& operator=(const WorkerPool&) = delete;

    // For LibraryParams::OnWorkAvailable. Any thread.
    static void OnWorkAvailable(void* pool, WorkType type, std::uint32_t family);

    // Starts the threads. The library must live until Stop has returned.
    void Start(Library* library);
    // Waits until no thread works and no announced work is left. Work that others push meanwhile counts too.
    void WaitUntilIdle();
    // Runs resource work on the calling thread when the pool has no resource thread.
    void RunResources();
    // Joins the threads. Work that is still queued stays with the library.
    void Stop();

  private:
    // One kind of work with its own threads. Guarded by mutex_.
    struct Lane {
        WorkType type = WorkType::Resources;
        std::deque<std::uint32_t> families;  // announced and not yet taken
        std::condition_variable arrived;
    };

    void Serve(Lane& lane);
    [[nodiscard]] bool IsIdle() const;

    const Settings settings_;
    Library* library_ = nullptr;
    std::mutex mutex_;
    std::condition_variable idle_;
    Lane resources_{WorkType::Resources, {}, {}};
    Lane layout_{WorkType::Layout, {}, {}};
    std::uint32_t busy_ = 0;
    bool stopping_ = false;
    std::vector<std::thread> threads_;
};

}  // namespace qorvex::host
