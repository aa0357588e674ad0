// Kinds of fonts: packed, coloured, variable, of pictures, and broken ones. Files are made here from the
// bytes of an installed font, so that no binary stands in the tree.
#include <gtest/gtest.h>

#include <random>

#include "font_files.h"

namespace fresco::test {
namespace {

// COLR of one glyph: its layers are the glyphs given, in palette colours red and blue.
void AddColor(std::vector<Table>& tables, uint32_t base, uint32_t red, uint32_t blue) {
    Table colr{Tag("COLR"), {}}, cpal{Tag("CPAL"), {}};
    Put16(colr.bytes, 0), Put16(colr.bytes, 1), Put32(colr.bytes, 14), Put32(colr.bytes, 20),
        Put16(colr.bytes, 2);
    for (const uint32_t value : {base, 0u, 2u, red, 0u, blue, 1u})
        Put16(colr.bytes, value);
    Put16(cpal.bytes, 0), Put16(cpal.bytes, 2), Put16(cpal.bytes, 1), Put16(cpal.bytes, 2);
    Put32(cpal.bytes, 14), Put16(cpal.bytes, 0);
    for (const uint32_t bgra : {0x0000FFFFu, 0xFF0000FFu})
        Put32(cpal.bytes, bgra);
    tables.push_back(colr);
    tables.push_back(cpal);
}

class FontKinds : public testing::Test {
  protected:
    void SetUp() override {
        sans = ReadFile(kSans);
        if (sans.empty()) GTEST_SKIP() << "no DejaVu on this machine";
        service = canvas.library->GetFontService();
    }
    Bytes sans;
    Canvas canvas{64, 64};
    IFontService* service = nullptr;
};

TEST_F(FontKinds, PackedFontsMeasureAsPlainOnes) {
    const FontId plain = Load(*service, sans);
    const FontId packed = Load(*service, Build(TablesOf(sans), true));
    ASSERT_NE(packed, kNoId);
    const IFont& a = *service->GetFont(plain);
    const IFont& b = *service->GetFont(packed);
    EXPECT_EQ(GlyphOf(a, 'g'), GlyphOf(b, 'g'));
    EXPECT_EQ(GlyphOf(a, 0x627), GlyphOf(b, 0x627));
    EXPECT_FLOAT_EQ(a.GetMetrics(20).ascent, b.GetMetrics(20).ascent);
    // A header that promises a font of gigabytes is not believed.
    Bytes liar = Build(TablesOf(sans), true);
    liar[16] = 0x7F;
    Load(*service, liar);
}

TEST_F(FontKinds, LayersOfColourArePictures) {
    const FontId plain = Load(*service, sans);
    const IFont& font = *service->GetFont(plain);
    std::vector<Table> tables = TablesOf(sans);
    AddColor(tables, GlyphOf(font, 'A'), GlyphOf(font, 0x2588), GlyphOf(font, '.'));
    const FontId colored = Load(*service, Build(tables, false));
    ASSERT_NE(colored, kNoId);
    DrawText(canvas, colored, "A", 40, 44);
    const Pixel pixel = canvas.At(12, 20);
    EXPECT_GT(pixel.r, 200);
    EXPECT_LT(pixel.b, 40);
    // Other glyphs keep the colour of the text.
    DrawText(canvas, colored, "B", 40, 44, {0, 1, 0, 1});
    EXPECT_GT(canvas.At(10, 30).g, 200);
}

TEST_F(FontKinds, FieldsCoverWhatOutlinesCover) {
    for (const float size : {12.0f, 18.0f, 27.0f, 40.0f, 60.0f}) {
        Canvas outline(64, 64), field(64, 64);
        const FontId a = Load(*outline.library->GetFontService(), sans);
        const FontId b = Load(*field.library->GetFontService(), sans, SdfMode::Always);
        DrawText(outline, a, "Rg", size, 48);
        DrawText(field, b, "Rg", size, 48);
        const long expected = outline.Ink();
        EXPECT_GT(expected, 1000);
        EXPECT_NEAR(double(field.Ink()), double(expected), double(expected) * 0.08) << size;
    }
}

TEST_F(FontKinds, PicturesMakeAFont) {
    // Two glyphs in a page of 4 by 2 pixels: white and red squares.
    const uint32_t page[8] = {~0u, ~0u, 0xFF0000FF, 0xFF0000FF, ~0u, ~0u, 0xFF0000FF, 0xFF0000FF};
    const BitmapFontImage image{page, 4, 2, 16};
    BitmapFontDescription description{"Tiles", 0, &image, 1};
    const std::string table =
        "info face=\"Tiles\" size=2\ncommon lineHeight=3 base=2 pages=1\n"
        "char id=65 x=0 y=0 width=2 height=2 xoffset=0 yoffset=0 xadvance=3 page=0\r\n"
        "char id=66 x=2 y=0 width=2 height=2 xoffset=0 yoffset=0 xadvance=2 page=0\n"
        "char id=67 x=-9 y=900000 width=99999 height=1 xadvance=-4 page=77\n"
        "kerning first=65 second=66 amount=-1\nnonsense\nchar id=\n";
    MemoryReader reader(Bytes(table.begin(), table.end()));
    const FontId id = service->RegisterBitmapFont(&reader, description);
    ASSERT_NE(id, kNoId);
    EXPECT_EQ(service->FindFont("tiles", 0), id);
    const IFont& font = *service->GetFont(id);
    uint32_t glyphs[] = {GlyphOf(font, 'A'), GlyphOf(font, 'Z')};
    EXPECT_NE(glyphs[0], 0u);
    EXPECT_EQ(glyphs[1], 0u);
    float advances[2];
    EXPECT_TRUE(font.GetAdvances(glyphs, 2, 20, advances));
    EXPECT_FLOAT_EQ(advances[0], 30);
    EXPECT_FLOAT_EQ(font.GetMetrics(20).ascent, -20);
    // White pictures take the colour of the text, black text hides nothing but colours.
    DrawText(canvas, id, "AB", 20, 30, {0, 1, 0, 1});
    EXPECT_EQ(canvas.At(14, 20), (Pixel{0, 255, 0, 255}));
    EXPECT_EQ(canvas.At(46, 20), (Pixel{0, 0, 0, 255}));
    DrawText(canvas, id, "C", 20, 60);
    for (const char* bad : {"", "char", "common lineHeight=nan\nchar id=99999999999"}) {
        MemoryReader empty(Bytes(bad, bad + std::strlen(bad)));
        EXPECT_EQ(service->RegisterBitmapFont(&empty, description), kNoId);
    }
    description.imageCount = 0;
    EXPECT_EQ(service->RegisterBitmapFont(&reader, description), kNoId);
}

TEST_F(FontKinds, BrokenFilesAnswerOrAreRefused) {
    std::mt19937 random(7);
    uint32_t text[] = {'a', 'f', 'i', 0x627, 0x644, 0x301, 0x10FFFF};
    for (int round = 0; round < 60; ++round) {
        Bytes bytes = sans;
        if (round % 3 == 0) bytes.resize(random() % bytes.size());
        for (int i = 0; i < 40 && !bytes.empty(); ++i)
            bytes[random() % std::min<size_t>(bytes.size(), round % 2 ? 4096 : bytes.size())] =
                uint8_t(random());
        const FontId id = Load(*service, bytes);
        const IFont* font = service->GetFont(id);
        if (!font) continue;
        GlyphSink sink;
        ShapeRequest request;
        request.codePoints = text, request.count = 7;
        font->Shape(request, sink);
        for (const ShapedGlyph& glyph : sink.glyphs)
            EXPECT_TRUE(std::isfinite(glyph.advance) && glyph.cluster < 7);
        font->PreloadGlyphs(text, 7);
        font->PreloadText("afi \u0627\u0644\u0301\n\xF0", 13);
        EXPECT_TRUE(std::isfinite(font->GetMetrics(20).ascent));
        DrawText(canvas, id, "afi", 20, 30);
    }
}

TEST_F(FontKinds, ShapingRemembersByTextAndContext) {
    const IFont& font = *service->GetFont(Load(*service, sans));
    const auto shape = [&](const std::vector<uint32_t>& text, size_t first, size_t count, float size) {
        GlyphSink sink;
        ShapeRequest request;
        request.codePoints = text.data() + first, request.count = count, request.size = size;
        request.direction = TextDirection::RightToLeft;
        request.context = text.data(), request.contextCount = text.size(), request.contextOffset = first;
        EXPECT_TRUE(font.Shape(request, sink));
        return sink.glyphs;
    };
    // Beh alone, and joined to a neighbour that is not part of the run.
    const std::vector<uint32_t> joined = {0x628, 0x628, 0x628};
    const uint32_t alone = shape({0x628}, 0, 1, 20)[0].index;
    const uint32_t middle = shape(joined, 1, 1, 20)[0].index;
    EXPECT_NE(alone, middle);
    EXPECT_EQ(shape({0x628}, 0, 1, 20)[0].index, alone);
    EXPECT_EQ(shape(joined, 1, 1, 20)[0].index, middle);
    // One result serves every size.
    EXPECT_FLOAT_EQ(shape(joined, 0, 3, 40)[0].advance, 2 * shape(joined, 0, 3, 20)[0].advance);
    // More runs than are kept: the first ones are shaped again and are the same.
    FontServiceConfiguration configuration;
    configuration.keptGlyphs = 64;
    service->Configure(&configuration);
    for (uint32_t i = 0; i < 500; ++i)
        shape({0x628, 'a' + i % 26, '0' + i / 26}, 0, 3, 20);
    EXPECT_EQ(shape(joined, 1, 1, 20)[0].index, middle);
    configuration.structSize = 4;
    service->Configure(&configuration);
    EXPECT_NE(canvas.log.lines.back().find("another version"), std::string::npos);
    service->Configure(nullptr);
}

}  // namespace
}  // namespace fresco::test
