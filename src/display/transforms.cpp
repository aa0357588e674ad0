#include "display/transforms.h"

#include "display/dirty_region.h"
#include "display/display_text.h"
#include "display/local_transform.h"
#include "display/own_paint.h"
#include "display/resolved_visuals.h"
#include "layout/layout_store.h"
#include "layout/prefetch.h"
#include "layout/scroll.h"

#include <algorithm>

namespace qorvex::dsp {

using layout::ChildGroups;
using layout::ChildSum;
using layout::Edges;
using layout::HandlePtr;
using layout::LayoutHandle;
using layout::LayoutNode;
using layout::LayoutPass;
using layout::Matrix;
using layout::Rect;

namespace {

Rect Outset(const Rect& rect, const Edges& by) {
    return {rect.x - by.left, rect.y - by.top, rect.z, rect.width + by.left + by.right,
            rect.height + by.top + by.bottom};
}

// Antialiased edges reach into the next pixel.
Rect ToVisual(const Rect& bounds) {
    if (layout::IsEmpty(bounds)) return {};
    return layout::RoundOut(Outset(bounds, {1, 1, 1, 1}));
}

// Of outlined glyphs. The lines of a text stay when only its outline changes, so it is no part of what the
// text knows of itself.
float StrokeReach(const css::TextLayoutStyle& style) {
    constexpr float kFarthest = 1e5f;
    return style.computedStrokeWidth > 0 ? std::min(style.computedStrokeWidth, kFarthest) : 0;
}

bool Same(const Rect& a, const Rect& b) {
    return a.x == b.x && a.y == b.y && a.width == b.width && a.height == b.height;
}
bool Same(const layout::ScrollPosition& a, const layout::ScrollPosition& b) {
    return a.x == b.x && a.y == b.y;
}

// Such as an image: layout gives what stands inside of it no boxes, so none of it shows.
bool HidesChildren(const LayoutNode& node) {
    const bool leaf = node.flags.isReplaced || node.flags.measuredByDisplayElement;
    return leaf && !(node.display && node.display->Has(IDisplayElement::kFlowsChildren));
}

// What a parent hands down.
struct Above {
    const Matrix& children;
    const layout::WorldMatrix*
        shared;  // what a child without a matrix of its own has; null where it makes its own
    layout::ScrollPosition scroll;
    Rect clip;   // view coordinates
    bool moved;  // the matrix or the scroll position differs from the last pass
};

void AddTo(ChildSum& sum, const LayoutHandle& handle) {
    const LayoutNode& child = handle.node();
    sum.content = layout::Union(sum.content, layout::ContentOf(handle));
    sum.visual = layout::Union(sum.visual, child.visualAabb);
    sum.layered = sum.layered || child.flags.isPositioned || child.establishesStackingContext ||
                  (child.layeredBelow && !child.flags.shouldOverflowClip);
}

// Under which the matrices of the children were made.
layout::ScrollPosition AppliedScroll(const LayoutNode& node) {
    return node.isBox && node.AsBox().below ? node.AsBox().below->appliedScroll : layout::ScrollPosition();
}

class TransformPass {
  public:
    explicit TransformPass(LayoutPass& pass) : pass_(pass), lengths_(layout::MakeLengthContext(pass)) {}

