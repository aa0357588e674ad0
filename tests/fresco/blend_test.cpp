// Blend modes and blurs against the formulas in double.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include <fresco/paint.h>
#include "fresco/cpu/blend_modes.h"
#include "fresco/cpu/filters.h"
#include "fresco/cpu/pixels.h"

namespace fresco::cpu {
namespace {

std::mt19937 g_random(3);

uint32_t RandomPixel() {
    const uint32_t a = g_random() % 4 == 0 ? (g_random() % 2) * 255 : g_random() % 256;
    const auto c = [&] { return a ? g_random() % (a + 1) : 0; };
    return c() | c() << 8 | c() << 16 | a << 24;
}

}  // namespace

TEST(Blend, NormalIsExactToOneStep) {
    for (int i = 0; i < 20000; ++i) {
        const uint32_t s = RandomPixel(), d = RandomPixel();
        const uint32_t out = BlendPixel(kBlendNormal, s, d);
        for (int shift = 0; shift < 32; shift += 8) {
            const double expected = (s >> shift & 255) + (d >> shift & 255) * (255.0 - (s >> 24)) / 255;
            ASSERT_NEAR(out >> shift & 255, expected, 0.51);
        }
    }
}

TEST(Blend, ModesKeepPixelsValidAndMatchKnownAnswers) {
    for (uint32_t mode = 0; mode < kBlendModeCount; ++mode) {
        for (int i = 0; i < 2000; ++i) {
            const uint32_t out = BlendPixel(mode, RandomPixel(), RandomPixel());
            for (int shift = 0; shift < 24; shift += 8)
                ASSERT_LE(out >> shift & 255, out >> 24) << mode;
        }
    }
    struct Case {
        uint32_t mode;
        int expected;  // of source 0.25 (64) on backdrop 0.5 (128), both opaque
    };
    for (const Case& c : {Case{kBlendMultiply, 32},
                          {kBlendScreen, 160},
                          {kBlendOverlay, 65},
                          {kBlendDarken, 64},
                          {kBlendLighten, 128},
                          {kBlendColorDodge, 171},
                          {kBlendColorBurn, 0},
                          {kBlendHardLight, 64},
                          {kBlendSoftLight, 96},
                          {kBlendDifference, 64},
                          {kBlendExclusion, 128},
                          {kBlendAdditive, 192},
                          {kBlendSource, 64},
                          {kBlendDestinationIn, 128},
                          {kBlendLuminosity, 64}}) {
        EXPECT_NEAR(int(BlendPixel(c.mode, 0xFF404040, 0xFF808080) & 255), c.expected, 1) << c.mode;
    }
    EXPECT_EQ(BlendPixel(kBlendClear, 0xFF404040, 0xFF808080), 0u);
    EXPECT_EQ(BlendPixel(kBlendXor, 0xFF404040, 0xFF808080), 0u);
}

TEST(Filters, BlurKeepsItsSumAndItsSpread) {
    for (const float sigma : {0.8f, 2.0f, 5.0f, 12.0f}) {
        PixelBuffer buffer;
        ASSERT_TRUE(buffer.Allocate(121, 121));
        for (int y = 50; y < 71; ++y)
            std::fill_n(buffer.Row(y) + 50, 21, 0xFFFFFFFFu);
        Blur(buffer.View(0, 0), sigma, sigma);
        double sum = 0, spread = 0;
        for (int y = 0; y < 121; ++y) {
            for (int x = 0; x < 121; ++x) {
                const double v = buffer.Row(y)[x] >> 24;
                sum += v;
                spread += v * (x - 60) * (x - 60);
                // No colour of its own: white stays white under its alpha.
                ASSERT_EQ(buffer.Row(y)[x] & 255, buffer.Row(y)[x] >> 24);
            }
        }
        EXPECT_NEAR(sum / (21 * 21 * 255), 1, 0.02) << sigma;
        const double variance = (21 * 21 - 1) / 12.0 + sigma * sigma;
        EXPECT_NEAR(spread / sum / variance, 1, 0.06) << sigma;
    }
}

}  // namespace fresco::cpu
