#include "display/paint_order.h"
#include "display/dump.h"
#include "layout/page_fixture.h"

#include <map>
#include <random>

namespace qorvex::test {
namespace {

using dsp::PaintList;
using layout::LayoutHandle;

class PaintOrderTest : public LayoutTest {
  protected:
    LayoutHandle* Add(LayoutHandle* parent, const char* name, const std::string& style) {
        LayoutHandle* handle = page.Add(parent, "width: 10px; height: 10px; " + style);
        names[&handle->node()] = name;
        return handle;
    }
    std::string Order(const LayoutHandle* context, std::span<const layout::Rect> areas = {}) {
        page.Frame();
        layout::WorkCounters counters;
        const TempMark mark;
        PaintList list;
        dsp::CollectPaintOrder(context->node(), areas, list, counters);
        std::string order;
        for (const dsp::PaintEntry& entry : list)
            order += (order.empty() ? "" : " ") + names[entry.node];
        return order;
    }

    // The same from runs, whose subtrees are all that is left.
    std::string OrderOfRuns(const LayoutHandle* context) {
        layout::WorkCounters counters;
        const TempMark mark;
        PaintList list;
        dsp::CollectPaintRuns(context->node(), {}, list, counters);
        std::string order;
        auto add = [&](auto& self, const layout::LayoutNode& node, bool below) -> void {
            order += (order.empty() ? "" : " ") + names[&node];
            if (!below) return;
            dsp::ForEachChild(node, {}, [&](const layout::LayoutNode& child) {
                self(self, child, !dsp::PaintsAsUnit(child));
            });
        };
        for (const dsp::PaintEntry& entry : list)
            add(add, *entry.node, entry.withSubtree);
        return order;
    }

    Page page;
    std::map<const layout::LayoutNode*, std::string> names{{&page.body->node(), "body"}};
};

TEST_F(PaintOrderTest, LayersOfAStackingContext) {
    Add(page.body, "plus", "position: relative; z-index: 1");
    Add(page.body, "positioned", "position: relative");
    Add(page.body, "opaque", "opacity: 0.9");
    Add(page.body, "flow", "");
    Add(page.body, "minus", "position: relative; z-index: -1");
    Add(page.body, "zero", "position: absolute; z-index: 0");
    Add(page.body, "plus2", "position: relative; z-index: 1");
    EXPECT_EQ(Order(page.root), "minus body flow positioned opaque zero plus plus2");
}

TEST_F(PaintOrderTest, PositionedNodesPaintWithTheirOwnFlowInTreeOrderHoweverDeep) {
    LayoutHandle* first = Add(page.body, "first", "position: relative");
    Add(first, "deep", "position: relative");
    Add(first, "text", "");
    Add(page.body, "flow", "");
    Add(page.body, "second", "position: relative");
    EXPECT_EQ(Order(page.root), "body flow first text deep second");
}

TEST_F(PaintOrderTest, ContextsAndClipsKeepTheirChildren) {
    LayoutHandle* context = Add(page.body, "context", "opacity: 0.5");
    Add(context, "inside", "position: relative; z-index: -5");
    LayoutHandle* clip = Add(page.body, "clip", "overflow: hidden");
    Add(clip, "clipped", "position: relative");
    EXPECT_EQ(Order(page.root), "body clip context");
    EXPECT_EQ(Order(context), "inside");
    EXPECT_EQ(Order(clip), "clipped");
}

TEST_F(PaintOrderTest, ChildrenInSpacePaintFromFarToNear) {
    LayoutHandle* space = Add(page.body, "space", "transform: rotateY(20deg); transform-style: preserve-3d");
    Add(space, "near", "transform: translateZ(20px)");
    Add(space, "far", "transform: translateZ(-20px)");
    Add(space, "plane", "");
    Add(space, "above", "position: relative");
    Add(space, "farther", "transform: rotateY(180deg) translateZ(30px); position: relative; z-index: 5");
    EXPECT_EQ(Order(space), "farther far plane above near");
    // Flat, the depth counts for nothing.
    page.Change(space, "transform-style: flat");
    EXPECT_EQ(Order(space), "plane near far above farther");
}

TEST_F(PaintOrderTest, RunsHoldTheSameOrder) {
    const char* styles[] = {"",
                            "",
                            "",
                            "position: relative",
                            "opacity: 0.5",
                            "position: relative; z-index: -1",
                            "position: absolute; z-index: 1",
                            "overflow: hidden"};
    std::mt19937 random(3);
    std::vector<LayoutHandle*> boxes{page.body};
    std::vector<std::string> kept(1000);
    for (int i = 0; i < 300; ++i) {
        kept[i] = std::to_string(i);
        // A few parents with many children.
        const uint32_t parents = static_cast<uint32_t>(std::min<size_t>(boxes.size(), 12));
        boxes.push_back(
            Add(boxes[random() % parents], kept[i].c_str(), styles[random() % std::size(styles)]));
        if (i % 10 != 0) continue;
        // And styles that change later.
        page.Change(boxes[random() % boxes.size()], "position: static; opacity: 1; overflow: visible");
        for (const LayoutHandle* box : boxes) {
            if (box == page.body || dsp::PaintsAsUnit(box->node())) {
                ASSERT_EQ(Order(box), OrderOfRuns(box)) << i;
            }
        }
    }
}

TEST_F(PaintOrderTest, WhatTouchesNoAreaIsLeftOut) {
    for (int i = 0; i < 300; ++i)
        Add(page.body, "row", "");
    const layout::Rect area = layout::MakeRect(0, 2000, 5, 5);
    LayoutHandle* far = Add(page.body, "far", "position: absolute; top: 0; left: 0");
    Add(far, "overflowing", "margin-top: 2000px");
    const std::string order = Order(page.root, {&area, 1});
    EXPECT_EQ(order, "body row row far overflowing");
}

TEST_F(PaintOrderTest, DumpNamesTheOrder) {
    LayoutHandle* context = Add(page.body, "context", "opacity: 0.5");
    Add(context, "inside", "position: relative; z-index: 2; width: 3px");
    page.Frame();
    EXPECT_EQ(dsp::DumpStackingContexts(*page.root).view(),
              "block (0, 0) 1000x500\n"
              "  block (0, 0) 1000x10\n"
              "  block (0, 0) 10x10 context z=0\n"
              "    block (0, 0) 3x10 relative context z=2\n");
    EXPECT_EQ(dsp::DumpLayoutTree(*page.root).view(),
              "block (0, 0) 1000x500\n"
              "  block (0, 0) 1000x10\n"
              "    block (0, 0) 10x10 context z=0\n"
              "      block (0, 0) 3x10 relative context z=2\n");
}

}  // namespace
}  // namespace qorvex::test
