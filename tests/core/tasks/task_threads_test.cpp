// Many threads at once; meant for ThreadSanitizer above all.
#include <atomic>
#include <chrono>
#include <memory>
#include <thread>
#include <vector>

#include "core/tasks/task_system.h"
#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

class TaskThreadsTest : public ::testing::Test {
  protected:
    TaskThreadsTest()
        : library_(Logging::Warning), tasks_(std::make_unique<TaskSystem>(TaskSystemSettings{})) {}
    ~TaskThreadsTest() override {
        tasks_->Stop();
        for (std::thread& thread : threads_)
            thread.join();
    }
    void Serve(WorkType type, uint32_t family, int count = 1) {
        for (int i = 0; i < count; ++i)
            threads_.emplace_back(
                [=, this] { tasks_->ExecuteWork(type, WorkExecutionMode::RunUntilStopped, family); });
    }
    static void WaitFor(const std::atomic<int>& counter, int value) {
        while (counter.load() < value)
            std::this_thread::yield();
    }

    test::ScopedLibraryState library_;
    std::unique_ptr<TaskSystem> tasks_;
    std::vector<std::thread> threads_;
};

TEST_F(TaskThreadsTest, RunsEveryTaskOnceHoweverManyPushAndServe) {
    for (uint32_t family : {1u, 2u, 3u})
        tasks_->OpenChannel(TaskChannels::Resources, family);
    Serve(WorkType::Resources, 0, 3);
    std::atomic<int> run{0};
    std::vector<std::thread> pushers;
    for (uint32_t family : {1u, 2u, 3u}) {
        pushers.emplace_back([&, family] {
            ThreadScope scope;
            for (int i = 0; i < 500; ++i)
                tasks_->Push(family, TaskChannels::Resources, MakeTask("Run", [&] { ++run; }));
        });
    }
    for (std::thread& pusher : pushers)
        pusher.join();
    WaitFor(run, 1500);
    EXPECT_EQ(run, 1500);
}

TEST_F(TaskThreadsTest, KeepsChainsInOrderAcrossChannels) {
    tasks_->OpenChannel(TaskChannels::Layout, 1);
    tasks_->OpenChannel(TaskChannels::Resources, 1);
    Serve(WorkType::Layout, 1);
    Serve(WorkType::Resources, 0, 2);
    for (int round = 0; round < 100; ++round) {
        int steps[10] = {};  // each written by one task and read by the next: a lost edge is a data race
        std::atomic<int> finished{0};
        std::vector<TaskPtr> chain;
        for (int i = 0; i < 10; ++i) {
            chain.push_back(MakeTask("Step", [&steps, &finished, i] {
                steps[i] = i ? steps[i - 1] + 1 : 1;
                if (i == 9) ++finished;
            }));
            if (i) tasks_->AddDependent(*chain[i - 1], *chain[i]);
        }
        for (int i = 10; i-- > 0;)
            tasks_->Push(1, i % 2 ? TaskChannels::Layout : TaskChannels::Resources, std::move(chain[i]));
        WaitFor(finished, 1);
        EXPECT_EQ(steps[9], 10);
    }
}

TEST_F(TaskThreadsTest, ClosingWaitsForWhatRunsAndDropsTheRest) {
    Serve(WorkType::Resources, 0, 2);
    for (int round = 0; round < 50; ++round) {
        auto owned = std::make_unique<std::atomic<int>>(0);
        std::atomic<int> destroyed{0};
        tasks_->OpenChannel(TaskChannels::Resources, 5);
        for (int i = 0; i < 20; ++i) {
            tasks_->Push(5, TaskChannels::Resources,
                         MakeTask(
                             "Use", [state = owned.get()] { state->fetch_add(1); }, [&] { ++destroyed; }));
        }
        tasks_->DestroyFamily(5);
        EXPECT_EQ(destroyed, 20) << "nothing of a closed family is left";
        owned.reset();
    }
}

