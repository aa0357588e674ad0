// <p qor-inline>: text and inline boxes share lines, in both engines, and follow what changes below.
#include "display/display_paragraph.h"

#include <fresco/rendering_library.h>
#include <qorvex/text_services.h>

#include <algorithm>
#include <cctype>
#include <vector>

#include "display/display_text.h"
#include "layout/fonts/fallback_font_data.h"
#include "layout/fonts/memory_stream.h"
#include "layout/page_fixture.h"

namespace qorvex::test {
namespace {

// Hebrew runs from right to left, Latin letters from left to right; signs between two letters of one
// direction go with them, others with the first letter of all.
class Directions final : public IInternationalizationManager {
  public:
    TextDirection ComputeBaseDirection(const char* utf8, unsigned length) override {
        for (unsigned i = 0; i < length; ++i)
            if (const int level = LevelOf(utf8[i], 0); level != kSign)
                return level & 1 ? TextDirection::RightToLeft : TextDirection::LeftToRight;
        return TextDirection::LeftToRight;
    }
    void ComputeTextDirection(const char* utf8, unsigned length, i18n::TextDirectionResult* result) override {
        ++asked;
        const int base = ComputeBaseDirection(utf8, length) == TextDirection::RightToLeft ? 1 : 0;
        int before = base;
        for (unsigned first = 0, end = 0; first < length; first = end) {
            while (end < length && LevelOf(utf8[end], base) == kSign)
                ++end;
            const int after = end < length ? LevelOf(utf8[end], base) : base;
            result->AddRun(first, end - first, static_cast<unsigned>(before == after ? before : base));
            if (end < length) result->AddRun(end++, 1, static_cast<unsigned>(before = after));
        }
    }
    int asked = 0;

  private:
    static constexpr int kSign = -1;
    static int LevelOf(char byte, int base) {
        if (byte == '\xD7') return 1;
        return std::isalpha(static_cast<unsigned char>(byte)) ? base * 2 : kSign;
    }
};

using dsp::DisplayParagraph;
using dsp::DisplayText;
using layout::LayoutHandle;

class ParagraphTest : public LayoutTest {
  protected:
    ParagraphTest() : fonts(fresco::CreateNullRenderingLibrary({})) {
        layout::MemoryStream stream(layout::kLargeFallbackFont, layout::kLargeFallbackFontSize);
        font = fonts->GetFontService()->LoadFace(&stream, 0, fresco::SdfMode::Never);
        page.tree.SetTextServices({fonts->GetFontService()});
    }
    ~ParagraphTest() override { fonts->Destroy(); }

    LayoutHandle* Add(LayoutHandle* parent, dsp::DisplayElementPtr display, std::string_view style) {
        css::LayoutStyleRefs refs = Page::Style(style);
        refs.Mutable<css::TextLayoutStyle>().typefaces.push_back(font);
        kept.push_back(page.tree.AddChild(*parent, parent->data().Children().size(),
                                          {page.Store(refs), std::move(display), nullptr, {}, false}));
        return kept.back().get();
    }
    LayoutHandle* Paragraph(std::string_view style) {
        return Add(page.body, MakeRef<DisplayParagraph>(), style);
    }
    LayoutHandle* Text(LayoutHandle* parent, std::string_view text, std::string_view style = "") {
        auto display = MakeRef<DisplayText>();
        display->SetText(text);
        return Add(parent, display, style);
    }
    LayoutHandle* Inline(LayoutHandle* parent, std::string_view style = "") {
        return Add(parent, MakeRef<dsp::Box>(), "display:inline;" + std::string(style));
    }
    static const layout::LayoutResult& Box(const LayoutHandle* handle) { return handle->data().result; }
    static float Right(const LayoutHandle* handle) { return Box(handle).left + Box(handle).width; }

