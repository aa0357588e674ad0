#include "layout/page_fixture.h"

#include <random>

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
    EXPECT_EQ(a->data().AsBox().result.edges.border().left, 2);
    EXPECT_EQ(a->data().AsBox().result.edges.padding().top, 1);
}

TEST_F(FlexLayoutTest, ContainerPropertiesFollowDisplay) {
    struct Case {
        const char* style;
        const char* box;
    };
    const Case cases[] = {
        {"display: flex; justify-content: flex-end; align-items: center", "80 40 20 20"},
        {"display: flex; flex-direction: column-reverse", "0 80 20 20"},
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

// A style that another node of the pass has too is copied from there; one of its own is written.
TEST_F(FlexLayoutTest, SharedStylesGiveTheSameBoxesAsOwnOnes) {
    std::vector<css::LayoutStyleRefs> kinds;
    for (const char* text :
         {"padding: 1em; width: 30%", "display: flex; flex: 1; margin: 2px 3em; border: 3px solid red",
          "position: absolute; right: 5px; bottom: 10%; width: 10px; height: 2em",
          "position: fixed; left: 3px; right: 4px; top: 10%; height: 5vh", "display: none",
          "position: relative; left: 2px; max-width: 5em; min-height: 7px; align-self: center",
          "display: inline; padding: 1px 2px 3px 4px; width: 20px; height: 10px"})
        kinds.push_back(Page::Style(text));
    const css::LayoutStyleRefs texts[] = {Page::Style("font-size: 10px"),
                                          Page::Style("font-size: 20px; text-align: right"),
                                          Page::Style("font-size: 10px; text-align: center")};
    Page pages[2];
    std::vector<LayoutHandle*> nodes[2];
    std::mt19937 random(7);
    for (int i = 0; i < 60; ++i) {
        const size_t parent = random() % (i + 1);
        for (int k = 0; k < 2; ++k)
            nodes[k].push_back(pages[k].Add(parent == 0 ? pages[k].body : nodes[k][parent - 1], ""));
    }
    for (int frame = 0; frame < 40; ++frame) {
        for (size_t i = 0; i < nodes[0].size(); ++i) {
            if (random() % 3 == 0) continue;
            css::LayoutStyleRefs style = kinds[random() % kinds.size()];
            style.text = texts[random() % std::size(texts)].text;
            style.written.AddAll();
            pages[0].Restore(nodes[0][i], style);
            style.Mutable<css::LayoutStyle>();
            pages[1].Restore(nodes[1][i], style);
        }
        pages[0].Frame();
        pages[1].Frame();
        for (size_t i = 0; i < nodes[0].size(); ++i)
            ASSERT_EQ(BoxOf(nodes[0][i]), BoxOf(nodes[1][i])) << "frame " << frame << " node " << i;
    }
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

}  // namespace
}  // namespace qorvex::test
