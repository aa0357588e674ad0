// What the pointer and the focus say about elements, taken once per matching batch.
//
// Invariant: it names elements by address and lives no longer than its batch, in which no script runs, so a
// node that dies later cannot be reached from it.
#pragma once

#include "core/memory/containers.h"

namespace qorvex::dom {
class Document;
class Element;
class Node;
}  // namespace qorvex::dom

namespace qorvex::css {

// Codes of the pseudo classes as selectors store them; an element's state has bit `1 << code`.
enum PseudoBits : uint8_t {
    kPseudoHover = 1 << 1,
    kPseudoRoot = 1 << 2,
    kPseudoSelection = 1 << 3,
    kPseudoActive = 1 << 4,
    kPseudoFocus = 1 << 5,
};

class PseudoState {
  public:
    PseudoState() = default;
    explicit PseudoState(const dom::Document& document) { Take(document); }
    // What holds in the document now. The room for the chains is kept from batch to batch.
    void Take(const dom::Document& document);
    void Forget();

    // The bits that hold for the element now. `selection` is no state and always holds.
    uint8_t BitsOf(const dom::Element& element) const;

    void SetHovered(const dom::Node* node) { FillChain(node, hoverChain_); }
    void SetActive(const dom::Node* node) { FillChain(node, activeChain_); }
    void SetFocused(const dom::Element* element) { focused_ = element; }

  private:
    // The node, if it is an element, and its element ancestors below the document.
    using Chain = SmallVector<const dom::Element*, 8, MemoryTag::CSS>;
    static void FillChain(const dom::Node* node, Chain& chain);

    Chain hoverChain_;
    Chain activeChain_;
    const dom::Element* focused_ = nullptr;
};

}  // namespace qorvex::css
