#include "qsl/vector.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>
#include <vector>

#include "qsl/small_vector.h"

namespace qsl {
namespace {

template <class V>
class VectorTest : public ::testing::Test {};

using Vectors =
    ::testing::Types<Vector<std::string>, SmallVector<std::string, 3>, SmallVector<std::string, 8>>;
TYPED_TEST_SUITE(VectorTest, Vectors);

TYPED_TEST(VectorTest, AgreesWithAReferenceUnderRandomWork) {
    std::mt19937 random(11);
    TypeParam vector;
    std::vector<std::string> reference;
    const auto text = [&] { return std::string(random() % 30, static_cast<char>('a' + random() % 26)); };
    for (int step = 0; step < 5000; ++step) {
        const size_t at = reference.empty() ? 0 : random() % (reference.size() + 1);
        switch (random() % 9) {
            case 0:
            case 1:
                vector.push_back(reference.emplace_back(text()));
                break;
            case 2:
                vector.insert(vector.begin() + at, *reference.insert(reference.begin() + at, text()));
                break;
            case 3:
                if (at == reference.size()) break;
                vector.erase(vector.begin() + at);
                reference.erase(reference.begin() + at);
                break;
            case 4: {
                const std::vector<std::string> some(random() % 4, text());
                vector.insert(vector.begin() + at, some.begin(), some.end());
                reference.insert(reference.begin() + at, some.begin(), some.end());
                break;
            }
            case 5:
                vector.resize(at);
                reference.resize(at);
                break;
            case 6: {
                TypeParam copy = vector;
                vector = std::move(copy);
                break;
            }
            case 7: {
                TypeParam moved = std::move(vector);
                EXPECT_TRUE(vector.empty());
                vector.push_back("gone");
                vector = std::move(moved);
                break;
            }
            default:
                vector.shrink_to_fit();
        }
        ASSERT_EQ(vector.size(), reference.size());
        ASSERT_TRUE(std::equal(vector.begin(), vector.end(), reference.begin()));
    }
}

TYPED_TEST(VectorTest, TakesItsOwnItemsAsArguments) {
    TypeParam vector{"a text that needs a block of its own", "b"};
    while (vector.size() < 40)
        vector.push_back(vector.front());
    vector.insert(vector.begin(), vector.back());
    vector.resize(80, vector[1]);
    for (const std::string& item : vector)
        EXPECT_TRUE(item == "b" || item == "a text that needs a block of its own");
}

TEST(Vector, GrowsByHalfAndAtLeastByOne) {
    Vector<int> vector;
    std::vector<uint32_t> capacities;
    for (int i = 0; i < 20; ++i) {
        vector.push_back(i);
        if (capacities.empty() || capacities.back() != vector.capacity())
            capacities.push_back(vector.capacity());
    }
    EXPECT_EQ(capacities, (std::vector<uint32_t>{1, 2, 3, 5, 8, 12, 18, 27}));
    EXPECT_EQ(sizeof(vector), 16u);
}

TEST(Vector, ErasesByPredicateAndUnordered) {
    Vector<std::unique_ptr<int>> vector;
    for (int i = 0; i < 10; ++i)
        vector.push_back(std::make_unique<int>(i));
    EXPECT_EQ(vector.erase_if([](const auto& item) { return *item % 2 == 0; }), 5u);
    vector.erase_unordered(0);
    ASSERT_EQ(vector.size(), 4u);
    EXPECT_EQ(*vector[0], 9);
    EXPECT_EQ(*vector[1], 3);
}

TEST(SmallVector, StaysInsideUpToItsRoomAndComesBack) {
    SmallVector<int, 4> vector{1, 2, 3, 4};
    EXPECT_TRUE(vector.is_inline());
    vector.push_back(5);
    EXPECT_FALSE(vector.is_inline());
    vector.truncate(2);
    vector.shrink_to_fit();
    EXPECT_TRUE(vector.is_inline());
    EXPECT_EQ(vector, (SmallVector<int, 4>{1, 2}));
}

}  // namespace
}  // namespace qsl
