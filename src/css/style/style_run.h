// What one pass over dirty elements knows: the parts of the document and of the engine that every element
// needs, and what the pass has found out so far.
#pragma once

#include "css/style/animation_side.h"
#include "css/style/root_propagation.h"
#include "css/style/style_sharing.h"
#include "css/style/text_step.h"
#include "css/style/text_style_cache.h"
#include "css/values/length_context.h"
#include "css/values/match_state.h"
#include "dom/document.h"

namespace qorvex::layout {
class IFontResolver;
}

namespace qorvex::css {

struct StyleRun {
    dom::Document& document;
    StyleCounters& counters;
    StyleSharingTable& sharing;
    TextStyleCache& textStyles;
    TextStep& textStep;
    RootStyles& rootStyles;
    const MatchState& nothingMatched;  // of an element that was never matched
    layout::IFontResolver* fonts;      // null without fonts
    LengthContext metrics;             // viewport units, and the root's font size as it becomes known
    bool rootFontSizeChanged = false;
};

}  // namespace qorvex::css
