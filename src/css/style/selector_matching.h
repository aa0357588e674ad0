// Does a selector match an element?
//
// Deviations from Selectors Level 4 that pages rely on: a descendant combinator takes the nearest matching
// ancestor and does not come back for a higher one when the rest then fails.
//
// Invariants: matching never recurses and never backtracks over more than the siblings of one element, so its
// cost is bounded by the selector times the siblings and ancestors looked at.
#pragma once

#include "css/parser/selector.h"
#include "css/style/pseudo_state.h"

namespace qorvex::css {

// For a batch of matching in document order: remembers where the last element stood among its siblings, so
// that the walk to its neighbours does not search the parent's children each time.
struct MatchContext {
    explicit MatchContext(const PseudoState& state) : pseudo(state) {}

    const PseudoState& pseudo;
    const dom::Node* hintParent = nullptr;
    size_t hintIndex = 0;
};

// With `recordDependencies` the elements whose pseudo state was asked are marked as depending on it, so that
// a change of hover, activity or focus knows whom to match again.
[[nodiscard]] bool MatchSelector(const ComplexSelector& selector, dom::Element& element,
                                 MatchContext& context, bool recordDependencies);

}  // namespace qorvex::css
