// Longhands as data: what each text becomes when it is read and printed again, and what is refused.
#include <string>

#include "css/values/value_text.h"
#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

using test::QorvexTest;

class LonghandTest : public QorvexTest {
  protected:
    // The printed value, "inherit", or "refused".
    std::string Read(std::string_view property, std::string_view text) {
        Declaration declaration;
        if (!ParseLonghand(FindProperty(property), text, declaration)) return "refused";
        CssString out;
        SerialiseDeclaration(declaration, out);
        return std::string(out.view());
    }
};

struct Case {
    const char* property;
    const char* text;
    const char* expected;
};

constexpr const char* kRefused = "refused";

constexpr Case kCases[] = {
    // Lengths
    {"padding-left", "0", "0px"},
    {"padding-left", "5", kRefused},
    {"padding-left", "0%", "0%"},
    {"padding-left", "-.5em", "-0.5em"},
    {"padding-left", "10PX", kRefused},
    {"padding-left", "1cm", kRefused},
    {"padding-left", "1e3px", kRefused},
    {"padding-left", "infpx", kRefused},
    {"padding-left", "1 px", kRefused},
    {"padding-left", "auto", kRefused},
    {"padding-left", "initial", kRefused},
    {"padding-left", "inherit", "inherit"},
    {"margin-left", "AUTO", "auto"},
    {"margin-left", "initial", "0px"},
    {"width", "initial", "auto"},
    {"width", "1.25vmin", "1.25vmin"},
    {"border-top-width", "thin", "thin"},
    {"border-top-width", "-1px", kRefused},
    {"border-top-left-radius", "5%", "5%"},
    {"border-top-left-radius", "5% 2px", "5% 2px"},
    {"border-top-left-radius", "-1px", kRefused},
    {"line-height", "1.5", "1.5em"},
    {"line-height", "normal", "normal"},
    {"letter-spacing", "2px", "2px"},
    {"letter-spacing", "2", kRefused},
    {"perspective", "none", "none"},
    {"z-index", "-3", "-3"},
    {"z-index", "1.5", kRefused},
    {"z-index", "99999999999", kRefused},
    {"opacity", "1.5", "1"},
    {"opacity", "-1", "0"},
    // Colours
    {"color", "#12", kRefused},
    {"color", "#F00", "rgba(255, 0, 0, 1.000000)"},
    {"color", "#12345", kRefused},
    {"color", "#11223380", "rgba(17, 34, 51, 0.501961)"},
    {"color", "#ggg", kRefused},
    {"color", "RED", "rgba(255, 0, 0, 1.000000)"},
    {"color", "transparent", "rgba(0, 0, 0, 0.000000)"},
    {"color", "lightgoldenrodyellow", "rgba(250, 250, 210, 1.000000)"},
    {"color", "notacolor", kRefused},
    {"color", "rgb(1.0,0,0)", "rgba(1, 0, 0, 1.000000)"},
    {"color", "rgb(0.999,0,0)", "rgba(254, 0, 0, 1.000000)"},
    {"color", "rgb(300,0,0)", "rgba(255, 0, 0, 1.000000)"},
    {"color", "rgb(1.5,0,0)", kRefused},
    {"color", "rgb(50%,0,0)", "rgba(127, 0, 0, 1.000000)"},
    {"color", "rgb(150%,0,0)", kRefused},
    {"color", "rgb(1,2)", kRefused},
    {"color", "rgb(1,,2)", kRefused},
    {"color", "rgba(1, 2, 3, 7)", "rgba(1, 2, 3, 1.000000)"},
    {"color", "color(qor-scrgb 2.0 0 0)", "color(qor-scrgb 2.000, 0.000, 0.000, 1.000)"},
    {"color", "color(rec2020 1 1)", kRefused},
    {"border-top-color", "currentcolor", "currentColor"},
    {"border-top-color", "initial", "currentColor"},
    // Keywords
    {"display", "inline-block", kRefused},
    {"display", "Flex", "flex"},
    {"display", "initial", kRefused},
    {"visibility", "initial", "visible"},
    {"text-align", "justify", "justify"},
    {"mix-blend-mode", "additive", "additive"},
    {"user-select", "auto", "inherit"},
    {"font-weight", "400", "normal"},
    {"font-weight", "949", "900"},
    {"font-weight", "1000", "900"},
    {"font-weight", "1", "100"},
    {"font-weight", "1001", kRefused},
    {"font-weight", "bolder", "bolder"},
    {"contain", "layout size", "size layout"},
    {"contain", "size size", kRefused},
    {"contain", "layout style paint", "content"},
    // Flex
    {"flex", "none", "0 0 auto"},
    {"flex", "auto", "1 auto"},
    {"flex", "initial", "0 auto"},
    {"flex", "2", "2"},
    {"flex", "10px", "10px"},
    {"flex", "1 2", "1 2"},
    {"flex", "1 10px", "1 10px"},
    {"flex", "1 1 0", "1 1 0px"},
    {"flex", "-1", kRefused},
    {"flex", "10px 1", kRefused},
    {"flex", "1 1 auto ignored", "1 1 auto"},
    // Images
    {"background-image", "url( 'a b.png' ),none", "url(\"a b.png\"), none"},
    {"background-image", "url(a.png),", kRefused},
    {"background-image", "linear-gradient(red,blue)",
     "linear-gradient(180deg, rgba(255, 0, 0, 1.000000), rgba(0, 0, 255, 1.000000))"},
    {"background-image", "linear-gradient(to top right,rgb(1,2,3) 10%,#fff 20px 30px)",
     "linear-gradient(to top right, rgba(1, 2, 3, 1.000000) 10%, rgba(255, 255, 255, 1.000000) 20px, "
     "rgba(255, 255, 255, 1.000000) 30px)"},
    {"background-image", "linear-gradient(to left right,red,blue)", kRefused},
    {"background-image", "linear-gradient(1rad,red,blue)", kRefused},
    {"background-image", "linear-gradient(red)", kRefused},
    {"mask-image", "radial-gradient(circle 5px at left top,red,blue)",
     "radial-gradient(circle 5px at 0% 0%, rgba(255, 0, 0, 1.000000), rgba(0, 0, 255, 1.000000))"},
    {"mask-image", "repeating-radial-gradient(closest-side,red,blue)",
     "repeating-radial-gradient(ellipse closest-side at 50% 50%, rgba(255, 0, 0, 1.000000), "
     "rgba(0, 0, 255, 1.000000))"},
    {"background-position-x", "left,25%", "0%, 25%"},
    {"background-position-x", "top", kRefused},
    {"background-position-y", "bottom", "100%"},
    {"mask-position", "top left", "0% 0%"},
    {"mask-position", "10px", "10px 50%"},
    {"background-size", "cover,10px auto", "cover, 10px"},
    {"background-size", "-1px", kRefused},
    {"background-repeat", "repeat-x,round space", "repeat no-repeat, round"},
    {"border-image-slice", "fill 1 2%", "1 2% 1 2% fill"},
    {"border-image-slice", "fill", kRefused},
    {"border-image-width", "auto 2 3px", "auto 2 3px 2"},
    {"border-image-outset", "auto", kRefused},
    {"border-image-repeat", "space", "repeat"},
    {"mask-mode", "luminance", "alpha"},
    {"mask-clip", "view-box", "border-box"},
    // Effects
    {"box-shadow", "inset 1px 2px red 3px 4px", "1px 2px 3px 4px rgba(255, 0, 0, 1.000000) inset"},
    {"box-shadow", "1px 2px,none", kRefused},
    {"box-shadow", "1px", kRefused},
    {"box-shadow", "1px 2px -3px", kRefused},
    {"box-shadow", "1px 2px red blue", kRefused},
    {"text-shadow", "1px 2px currentColor", "1px 2px 0px currentColor"},
    {"text-shadow", "1px 2px 3px 4px", kRefused},
    {"filter", "blur(2px) hue-rotate(90deg) sepia(50%) invert()",
     "blur(2px) hue-rotate(90deg) sepia(50%) invert(1)"},
    {"filter", "drop-shadow(1px 2px 3px)", "drop-shadow(1px 2px 3px currentColor)"},
    {"filter", "qor-axis-blur(1px, 2px)", "qor-axis-blur(1px 2px)"},
    {"filter", "qor-color-matrix(1,2)", kRefused},
    {"filter", "glow(1px)", kRefused},
    {"cursor", "url(a.png) 1 2,pointer", "url(\"a.png\"), pointer"},
    {"cursor", "url", kRefused},
    {"clip-path", "circle(closest-side at 1px 2px) border-box", "circle(closest-side at 1px 2px) border-box"},
    {"clip-path", "padding-box", "padding-box"},
    {"clip-path", "inset(1px 2px round 3px/4px)",
     "inset(1px 2px 1px 2px round 3px 3px 3px 3px / 4px 4px 4px 4px)"},
    {"clip-path", "polygon(evenodd,0 0,10px 5%)", "polygon(evenodd, 0px 0px, 10px 5%)"},
    {"clip-path", "polygon(0 0 0)", kRefused},
    {"clip-path", "path('M0 0L10 10z')", "path(\"M0 0L10 10z\")"},
    {"clip-path", "path('M0 0)", kRefused},
    {"clip-path", "path('L0 0')", kRefused},
    {"qor-composition-id", "Hud Main", "Hud Main"},
    // Transform
    {"transform", "none", "none"},
    {"transform", "translate(1px) scale(2)", "translate3d(1px, 0px, 0px) scale3d(2, 2, 1)"},
    {"transform", "rotate(0) skewX(-3deg)", "rotateZ(0deg) skewX(-3deg)"},
    {"transform", "rotate(1rad)", kRefused},
    {"transform", "rotate(5)", kRefused},
    {"transform", "translate3d(1px,2px)", kRefused},
    {"transform", "scale3d(2)", "scale3d(2, 1, 1)"},
    {"transform", "rotate3d(1,0,0,45deg)", "rotate3d(1, 0, 0, 45deg)"},
    {"transform", "matrix(1,2,3,4,5,6)", "matrix3d(1, 2, 0, 0, 3, 4, 0, 0, 0, 0, 1, 0, 5, 6, 0, 1)"},
    {"transform-origin", "top", "50% 0%"},
    {"transform-origin", "right 3px 4px", "100% 3px 4px"},
    {"perspective-origin", "left", "0% 50%"},
    // Text
    {"font-family", "\"A B\",C D,serif", "A B, C D, serif"},
    {"font-family", "\"a\tb\", \"None\", 'x\\\"y'", "\"a\tb\", \"None\", \"x\\\"y\""},
    {"font-family", "12px", kRefused},
    {"font-family", "a,,b", kRefused},
    // Lists
    {"animation-name", "none", "none"},
    {"animation-name", "'a b', \"c\"", "\"a b\", c"},
    {"animation-name", "a,none", "a, none"},
    {"animation-duration", "500ms,2s", "0.5s, 2s"},
    {"animation-duration", "-1s", kRefused},
    {"animation-duration", "1", kRefused},
    {"animation-delay", "-1s", "-1s"},
    {"animation-iteration-count", "infinite,2.5", "infinite, 2.5"},
    {"animation-timing-function", "ease-in,steps(3,start),cubic-bezier(0,1,2,3)", kRefused},
    {"animation-timing-function", "ease-in,steps(3,start),cubic-bezier(0,1,1,3)",
     "ease-in, steps(3, start), cubic-bezier(0, 1, 1, 3)"},
    {"animation-timing-function", "step-end", "step-end"},
    {"transition-property", "all,margin,opacity", "all, margin, opacity"},
    {"transition-property", "bogus,width", "none, width"},
};

