// From a string and a style to lines of positioned glyphs. Layout thread; scratch memory is the thread's own.
#pragma once

#include <string_view>

#include "layout/text/text_info.h"

namespace fresco {
class IFontService;
}
namespace qorvex {
class IInternationalizationManager;
namespace i18n {
class IBreakIterator;
}
}  // namespace qorvex

namespace qorvex::layout {

struct TextRequest {
    std::string_view text;  // UTF-8
    const TextStyle& style;
    float availableWidth;   // pixels; NaN when not known
    float availableHeight;  // read by font-fit-mode alone
    fresco::IFontService& fonts;
    i18n::IBreakIterator* iterator = nullptr;      // holds the text
    IInternationalizationManager* i18n = nullptr;  // read by the complex path alone
    float firstLineOffset = 0;
    bool applyLineHeight = true;
    bool notesGaps = false;  // fill TextInfo::gaps
    BaseDirection base = BaseDirection::OfText;
    const uint8_t* levels = nullptr;  // one for each byte of the text; null: `i18n` is asked
};

// One layout at style.usedSize, by the path that the text needs. False, with an empty result, when no
// typeface is loaded.
bool CalculateTextRunsAndGlyphs(const TextRequest& request, TextInfo& out);
// The complex path, whatever the text.
bool CalculateTextRunsAndGlyphsForComplexText(const TextRequest& request, TextInfo& out);

// The same under font-fit-mode: the largest (fit) or the first smaller (shrink) size that the available box
// holds.
bool LayoutText(const TextRequest& request, TextInfo& out);

}  // namespace qorvex::layout
