// Moves the runs of finished lines to where text-align wants them.
#pragma once

#include "layout/text/text_info.h"

namespace qorvex::layout {

// Lines get the width of the widest one (of the available width when justified).
void AlignLines(const TextStyle& style, float availableWidth, TextInfo& info);

}  // namespace qorvex::layout
