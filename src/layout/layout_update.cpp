#include "layout/layout_update.h"

#include "core/logging/log.h"
#include "layout/scroll.h"

namespace qorvex::layout {

void SyncTrees(LayoutUpdateData& update) {
    LogTrace("Synchronizing layout tree to main");
    update.updated.ForEach([](LayoutHandle& handle) {
        LayoutNode& node = handle.node();
        LayoutData& data = handle.data();
        LayoutResult& result = data.result;
        result.left = node.box.x;
        result.top = node.box.y;
        result.width = node.box.width;
        result.height = node.box.height;
        result.edges = node.edges;
        result.scrollSize = node.ScrollSize();
        result.visualAabb = node.visualAabb;
        result.viewBox = MapBounds(node.world.Get(), node.box);
        data.scroll = ClampScroll(data.scroll, node);
        data.flags = node.flags;
        data.establishesStackingContext = node.establishesStackingContext;
        data.zIndex = node.zIndex;
        node.visualChanged = false;
        node.rectChanged = false;
        node.boxMetricsChanged = false;
        node.previousStacking = node.establishesStackingContext;
        node.previousZIndex = node.zIndex;
        node.previousPositioned = node.flags.isPositioned;
        node.previousClip = node.flags.shouldOverflowClip;
    });
    update.updated.Clear();
}

}  // namespace qorvex::layout
