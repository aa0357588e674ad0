// Glyphs that are graphs of paints (COLR version 1): what each kind draws, and what no graph may cost.
#include <gtest/gtest.h>

#include <random>

#include "font_files.h"

namespace fresco::test {
namespace {

constexpr uint32_t kRed = 0, kBlue = 1;
constexpr uint32_t kBox = 0x2588;  // the full block: a rectangle from the left edge of the em on
// Pixels per em of the tests, and where the glyph's origin stands.
constexpr float kSize = 40, kBaseline = 44;

uint32_t F2Dot14(double value) {
    return uint32_t(int(value * 16384)) & 0xFFFF;
}

Bytes Words(std::initializer_list<uint32_t> values) {
    Bytes out;
    for (const uint32_t value : values)
        Put16(out, value);
    return out;
}

void Put24(Bytes& out, size_t value) {
    out.push_back(uint8_t(value >> 16));
    Put16(out, uint32_t(value) & 0xFFFF);
}

void Append(Bytes& out, const Bytes& more) {
    out.insert(out.end(), more.begin(), more.end());
}

// Most paints: a format, the way to what they are made of, which stands behind them, and their own words.
Bytes Node(uint8_t format, const Bytes& inner, const Bytes& fields) {
    Bytes out{format};
    Put24(out, 4 + fields.size());
    Append(out, fields);
    Append(out, inner);
    return out;
}

Bytes Solid(uint32_t color, double alpha = 1) {
    Bytes out{2};
    Append(out, Words({color, F2Dot14(alpha)}));
    return out;
}
Bytes Glyph(uint32_t glyph, const Bytes& inner) {
    return Node(10, inner, Words({glyph}));
}
Bytes ColrGlyph(uint32_t glyph) {
    Bytes out{11};
    Put16(out, glyph);
    return out;
}
Bytes Layers(uint8_t count, uint32_t first) {
    Bytes out{1, count};
    Put32(out, first);
    return out;
}
Bytes RedToBlue(uint8_t extend = 0) {
    Bytes out{extend};
    Append(out, Words({2, F2Dot14(0), kRed, F2Dot14(1), F2Dot14(1), kBlue, F2Dot14(1)}));
    return out;
}
Bytes Composite(const Bytes& source, uint8_t mode, const Bytes& backdrop) {
    Bytes out{32};
    Put24(out, 8);
    out.push_back(mode);
    Put24(out, 8 + source.size());
    Append(out, source);
    Append(out, backdrop);
    return out;
}

class ColorFont : public testing::Test {
  protected:
    void SetUp() override {
        sans = ReadFile(kSans);
        if (sans.empty()) GTEST_SKIP() << "no DejaVu on this machine";
        service = canvas.library->GetFontService();
        plain = service->GetFont(Load(*service, sans));
        box = GlyphOf(*plain, kBox);
    }

    // The font with a graph for A, which may use the layers; its box cuts it where there is one.
    Bytes Font(const Bytes& graph, const std::vector<Bytes>& layers = {}, const Bytes& clip = {}) const {
        Table colr{Tag("COLR"), {}}, cpal{Tag("CPAL"), {}};
        Bytes bases, list, clips;
        Put32(bases, 1), Put16(bases, GlyphOf(*plain, 'A')), Put32(bases, 10);
        Append(bases, graph);
        Put32(list, uint32_t(layers.size()));
        size_t at = 4 + layers.size() * 4;
        for (const Bytes& layer : layers)
            Put32(list, uint32_t(at)), at += layer.size();
        for (const Bytes& layer : layers)
            Append(list, layer);
        if (!clip.empty()) {
            clips.push_back(1), Put32(clips, 1);
            Put16(clips, GlyphOf(*plain, 'A')), Put16(clips, GlyphOf(*plain, 'A')), Put24(clips, 12);
            clips.push_back(1), Append(clips, clip);
        }
        constexpr uint32_t kHeader = 34;
        const auto after = [](size_t size) { return kHeader + uint32_t(size); };
        Put16(colr.bytes, 1), Put16(colr.bytes, 0), Put32(colr.bytes, 0), Put32(colr.bytes, 0);
        Put16(colr.bytes, 0), Put32(colr.bytes, kHeader), Put32(colr.bytes, after(bases.size()));
        Put32(colr.bytes, clip.empty() ? 0 : after(bases.size() + list.size()));
        Put32(colr.bytes, 0), Put32(colr.bytes, 0);
        for (const Bytes& part : {bases, list, clips})
            Append(colr.bytes, part);
        Append(cpal.bytes, Words({0, 2, 1, 2}));
        Put32(cpal.bytes, 14), Put16(cpal.bytes, 0);
        for (const uint32_t bgra : {0x0000FFFFu, 0xFF0000FFu})
            Put32(cpal.bytes, bgra);
        std::vector<Table> tables = TablesOf(sans);
        tables.push_back(colr);
        tables.push_back(cpal);
        return Build(tables, false);
    }

