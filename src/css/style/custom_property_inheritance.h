// Which custom properties are in force for an element: its parent's map, overlaid with its own.
#pragma once

#include "css/values/layout_style_refs.h"
#include "css/values/match_state.h"

namespace qorvex::css {

// An element without own custom properties shares its parent's map; one whose map already holds just these
// records keeps it. True if the map changed.
bool UpdateCustomProperties(LayoutStyleRefs& style, const LayoutStyleRefs& parent, const MatchState& match);

}  // namespace qorvex::css
