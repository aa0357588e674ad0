// A frame's way from the layout thread to the render thread, against one round trip between the same two
// threads over a condition variable, which is the least that two threads pay to ask and answer.
#include <benchmark/benchmark.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <thread>

#include "benchmarks/page.h"

namespace {

using Clock = std::chrono::steady_clock;

// A thread that runs what it is told, one thing at a time.
class Worker {
  public:
    ~Worker() {
        Start(nullptr);
        thread_.join();
    }
    void Start(void (*work)(void*), void* argument = nullptr) {
        const std::lock_guard lock(mutex_);
        work_ = work;
        argument_ = argument;
        told_ = true;
        changed_.notify_all();
    }
    void WaitUntilDone() {
        std::unique_lock lock(mutex_);
        changed_.wait(lock, [this] { return !told_; });
    }

  private:
    void Serve() {
        for (;;) {
            std::unique_lock lock(mutex_);
            changed_.wait(lock, [this] { return told_; });
            if (!work_) return;
            lock.unlock();
            work_(argument_);
            lock.lock();
            told_ = false;
            changed_.notify_all();
        }
    }

    std::mutex mutex_;
    std::condition_variable changed_;
    void (*work_)(void*) = nullptr;
    void* argument_ = nullptr;
    bool told_ = false;
    std::thread thread_{[this] { Serve(); }};
};

// Both sides wake a thread that has been asleep for as long.
void LetTheOtherFallAsleep() {
    std::this_thread::sleep_for(std::chrono::microseconds(100));
}

// A thread that loses its processor for a moment spoils a mean, so one time is the median of some.
template <class Once>
void MeasureMedians(benchmark::State& state, Once once) {
    for (auto _ : state) {
        std::array<double, 15> seconds;
        for (double& time : seconds)
            time = once();
        std::nth_element(seconds.begin(), seconds.begin() + seconds.size() / 2, seconds.end());
        state.SetIterationTime(seconds[seconds.size() / 2]);
    }
}

// The layout side of a frame, all of it, on one thread, while the render thread waits inside Paint; until the
// frame is on the target. The page is one small box that is drawn anew.
void FrameHandover(benchmark::State& state) {
    bench::Page page({.width = 16, .height = 16, .layout_elsewhere = true});
    if (!page.IsComplete()) return state.SkipWithError("the page is not what was asked for");
    page.view().ContinuousRepaint(true);
    struct Run {
        bench::Page& page;
        std::uint32_t frame = 0;
        Clock::time_point begun{};
        Clock::time_point painted{};
        bool complete = true;
    } run{page};
    Worker layout;
    Worker render;
    MeasureMedians(state, [&] {
        run.frame = page.FrameId() + 1;
        page.Advance();
        render.Start(
            [](void* argument) {
                auto& run = *static_cast<Run*>(argument);
                const auto status = run.page.renderer().Paint(run.frame, true);
                run.painted = Clock::now();
                run.complete = run.complete && status == qorvex::PaintStatus::Complete;
            },
            &run);
        LetTheOtherFallAsleep();
        layout.Start(
            [](void* argument) {
                auto& run = *static_cast<Run*>(argument);
                run.begun = Clock::now();
                run.page.LayOut();
            },
            &run);
        layout.WaitUntilDone();
        render.WaitUntilDone();
        return std::chrono::duration<double>(run.painted - run.begun).count();
    });
    if (!run.complete) state.SkipWithError("a frame was not painted");
    state.counters["target"] = 1.5;
}
BENCHMARK(FrameHandover)->Name("frame_handover")->UseManualTime()->Iterations(40);

void RoundTrip(benchmark::State& state) {
    struct Run {
        std::mutex mutex;
        std::condition_variable asked;
        std::condition_variable answered;
        int step = 0;  // 1 asked, 2 answered
        Clock::time_point begun{};
        Clock::time_point ended{};
    } run;
    Worker layout;
    Worker render;
    MeasureMedians(state, [&] {
        run.step = 0;
        render.Start(
            [](void* argument) {
                auto& run = *static_cast<Run*>(argument);
                std::unique_lock lock(run.mutex);
                run.asked.wait(lock, [&] { return run.step == 1; });
                run.step = 2;
                lock.unlock();
                run.answered.notify_one();
            },
            &run);
        LetTheOtherFallAsleep();
        layout.Start(
            [](void* argument) {
                auto& run = *static_cast<Run*>(argument);
                run.begun = Clock::now();
                std::unique_lock lock(run.mutex);
                run.step = 1;
                lock.unlock();
                run.asked.notify_one();
                lock.lock();
                run.answered.wait(lock, [&] { return run.step == 2; });
                run.ended = Clock::now();
            },
            &run);
        layout.WaitUntilDone();
        render.WaitUntilDone();
        return std::chrono::duration<double>(run.ended - run.begun).count();
    });
}
BENCHMARK(RoundTrip)->Name("frame_handover_baseline")->UseManualTime()->Iterations(40);

}  // namespace