TEST_F(LonghandTest, ReadsAndPrints) {
    for (const Case& c : kCases)
        EXPECT_EQ(Read(c.property, c.text), c.expected) << c.property << ": " << c.text;
}

TEST_F(LonghandTest, PrintedValuesReadBack) {
    for (const Case& c : kCases) {
        Declaration first, second;
        PropertyId id = FindProperty(c.property);
        if (!ParseLonghand(id, c.text, first) || !first.IsValue()) continue;
        CssString text;
        SerialiseDeclaration(first, text);
        ASSERT_TRUE(ParseLonghand(id, text, second)) << c.property << ": " << text.view();
        CssString again;
        SerialiseDeclaration(second, again);
        EXPECT_EQ(text, again) << c.property;
        // Colours print as 255ths: they settle after one round.
        Declaration third;
        ASSERT_TRUE(ParseLonghand(id, again, third));
        EXPECT_TRUE(second == third) << c.property << ": " << text.view();
    }
}

TEST_F(LonghandTest, InitialValuesReadBack) {
    for (size_t i = 0; i < kLonghandCount; ++i) {
        PropertyId id = static_cast<PropertyId>(i);
        Declaration initial = Declaration::Initial(id), read;
        CssString text, again;
        SerialiseDeclaration(initial, text);
        if (text.empty() || id == PropertyId::UserSelect) continue;  // no text stands for these
        ASSERT_TRUE(ParseLonghand(id, text, read)) << PropertyName(id) << ": " << text.view();
        SerialiseDeclaration(read, again);
        EXPECT_EQ(text, again) << PropertyName(id);
    }
}

