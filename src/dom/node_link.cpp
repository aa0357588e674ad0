#include "dom/node_link.h"

#include "dom/document.h"
#include "layout/dom_tasks.h"

namespace qorvex::dom {

void NodeLink::Release() noexcept {
    if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) Give(this);
}

void NodeLink::SetInLayoutTree(bool in_tree) {
    if (node_) node_->SetFlag(kInLayoutTree, in_tree);
}

std::string_view NodeLink::DebugName() const {
    return node_ ? node_->GetMarkupName().view() : std::string_view();
}

void NodeLink::Receive(layout::DOMTaskKind kind, const layout::DOMTaskData&) {
    if (kind == layout::DOMTaskKind::FontArrived && node_ && node_->IsElement() && node_->IsInDocument()) {
        // The next solve asks for the faces of the family list again.
        static_cast<Element*>(node_)->GetDirtyProperties().Add(css::PropertyId::FontFamily);
        node_->GetDocument()->MarkNodeDirty(*node_);
        return;
    }
    // What else layout reports goes to texts and text controls, which come with their own classes.
}

}  // namespace qorvex::dom
