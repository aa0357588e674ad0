// Pushing and running tasks against a plain deque of callables under a mutex.
#include <benchmark/benchmark.h>

#include <atomic>
#include <deque>
#include <functional>
#include <mutex>
#include <thread>

#include "core/tasks/task_system.h"

namespace {

using namespace qorvex;

constexpr int kTasks = 256;

// In a process of one thread the C library leaves its locks open; an engine never is in one.
class OtherThread {
  public:
    OtherThread() : thread_([this] { stop_.wait(false); }) {}
    ~OtherThread() {
        stop_ = true;
        stop_.notify_one();
        thread_.join();
    }

  private:
    std::atomic<bool> stop_{false};
    std::thread thread_;
};

void TaskPushRun(benchmark::State& state) {
    const OtherThread other;
    TaskSystem tasks({});
    tasks.OpenChannel(TaskChannels::Main, 1);
    uint64_t sum = 0;
    for (auto _ : state) {
        for (int i = 0; i < kTasks; ++i) {
            tasks.Push(1, TaskChannels::Main, MakeTask("Benchmark", [&sum, i] { sum += i; }));
        }
        tasks.Run(TaskChannels::Main, false, nullptr, 1);
    }
    benchmark::DoNotOptimize(sum);
    tasks.CloseChannel(TaskChannels::Main, 1);
    state.counters["target"] = 1.0;
}
BENCHMARK(TaskPushRun)->Name("task_push_run");

// Small enough for std::function to keep inside, so this side never allocates but for the deque's own blocks.
void MutexedDeque(benchmark::State& state) {
    const OtherThread other;
    std::mutex mutex;
    std::deque<std::function<void()>> queue;
    uint64_t sum = 0;
    for (auto _ : state) {
        for (int i = 0; i < kTasks; ++i) {
            const std::lock_guard lock(mutex);
            queue.emplace_back([&sum, i] { sum += i; });
        }
        for (;;) {
            std::unique_lock lock(mutex);
            if (queue.empty()) break;
            const std::function<void()> work = std::move(queue.front());
            queue.pop_front();
            lock.unlock();
            work();
        }
    }
    benchmark::DoNotOptimize(sum);
}
BENCHMARK(MutexedDeque)->Name("task_push_run_baseline");

}  // namespace