TEST_F(TaskThreadsTest, ClosingElsewhereDropsWhatALoopHasTakenButNotBegun) {
    tasks_->OpenChannel(TaskChannels::Main, 5);
    std::atomic<int> started{0};
    std::atomic<int> destroyed{0};
    std::atomic<bool> closing{false};
    tasks_->Push(5, TaskChannels::Main, MakeTask("Slow", [&] {
                     ++started;
                     while (!closing)
                         std::this_thread::yield();
                     std::this_thread::sleep_for(std::chrono::milliseconds(20));
                 }));
    for (int i = 0; i < 10; ++i)
        tasks_->Push(5, TaskChannels::Main,
                     MakeTask(
                         "Dropped", [] { FAIL(); }, [&] { ++destroyed; }));
    std::thread closer([&] {
        ThreadScope scope;
        WaitFor(started, 1);
        closing = true;
        tasks_->CloseChannel(TaskChannels::Main, 5);
        EXPECT_EQ(destroyed, 10);
    });
    tasks_->Run(TaskChannels::Main, false, nullptr, 5);
    closer.join();
}

TEST_F(TaskThreadsTest, ClosingSendsThoseAwayWhoWaitForJustThisFamily) {
    for (int round = 0; round < 20; ++round) {
        tasks_->OpenChannel(TaskChannels::Layout, 5);
        std::atomic<int> run{0};
        std::thread server(
            [&] { tasks_->ExecuteWork(WorkType::Layout, WorkExecutionMode::RunUntilStopped, 5); });
        tasks_->Push(5, TaskChannels::Layout, MakeTask("Run", [&] { ++run; }));
        WaitFor(run, 1);
        tasks_->CloseChannel(TaskChannels::Layout, 5);
        server.join();
    }
}

TEST_F(TaskThreadsTest, ClosingFromInsideATaskWaitsForTheOthersAlone) {
    tasks_->OpenChannel(TaskChannels::Resources, 5);
    std::atomic<int> started{0};
    std::atomic<int> ended{0};
    Serve(WorkType::Resources, 0, 2);
    tasks_->Push(5, TaskChannels::Resources, MakeTask("Slow", [&] {
                     ++started;
                     std::this_thread::sleep_for(std::chrono::milliseconds(20));
                     ++ended;
                 }));
    tasks_->Push(5, TaskChannels::Resources, MakeTask("Close", [&] {
                     WaitFor(started, 1);
                     tasks_->CloseChannel(TaskChannels::Resources, 5);
                     EXPECT_EQ(ended, 1);
                     ++ended;
                 }));
    WaitFor(ended, 2);
}

TEST_F(TaskThreadsTest, WakesTheThreadThatWaitsForJustThisFamily) {
    for (uint32_t family = 1; family <= 4; ++family) {
        tasks_->OpenChannel(TaskChannels::Layout, family);
        Serve(WorkType::Layout, family);
    }
    std::atomic<int> run{0};
    for (int i = 0; i < 400; ++i) {
        tasks_->Push(1 + i % 4, TaskChannels::Layout, MakeTask("Run", [&] { ++run; }));
        WaitFor(run, i + 1);
    }
}

TEST_F(TaskThreadsTest, StopReleasesWaitingThreadsWithWorkStillQueued) {
    tasks_->OpenChannel(TaskChannels::Layout, 1);
    tasks_->OpenChannel(TaskChannels::Resources, 1);
    Serve(WorkType::Layout, 1, 2);
    Serve(WorkType::Resources, 0, 2);
    std::thread pusher([&] {
        ThreadScope scope;
        for (int i = 0; i < 1000; ++i)
            tasks_->Push(1, TaskChannels::Resources, MakeTask("Idle", [] {}));
    });
    tasks_->Stop();
    EXPECT_FALSE(tasks_->IsRunning());
    pusher.join();
    // The destructor joins the servers: a thread that missed the stop would hang there.
}

}  // namespace
}  // namespace qorvex
