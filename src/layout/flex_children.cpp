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
    return leaf ? 0 : static_cast<uint32_t>(node.Children().size());
}

bool FlowsChildren(const LayoutNode& node) {
    return node.display && node.display->Has(dsp::IDisplayElement::kFlowsChildren);
}

void ReportDepth(LayoutHandle& handle) {
    if (handle.store().reportedDepth) return;
    handle.store().reportedDepth = true;
    LogWarning("Elements are nested deeper than ", limits::kMaxLayoutDepth,
               " levels; deeper ones are not laid out.");
}

}  // namespace

// Children that Yoga has to know: what a paragraph flows is no child of its node, but the flow asks Yoga for
// edges and sizes of it.
static uint32_t KnownChildCount(const LayoutNode& node) {
    return FlowsChildren(node) ? static_cast<uint32_t>(node.Children().size()) : FlexChildCount(node);
}

static void SyncOneLevel(LayoutHandle& handle) {
    LayoutNode& node = handle.node();
    YGNode* owner = node.flex;
    if (!IsMeasured(node)) YGNodeSetMeasureFunc(owner, nullptr);
    const uint32_t wanted = FlexChildCount(node);
    if (wanted == 0 && !node.Children().empty() && !IsMeasured(node)) ReportDepth(handle);
    if (FlowsChildren(node)) handle.store().flowsText = true;
    uint32_t present = static_cast<uint32_t>(YGNodeGetChildCount(owner));
    const HandleSpan children = node.Children();
    uint32_t prefix = 0;
    while (prefix < wanted && prefix < present &&
           YGNodeGetChild(owner, prefix) == children[prefix]->node().flex)
        ++prefix;
    uint32_t suffix = 0;
    while (suffix < wanted - prefix && suffix < present - prefix &&
           YGNodeGetChild(owner, present - 1 - suffix) == children[wanted - 1 - suffix]->node().flex)
        ++suffix;
    if (prefix == 0 && suffix == 0 && present > 0) {
        // One pass instead of one search a child.
        YGNodeRemoveAllChildren(owner);
        present = 0;
    }
    for (uint32_t i = present - suffix; i-- > prefix;)
        YGNodeRemoveChild(owner, YGNodeGetChild(owner, i));
    for (uint32_t i = prefix; i < wanted - suffix; ++i) {
        YGNode* child = children[i]->node().flex;
        // A child that moved here may still stand in its former parent's list, whose turn comes later.
        if (YGNode* former = YGNodeGetOwner(child)) YGNodeRemoveChild(former, child);
        YGNodeInsertChild(owner, child, i);
    }
    if (IsMeasured(node) && !YGNodeHasMeasureFunc(owner)) YGNodeSetMeasureFunc(owner, MeasureFlexNode);
}

// Yoga's nodes are made in the order of the tree: at the end of every run it walks all of them in that order,
// which costs half as much again where they lie scattered.
static void SyncFlexTree(LayoutHandle& handle, const HandleSet* changed) {
    const TempMark mark;
    TempVector<LayoutHandle*> stack;
    TempVector<LayoutHandle*> fresh;
    stack.push_back(&handle);
    fresh.push_back(&handle);
    while (!stack.empty()) {
        LayoutHandle* parent = stack.back();
        stack.pop_back();
        if (parent->node().flex == nullptr) {
            parent->store().MakeFlexNode(*parent);
            if (changed && !changed->Contains(parent)) parent->store().flexStylesMissing = true;
            fresh.push_back(parent);
        }
        for (uint32_t i = KnownChildCount(parent->node()); i-- > 0;) {
            LayoutHandle* child = parent->node().Children()[i].get();
            if (child->node().flex == nullptr) stack.push_back(child);
        }
    }
    for (LayoutHandle* parent : fresh)
        SyncOneLevel(*parent);
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

static void ForgetBox(LayoutNode& node) {
    node.box = node.visualAabb = {};
    if (node.isBox) node.AsBox().aabb = node.AsBox().paintBounds = {};
}

void UpdateDepths(LayoutHandle& top, const HandleSet& changed) {
    const TempMark mark;
    TempVector<LayoutHandle*> stack;
    stack.push_back(&top);
    while (!stack.empty()) {
        LayoutHandle* parent = stack.back();
        stack.pop_back();
        LayoutNode& node = parent->node();
        const HandleSpan children = node.Children();
        for (uint32_t i = 0; i < children.size(); ++i) {
            LayoutNode& child = children[i]->node();
            child.index = i;
            const bool moved = child.depth != node.depth + 1;
            child.depth = node.depth + 1;
            if (child.IsBeyondLimit()) ForgetBox(child);
            if (moved || changed.Contains(children[i].get())) stack.push_back(children[i].get());
        }
        if (!changed.Contains(parent)) SyncFlexChildren(*parent, changed);
    }
}

}  // namespace qorvex::layout
