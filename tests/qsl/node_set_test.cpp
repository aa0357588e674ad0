#include "qsl/node_set.h"

#include <gtest/gtest.h>

#include <random>
#include <set>
#include <vector>

#include "qsl/function.h"

namespace qsl {
namespace {

int g_allocations = 0;

template <class T>
struct CountingAllocator {
    using value_type = T;
    CountingAllocator() = default;
    template <class U>
    CountingAllocator(const CountingAllocator<U>&) {}
    T* allocate(size_t count) {
        ++g_allocations;
        return std::allocator<T>().allocate(count);
    }
    void deallocate(T* memory, size_t count) { std::allocator<T>().deallocate(memory, count); }
};

TEST(NodeSet, AgreesWithAReferenceUnderRandomWork) {
    std::mt19937 random(5);
    std::vector<int64_t> nodes(600);
    NodeSet<int64_t*> set;
    std::set<int64_t*> reference;
    for (int step = 0; step < 30000; ++step) {
        int64_t* node = &nodes[random() % nodes.size()];
        if (random() % 5 < 3)
            EXPECT_EQ(set.insert(node), reference.insert(node).second);
        else
            EXPECT_EQ(set.erase(node), reference.erase(node) != 0);
        ASSERT_EQ(set.size(), reference.size());
        if (step % 100 == 0) {
            for (int64_t& each : nodes)
                ASSERT_EQ(set.contains(&each), reference.count(&each) != 0);
            EXPECT_EQ(std::set<int64_t*>(set.begin(), set.end()), reference);
        }
        if (step % 10000 == 9999) {
            set.clear();
            reference.clear();
        }
    }
}

TEST(NodeSet, GrowsByPrimesAndShrinksByOneWhenClearedRoomy) {
    std::vector<int64_t> nodes(40);
    NodeSet<int64_t*> set;
    EXPECT_EQ(set.capacity(), 0u);
    EXPECT_FALSE(set.insert(nullptr));
    for (int i = 0; i < 3; ++i)
        set.insert(&nodes[i]);
    EXPECT_EQ(set.capacity(), 5u);
    set.insert(&nodes[3]);  // 4 of 5 would pass 0.7
    EXPECT_EQ(set.capacity(), 11u);
    for (int64_t& node : nodes)
        set.insert(&node);
    EXPECT_EQ(set.capacity(), 97u);
    set.clear();
    EXPECT_EQ(set.capacity(), 97u);
    set.insert(&nodes[0]);
    set.clear();
    EXPECT_EQ(set.capacity(), 47u);
    EXPECT_FALSE(set.contains(&nodes[0]));
    set.clear();
    EXPECT_EQ(set.capacity(), 47u) << "a small table stays";
}

// Idle frames clear empty sets, and must not allocate.
TEST(NodeSet, AnEmptySetGivesALargeTableBackInStepsWithoutAllocating) {
    std::vector<int64_t> nodes(1000);
    NodeSet<int64_t*, CountingAllocator<std::byte>> set;
    for (int64_t& node : nodes)
        set.insert(&node);
    set.clear();
    EXPECT_EQ(set.capacity(), 1741u);
    const int before = g_allocations;
    set.clear();
    EXPECT_EQ(set.capacity(), 823u);
    set.insert(&nodes[0]);
    set.erase(&nodes[0]);
    for (const uint32_t capacity : {409u, 0u, 0u}) {
        set.clear();
        EXPECT_EQ(set.capacity(), capacity);
    }
    EXPECT_EQ(g_allocations, before);
    EXPECT_TRUE(set.insert(&nodes[0]));
}

TEST(Function, KeepsSmallCallablesInsideAndOwnsLargeOnes) {
    auto counter = std::make_shared<int>(0);
    function<int(int)> small = [counter](int add) { return *counter += add; };
    char padding[100] = "x";
    function<int(int)> large = [counter, padding](int add) { return *counter += add + (padding[0] == 'x'); };
    EXPECT_EQ(small(2), 2);
    EXPECT_EQ(large(2), 5);
    function<int(int)> moved = std::move(large);
    EXPECT_FALSE(large);
    EXPECT_EQ(large(1), 0) << "an empty one gives the neutral value";
    EXPECT_EQ(moved(0), 6);
    small = std::move(moved);
    EXPECT_EQ(small(0), 7);
    small.reset();
    EXPECT_EQ(counter.use_count(), 1);
}

}  // namespace
}  // namespace qsl
