#include "display/record_node.h"

#include "css/values/style_groups.h"
#include "display/background_painter.h"
#include "display/box_shape.h"
#include "display/clip_path.h"
#include "display/dirty_region.h"
#include "display/layer_effects.h"
#include "display/mask_painter.h"
#include "display/paint_order.h"
#include "display/transforms.h"

namespace qorvex::dsp {

using fresco::CommandBuffer;
using layout::LayoutNode;
using layout::Rect;

namespace {

using Areas = std::span<const Rect>;

// Counts the pushes of one scope and takes them back together.
class StateScope {
  public:
    explicit StateScope(CommandBuffer& buffer) : buffer_(buffer) {}
    StateScope(const StateScope&) = delete;
    StateScope& operator=(const StateScope&) = delete;
    ~StateScope() {
        while (pushes_-- > 0)
            buffer_.PopState();
    }
    void Push(uint32_t mask) {
        buffer_.PushState(mask);
        ++pushes_;
    }

  private:
    CommandBuffer& buffer_;
    int pushes_ = 0;
};

// The caller has looked at the visual bounds, which a node without children paints all by itself.
void PaintOwn(const LayoutNode& node, PaintContext& context, Areas areas, CommandBuffer& buffer) {
    if (node.ownPaint == 0 || (!node.Children().empty() && !TouchesAny(areas, node.PaintBounds()))) return;
    ++context.counters.recorded;
    if (node.ownPaint == layout::kPaintsColor) {
        PaintPlainColor(node, context.snapToPixels, buffer);
        return;
    }
    context.lengths.em = node.style->text->computedFontSize;
    node.display->Paint(context, context.partialRedraw, node, buffer);
}

void ClipToPaddingBox(const LayoutNode& node, const PaintContext& context, CommandBuffer& buffer) {
    const Rect padding = ClipBox(node, context.snapToPixels);
    if (node.visuals && HasRadii(node.visuals->radii)) {
        const Rect box = PaintBox(node, context.snapToPixels);
        fresco::CornerRadii radii = node.visuals->radii;
        FitRadii(radii, box.width, box.height);
        buffer.ClipRoundedRect(padding, InsetRadii(radii, node.border()), fresco::kClipIntersect);
    } else {
        buffer.ClipRect(padding, fresco::kClipIntersect);
    }
}

// The areas of the children: those of the node, cut by its clip.
class ChildAreas {
  public:
    ChildAreas(const LayoutNode& node, const PaintContext& context, Areas areas) : areas_(areas) {
        if (!node.flags.shouldOverflowClip) return;
        const Rect clip =
            layout::RoundOut(layout::MapBounds(node.world.Get(), ClipBox(node, context.snapToPixels)));
        uint32_t kept = 0;
        for (const Rect& area : areas) {
            const Rect cut = layout::Intersection(area, clip);
            if (!layout::IsEmpty(cut)) rects_[kept++] = cut;
        }
        areas_ = {rects_.data(), kept};
    }
    Areas Get() const { return areas_; }

