// Changed text: what keeps its size moves nothing, and however texts change, boxes are those of a page that
// is laid out from nothing.
#include <fresco/rendering_library.h>

#include <algorithm>
#include <random>

#include "display/display_text.h"
#include "layout/fonts/fallback_font_data.h"
#include "layout/fonts/memory_stream.h"
#include "layout/page_fixture.h"

namespace qorvex::test {
namespace {

using dsp::DisplayText;
using layout::LayoutHandle;

// Rows of labels, of which some take their width from the text.
class Labels {
  public:
    Labels(fresco::IFontService& fonts, const std::vector<std::string>& texts) {
        layout::MemoryStream stream(layout::kLargeFallbackFont, layout::kLargeFallbackFontSize);
        const fresco::FontId font = fonts.LoadFace(&stream, 0, fresco::SdfMode::Never);
        page.tree.SetTextServices({&fonts});
        for (size_t i = 0; i < texts.size(); ++i) {
            static constexpr const char* kStyles[] = {"display: flex; flex-direction: row; width: 60px",
                                                      "display: flex", "position: absolute; left: 300px",
                                                      "display: flex; max-height: 20px; align-items: center"};
            LayoutHandle* box = page.Add(page.body, kStyles[i % std::size(kStyles)]);
            css::LayoutStyleRefs style = Page::Style(i % 3 == 0 ? "white-space: nowrap" : "");
            style.Mutable<css::TextLayoutStyle>().typefaces.push_back(font);
            auto display = MakeRef<DisplayText>();
            display->SetText(texts[i]);
            displays.push_back(display);
            handles.push_back(page.tree.AddChild(*box, 0, {page.Store(style), display, nullptr, {}, false}));
        }
        page.Settle();
    }
    void Change(size_t index, std::string_view text) {
        displays[index]->SetText(text);
        page.tree.MarkChanged(*handles[index]);
    }
    std::string Boxes() const {
        std::string all;
        for (const layout::HandlePtr& handle : handles)
            all += BoxOf(handle.get()) + "; " + BoxOf(handle->data().parent) + "\n";
        return all;
    }

    Page page;
    std::vector<RefPtr<DisplayText>> displays;
    std::vector<layout::HandlePtr> handles;
};

class TextChangeTest : public LayoutTest {
  protected:
    TextChangeTest() : library(fresco::CreateNullRenderingLibrary({})) {}
    ~TextChangeTest() override { library->Destroy(); }
    fresco::IFontService& Fonts() { return *library->GetFontService(); }

    fresco::IRenderingLibrary* library;
};

TEST_F(TextChangeTest, OtherDigitsOfTheSameWidthMoveNothing) {
    Labels labels(Fonts(), {"10", "20", "30", "40"});
    labels.Change(1, "99");
    labels.page.Frame();
    EXPECT_EQ(labels.page.Counters().laidOut, 0u);
    EXPECT_EQ(labels.page.Counters().measured, 0u);
    EXPECT_TRUE(labels.page.dirty.HasArea());
    EXPECT_EQ(labels.displays[1]->Info()->lines.size(), 1u);
    labels.page.dirty.Clear();
    labels.Change(1, "999");
    labels.page.Frame();
    EXPECT_GT(labels.page.Counters().laidOut, 0u);
}

TEST_F(TextChangeTest, BoxesAreThoseOfANewPage) {
    static constexpr const char* kTexts[] = {"1",   "7", "42", "words that wrap", "", "a b c d e f g h",
                                             "Wide"};
    std::mt19937 random(3);
    std::vector<std::string> texts(8, "12");
    Labels labels(Fonts(), texts);
    for (int step = 0; step < 60; ++step) {
        for (int changes = 0; changes < 1 + step % 3; ++changes) {
            const size_t index = random() % texts.size();
            texts[index] = kTexts[random() % std::size(kTexts)];
            labels.Change(index, texts[index]);
        }
        // Every tenth frame finds a style changed as well.
        const char* width = step / 10 % 2 == 0 ? "width: 700px" : "width: 400px";
        if (step % 10 == 0) labels.page.Change(labels.page.body, width);
        labels.page.Frame();
        Labels fresh(Fonts(), texts);
        fresh.page.Change(fresh.page.body, width);
        fresh.page.Frame();
        ASSERT_EQ(labels.Boxes(), fresh.Boxes()) << step;
    }
}

TEST_F(TextChangeTest, WhereATextWasIsPaintedAnew) {
    Labels labels(Fonts(), {"10", "20", "30"});
    Page& page = labels.page;
    LayoutHandle* clip =
        page.Add(page.body, "position: absolute; left: 500px; width: 40px; overflow: hidden");
    page.Settle();
    const auto paints = [&](const layout::Rect& area) {
        EXPECT_FALSE(layout::IsEmpty(area));
        return std::any_of(page.dirty.begin(), page.dirty.end(),
                           [&](const layout::Rect& rect) { return layout::Contains(rect, area); });
    };
    const layout::Rect moved = labels.handles[0]->node().visualAabb;
    page.dirty.Clear();
    page.tree.Remove(*labels.handles[0], &page.dirty);
    page.tree.Attach(*labels.handles[0], *clip, 0);
    page.Frame();
    EXPECT_TRUE(paints(moved));
    const layout::Rect gone = labels.handles[2]->node().visualAabb;
    page.dirty.Clear();
    page.tree.Remove(*labels.handles[2], &page.dirty);
    page.Frame();
    EXPECT_TRUE(paints(gone));
}

}  // namespace
}  // namespace qorvex::test
