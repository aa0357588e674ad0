// Pushing and running tasks against a plain deque of callables under a mutex.
#include <benchmark/benchmark.h>

#include <deque>
#include <functional>
#include <mutex>

#include "core/tasks/task_system.h"

namespace {

using namespace qorvex;

constexpr int kTasks = 256;

void TaskPushRun(benchmark::State& state) {
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

// The callable is on the heap, as a task is, since tasks go from thread to thread.
void MutexedDeque(benchmark::State& state) {
    std::mutex mutex;
    std::deque<std::unique_ptr<std::function<void()>>> queue;
    uint64_t sum = 0;
    for (auto _ : state) {
        for (int i = 0; i < kTasks; ++i) {
            auto work = std::make_unique<std::function<void()>>([&sum, i] { sum += i; });
            const std::lock_guard lock(mutex);
            queue.push_back(std::move(work));
        }
        for (;;) {
            std::unique_lock lock(mutex);
            if (queue.empty()) break;
            const std::unique_ptr<std::function<void()>> work = std::move(queue.front());
            queue.pop_front();
            lock.unlock();
            (*work)();
        }
    }
    benchmark::DoNotOptimize(sum);
}
BENCHMARK(MutexedDeque)->Name("task_push_run_baseline");

}  // namespace