    // Before the page, whose texts ask for its fonts.
    fresco::IRenderingLibrary* fonts;
    fresco::FontId font;
    Page page;
    std::vector<layout::HandlePtr> kept;
};

TEST_F(ParagraphTest, TextAndInlineBoxesShareALine) {
    LayoutHandle* p = Paragraph("padding-left:10px;padding-top:4px;width:600px");
    LayoutHandle* first = Text(p, "some text ");
    LayoutHandle* chip = Inline(p,
                                "padding-left:5px;padding-right:5px;border-left-width:2px;"
                                "border-left-style:solid");
    LayoutHandle* inside = Text(chip, "inside");
    LayoutHandle* last = Text(p, " and behind");
    page.Settle();
    EXPECT_FLOAT_EQ(Box(first).left, 10);
    EXPECT_FLOAT_EQ(Box(first).top, 4);
    EXPECT_NEAR(Box(chip).left, Right(first), 0.01f);
    EXPECT_NEAR(Box(inside).left, Box(chip).left + 7, 0.01f);
    EXPECT_NEAR(Right(chip), Right(inside) + 5, 0.01f);
    EXPECT_NEAR(Box(last).left, Right(chip), 0.01f);
    EXPECT_FLOAT_EQ(Box(first).top, Box(last).top);
    EXPECT_FLOAT_EQ(Box(p).height, std::ceil(Box(first).height) + 4);
}

TEST_F(ParagraphTest, LinesBreakAcrossElementsAndStandOnOneBaseline) {
    LayoutHandle* p = Paragraph("width:200px");
    LayoutHandle* small = Text(p, "aaa bbb ");
    LayoutHandle* span = Inline(p);
    LayoutHandle* large = Text(span, "cccccccc ddd", "font-size:40px");
    page.Settle();
    // The large text does not fit behind the small one.
    EXPECT_FLOAT_EQ(Box(large).left, Box(p).left);
    EXPECT_GE(Box(large).top, Box(small).top + Box(small).height - 0.01f);
    const float narrow = Box(p).height;
    page.Change(p, "width:500px");
    page.Settle();
    EXPECT_LT(Box(p).height, narrow);
    EXPECT_NEAR(Box(large).left, Right(small), 0.01f);
    // One baseline: the small text hangs lower than the top of the line.
    EXPECT_GT(Box(small).top, Box(large).top);
}

// Three texts share lines: the gaps of every full line take up its free width, the last line stays.
TEST_F(ParagraphTest, JustifyWidensGapsAcrossElements) {
    LayoutHandle* p = Paragraph("width:200px");
    LayoutHandle* first = Text(p, "aa ");
    LayoutHandle* span = Inline(p, "padding-left:3px");
    Text(span, "bb");
    LayoutHandle* second = Text(p, " cccc dd eeeee ffff ggg hhhhhh jjjj kkkkk lll mmmmmm nn ooooo");
    LayoutHandle* last = Text(p, " iii");
    page.Settle();
    const float left = Box(span).left;
    ASSERT_NE(static_cast<DisplayText&>(*second->node().display).Info(), nullptr);
    const layout::TextInfo plain = *static_cast<DisplayText&>(*second->node().display).Info();
    ASSERT_GT(plain.lines.size(), 2u);
    EXPECT_GT(plain.gaps.size(), 10u);
    const float end = Right(last);

    for (const char* align : {"text-align:justify", "text-align:left", "text-align:justify"}) {
        page.Change(p, align);
        page.Settle();
        const bool justified = std::string_view(align) == "text-align:justify";
        SCOPED_TRACE(align);
        // The space that ends the first text is a gap too.
        EXPECT_EQ(Box(span).left > left + 0.01f, justified);
        EXPECT_EQ(Right(first) < Box(span).left - 0.01f, justified);
        EXPECT_EQ(std::fabs(Right(second) - 200) < 0.01f, justified);
        EXPECT_LE(Right(second), 200.01f);
        EXPECT_FLOAT_EQ(Right(last), end);
    }
}

// The first letter of a paragraph decides from which side its lines are read, and with them its punctuation.
TEST_F(ParagraphTest, LinesAreReadFromTheSideOfTheFirstLetter) {
    Directions directions;
    page.tree.SetTextServices({fonts->GetFontService(), &directions});
    const auto texts = [&](std::initializer_list<const char*> parts) {
        LayoutHandle* p = Paragraph("width:600px");
        std::vector<LayoutHandle*> made;
        for (const char* part : parts)
            made.push_back(Text(p, part));
        return made;
    };
    const auto right = texts({"אבג ", "one ", "two", " ד!"});
    const auto left = texts({"one ", "אב", "גד", " two"});
    const auto plain = texts({"one ", "two"});
    page.Settle();
    // Latin words keep their own order; what is read last stands at the left edge.
    EXPECT_FLOAT_EQ(Box(right[3]).left, 0);
    EXPECT_GT(Box(right[1]).left, Right(right[3]) - 0.01f);
    EXPECT_GT(Box(right[2]).left, Right(right[1]) - 0.01f);
    EXPECT_GT(Box(right[0]).left, Right(right[2]) - 0.01f);
    const layout::TextInfo& last = *static_cast<DisplayText&>(*right[3]->node().display).Info();
    EXPECT_TRUE(last.runs[0].rightToLeft);
    EXPECT_LT(Box(left[2]).left, Box(left[1]).left);
    EXPECT_LT(Box(left[1]).left, Box(left[3]).left);
    EXPECT_LT(Box(plain[0]).left, Box(plain[1]).left);
    page.tree.SetTextServices({fonts->GetFontService()});
}

// The bidirectional algorithm sees one text: the parts of one element stand on both sides of another.
TEST_F(ParagraphTest, PartsOfSeveralTextsChangePlacesTogether) {
    Directions directions;
    page.tree.SetTextServices({fonts->GetFontService(), &directions});
    struct Row {
        const char* first;
        const char* inside;
        const char* last;
        bool boxOnTheLeft;
    };
    for (const Row& row : {Row{"one אב ", "גד", " two", false}, Row{"אב one ", "two", " גד", true}}) {
        SCOPED_TRACE(row.first);
        LayoutHandle* p = Paragraph("width:600px");
        LayoutHandle* first = Text(p, row.first);
        LayoutHandle* span = Inline(p, "padding-left:3px;padding-right:3px");
        LayoutHandle* inside = Text(span, row.inside);
        LayoutHandle* last = Text(p, row.last);
        for (const char* align : {"text-align:left", "text-align:justify", "text-align:left"}) {
            page.Change(p, align);
            page.Settle();
            // Runs of the first text as they are painted.
            const layout::TextInfo& shown = *static_cast<DisplayText&>(*first->node().display).ShownInfo();
            ASSERT_GE(shown.runs.size(), 2u);
            std::vector<std::pair<float, float>> spans;
            for (const layout::TextRun& run : shown.runs)
                spans.push_back({run.x, run.x + run.width});
            std::sort(spans.begin(), spans.end());
            EXPECT_LE(spans.front().second, Box(span).left + 0.01f);
            EXPECT_GE(spans.back().first, Right(span) - 0.01f);
            EXPECT_NEAR(Box(first).left, spans.front().first, 0.01f);
            EXPECT_NEAR(Right(first), spans.back().second, 0.01f);
            EXPECT_NEAR(Box(inside).left, Box(span).left + 3, 0.01f);
            EXPECT_NEAR(Right(inside), Right(span) - 3, 0.01f);
            EXPECT_EQ(Box(last).left < Box(first).left, row.boxOnTheLeft);
        }
        // Nothing is asked or laid out again for a paragraph that did not change.
        const int asked = directions.asked;
        page.Settle();
        EXPECT_EQ(directions.asked, asked);
    }
    // A box is a sign between letters, and a text of signs alone goes with the letters around it.
    LayoutHandle* p = Paragraph("width:600px");
    LayoutHandle* before = Text(p, "one אב");
    LayoutHandle* box = Add(p, MakeRef<dsp::Box>(), "display:block;width:20px;height:5px");
    LayoutHandle* sign = Text(p, "!");
    Text(p, "גד");
    page.Settle();
    EXPECT_LT(Box(box).left, Right(before) - 1);
    EXPECT_LT(Box(sign).left, Box(box).left);
    EXPECT_TRUE(static_cast<DisplayText&>(*sign->node().display).Info()->runs[0].rightToLeft);
    page.tree.SetTextServices({fonts->GetFontService()});
}

TEST_F(ParagraphTest, EdgesGoToTheNextLineWithTheirContent) {
    LayoutHandle* p = Paragraph("width:100px");
    Text(p, "some words ");
    LayoutHandle* chip = Inline(p, "padding-left:9px;padding-right:9px");
    Text(chip, "button");
    page.Settle();
    EXPECT_GT(Box(chip).top, Box(p).top);
    EXPECT_FLOAT_EQ(Box(chip).left, Box(p).left);
}

TEST_F(ParagraphTest, BlocksStandAsPiecesAndAlignmentMovesLines) {
    LayoutHandle* p = Paragraph("width:400px;text-align:right");
    Text(p, "text");
    LayoutHandle* box = Add(p, MakeRef<dsp::Box>(), "display:block;width:50px;height:60px;margin-left:6px");
    LayoutHandle* child = Add(box, MakeRef<dsp::Box>(), "width:10px;height:10px;margin-top:3px");
    page.Settle();
    EXPECT_NEAR(Right(box), Box(p).left + 400, 0.01f);
    EXPECT_FLOAT_EQ(Box(box).height, 60);
    EXPECT_FLOAT_EQ(Box(child).left, Box(box).left);
    EXPECT_FLOAT_EQ(Box(child).top, Box(box).top + 3);
    page.Change(p, "margin-top:100px");
    page.Settle();
    EXPECT_FLOAT_EQ(Box(child).top, Box(box).top + 3);
    EXPECT_GE(Box(box).top, 100);
}

TEST_F(ParagraphTest, AChangeBelowIsSeenAndCostsNothingElsewhere) {
    LayoutHandle* p = Paragraph("");
    LayoutHandle* span = Inline(p);
    LayoutHandle* text = Text(span, "short");
    LayoutHandle* other = Paragraph("");
    Text(other, "other");
    page.Settle();
    const float before = Box(text).width;
    static_cast<DisplayText&>(*text->node().display).SetText("very much longer");
    page.tree.MarkChanged(*text);
    page.Settle();
    EXPECT_GT(Box(text).width, before);
    EXPECT_GT(Box(span).width, before);
    EXPECT_LE(page.Counters().measured, 3u);
    page.Settle();
    EXPECT_EQ(page.Counters().measured, 0u);
}

TEST_F(ParagraphTest, FitFillsTheBox) {
    LayoutHandle* p = Paragraph("width:300px;height:100px;font-fit-mode:fit");
    LayoutHandle* text = Text(p, "some words to fit");
    page.Settle();
    EXPECT_GT(Box(text).height, 24);
    EXPECT_LE(Box(text).height, 100);
    EXPECT_LE(Box(text).width, 300);
}

TEST_F(ParagraphTest, SimplePagesPlaceParagraphsToo) {
    page.Change(page.body, "display:simple");
    LayoutHandle* p = Paragraph("position:absolute;left:30px;top:20px");
    LayoutHandle* first = Text(p, "one ");
    LayoutHandle* span = Inline(p);
    LayoutHandle* second = Text(span, "two");
    page.Settle();
    EXPECT_FLOAT_EQ(Box(first).left, 30);
    EXPECT_NEAR(Box(second).left, Right(first), 0.01f);
    static_cast<DisplayText&>(*first->node().display).SetText("longer ");
    page.tree.MarkChanged(*first);
    page.Settle();
    EXPECT_NEAR(Box(second).left, Right(first), 0.01f);
}

}  // namespace
}  // namespace qorvex::test
