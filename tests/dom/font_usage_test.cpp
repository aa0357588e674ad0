#include "dom/font_usage.h"

#include <fresco/font.h>

#include <algorithm>

#include "support/scoped_library_state.h"

namespace qorvex::dom {
namespace {

// Has the letters of one range, and notes what it is told to preload.
class NotingFont final : public fresco::IFont {
  public:
    NotingFont(uint32_t first, uint32_t last) : first_(first), last_(last) {}
    uint32_t GetFlags() const override { return 0; }
    const char* GetFamilyName() const override { return ""; }
    void GetGlyphIndices(const uint32_t* codes, size_t count, uint32_t* glyphs) const override {
        std::transform(codes, codes + count, glyphs,
                       [this](uint32_t code) { return code >= first_ && code <= last_ ? code : 0; });
    }
    fresco::FontMetrics GetMetrics(float) const override { return {}; }
    bool GetAdvances(const uint32_t*, size_t, float, float*) const override { return false; }
    bool Shape(const fresco::ShapeRequest&, fresco::IShapeSink&) const override { return false; }
    void MarkAsUserBitmapFont() override {}
    void PreloadGlyphs(const uint32_t*, size_t count) const override { glyphs += count; }
    void PreloadText(const char* utf8, size_t length) const override { texts.emplace_back(utf8, length); }
    fresco::FontId GetId() const override { return 0; }

    mutable size_t glyphs = 0;
    mutable std::vector<std::string> texts;

  private:
    const uint32_t first_, last_;
};

class Service final : public fresco::IFontService {
  public:
    void Configure(void*) override {}
    uint32_t GetFaceCount(fresco::IStreamReader*) override { return 0; }
    fresco::FontId LoadFace(fresco::IStreamReader*, uint32_t, fresco::SdfMode, uint32_t) override {
        return 0;
    }
    fresco::FontId RegisterBitmapFont(fresco::IStreamReader*, const fresco::BitmapFontDescription&) override {
        return 0;
    }
    fresco::FontId FindFont(const char*, uint32_t) override { return 0; }
    fresco::IFont* GetFont(fresco::FontId id) override { return id == 1 ? &latin : &arabic; }

    NotingFont latin{'A', 'z'};
    NotingFont arabic{0x600, 0x6FF};
};

using FontUsageTest = test::QorvexTest;

TEST_F(FontUsageTest, LettersAndShapedTextsGoOnceToTheFontThatHasThem) {
    Service service;
    FontUsage usage;
    const FontUsage::Typefaces typefaces = {css::kNoTypeface, 1, 2};
    const auto preload = [&](const char* text) {
        usage.Add(typefaces, text);
        const TaskPtr task = usage.TakeTask(service);
        if (task) task->Execute(TaskFamilyHandle{});
        return task != nullptr;
    };
    EXPECT_TRUE(preload("abc"));
    EXPECT_TRUE(preload("ab بيت"));
    EXPECT_TRUE(preload("تيب")) << "known letters in another shape";
    EXPECT_FALSE(preload("cab"));
    EXPECT_FALSE(preload("ab بيت"));
    EXPECT_EQ(service.latin.glyphs, 3u);
    EXPECT_EQ(service.arabic.glyphs, 3u);
    EXPECT_EQ(service.latin.texts, std::vector<std::string>());
    EXPECT_EQ(service.arabic.texts, (std::vector<std::string>{"ab بيت", "تيب"}));
}

}  // namespace
}  // namespace qorvex::dom
