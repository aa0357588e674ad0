// One element's or text node's place in the layout tree, in two halves that no two threads touch at once.
//
// LayoutData is written on the DOM thread only (also by the commit and SyncTrees, which run there while the
// layout side is idle). LayoutNode is written by tasks on the layout channel only, while no commit or
// SyncTrees runs; those two are the only code that touches both. So neither half has a lock: only the counts
// of handles, style groups, node links and display elements are atomic.
//
// A text has neither children nor edges nor scrolling, so half of what a box needs is left out of its handle:
// both halves have a part that only boxes have. What a handle is of stays so for its life.
//
// Owners of a handle: its element, the child vector of its parent's halves, change sets and tasks. Both
// halves lie in the handle, which returns to the pool of the tree's store.
#pragma once

#include "core/limits.h"
#include "core/memory/containers.h"
#include "css/values/layout_style_refs.h"
#include "display/display_element.h"
#include "layout/child_groups.h"
#include "layout/geometry.h"
#include "layout/node_link.h"
#include "qsl/ref_ptr.h"

#include <array>
#include <atomic>
#include <cassert>
#include <cstdint>
#include <span>

struct YGNode;

namespace qorvex::dsp {
struct ResolvedVisuals;
}

namespace qorvex::layout {

class LayoutHandle;
class BoxHandle;
struct BoxData;
struct BoxNode;
class LayoutStore;
template <typename T>
class ObjectPool;
class LayoutTree;
using HandlePtr = qsl::RefPtr<LayoutHandle>;
using HandleVector = CompactVector<HandlePtr, MemoryTag::LayoutNodes>;
using HandleSpan = std::span<const HandlePtr>;

// Facts that follow from a node's style alone. Computed on the layout side, mirrored to the DOM side.
struct NodeFlags {
    bool isPositioned : 1 = false;  // position is not static
    bool isFixed : 1 = false;
    bool isAbsolute : 1 = false;
    bool shouldOverflowClip : 1 = false;        // either overflow axis is not visible
    bool containsFixedDescendants : 1 = false;  // has a transform, a perspective or a filter
    bool preserves3d : 1 = false;
    bool measuredByDisplayElement : 1 = false;
    bool isReplaced : 1 = false;  // sides that its style leaves open come from its display element
};

// An immutable record of the layout side that several nodes and both halves hold.
template <class Value>
struct SharedRecord : AtomicRefCounted<SharedRecord<Value>, MemoryTag::LayoutNodes> {
    explicit SharedRecord(const Value& value) : value(value) {}
    Value value;
};

// The records made last: the boxes of a list mostly have the same edges.
using EdgesPtr = qsl::RefPtr<const SharedRecord<BoxEdges>>;
using EdgesCache = std::array<EdgesPtr, 16>;

// Border, padding and margin of a box; without a record all of them are zero.
class SharedEdges {
  public:
    const Edges& border() const { return Get().border; }
    const Edges& padding() const { return Get().padding; }
    const Edges& margin() const { return Get().margin; }
    void Set(const BoxEdges& edges, EdgesCache& cache);
    static const BoxEdges& None() { return kNone; }

  private:
    static constexpr BoxEdges kNone{};
    const BoxEdges& Get() const { return record_ ? record_->value : kNone; }
    EdgesPtr record_;
};

// A node's world matrix. The node that has another one than its parent owns a record and writes it in place;
// all below it that add nothing hold the same one. Without a record it is the identity.
class WorldMatrix {
  public:
    const Matrix& Get() const { return record_ ? record_->value : kIdentity; }
    // True when it may be another matrix now. Another record counts even with the same value: those below,
    // who hold the former one, must change over before its owner writes it.
    bool Share(const WorldMatrix& other);
    bool Set(const Matrix& matrix);

  private:
    static constexpr Matrix kIdentity{};
    qsl::RefPtr<SharedRecord<Matrix>> record_;
    bool owns_ = false;
};

// The geometry that scripts read. Left and Top are in document coordinates, before transforms and scrolling.
struct LayoutResult {
    float left = 0;
    float top = 0;
    float width = 0;
    float height = 0;
};
struct BoxResult {
    SharedEdges edges;
    Rect visualAabb{};
    Rect viewBox{};  // the box under its transforms and the scrolling of its ancestors, in view coordinates
    Size scrollSize;
};

struct LayoutData {
    LayoutHandle* parent = nullptr;
    NodeLinkPtr node;
    // Of the node, read by the commit. Null once the node has died or left the document.
    const css::LaidOutStyle* style = nullptr;
    css::WrittenGroups written;  // since the last commit
    NodeFlags flags;
    bool isBox : 1;  // and no text
    bool establishesStackingContext : 1 = false;
    bool isImage : 1 = false;
    bool changed : 1 = false;  // an edit that the next commit must carry over
    bool inTree : 1 = false;
    LayoutResult result;

