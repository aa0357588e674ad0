#include "layout/layout_store.h"

#include "display/resolved_visuals.h"

#include <yoga/Yoga.h>

namespace qorvex::layout {

LayoutStore::LayoutStore() : config_(YGConfigNew()) {
    // Snapping to pixels is ours, after layout.
    YGConfigSetPointScaleFactor(config_, 0);
}

LayoutStore::~LayoutStore() {
    YGConfigFree(config_);
}

HandlePtr LayoutStore::MakeHandle(bool isBox) {
    const std::lock_guard lock(mutex_);
    LayoutHandle* handle = isBox ? boxes_.Make() : texts_.Make();
    AddRef();
    handle->store_ = this;
    return qsl::AdoptRef(handle);
}

void LayoutStore::MakeFlexNode(LayoutHandle& handle) {
    YGNode* node = YGNodeNewWithConfig(config_);
    YGNodeSetContext(node, &handle);
    handle.node().flex = node;
}

void LayoutStore::FreeFlexNode(LayoutNode& node) noexcept {
    if (node.flex == nullptr) return;
    if (YGNode* owner = YGNodeGetOwner(node.flex)) YGNodeRemoveChild(owner, node.flex);
    YGNodeRemoveAllChildren(node.flex);
    YGNodeFree(node.flex);
    node.flex = nullptr;
}

// Children lose a reference each; those that die with it join a list, so that a page's deep tree costs no
// deep stack. The list runs through the parent links, which mean nothing any more in a dead handle.
void LayoutStore::Destroy(LayoutHandle* first) noexcept {
    uint32_t died = 0;
    first->data().parent = nullptr;
    for (LayoutHandle* handle = first; handle != nullptr;) {
        LayoutHandle* next = handle->data().parent;
        auto drop = [&](HandleVector& children, bool dataSide) {
            for (HandlePtr& child : children) {
                LayoutHandle* raw = child.leak();
                if (dataSide && raw->data().parent == handle) raw->data().parent = nullptr;
                if (!dataSide && raw->node().parent == handle) raw->node().parent = nullptr;
                if (raw->count_.fetch_sub(1, std::memory_order_acq_rel) != 1) continue;
                raw->data().parent = next;
                next = raw;
            }
            children.clear();
        };
        const bool isBox = handle->node().isBox;
        if (isBox) {
            drop(handle->data().AsBox().children, true);
            drop(handle->node().AsBox().children, false);
        }
        {
            const std::lock_guard lock(mutex_);
            FreeFlexNode(handle->node());
            isBox ? boxes_.Recycle(static_cast<BoxHandle*>(handle)) : texts_.Recycle(handle);
        }
        ++died;
        handle = next;
    }
    while (died-- > 0)
        Release();
}

void LayoutHandle::Release() noexcept {
    if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) store_->Destroy(this);
}

}  // namespace qorvex::layout
