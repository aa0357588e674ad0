#include "layout/page_fixture.h"

namespace qorvex::test {
namespace {

using layout::LayoutHandle;

class SimpleLayoutTest : public LayoutTest {
  protected:
    SimpleLayoutTest() { page.Change(page.body, "display: simple"); }
    Page page;
};

TEST_F(SimpleLayoutTest, ChildrenOverlapAndAutoSizesAddUp) {
    LayoutHandle* box = page.Add(page.body, "padding: 2px; border: 3px solid red; margin: auto");
    LayoutHandle* a = page.Add(box, "width: 10px; height: 20px");
    LayoutHandle* b = page.Add(box, "width: 30px; height: 40px; margin: 9px");
    LayoutHandle* out = page.Add(box, "position: absolute; width: 500px; height: 500px");
    page.Frame();
    EXPECT_EQ(BoxOf(a), "5 5 10 20");
    EXPECT_EQ(BoxOf(b), "5 5 30 40");
    EXPECT_EQ(BoxOf(box), "0 0 50 70");
    EXPECT_EQ(b->data().AsBox().result.edges.margin().left, 9);
    EXPECT_EQ(box->data().AsBox().result.edges.margin().left, 0);
    EXPECT_EQ(out->data().result.width, 500);
}

TEST_F(SimpleLayoutTest, PositionedBoxesUseLeftAndTopOfTheirContainingBox) {
    LayoutHandle* outer = page.Add(page.body,
                                   "position: relative; left: 10px; top: 20px; width: 200px; "
                                   "height: 100px; border: 5px solid red; padding: 8px");
    LayoutHandle* flow = page.Add(outer, "width: 50%; height: 50px");
    LayoutHandle* box = page.Add(flow,
                                 "position: absolute; left: 10%; top: 5px; right: 10px; width: 20px; "
                                 "height: 10px");
    LayoutHandle* fixed = page.Add(flow, "position: fixed; left: 50%; top: 0; width: 10px; height: 100%");
    page.Frame();
    EXPECT_EQ(BoxOf(flow), "23 33 87 50");
    EXPECT_EQ(BoxOf(box), "34 30 20 10");
    EXPECT_EQ(BoxOf(fixed), "500 0 10 500");
}

TEST_F(SimpleLayoutTest, OnlyTopMostChangedSubtreesAreTouched) {
    std::vector<LayoutHandle*> boxes;
    for (int i = 0; i < 2000; ++i)
        boxes.push_back(page.Add(page.body, "position: absolute; width: 5px; height: 5px"));
    LayoutHandle* child = page.Add(boxes[7], "position: absolute; left: 1px");
    page.Settle();
    page.Change(boxes[7], "left: 30px");
    page.Change(child, "left: 2px");
    page.Frame();
    EXPECT_EQ(BoxOf(child), "32 0 0 0");
    EXPECT_EQ(page.Counters().laidOut, 2u);
    EXPECT_LE(page.Counters().transformed, 4u);
}

TEST_F(SimpleLayoutTest, FlexElementsGetTheirOwnRun) {
    LayoutHandle* outer = page.Add(page.body, "position: absolute; left: 100px; top: 50px; padding: 4px");
    LayoutHandle* row = page.Add(outer, "display: flex; position: relative; left: 6px; margin-left: 11px");
    LayoutHandle* a = page.Add(row, "width: 10px; height: 10px");
    LayoutHandle* b = page.Add(row, "width: 20px; height: 30px");
    page.Frame();
    EXPECT_EQ(BoxOf(row), "110 54 30 30");
    EXPECT_EQ(BoxOf(a), "110 54 10 10");
    EXPECT_EQ(BoxOf(b), "120 54 20 30");
    page.Change(a, "width: 15px");
    page.Frame();
    EXPECT_EQ(BoxOf(b), "125 54 20 30");
    EXPECT_EQ(row->data().result.width, 35);
}

// Yoga's nodes are most of what a handle costs.
TEST_F(SimpleLayoutTest, OnlyFlexPartsHaveYogaNodes) {
    LayoutHandle* row = page.Add(page.body, "display: flex");
    LayoutHandle* a = page.Add(row, "width: 10px; height: 10px");
    LayoutHandle* plain = page.Add(page.body, "width: 10px; height: 10px");
    page.Frame();
    EXPECT_TRUE(row->node().flex && a->node().flex);
    EXPECT_FALSE(plain->node().flex || page.body->node().flex);
    page.Change(row, "display: block");
    page.Frame();
    EXPECT_FALSE(row->node().flex || a->node().flex);
    // What changed while Yoga did not know the part is not lost.
    page.Change(a, "width: 12px");
    page.Frame();
    page.Change(row, "display: flex");
    LayoutHandle* b = page.Add(row, "width: 20px; height: 30px");
    page.Frame();
    EXPECT_EQ(BoxOf(a), "0 0 12 10");
    EXPECT_EQ(BoxOf(b), "12 0 20 30");
}

TEST_F(SimpleLayoutTest, MeasuredLeavesHaveNoAvailableSize) {
    RefPtr<FakeText> text = MakeRef<FakeText>(2500.0f, 10.0f);
    LayoutHandle* leaf = page.AddText(page.Add(page.body, "width: 10px"), text);
    page.Frame();
    EXPECT_EQ(BoxOf(leaf), "0 0 2500 10");
}

TEST_F(SimpleLayoutTest, SwitchingTheEngineLaysOutEverything) {
    LayoutHandle* a = page.Add(page.body, "height: 10px");
    LayoutHandle* b = page.Add(page.body, "height: 10px");
    page.Frame();
    EXPECT_EQ(BoxOf(b), "0 0 0 10");
    page.Change(page.body, "display: block");
    page.Frame();
    EXPECT_EQ(BoxOf(a), "0 0 1000 10");
    EXPECT_EQ(BoxOf(b), "0 10 1000 10");
    page.Change(page.body, "display: simple");
    page.Frame();
    EXPECT_EQ(BoxOf(b), "0 0 0 10");
}

}  // namespace
}  // namespace qorvex::test
