#include "layout/layout_update.h"

#include "core/logging/log.h"
#include "layout/scroll.h"

namespace qorvex::layout {

static void SyncBox(const LayoutNode& node, BoxData& data) {
    BoxResult& result = data.result;
    result.edges = node.AsBox().edges;
    result.scrollSize = node.ScrollSize();
    result.visualAabb = node.visualAabb;
    result.viewBox = MapBounds(node.world.Get(), node.box);
    data.scroll = ClampScroll(data.scroll, node);
    data.zIndex = node.ZIndex();
}

void SyncTrees(LayoutUpdateData& update) {
    LogTrace("Synchronizing layout tree to main");
    update.updated.ForEach([](LayoutHandle& handle) {
        LayoutNode& node = handle.node();
        LayoutData& data = handle.data();
        data.result = {node.box.x, node.box.y, node.box.width, node.box.height};
        if (data.isBox) SyncBox(node, data.AsBox());
        data.flags = node.flags;
        data.establishesStackingContext = node.establishesStackingContext;
        node.visualChanged = false;
        node.rectChanged = false;
        node.boxMetricsChanged = false;
        node.previousStacking = node.establishesStackingContext;
        if (node.isBox) node.AsBox().previousZIndex = node.AsBox().zIndex;
        node.previousPositioned = node.flags.isPositioned;
        node.previousClip = node.flags.shouldOverflowClip;
    });
    update.updated.Clear();
}

}  // namespace qorvex::layout
