// The rasteriser against a plain count of sample points.
#include <gtest/gtest.h>

#include <cmath>
#include <random>

#include <fresco/paint.h>
#include "fresco/cpu/outline.h"
#include "fresco/cpu/paint_sink.h"
#include "fresco/cpu/rasterizer.h"

namespace fresco::cpu {
namespace {

constexpr int kSize = 40;
constexpr int kSamples = 16;  // in each direction

struct Coverage : CoverageSink {
    std::vector<int> values = std::vector<int>(kSize * kSize, 0);
    void Span(int y, int x0, int x1, uint8_t coverage) override {
        for (int x = x0; x < x1; ++x)
            values[size_t(y * kSize + x)] += coverage;
    }
    void Mask(int y, int x0, const uint8_t* coverage, int count) override {
        for (int i = 0; i < count; ++i)
            values[size_t(y * kSize + x0 + i)] += coverage[i];
    }
};

struct Sum : CoverageSink {
    double total = 0;
    void Span(int, int x0, int x1, uint8_t c) override { total += double(c) * (x1 - x0); }
    void Mask(int, int, const uint8_t* c, int count) override {
        for (int i = 0; i < count; ++i)
            total += c[i];
    }
};

using Polygon = std::vector<Vec2>;

int WindingAt(const Polygon& polygon, double x, double y) {
    int winding = 0;
    for (size_t i = 0, j = polygon.size() - 1; i < polygon.size(); j = i++) {
        const Vec2 a = polygon[j], b = polygon[i];
        if ((a.y <= y) == (b.y <= y)) continue;
        if (a.x + (y - a.y) / (b.y - a.y) * (b.x - a.x) <= x) winding += a.y < b.y ? 1 : -1;
    }
    return winding;
}

double Expected(const Polygon& polygon, FillRule rule, int x, int y) {
    int inside = 0;
    for (int sy = 0; sy < kSamples; ++sy) {
        for (int sx = 0; sx < kSamples; ++sx) {
            const int w = WindingAt(polygon, x + (sx + 0.5) / kSamples, y + (sy + 0.5) / kSamples);
            inside += rule == kFillEvenOdd ? w & 1 : w != 0;
        }
    }
    return 255.0 * inside / (kSamples * kSamples);
}

void Add(Rasterizer& rasterizer, const Polygon& polygon) {
    rasterizer.AddContour(polygon.data(), polygon.size());
}

Coverage Rasterize(const Polygon& polygon, FillRule rule, const IRect& bounds) {
    Rasterizer rasterizer;
    Coverage coverage;
    rasterizer.Begin(bounds);
    Add(rasterizer, polygon);
    rasterizer.Sweep(rule, coverage);
    return coverage;
}

}  // namespace

TEST(Rasterizer, AgreesWithSamplesOnConvexAndReflexShapes) {
    std::mt19937 random(7);
    std::uniform_real_distribution<double> around(-8, kSize + 8), angle(0, 6.2831853), radius(1, 18);
    for (int round = 0; round < 30; ++round) {
        // A star around a centre does not cross itself: there exact area and fill rule agree.
        Polygon polygon;
        const Vec2 center{around(random), around(random)};
        const double from = angle(random);
        for (int i = 0; i < 7; ++i) {
            const double a = from + i * 6.2831853 / 7, r = radius(random);
            polygon.push_back({center.x + r * std::cos(a), center.y + r * std::sin(a)});
        }
        if (round & 1) std::reverse(polygon.begin(), polygon.end());
        const Coverage coverage = Rasterize(polygon, kFillNonZero, {0, 0, kSize, kSize});
        for (int y = 0; y < kSize; ++y) {
            for (int x = 0; x < kSize; ++x) {
                ASSERT_NEAR(coverage.values[size_t(y * kSize + x)], Expected(polygon, kFillNonZero, x, y), 10)
                    << round << " at " << x << "," << y;
            }
        }
    }
}

TEST(Rasterizer, FillRulesDifferWhereAnOutlineWindsTwice) {
    // A pentagram whose centre winds twice.
    Polygon star;
    for (int i = 0; i < 5; ++i)
        star.push_back({20 + 18 * std::sin(i * 2.5132741), 20 - 18 * std::cos(i * 2.5132741)});
    for (const FillRule rule : {kFillNonZero, kFillEvenOdd}) {
        const Coverage coverage = Rasterize(star, rule, {0, 0, kSize, kSize});
        double difference = 0;
        for (int y = 0; y < kSize; ++y) {
            for (int x = 0; x < kSize; ++x) {
                difference += std::abs(coverage.values[size_t(y * kSize + x)] - Expected(star, rule, x, y));
            }
        }
        // Only the five crossings differ: a pixel there sums signed areas.
        EXPECT_LT(difference / (kSize * kSize), 0.5) << rule;
        EXPECT_EQ(coverage.values[20 * kSize + 20], rule == kFillNonZero ? 255 : 0);
    }
}

TEST(Rasterizer, BoundsNeverChangeAPixel) {
    std::mt19937 random(11);
    std::uniform_real_distribution<double> far(-500, 500);
    std::uniform_int_distribution<int> edge(0, kSize);
    for (int round = 0; round < 200; ++round) {
        Polygon polygon;
        for (int i = 0; i < 6; ++i)
            polygon.push_back({far(random), far(random)});
        const Coverage whole = Rasterize(polygon, kFillEvenOdd, {0, 0, kSize, kSize});
        const int xs[] = {edge(random), edge(random)}, ys[] = {edge(random), edge(random)};
        const IRect part{std::min(xs[0], xs[1]), std::min(ys[0], ys[1]), std::max(xs[0], xs[1]),
                         std::max(ys[0], ys[1])};
        const Coverage clipped = Rasterize(polygon, kFillEvenOdd, part);
        for (int y = 0; y < kSize; ++y) {
            for (int x = 0; x < kSize; ++x) {
                const bool inside = x >= part.x0 && x < part.x1 && y >= part.y0 && y < part.y1;
                ASSERT_EQ(clipped.values[size_t(y * kSize + x)],
                          inside ? whole.values[size_t(y * kSize + x)] : 0);
            }
        }
    }
}

TEST(Rasterizer, SmallShapesAreTheSameWithoutEdges) {
    std::mt19937 random(13);
    std::uniform_real_distribution<double> around(-30, kSize + 30);
    Rasterizer rasterizer;  // one for all: each shape finds what the one before left behind
    for (int round = 0; round < 300; ++round) {
        Polygon polygon;
        for (int i = 0; i < 3 + round % 9; ++i)
            polygon.push_back({around(random), around(random)});
        if (round % 3 == 0) polygon[1] = {polygon[0].x, polygon[2].y};
        const IRect bounds{round % 5, round % 7, kSize - round % 11, kSize};
        const Coverage expected = Rasterize(polygon, kFillNonZero, bounds);
        std::vector<uint8_t> bytes(size_t(bounds.Width()) * size_t(bounds.Height()), 77);
        rasterizer.BeginSmall(bounds);
        Add(rasterizer, polygon);
        rasterizer.SweepInto(bytes.data());
        size_t at = 0;
        for (int y = bounds.y0; y < bounds.y1; ++y) {
            for (int x = bounds.x0; x < bounds.x1; ++x)
                ASSERT_EQ(bytes[at++], expected.values[size_t(y * kSize + x)])
                    << round << ": " << x << "," << y;
        }
    }
}

// Rows that repeat are painted by columns, glyphs by boxes: the pixels are those of one piece after the
// other.
TEST(PaintSink, RowsAndBoxesAreTheSameAsTheirPieces) {
    std::mt19937 random(17);
    for (int round = 0; round < 200; ++round) {
        std::vector<uint32_t> pixels(kSize * kSize), expected;
        for (uint32_t& pixel : pixels)
            pixel = random() | 0xFF000000u;
        expected = pixels;
        uint8_t masks[kSize];
        for (uint8_t& mask : masks)
            mask = uint8_t(random() % 4 ? random() : random() % 2 * 255);
        const auto bitmap = [](std::vector<uint32_t>& memory) {
            return Bitmap{reinterpret_cast<uint8_t*>(memory.data()), kSize * 4, {0, 0, kSize, kSize}};
        };
        Ink ink;
        ink.color = ScalePixel(random() | 0xFF000000u, random() % 256);
        if (round % 8 == 0) ink.blend = kBlendMultiply;
        const CoverageSink::Piece pieces[] = {{int(random() % 3), 1 + round % 9, 0, true},
                                              {12, 9, uint8_t(random()), false},
                                              {22, 1 + round % 12, 0, true}};
        Vector<uint32_t> row;
        const Bitmap fast = bitmap(pixels), plain = bitmap(expected);
        PaintSink sink(fast, ink, row);
        sink.Rows(3, 30, pieces, masks);
        const IRect box{1, 34, 1 + round % 15, 36};
        sink.Box(box, masks, 19);
        PaintSink slow(plain, ink, row);
        slow.CoverageSink::Rows(3, 30, pieces, masks);
        for (int y = 34; y < 36; ++y)
            slow.Mask(y, 1, masks + (y - 34) * 19, box.Width());
        ASSERT_EQ(pixels, expected) << round;
        EXPECT_EQ(sink.painted(), slow.painted());
    }
}

TEST(Rasterizer, SurvivesTheEdgesOfItsWords) {
    // Runs of touched cells that begin, end and continue at multiples of 64.
    for (const int width : {1, 62, 63, 64, 65, 127, 128, 129, 200}) {
        for (const double inset : {0.0, 0.25, 1.0}) {
            Sum sum;
            Rasterizer rasterizer;
            for (int pass = 0; pass < 2; ++pass) {  // the second finds what the first left behind
                sum.total = 0;
                rasterizer.Begin({0, 0, width, 3});
                Add(rasterizer, {{inset, 0}, {width - inset, 1}, {width + 5.0, 3}, {-5, 3}});
                rasterizer.Sweep(kFillNonZero, sum);
                const double first = sum.total;
                rasterizer.Begin({0, 0, width, 3});
                Add(rasterizer, {{inset, 0}, {inset, 3}, {width - inset, 3}, {width - inset, 0}});
                sum.total = 0;
                rasterizer.Sweep(kFillNonZero, sum);
                EXPECT_NEAR(sum.total, 255.0 * 3 * std::abs(width - 2 * inset), 6) << width << " " << inset;
                EXPECT_GT(first, 0);
            }
        }
    }
}

TEST(Outline, CurvesAndStrokesHaveTheirArea) {
    const auto area = [](auto add) {
        Sum sum;
        Rasterizer rasterizer;
        OutlineBuilder builder;
        rasterizer.Begin({0, 0, 200, 200});
        add(builder, rasterizer);
        rasterizer.Sweep(kFillNonZero, sum);
        return sum.total / 255;
    };
    const Homography identity;
    PathData circle;
    circle.AddEllipse(100, 100, 60, 60);
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddFill(circle, identity, r); }), 3.14159265 * 3600, 12);
    StrokeStyle style;
    style.width = 10;
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddStroke(circle, style, identity, r); }),
                3.14159265 * (65 * 65 - 55 * 55), 12);
    PathData line;
    line.MoveTo({50, 100});
    line.LineTo({150, 100});
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddStroke(line, style, identity, r); }), 1000, 1);
    style.cap = kCapSquare;
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddStroke(line, style, identity, r); }), 1100, 1);
    style.cap = kCapRound;
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddStroke(line, style, identity, r); }),
                1000 + 3.14159265 * 25, 2);
    PathData corner;
    corner.MoveTo({50, 50});
    corner.LineTo({150, 50});
    corner.LineTo({150, 150});
    style.cap = kCapButt;
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddStroke(corner, style, identity, r); }), 2000,
                1);  // 25 overlap, 25 of the tip
    style.join = kJoinBevel;
    EXPECT_NEAR(area([&](auto& b, auto& r) { b.AddStroke(corner, style, identity, r); }), 2000 - 12.5, 1);
}

TEST(Outline, PerspectiveCutsWhatIsBehindTheEye) {
    // A floor that runs under the viewer: w grows negative at the bottom.
    Homography h;
    h.wy = -1.0 / 100, h.w0 = 1;
    PathData floor;
    floor.AddRect(0, 0, 30, 400);
    Rasterizer rasterizer;
    OutlineBuilder builder;
    Coverage coverage;
    rasterizer.Begin({0, 0, kSize, kSize});
    builder.AddFill(floor, h, rasterizer);
    rasterizer.Sweep(kFillNonZero, coverage);
    EXPECT_EQ(coverage.values[0], 255);
    EXPECT_EQ(coverage.values[size_t(39 * kSize + 20)], 255);
}

}  // namespace fresco::cpu