TEST_F(LonghandTest, WarnsOfWhatItReplaces) {
    Read("mask-mode", "luminance");
    Read("mask-clip", "no-clip");
    Read("background-repeat", "space");
    Read("border-image-repeat", "round space");
    Read("transition-property", "bogus");
    Read("clip-path", "path('M0 0' 1)");
    std::string many;
    for (int i = 0; i < 17; ++i)
        many += "rotate(1deg) ";
    Read("transform", many);
    EXPECT_EQ(log_.Count("mask-mode Luminance currently not supported falling back to alpha"), 1u);
    EXPECT_EQ(log_.Count("no-clip for mask-clip is currently not supported falling back to border-box"), 1u);
    EXPECT_EQ(log_.Count("Space repeat type is not supported falling back to round"), 1u);
    EXPECT_EQ(log_.Count("'space' is not supported for vertical border-image-repeat. Fallback to 'repeat'"),
              1u);
    EXPECT_EQ(log_.Count("Transition property bogus is not recognized."), 1u);
    EXPECT_EQ(log_.Count("declaration has excess characters after path declaration - they are ignored!"), 1u);
    EXPECT_EQ(
        log_.Count("Maximum transform operations reached: 17. The rest of the operations will be ignored!"),
        1u);
    Declaration declaration;
    ASSERT_TRUE(ParseLonghand(PropertyId::Transform, many, declaration));
    EXPECT_EQ(declaration.Get<PropertyId::Transform>().operations.size(), 16u);
}

TEST_F(LonghandTest, KeepsWideColorsAndExactChannels) {
    Color color;
    ASSERT_TRUE(ParseColor("color(rec2020 1 0 0 2)", color));
    EXPECT_FLOAT_EQ(color.red, 1.6605f);
    EXPECT_FLOAT_EQ(color.green, -0.1246f);
    EXPECT_EQ(color.alpha, 1);
    // Every 255th prints as itself.
    for (int i = 0; i < 256; ++i) {
        std::string text = "rgba(" + std::to_string(i) + ", 0, 0, 1.000000)";
        EXPECT_EQ(Read("color", text), text);
    }
}

}  // namespace
}  // namespace qorvex::css