    // True when something of the subtree has to be painted again.
    bool Visit(LayoutHandle& handle, const Above& above) {
        LayoutNode& node = handle.node();
        if (node.IsBeyondLimit()) return false;
        const bool self = pass_.everything || above.moved || node.needsTransform;
        if (!self && !node.descendantNeedsTransform) return false;
        ++pass_.update.counters.transformed;

        const Before before(node);
        const Rect box = PaintBox(node, pass_.snapToPixels);
        bool ownMatricesChanged = false, worldChanged = false;
        if (self) {
            if (node.needsTransform || pass_.everything) node.ownPaint = FindOwnPaint(node);
            UpdateStacking(node);
            lengths_.em = node.style->text->computedFontSize;
            ownMatricesChanged = UpdateLocalMatrices(node, box, lengths_) ||
                                 (node.needsTransform && (node.Local() || node.Perspective()));
            worldChanged = UpdateWorld(node, above);
        }
        bool dirtyBelow = UpdateChildren(node, above, worldChanged || ownMatricesChanged);
        UpdateBounds(node, box);
        const layout::ScrollPosition scroll = node.Scroll(), clamped = layout::ClampScroll(scroll, node);
        if (!Same(clamped, scroll)) {
            node.AsBox().scroll = clamped;
            dirtyBelow = UpdateChildren(node, above, true) || dirtyBelow;
            UpdateBounds(node, box);
        }
        node.needsTransform = node.descendantNeedsTransform = node.childrenChanged = false;
        UpdatePaintBounds(node, box);
        return NoteChanges(handle, before, above, self && (above.moved || worldChanged), dirtyBelow) ||
               dirtyBelow;
    }

  private:
    struct Before {
        Rect aabb, paint, visual;
        layout::Size scrollSize;
        layout::ScrollPosition scroll;
        bool children;  // are others
        explicit Before(const LayoutNode& node)
            : aabb(node.isBox ? node.AsBox().aabb : Rect()),
              paint(node.PaintBounds()),
              visual(node.visualAabb),
              scrollSize(node.ScrollSize()),
              scroll(AppliedScroll(node)),
              children(node.childrenChanged) {}
    };

    static bool UpdateWorld(LayoutNode& node, const Above& above) {
        const bool scrolled = layout::IsScrolled(above.scroll);
        const Matrix* local = node.Local();
        if (above.shared && !scrolled && !local) return node.world.Share(*above.shared);
        Matrix world = above.children;
        if (scrolled) world = world * fresco::TranslationMatrix(-above.scroll.x, -above.scroll.y);
        return node.world.Set(local ? world * *local : world);
    }

    // Do the children stand in the node's own matrix?
    static bool HandsDownWorld(const LayoutNode& node) {
        return !node.Perspective() && (node.flags.preserves3d || layout::IsFlat(node.world.Get()));
    }

    static Matrix ChildrenMatrix(const LayoutNode& node) {
        Matrix children = node.world.Get();
        if (!node.flags.preserves3d && !layout::IsFlat(children)) children = fresco::Flattened(children);
        const Matrix* perspective = node.Perspective();
        return perspective ? children * *perspective : children;
    }

    bool UpdateChildren(LayoutNode& node, const Above& above, bool matricesChanged) {
        children_ = {};
        if (!node.isBox) return false;
        layout::BoxNode& own = node.AsBox();
        const bool hidden = HidesChildren(node);
        const bool scrolled = !Same(own.scroll, AppliedScroll(node));
        KeepBounds(own, hidden);
        if (hidden || own.children.empty()) {
            node.layeredBelow = false;
            return false;
        }
        const Matrix children = ChildrenMatrix(node);
        Above below{children, HandsDownWorld(node) ? &node.world : nullptr, own.scroll, above.clip,
                    above.moved || matricesChanged || scrolled};
        if (node.flags.shouldOverflowClip) {
            const Rect clip =
                layout::RoundOut(layout::MapBounds(node.world.Get(), ClipBox(node, pass_.snapToPixels)));
            below.clip = layout::Intersection(below.clip, clip);
        }
        bool dirty = false;
        const uint32_t count = own.children.size();
        for (uint32_t i = 0; i < std::min(count, layout::kNodesAhead); ++i)
            layout::PrefetchNode(*own.children[i]);
        auto add = [&](uint32_t child, ChildSum& sum) {
            if (child + layout::kNodesAhead < count)
                layout::PrefetchNode(*own.children[child + layout::kNodesAhead]);
            if (child + 2 < count) __builtin_prefetch(own.children[child + 2]->node().display.get());
            dirty = Visit(*own.children[child], below) || dirty;
            AddTo(sum, *own.children[child]);
        };
        const ChildSum sum = SumChildren(own, below.moved || pass_.everything, add);
        if (own.below) own.below->sum = sum;
        node.layeredBelow = sum.layered;
        children_ = sum;
        return dirty;
    }

