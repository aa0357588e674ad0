// What the index finds against a walk over all of its rules, while rules come, go and change their place.
#include <random>

#include "css/style/style_fixture.h"

namespace qorvex::css::test {
namespace {

constexpr const char* kCompounds[] = {
    "div",      "p",        "*",          ".a",          ".b",       ".c",         "#x",
    "#y",       "my-tag",   "other-tag",  "p.a",         ".a.b",     "#x.a",       ".a#y",
    "*.c",      "div#x",    "[title]",    ".a[title]",   "[data-k]", "p[title=t]", ":hover",
    ".a:hover", "my-tag.a", "div:active", "::selection", ":root"};
constexpr const char* kJoints[] = {" ", " > ", " + ", " ~ "};

class RuleIndexTest : public StyleTest {
  protected:
    size_t Pick(size_t count) { return random_() % count; }

    std::string AnySheet(int rules) {
        std::string sheet;
        for (int i = 0; i < rules; ++i) {
            // The view is 800 pixels wide. What is out of force says top, so that the walk knows it.
            const size_t media = Pick(8);
            if (media < 2)
                sheet += media == 0 ? "@media (min-width: 700px) { " : "@media (min-width: 900px) { ";
            for (size_t part = Pick(3); part > 0; --part)
                sheet +=
                    std::string(kCompounds[Pick(std::size(kCompounds))]) + kJoints[Pick(std::size(kJoints))];
            sheet += std::string(kCompounds[Pick(std::size(kCompounds))]) +
                     (media == 1 ? " { top: " : " { left: ") + std::to_string(i) + "px }" +
                     (media < 2 ? " }\n" : "\n");
        }
        return sheet;
    }

    static bool IsInForce(const IndexedRule& rule) {
        return rule.declarations().front().property() != PropertyId::Top;
    }

    CssVector<uint64_t> FoundByWalk(dom::Element& element, MatchContext& context) {
        RuleIndex& index = engine_->GetAuthorRules();
        CssVector<uint64_t> found;
        for (const uint64_t id : index.GetAllRuleIds()) {
            const IndexedRule& rule = *index.FindRule(id);
            if (IsInForce(rule) && MatchSelector(rule.selector, element, context, false)) found.push_back(id);
        }
        return found;
    }

    std::mt19937 random_{7};
};

TEST_F(RuleIndexTest, FindsWhatAWalkOverAllRulesFinds) {
    size_t matches = 0;
    for (int round = 0; round < 12; ++round) {
        Load(
            "<div class=a id=x><p class='a b' title=t></p><my-tag class=a></my-tag><p id=y class='a "
            "a'><other-tag>"
            "</other-tag></p><div class='c b a' data-k=1><my-tag id=x></my-tag><span></span></div></div>",
            AnySheet(60));
        RuleIndex& index = engine_->GetAuthorRules();
        for (int change = 0; change < 6; ++change) {
            const CssVector<uint64_t> ids = index.GetAllRuleIds();
            const uint64_t some = ids[static_cast<uint32_t>(Pick(ids.size()))];
            if (change % 3 == 1) {
                EXPECT_TRUE(index.RemoveRule(some));
            }
            if (change % 3 == 2) {
                const uint64_t other = ids[static_cast<uint32_t>(Pick(ids.size()))];
                const IndexedRule* rule = index.FindRule(other);
                if (rule && IsInForce(*rule)) index.InsertRule(Ruleset(*rule), some);
            }
            host_->hovered = Pick(2) ? &Find("y") : nullptr;
            const PseudoState pseudo(*document_);
            MatchContext context(pseudo);
            document_->ForEachElement([&](dom::Element& element) {
                const CssVector<uint64_t> wanted = FoundByWalk(element, context);
                EXPECT_TRUE(engine_->GetMatcher().GetMatchedRuleIds(index, element, context) == wanted);
                matches += wanted.size();
            });
        }
        document_->RequestFullStyleSolve();  // elements point at declarations of removed rules
    }
    EXPECT_GT(matches, 1000u);
}

// A turned screen: however many groups end at once, the index is gone through once.
TEST_F(RuleIndexTest, MediaGroupsThatEndTogetherTakeOnePass) {
    std::string sheet = ".a { height: 1px }";
    for (int i = 0; i < 100; ++i)
        sheet += "@media (orientation: landscape) { .a { left: " + std::to_string(i) +
                 "px } p > .a { top: 2px } }";
    Load("<p><i id='x' class='a'></i></p>", sheet);
    RuleIndex& index = engine_->GetAuthorRules();
    EXPECT_EQ(Computed("x", "left"), "99px");
    const uint64_t generation = index.GetGeneration();
    document_->SetViewSize(600, 800);
    EXPECT_EQ(Computed("x", "left"), "auto");
    EXPECT_EQ(Computed("x", "top"), "auto");
    EXPECT_EQ(index.GetGeneration(), generation + 1);
    EXPECT_EQ(index.GetSearchableRuleCount(), 1u);
    document_->SetViewSize(800, 600);
    EXPECT_EQ(Computed("x", "left"), "99px");
    EXPECT_EQ(index.GetSearchableRuleCount(), 201u);
}

}  // namespace
}  // namespace qorvex::css::test