  private:
    friend class LayoutHandle;
    friend class LayoutStore;
    std::atomic<uint32_t> count_{1};  // of the handle, which has no better room for it

  public:
    explicit LayoutData(bool box);
    // DOM order among the siblings that have handles; none of a text.
    HandleSpan Children() const;
    BoxData& AsBox();
    const BoxData& AsBox() const;
};
static_assert(sizeof(LayoutData) == 48);

struct BoxData {
    HandleVector children;
    dsp::DisplayElementPtr display;
    ScrollPosition scroll;
    int32_t zIndex = 0;
    BoxResult result;
};

// What a node paints by itself; found when its style, its display element or its borders change, so that the
// recording asks for nothing that is not there.
enum OwnPaint : uint8_t {
    kPaintsColor = 1,       // a background colour on a box with square corners
    kPaintsRoundColor = 2,  // the same with round ones
    kPaintsImages = 4,      // of the background
    kPaintsShadows = 8,     // of the box
    kPaintsBorder = 16,     // of colours or of an image
    kPaintsContent = 32,    // text, or what else the display element shows
};

struct LayoutNode {
    LayoutHandle* parent = nullptr;
    // Its context points back at the handle. Only of nodes that Yoga lays out: none in a page, or a part of
    // it, that the simple engine places.
    YGNode* flex = nullptr;
    // Depth below the root, which is 0. Nodes at kMaxLayoutDepth and deeper keep zero boxes.
    uint32_t depth = 0;
    // Place among the parent's children, for the bounds that the parent keeps by groups of children.
    uint32_t index = 0;
    // Present only where the style needs them.
    UniquePtr<dsp::ResolvedVisuals, MemoryTag::LayoutNodes> visuals;

    // Small fields stand in the room that the member before them leaves at its end.
    [[no_unique_address]] WorldMatrix world;
    // As of the last SyncTrees.
    bool previousStacking : 1 = false;
    bool previousPositioned : 1 = false;
    bool previousClip : 1 = false;

    // One frame long; SyncTrees clears them.
    bool visualChanged : 1 = false;
    bool rectChanged : 1 = false;
    bool boxMetricsChanged : 1 = false;
    // What the element measures changed, and the next layout asks whether its size did.
    bool contentChanged : 1 = false;
    // Of an UpdatedList.
    bool isInUpdated : 1 = false;

    // Sticky and conservative: there is an absolute or fixed box below, whose containing block may lie above
    // this node. When it is set here, it is set on all ancestors.
    bool absoluteBelow : 1 = false;
    // The transform pass must look at this node, or somewhere below it.
    bool needsTransform : 1 = true;
    bool descendantNeedsTransform : 1 = false;
    // The commit gave the node other children, so what their bounds add up to is not known.
    bool childrenChanged : 1 = false;
    // What Yoga was told last about the node as a container.
    bool wasFlexContainer : 1 = false;

    // From here on what the recording reads of every node.
    bool isBox : 1;  // and no text
    bool establishesStackingContext : 1 = false;
    // A child, or a plain node below, is positioned or a stacking context: not all below paints in tree
    // order.
    bool layeredBelow : 1 = false;
    NodeFlags flags;
    uint8_t ownPaint = 0;  // OwnPaint
    // That of a text is there from the first moment and stays.
    dsp::DisplayElementPtr display;
    // Of a box its own, in its other part; of a text a record that all texts of that style share.
    const css::LaidOutStyle* style;
    Rect visualAabb{};  // what the node and its subtree can touch, view coordinates
    Rect box{};         // document coordinates; z and the pixel grid play no part yet

    explicit LayoutNode(bool box);

    // The part that a box has on top.
    BoxNode& AsBox();
    const BoxNode& AsBox() const;
    // And what a text has none of.
    HandleSpan Children() const;
    const Matrix* Local() const;
    const Matrix* Perspective() const;
    ScrollPosition Scroll() const;
    int32_t ZIndex() const;
    const Edges& border() const;
    const Edges& padding() const;
    const Edges& margin() const;
    // Extent of the content.
    Size ScrollSize() const;
    // What the node's own content can touch, view coordinates.
    const Rect& PaintBounds() const;

