// Solving a change against solving the whole tree afresh: random changes, then both ways must tell the same
// styles.
#include <random>
#include <sstream>

#include "css/style/style_fixture.h"
#include "dom/character_data.h"

namespace qorvex::css::test {
namespace {

constexpr std::string_view kSheet = R"(
.a { color: red; width: 10px; --v: 4px }
.b { font-size: 1.5em; background-color: #00ff00; display: none }
.c { visibility: hidden; letter-spacing: 0.1em; line-height: 1.5; z-index: 3 }
.d { display: flex; margin-left: var(--v); text-transform: uppercase; font-weight: bolder }
.e { font-size: 2rem; width: inherit; transform: translateX(1em); opacity: 0.25 }
.a .b, .c > .d { padding-left: 3px } .a + .c { height: 7px } .b ~ .e { min-width: 9px; display: block }
.a.d { --v: calc(2px * 3) !important; white-space: pre } div.e { max-width: 20px }
[title] { top: 1px } [title="x"] .a { bottom: 2px } #one .c { left: 3px } [data-k] { right: 4px }
p { font-weight: lighter; overflow: hidden } span { text-shadow: 1px 1px 2px red; text-stroke-width: 0.1em }
.h:hover { color: blue } .h:hover .a { width: 44px } .h:active { height: 55px }
@media (min-width: 700px) { .m { width: 70px } } @media (max-width: 35em) { .m { height: 35px; font-size: 30px } }
)";
// Without combinators a change queues one element only: what reaches its descendants does so by inheritance.
constexpr std::string_view kQuickSheet = R"(
.a { color: red; width: 10px; --v: 4px } .b { font-size: 1.5em; background-color: #00ff00; visibility: hidden }
.c { width: inherit; letter-spacing: 0.1em; line-height: 1.5 } .d { margin-left: var(--v); font-weight: bolder }
.e { font-size: 2rem; background-color: inherit; height: calc(1em + 1px) } .h { display: none; --v: inherit }
.m { --v: calc(1em * 2); text-transform: uppercase; margin-left: inherit } .h:hover { opacity: 0.5 }
p { font-weight: lighter; white-space: pre } span { text-stroke-width: 0.1em; text-shadow: 1px 1px red }
)";
constexpr const char* kClasses[] = {"a", "b", "c", "d", "e", "h", "m"};
constexpr const char* kTags[] = {"div", "p", "span", "h1"};

// The first line in which two dumps differ, with the node it belongs to; empty when there is none.
std::string FirstDifference(const std::string& a, const std::string& b) {
    std::istringstream left(a), right(b);
    std::string node, x, y;
    for (int count = 0;; ++count) {
        const bool more = static_cast<bool>(std::getline(left, x));
        if (more != static_cast<bool>(std::getline(right, y))) return "another number of nodes";
        if (!more) return "";
        if (x.find(':') == std::string::npos) node = x;
        if (x != y) return node + ": " + x + " / " + y + " (line " + std::to_string(count) + ")";
    }
}

class Incremental : public StyleTest {
  protected:
    size_t Pick(size_t count) { return random_() % count; }

    dom::Element& AnyElement() {
        std::vector<dom::Element*> all;
        document_->ForEachElement([&](dom::Element& element) { all.push_back(&element); });
        return *all[Pick(all.size())];
    }

    dom::Element& AnyBelowBody() {
        for (;;) {
            dom::Element& element = AnyElement();
            if (&element != document_->GetHtmlElement() && &element != &Body() &&
                element.GetTag() != TagId::Head)
                return element;
        }
    }

