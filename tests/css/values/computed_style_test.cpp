// Ids, names, tags, declarations as owners, and the sharing of computed style.
#include "css/values/html_tags.h"
#include "css/values/layout_style_refs.h"
#include "css/values/length_context.h"
#include "css/values/match_state.h"
#include "css/values/style_declaration_set.h"
#include "css/values/value_text.h"
#include "support/scoped_library_state.h"

namespace qorvex::css {
namespace {

using test::QorvexTest;

class ComputedStyleTest : public QorvexTest {
  protected:
    ComputedStyleTest() { CreateDefaultStyles(); }
    ~ComputedStyleTest() override { DestroyDefaultStyles(); }
};

TEST_F(ComputedStyleTest, NamesAndIdsAgree) {
    for (size_t i = 0; i < kPropertyEnd; ++i) {
        PropertyId id = static_cast<PropertyId>(i);
        if (id == PropertyId::kLonghandCount) continue;
        EXPECT_EQ(FindProperty(PropertyName(id)), id);
    }
    EXPECT_EQ(FindProperty("Color"), PropertyId::kUnknown);
    EXPECT_EQ(FindProperty(""), PropertyId::kUnknown);
    EXPECT_EQ(static_cast<int>(FindProperty("border-top-width")), 11);
    EXPECT_EQ(static_cast<int>(FindProperty("margin-top")), 22);
    EXPECT_EQ(static_cast<int>(FindProperty("qor-composition-id")), 82);
    EXPECT_EQ(static_cast<int>(FindProperty("background-position")), 136);
    EXPECT_EQ(TagLookup("HTML"), TagId::Html);
    EXPECT_EQ(TagLookup("DIV"), TagId::Div);
    EXPECT_EQ(TagLookup("MY-TAG"), TagId::Custom);
    EXPECT_EQ(TagLookup("NOPE"), TagId::Unknown);
    EXPECT_EQ(static_cast<int>(TagId::Rtc), 149);
}

TEST_F(ComputedStyleTest, LengthsResolve) {
    LengthContext context{10, 5, 20, 16, -1};
    EXPECT_EQ(ResolveLength({LengthUnit::Percent, 50}, context, 300), 150);
    EXPECT_EQ(ResolveLength({LengthUnit::Percent, 50}, context), -1);
    EXPECT_EQ(ResolveLength({LengthUnit::Vmin, 2}, context), 10);
    EXPECT_EQ(ResolveLength({LengthUnit::Vmax, 2}, context), 20);
    EXPECT_EQ(ResolveLength({LengthUnit::Em, 1.5f}, context), 30);
    EXPECT_EQ(ResolveLength({LengthUnit::Rem, 2}, context), 32);
    EXPECT_EQ(ResolveLength({LengthUnit::In, 1}, context), 96);
    EXPECT_EQ(ResolveLength({LengthUnit::Pt, 10}, context), 13);
}

TEST_F(ComputedStyleTest, WritingCopiesOnlySharedGroups) {
    LayoutStyleRefs a = DefaultStyles(), b = a;
    EXPECT_TRUE(a.SameGroups(b));
    a.Mutable<LayoutStyle>().width = Extent::Pixels(10);
    EXPECT_FALSE(a.layout == b.layout);
    EXPECT_TRUE(a.visual == b.visual);
    EXPECT_TRUE(a.written.Has(StyleGroup::Layout));
    EXPECT_EQ(b.Get<PropertyId::Width>(), Extent::Auto());
    const LayoutStyle* own = a.layout.get();
    a.Mutable<LayoutStyle>().height = Extent::Pixels(5);
    EXPECT_EQ(a.layout.get(), own);

    a.EnsureRare().StoreEvaluated(Declaration::Make<PropertyId::Width>(Extent::Pixels(1)));
    LayoutStyleRefs copy = a;
    EXPECT_FALSE(copy.rare);
    EXPECT_TRUE(copy.SameGroups(a));
}

TEST_F(ComputedStyleTest, DefaultsAreTheInitialValues) {
    for (size_t i = 0; i < kLonghandCount; ++i) {
        PropertyId id = static_cast<PropertyId>(i);
        Declaration initial = Declaration::Initial(id);
        EXPECT_TRUE(OperationsOf(id).equal(initial.value(), DefaultStyles().Field(id))) << PropertyName(id);
    }
    EXPECT_EQ(DefaultStyles().Get<PropertyId::MaskRepeat>(), BackgroundRepeatType::None());
    EXPECT_TRUE(kInheritedProperties.Contains(PropertyId::Cursor));
    EXPECT_FALSE(kInheritedProperties.Contains(PropertyId::TextOverflow));
}

TEST_F(ComputedStyleTest, DeclarationsOwnTheirValues) {
    for (const char* text : {"1px 2px red", "none"}) {
        Declaration shadow;
        ASSERT_TRUE(ParseLonghand(PropertyId::BoxShadow, text, shadow));
        Declaration copy = shadow, moved = std::move(shadow);
        EXPECT_TRUE(copy == moved);
        copy = Declaration::Make<PropertyId::Width>(Extent::Pixels(3));
        EXPECT_FALSE(copy == moved);
        moved = copy;
        EXPECT_EQ(moved.Get<PropertyId::Width>().value, 3);
    }
}

TEST_F(ComputedStyleTest, SetsKeepOrderAndSeeNoChange) {
    StringPool strings;
    StyleDeclarationSet set;
    EXPECT_TRUE(set.Set(Declaration::Make<PropertyId::Width>(Extent::Pixels(3))));
    EXPECT_TRUE(set.Set(Declaration::Make<PropertyId::Color>(Color::White(), kImportant)));
    EXPECT_FALSE(set.Set(Declaration::Make<PropertyId::Width>(Extent::Pixels(3))));
    EXPECT_TRUE(set.Set(Declaration::Make<PropertyId::Width>(Extent::Pixels(4))));
    set.SetCustomProperty(strings.Intern("a"), MakeCustomProperty("1px var(--b)", kHasVar, strings));
    EXPECT_EQ(set.ToText(),
              "width: 4px; color: rgba(255, 255, 255, 1.000000) !important; --a: 1px var(--b); ");
    ASSERT_EQ(set.ToNameValueList().size(), 2u);
    EXPECT_TRUE(set.ToNameValueList()[1].important);
    EXPECT_TRUE(set.Remove(PropertyId::Width));
    EXPECT_FALSE(set.Remove(PropertyId::Width));
}

TEST_F(ComputedStyleTest, MatchStatesTellWhatDiffers) {
    const Declaration width = Declaration::Make<PropertyId::Width>(Extent::Pixels(1));
    const Declaration color = Declaration::Inherit(PropertyId::Color);
    const Declaration other = Declaration::Make<PropertyId::Color>(Color::White());
    const Declaration delay = Declaration::Initial(PropertyId::TransitionDelay);
    const auto fill = [](MatchState& state, std::initializer_list<const Declaration*> declarations) {
        const Declaration* winners[kLonghandCount] = {};
        PropertySet set;
        for (const Declaration* declaration : declarations) {
            winners[IndexOf(declaration->property())] = declaration;
            set.Add(declaration->property());
        }
        state.Fill(set, {}, winners);
    };
    MatchState a, b, nothing;
    fill(a, {&width, &color, &delay});
    fill(b, {&width, &other});
    EXPECT_EQ(a.Find(PropertyId::Width), &width);
    EXPECT_EQ(a.Find(PropertyId::Color), &color);
    EXPECT_EQ(a.Find(PropertyId::TransitionDelay), &delay);
    EXPECT_EQ(a.Find(PropertyId::Height), nullptr);
    EXPECT_EQ(a.inheriting().Count(), 1);
    const PropertySet different = MatchState::Difference(a, b);
    EXPECT_EQ(different.Count(), 2);
    EXPECT_TRUE(different.Contains(PropertyId::Color) && different.Contains(PropertyId::TransitionDelay));
    EXPECT_EQ(MatchState::Difference(a, nothing), a.properties());
    EXPECT_TRUE(MatchState::Difference(a, a).Empty());
}

TEST_F(ComputedStyleTest, ExpressionsKeepTheirText) {
    StringPool strings;
    std::optional<CustomExpression> expression =
        PrepareCustomExpression("calc(var(--a) + var(--b, 1px)) x", strings);
    ASSERT_TRUE(expression);
    EXPECT_EQ(expression->text, "calc( + ) x");
    ASSERT_EQ(expression->references.size(), 2u);
    EXPECT_EQ(expression->references[1].name.view(), "b, 1px");
    CssString text;
    expression->AppendText(text);
    EXPECT_EQ(text, "calc(var(--a) + var(--b, 1px)) x");
    EXPECT_FALSE(PrepareCustomExpression("var()", strings));
    EXPECT_FALSE(PrepareCustomExpression("var(--a) var(--)", strings));
    EXPECT_FALSE(PrepareCustomExpression("var(--abc", strings));
    EXPECT_EQ(log_.Count("Expected a custom expression in declaration but declaration is too short!"), 1u);
    EXPECT_EQ(log_.Count("-- is an invalid custom expression!"), 2u);
}

}  // namespace
}  // namespace qorvex::css
