// What shorthands expand to; tests/pages/cases/shorthands shows their values.
#include "css/values/value_text.h"
#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

using test::QorvexTest;

using ShorthandTest = QorvexTest;

TEST_F(ShorthandTest, ExpandsToItsLonghandsAlone) {
    for (size_t i = kLonghandCount + 1; i < kPropertyEnd; ++i) {
        PropertyId id = static_cast<PropertyId>(i);
        CssVector<Declaration> made;
        ASSERT_TRUE(ParseShorthand(id, "initial", kImportant, made) ||
                    ParseShorthand(id, "none", kImportant, made))
            << PropertyName(id);
        std::span<const PropertyId> longhands = LonghandsOf(id);
        ASSERT_EQ(made.size(), longhands.size()) << PropertyName(id);
        for (size_t k = 0; k < longhands.size(); ++k) {
            EXPECT_EQ(made[k].property(), longhands[k]) << PropertyName(id);
            EXPECT_TRUE(made[k].important());
        }
    }
}

// From script alone: the grammar of sheets stops at the first, and takes two slashes for a comment.
TEST_F(ShorthandTest, EmptyParts) {
    CssVector<Declaration> made;
    EXPECT_FALSE(ParseShorthand(PropertyId::Transition, "opacity 1s,", 0, made));
    EXPECT_TRUE(made.empty());
    ASSERT_TRUE(ParseShorthand(PropertyId::BorderImage, "url(b.png) 30//2", 0, made));
    CssString text;
    for (const Declaration& declaration : made)
        SerialiseDeclaration(declaration, text);
    EXPECT_EQ(text, "url(\"b.png\")30 30 30 301 1 1 12 2 2 2stretch");
}

}  // namespace
}  // namespace qorvex::css
