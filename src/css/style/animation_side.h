// What style solving tells those who run animations and transitions, which live on a higher floor.
#pragma once

#include <span>

namespace qorvex::dom {
class Document;
class Node;
}  // namespace qorvex::dom

namespace qorvex::css {

class IAnimationSide {
  public:
    // The elements' transition records have new end values; transitions to these start now.
    virtual void RetargetTransitions(std::span<dom::Node* const> elements) = 0;
    // The animation or transition fields of these elements changed, or they came into the layout or left it.
    // Nodes whose values this changes are marked dirty on the document and solved in the same frame.
    virtual void UpdateAnimations(dom::Document& document, std::span<dom::Node* const> animations,
                                  std::span<dom::Node* const> transitions) = 0;

  protected:
    ~IAnimationSide() = default;
};

}  // namespace qorvex::css
