// Shorthands as data: the longhands that a text expands to, or that it is refused.
#include <string>

#include "css/values/value_text.h"
#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

using test::QorvexTest;

class ShorthandTest : public QorvexTest {
  protected:
    // "name: value; ..." of the longhands, or "refused".
    std::string Expand(std::string_view property, std::string_view text) {
        CssVector<Declaration> made;
        if (!ParseShorthand(FindProperty(property), text, kImportant, made)) {
            EXPECT_TRUE(made.empty());
            return "refused";
        }
        CssString out;
        for (const Declaration& declaration : made) {
            EXPECT_TRUE(declaration.important());
            out.append(PropertyName(declaration.property()));
            out.append(": ");
            SerialiseDeclaration(declaration, out);
            out.append("; ");
        }
        return std::string(out.view());
    }
};

struct Case {
    const char* property;
    const char* text;
    const char* expected;
};

constexpr Case kCases[] = {
    {"margin", "1px 2px 3px", "margin-bottom: 3px; margin-left: 2px; margin-right: 2px; margin-top: 1px; "},
    {"margin", "1px 2px 3px 4px 5px", "refused"},
    {"margin", "1px inherit", "refused"},
    {"margin", "inherit",
     "margin-bottom: inherit; margin-left: inherit; margin-right: inherit; margin-top: inherit; "},
    {"padding", "auto", "refused"},
    {"border-width", "thin 2px",
     "border-top-width: thin; border-left-width: 2px; border-right-width: 2px; border-bottom-width: thin; "},
    {"border-style", "solid dashed none hidden",
     "border-bottom-style: none; border-left-style: hidden; border-right-style: dashed; border-top-style: "
     "solid; "},
    {"border-left", "solid 2px",
     "border-left-width: 2px; border-left-style: solid; border-left-color: currentColor; "},
    {"border-left", "solid dashed", "refused"},
    {"border-radius", "1px 2px/3px",
     "border-top-left-radius: 1px 3px; border-top-right-radius: 2px 3px; border-bottom-left-radius: 2px 3px; "
     "border-bottom-right-radius: 1px 3px; "},
    {"border-radius", "-1px", "refused"},
    {"overflow", "hidden", "overflow-x: hidden; overflow-y: hidden; "},
    {"overflow", "hidden auto", "overflow-x: hidden; overflow-y: auto; "},
    {"background-position", "top,5px 6px",
     "background-position-x: 50%, 5px; background-position-y: 0%, 6px; "},
    {"text-stroke", "1px red", "text-stroke-width: 1px; text-stroke-color: rgba(255, 0, 0, 1.000000); "},
    {"font", "italic 700 12px/14px \"A B\",C",
     "font-family: A B, C; font-size: 12px; font-style: italic; font-weight: bold; line-height: 14px; "},
    {"font", "bold italic 1em / 2 serif",
     "font-family: serif; font-size: 1em; font-style: italic; font-weight: bold; line-height: 2em; "},
    {"font", "12px", "refused"},
    {"font", "bold 12px", "refused"},
    {"background", "url(a.png) left top/cover no-repeat #fff",
     "background-image: url(\"a.png\"); background-position-x: 0%; background-position-y: 0%; "
     "background-color: "
     "rgba(255, 255, 255, 1.000000); background-size: cover; background-repeat: no-repeat; "},
    {"background", "none",
     "background-image: none; background-position-x: 0%; background-position-y: 0%; background-color: "
     "rgba(0, 0, 0, "
     "0.000000); background-size: auto; background-repeat: repeat; "},
    {"background", "red blue", "refused"},
    {"background", "bogus", "refused"},
    {"mask", "url(m.png) center/50% 20px repeat-x alpha",
     "mask-position: 50% 50%; mask-size: 50% 20px; mask-image: url(\"m.png\"); mask-mode: alpha; mask-clip: "
     "border-box; mask-repeat: repeat no-repeat; "},
    {"mask", "none",
     "mask-position: 0% 0%; mask-size: auto; mask-image: none; mask-mode: auto; mask-clip: border-box; "
     "mask-repeat: "
     "no-repeat; "},
    {"border-image", "url(b.png) 30 fill/10px/5px round",
     "border-image-source: url(\"b.png\"); border-image-slice: 30 30 30 30 fill; border-image-width: 10px "
     "10px 10px "
     "10px; border-image-outset: 5px 5px 5px 5px; border-image-repeat: round; "},
    {"border-image", "url(b.png) 30//2",
     "border-image-source: url(\"b.png\"); border-image-slice: 30 30 30 30; "
     "border-image-width: 1 1 1 1; border-image-outset: 2 2 2 2; "
     "border-image-repeat: stretch; "},
    {"animation", "1s 2s foo",
     "animation-name: foo; animation-duration: 1s; animation-iteration-count: 1; animation-delay: 2s; "
     "animation-fill-mode: none; animation-direction: normal; animation-timing-function: ease; "
     "animation-play-state: running; "},
    {"animation", "a 1s infinite,b steps(2,end) paused both",
     "animation-name: a, b; animation-duration: 1s, 0s; animation-iteration-count: infinite, 1; "
     "animation-delay: 0s, "
     "0s; animation-fill-mode: none, both; animation-direction: normal, normal; animation-timing-function: "
     "ease, "
     "steps(2, end); animation-play-state: running, paused; "},
    {"animation", "a b", "refused"},
    {"transition", "opacity 1s linear 200ms,2s",
     "transition-property: opacity, all; transition-duration: 1s, 2s; transition-delay: 0.2s, 0s; "
     "transition-timing-function: linear, ease; "},
    {"transition", "opacity 1s,", "refused"},
};

TEST_F(ShorthandTest, ExpandsInOrderOfIds) {
    for (const Case& c : kCases)
        EXPECT_EQ(Expand(c.property, c.text), c.expected) << c.property << ": " << c.text;
}

TEST_F(ShorthandTest, ExpandsToItsLonghandsAlone) {
    for (size_t i = kLonghandCount + 1; i < kPropertyEnd; ++i) {
        PropertyId id = static_cast<PropertyId>(i);
        CssVector<Declaration> made;
        ASSERT_TRUE(ParseShorthand(id, "initial", 0, made) || ParseShorthand(id, "none", 0, made))
            << PropertyName(id);
        std::span<const PropertyId> longhands = LonghandsOf(id);
        ASSERT_EQ(made.size(), longhands.size()) << PropertyName(id);
        for (size_t k = 0; k < longhands.size(); ++k)
            EXPECT_EQ(made[k].property(), longhands[k]) << PropertyName(id);
    }
}

TEST_F(ShorthandTest, BorderSetsAllSides) {
    CssVector<Declaration> made;
    ASSERT_TRUE(ParseShorthand(PropertyId::Border, "red 2px solid", 0, made));
    ASSERT_EQ(made.size(), 12u);
    for (const Declaration& declaration : made) {
        CssString text;
        SerialiseDeclaration(declaration, text);
        EXPECT_TRUE(text == "2px" || text == "solid" || text == "rgba(255, 0, 0, 1.000000)") << text.view();
    }
}

}  // namespace
}  // namespace qorvex::css
