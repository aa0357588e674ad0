#include "core/tasks/task_system.h"

#include <array>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

constexpr uint32_t kFamily = 7;

class TaskSystemTest : public test::QorvexTest {
  protected:
    void SetUp() override { Make({}); }
    void Make(const TaskSystemSettings& settings) {
        tasks_ = std::make_unique<TaskSystem>(settings);
        for (auto channel : {TaskChannels::Main, TaskChannels::Layout, TaskChannels::Resources})
            tasks_->OpenChannel(channel, kFamily);
    }
    TaskPtr Note(const std::string& text) {
        return MakeTask("Note", [this, text] {
            std::lock_guard lock(mutex_);
            order_ += text;
        });
    }
    void RunEmpty(TaskChannels channel, uint32_t family = kFamily) {
        tasks_->Run(channel, false, nullptr, family);
    }

    std::unique_ptr<TaskSystem> tasks_;
    std::mutex mutex_;
    std::string order_;
};

TEST_F(TaskSystemTest, RunsOneFamilyInOrderAndAllFamiliesInTurn) {
    tasks_->OpenChannel(TaskChannels::Resources, 8);
    for (const char* text : {"a", "b", "c"})
        tasks_->Push(kFamily, TaskChannels::Resources, Note(text));
    for (const char* text : {"1", "2", "3"})
        tasks_->Push(8, TaskChannels::Resources, Note(text));
    RunEmpty(TaskChannels::Resources, kAllTaskFamilies);
    EXPECT_EQ(order_, "a1b2c3");
    RunEmpty(TaskChannels::Resources, kAllTaskFamilies);
    RunEmpty(TaskChannels::Main, 99);
    EXPECT_EQ(log_.Count("Trying to do tasks on a family (%d) channel that is closed99"), 1u);
}

TEST_F(TaskSystemTest, HoldsTasksBackUntilAllTheyDependOnHasRun) {
    TaskPtr last = Note("z");
    TaskPtr middle = Note("m");
    TaskPtr first = Note("a");
    TaskPtr other = Note("b");
    tasks_->AddDependent(*middle, *last);
    tasks_->AddDependent(*other, *last);
    tasks_->AddDependent(*first, *middle);
    tasks_->Push(kFamily, TaskChannels::Main, std::move(last));
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(middle));
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(other));
    RunEmpty(TaskChannels::Main);
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(first));
    RunEmpty(TaskChannels::Layout);
    EXPECT_EQ(order_, "bam");
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "bamz");
}

TEST_F(TaskSystemTest, RunsAParentAfterTheChildrenThatItWasPushedWith) {
    TaskHandle handle;
    TaskPtr parent = Note("p");
    TaskPtr child = Note("c");
    TaskPtr after = Note("x");
    parent->SetHandle(&handle);
    tasks_->AddChild(*parent, *child);
    tasks_->AddDependent(*parent, *after);
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(after));
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(parent));
    RunEmpty(TaskChannels::Layout);
    EXPECT_EQ(order_, "");
    EXPECT_NE(handle.task.load(), nullptr);
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(child));
    RunEmpty(TaskChannels::Layout);
    EXPECT_EQ(order_, "cpx");
    EXPECT_EQ(handle.task.load(), nullptr);
}

TEST_F(TaskSystemTest, AChildMadeWhileTheParentRunsKeepsItFromEnding) {
    Task* running = nullptr;
    TaskPtr parent = MakeTask("Parent", [&] {
        order_ += "p";
        TaskPtr child = Note("c");
        tasks_->AddChild(*running, *child);
        tasks_->Push(kFamily, TaskChannels::Layout, std::move(child));
    });
    running = parent.get();
    TaskPtr after = Note("x");
    tasks_->AddDependent(*parent, *after);
    tasks_->Push(kFamily, TaskChannels::Main, std::move(after));
    tasks_->Push(kFamily, TaskChannels::Main, std::move(parent));
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "p");
    RunEmpty(TaskChannels::Layout);
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "pcx");
}

