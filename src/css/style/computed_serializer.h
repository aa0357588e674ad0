// Computed values as text, for the inspector, script and the style dump: one formatter for all of them.
#pragma once

#include "css/values/layout_style_refs.h"

namespace qorvex::css {

[[nodiscard]] CssString SerializeComputed(PropertyId longhand, const LayoutStyleRefs& style);
// Every longhand as "name: value", one a line, in the order of their ids.
void AppendComputedStyle(const LayoutStyleRefs& style, CssString& out);

}  // namespace qorvex::css
