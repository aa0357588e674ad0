// Moves the runs of finished lines to where text-align wants them.
#pragma once

#include "layout/text/text_info.h"

namespace qorvex::layout {

// Lines get the width of the widest one (of the available width when justified).
void AlignLines(const TextStyle& style, float availableWidth, TextInfo& info);

// Widens gaps of one line of an inline flow, as its placement tells.
void SpreadLine(TextInfo& info, TextLineInfo& line, const LinePlacement& placement);

}  // namespace qorvex::layout