    // A single child that shows and was never scrolled tells all that there is to know.
    static void KeepBounds(layout::BoxNode& node, bool hidden) {
        const bool simple = node.children.size() == 1 && !hidden && Same(node.scroll, {});
        if (simple || node.children.empty()) {
            node.below.reset();
            return;
        }
        if (!node.below) node.below = MakeUnique<layout::ChildBounds, MemoryTag::LayoutNodes>();
        node.below->appliedScroll = node.scroll;
        if (hidden) node.below->sum = {};
    }

    template <typename AddChild>
    static ChildSum SumChildren(layout::BoxNode& node, bool all, AddChild&& add) {
        const uint32_t count = node.children.size();
        if (count > ChildGroups::kFanout) {
            auto& groups = node.below->groups;
            if (!groups) groups = MakeUnique<ChildGroups, MemoryTag::LayoutNodes>();
            if (!groups->Fit(count)) groups->Resize(count);
            return groups->Update(all, add);
        }
        ChildSum sum;
        for (uint32_t i = 0; i < count; ++i)
            add(i, sum);
        return sum;
    }

    void UpdateBounds(LayoutNode& node, const Rect& box) const {
        if (!node.isBox) return;
        const bool overflows = !node.flags.shouldOverflowClip && !layout::IsEmpty(children_.content);
        node.AsBox().aabb = overflows ? layout::Union(box, children_.content) : box;
    }

    void UpdatePaintBounds(LayoutNode& node, const Rect& box) {
        Rect reach = box;
        Rect subtree = children_.visual;
        if (node.flags.shouldOverflowClip && !layout::IsEmpty(subtree)) {
            const Rect clip = layout::MapBounds(node.world.Get(), ClipBox(node, pass_.snapToPixels));
            subtree = layout::Intersection(subtree, layout::RoundOut(clip));
        }
        if (!node.isBox && node.display) {
            const auto& text = static_cast<const DisplayText&>(*node.display);
            const float ink = text.InkOverflow() + StrokeReach(*node.style->text);
            const layout::Size content = text.ContentSize();
            // Lines may be aligned to either side.
            const float wider = ink + std::max(content.width - box.width, 0.0f);
            const float taller = ink + std::max(content.height - box.height, 0.0f);
            reach = Outset(reach, {wider, wider, ink, taller});
        }
        if (node.visuals) reach = Outset(reach, PaintOutset(*node.visuals));
        const Rect paint = ToVisual(layout::MapBounds(node.world.Get(), reach));
        if (node.isBox) node.AsBox().paintBounds = paint;
        node.visualAabb = layout::Union(paint, subtree);
        if (node.visuals && !node.visuals->filters.empty() && !layout::IsEmpty(node.visualAabb)) {
            node.visualAabb = layout::RoundOut(Outset(node.visualAabb, FilterReach(node)));
        }
    }

    // The filter's reach under the node's transform; the largest scale stands for all directions.
    static Edges FilterReach(const LayoutNode& node) {
        const float* m = node.world.Get().m;
        const float scale = std::max({std::hypot(m[0], m[1]), std::hypot(m[4], m[5]), 1e-3f});
        const Edges reach = FilterOutset(*node.visuals);
        const float largest = scale * std::max({reach.left, reach.right, reach.top, reach.bottom});
        return {largest, largest, largest, largest};
    }

