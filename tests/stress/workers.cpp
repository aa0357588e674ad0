#include "workers.h"

#include <qorvex/library.h>

namespace stress {

using qorvex::WorkExecutionMode;
using qorvex::WorkType;

const char* NameOf(Mode mode) {
    static constexpr const char* kNames[kModes] = {"sync", "polling", "layout", "threads", "jobs"};
    return kNames[static_cast<int>(mode)];
}

Workers::Workers(Mode mode)
    : mode_(mode),
      pool_({mode == Mode::AllThreads ? 1u : 0u, mode == Mode::LayoutThread || mode == Mode::AllThreads}) {}

void Workers::OnWorkAvailable(void* workers, WorkType type, std::uint32_t family) {
    auto* self = static_cast<Workers*>(workers);
    qorvex::Library* library = self->library_;
    // A client that has not read the manual: the engine refuses.
    if (library && self->announcements_++ % 50 == 49)
        library->ExecuteWork(type, WorkExecutionMode::RunUntilEmpty, family);
    if (self->mode_ == Mode::JobPool) {
        const std::lock_guard lock(self->mutex_);
        self->jobs_.push_back({type, family});
        self->arrived_.notify_one();
    } else if (self->mode_ == Mode::LayoutThread || self->mode_ == Mode::AllThreads) {
        qorvex::host::WorkerPool::OnWorkAvailable(&self->pool_, type, family);
    }
}

void Workers::Start(qorvex::Library* library) {
    library_ = library;
    pool_.Start(library);
    if (mode_ == Mode::AllThreads)
        threads_.emplace_back(
            [library] { library->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilStopped, 0); });
    if (mode_ == Mode::JobPool)
        for (int i = 0; i < 2; ++i)
            threads_.emplace_back([this] { ServeJobs(); });
}

void Workers::ServeJobs() {
    std::unique_lock lock(mutex_);
    for (unsigned turn = 0;; ++turn) {
        arrived_.wait(lock, [this] { return stopping_ || !jobs_.empty(); });
        if (stopping_) return;
        // A job system promises no order.
        const Job job = turn % 3 == 0 ? jobs_.back() : jobs_.front();
        turn % 3 == 0 ? jobs_.pop_back() : jobs_.pop_front();
        lock.unlock();
        library_.load()->ExecuteWork(job.type, WorkExecutionMode::RunUntilEmpty, job.family);
        lock.lock();
    }
}

void Workers::Stop() {
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    arrived_.notify_all();
    pool_.Stop();
    for (std::thread& thread : threads_)
        thread.join();
    threads_.clear();
}

RenderThread::RenderThread(bool threaded) {
    if (threaded) thread_ = std::thread([this] { Serve(); });
}

RenderThread::~RenderThread() {
    if (!IsThread()) return;
    {
        const std::lock_guard lock(mutex_);
        stopping_ = true;
    }
    changed_.notify_all();
    thread_.join();
}

void RenderThread::Post(std::function<void()> job) {
    if (!IsThread()) return job();
    {
        const std::lock_guard lock(mutex_);
        jobs_.push_back(std::move(job));
    }
    changed_.notify_all();
}

void RenderThread::Call(const std::function<void()>& job) {
    if (!IsThread()) return job();
    bool done = false;
    Post([&] {
        job();
        const std::lock_guard lock(mutex_);
        done = true;
        changed_.notify_all();
    });
    std::unique_lock lock(mutex_);
    changed_.wait(lock, [&] { return done; });
}

void RenderThread::Serve() {
    std::unique_lock lock(mutex_);
    for (;;) {
        changed_.wait(lock, [this] { return stopping_ || !jobs_.empty(); });
        if (jobs_.empty()) return;
        const std::function<void()> job = std::move(jobs_.front());
        jobs_.pop_front();
        lock.unlock();
        job();
        lock.lock();
    }
}

}  // namespace stress
