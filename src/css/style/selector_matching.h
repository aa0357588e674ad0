// Does a selector match an element?
//
// Deviations from Selectors Level 4 that pages rely on: a descendant combinator takes the nearest matching
// ancestor and does not come back for a higher one when the rest then fails.
//
// Invariants: matching never recurses and never backtracks over more than the siblings of one element, so its
// cost is bounded by the selector times the siblings and ancestors looked at; over a whole pass each sibling is
// looked at a fixed number of times.
#pragma once

#include "css/parser/selector.h"
#include "css/style/pseudo_state.h"
#include "css/style/sibling_memo.h"

namespace qorvex::css {

// One pass of matching. Without a memo each element walks its siblings anew, which is right for one or a few.
// All calls of one pass record dependencies, or none does: what was looked at once is not asked again.
struct MatchContext {
    explicit MatchContext(const PseudoState& state, SiblingMemo* memo = nullptr)
        : pseudo(state), siblings(memo) {
        if (siblings) siblings->BeginPass();
    }

    const PseudoState& pseudo;
    SiblingMemo* siblings;
};

// With `recordDependencies` the elements whose pseudo state was asked are marked as depending on it, so that
// a change of hover, activity or focus knows whom to match again.
[[nodiscard]] bool MatchSelector(const ComplexSelector& selector, dom::Element& element,
                                 MatchContext& context, bool recordDependencies);

}  // namespace qorvex::css
