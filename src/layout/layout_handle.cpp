#include "layout/layout_handle.h"

#include "display/resolved_visuals.h"
#include "layout/layout_store.h"

#include <algorithm>
#include <bit>

namespace qorvex::layout {

namespace {

bool Same(const Edges& a, const Edges& b) {
    return a.left == b.left && a.right == b.right && a.top == b.top && a.bottom == b.bottom;
}
bool Same(const BoxEdges& a, const BoxEdges& b) {
    return Same(a.border, b.border) && Same(a.padding, b.padding) && Same(a.margin, b.margin);
}
bool Same(const Matrix& a, const Matrix& b) {
    return std::equal(a.m, a.m + 16, b.m);
}

// Of a text that no commit has seen.
const css::LaidOutStyle kNoStyle;

void ReleaseStyle(const css::LaidOutStyle* style) {
    if (style != &kNoStyle) static_cast<const css::SharedStyle*>(style)->Release();
}

}  // namespace

LayoutData::LayoutData(bool box) : isBox(box) {}
LayoutNode::LayoutNode(bool box) : isBox(box), style(&kNoStyle) {}

LayoutHandle::LayoutHandle(bool isBox) : LayoutData(isBox), LayoutNode(isBox) {}

LayoutHandle::~LayoutHandle() {
    if (!LayoutNode::isBox) ReleaseStyle(LayoutNode::style);
}

void LayoutHandle::TakeStyle(const css::LaidOutStyle& style) {
    if (LayoutNode::isBox) {
        LayoutNode::AsBox().style = style;
        return;
    }
    css::SharedStylePtr shared = store_->textStyles.Get(style);
    ReleaseStyle(LayoutNode::style);
    LayoutNode::style = shared.leak();
}

BoxHandle::BoxHandle() : LayoutHandle(true) {
    node().style = &node().AsBox().style;
}

BoxHandle::~BoxHandle() = default;

Rect ContentOf(const LayoutHandle& child) {
    const LayoutNode& node = child.node();
    if (!node.isBox) return child.store().snapsToPixels ? SnapToPixels(node.box) : node.box;
    const BoxNode& box = node.AsBox();
    return box.local ? MapBounds(*box.local, box.aabb) : box.aabb;
}

Size LayoutNode::ScrollSize() const {
    if (!isBox) return {};
    const BoxNode& own = AsBox();
    if (own.below) return {own.below->sum.content.width, own.below->sum.content.height};
    if (own.children.size() != 1) return {};
    const Rect content = ContentOf(*own.children[0]);
    return {content.width, content.height};
}

void SharedEdges::Set(const BoxEdges& edges, EdgesCache& cache) {
    if (Same(edges, Get())) return;
    if (Same(edges, kNone)) return record_.reset();
    const float sum =
        edges.border.top + 3 * edges.padding.top + 5 * edges.margin.top + 7 * edges.padding.left;
    EdgesPtr& place = cache[std::bit_cast<uint32_t>(sum) * 0x9E3779B1u >> 28];
    if (!place || !Same(place->value, edges)) place = MakeRef<SharedRecord<BoxEdges>>(edges);
    record_ = place;
}

bool WorldMatrix::Share(const WorldMatrix& other) {
    if (record_ == other.record_) return false;
    record_ = other.record_;
    owns_ = false;
    return true;
}

bool WorldMatrix::Set(const Matrix& matrix) {
    if (Same(Get(), matrix)) return false;
    if (owns_) {
        record_->value = matrix;
    } else {
        record_ = MakeRef<SharedRecord<Matrix>>(matrix);
        owns_ = true;
    }
    return true;
}

}  // namespace qorvex::layout
