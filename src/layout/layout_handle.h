// One element's or text node's place in the layout tree, in two halves that no two threads touch at once.
//
// LayoutData is written on the DOM thread only (also by the commit and SyncTrees, which run there while the
// layout side is idle). LayoutNode is written by tasks on the layout channel only, while no commit or
// SyncTrees runs; those two are the only code that touches both. So neither half has a lock: only the counts
// of handles, style groups, node links and display elements are atomic.
//
// Owners of a handle: its element, the child vector of its parent's halves, change sets and tasks. Both
// halves return to the pools of the tree's store in one step with the handle.
#pragma once

#include "core/limits.h"
#include "core/memory/containers.h"
#include "css/values/layout_style_refs.h"
#include "display/display_element.h"
#include "layout/geometry.h"
#include "layout/node_link.h"
#include "qsl/ref_ptr.h"

#include <atomic>
#include <cstdint>

struct YGNode;

namespace qorvex::dsp {
struct ResolvedVisuals;
}

namespace qorvex::layout {

class LayoutHandle;
class LayoutStore;
class LayoutTree;
using HandlePtr = qsl::RefPtr<LayoutHandle>;
using HandleVector = Vector<HandlePtr, MemoryTag::LayoutNodes>;

// Facts that follow from a node's style alone. Computed on the layout side, mirrored to the DOM side.
struct NodeFlags {
    bool isPositioned = false;  // position is not static
    bool isFixed = false;
    bool isAbsolute = false;
    bool shouldOverflowClip = false;        // either overflow axis is not visible
    bool containsFixedDescendants = false;  // has a transform, a perspective or a filter
    bool preserves3d = false;
    bool measuredByDisplayElement = false;
};

// The geometry that scripts read. Left and Top are in document coordinates, before transforms and scrolling.
struct LayoutResult {
    float left = 0;
    float top = 0;
    float width = 0;
    float height = 0;
    Edges border;
    Edges padding;
    Edges margin;
    Rect aabb{};
    Rect visualAabb{};
    Rect viewBox{};  // the box under its transforms and the scrolling of its ancestors, in view coordinates
    Size scrollSize;
};

struct LayoutData {
    LayoutHandle* parent = nullptr;
    HandleVector children;  // DOM order among the siblings that have handles
    css::LayoutStyleRefs style;
    dsp::DisplayElementPtr display;
    ScrollPosition scroll;
    Size measuredSize;
    NodeFlags flags;
    bool establishesStackingContext = false;
    bool isImage = false;
    int32_t zIndex = 0;
    bool changed = false;  // an edit that the next commit must carry over
    LayoutResult result;
    NodeLinkPtr node;
    bool inTree = false;
};

// Union of the bounds of some neighbouring children, so that one changed child of ten thousand costs the look
// at its group and not at all its siblings.
struct ChildGroup {
    Rect content{};
    Rect visual{};
    bool dirty = true;
};
inline constexpr uint32_t kChildGroup = 64;

struct LayoutNode {
    LayoutHandle* parent = nullptr;
    HandleVector children;
    YGNode* flex = nullptr;  // its context points back at the handle
    css::LayoutStyleRefs style;
    dsp::DisplayElementPtr display;
    ScrollPosition scroll;
    ScrollPosition appliedScroll;  // under which the children's matrices were made
    NodeFlags flags;
    bool transformDirty = false;
    bool establishesStackingContext = false;
    int32_t zIndex = 0;
    bool previousStacking = false;  // as of the last SyncTrees
    int32_t previousZIndex = 0;

    Rect box{};  // document coordinates; z and the pixel grid play no part yet
    Edges border;
    Edges padding;
    Edges margin;
    Size scrollSize;
    Rect aabb{};           // snapped box and in-flow overflow, document coordinates
    Rect paintBounds{};    // what the node's own content can touch, view coordinates
    Rect visualAabb{};     // the same with its subtree
    Rect contentBounds{};  // of the children: their aabb, document coordinates
    // Bounds of kChildGroup children each, kept only by nodes with more children than that.
    Vector<ChildGroup, MemoryTag::LayoutNodes> groups;
    Matrix world;
    // Present only where the style needs them.
    UniquePtr<Matrix, MemoryTag::LayoutNodes> local;
    UniquePtr<Matrix, MemoryTag::LayoutNodes> perspective;
    UniquePtr<dsp::ResolvedVisuals, MemoryTag::LayoutNodes> visuals;

    // One frame long; SyncTrees clears them.
    bool visualChanged = false;
    bool rectChanged = false;
    bool boxMetricsChanged = false;

    // Place among the parent's children, for the bounds that the parent keeps by groups of children.
    uint32_t index = 0;
    // Depth below the root, which is 0. Nodes at kMaxLayoutDepth and deeper keep zero boxes.
    uint32_t depth = 0;
    // Sticky and conservative: there is an absolute or fixed box below, whose containing block may lie above
    // this node. When it is set here, it is set on all ancestors.
    bool absoluteBelow = false;
    // The transform pass must look at this node, or somewhere below it.
    bool needsTransform = true;
    bool descendantNeedsTransform = false;
    // The commit gave the node other children, so what their bounds add up to is not known.
    bool childrenChanged = false;
    // Beyond the depth limit a node takes no part in layout, transforms and painting.
    bool IsBeyondLimit() const { return depth >= limits::kMaxLayoutDepth; }
};

class LayoutHandle {
  public:
    LayoutHandle(const LayoutHandle&) = delete;
    LayoutHandle& operator=(const LayoutHandle&) = delete;

    void AddRef() noexcept { count_.fetch_add(1, std::memory_order_relaxed); }
    void Release() noexcept;

    // DOM thread.
    LayoutData& data() { return *data_; }
    const LayoutData& data() const { return *data_; }
    // Layout thread.
    LayoutNode& node() { return *node_; }
    const LayoutNode& node() const { return *node_; }
    // Shared by all handles of a tree; outlives the tree while a handle lives.
    LayoutStore& store() const { return *store_; }

  private:
    friend class LayoutStore;
    LayoutHandle() = default;

    std::atomic<uint32_t> count_{1};
    LayoutStore* store_ = nullptr;
    LayoutData* data_ = nullptr;
    LayoutNode* node_ = nullptr;
};

}  // namespace qorvex::layout
