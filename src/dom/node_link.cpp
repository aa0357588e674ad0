#include "dom/node_link.h"

#include "dom/node.h"

namespace qorvex::dom {

void NodeLink::Release() noexcept {
    if (count_.fetch_sub(1, std::memory_order_acq_rel) == 1) Delete<MemoryTag::DOM>(this);
}

void NodeLink::SetInLayoutTree(bool in_tree) {
    if (node_) node_->SetFlag(kInLayoutTree, in_tree);
}

std::string_view NodeLink::DebugName() const {
    return node_ ? node_->GetNodeName().view() : std::string_view();
}

void NodeLink::Receive(layout::DOMTaskKind, const layout::DOMTaskData&) {
    // Text controls and per-character positions, which are what layout reports, come with their own classes.
}

}  // namespace qorvex::dom
