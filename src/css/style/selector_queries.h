// matches, closest, querySelector and querySelectorAll. Parsed selectors are kept, since scripts ask the same
// question again and again.
//
// Deviations from DOM, 4.2.6 that pages rely on: closest starts at the parent; with a selector list,
// querySelector answers for the first selector that matches anything, and querySelectorAll groups its answer
// by selector.
#pragma once

#include "core/memory/string_pool.h"
#include "css/parser/selector.h"
#include "css/style/sibling_memo.h"

namespace qorvex::dom {
class Element;
class Node;
}  // namespace qorvex::dom

namespace qorvex::css {

class SelectorQueries {
  public:
    explicit SelectorQueries(StringPool& strings) : strings_(strings) {}

    [[nodiscard]] bool Matches(dom::Element& element, std::string_view text);
    [[nodiscard]] dom::Element* Closest(dom::Element& element, std::string_view text);
    [[nodiscard]] dom::Element* QuerySelector(dom::Node& root, std::string_view text);
    void QuerySelectorAll(dom::Node& root, std::string_view text,
                          Vector<dom::Element*, MemoryTag::DOM>& matches);

  private:
    using SelectorList = CssVector<ComplexSelector>;
    // Borrowed until the next call; null, with the fault logged, for a text that is no selector.
    const SelectorList* Parse(std::string_view text, std::string_view operation);

    StringPool& strings_;
    CssHashMap<CssString, SelectorList> cache_;
    SiblingMemo siblings_;
};

}  // namespace qorvex::css
