#pragma once

#include <qorvex/work.h>

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <thread>
#include <vector>

#include "host/worker_pool.h"

namespace stress {

// Who runs the engine's work.
enum class Mode {
    Sync,          // the main thread, inside Advance
    Polling,       // the main thread, when the game finds time for it; layout is asynchronous
    LayoutThread,  // one thread for layout, the main thread for resources
    AllThreads,    // one thread for layout, two for resources, one of which never leaves; a render thread
    JobPool,       // the jobs of a client's job system, in any order; a render thread
};
constexpr int kModes = 5;
const char* NameOf(Mode mode);

inline bool HasLayoutThread(Mode mode) {
    return mode == Mode::LayoutThread || mode == Mode::AllThreads || mode == Mode::JobPool;
}
inline bool HasResourceThread(Mode mode) {
    return mode == Mode::AllThreads || mode == Mode::JobPool;
}

// The threads of one mode.
class Workers {
  public:
    explicit Workers(Mode mode);
    ~Workers() { Stop(); }

    static void OnWorkAvailable(void* workers, qorvex::WorkType type, std::uint32_t family);
    void Start(qorvex::Library* library);
    // After Library::StopWorkers, or no thread of Mode::AllThreads comes back.
    void Stop();

  private:
    struct Job {
        qorvex::WorkType type;
        std::uint32_t family;
    };
    void ServeJobs();

    const Mode mode_;
    std::atomic<qorvex::Library*> library_{nullptr};
    std::atomic<std::uint32_t> announcements_{0};
    qorvex::host::WorkerPool pool_;
    std::mutex mutex_;
    std::condition_variable arrived_;
    std::deque<Job> jobs_;
    bool stopping_ = false;
    std::vector<std::thread> threads_;
};

// The game's render thread; without one, what is posted runs at once.
class RenderThread {
  public:
    explicit RenderThread(bool threaded);
    ~RenderThread();

    void Post(std::function<void()> job);
    // Posts, and returns when it is done.
    void Call(const std::function<void()>& job);
    [[nodiscard]] bool IsThread() const { return thread_.joinable(); }

  private:
    void Serve();

    std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<std::function<void()>> jobs_;
    bool stopping_ = false;
    std::thread thread_;
};

}  // namespace stress