TEST_F(TaskSystemTest, DropsTasksOfClosedFamiliesButRunsTheirFinalizers) {
    int finalized = 0;
    const auto make = [&] {
        return MakeTask(
            "Dropped", [] { FAIL(); }, [&] { ++finalized; });
    };
    tasks_->Push(kFamily, TaskChannels::Main, make());
    tasks_->CloseChannel(TaskChannels::Main, kFamily);
    EXPECT_EQ(finalized, 1);
    tasks_->Push(kFamily, TaskChannels::Main, make());
    EXPECT_EQ(finalized, 2);
    EXPECT_TRUE(log_.Contains("Trying to push task 'Dropped' to closed channel in family 7 dropping task!"));

    // A waiting task would otherwise hold what it owns for ever.
    TaskPtr first = make();
    TaskPtr second = make();
    tasks_->AddDependent(*first, *second);
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(second));
    tasks_->Push(kFamily, TaskChannels::Layout, std::move(first));
    tasks_->DestroyFamily(kFamily);
    EXPECT_EQ(finalized, 4);
    EXPECT_TRUE(log_.Contains("Destroying task family 7"));
}

TEST_F(TaskSystemTest, StopsAtTheFlagBeforeTheNextTask) {
    std::atomic<uint32_t> stop{0};
    tasks_->Push(kFamily, TaskChannels::Main, MakeTask("Stop", [&] { stop = 1; }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("a"));
    tasks_->Run(TaskChannels::Main, true, &stop, kFamily);
    EXPECT_EQ(order_, "");
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "a");
}

TEST_F(TaskSystemTest, AFamilyMayCloseFromInsideItsOwnTask) {
    tasks_->Push(kFamily, TaskChannels::Main,
                 MakeTask("Close", [&] { tasks_->CloseChannel(TaskChannels::Main, kFamily); }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("never"));
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "");
    EXPECT_TRUE(log_.Contains("A family (%d) channel was closed while there were still tasks in-flight!7"));
}

struct Announced {
    TaskSystem* system = nullptr;
    std::vector<std::pair<WorkType, uint32_t>> calls;
    static void Note(void* user_data, WorkType type, uint32_t family) {
        auto* self = static_cast<Announced*>(user_data);
        self->calls.push_back({type, family});
        self->system->ExecuteWork(type, WorkExecutionMode::RunUntilEmpty, family);
    }
};