    // Draws A; the pixel at that place of the em, y upward.
    void Show(const Bytes& font) {
        std::fill(canvas.pixels.begin(), canvas.pixels.end(), 0);
        DrawText(canvas, Load(*service, font), "A", kSize, kBaseline, {0, 1, 0, 1});
    }
    Pixel At(float x, float y) const {
        const float pixel = kSize / 2048;
        return canvas.At(int(4 + x * pixel), int(kBaseline - y * pixel));
    }
    static char Name(Pixel p) {
        if (p.a < 40) return '.';
        if (p.r > 150 && p.b < 100) return 'r';
        if (p.b > 150 && p.r < 100) return 'b';
        return p.g > 150 ? 'g' : '?';
    }
    // At a quarter and at three quarters of the block's width, high and low.
    std::string Corners() const {
        return {Name(At(300, 1300)), Name(At(1200, 1300)), ' ', Name(At(300, -100)), Name(At(1200, -100))};
    }

    Bytes sans;
    Canvas canvas{64, 64};
    IFontService* service = nullptr;
    const IFont* plain = nullptr;
    uint32_t box = 0;
};

TEST_F(ColorFont, EachKindOfPaintDrawsWhatItSays) {
    const Bytes red = Glyph(box, Solid(kRed));
    const auto word = [](int value) { return uint32_t(value) & 0xFFFF; };
    // Gradients across the block.
    const Bytes across = Node(4, RedToBlue(), Words({0, 0, 1500, 0, 0, 500}));
    const Bytes up = Node(4, RedToBlue(), Words({0, word(-400), 0, 1500, 500, word(-400)}));
    const Bytes slanted = Node(4, RedToBlue(), Words({0, 0, 1500, 0, 0, 0}));
    const Bytes radial = Node(6, RedToBlue(), Words({300, 1300, 100, 300, 1300, 600}));
    const Bytes sweep = Node(8, RedToBlue(), Words({750, 600, F2Dot14(-1), F2Dot14(1)}));
    Bytes half{12};  // a transform of half the width
    Put24(half, 7), Put24(half, 7 + red.size());
    Append(half, red);
    for (const uint32_t fixed : {0x8000u, 0u, 0u, 0x10000u, 0u, 0u})
        Put32(half, fixed);
    const Bytes narrow = Glyph(box, Node(16, across, Words({F2Dot14(0.25), F2Dot14(1)})));
    Bytes varying = Solid(kBlue);
    varying[0] = 3, Put32(varying, 0);
    struct Case {
        const char* what;
        Bytes graph;
        const char* corners;
    };
    const Case cases[] = {
        {"solid", red, "rr rr"},
        {"across", Glyph(box, across), "rb rb"},
        {"solid that varies", Glyph(box, varying), "bb bb"},
        {"up", Glyph(box, up), "bb rr"},
        {"without a second point", Glyph(box, slanted), "rb rb"},
        {"radial", Glyph(box, radial), "rb bb"},
        {"sweep", Glyph(box, sweep), "rr bb"},
        {"translate", Node(14, red, Words({word(750), 0})), ".r .r"},
        {"scale", Node(18, red, Words({F2Dot14(0.5), F2Dot14(1), 1500, 0})), ".r .r"},
        {"scale of a gradient", narrow, "bb bb"},
        {"rotate", Node(24, red, Words({F2Dot14(0.5)})), "r. .."},
        {"skew", Node(28, red, Words({F2Dot14(0.125), 0})), "r. rr"},
        {"transform", half, "r. r."},
        {"no such graph", Glyph(box, ColrGlyph(9999)), ".. .."},
        {"itself", Glyph(box, ColrGlyph(GlyphOf(*plain, 'A'))), ".. .."},
        {"source out", Composite(red, 7, red), ".. .."},
        {"source in", Composite(Solid(kBlue), 5, red), "bb bb"},
        {"destination", Composite(Glyph(box, Solid(kBlue)), 2, red), "rr rr"},
        {"clear", Composite(red, 0, red), ".. .."},
        {"unbounded", Solid(kRed), "gg gg"},
        {"no such colour", Glyph(box, Solid(77)), ".. .."},
    };
    for (const Case& c : cases) {
        Show(Font(c.graph));
        // Where nothing can be painted the outline of A shows, in the colour of the text, or misses the
        // corners.
        const std::string seen = Corners();
        if (std::string(c.corners) == "gg gg")
            EXPECT_GT(At(700, 560).g, 100) << c.what;
        else
            EXPECT_EQ(seen, c.corners) << c.what;
    }
}

TEST_F(ColorFont, LayersLieOverEachOtherInsideOfTheBox) {
    const std::vector<Bytes> layers = {Glyph(box, Solid(kRed)),
                                       Node(14, Glyph(box, Solid(kBlue)), Words({750, 0}))};
    Show(Font(Layers(2, 0), layers));
    EXPECT_EQ(Corners(), "rb rb");
    // From the left edge to the middle, above the baseline.
    Show(Font(Layers(2, 0), layers, Words({0, 0, 1000, 1800})));
    EXPECT_EQ(Corners(), "r. ..");
}

TEST_F(ColorFont, NoGraphCostsMoreThanItsShare) {
    // Each layer is all layers: 16 to the power of the depth.
    const std::vector<Bytes> bomb(16, Layers(16, 0));
    Show(Font(Layers(16, 0), bomb));
    EXPECT_GT(At(700, 560).g, 100);
    EXPECT_NE(canvas.log.lines.back().find("too much to paint"), std::string::npos);
    // Deep, and nothing but composites.
    Bytes deep = Glyph(box, Solid(kRed));
    for (int i = 0; i < 10; ++i)
        deep = Composite(deep, 3, deep);
    Show(Font(deep));
    // What fills much, often, with a gradient.
    const std::vector<Bytes> fills(4000, Glyph(box, Node(4, RedToBlue(1), Words({0, 0, 1, 0, 0, 500}))));
    Show(Font(Layers(255, 0), fills));
    Bytes wide;
    for (int i = 0; i < 20; ++i)
        wide = i == 0 ? Glyph(box, Solid(kRed)) : Node(16, wide, Words({F2Dot14(1.99), F2Dot14(-1.99)}));
    Show(Font(wide));
}

TEST_F(ColorFont, BrokenGraphsAnswer) {
    std::mt19937 random(11);
    const std::vector<Bytes> layers = {
        Glyph(box, Node(6, RedToBlue(2), Words({300, 1300, 100, 300, 1300, 600}))),
        Composite(Glyph(box, Solid(kBlue, 0.5)), 12, Node(24, Glyph(box, Solid(kRed)), Words({4000})))};
    const Bytes whole = Font(Layers(2, 0), layers, Words({0, 0, 1000, 1800}));
    size_t colr = 0;
    for (size_t i = 12; i < 12 + 16 * 30; i += 16)
        if (Read32(whole, i) == Tag("COLR")) colr = Read32(whole, i + 8);
    ASSERT_GT(colr, 0u);
    for (int round = 0; round < 60; ++round) {
        Bytes bytes = whole;
        for (int i = 0; i < 3; ++i)
            bytes[colr + random() % 200] = uint8_t(random());
        Show(bytes);
    }
}

}  // namespace
}  // namespace fresco::test
