// Computed style as text, for script, the inspector, tools and tests.
#pragma once

#include "css/values/layout_style_refs.h"

namespace qorvex::css {

// Appends the value of one longhand. What solving derives is what is shown: sizes in pixels and an absolute
// weight, whatever was declared.
void SerialiseComputed(PropertyId longhand, const LayoutStyleRefs& style, CssString& out);

}  // namespace qorvex::css
