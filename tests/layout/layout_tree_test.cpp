#include "layout/page_fixture.h"

#include "core/limits.h"
#include "layout/debug_names.h"

namespace qorvex::test {
namespace {

using layout::HandlePtr;
using layout::LayoutHandle;

using LayoutTreeTest = LayoutTest;

std::vector<const LayoutHandle*> NodeChildren(const LayoutHandle* handle) {
    std::vector<const LayoutHandle*> children;
    for (const HandlePtr& child : handle->node().Children())
        children.push_back(child.get());
    return children;
}

TEST_F(LayoutTreeTest, NewChildStandsWhereItIsPut) {
    Page page;
    LayoutHandle* first = page.Add(page.body, "");
    LayoutHandle* last = page.Add(page.body, "");
    LayoutHandle* middle = page.Insert(page.body, 1, "");
    page.Frame();
    EXPECT_EQ(NodeChildren(page.body), (std::vector<const LayoutHandle*>{first, middle, last}));
}

TEST_F(LayoutTreeTest, CommitCopiesOnlyChangedHandles) {
    Page page;
    std::vector<LayoutHandle*> boxes;
    for (int i = 0; i < 1000; ++i)
        boxes.push_back(page.Add(page.body, "position: absolute; width: 5px; height: 5px"));
    page.Settle();
    page.Frame();
    EXPECT_EQ(page.Counters().committed, 0u);
    for (LayoutHandle* box : boxes)
        page.Change(box, "top: 7px");
    EXPECT_EQ(page.tree.Changed().Size(), 1000u);
    page.Frame();
    EXPECT_EQ(page.Counters().committed, 1000u);
    EXPECT_EQ(BoxOf(boxes[500]), "0 7 5 5");
    EXPECT_TRUE(page.tree.Changed().Empty());
}

TEST_F(LayoutTreeTest, AFrameThatIsDroppedTakesNothingFromTheNext) {
    Page page;
    LayoutHandle* box = page.Add(page.body, "width: 10px; height: 10px");
    page.Frame();
    page.sync = false;
    page.Change(box, "width: 20px");
    page.Frame();
    page.update.reset();
    page.sync = true;
    page.Change(box, "width: 30px");
    page.Frame();
    EXPECT_EQ(BoxOf(box), "0 0 30 10");
}

TEST_F(LayoutTreeTest, RemovingTakesTheSubtreeOutOnceAndDirtiesWhatItCovered) {
    FakeNode node;
    Page page;
    LayoutHandle* parent =
        page.Insert(page.body, 0, "width: 50px; height: 40px; background-color: red", &node);
    LayoutHandle* child = page.Add(parent, "width: 80px; height: 90px");
    page.Settle();
    EXPECT_TRUE(node.inTree);
    page.tree.Remove(*parent, nullptr);
    page.tree.Remove(*parent, nullptr);
    page.tree.Remove(*child, nullptr);
    EXPECT_EQ(page.tree.Removed().Size(), 2u);
    EXPECT_FALSE(node.inTree);
    EXPECT_FALSE(child->data().inTree);
    page.Frame();
    EXPECT_TRUE(page.body->node().Children().empty());
    EXPECT_EQ(BoxOf(page.body), "0 0 1000 0");
    EXPECT_TRUE(layout::Contains(page.dirty.Bounds(), layout::MakeRect(0, 0, 80, 90)));
}

TEST_F(LayoutTreeTest, MovedNodeIsRemovedAndAttached) {
    Page page;
    LayoutHandle* a = page.Add(page.body, "height: 10px");
    LayoutHandle* b = page.Add(page.body, "height: 10px");
    LayoutHandle* moved = page.Add(a, "width: 10px; height: 5px");
    page.Settle();
    page.tree.Remove(*moved, nullptr);
    page.tree.Attach(*moved, *b, 0);
    EXPECT_TRUE(page.tree.Removed().Empty());
    page.Frame();
    EXPECT_TRUE(a->node().Children().empty());
    EXPECT_EQ(BoxOf(moved), "0 10 10 5");
    // There and back between two frames.
    page.tree.Remove(*moved, nullptr);
    page.tree.Attach(*moved, *a, 0);
    page.tree.Remove(*moved, nullptr);
    page.tree.Attach(*moved, *b, 0);
    page.Frame();
    EXPECT_EQ(BoxOf(moved), "0 10 10 5");
}

TEST_F(LayoutTreeTest, HandlesOutliveTheTree) {
    HandlePtr kept;
    {
        Page page;
        LayoutHandle* parent = page.Add(page.body, "");
        kept = HandlePtr(page.Add(parent, ""));
        page.Frame();
    }
    EXPECT_EQ(kept->data().parent, nullptr);
    EXPECT_FALSE(kept->data().inTree);
}

TEST_F(LayoutTreeTest, DiagnosticNamesFollowTheTree) {
    FakeNode node;
    Page page;
    LayoutHandle* box = page.Insert(page.body, 0, "", &node);
    layout::DebugNames names;
    layout::LayoutUpdatePtr update = MakeRef<layout::LayoutUpdateData>();
    page.tree.Commit(*update, nullptr, &names);
    EXPECT_EQ(names.Find(box), "div");
    page.tree.Remove(*box, nullptr);
    page.tree.Commit(*update, nullptr, &names);
    EXPECT_EQ(names.Find(box), "");
}

TEST_F(LayoutTreeTest, ScrollPositionIsClampedWhenContentShrinks) {
    Page page;
    LayoutHandle* scroller = page.Add(page.body, "overflow: auto; width: 100px; height: 100px");
    LayoutHandle* content = page.Add(scroller, "height: 500px");
    page.Settle();
    page.tree.SetScroll(*scroller, {0, 300});
    page.Frame();
    EXPECT_EQ(scroller->data().AsBox().scroll.y, 300);
    EXPECT_EQ(content->node().world.Get().m[13], -300);
    EXPECT_EQ(scroller->data().AsBox().result.scrollSize.height, 500);
    page.Change(content, "height: 250px");
    page.Frame();
    EXPECT_EQ(scroller->data().AsBox().scroll.y, 150);
    EXPECT_EQ(content->node().world.Get().m[13], -150);
    page.tree.SetScroll(*scroller, {std::nanf(""), -5});
    page.Frame();
    EXPECT_EQ(scroller->data().AsBox().scroll.x, 0);
    EXPECT_EQ(scroller->data().AsBox().scroll.y, 0);
}

}  // namespace
}  // namespace qorvex::test
