#include "layout/flex_children.h"

#include "core/logging/log.h"
#include "core/memory/temp_vector.h"
#include "layout/flex_measure.h"
#include "layout/layout_store.h"

#include <yoga/Yoga.h>

#include <algorithm>

namespace qorvex::layout {

namespace {

// Yoga asks such a node for its size and takes no children for it.
bool IsMeasured(const LayoutNode& node) {
    return node.flags.measuredByDisplayElement || node.flags.isReplaced;
}

// Measured nodes are leaves to Yoga, and so is the last level that takes part in layout.
uint32_t FlexChildCount(const LayoutNode& node) {
    const bool leaf = IsMeasured(node) || node.depth + 1 >= limits::kMaxLayoutDepth;
    return leaf ? 0 : static_cast<uint32_t>(node.children.size());
}

void ReportDepth(LayoutHandle& handle) {
    if (handle.store().reportedDepth) return;
    handle.store().reportedDepth = true;
    LogWarning("Elements are nested deeper than ", limits::kMaxLayoutDepth,
               " levels; deeper ones are not laid out.");
}

}  // namespace

// The children that come anew to Yoga are added to `made`.
static void SyncOneLevel(LayoutHandle& handle, const HandleSet* changed, TempVector<LayoutHandle*>& made) {
    LayoutNode& node = handle.node();
    YGNode* owner = node.flex;
    if (!IsMeasured(node)) YGNodeSetMeasureFunc(owner, nullptr);
    const uint32_t wanted = FlexChildCount(node);
    if (wanted == 0 && !node.children.empty() && !IsMeasured(node)) ReportDepth(handle);
    const bool flows = node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren);
    if (flows) handle.store().flowsText = true;
    // What a paragraph flows is no child of its node, but the flow asks Yoga for edges and sizes of it.
    const uint32_t known = flows ? static_cast<uint32_t>(node.children.size()) : wanted;
    for (uint32_t i = 0; i < known; ++i) {
        LayoutHandle& child = *node.children[i];
        if (child.node().flex != nullptr) continue;
        child.store().MakeFlexNode(child);
        if (changed && !changed->Contains(&child)) child.store().flexStylesMissing = true;
        made.push_back(&child);
    }
    uint32_t present = static_cast<uint32_t>(YGNodeGetChildCount(owner));
    uint32_t prefix = 0;
    while (prefix < wanted && prefix < present &&
           YGNodeGetChild(owner, prefix) == node.children[prefix]->node().flex)
        ++prefix;
    uint32_t suffix = 0;
    while (suffix < wanted - prefix && suffix < present - prefix &&
           YGNodeGetChild(owner, present - 1 - suffix) == node.children[wanted - 1 - suffix]->node().flex)
        ++suffix;
    if (prefix == 0 && suffix == 0 && present > 0) {
        // One pass instead of one search a child.
        YGNodeRemoveAllChildren(owner);
        present = 0;
    }
    for (uint32_t i = present - suffix; i-- > prefix;)
        YGNodeRemoveChild(owner, YGNodeGetChild(owner, i));
    for (uint32_t i = prefix; i < wanted - suffix; ++i) {
        YGNode* child = node.children[i]->node().flex;
        // A child that moved here may still stand in its former parent's list, whose turn comes later.
        if (YGNode* former = YGNodeGetOwner(child)) YGNodeRemoveChild(former, child);
        YGNodeInsertChild(owner, child, i);
    }
    if (IsMeasured(node) && !YGNodeHasMeasureFunc(owner)) YGNodeSetMeasureFunc(owner, MeasureFlexNode);
}

static void SyncFlexTree(LayoutHandle& handle, const HandleSet* changed) {
    const TempMark mark;
    TempVector<LayoutHandle*> stack;
    stack.push_back(&handle);
    while (!stack.empty()) {
        LayoutHandle* next = stack.back();
        stack.pop_back();
        SyncOneLevel(*next, changed, stack);
    }
}

void SyncFlexChildren(LayoutHandle& handle, const HandleSet& changed) {
    if (handle.node().flex != nullptr) SyncFlexTree(handle, &changed);
}

bool EnsureFlexTree(LayoutHandle& handle) {
    if (handle.node().flex != nullptr) return false;
    handle.store().MakeFlexNode(handle);
    SyncFlexTree(handle, nullptr);
    return true;
}

void UpdateDepths(LayoutHandle& top, const HandleSet& changed) {
    const TempMark mark;
    TempVector<LayoutHandle*> stack;
    stack.push_back(&top);
    while (!stack.empty()) {
        LayoutHandle* parent = stack.back();
        stack.pop_back();
        LayoutNode& node = parent->node();
        for (uint32_t i = 0; i < node.children.size(); ++i) {
            LayoutNode& child = node.children[i]->node();
            child.index = i;
            const bool moved = child.depth != node.depth + 1;
            child.depth = node.depth + 1;
            if (child.IsBeyondLimit()) child.box = child.aabb = child.paintBounds = child.visualAabb = {};
            if (moved || changed.Contains(node.children[i].get())) stack.push_back(node.children[i].get());
        }
        if (!changed.Contains(parent)) SyncFlexChildren(*parent, changed);
    }
}

}  // namespace qorvex::layout
