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

// What no page of tests/pages/cases/values shows.
constexpr Case kCases[] = {
    {"padding-left", "-.5em", "-0.5em"},
    {"padding-left", "infpx", kRefused},
    {"padding-left", "1 px", kRefused},
    {"color", "rgb(1,,2)", kRefused},
    {"font-weight", "bolder", "bolder"},
    {"contain", "size size", kRefused},
    {"flex", "1 1 0", "1 1 0px"},
    {"border-image-outset", "auto", kRefused},
    {"box-shadow", "1px 2px,none", kRefused},
    {"filter", "drop-shadow(1px 2px 3px)", "drop-shadow(1px 2px 3px currentColor)"},
    {"filter", "qor-axis-blur(1px, 2px)", "qor-axis-blur(1px 2px)"},
    {"clip-path", "circle(closest-side at 1px 2px) border-box", "circle(closest-side at 1px 2px) border-box"},
    {"transform-origin", "right 3px 4px", "100% 3px 4px"},
    {"font-family", "\"a\tb\", \"None\", 'x\\\"y'", "\"a\tb\", \"None\", \"x\\\"y\""},
    {"font-family", "a,,b", kRefused},
    {"animation-name", "'a b', \"c\"", "\"a b\", c"},
};

TEST_F(LonghandTest, ReadsAndPrints) {
    for (const Case& c : kCases)
        EXPECT_EQ(Read(c.property, c.text), c.expected) << c.property << ": " << c.text;
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
