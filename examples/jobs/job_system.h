// A game's own job system in miniature: two threads and one list of jobs. Nothing in it knows the engine but
// Job::Run.
#pragma once

#include <qorvex/library.h>

#include <algorithm>
#include <condition_variable>
#include <deque>
#include <mutex>
#include <thread>
#include <vector>

// "There may be engine work of this type and family."
struct Job {
    qorvex::WorkType type;
    std::uint32_t family;

    void Run(qorvex::Library& library) const {
        library.ExecuteWork(type, qorvex::WorkExecutionMode::RunUntilEmpty, family);
    }
    // Layout of one view wants one thread at a time; resource work takes as many as there are.
    [[nodiscard]] bool IsSerial() const { return type == qorvex::WorkType::Layout; }
    friend bool operator==(const Job& a, const Job& b) { return a.type == b.type && a.family == b.family; }
};

class JobSystem {
  public:
    ~JobSystem() { Stop(); }

    void Start(qorvex::Library& library) {
        for (int i = 0; i < 2; ++i)
            threads_.emplace_back([this, &library] { Serve(library); });
    }

    // For LibraryParams::OnWorkAvailable: an engine lock is held here, so the job is only written down.
    static void OnWorkAvailable(void* jobs, qorvex::WorkType type, std::uint32_t family) {
        static_cast<JobSystem*>(jobs)->Add({type, family});
    }

    void Stop() {
        {
            const std::lock_guard lock(mutex_);
            stopping_ = true;
        }
        changed_.notify_all();
        for (std::thread& thread : threads_)
            thread.join();
        threads_.clear();
    }

  private:
    void Add(Job job) {
        {
            const std::lock_guard lock(mutex_);
            // A job runs all that it finds, so one that nobody has begun is enough.
            if (std::find(waiting_.begin(), waiting_.end(), job) != waiting_.end()) return;
            waiting_.push_back(job);
        }
        changed_.notify_one();
    }

    void Serve(qorvex::Library& library) {
        std::unique_lock lock(mutex_);
        while (!stopping_) {
            const auto next =
                std::find_if(waiting_.begin(), waiting_.end(), [this](Job job) { return MayRun(job); });
            if (next == waiting_.end()) {
                changed_.wait(lock);
                continue;
            }
            const Job job = *next;
            waiting_.erase(next);
            running_.push_back(job);
            lock.unlock();
            job.Run(library);
            lock.lock();
            running_.erase(std::find(running_.begin(), running_.end(), job));
            if (job.IsSerial()) changed_.notify_all();  // its successor may have been passed over
        }
    }
    [[nodiscard]] bool MayRun(const Job& job) const {
        return !job.IsSerial() || std::find(running_.begin(), running_.end(), job) == running_.end();
    }

    std::mutex mutex_;
    std::condition_variable changed_;
    std::deque<Job> waiting_;
    std::vector<Job> running_;
    bool stopping_ = false;
    std::vector<std::thread> threads_;
};
