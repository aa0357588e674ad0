#include "dom/node_link.h"

#include "dom/character_data.h"
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

void NodeLink::Receive(layout::DOMTaskKind kind, const layout::DOMTaskData& data) {
    using layout::DOMTaskKind;
    const bool ofText =
        kind == DOMTaskKind::UpdateTextPositionsInDOM || kind == DOMTaskKind::UpdateFontStyleDataInDOM;
    if (ofText && node_ && node_->Is(kIsText)) {
        auto& text = static_cast<Text&>(*node_);
        // Blocks are immutable once sent; the node only shares this one.
        auto& shared = const_cast<layout::DOMTaskData&>(data);
        if (kind == DOMTaskKind::UpdateTextPositionsInDOM)
            text.TakeTextPositions(qsl::RefPtr(&static_cast<layout::TextPositions&>(shared)));
        else
            text.TakeFontStyle(qsl::RefPtr(&static_cast<layout::TextFontStyle&>(shared)));
        return;
    }
    if (kind == layout::DOMTaskKind::FontArrived && node_ && node_->IsElement() && node_->IsInDocument()) {
        // The next solve asks for the faces of the family list again.
        static_cast<Element*>(node_)->GetDirtyProperties().Add(css::PropertyId::FontFamily);
        node_->GetDocument()->MarkNodeDirty(*node_);
        return;
    }
    // Text controls, which are what else layout reports to, come with their own classes.
}

}  // namespace qorvex::dom
