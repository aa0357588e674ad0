// From line spans to lines of positioned glyph runs: ellipsis, justification, visual order.
#pragma once

#include "layout/text/line_breaking.h"
#include "layout/text/shaping.h"
#include "layout/text/text_layout.h"

namespace qorvex::layout {

struct LineSource {
    const TextRequest& request;
    const Characters& characters;
    const LoadedTypefaces& typefaces;
    GlyphMap& map;             // justification widens its advances
    const ShapedText* shaped;  // null in the plain path
};

void BuildLines(const LineSource& source, const TempVector<LineSpan>& spans, TextInfo& out);

}  // namespace qorvex::layout
