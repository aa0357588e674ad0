// Text form of gradients (CSS Images Module Level 3, 3).
#pragma once

#include <string_view>

#include "css/values/image_values.h"

namespace qorvex::css {

// Null when the text is no gradient.
[[nodiscard]] RefPtr<const Gradient> ParseGradient(std::string_view text);
void SerialiseGradient(const Gradient& gradient, CssString& out);

}  // namespace qorvex::css