TEST_F(TaskSystemTest, AnnouncesWorkNobodyIsThereForAndRefusesItInTheCallback) {
    Announced announced;
    Make({.use_dedicated_layout_thread = true,
          .on_work_available = &Announced::Note,
          .user_data = &announced});
    announced.system = tasks_.get();
    tasks_->Push(kFamily, TaskChannels::Layout, MakeTask("Pushes more", [&] {
                     tasks_->Push(kFamily, TaskChannels::Layout, Note("b"));
                     tasks_->Push(kFamily, TaskChannels::Resources, Note("c"));
                 }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("a"));
    EXPECT_EQ(announced.calls, (std::vector<std::pair<WorkType, uint32_t>>{{WorkType::Layout, kFamily}}));
    EXPECT_EQ(log_.Count("Work can't be executed in the notification callstack. Execution canceled."), 1u);
    tasks_->ExecuteWork(WorkType::Layout, WorkExecutionMode::RunUntilEmpty, kFamily);
    EXPECT_EQ(order_, "b");
    ASSERT_EQ(announced.calls.size(), 2u);
    EXPECT_EQ(announced.calls[1], (std::pair{WorkType::Resources, kAllTaskFamilies}));
    tasks_->ExecuteWork(WorkType::Resources, static_cast<WorkExecutionMode>(2), 0);
    EXPECT_TRUE(log_.Contains("Trying to ExecuteWork on unknown WorkExecutionMode"));
    tasks_->ExecuteWork(WorkType::Resources, WorkExecutionMode::RunUntilEmpty, 12345);
    EXPECT_EQ(order_, "bc");
}

TEST_F(TaskSystemTest, AStoppedLoopAnnouncesTheWorkItLeavesBehind) {
    Announced announced;
    Make({.use_dedicated_layout_thread = true,
          .on_work_available = &Announced::Note,
          .user_data = &announced});
    announced.system = tasks_.get();
    std::atomic<uint32_t> stop{0};
    tasks_->Push(kFamily, TaskChannels::Layout, MakeTask("Stop", [&] {
                     tasks_->Push(kFamily, TaskChannels::Layout, Note("left"));
                     stop = 1;
                 }));
    announced.calls.clear();
    tasks_->Run(TaskChannels::Layout, true, &stop, kFamily);
    EXPECT_EQ(announced.calls.size(), 1u);
}

TEST_F(TaskSystemTest, KeepsTheBlocksOfSmallTasksAndGivesABurstBack) {
    const auto run = [&](int count) {
        for (int i = 0; i < count; ++i)
            tasks_->Push(kFamily, TaskChannels::Main, MakeTask("Count", [] {}));
        RunEmpty(TaskChannels::Main);
    };
    run(60);
    const size_t blocks = allocator_.LiveBlocks(MemoryTag::Tasks);
    const uint64_t before = allocator_.Allocations(MemoryTag::Tasks);
    for (int round = 0; round < 10; ++round)
        run(60);
    EXPECT_EQ(allocator_.Allocations(MemoryTag::Tasks), before)
        << "neither tasks nor their places in a queue";
    run(5000);
    EXPECT_LE(allocator_.LiveBlocks(MemoryTag::Tasks), blocks + 16) << "chunks of 64 tasks";
}

TEST_F(TaskSystemTest, WithoutPoolsEveryTaskIsABlockOfItsOwn) {
    SetPoolsEnabled(false);
    const size_t before = allocator_.LiveBlocks(MemoryTag::Tasks);
    TaskPtr small = Note("a");
    TaskPtr large = MakeTask("Large", [text = std::array<char, 1000>()] { (void)text; });
    EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::Tasks), before + 2);
    small.reset();
    large.reset();
    EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::Tasks), before);
    SetPoolsEnabled(true);
}

// The main thread takes what waits in one go; none of that may show.
TEST_F(TaskSystemTest, ANestedLoopRunsWhatTheOuterOneHasTaken) {
    tasks_->Push(kFamily, TaskChannels::Main, MakeTask("Nest", [&] {
                     order_ += "(";
                     tasks_->Push(kFamily, TaskChannels::Main, Note("c"));
                     RunEmpty(TaskChannels::Main);
                     order_ += ")";
                     tasks_->Push(kFamily, TaskChannels::Main, Note("d"));
                 }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("a"));
    tasks_->Push(kFamily, TaskChannels::Main, Note("b"));
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "(abc)d");
}

TEST_F(TaskSystemTest, AStopInsideANestedLoopLeavesTheRestInOrder) {
    std::atomic<uint32_t> stop{0};
    tasks_->Push(kFamily, TaskChannels::Main, MakeTask("Nest", [&] {
                     tasks_->Run(TaskChannels::Main, true, &stop, kFamily);
                     order_ += "|";
                 }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("a"));
    tasks_->Push(kFamily, TaskChannels::Main, MakeTask("Stop", [&] { stop = 1; }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("b"));
    tasks_->Push(kFamily, TaskChannels::Main, Note("c"));
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "a|bc");
}

TEST_F(TaskSystemTest, QuittingFromATaskLeavesTheRestUnrun) {
    tasks_->Push(kFamily, TaskChannels::Main, MakeTask("Quit", [&] { tasks_->Stop(); }));
    tasks_->Push(kFamily, TaskChannels::Main, Note("never"));
    RunEmpty(TaskChannels::Main);
    RunEmpty(TaskChannels::Main);
    EXPECT_EQ(order_, "");
}

}  // namespace
}  // namespace qorvex
