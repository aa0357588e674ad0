#include "qsl/hash_map.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>
#include <unordered_map>

#include "qsl/hash_set.h"
#include "qsl/string.h"

namespace qsl {
namespace {

struct Counting {
    static inline int live = 0;
    explicit Counting(int v) : value(std::make_unique<int>(v)) { ++live; }
    Counting(Counting&& other) noexcept : value(std::move(other.value)) { ++live; }
    Counting& operator=(Counting&&) = default;
    ~Counting() { --live; }
    std::unique_ptr<int> value;
};

TEST(HashMap, AgreesWithAReferenceUnderRandomWork) {
    std::mt19937 random(7);
    HashMap<uint64_t, Counting> map;
    std::unordered_map<uint64_t, int> reference;
    for (int step = 0; step < 40000; ++step) {
        // A small key space makes hits, misses and long runs about equally common.
        const uint64_t key = random() % 700 * 8;
        switch (random() % 4) {
            case 0:
            case 1: {
                const auto result = map.try_emplace(key, step);
                EXPECT_EQ(result.second, reference.emplace(key, step).second);
                EXPECT_EQ(*result.first->second.value, reference[key]);
                break;
            }
            case 2:
                EXPECT_EQ(map.erase(key), reference.erase(key) != 0);
                break;
            default: {
                const Counting* value = map.get(key);
                const auto found = reference.find(key);
                ASSERT_EQ(value != nullptr, found != reference.end());
                if (value) {
                    EXPECT_EQ(*value->value, found->second);
                }
            }
        }
        ASSERT_EQ(map.size(), reference.size());
        ASSERT_EQ(Counting::live, static_cast<int>(map.size()));
    }
    size_t walked = 0;
    for (const auto& [key, value] : map) {
        EXPECT_EQ(*value.value, reference.at(key));
        ++walked;
    }
    EXPECT_EQ(walked, reference.size());
    map.clear();
    EXPECT_EQ(Counting::live, 0);
    EXPECT_TRUE(map.begin() == map.end());
}

TEST(HashMap, StaysHalfEmptyAndAllocatesNothingWhileEmpty) {
    HashMap<int, int> map;
    EXPECT_EQ(map.capacity(), 0u);
    EXPECT_FALSE(map.contains(5));
    EXPECT_FALSE(map.erase(5));
    for (int i = 0; i < 1000; ++i) {
        map[i] = i;
        EXPECT_LE(map.size() * 2, map.capacity());
    }
    EXPECT_EQ(map.capacity(), 2048u);
}

struct AlikeHash {
    using Lookup = int;
    static uint64_t Hash(int) { return 42; }
    static bool Equal(int a, int b) { return a == b; }
};

// More than a distance byte can tell apart.
TEST(HashMap, HoldsManyKeysOfOneHashWithoutRunawayGrowth) {
    for (const int count : {120, 127, 3000}) {
        HashMap<int, int, AlikeHash> map;
        for (int i = 0; i < count; ++i)
            map[i] = -i;
        EXPECT_LE(map.capacity(), static_cast<size_t>(count) * 64);
        const HashMap<int, int, AlikeHash> copy = map;
        for (int i = 0; i < count; i += 2)
            EXPECT_TRUE(map.erase(i));
        for (int i = 0; i < count; ++i) {
            EXPECT_EQ(map.get_or(i, 1), i % 2 ? -i : 1);
            EXPECT_EQ(copy.get_or(i, 1), -i);
        }
        EXPECT_FALSE(map.contains(count));
    }
}

// Some keys are made to collide, others are not, and both come and go.
struct HostileHash {
    using Lookup = int;
    static uint64_t Hash(int key) { return key < 2000 ? key % 3 : static_cast<uint64_t>(key) * 8; }
    static bool Equal(int a, int b) { return a == b; }
};

TEST(HashMap, AgreesWithAReferenceWhenKeysAreMadeToCollide) {
    std::mt19937 random(3);
    HashMap<int, Counting, HostileHash> map;
    std::unordered_map<int, int> reference;
    for (int step = 0; step < 30000; ++step) {
        const auto key = static_cast<int>(random() % 4000);
        // First mostly growing, then mostly shrinking.
        if (random() % 4 < (step < 15000 ? 3u : 1u)) {
            EXPECT_EQ(map.try_emplace(key, step).second, reference.emplace(key, step).second);
        } else {
            EXPECT_EQ(map.erase(key), reference.erase(key) != 0);
        }
        const auto asked = static_cast<int>(random() % 4000);
        const Counting* value = map.get(asked);
        const auto found = reference.find(asked);
        ASSERT_EQ(value != nullptr, found != reference.end());
        if (value) {
            EXPECT_EQ(*value->value, found->second);
        }
    }
    EXPECT_EQ(Counting::live, static_cast<int>(reference.size()));
    EXPECT_LE(map.capacity(), 64u * 1024);
}

TEST(HashMap, ErasesWhileWalking) {
    HashSet<int> set;
    for (int i = 0; i < 500; ++i)
        set.insert(i);
    EXPECT_EQ(set.erase_if([](int key) { return key % 3 != 0; }), 333u);
    EXPECT_EQ(set.size(), 167u);
    for (int i = 0; i < 500; ++i)
        EXPECT_EQ(set.contains(i), i % 3 == 0);
}

TEST(HashMap, LooksStringsUpByViewAndCopiesDeeply) {
    HashMap<string, std::string> map;
    map[std::string_view("alpha")] = "a";
    map.insert(string("a name that is longer than the room inside"), "b");
    HashMap<string, std::string> copy = map;
    map.clear();
    const char text[] = "xalphax";
    ASSERT_NE(copy.get(std::string_view(text + 1, 5)), nullptr);
    EXPECT_EQ(copy.take("alpha"), "a");
    EXPECT_EQ(copy.size(), 1u);
    EXPECT_EQ(copy.begin()->second, "b");
    HashMap<string, std::string> moved = std::move(copy);
    EXPECT_TRUE(copy.empty());
    EXPECT_TRUE(moved.contains("a name that is longer than the room inside"));
}

}  // namespace
}  // namespace qsl
