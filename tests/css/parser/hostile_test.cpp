// Large and broken texts: work stays in proportion to the text, and nothing nests without bound.
#include "core/limits.h"
#include "css/parser/sheet_dump.h"
#include "support/repeat.h"
#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

using test::QorvexTest;
using test::Repeat;

class HostileSheetTest : public QorvexTest {
  protected:
    std::unique_ptr<StringPool> strings_ = std::make_unique<StringPool>();
};

TEST_F(HostileSheetTest, NestingEndsAtTheLimit) {
    const size_t limit = limits::kMaxCssNesting;
    for (const char* opening : {"f(", "("}) {
        std::string inside = Repeat(opening, limit) + "1" + Repeat(")", limit);
        EXPECT_FALSE(ParseStylesheet("a{x:" + inside + "}")->HasError());
        log_.Clear();
        EXPECT_TRUE(ParseStylesheet("a{x:(" + inside + ")}")->HasError());
        EXPECT_TRUE(log_.Contains("memory exhausted"));
    }
    log_.Clear();
    ParserContextPtr context =
        ParseStylesheet(Repeat(":not(", limit + 1) + "a" + Repeat(")", limit + 1) + "{x:1}");
    EXPECT_TRUE(context->HasError());
    EXPECT_TRUE(log_.Contains("memory exhausted"));
    EXPECT_FALSE(ParseStylesheet(Repeat(":not(", limit) + "a" + Repeat(")", limit) + "{x:1}")->HasError());
}

TEST_F(HostileSheetTest, TokensFollowTheText) {
    const size_t size = 200000;
    for (const char* piece :
         {"a",    "{",     "}",     "a{",      "a{b:c;", "(",   "'",   "\"\\",   "/*",   "//", "/",
          "url(", "url('", "\\",    "@media(", "!",      "! /", "-",   "--",     "<!--", "#",  ".",
          "1.",   "\xFF",  ":not(", "[a=",     "a,",     "a>",  "1%{", "var(--", "@",    ";"}) {
        std::string text = Repeat(piece, size / std::string_view(piece).size());
        ParserContextPtr context = ParseStylesheet(text);
        EXPECT_LE(context->GetTokenCount(), text.size() + 2) << piece;
        EXPECT_LE(context->arena().BytesReserved(), 96 * text.size() + (1 << 20)) << piece;
        StylesheetPtr sheet = ConvertStylesheet(*context, "", *strings_);
        EXPECT_LE(sheet->rules.size(), text.size());
    }
    std::string zeros(size, '\0');
    EXPECT_LE(ParseStylesheet(zeros)->GetTokenCount(), size);
}

TEST_F(HostileSheetTest, CopiesDoNotMultiply) {
    // N selectors over M declarations, N queries over M rules, N moments over M declarations.
    std::string selectors = Repeat("a,", 20000) + "b{" + Repeat("top:1px;", 20000) + "}";
    StylesheetPtr sheet = MakeStylesheet(selectors, "", *strings_);
    ASSERT_EQ(sheet->rules.size(), 20001u);
    EXPECT_EQ(&sheet->rules[0].declarations(), &sheet->rules[20000].declarations());

    std::string media =
        "@media " + Repeat("(min-width:1px),", 5000) + "(min-width:1px){" + Repeat("a{top:0}", 5000) + "}";
    sheet = MakeStylesheet(media, "", *strings_);
    EXPECT_LE(sheet->mediaBlocks.size() * 5000, limits::kMaxMediaRuleCopies + 5000);

    std::string keyframes = "@keyframes k{";
    for (int i = 0; i < 5000; ++i)
        keyframes += (i ? "," : "") + std::to_string(i * 0.01) + "%";
    keyframes += "{" + Repeat("top:1px;left:2px;", 2000) +
                 "opacity:1;width:1px;height:1px;z-index:1;right:1px;"
                 "bottom:1px;margin:1px;padding:1px;color:red;font-size:1px}}";
    sheet = MakeStylesheet(keyframes, "", *strings_);
    size_t frames = 0;
    for (const KeyframeTrack& track : sheet->keyframes[0].tracks)
        frames += track.frames.size();
    EXPECT_LE(frames, limits::kMaxKeyframeValues);
}

TEST_F(HostileSheetTest, NumbersOutOfRangeAreRefused) {
    std::string digits(400, '9');
    std::string text = "a{top:" + digits + "px;left:0." + std::string(400, '0') + "1px;right:" + digits +
                       ".5px;z-index:" + digits + ";color:rgb(" + digits + ",0,0)}";
    EXPECT_EQ(Dump(*MakeStylesheet(text, "", *strings_)), "A{left:0px;}");
}

TEST_F(HostileSheetTest, CutAnywhereNothingBreaks) {
    const std::string_view text =
        "@charset \"x\";@import url(a);a.b#c[d=\"e\" "
        "i]:hover::selection>*{color:rgb(1,2,3)!important;--x:var(--y)}"
        "@media (min-width:1px) and (orientation:landscape){a{margin:1px/2px}}@keyframes "
        "k{from,50%{top:calc(1px)}}"
        "@font-face{src:url('a')}";
    for (size_t length = 0; length <= text.size(); ++length) {
        (void)MakeStylesheet(text.substr(0, length), "ui://a/b", *strings_);
        (void)MakeStylesheet(text.substr(length), "", *strings_);
        (void)ConvertInlineStyle(*ParseInlineStyle(text.substr(length)), "", *strings_);
    }
}

}  // namespace
}  // namespace qorvex::css
