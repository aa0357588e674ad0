// Selectors of the syntax tree to their matching form.
#pragma once

#include <optional>

#include "css/parser/selector.h"
#include "css/parser/syntax.h"

namespace qorvex::css {

// Nothing, with a log line, when a part of it is not supported: that voids the whole selector.
[[nodiscard]] std::optional<ComplexSelector> ConvertComplexSelector(const SelectorSyntax& syntax,
                                                                    StringPool& strings);

// Whether any compound holds ::selection; such selectors style the selection alone.
[[nodiscard]] bool SelectsSelection(const ComplexSelector& selector);

}  // namespace qorvex::css
