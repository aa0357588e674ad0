// Plain text over the embedded fallback font: line breaking, white space, ellipsis, alignment, fit.
#include "layout/text/text_layout.h"

#include <fresco/rendering_library.h>
#include <gtest/gtest.h>
#include <qorvex/text_services.h>

#include <cmath>
#include <string>
#include <vector>

#include "layout/fonts/fallback_font_data.h"
#include "layout/fonts/memory_stream.h"
#include "support/scoped_library_state.h"

namespace qorvex::layout {
namespace {

using css::FontFitModeType;
using css::OverflowWrapMode;
using css::TextAlignType;
using css::TextOverflowMode;
using css::WhiteSpaceMode;

class TextLayoutTest : public testing::Test {
  protected:
    TextLayoutTest() {
        MemoryStream stream(kLargeFallbackFont, kLargeFallbackFontSize);
        library_ = fresco::CreateNullRenderingLibrary({});
        style_.typefaces.push_back(library_->GetFontService()->LoadFace(&stream, 0, fresco::SdfMode::Never));
    }
    ~TextLayoutTest() override { library_->Destroy(); }

    TextInfo Lay(std::string_view text, float width, float height = NAN) {
        TextInfo info;
        EXPECT_TRUE(LayoutText({text, style_, width, height, *library_->GetFontService()}, info));
        return info;
    }
    float WidthOf(std::string_view text) { return Lay(text, NAN).width; }

    // The characters of each line.
    std::vector<std::string> Lines(std::string_view text, float width) {
        std::vector<std::string> lines;
        const TextInfo info = Lay(text, width);
        for (const TextLineInfo& line : info.lines) {
            lines.emplace_back(text.substr(line.firstCharacter, line.endCharacter - line.firstCharacter));
        }
        return lines;
    }