    // Beyond the depth limit a node takes no part in layout, transforms and painting.
    bool IsBeyondLimit() const { return depth >= limits::kMaxLayoutDepth; }
};
static_assert(sizeof(LayoutNode) == 104);

// Lies right behind the node, the children first: the recording reads on.
struct BoxNode {
    HandleVector children;
    [[no_unique_address]] css::LaidOutStyle style;
    int32_t zIndex = 0;
    int32_t previousZIndex = 0;  // as of the last SyncTrees
    Rect paintBounds{};
    Rect aabb{};  // snapped box and in-flow overflow, document coordinates
    ScrollPosition scroll;
    SharedEdges edges;
    // Made by the transform pass where one child does not tell it all.
    UniquePtr<ChildBounds, MemoryTag::LayoutNodes> below;
    // Present only where the style needs them.
    UniquePtr<Matrix, MemoryTag::LayoutNodes> local;
    UniquePtr<Matrix, MemoryTag::LayoutNodes> perspective;
};
static_assert(sizeof(BoxNode) == 136);

class HandleHead {
  protected:
    LayoutStore* store_ = nullptr;
};

// The handle of a text, and the base of a box's.
class LayoutHandle : private HandleHead, private LayoutData, private LayoutNode {
  public:
    LayoutHandle(const LayoutHandle&) = delete;
    LayoutHandle& operator=(const LayoutHandle&) = delete;

    void AddRef() noexcept { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() noexcept;

    // DOM thread.
    LayoutData& data() { return *this; }
    const LayoutData& data() const { return *this; }
    // Layout thread.
    LayoutNode& node() { return *this; }
    const LayoutNode& node() const { return *this; }
    // DOM thread.
    dsp::IDisplayElement* Display() const;
    // The node takes over the style; on the layout side, at the commit.
    void TakeStyle(const css::LaidOutStyle& style);
    // Shared by all handles of a tree; outlives the tree while a handle lives.
    LayoutStore& store() const { return *store_; }

  protected:
    explicit LayoutHandle(bool isBox);
    ~LayoutHandle();

  private:
    friend struct LayoutData;
    friend struct LayoutNode;
    friend class LayoutStore;
    friend class ObjectPool<LayoutHandle>;
    LayoutHandle() : LayoutHandle(false) {}
};
static_assert(sizeof(LayoutHandle) == 160);

class BoxHandle final : public LayoutHandle, private BoxNode, private BoxData {
    friend struct layout::LayoutData;
    friend struct layout::LayoutNode;
    friend class LayoutStore;
    friend class ObjectPool<BoxHandle>;
    BoxHandle();
    ~BoxHandle();
};
static_assert(sizeof(BoxHandle) == 384);

// What a child and its flow cover, in the coordinates of its parent.
Rect ContentOf(const LayoutHandle& child);

inline BoxData& LayoutData::AsBox() {
    assert(isBox);
    return static_cast<BoxHandle&>(static_cast<LayoutHandle&>(*this));
}
inline const BoxData& LayoutData::AsBox() const {
    return const_cast<LayoutData*>(this)->AsBox();
}
inline HandleSpan LayoutData::Children() const {
    if (!isBox) return {};
    const HandleVector& children = AsBox().children;
    return {children.data(), children.size()};
}

inline dsp::IDisplayElement* LayoutHandle::Display() const {
    return LayoutData::isBox ? LayoutData::AsBox().display.get() : LayoutNode::display.get();
}

inline BoxNode& LayoutNode::AsBox() {
    assert(isBox);
    return static_cast<BoxHandle&>(static_cast<LayoutHandle&>(*this));
}
inline const BoxNode& LayoutNode::AsBox() const {
    return const_cast<LayoutNode*>(this)->AsBox();
}
inline HandleSpan LayoutNode::Children() const {
    if (!isBox) return {};
    const HandleVector& children = AsBox().children;
    return {children.data(), children.size()};
}
inline const Matrix* LayoutNode::Local() const {
    return isBox ? AsBox().local.get() : nullptr;
}
inline const Matrix* LayoutNode::Perspective() const {
    return isBox ? AsBox().perspective.get() : nullptr;
}
inline ScrollPosition LayoutNode::Scroll() const {
    return isBox ? AsBox().scroll : ScrollPosition();
}
inline int32_t LayoutNode::ZIndex() const {
    return isBox ? AsBox().zIndex : 0;
}
inline const Edges& LayoutNode::border() const {
    return isBox ? AsBox().edges.border() : SharedEdges::None().border;
}
inline const Edges& LayoutNode::padding() const {
    return isBox ? AsBox().edges.padding() : SharedEdges::None().padding;
}
inline const Edges& LayoutNode::margin() const {
    return isBox ? AsBox().edges.margin() : SharedEdges::None().margin;
}
inline const Rect& LayoutNode::PaintBounds() const {
    return isBox ? AsBox().paintBounds : visualAabb;
}

}  // namespace qorvex::layout