  private:
    std::array<Rect, DirtyRegion::kScissorCount> rects_;
    Areas areas_;
};

// Neither a filter nor the client's effect says which pixels it needs for those in sight.
bool NeedsWholeContent(const LayoutNode& node) {
    return !node.style->visual->filter.empty() || !node.style->visual->customEffectName.empty();
}

void PushChildState(const LayoutNode& node, const PaintContext& context, StateScope& scope,
                    CommandBuffer& buffer) {
    if (!node.flags.preserves3d && !layout::IsFlat(node.world.Get())) {
        scope.Push(fresco::kStateTransform);
        buffer.FlattenTransform();
    }
    if (const layout::Matrix* perspective = node.Perspective()) {
        scope.Push(fresco::kStateTransform);
        buffer.MultiplyTransform(*perspective);
    }
    const layout::ScrollPosition scroll = node.Scroll();
    const bool scrolled = layout::IsScrolled(scroll);
    if (!scrolled && !node.flags.shouldOverflowClip) return;
    scope.Push((node.flags.shouldOverflowClip ? fresco::kStateClip : 0u) |
               (scrolled ? fresco::kStateTransform : 0u));
    if (node.flags.shouldOverflowClip) ClipToPaddingBox(node, context, buffer);
    if (scrolled) buffer.Translate(-scroll.x, -scroll.y);
}

const Rect& ChildrenVisual(const LayoutNode& node) {
    const layout::BoxNode& box = node.AsBox();
    return box.below ? box.below->sum.visual : box.children[0]->node().visualAabb;
}

// In-flow content needs no list: it paints in tree order.
void RecordFlow(const LayoutNode& parent, PaintContext& context, Areas areas, CommandBuffer& buffer) {
    ForEachChild(parent, areas, [&](const LayoutNode& child) {
        if (child.IsBeyondLimit()) return;
        ++context.counters.visited;
        if (!TouchesAny(areas, child.visualAabb)) return;
        if (PaintsAsUnit(child)) {
            RecordNode(child, context, areas, &buffer);
            return;
        }
        PaintOwn(child, context, areas, buffer);
        if (!child.Children().empty()) RecordFlow(child, context, areas, buffer);
    });
}

void RecordLayers(const PaintList& list, PaintContext& context, Areas areas, CommandBuffer& buffer) {
    for (const PaintEntry& entry : list) {
        if (PaintsAsUnit(*entry.node)) {
            RecordNode(*entry.node, context, areas, &buffer);
            continue;
        }
        PaintOwn(*entry.node, context, areas, buffer);
        if (entry.withSubtree) RecordFlow(*entry.node, context, areas, buffer);
    }
}

void RecordChildren(const LayoutNode& node, PaintContext& context, Areas areas, CommandBuffer& buffer) {
    if (node.Children().empty() || areas.empty()) return;
    const bool inOrder = PaintsInTreeOrder(node);
    const TempMark mark;
    PaintList list;
    if (inOrder) {
        if (!TouchesAny(areas, ChildrenVisual(node))) return;
    } else {
        CollectPaintRuns(node, areas, list, context.counters);
        if (list.empty()) return;
    }
    StateScope scope(buffer);
    PushChildState(node, context, scope, buffer);
    inOrder ? RecordFlow(node, context, areas, buffer) : RecordLayers(list, context, areas, buffer);
}

void RecordContent(const LayoutNode& node, PaintContext& context, Areas areas, CommandBuffer& buffer) {
    const css::VisualStyle& visual = *node.style->visual;
    const MaskState mask = PrepareMask(node);
    if (mask == MaskState::Hold) return;
    StateScope scope(buffer);
    if (!visual.clipPath.IsNone()) {
        scope.Push(fresco::kStateClip);
        context.lengths.em = node.style->text->computedFontSize;
        if (!ApplyClipPath(node, context, buffer)) return;
    }
    PaintOwn(node, context, areas, buffer);
    RecordChildren(node, context, ChildAreas(node, context, areas).Get(), buffer);
    if (mask == MaskState::Ready) ApplyMask(node, context, buffer);
}

}  // namespace

void RecordNode(const LayoutNode& node, PaintContext& context, Areas areas, CommandBuffer* buffer) {
    const css::VisualStyle& visual = *node.style->visual;
    if (visual.opacity.value <= 0 || !TouchesAny(areas, node.visualAabb)) return;
    // The transform goes around the layer, so that filters measure in the node's own space.
    const layout::Matrix* local = node.Local();
    if (local) {
        buffer->PushState(fresco::kStateTransform);
        buffer->MultiplyTransform(*local);
    }
    const bool hasLayer = NeedsLayer(node);
    if (hasLayer) {
        context.lengths.em = node.style->text->computedFontSize;
        buffer = OpenLayer(node, context, buffer);
    }
    RecordContent(node, context, NeedsWholeContent(node) ? Areas(&node.visualAabb, 1) : areas, *buffer);
    if (hasLayer) buffer = CloseLayer(node, buffer);
    if (local) buffer->PopState();
}

}  // namespace qorvex::dsp
