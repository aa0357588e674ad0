// Where lines end. Works on widths alone, so both paths share it.
#pragma once

#include "layout/text/characters.h"
#include "layout/text/text_style.h"

namespace qorvex::i18n {
class IBreakIterator;
}

namespace qorvex::layout {

// Characters from first to end are on the line; those from end to next (a space at which the line was broken,
// or a line feed) are not shown.
struct LineSpan {
    uint32_t first = 0;
    uint32_t end = 0;
    uint32_t next = 0;
    float width = 0;
    bool endsParagraph = false;
};

struct BreakRequest {
    const Characters& characters;
    const float* advances;  // one for each character, letter spacing included
    const TextStyle& style;
    float available;                         // NaN: lines end at line feeds alone
    float firstLineOffset;                   // taken on the first line by content before this text
    i18n::IBreakIterator* iterator;          // null: lines break at spaces alone; holds the text already
    const uint8_t* clusterStarts = nullptr;  // null: a line may break before each character
    float hyphen = 0;                        // that a soft hyphen at the end of a line becomes
};

void BreakLines(const BreakRequest& request, TempVector<LineSpan>& out);

}  // namespace qorvex::layout
