// Descriptions on their way from unknown to loaded: weight search, waiters, late and failed answers.
#include "layout/fonts/font_manager.h"

#include <fresco/rendering_library.h>
#include <gtest/gtest.h>

#include <memory>

#include "layout/dom_tasks.h"
#include "layout/fonts/fallback_font_data.h"
#include "support/scoped_library_state.h"

namespace qorvex::layout {
namespace {

// The embedded font as a file of the client; counts how many are open.
class FontFile final : public fresco::IStreamReader {
  public:
    explicit FontFile(int& open) : open_(open) { ++open_; }
    size_t GetSize() override { return kLargeFallbackFontSize; }
    size_t Read(size_t offset, void* destination, size_t size) override {
        std::memcpy(destination, kLargeFallbackFont + offset, size);
        return size;
    }
    void Close() override {
        --open_;
        delete this;
    }

  private:
    int& open_;
};

// Keeps the answers until the test gives them.
class Loader final : public IFontResourceLoader {
  public:
    TaskPtr RequestFont(const URL&, Callback done) override {
        waiting.push_back(std::move(done));
        return MakeTask("Empty", [] {});
    }
    std::vector<Callback> waiting;
};

class Link final : public INodeLink {
  public:
    void AddRef() noexcept override {}
    void Release() noexcept override {}
    void SetInLayoutTree(bool) override {}
    std::string_view DebugName() const override { return {}; }
    void Receive(DOMTaskKind kind, const DOMTaskData&) override { told += kind == DOMTaskKind::FontArrived; }
    int told = 0;
};

class FontManagerTest : public test::QorvexTest {
  protected:
    FontManagerTest() : library(fresco::CreateNullRenderingLibrary({})), tasks(TaskSystemSettings{}) {
        Make();
    }
    ~FontManagerTest() override {
        manager.reset();
        loader.waiting.clear();
        library->Destroy();
    }

    void Make() {
        manager.reset(new FontManager(
            {*library->GetFontService(), {1, &tasks}, loader, strings, {nullptr, nullptr}, 2}));
    }
    void RunAll() {
        tasks.Run(TaskChannels::Resources, false, nullptr, kAllTaskFamilies);
        manager->RunMainTasks();
    }
    void Add(const char* family, uint8_t weight) {
        manager->AddFontDescription({strings.Intern(family), kNormalStyle, weight}, URL("game://font.ttf"),
                                    0);
    }
    // The ids for a family list of one name.
    TypefaceList Resolve(const char* family, uint8_t weight, css::FontStyle style = css::FontStyle::Normal) {
        css::FontFamily families;
        families.items.push_back(css::CssString(family));
        TypefaceList out;
        manager->ResolveTypefaces(families, style, weight, NodeLinkPtr(&link), out);
        return out;
    }

    fresco::IRenderingLibrary* library;
    TaskSystem tasks;
    StringPool strings;
    Loader loader;
    Link link;
    int open = 0;
    std::unique_ptr<FontManager> manager;
};

TEST_F(FontManagerTest, WeightsAreSearchedAsTheStandardSays) {
    const auto order = [](uint8_t wanted) {
        std::string weights;
        SearchWeights(wanted, [&](uint8_t w) {
            weights += static_cast<char>('0' + w);
            return false;
        });
        return weights;
    };
    EXPECT_EQ(order(4), "453216789");
    EXPECT_EQ(order(5), "543216789");
    EXPECT_EQ(order(3), "321456789");
    EXPECT_EQ(order(7), "789654321");
}

TEST_F(FontManagerTest, WaitersAreToldOnceAndFindTheFont) {
    Add("Late", 4);
    Add("Late", 4);  // the same description: one request
    ASSERT_EQ(loader.waiting.size(), 1u);
    const TypefaceList before = Resolve("Late", 7);  // waits for the nearest weight
    ASSERT_EQ(before.size(), 2u);
    EXPECT_EQ(before[0], css::kNoTypeface);
    EXPECT_NE(before[1], css::kNoTypeface);  // the embedded font
    loader.waiting[0](new FontFile(open));
    RunAll();
    EXPECT_EQ(open, 0);
    EXPECT_EQ(link.told, 1);
    EXPECT_NE(Resolve("Late", 7)[0], css::kNoTypeface);
    // No slanted face: the upright one shows.
    EXPECT_EQ(Resolve("Late", 4, css::FontStyle::Italic)[0], Resolve("Late", 4)[0]);
    EXPECT_EQ(link.told, 1);
}

TEST_F(FontManagerTest, FailedAndLateAnswersLeaveNothingBehind) {
    Add("Gone", 4);
    Resolve("Gone", 4);
    loader.waiting[0](nullptr);
    RunAll();
    EXPECT_EQ(link.told, 1);
    EXPECT_EQ(Resolve("Gone", 4)[0], css::kNoTypeface);
    // The client answers when the manager has gone.
    Add("Late", 4);
    manager.reset();
    loader.waiting[1](new FontFile(open));
    EXPECT_EQ(open, 0);
    Make();
    EXPECT_TRUE(log_.Contains("to closed channel"));
}

// A page of 2 by 2 white pixels with one glyph.
BitmapFontSourcePtr Tiles(const char* table) {
    auto source = MakeRef<BitmapFontSource>();
    source->family = "Tiles";
    source->table = table;
    BitmapFontPage page;
    page.width = page.height = 2;
    page.bytes.resize(16, uint8_t{255});
    source->pages.push_back(std::move(page));
    return source;
}

TEST_F(FontManagerTest, BitmapFontsMakeTextWaitAndReplaceEachOther) {
    constexpr char kTable[] =
        "info size=2\ncommon lineHeight=2 base=2\nchar id=65 width=2 height=2 xadvance=2\n";
    const FontDescription tiles{strings.Intern("Tiles"), kNormalStyle, kNormalWeight};
    manager->AddBitmapFont(tiles, Tiles(kTable));
    EXPECT_EQ(Resolve("Tiles", 4)[0], css::kNoTypeface);
    RunAll();
    EXPECT_EQ(link.told, 1);
    const uint32_t first = Resolve("Tiles", 4)[0];
    EXPECT_NE(first, css::kNoTypeface);
    manager->AddBitmapFont(tiles, Tiles(kTable));
    RunAll();
    EXPECT_TRUE(log_.Contains("Bitmap font Tiles already loaded, will replace its description!"));
    EXPECT_NE(Resolve("Tiles", 4)[0], first);
    // What cannot be used leaves the font that is there.
    const uint32_t second = Resolve("Tiles", 4)[0];
    manager->AddBitmapFont(tiles, Tiles("nonsense"));
    RunAll();
    EXPECT_TRUE(log_.Contains("Unable to load user font Tiles"));
    BitmapFontSourcePtr broken = Tiles(kTable);
    broken->pages[0].encoded = true;
    manager->AddBitmapFont(tiles, broken);
    RunAll();
    EXPECT_TRUE(log_.Contains("Cannot load image for user font"));
    EXPECT_EQ(Resolve("Tiles", 4)[0], second);
}

}  // namespace
}  // namespace qorvex::layout
