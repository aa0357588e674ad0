// Value records of the text group.
#pragma once

#include <cstdint>

#include "css/values/css_containers.h"
#include "css/values/length.h"

namespace qorvex::css {

using FontFamily = ValueList<CssString, struct FontFamilyTag>;

enum class SpacingKind : uint32_t { Normal = 0, Initial = 1, Inherit = 2, Length = 3 };

struct LetterSpacing {
    SpacingKind kind = SpacingKind::Normal;
    Length length;
    friend bool operator==(const LetterSpacing&, const LetterSpacing&) = default;
};

// A plain number is a length in em: it multiplies the font size of the element that it is inherited by, which
// is what the standard asks of the number form.
struct LineHeight {
    SpacingKind kind = SpacingKind::Normal;
    Length length{LengthUnit::Em, 1};
    friend bool operator==(const LineHeight&, const LineHeight&) = default;
};

}  // namespace qorvex::css
