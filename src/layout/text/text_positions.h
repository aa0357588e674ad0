// Where the characters of a laid-out text stand: what selection and carets work with on the DOM side.
#pragma once

#include <string_view>

#include "layout/dom_tasks.h"
#include "layout/text/text_info.h"

namespace qorvex::layout {

struct TextLinePosition {
    uint32_t firstCharacter = 0;
    uint32_t endCharacter = 0;
    float top = 0;
    float height = 0;
};

// Of UpdateTextPositionsInDOM. Pixels from the corner of the text's box.
struct TextPositions final : DOMTaskData {
    TextArray<float> x;  // the edge of each character at which reading it begins, and one for the end
    TextArray<TextLinePosition> lines;

    // Where a character stands in the shown UTF-8 text; behind the last one the text's length.
    uint32_t OffsetOf(size_t character) const {
        return offsets.empty() ? static_cast<uint32_t>(character) : offsets[character];
    }
    TextArray<uint32_t> offsets;  // empty where all characters are single bytes
};

// Of UpdateFontStyleDataInDOM.
struct TextFontStyle final : DOMTaskData {
    uint32_t font = css::kNoTypeface;  // the first one that is loaded
    float size = 0;
    float letterSpacing = 0;
    float lineHeight = 0;  // of the first line, as laid out
    float baseline = 0;

    bool Same(const TextFontStyle& other) const {
        return font == other.font && Near(size, other.size) && Near(letterSpacing, other.letterSpacing) &&
               Near(lineHeight, other.lineHeight) && Near(baseline, other.baseline);
    }
};

// `placements` (may be null) are the lines' places in an inline flow, else they follow from their heights.
void ComputeTextPositions(const TextInfo& info, std::string_view text, css::WhiteSpaceMode whiteSpace,
                          const LinePlacement* placements, TextPositions& out);

}  // namespace qorvex::layout
