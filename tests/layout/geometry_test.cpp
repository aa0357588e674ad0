// The quick ways of geometry.h against the plain ones.
#include "layout/geometry.h"

#include <gtest/gtest.h>

#include <limits>
#include <random>

namespace qorvex::layout {
namespace {

constexpr float kInfinity = std::numeric_limits<float>::infinity();
constexpr float kNaN = std::numeric_limits<float>::quiet_NaN();

void ExpectEqual(const Rect& a, const Rect& b) {
    EXPECT_TRUE(a.x == b.x && a.y == b.y && a.width == b.width && a.height == b.height)
        << a.x << " " << a.y << " " << a.width << " " << a.height << " and " << b.x << " " << b.y << " "
        << b.width << " " << b.height;
}

TEST(Geometry, BoundsUnderStraightMatricesEqualThoseOfTheGeneralWay) {
    const float edges[] = {0,     -0.0f, 1,       -3.25f,    1e9f,       -1e9f, 3e9f,
                           1e30f, 0.1f,  8388609, kInfinity, -kInfinity, kNaN};
    std::mt19937 random(3);
    const auto number = [&] {
        if (random() % 8 == 0) return edges[random() % std::size(edges)];
        return static_cast<float>(static_cast<int>(random() % 20000) - 10000) / 7;
    };
    for (int i = 0; i < 20000; ++i) {
        Matrix m;
        m.m[0] = random() % 3 ? 1 : number();
        m.m[5] = random() % 3 ? 1 : number();
        m.m[12] = number();
        m.m[13] = number();
        if (random() % 4 == 0) m.m[8] = number();
        if (random() % 8 == 0) m.m[random() % 16] = number();
        const Rect rect{number(), number(), random() % 2 ? 0 : number(), number(), number()};
        ExpectEqual(MapBounds(m, rect), MapBoundsInSpace(m, rect));
    }
}

TEST(Geometry, RoundingEqualsThatOfTheLibrary) {
    for (const float value : {0.0f, -0.0f, 0.5f, -0.5f, 0.99999994f, -1e-30f, 1e-30f, 3.0f, -3.0f, 8388607.5f,
                              -8388607.5f, 8388608.0f, 1e20f, -1e20f, kInfinity, -kInfinity}) {
        EXPECT_EQ(RoundDown(value), std::floor(value)) << value;
        EXPECT_EQ(RoundUp(value), std::ceil(value)) << value;
    }
    EXPECT_TRUE(std::isnan(RoundDown(kNaN)) && std::isnan(RoundUp(kNaN)));
}

}  // namespace
}  // namespace qorvex::layout
