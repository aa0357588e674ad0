// What a solve costs, by counting the work and the memory; nothing here is timed.
#include <set>

#include "css/style/style_fixture.h"
#include "dom/character_data.h"
#include "layout/layout_handle.h"
#include "support/repeat.h"

namespace qorvex::css::test {
namespace {

using qorvex::test::Repeat;

class WorkCount : public StyleTest {};

std::string Rows(int count) {
    return Repeat("<div class='row'><span class='cell'>text</span></div>", size_t(count));
}
constexpr std::string_view kSheet =
    ".row { width: 50px; background-color: red } .cell { padding-left: 2px; color: blue } .on { width: 60px }"
    ".big { font-size: 20px }";

TEST_F(WorkCount, EqualElementsShareTheirGroups) {
    Load(Rows(500), kSheet);
    const StyleCounters first = Counted([&] { Solve(); });
    EXPECT_GE(first.stylesShared, 990u);
    std::set<const void*> layouts, visuals, texts, textNodeVisuals;
    for (dom::Node* node = &Body(); node; node = node->GetNextInTree(&Body())) {
        const LaidOutStyle& style = node->GetLaidOutStyle();
        layouts.insert(style.layout.get());
        texts.insert(style.text.get());
        (node->IsText() ? textNodeVisuals : visuals).insert(style.visual.get());
    }
    EXPECT_LE(layouts.size(), 4u);  // body, row, cell, text
    EXPECT_LE(visuals.size(), 2u);
    EXPECT_LE(texts.size(), 2u);
    EXPECT_EQ(textNodeVisuals.size(), 1u);
}

TEST_F(WorkCount, OneChangeCostsTheSameInALargePage) {
    StyleCounters work[2];
    for (const int rows : {50, 2000}) {
        Load(Rows(rows), kSheet);
        Solve();
        auto& row = static_cast<dom::Element&>(*Body().GetFirstChild());
        work[rows > 50] = Counted([&] {
            row.AddClass("on");
            Solve();
        });
        EXPECT_EQ(Computed(row, "width"), "60px");
    }
    EXPECT_EQ(work[1].elementsMatched, 1u);
    EXPECT_EQ(work[0].elementsMatched, work[1].elementsMatched);
    EXPECT_EQ(work[0].propertiesApplied, work[1].propertiesApplied);
    EXPECT_EQ(work[1].propertiesChanged, 1u);
}

TEST_F(WorkCount, AnEqualValueCopiesNoGroup) {
    Load("<p id='a' class='cell'></p><p id='b' class='cell'></p>", kSheet);
    Solve();
    const void* group = Find("a").GetStyle().text.get();
    const StyleCounters work = Counted([&] {
        Find("a").SetAttribute("style", "color: blue");
        Solve();
    });
    EXPECT_EQ(work.propertiesChanged, 0u);
    EXPECT_EQ(Find("a").GetStyle().text.get(), group);
    EXPECT_EQ(Find("b").GetStyle().text.get(), group);
}

TEST_F(WorkCount, AnInheritedChangeChangesOnlyWhoHasNoValueOfItsOwn) {
    Load("<div id='top'>" + Rows(300) + "</div>", kSheet);
    Solve();
    const StyleCounters work = Counted([&] {
        Find("top").SetAttribute("style", "color: green");
        Solve();
    });
    EXPECT_EQ(work.elementsMatched, 1u);
    EXPECT_LE(work.propertiesApplied, 601u + 20u);
    EXPECT_EQ(work.propertiesChanged, 301u);  // the top and its rows; the cells have their own colour
}

// What nobody inherits costs the element alone, however much stands below it.
TEST_F(WorkCount, AChangeIsFollowedNoFurtherThanItReaches) {
    Load("<div id='top'>" + Rows(300) + "</div>", kSheet);
    Solve();
    StyleCounters work = Counted([&] {
        Find("top").SetAttribute("style", "background-color: green; width: 70px");
        Solve();
    });
    EXPECT_EQ(work.elementsSolved, 1u);
    EXPECT_EQ(work.textNodesSolved, 0u);
    // The same again: matched, and found to be equal.
    work = Counted([&] {
        Find("top").SetAttribute("style", "background-color: green; width: 70px");
        Solve();
    });
    EXPECT_EQ(work.propertiesChanged, 0u);
    EXPECT_EQ(work.elementsSolved, 1u);
}

TEST_F(WorkCount, OnlyWhatIsWonByAnotherDeclarationIsLookedAt) {
    Load("<p id='p' class='row cell'></p>", kSheet);
    Solve();
    const StyleCounters work = Counted([&] {
        Find("p").AddClass("on");
        Solve();
    });
    EXPECT_EQ(work.propertiesApplied, 1u);  // width; the other four have the winners that they had
}

TEST_F(WorkCount, HoverDeepInAPageAllocatesNothing) {
    Load(Repeat("<div class='row'>", 30) + "<p id='p'></p>",
         ".row:hover { width: 60px } .row .row:hover { height: 3px }");
    Solve();
    const auto hover = [&](dom::Element* element) {
        dom::Element& deepest = Find("p");
        host_->hovered = element;
        deepest.OnHoverChanged();
        Solve();
        document_->GetStyleRunLists().Clear();
    };
    for (int i = 0; i < 8; ++i)
        hover(i % 2 ? &Find("p") : nullptr);
    const uint64_t before = allocator_.Allocations();
    for (int i = 0; i < 8; ++i)
        hover(i % 2 ? &Find("p") : nullptr);
    EXPECT_EQ(allocator_.Allocations(), before);
}

// New nodes are dirty in no order; each still finds its place in the layout beside the one before it.
TEST_F(WorkCount, ManyNewSiblingsFindTheirPlacesAtOnce) {
    constexpr size_t kCount = 1000;
    Load("<p id='first'></p><p id='last'></p>");
    Solve();
    document_->UpdateLayoutStyles(false);
    for (const char* reference : {"first", "last", "none"}) {
        for (size_t i = 0; i < kCount; ++i)
            Body().InsertBefore(document_->CreateElement("i"), document_->GetElementById(reference));
        document_->work = {};
        Solve();
        EXPECT_LE(document_->work.siblingsSearched, 4 * kCount);
        const auto& handles = Body().GetLayoutHandle()->data().Children();
        const auto children = Body().GetChildren();
        ASSERT_EQ(handles.size(), children.size());
        for (uint32_t i = 0; i < handles.size(); ++i)
            ASSERT_EQ(handles[i].get(), children[i]->GetLayoutHandle()) << i;
        document_->UpdateLayoutStyles(false);
    }
}

TEST_F(WorkCount, EachNewFirstChildFindsItsPlaceAtOnce) {
    constexpr size_t kCount = 300;
    Load("<p class='off'></p><p></p>", ".off { display: none }");
    Solve();
    document_->UpdateLayoutStyles(false);
    document_->work = {};
    for (size_t i = 0; i < kCount; ++i) {
        Body().InsertBefore(document_->CreateElement("i"), Body().GetFirstChild());
        Solve();
        document_->UpdateLayoutStyles(false);
    }
    EXPECT_LE(document_->work.siblingsSearched, 4 * kCount);
    const layout::HandleSpan handles = Body().GetLayoutHandle()->data().Children();
    const auto children = Body().GetChildren();
    ASSERT_EQ(handles.size(), kCount + 1);
    for (uint32_t i = 0; i < kCount; ++i)
        ASSERT_EQ(handles[i].get(), children[i]->GetLayoutHandle()) << i;
    EXPECT_EQ(handles.back().get(), children.back()->GetLayoutHandle());
}

// In whatever order a script comes to them.
TEST_F(WorkCount, DirtyingManySiblingsVisitsEachOnce) {
    constexpr int kRows = 1000;
    for (const int step : {1, -1, 7}) {
        Load(Rows(kRows), ".row + .row { height: 1px } .on ~ .row .cell { width: 3px }");
        Solve();
        const std::string before = DumpAll();
        const auto rows = Body().GetChildren();
        document_->work = {};
        for (int i = 0; i < kRows; ++i) {
            const int at = step > 0 ? i * step % kRows : kRows - 1 - i;
            static_cast<dom::Element&>(*rows[at]).SetAttribute("class", i % 3 ? "row" : "row on");
        }
        EXPECT_LE(document_->work.dependentsVisited, 4u * kRows) << step;
        Solve();
        const std::string after = DumpAll();
        EXPECT_FALSE(before == after);
        document_->RequestFullStyleSolve();
        Solve();
        EXPECT_TRUE(DumpAll() == after) << step;
    }
}

TEST_F(WorkCount, AColourChangeDoesNotLayOutText) {
    Load("<div id='top'>text</div>", kSheet);
    Solve();
    document_->UpdateLayoutStyles(false);
    Solve();
    document_->UpdateLayoutStyles(false);
    Find("top").SetAttribute("style", "color: green");
    Solve();
    EXPECT_EQ(document_->UpdateLayoutStyles(false), layout::LayoutWork::VisualStyle);
    Find("top").SetAttribute("style", "color: green; letter-spacing: 2px");
    Solve();
    EXPECT_EQ(document_->UpdateLayoutStyles(false), layout::LayoutWork::Layout);
    Find("top").SetAttribute("style", "color: green; letter-spacing: 2px; transform: translateX(1px)");
    Solve();
    EXPECT_EQ(document_->UpdateLayoutStyles(false), layout::LayoutWork::Transforms);
}

TEST_F(WorkCount, ASteadyPageAllocatesNothing) {
    Load(Rows(200), kSheet);
    Solve();
    const Atom on = host_->strings.Intern("on");
    auto& row = static_cast<dom::Element&>(*Body().GetFirstChild());
    const auto toggle = [&] {
        if (row.HasClass(on)) {
            row.RemoveClass("on");
        } else {
            row.AddClass("on");
        }
        Solve();
        document_->GetStyleRunLists().Clear();
    };
    for (int i = 0; i < 8; ++i)
        toggle();
    const uint64_t before = allocator_.Allocations();
    for (int i = 0; i < 8; ++i)
        toggle();
    EXPECT_EQ(allocator_.Allocations(), before);

    document_->RequestFullStyleSolve();
    Solve();
    const uint64_t beforeFull = allocator_.Allocations();
    document_->RequestFullStyleSolve();
    Solve();
    EXPECT_EQ(allocator_.Allocations(), beforeFull);
}

TEST_F(WorkCount, QuickRefusalTriesNoRuleOfOtherIdsAndTags) {
    std::string sheet;
    for (int i = 0; i < 200; ++i)
        sheet += "#n" + std::to_string(i) + ":hover { width: 1px } ";
    Load("<p id='n7'></p>", sheet);
    host_->hovered = &Find("n7");
    EXPECT_EQ(Computed("n7", "width"), "1px");
    const RuleIndex& rules = engine_->GetAuthorRules();
    EXPECT_EQ(rules.GetComplexRuleCount(), 200u);
    EXPECT_EQ(rules.FindById(Find("n7").GetId())->complex.size(), 1u);
    EXPECT_TRUE(rules.GetUnkeyed().complex.empty());
}

}  // namespace
}  // namespace qorvex::css::test
