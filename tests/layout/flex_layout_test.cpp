#include "layout/page_fixture.h"

namespace qorvex::test {
namespace {

using layout::LayoutHandle;

using FlexLayoutTest = LayoutTest;

TEST_F(FlexLayoutTest, BlocksStackAndStretch) {
    Page page;
    LayoutHandle* a = page.Add(page.body, "height: 20px; margin: 5px; padding: 1px; border: 2px solid red");
    LayoutHandle* b = page.Add(page.body, "height: 1in");
    page.Frame();
    EXPECT_EQ(BoxOf(page.root), "0 0 1000 500");
    EXPECT_EQ(BoxOf(a), "5 5 990 20");
    EXPECT_EQ(BoxOf(b), "0 30 1000 96");
    EXPECT_EQ(a->data().result.edges.border().left, 2);
    EXPECT_EQ(a->data().result.edges.padding().top, 1);
}

TEST_F(FlexLayoutTest, FlexGrowsShrinksAndResets) {
    Page page;
    LayoutHandle* row = page.Add(page.body, "display: flex; width: 300px");
    LayoutHandle* grows = page.Add(row, "flex: 1; height: 10px");
    LayoutHandle* content = page.Add(grows, "width: 80px; height: 4px");
    LayoutHandle* two = page.Add(row, "flex: 2; height: 10px");
    LayoutHandle* rigid = page.Add(row, "width: 60px; height: 10px");
    page.Frame();
    EXPECT_EQ(BoxOf(grows), "0 0 80 10");
    EXPECT_EQ(BoxOf(two), "80 0 160 10");
    EXPECT_EQ(BoxOf(rigid), "240 0 60 10");
    EXPECT_EQ(BoxOf(content), "0 0 80 4");

    // Without `flex` nothing shrinks.
    page.Change(rigid, "width: 400px");
    page.Frame();
    EXPECT_EQ(rigid->data().result.width, 400);
    // A basis alone grows and shrinks.
    page.Change(rigid, "flex: 100px; width: auto");
    page.Change(two, "flex: none; width: 50px");
    page.Change(grows, "flex: 0");
    page.Frame();
    EXPECT_EQ(rigid->data().result.width, 250);
}

TEST_F(FlexLayoutTest, ContainerPropertiesFollowDisplay) {
    struct Case {
        const char* style;
        const char* box;
    };
    const Case cases[] = {
        {"display: flex; justify-content: flex-end; align-items: center", "80 40 20 20"},
        {"display: flex; justify-content: space-between", "0 0 20 20"},
        {"display: flex; flex-direction: column-reverse", "0 80 20 20"},
        {"display: flex; flex-direction: row-reverse", "80 0 20 20"},
        {"display: inline; text-align: right", "80 0 20 20"},
        {"display: inline; text-align: center", "40 0 20 20"},
        {"display: block; text-align: center", "40 0 20 20"},
        {"display: block; text-align: right", "80 0 20 20"},
        {"display: block; justify-content: flex-end", "0 0 20 20"},
    };
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 100px; height: 100px");
    LayoutHandle* child = page.Add(box, "width: 20px; height: 20px");
    for (const Case& c : cases) {
        page.Change(box,
                    "display: block; justify-content: flex-start; align-items: stretch; flex-direction: row; "
                    "text-align: left");
        page.Change(box, c.style);
        page.Frame();
        EXPECT_EQ(BoxOf(child), c.box) << c.style;
    }
}

TEST_F(FlexLayoutTest, AutoMarginsAreZeroAndPercentagesResolve) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 50%; height: 100px; margin: auto; padding: 10%");
    LayoutHandle* inner = page.Add(box, "width: 25%; height: 50%; min-width: 120px");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "0 0 500 200");
    EXPECT_EQ(inner->data().result.width, 120);
    page.Change(page.root, "font-size: 10px");
    page.Change(inner, "width: 20vw; height: 2rem; font-size: 30px; margin-left: 1em");
    page.Frame();
    EXPECT_EQ(BoxOf(inner), "130 100 200 20");
}

TEST_F(FlexLayoutTest, AbsoluteBoxesUseTheNearestPositionedAncestor) {
    Page page;
    LayoutHandle* outer = page.Add(page.body,
                                   "position: relative; margin: 20px; width: 400px; height: 200px; "
                                   "border: 10px solid red; padding: 30px");
    LayoutHandle* still = page.Add(outer, "margin: 7px; padding: 5px; width: 100px; height: 50px");
    LayoutHandle* deeper = page.Add(still, "padding: 3px; display: flex");
    LayoutHandle* box = page.Add(deeper, "position: absolute; width: 40px; height: 20px");
    struct Case {
        const char* style;
        const char* box;
    };
    // The padding box of the ancestor is 380x180 at 30, 30.
    const Case cases[] = {
        {"left: 5px; top: 6px", "35 36 40 20"},
        {"right: 5px; bottom: 6px; left: auto; top: auto", "365 184 40 20"},
        {"left: 50%; top: 10%", "220 48 40 20"},
        {"left: 10%; width: 50%; height: 50%; top: 0", "68 30 190 90"},
        {"left: 10px; right: 10px; top: 20px; bottom: 20px; width: auto; height: auto", "40 50 360 140"},
    };
    for (const Case& c : cases) {
        page.Change(box, "left: auto; right: auto; top: auto; bottom: auto; width: 40px; height: 20px");
        page.Change(box, c.style);
        page.Frame();
        EXPECT_EQ(BoxOf(box), c.box) << c.style;
    }
    // An unpositioned ancestor that moves carries nothing; the positioned one does.
    page.Change(box, "left: 5px; top: 6px; right: auto; bottom: auto; width: 40px; height: 20px");
    page.Change(still, "margin: 50px");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "35 36 40 20");
    page.Change(outer, "margin: 0");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "15 16 40 20");
    // Without a positioned ancestor, the root.
    page.Change(outer, "position: static");
    page.Change(box, "left: auto; right: 0");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "960 6 40 20");
}

