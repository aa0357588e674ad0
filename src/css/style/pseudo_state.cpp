#include "css/style/pseudo_state.h"

#include "dom/document.h"
#include "dom/document_host.h"

namespace qorvex::css {

void PseudoState::Take(const dom::Document& document) {
    SetFocused(document.GetFocusedElement());
    SetHovered(document.GetHost().GetHoveredNode());
    SetActive(document.GetHost().GetActiveNode());
}

void PseudoState::Forget() {
    hoverChain_.clear();
    activeChain_.clear();
    focused_ = nullptr;
}

void PseudoState::FillChain(const dom::Node* node, Chain& chain) {
    chain.clear();
    if (!node || !node->IsInDocument()) return;
    for (; node && !node->Is(dom::kIsDocument); node = node->GetParent()) {
        if (node->IsElement()) chain.push_back(static_cast<const dom::Element*>(node));
    }
}

uint8_t PseudoState::BitsOf(const dom::Element& element) const {
    uint8_t bits = kPseudoSelection;
    if (element.GetTag() == TagId::Html) bits |= kPseudoRoot;
    if (hoverChain_.contains(&element)) bits |= kPseudoHover;
    if (activeChain_.contains(&element)) bits |= kPseudoActive;
    if (focused_ == &element) bits |= kPseudoFocus;
    return bits;
}

}  // namespace qorvex::css
