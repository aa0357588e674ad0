// Which values of one property may stand in one animation: those that can be blended without converting
// units.
#pragma once

#include "css/values/declaration.h"

namespace qorvex::css {

// Both of the same property. Values of properties without a rule always fit; so do custom expressions, which
// are refused as a whole later.
[[nodiscard]] bool FitInOneAnimation(const Declaration& first, const Declaration& other);

}  // namespace qorvex::css
