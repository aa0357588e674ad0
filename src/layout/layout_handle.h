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
using HandleVector = Vector<HandlePtr, MemoryTag::Layout>;

// Facts that follow from a node's style alone. Computed on the layout side, mirrored to the DOM side.
struct NodeFlags {
    bool is_positioned = false;  // position is not static
    bool is_fixed = false;
    bool is_absolute = false;
    bool should_overflow_clip = false;        // either overflow axis is not visible
    bool contains_fixed_descendants = false;  // has a transform, a perspective or a filter
    bool preserves_3d = false;
    bool measured_by_display_element = false;
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
    Rect visual_aabb{};
    Size scroll_size;
};

struct LayoutData {
    LayoutHandle* parent = nullptr;
    HandleVector children;  // DOM order among the siblings that have handles
    css::LayoutStyleRefs style;
    dsp::DisplayElementPtr display;
    ScrollPosition scroll;
    Size measured_size;
    NodeFlags flags;
    bool establishes_stacking_context = false;
    bool is_image = false;
    int32_t z_index = 0;
    bool changed = false;  // an edit that the next commit must carry over
    LayoutResult result;
    NodeLinkPtr node;
    bool in_tree = false;
};

struct LayoutNode {
    LayoutHandle* parent = nullptr;
    HandleVector children;
    YGNode* flex = nullptr;  // its context points back at the handle
    css::LayoutStyleRefs style;
    dsp::DisplayElementPtr display;
    ScrollPosition scroll;
    NodeFlags flags;
    bool transform_dirty = false;
    bool establishes_stacking_context = false;
    int32_t z_index = 0;
    bool previous_stacking = false;  // as of the last SyncTrees
    int32_t previous_z_index = 0;

    Rect box{};  // document coordinates; z and the pixel grid play no part yet
    Edges border;
    Edges padding;
    Edges margin;
    Size scroll_size;
    Rect aabb{};         // snapped box and in-flow overflow, document coordinates
    Rect visual_aabb{};  // what the node and its subtree can touch, view coordinates
    Matrix world = Matrix::Identity();
    // Present only where the style needs them.
    UniquePtr<Matrix, MemoryTag::Layout> local;
    UniquePtr<Matrix, MemoryTag::Layout> perspective;
    UniquePtr<dsp::ResolvedVisuals, MemoryTag::Layout> visuals;

    // One frame long; SyncTrees clears them.
    bool visual_changed = false;
    bool rect_changed = false;
    bool box_metrics_changed = false;

    // Depth below the root, which is 0. Nodes at kMaxLayoutDepth and deeper keep zero boxes.
    uint32_t depth = 0;
    // Sticky and conservative: some absolute or fixed box below has its containing block above this node.
    bool absolute_below = false;
    // The transform pass must look at this node, or somewhere below it.
    bool needs_transform = true;
    bool descendant_needs_transform = false;
    // Recalculation of VisualAABB alone, for nodes whose paint changed but whose box did not.
    bool needs_visual_bounds = false;

    dsp::IDisplayElement* Display() const { return display.get(); }
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

    std::atomic<uint32_t> count_{0};
    LayoutStore* store_ = nullptr;
    LayoutData* data_ = nullptr;
    LayoutNode* node_ = nullptr;
};

}  // namespace qorvex::layout
