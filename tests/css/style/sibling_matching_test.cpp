// Combinators that look at siblings: the memo of a pass against walks without one, and how the work grows.
#include <algorithm>
#include <random>
#include <vector>

#include "css/style/style_fixture.h"

namespace qorvex::css::test {
namespace {

class SiblingMatching : public StyleTest {
  protected:
    size_t Pick(size_t count) { return random_() % count; }

    // Siblings of a few kinds with text and comments between them; some have children of their own.
    std::string Siblings(size_t count, int levels) {
        static constexpr const char* kOpen[] = {
            "<p>", "<p class=a>", "<i class=b>", "<p class='a b'>", "<b class=c>", "<div class=a>", "<div>"};
        static constexpr const char* kBetween[] = {"", "", "text", "<!-- c -->", "<!----><!---->"};
        std::string body;
        for (size_t i = 0; i < count; ++i) {
            const std::string open = kOpen[Pick(std::size(kOpen))];
            const std::string tag = open.substr(1, open.find_first_of(" >") - 1);
            body += open;
            if (levels > 0 && tag == "div") body += Siblings(40, levels - 1);
            body += "</" + tag + ">" + kBetween[Pick(std::size(kBetween))];
        }
        return body;
    }

    std::string AnySheet(int rules) {
        static constexpr const char* kCompounds[] = {"p",   ".a", ".b",   ".c",    "i",
                                                     "div", "*",  ".a.b", ".none", "#here"};
        static constexpr const char* kJoints[] = {" ", " > ", " + ", " ~ ", " ~ ", " ~ "};
        std::string sheet;
        for (int i = 0; i < rules; ++i) {
            for (size_t part = 1 + Pick(4); part > 0; --part) {
                sheet += kCompounds[Pick(std::size(kCompounds))];
                if (Pick(8) == 0) sheet += Pick(2) ? ":hover" : ":focus";
                sheet += kJoints[Pick(std::size(kJoints))];
            }
            sheet += std::string(kCompounds[Pick(6)]) + " { left: 1px }\n";
        }
        return sheet;
    }

    std::vector<dom::Element*> Elements() {
        std::vector<dom::Element*> elements;
        document_->ForEachElement([&](dom::Element& element) { elements.push_back(&element); });
        return elements;
    }

    // Who matches which rule, and who was marked as depending on a pseudo class by that.
    std::vector<uint32_t> Outcome(const std::vector<dom::Element*>& order, SiblingMemo* memo) {
        for (dom::Element* element : order)
            element->pendingStyleBits = 0;
        const PseudoState pseudo(*document_);
        MatchContext context(pseudo, memo);
        const RuleIndex& rules = engine_->GetAuthorRules();
        std::vector<uint32_t> outcome;
        for (dom::Element* element : order) {
            for (uint32_t i = 0; i < rules.GetComplexRuleCount(); ++i)
                outcome.push_back(MatchSelector(rules.ComplexRule(i).selector, *element, context, true));
        }
        for (dom::Element* element : order)
            outcome.push_back(element->pendingStyleBits);
        return outcome;
    }

    uint64_t Steps(const std::function<void()>& action) {
        const SiblingMemo& memo = engine_->GetMatcher().GetSiblingMemo();
        const uint64_t before = memo.GetSteps();
        action();
        return memo.GetSteps() - before;
    }

    std::mt19937 random_{11};
};

TEST_F(SiblingMatching, TheMemoFindsWhatPlainWalksFind) {
    size_t matches = 0;
    for (int round = 0; round < 6; ++round) {
        Load("<p id=here class=a></p>" + Siblings(90, 1), AnySheet(40));
        std::vector<dom::Element*> order = Elements();
        host_->hovered = order[Pick(order.size())];
        SiblingMemo memo;  // of all orders: what a pass noted must not reach into the next one
        const auto compare = [&](const char* name) {
            SCOPED_TRACE(name);
            const std::vector<uint32_t> wanted = Outcome(order, nullptr);
            EXPECT_TRUE(Outcome(order, &memo) == wanted);
            matches += static_cast<size_t>(std::count(wanted.begin(), wanted.end(), 1u));
        };
        compare("document order");
        std::stable_sort(order.begin(), order.end(),
                         [](auto* a, auto* b) { return a->GetDepth() < b->GetDepth(); });
        compare("level order");
        std::reverse(order.begin(), order.end());
        compare("backwards");
        std::shuffle(order.begin(), order.end(), random_);
        compare("no order");
        document_->RequestFullStyleSolve();
    }
    EXPECT_GT(matches, 1000u);
}

TEST_F(SiblingMatching, TheWorkGrowsWithTheSiblings) {
    const auto work = [&](size_t siblings) {
        // Five comments before each: neither search may start over for what is no element.
        std::string body = "<section id=top><u></u>";
        for (size_t i = 0; i < siblings; ++i)
            body += i % 5 == 4 ? "<!----><!----><!----><!----><!----><div><div><p></p></div><p></p></div>"
                               : "<!----><!----><!----><!----><!----><p></p>";
        Load(body + "</section>",
             ".none ~ p { left: 1px } u ~ p { left: 2px } .none + p { left: 3px } u ~ div ~ p ~ p { left: "
             "4px }"
             ".none + div ~ p { left: 5px } u ~ div p { left: 6px } .none ~ div p { left: 7px }"
             "u ~ .none ~ p:hover ~ p { left: 8px }");
        std::vector<uint64_t> steps;
        steps.push_back(Steps([&] { Solve(); }));
        EXPECT_EQ(Computed(*document_->QuerySelector("#top > p"), "left"), "2px");
        document_->GetStyleRunLists().Clear();
        // Everybody again, as a change reaches them.
        steps.push_back(Steps([&] {
            Find("top").AddClass("x");
            Solve();
        }));
        return steps;
    };
    const std::vector<uint64_t> few = work(400), many = work(3200);
    for (size_t i = 0; i < few.size(); ++i) {
        EXPECT_GT(few[i], 400u);
        EXPECT_LT(many[i], few[i] * 9) << i;
        EXPECT_LT(many[i], 3200u * 6 * 16) << i;
    }
}

}  // namespace
}  // namespace qorvex::css::test