    bool NoteChanges(LayoutHandle& handle, const Before& before, const Above& above, bool moved,
                     bool dirtyBelow) {
        LayoutNode& node = handle.node();
        const bool stacking = node.establishesStackingContext != node.previousStacking ||
                              (node.isBox && node.AsBox().zIndex != node.AsBox().previousZIndex);
        const layout::Size scrollSize = node.ScrollSize();
        const bool scrolls = before.children || !layout::Near(before.scrollSize.width, scrollSize.width) ||
                             !layout::Near(before.scrollSize.height, scrollSize.height) ||
                             !Same(before.scroll, node.Scroll());
        const Rect& paintBounds = node.PaintBounds();
        const bool paints = node.visualChanged || stacking || moved || node.rectChanged ||
                            node.boxMetricsChanged || !Same(before.paint, paintBounds);
        const bool bounds =
            !Same(before.visual, node.visualAabb) || (node.isBox && !Same(before.aabb, node.AsBox().aabb));
        if (paints) node.visualChanged = true;
        if (paints || bounds || scrolls) pass_.update.updated.Add(handle);

        const bool spreads = node.visuals && !node.visuals->filters.empty();
        if (!paints && !(spreads && dirtyBelow)) return false;
        // A node that paints as a unit may show any change of its own on all of its subtree; so does one that
        // has become another kind of layer.
        const bool unit = spreads || node.establishesStackingContext || node.previousStacking ||
                          node.flags.shouldOverflowClip || node.previousClip ||
                          node.flags.isPositioned != node.previousPositioned;
        pass_.dirty.Add(layout::Intersection(unit ? before.visual : before.paint, above.clip));
        pass_.dirty.Add(layout::Intersection(unit ? node.visualAabb : paintBounds, above.clip));
        return true;
    }

    LayoutPass& pass_;
    css::LengthContext lengths_;
    // Of the children of the node that was updated last.
    ChildSum children_;
};

}  // namespace

void RunTransformPass(LayoutPass& pass) {
    if (pass.root == nullptr) return;
    pass.root->store().snapsToPixels = pass.snapToPixels;
    const Matrix identity;
    const Rect view{0, 0, 0, static_cast<float>(pass.viewWidth), static_cast<float>(pass.viewHeight)};
    const layout::WorldMatrix none;
    TransformPass(pass).Visit(*pass.root, {identity, &none, {}, view, false});
}

void MarkForTransform(LayoutHandle& handle) {
    handle.node().needsTransform = true;
    uint32_t index = handle.node().index;
    for (LayoutHandle* parent = handle.node().parent; parent != nullptr; parent = parent->node().parent) {
        LayoutNode& node = parent->node();
        const auto& below = node.AsBox().below;
        const bool groupKnown = !below || !below->groups || !below->groups->MarkDirty(index);
        if (node.descendantNeedsTransform && groupKnown) break;
        node.descendantNeedsTransform = true;
        index = node.index;
    }
}

Rect PaintBox(const LayoutNode& node, bool snapToPixels) {
    return snapToPixels ? layout::SnapToPixels(node.box) : node.box;
}

Rect ClipBox(const LayoutNode& node, bool snapToPixels) {
    return layout::Inset(PaintBox(node, snapToPixels), node.border());
}

Rect ClipToAncestors(const LayoutNode& node) {
    Rect area = node.visualAabb;
    for (const LayoutHandle* above = node.parent; above != nullptr; above = above->node().parent) {
        const LayoutNode& parent = above->node();
        if (parent.flags.shouldOverflowClip) {
            // A pixel more: whether boxes are snapped is not known here.
            const Rect clip = Outset(ClipBox(parent, true), {1, 1, 1, 1});
            area = layout::Intersection(area, layout::RoundOut(layout::MapBounds(parent.world.Get(), clip)));
        }
        const bool spreads = parent.visuals && !parent.visuals->filters.empty();
        if (spreads && !layout::IsEmpty(area)) area = parent.visualAabb;
    }
    return area;
}

}  // namespace qorvex::dsp
