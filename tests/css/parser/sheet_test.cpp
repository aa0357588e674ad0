// Sheets as data: what stands after a parse, where it ends, and what is logged.
#include "css/parser/sheet_dump.h"
#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

using test::QorvexTest;

class SheetTest : public QorvexTest {
  protected:
    std::string Parse(std::string_view text) { return Dump(*MakeStylesheet(text, "", *strings_)); }

    std::unique_ptr<StringPool> strings_ = std::make_unique<StringPool>();
};

struct Case {
    const char* text;
    const char* expected;
};

// Beside what the pages of tests/pages/cases/syntax show.
constexpr Case kCases[] = {
    // Selectors
    {"DIV.a#b, * > p + my-tag ~ .c .d {top:0}", "DIV.a#b{top:0px;}.d .c~<my-tag>+P>*{top:0px;}"},
    {"[Data-X][a~='b c'][d|=e i] {top:0}", "[data:x][a~=b c][d|=e i]{top:0px;}"},
    {"[a=b x], b {top:0}", "B{top:0px;}"},
    {"a:HOVER:root::selection{color:red; width:1px}",
     "A:hover:root::selection{selection-color:rgba(255, 0, 0, 1.000000);}"},
    {"x-y::selection, b { Color: red; background-COLOR: blue; top: 0 }",
     "<x-y>::selection{selection-color:rgba(255, 0, 0, 1.000000);selection-background-color:rgba(0, 0, 255, "
     "1.000000);}B{top:0px;}"},
    {"a:visited, b {top:0} :not(.a:nth-child(odd) > b) {top:0} c{top:0}", "B{top:0px;}"},
    // Declarations
    {"a { top: 1px) ; left: 2px }", "A{left:2px;}"},
    {"a { top: ; left: 2px !important x; right: 0 }", "A{right:0px;}"},
    // Sheets
    {"\xEF\xBB\xBF@charset \"x\"; <!-- @import url(a) ; a{top:0} --> b{top:0}", "A{top:0px;}B{top:0px;}"},
    {"@import 'a'; @import 'b'; a{top:0}", ""},
    {"a{top:0} }b{left:0}", "A{top:0px;}"},
    {"a{x:{y:1} z:2} b{left:0}", ""},
    // Media
    {"@media (min-width: 100px), (max-width: 50px) and (orientation:landscape) { a{top:0} }",
     "@media(3,){A{top:0px;}}@media(4,7,){A{top:0px;}}"},
    {"@media (min-aspect-ratio: 16/9) { } b{top:0}", ""},
};

TEST_F(SheetTest, StandsAfterAParse) {
    for (const Case& c : kCases)
        EXPECT_EQ(Parse(c.text), c.expected) << c.text;
}

TEST_F(SheetTest, ReadsCustomPropertiesOnce) {
    StylesheetPtr sheet = MakeStylesheet(
        "a, b { --x: 1px  calc(2px); --x: 2px !important; --x: 3px; --: 1; --y:var(--x) }", "", *strings_);
    ASSERT_EQ(sheet->rules.size(), 2u);
    const CustomPropertyMap& map = sheet->rules[1].customProperties();
    ASSERT_EQ(map.size(), 2u);
    EXPECT_EQ((*map.get(strings_->Intern("x")))->text, "2px");
    const CustomProperty& y = **map.get(strings_->Intern("y"));
    EXPECT_EQ(y.flags, kHasVar);
    ASSERT_EQ(y.references.size(), 1u);
    EXPECT_EQ(y.references[0].length, y.text.size());
}

TEST_F(SheetTest, EditingOneRulesetLeavesItsSiblings) {
    StylesheetPtr sheet = MakeStylesheet("a, b { top: 1px }", "", *strings_);
    sheet->rules[0].MutableBlock().declarations.clear();
    EXPECT_EQ(Dump(*sheet), "A{}B{top:1px;}");
}

TEST_F(SheetTest, KeyframesAndFontFaces) {
    StylesheetPtr sheet = MakeStylesheet(
        "@keyframes 'k' { from, 50% { margin: 1px; bogus: 1 } 50% { margin-top: 2px } to { margin-top: 3px } "
        "}"
        "@font-face { font-family: \"A B\"; src: local(x), url(f/a.ttf) format('x'); font-weight: bold; "
        "font-style: italic }",
        "ui://ui/css/main.css", *strings_);
    ASSERT_EQ(sheet->keyframes.size(), 1u);
    const KeyframesRule& rule = sheet->keyframes[0];
    EXPECT_EQ(rule.name, "k");
    ASSERT_EQ(rule.tracks.size(), 4u);
    const KeyframeTrack& top = rule.tracks[3];
    ASSERT_EQ(top.property, PropertyId::MarginTop);
    ASSERT_EQ(top.frames.size(), 3u);
    EXPECT_EQ(top.frames[1].offset, 0.5f);
    EXPECT_EQ(top.frames[1].value.Get<PropertyId::MarginTop>().value, 2);
    EXPECT_EQ(top.frames[2].offset, 1);
    ASSERT_EQ(sheet->fontFaces.size(), 1u);
    const FontFace& face = sheet->fontFaces[0];
    EXPECT_EQ(face.family, "A B");
    EXPECT_EQ(face.url, "ui://ui/css/f/a.ttf");
    EXPECT_EQ(face.weight, 700);
    EXPECT_EQ(face.style, FontStyle::Italic);
}

