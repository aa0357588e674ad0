// Fonts: what they measure.

#include <gtest/gtest.h>
#include "canvas.h"

namespace fresco::test {
namespace {

constexpr char kBold[] = "/usr/share/fonts/truetype/dejavu/DejaVuSans-Bold.ttf";

}  // namespace

TEST(Font, LoadsFindsAndMeasures) {
    Canvas canvas;
    IFontService* service = canvas.library->GetFontService();
    const FontId regular = canvas.LoadFont(kSans), bold = canvas.LoadFont(kBold);
    if (regular == kNoId || bold == kNoId) GTEST_SKIP() << "no DejaVu on this machine";
    EXPECT_EQ(service->FindFont("dejavu sans", 0), regular);
    EXPECT_EQ(service->FindFont("DejaVu Sans", kFontWeight700), bold);
    EXPECT_EQ(service->FindFont("DejaVu Sans", kFontItalic), kNoId);
    EXPECT_EQ(service->GetFont(77), nullptr);
    IFont* font = service->GetFont(regular);
    EXPECT_STREQ(font->GetFamilyName(), "DejaVu Sans");
    const FontMetrics m = font->GetMetrics(100);
    EXPECT_NEAR(m.ascent, -92.8f, 0.5f);
    EXPECT_NEAR(m.descent, 23.6f, 0.5f);
    const uint32_t text[] = {'A', 'V', 0x10FFFF};
    uint32_t glyphs[3];
    float advances[3];
    font->GetGlyphIndices(text, 3, glyphs);
    EXPECT_EQ(glyphs[2], 0u);
    EXPECT_TRUE(font->GetAdvances(glyphs, 3, 100, advances));
    EXPECT_NEAR(advances[0], 68.4f, 0.1f);
    EXPECT_FALSE(font->GetAdvances(glyphs, 3, -1, advances));
    GlyphSink shaped;
    ShapeRequest request;
    request.codePoints = text, request.count = 2, request.size = 100;
    ASSERT_TRUE(font->Shape(request, shaped));
    ASSERT_EQ(shaped.glyphs.size(), 2u);
    EXPECT_LT(shaped.glyphs[0].advance, 68);  // kerned
    request.direction = TextDirection::RightToLeft;
    ASSERT_TRUE(font->Shape(request, shaped));
    EXPECT_EQ(shaped.glyphs[0].cluster, 1u);
}

TEST(Font, RefusesWhatIsNoFont) {
    Canvas canvas;
    IFontService* service = canvas.library->GetFontService();
    std::vector<uint8_t> bytes = ReadFile(kSans);
    for (const size_t size : {size_t(0), size_t(10), bytes.size() / 2}) {
        MemoryReader cut(
            std::vector<uint8_t>(bytes.begin(), bytes.begin() + ptrdiff_t(std::min(size, bytes.size()))));
        // Half a font may load; it must then answer all the same.
        const FontId id = service->LoadFace(&cut, 0, SdfMode::Never);
        if (IFont* font = service->GetFont(id)) font->PreloadText("abc", 3);
    }
    MemoryReader whole(bytes);
    EXPECT_EQ(service->LoadFace(&whole, 9, SdfMode::Never), kNoId);
    if (!bytes.empty()) {
        EXPECT_EQ(service->GetFaceCount(&whole), 1u);
    }
}

namespace {

// Files of a client that has them in memory: handed out in place, or to be read.
class Files final : public IFileManipulator {
  public:
    Files(std::vector<uint8_t> bytes, bool in_place) : bytes_(std::move(bytes)), in_place_(in_place) {}
    IStreamReader* OpenFile(const char*) override {
        ++open;
        return new Reader(*this);
    }
    int open = 0, reads = 0;

  private:
    class Reader final : public IStreamReader {
      public:
        explicit Reader(Files& files) : files_(files) {}
        size_t GetSize() override { return files_.bytes_.size(); }
        size_t Read(size_t offset, void* destination, size_t size) override {
            ++files_.reads;
            return MemoryReader(files_.bytes_).Read(offset, destination, size);
        }
        void Close() override {
            --files_.open;
            delete this;
        }
        const void* GetData() override { return files_.in_place_ ? files_.bytes_.data() : nullptr; }

      private:
        Files& files_;
    };
    std::vector<uint8_t> bytes_;
    bool in_place_;
};

}  // namespace

TEST(Font, SystemFontsStayInPlaceWhereTheClientHasThem) {
    const std::vector<uint8_t> bytes = ReadFile(kSans);
    if (bytes.empty()) GTEST_SKIP() << "no DejaVu on this machine";
    std::vector<float> advances;
    for (const bool in_place : {false, true}) {
        CountingAllocator allocator;
        Files files(bytes, in_place);
        RenderingLibraryParams params;
        params.allocator = &allocator;
        params.additionalOptions = "--system-fonts=sans.ttf:again.ttf";
        IRenderingLibrary* library = IRenderingLibrary::Initialize(params);
        library->SetFileManipulator(&files);
        IFont* font =
            library->GetFontService()->GetFont(library->GetFontService()->FindFont("DejaVu Sans", 0));
        ASSERT_NE(font, nullptr);
        const uint32_t text = 'W';
        uint32_t glyph = 0;
        font->GetGlyphIndices(&text, 1, &glyph);
        EXPECT_TRUE(font->GetAdvances(&glyph, 1, 100, &advances.emplace_back()));
        // Two names of the same bytes are one font file.
        EXPECT_EQ(files.open, in_place ? 1 : 0);
        EXPECT_EQ(files.reads > 0, !in_place);
        EXPECT_EQ(allocator.peak > long(bytes.size()), !in_place);
        library->Destroy();
        EXPECT_EQ(files.open, 0);
        EXPECT_EQ(allocator.live, 0);
    }
    EXPECT_EQ(advances[0], advances[1]);
}

TEST(Font, TheNullLibraryMeasuresAndDrawsNothing) {
    IRenderingLibrary* library = CreateNullRenderingLibrary({});
    EXPECT_STREQ(library->GetBuildIdentifier(), kBuildIdentifier.text);
    EXPECT_EQ(std::strlen(library->GetBuildIdentifier()), 64u);
    MemoryReader reader(ReadFile(kSans));
    const FontId id = library->GetFontService()->LoadFace(&reader, 0, SdfMode::Never);
    if (id != kNoId) {
        EXPECT_LT(library->GetFontService()->GetFont(id)->GetMetrics(10).ascent, 0);
    }
    IScene* scene = library->CreateScene({});
    CommandBuffer* b = Library::CreateBuffer(0, 0);
    b->FillRect({0, 0, 0, 1, 1}, Paint{});
    scene->ExecuteBackEnd(&b, 1);
    b->Release();
    scene->Destroy();
    library->Destroy();
}

}  // namespace fresco::test