    test::ScopedLibraryState state_;
    fresco::IRenderingLibrary* library_ = nullptr;
    TextStyle style_;
};

using Texts = std::vector<std::string>;

TEST_F(TextLayoutTest, BreaksAtSpacesThatDoNotFit) {
    const float two = WidthOf("aa bb");
    EXPECT_EQ(Lines("aa bb cc", two), (Texts{"aa bb", "cc"}));
    EXPECT_EQ(Lines("bb bb bb", WidthOf("bb bb") - 1), (Texts{"bb", "bb", "bb"}));
    EXPECT_EQ(Lines("aa bb cc", NAN), (Texts{"aa bb cc"}));
    // The exact width of a text holds it: measured boxes must not wrap again.
    EXPECT_EQ(Lines("aa bb cc", WidthOf("aa bb cc")), (Texts{"aa bb cc"}));
    EXPECT_EQ(Lines("", 10), Texts{});
    style_.whiteSpace = WhiteSpaceMode::NoWrap;
    EXPECT_EQ(Lines("aa bb cc", 5), (Texts{"aa bb cc"}));
}

TEST_F(TextLayoutTest, LongWordsFollowOverflowWrap) {
    const float four = WidthOf("oooo");
    EXPECT_EQ(Lines("oooooo", four), (Texts{"oooooo"}));
    style_.overflowWrap = OverflowWrapMode::BreakWord;
    EXPECT_EQ(Lines("oooooo", four), (Texts{"oooo", "oo"}));
    EXPECT_EQ(Lines("i oooooo", four), (Texts{"i", "oooo", "oo"}));
    style_.overflowWrap = OverflowWrapMode::Anywhere;
    EXPECT_EQ(Lines("i oooooo", four + 1), (Texts{"i ooo", "ooo"}));
}

TEST_F(TextLayoutTest, WhiteSpaceCollapsesOrStays) {
    EXPECT_EQ(Lay("a \n\t b", NAN).glyphs.size(), 3u);
    // A space at the end widens the line by a quarter of the size.
    EXPECT_FLOAT_EQ(WidthOf("a "), WidthOf("a") + 16 * 0.25f);
    style_.whiteSpace = WhiteSpaceMode::Pre;
    EXPECT_EQ(Lines("a  b\nc", 5), (Texts{"a  b", "c"}));
    EXPECT_EQ(Lines("a\n\nb", NAN), (Texts{"a", "", "b"}));
    style_.whiteSpace = WhiteSpaceMode::PreWrap;
    EXPECT_EQ(Lines("aa  bb\nc", WidthOf("aa  b")), (Texts{"aa", "bb", "c"}));
}

// What a font has no sign for, and need not have, neither shows nor takes room; a soft hyphen shows where a
// line ends behind it, and fits there.
TEST_F(TextLayoutTest, InvisibleCharactersShowNothing) {
    EXPECT_FLOAT_EQ(WidthOf("in\u00ADter\u200Bna\u2060tio\uFEFFnal"), WidthOf("international"));
    struct BreakBehindHyphen final : i18n::IBreakIterator {
        void Destroy() override {}
        void SetText(const char*, unsigned) override {}
        void Restart(const char*, unsigned) override {}
        void ClearText() override {}
        void ResetToBeginning() override {}
        void ResetToEnd() override {}
        int MoveToNext() override { return 0; }
        int MoveToCandidateAfter(int) override { return 0; }
        int MoveToPrevious() override { return 0; }
        int GetCurrentPosition() override { return 0; }
        int GetBoundaryAfter(int position) override { return position < 4 ? 4 : -1; }
    } iterator;
    for (const char* fitting : {"in-", "in"}) {
        TextInfo info;
        const float width = WidthOf(fitting);
        ASSERT_TRUE(
            LayoutText({"in\u00ADter", style_, width, NAN, *library_->GetFontService(), &iterator}, info));
        const bool fits = std::string_view(fitting) == "in-";
        ASSERT_EQ(info.lines.size(), 2u);
        EXPECT_FLOAT_EQ(info.runs[0].width, WidthOf("in-"));
        EXPECT_EQ(info.runs[0].width <= width, fits);
    }
}

TEST_F(TextLayoutTest, EllipsisCutsOnlyLinesThatDoNotWrap) {
    style_.overflow = TextOverflowMode::Ellipsis;
    EXPECT_EQ(Lay("aaaa bbbb", 40).lines[0].ellipsis.font, css::kNoTypeface);
    style_.whiteSpace = WhiteSpaceMode::NoWrap;
    const TextInfo cut = Lay("aaaa bbbb", 60);
    ASSERT_EQ(cut.lines.size(), 1u);
    EXPECT_NE(cut.lines[0].ellipsis.font, css::kNoTypeface);
    EXPECT_LE(cut.width, 60);
    EXPECT_LT(cut.lines[0].endCharacter, 9u);
    // One character stays, however narrow the box is.
    EXPECT_EQ(Lay("aaaa", 1).lines[0].endCharacter, 1u);
    EXPECT_EQ(Lay("aa", 200).lines[0].ellipsis.font, css::kNoTypeface);
}

TEST_F(TextLayoutTest, AlignmentMovesLinesInsideTheWidest) {
    style_.whiteSpace = WhiteSpaceMode::Pre;
    const float gap = WidthOf("aaaa") - WidthOf("aa");
    style_.align = TextAlignType::Center;
    EXPECT_NEAR(Lay("aaaa\naa", NAN).runs[1].x, gap / 2, 0.01f);
    style_.align = TextAlignType::Right;
    EXPECT_NEAR(Lay("aaaa\naa", NAN).runs[1].x, gap, 0.01f);
    style_.whiteSpace = WhiteSpaceMode::Normal;
    style_.align = TextAlignType::Justify;
    const float width = WidthOf("aa bb") + 10;
    const TextInfo info = Lay("aa bb cc", width);
    ASSERT_EQ(info.lines.size(), 2u);
    EXPECT_NEAR(info.runs[0].width, width, 0.01f);
    EXPECT_NEAR(info.runs[1].width, WidthOf("cc"), 0.01f);  // the last line stays
}

TEST_F(TextLayoutTest, LettersSpacingAndLineHeightAreApplied) {
    const float plain = WidthOf("abc");
    style_.letterSpacing = 2;
    EXPECT_FLOAT_EQ(WidthOf("abc"), plain + 6);
    style_.lineHeight = 30;
    const TextInfo info = Lay("a b", 1);
    EXPECT_FLOAT_EQ(info.height, 60);
    EXPECT_GT(info.lines[0].baseline, 15);
}

TEST_F(TextLayoutTest, FitSearchesTheSize) {
    style_.fit = FontFitModeType::Fit;
    style_.whiteSpace = WhiteSpaceMode::NoWrap;
    const TextInfo grown = Lay("word", 400, 200);
    EXPECT_LE(grown.width, 400);
    EXPECT_LE(grown.height, 200);
    style_.fit = FontFitModeType::None;
    style_.fontSize = style_.usedSize = grown.usedSize + 1;
    const TextInfo above = Lay("word", NAN);
    EXPECT_TRUE(above.width > 400 || above.height > 200);
    style_.fit = FontFitModeType::Shrink;
    EXPECT_FLOAT_EQ(Lay("never fits", 1, 1).usedSize, 6);
    EXPECT_FLOAT_EQ(Lay("word", NAN, NAN).usedSize, style_.fontSize);
}

TEST_F(TextLayoutTest, BadUtf8AndMissingFontsAreBounded) {
    EXPECT_EQ(Lay("a\xFF\xC3(\xE2\x82", NAN).glyphs.size(), 5u);
    TextStyle none;
    none.typefaces.push_back(css::kNoTypeface);
    TextInfo info;
    EXPECT_FALSE(LayoutText({"a", none, NAN, NAN, *library_->GetFontService()}, info));
    EXPECT_TRUE(info.lines.empty());
    // A megabyte in one node is one pass.
    std::string large;
    for (int i = 0; i < 200000; ++i)
        large += "word ";
    EXPECT_GT(Lay(large, 300).lines.size(), 1000u);
}

}  // namespace
}  // namespace qorvex::layout
