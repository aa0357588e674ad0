// The attribute selectors ([name], [name=value] and their kin).
#pragma once

#include "css/parser/selector.h"

namespace qorvex::dom {
class Element;
}

namespace qorvex::css {

[[nodiscard]] bool MatchAttribute(const SimpleSelector& simple, const dom::Element& element);

}  // namespace qorvex::css
