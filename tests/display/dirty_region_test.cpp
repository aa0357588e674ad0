#include "display/dirty_region.h"

#include <gtest/gtest.h>

#include <limits>

namespace qorvex::test {
namespace {

using dsp::DirtyRegion;
using layout::MakeRect;
using layout::Rect;

bool Covers(const DirtyRegion& region, const Rect& rect) {
    for (const Rect& part : region) {
        if (layout::Contains(part, rect)) return true;
    }
    return false;
}

TEST(DirtyRegion, MergesWhatOverlapsAndKeepsTheRest) {
    DirtyRegion region;
    region.Add(MakeRect(0, 0, 10, 10));
    region.Add(MakeRect(100, 0, 10, 10));
    region.Add(MakeRect(5, 5, 10, 10));
    EXPECT_EQ(region.Count(), 2u);
    EXPECT_TRUE(Covers(region, MakeRect(0, 0, 15, 15)));
    EXPECT_EQ(region.Bounds().width, 110);
    // The union moved to the end.
    EXPECT_EQ(region.begin()[1].width, 15);
    region.Add(MakeRect(-1, -1, 200, 200));
    EXPECT_EQ(region.Count(), 1u);
}

TEST(DirtyRegion, IgnoresWhatCannotShow) {
    DirtyRegion region;
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float infinity = std::numeric_limits<float>::infinity();
    region.Add(MakeRect(0, 0, 0, 10));
    region.Add(MakeRect(0, 0, 0.01f, 0.01f));
    region.Add(MakeRect(0, 0, -5, -5));
    region.Add(MakeRect(nan, 0, 5, 5));
    region.Add(MakeRect(0, 0, infinity, 5));
    EXPECT_TRUE(region.Empty());
    EXPECT_FALSE(region.HasArea());
}

TEST(DirtyRegion, StaysBelowItsCapacityAndReducesForScissors) {
    DirtyRegion region;
    std::vector<Rect> added;
    for (int i = 0; i < 200; ++i) {
        added.push_back(MakeRect(static_cast<float>((i % 20) * 50), static_cast<float>((i / 20) * 60), 5, 5));
        region.Add(added.back());
        EXPECT_LE(region.Count(), DirtyRegion::kCapacity);
    }
    region.ReduceForScissors();
    EXPECT_LE(region.Count(), DirtyRegion::kScissorCount);
    for (const Rect& rect : added)
        EXPECT_TRUE(Covers(region, rect));
}

TEST(DirtyRegion, ReducesRectanglesThatLieFarApart) {
    DirtyRegion region;
    for (int i = 0; i < 64; ++i)
        region.Add(
            MakeRect(static_cast<float>(i % 8) * 1e6f - 4e6f, static_cast<float>(i / 8) * 1e6f - 4e6f, 1, 1));
    region.ReduceForScissors();
    EXPECT_LE(region.Count(), DirtyRegion::kScissorCount);
}

}  // namespace
}  // namespace qorvex::test
