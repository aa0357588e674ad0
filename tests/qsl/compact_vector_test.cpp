#include "qsl/compact_vector.h"

#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "qsl/ref_ptr.h"

namespace qsl {
namespace {

struct Counted {
    void AddRef() { ++count; }
    void Release() { --count; }
    int count = 0;
};
using List = CompactVector<RefPtr<Counted>>;
static_assert(sizeof(List) == sizeof(void*));

TEST(CompactVector, AgreesWithAReferenceUnderRandomWork) {
    std::mt19937 random(5);
    Counted objects[16];
    {
        List list;
        std::vector<Counted*> reference;
        for (int step = 0; step < 20000; ++step) {
            Counted* object = &objects[random() % std::size(objects)];
            const size_t at = random() % (reference.size() + 1);
            switch (random() % 8) {
                case 0:
                    list.push_back(object);
                    reference.push_back(object);
                    break;
                case 1:
                    EXPECT_EQ(*list.insert(list.begin() + at, object), object);
                    reference.insert(reference.begin() + at, object);
                    break;
                case 2:
                case 3:
                    if (at == reference.size()) break;
                    EXPECT_EQ(list.erase(list.begin() + at) - list.begin(), static_cast<ptrdiff_t>(at));
                    reference.erase(reference.begin() + at);
                    break;
                case 4: {
                    List copy = list;
                    list = copy;
                    break;
                }
                case 5: {
                    List moved = std::move(list);
                    EXPECT_TRUE(list.empty());
                    list.push_back(object);
                    list = std::move(moved);
                    break;
                }
                case 6: {
                    List other;
                    for (size_t i = 0; i < at; ++i)
                        other.push_back(object);
                    other = list;
                    list.swap(other);
                    break;
                }
                default:
                    if (random() % 8 == 0) {
                        list.clear();
                        reference.clear();
                    }
            }
            ASSERT_EQ(list.size(), reference.size());
            ASSERT_TRUE(std::equal(list.begin(), list.end(), reference.begin()));
            int held = 0;
            for (const Counted& each : objects)
                held += each.count;
            ASSERT_EQ(held, static_cast<int>(reference.size()));
            if (reference.empty()) continue;
            EXPECT_EQ(list.front(), reference.front());
            EXPECT_EQ(list.back(), reference.back());
        }
    }
    for (const Counted& each : objects)
        EXPECT_EQ(each.count, 0);
}

}  // namespace
}  // namespace qsl
