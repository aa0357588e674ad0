// Tagged memory: thread scopes, temporary memory, pointers, the tracker.
#include <thread>

#include "core/memory/containers.h"
#include "core/memory/total_memory_tracker.h"
#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

using MemoryTest = test::QorvexTest;

TEST_F(MemoryTest, NestedScopesKeepOneRecordUntilTheOuterOneCloses) {
    std::thread([] {
        TempAllocator* first;
        {
            ThreadScope outer;
            first = t_thread_record.temp;
            {
                ThreadScope inner;
                EXPECT_EQ(t_thread_record.temp, first);
                EXPECT_EQ(first->scope_count, 2u);
            }
            EXPECT_EQ(t_thread_record.temp, first);
        }
        EXPECT_EQ(t_thread_record.temp, nullptr);
        ThreadScope again;
        EXPECT_EQ(t_thread_record.temp, first) << "idle records are shared, not freed";
    }).join();
}

TEST_F(MemoryTest, MarksGiveBackBlocksBehindThem) {
    TempAllocator& temp = CurrentTempAllocator();
    const size_t blocks = allocator_.LiveBlocks(MemoryTag::Temporary);
    {
        TempMark outer;
        temp.Allocate(100, 8);
        const size_t mark = temp.Mark();
        void* large = temp.Allocate(3 * limits::kTempBlockBytes, 64);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(large) % 64, 0u);
        for (int i = 0; i < 10; ++i)
            temp.Allocate(limits::kTempBlockBytes / 2, 8);
        EXPECT_GT(allocator_.LiveBlocks(MemoryTag::Temporary), blocks + 3);
        temp.Release(mark);
        EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::Temporary), blocks);
        EXPECT_EQ(temp.Mark(), mark);
    }
    EXPECT_EQ(temp.Mark(), 0u);
    TempVector<int> numbers;
    const uint64_t before = allocator_.Allocations();
    for (int i = 0; i < 1000; ++i)
        numbers.push_back(i);
    EXPECT_EQ(allocator_.Allocations(), before);
}

TEST_F(MemoryTest, TemporaryMemoryOutsideAScopeIsAFaultButWorks) {
    std::thread([] {
        TempVector<int> numbers{1, 2, 3};
        EXPECT_EQ(numbers[2], 3);
        ThreadScope scope;
    }).join();
    EXPECT_TRUE(log_.Contains("Temporary memory is used outside a thread scope!"));
}

struct Watched : AtomicRefCounted<Watched, MemoryTag::DOM> {
    WeakBlock* GetWeakBlock() { return weak.Get(); }
    WeakSource weak;
};

TEST_F(MemoryTest, WeakPointersOutliveTheirObject) {
    RefPtr<Watched> object = MakeRef<Watched>();
    WeakPtr<Watched> watcher = object.get();
    WeakPtr<Watched> copy = watcher;
    EXPECT_EQ(copy.get(), object.get());
    std::thread([other = watcher] { EXPECT_FALSE(other == WeakPtr<Watched>()); }).join();
    object.reset();
    EXPECT_EQ(watcher.get(), nullptr);
    EXPECT_TRUE(watcher == copy);
    EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::DOM), 0u);
}

TEST_F(MemoryTest, TheTrackerWeighsLiveBytesByTag) {
    TotalMemoryTracker tracker(allocator_);
    tracker.SetWeight(MemoryTag::Temporary, 0);
    tracker.SetWeight(MemoryTag::CSS, 3);
    void* a = tracker.Allocate(100, MemoryTag::DOM);
    void* b = tracker.Allocate(50, MemoryTag::Temporary);
    void* c = tracker.Reallocate(nullptr, 10, MemoryTag::CSS);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(a) % alignof(std::max_align_t), 0u);
    EXPECT_EQ(tracker.GetTotal(), 130u);
    static_cast<char*>(c)[9] = 'x';
    c = tracker.Reallocate(c, 1000, MemoryTag::CSS);
    EXPECT_EQ(static_cast<char*>(c)[9], 'x');
    a = tracker.Reallocate(a, 20, MemoryTag::DOM);
    EXPECT_EQ(tracker.GetTotal(), 3020u);
    void* d = tracker.AlignedAllocate(64, 64, MemoryTag::DOM);
    tracker.AlignedDeallocate(d, MemoryTag::DOM);
    tracker.Deallocate(a, MemoryTag::DOM);
    tracker.Deallocate(b, MemoryTag::Temporary);
    tracker.Deallocate(c, MemoryTag::CSS);
    EXPECT_EQ(tracker.GetTotal(), 0u);
}

}  // namespace
}  // namespace qorvex
