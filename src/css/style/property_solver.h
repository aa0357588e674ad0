// From what was matched, animated and inherited to the computed value of one property of one element.
//
// Invariant: a value is only looked at, never owned: it lies in a declaration, in a style group of the parent
// or of the defaults, in a record of animated values, or in the scratch fields below, which the next property
// reuses.
#pragma once

#include <cstdint>

#include "css/style/custom_expressions.h"
#include "css/values/layout_style_refs.h"
#include "css/values/match_state.h"

namespace qorvex::css {

class AnimatedProperties;
class TransitionProperties;
class RootStyles;

enum class ValueSource : uint8_t {
    Declaration = 0,
    Inherited = 1,
    Initial = 2,
    Animation = 3,
    Transition = 4,
    Unchanged = 5,
};

// Counted for tests and statistics; never reset by the engine itself.
struct StyleCounters {
    uint64_t elementsMatched = 0;
    uint64_t elementsSolved = 0;  // that went through a path, not only past it
    uint64_t stylesShared = 0;    // of those, how many took the groups of an equal element
    uint64_t textNodesSolved = 0;
    uint64_t propertiesApplied = 0;
    uint64_t propertiesChanged = 0;
};

struct PropertyInputs {
    LayoutStyleRefs& style;
    const LayoutStyleRefs& parent;
    const MatchState& match;
    const AnimatedProperties* animated;
    TransitionProperties* transition;
    bool firstSolve;  // an element's first solve never shows a transition
    ExpressionContext expressions;
    // Set where the parent is html or body, whose groups hold some values as propagated, not as cascaded.
    const RootStyles* parentRoot = nullptr;
    bool parentIsHtml = false;
};

class PropertySolver {
  public:
    PropertySolver(const PropertyInputs& inputs, StyleCounters& counters)
        : in_(inputs), counters_(counters) {}

    // Computes and stores; what happened as a code, what it means as dom::ChangeMask bits in `mask`.
    ValueSource Apply(PropertyId id, uint32_t& mask);

    // The value that the cascade gives, animations included, without storing it.
    const void* Compute(PropertyId id, ValueSource& source);
    template <PropertyId id>
    typename PropertyTraits<id>::Type Compute(ValueSource& source) {
        return *static_cast<const typename PropertyTraits<id>::Type*>(Compute(id, source));
    }

  private:
    const void* FromCascade(PropertyId id, ValueSource& source);
    const void* FromParent(PropertyId id);
    const void* ThroughTransition(PropertyId id, const void* value, ValueSource& source, uint32_t& mask);

    const PropertyInputs& in_;
    StyleCounters& counters_;

    // What a property inherits when it is not the parent's field as it stands.
    Length inheritedLength_;
    FontWeight inheritedWeight_ = FontWeight::Normal;
    LetterSpacing inheritedSpacing_;
    LineHeight inheritedLineHeight_;
    Declaration evaluated_;
};

}  // namespace qorvex::css