    void Change() {
        switch (Pick(9)) {
            case 0:
                AnyBelowBody().AddClass(kClasses[Pick(std::size(kClasses))]);
                break;
            case 1:
                AnyBelowBody().RemoveClass(kClasses[Pick(std::size(kClasses))]);
                break;
            case 2:
                AnyBelowBody().SetAttribute("title", Pick(2) ? "x" : "y");
                break;
            case 3:
                AnyBelowBody().RemoveAttribute(Pick(2) ? "title" : "data-k");
                break;
            case 4: {
                const char* styles[] = {"",         "color: green",  "font-size: 3em; width: calc(1em + 1px)",
                                        "--v: 9px", "display: none", "display: block; color: inherit"};
                AnyElement().SetAttribute("style", styles[Pick(std::size(styles))]);
                break;
            }
            case 5: {
                dom::Element& parent = Pick(2) ? AnyBelowBody() : Body();
                const auto made = document_->CreateElement(kTags[Pick(4)]);
                made->AddClass(kClasses[Pick(std::size(kClasses))]);
                made->AppendChild(document_->CreateTextNode("text"));
                parent.InsertBefore(made, Pick(2) ? parent.GetFirstChild() : nullptr);
                break;
            }
            case 6: {
                dom::Element& gone = AnyBelowBody();
                if (document_->GetHtmlElement()->GetChildCount() < 2 || gone.GetParent() == &Body()) break;
                gone.GetParent()->RemoveChild(&gone);
                break;
            }
            case 7:
                SetHovered(Pick(2) ? &AnyBelowBody() : nullptr);
                break;
            case 8:
                AnyBelowBody().SetAttribute("data-k", "1");
                break;
        }
    }

    void SetHovered(dom::Element* element) {
        const qsl::RefPtr<dom::Element> old = hoveredRef_;
        hoveredRef_ = qsl::RefPtr<dom::Element>(element);
        host_->hovered = element;
        if (old) old->OnHoverChanged();
        if (element) element->OnHoverChanged();
    }

    std::mt19937 random_{20240817};
    qsl::RefPtr<dom::Element> hoveredRef_;
};

TEST_F(Incremental, EndsWhereAFullSolveEnds) {
    std::string body;
    for (int i = 0; i < 8; ++i)
        body +=
            "<div class='a h'><p class='c'>x<span class='d'>y</span></p><div class='b "
            "m'><span>z</span></div></div>";
    for (const std::string_view sheet : {kSheet, kQuickSheet}) {
        hoveredRef_ = nullptr;
        Load(body, sheet);
        Solve();
        for (int round = 0; round < 120; ++round) {
            for (size_t i = 0, count = 1 + Pick(3); i < count; ++i)
                Change();
            Solve();
            const std::string incremental = DumpAll();
            document_->RequestFullStyleSolve();
            Solve();
            ASSERT_EQ(FirstDifference(incremental, DumpAll()), "") << "round " << round;
        }
        SetHovered(nullptr);
    }
}

// The same page built at once must look like the one that came about by changes, whose groups have another
// history.
TEST_F(Incremental, HistoryLeavesNoTrace) {
    Load("<div id='one' class='a'><p class='c' id='p'>x</p></div>", kSheet);
    Solve();
    Find("one").SetAttribute("class", "b e");
    Find("p").SetAttribute("style", "color: red");
    Solve();
    Find("one").SetAttribute("class", "a d");
    Find("p").RemoveAttribute("style");
    Solve();
    const std::string changed = DumpAll();
    Load("<div id='one' class='a d'><p class='c' id='p'>x</p></div>", kSheet);
    Solve();
    EXPECT_EQ(FirstDifference(changed, DumpAll()), "");
}

TEST_F(Incremental, HoverMatchesAgainWhoDependsOnIt) {
    Load("<div id='h' class='h'><p id='a' class='a'></p></div><p id='q'></p>", kSheet);
    EXPECT_EQ(Computed("a", "width"), "10px");
    const StyleCounters idle = Counted([&] {
        SetHovered(&Find("q"));
        Solve();
    });
    EXPECT_EQ(idle.elementsMatched, 0u);
    SetHovered(&Find("a"));
    EXPECT_EQ(Computed("a", "width"), "44px");
    host_->active = &Find("a");
    Find("a").OnActiveChanged();
    EXPECT_EQ(Computed("h", "height"), "55px");
    host_->active = nullptr;
    SetHovered(nullptr);
    EXPECT_EQ(Computed("a", "width"), "10px");
}

TEST_F(Incremental, DeclarationsOfARemovedSheetAreForgotten) {
    Load("<p id='p' class='x'></p><style id='s'></style>");
    AddSheet(".x { width: 5px } p.x { height: 6px }", &Find("s"));
    EXPECT_EQ(Computed("p", "width"), "5px");
    engine_->RemoveStyleSheet(*document_, &Find("s"));
    EXPECT_EQ(Computed("p", "width"), "auto");
    EXPECT_EQ(Computed("p", "height"), "auto");
    EXPECT_EQ(engine_->GetAuthorRules().GetSearchableRuleCount(), 0u);
}

}  // namespace
}  // namespace qorvex::css::test
