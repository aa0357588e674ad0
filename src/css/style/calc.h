// calc() as text substitution: every `calc(...)` in a value text is computed and replaced by a literal, and
// the plain text then goes through the ordinary value parser. There is no value record for a calc().
//
// Invariant: no recursion. The expression is turned into a flat postfix program whose types are checked while
// it is built, and a value stack runs it, so nesting depth costs memory in proportion to the text and nothing
// else.
#pragma once

#include <string_view>

#include "css/values/css_containers.h"
#include "css/values/length_context.h"

namespace qorvex::css {

// Appends `text` with every calc() replaced to `result`. False, with the reason logged, leaves `result` with
// what was appended so far. `metrics.em` is the em of the surrounding text, `metrics.percentBase` is not
// used.
[[nodiscard]] bool EvaluateCalc(std::string_view text, CssString& result, const LengthContext& metrics);

}  // namespace qorvex::css