TEST_F(FlexLayoutTest, OnlyTheContainingBlockChangesAndItsBoxStillFollows) {
    Page page;
    LayoutHandle* outer = page.Add(page.body, "position: relative; width: 400px; height: 200px");
    LayoutHandle* still = page.Add(outer, "width: 100px; height: 50px");
    LayoutHandle* box = page.Add(still, "position: absolute; right: 0; bottom: 0; width: 10px; height: 10px");
    page.Settle();
    EXPECT_EQ(BoxOf(box), "390 190 10 10");
    page.Change(outer, "width: 300px; height: 100px");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "290 90 10 10");
}

TEST_F(FlexLayoutTest, FixedBoxesUseTheView) {
    Page page;
    LayoutHandle* outer = page.Add(page.body,
                                   "position: relative; margin: 50px; width: 100px; height: 100px; "
                                   "border: 4px solid red");
    LayoutHandle* fixed = page.Add(outer, "position: fixed; left: 50%; top: 10px; width: 30px; height: 10%");
    page.Frame();
    EXPECT_EQ(BoxOf(fixed), "500 10 30 50");
    EXPECT_EQ(log_.Count("Using % values with position:fixed is not supported. Percents will be calculated "
                         "against viewport."),
              1u);
    page.Change(fixed, "left: auto; right: 20px; top: auto; bottom: 5px");
    page.Frame();
    EXPECT_EQ(BoxOf(fixed), "950 445 30 50");
    // A transformed ancestor is the containing block.
    page.Change(outer, "transform: translateX(1px)");
    page.Frame();
    EXPECT_EQ(BoxOf(fixed), "96 91 30 50");
    page.Change(outer, "margin: 60px");
    page.Frame();
    EXPECT_EQ(BoxOf(fixed), "106 101 30 50");
}

TEST_F(FlexLayoutTest, MeasuredLeavesWrapAndAreAskedOnlyOnChange) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 100px");
    RefPtr<FakeText> text = MakeRef<FakeText>(250.0f, 10.0f);
    LayoutHandle* leaf = page.AddText(box, text);
    LayoutHandle* other = page.Add(page.body, "height: 5px");
    page.Frame();
    EXPECT_EQ(BoxOf(leaf), "0 0 100 30");
    EXPECT_EQ(BoxOf(other), "0 30 1000 5");
    const int asked = text->measures;
    page.Change(other, "height: 6px");
    page.Frame();
    EXPECT_EQ(text->measures, asked);
    text->SetWidth(50);
    page.tree.MarkChanged(*leaf);
    page.Frame();
    EXPECT_GT(text->measures, asked);
    EXPECT_EQ(BoxOf(other), "0 10 1000 6");
}

TEST_F(FlexLayoutTest, CostFollowsTheChange) {
    Page page;
    std::vector<LayoutHandle*> cells;
    for (int i = 0; i < 20; ++i) {
        LayoutHandle* row = page.Add(page.body, "display: flex; height: 20px");
        for (int k = 0; k < 20; ++k)
            cells.push_back(page.Add(page.Add(row, "width: 20px; height: 20px"), "width: 5px; height: 5px"));
    }
    page.Settle();
    page.Change(cells[137], "width: 7px");
    page.Frame();
    EXPECT_EQ(page.Counters().synced, 1u);
    // The changed box, its ancestors and what these had to place again.
    EXPECT_LE(page.Counters().laidOut, 60u);
    EXPECT_LE(page.Counters().transformed, 5u);
    page.Frame();
    EXPECT_LE(page.Counters().laidOut, 1u);
    EXPECT_EQ(page.Counters().transformed, 0u);
}

TEST_F(FlexLayoutTest, ResizingWritesEveryStyleAnew) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 10vw; height: 10vh");
    LayoutHandle* fixed = page.Add(box, "position: fixed; right: 0; top: 0; width: 10px; height: 10px");
    page.Settle();
    page.viewWidth = 600;
    page.viewHeight = 200;
    page.Frame();
    EXPECT_EQ(BoxOf(box), "0 0 60 20");
    EXPECT_EQ(BoxOf(fixed), "590 0 10 10");
}

TEST_F(FlexLayoutTest, InternalAlgorithmMovesNoBox) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 10px; height: 10px");
    page.Settle();
    page.algorithm = layout::FlexAlgorithm::Internal;
    page.Change(box, "width: 50px");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "0 0 10 10");
    page.algorithm = layout::FlexAlgorithm::Yoga;
    page.tree.MarkChanged(*page.root);
    page.Frame();
    EXPECT_EQ(BoxOf(box), "0 0 50 10");
}

TEST_F(FlexLayoutTest, TinyDifferencesAreNoChange) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 10px; height: 10px");
    page.Settle();
    page.Change(box, "width: 10.0005px");
    page.Frame();
    EXPECT_FALSE(box->node().boxMetricsChanged);
    EXPECT_FALSE(box->node().rectChanged);
}

TEST_F(FlexLayoutTest, HostileNumbersStayFinite) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "display: flex; width: 1000000000px; padding: 3000000000%");
    LayoutHandle* child =
        page.Add(box, "width: -50px; height: 100000%; margin: -1000000000px; flex: 99999999999");
    page.Frame();
    for (const LayoutHandle* handle : {box, child}) {
        EXPECT_TRUE(layout::IsFinite(handle->node().box));
        EXPECT_TRUE(layout::IsFinite(handle->node().visualAabb));
    }
}

}  // namespace
}  // namespace qorvex::test
