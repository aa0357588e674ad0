#include "core/memory/pool.h"

#include <set>
#include <thread>
#include <vector>

#include "core/memory/family_names.h"
#include "support/scoped_library_state.h"

namespace qorvex {
namespace {

struct Small : MTPoolObject<Small, MemoryTag::DOM, 8> {
    explicit Small(int v = 0) : value(v) { ++live; }
    ~Small() { --live; }
    static inline std::atomic<int> live{0};
    int64_t value;
    int64_t more = 0;
};

class PoolTest : public test::QorvexTest {
  protected:
    PoolTest() { SetPoolsEnabled(true); }
    ~PoolTest() override { SetPoolsEnabled(true); }
};

TEST_F(PoolTest, ReusesObjectsAndAllocatesByTheChunk) {
    std::vector<Small*> objects;
    std::set<Small*> distinct;
    for (int i = 0; i < 80; ++i) {
        objects.push_back(Small::Take(i));
        distinct.insert(objects.back());
    }
    EXPECT_EQ(distinct.size(), 80u);
    EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::DOM), 10u);
    EXPECT_EQ(log_.Count("Allocated object pool memory chunk!"), 10u);
    for (int i = 0; i < 80; ++i)
        EXPECT_EQ(objects[i]->value, i);
    for (Small* object : objects)
        Small::Give(object);
    EXPECT_EQ(Small::live, 0);
    for (Small*& object : objects)
        object = Pool<Small>::Take();
    EXPECT_EQ(allocator_.Allocations(MemoryTag::DOM), 10u) << "the second round needs no new chunk";
    for (Small* object : objects)
        Small::Give(object);
    FreePoolChunks();
    EXPECT_EQ(log_.Count("Deleted 10 object pool memory chunks!"), 1u);
}

TEST_F(PoolTest, BatchesFlowFromTheGivingThreadToTheTakingOne) {
    // One thread makes, the other drops: the free objects must come back to the first one.
    for (int round = 0; round < 20; ++round) {
        std::vector<Small*> objects;
        for (int i = 0; i < 64; ++i)
            objects.push_back(Small::Take(i));
        std::thread([&] {
            ThreadScope scope;
            for (Small* object : objects)
                Small::Give(object);
        }).join();
    }
    EXPECT_LE(allocator_.Allocations(MemoryTag::DOM), 12u);
}

TEST_F(PoolTest, ManyThreadsTakeAndGiveAtOnce) {
    std::vector<std::thread> threads;
    for (int t = 0; t < 4; ++t) {
        threads.emplace_back([t] {
            ThreadScope scope;
            std::vector<Small*> mine;
            for (int i = 0; i < 3000; ++i) {
                mine.push_back(Small::Take(t));
                if (i % 3) {
                    EXPECT_EQ(mine.front()->value, t);
                    Small::Give(mine.front());
                    mine.erase(mine.begin());
                }
            }
            for (Small* object : mine)
                Small::Give(object);
        });
    }
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(Small::live, 0);
}

TEST_F(PoolTest, WithoutPoolsEachObjectIsAnAlignedBlock) {
    SetPoolsEnabled(false);
    Small* object = Small::Take(5);
    EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::DOM), 1u);
    Small::Give(object);
    EXPECT_EQ(allocator_.LiveBlocks(MemoryTag::DOM), 0u);
}

TEST_F(PoolTest, AnOwnersPoolGivesItsChunksBackWithIt) {
    const size_t before = allocator_.LiveBlocks();
    {
        PoolObject<std::string, MemoryTag::General, 4> pool;
        std::vector<std::string*> texts;
        for (int i = 0; i < 9; ++i)
            texts.push_back(pool.Take(50, 'x'));
        for (std::string* text : texts)
            pool.Give(text);
        std::string* again = pool.Take();
        EXPECT_EQ(again, texts.back());
        pool.Give(again);
    }
    EXPECT_EQ(allocator_.LiveBlocks(), before);
}

TEST_F(PoolTest, FamilyNamesAreOnePointerUntilTheStoreIsFull) {
    StartFamilyNames("Droid Sans");
    EXPECT_STREQ(GetDefaultFamilyName(), "Droid Sans");
    EXPECT_EQ(InternFamilyName(std::string("Droid Sans")), GetDefaultFamilyName());
    EXPECT_EQ(InternFamilyName(std::string(1100, 'a')), nullptr);
    std::vector<const char*> names;
    const char* name;
    while ((name = InternFamilyName("family " + std::to_string(names.size()))))
        names.push_back(name);
    EXPECT_GT(names.size(), 80u);
    for (size_t i = 0; i < names.size(); ++i)
        EXPECT_EQ(InternFamilyName("family " + std::to_string(i)), names[i]);
    StopFamilyNames();
}

}  // namespace
}  // namespace qorvex