TEST_F(SheetTest, ImageUrlsBecomeAbsolute) {
    StylesheetPtr sheet = MakeStylesheet(
        "a { background-image: url(../i/a.png), url('data:image/png;base64,AA'); mask-image: "
        "url(http://x/b.png) }",
        "ui://ui/css/main.css", *strings_);
    EXPECT_EQ(sheet->imageUrls.size(), 3u);
    EXPECT_TRUE(sheet->imageUrls.contains("ui://ui/i/a.png"));
    EXPECT_TRUE(sheet->imageUrls.contains("data:image/png;base64,AA"));
    EXPECT_TRUE(sheet->imageUrls.contains("http://x/b.png"));
}

TEST_F(SheetTest, InlineStylesSelectorsAndMediaTexts) {
    auto inlineText = [&](std::string_view text) {
        return std::string(ConvertInlineStyle(*ParseInlineStyle(text), "", *strings_).ToText().view());
    };
    EXPECT_EQ(inlineText("width:1px; width : 2px;--a:b"), "width: 2px; --a: b; ");
    EXPECT_EQ(inlineText("width:1px!important;width:2px"), "width: 1px !important; ");
    EXPECT_EQ(inlineText("/* x */"), "");
    EXPECT_EQ(inlineText(""), "");
    EXPECT_EQ(inlineText("top:0} b{left:0"), "");
    EXPECT_FALSE(ParseInlineStyle("top:0")->HasError());
    // Printed and read again it is the same, whatever operators and signs stand between names and numbers.
    for (const char* const value :
         {"#a - calc(1px)", "1px - var(--b)", "1 + 2", "calc(1px + 2px)", "calc(1px - (2px))", "calc(a - b)",
          "calc(1px) - -2px", "- calc(1px)", "calc(1px) * - 1px", "a - - b", "calc(- url(a b))",
          "calc(1px)-url(x/y)", "calc(1) + .5 - \"a\"", "(--x)-#y", "calc(--x - --y)", "1%-2%", "- (1px)",
          "calc(2)/-3"}) {
        for (const char* const name : {"--x: ", "width: ", "qor-composition-id: "}) {
            const std::string once = inlineText(std::string(name) + value);
            EXPECT_EQ(inlineText(once), once) << value;
        }
    }
    // Printed without its space a second sign would not be read.
    EXPECT_EQ(inlineText("--x: - - calc(1px); --x: - + -b; --x: 1px * - - a"), "");
    EXPECT_EQ(inlineText("width: calc( 1px+var(--x)/2 - 3px )"), "width: calc(1px+var(--x)/2 - 3px); ");

    auto selectors = [&](std::string_view text) {
        std::string out;
        auto list = ConvertSelector(*ParseSelector(text), *strings_);
        if (!list) return std::string("invalid");
        for (const ComplexSelector& selector : *list)
            out += Dump(selector) + ";";
        return out;
    };
    EXPECT_EQ(selectors(" a > b , .c"), "B>A;.c;");
    EXPECT_EQ(selectors(""), "invalid");
    EXPECT_EQ(selectors("a{top:0} b"), "invalid");
    EXPECT_EQ(selectors("a{"), "invalid");
    EXPECT_EQ(selectors(":visited"), "invalid");

    auto media = ConvertMediaQuery(*ParseMediaQuery("(min-width: 10vw) and (bogus: 1)"));
    ASSERT_TRUE(media);
    ASSERT_EQ(media->size(), 1u);
    EXPECT_EQ((*media)[0].length.value, 10);
    for (const char* text : {"", "all", "(bogus: 1)", "(min-width"})
        EXPECT_FALSE(ConvertMediaQuery(*ParseMediaQuery(text))) << text;
}

TEST_F(SheetTest, SpecificityOutranksByKind) {
    auto of = [&](std::string_view text) {
        return (*ConvertSelector(*ParseSelector(text), *strings_))[0].specificity.AsNumber();
    };
    EXPECT_EQ(of("#a.b[c]:hover p *"), 0x00010301u);
    EXPECT_GT(of("#a"), of(".a.b.c p"));
    std::string many;
    for (int i = 0; i < 300; ++i)
        many += ".a";
    EXPECT_LT(of(many), of("#a"));
    EXPECT_TRUE((*ConvertSelector(*ParseSelector("my-tag"), *strings_))[0].IsQuick());
    EXPECT_FALSE((*ConvertSelector(*ParseSelector("[a]"), *strings_))[0].IsQuick());
}

TEST_F(SheetTest, MakesSingleDeclarations) {
    auto width = MakeDeclaration(PropertyId::Width, " calc(1px + 2px) ", *strings_);
    ASSERT_TRUE(width);
    EXPECT_EQ(width->kind(), DeclarationKind::CustomExpression);
    EXPECT_FALSE(MakeDeclaration(PropertyId::Margin, "1px", *strings_));
    EXPECT_EQ(log_.Count("You can't create css declarations from short hand"), 1u);
}

}  // namespace
}  // namespace qorvex::css
