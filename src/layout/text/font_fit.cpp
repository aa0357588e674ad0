// font-fit-mode: the size at which a text fills, or at least fits, its box.
#include "layout/text/font_fit.h"

#include "layout/text/text_layout.h"

namespace qorvex::layout {

namespace {

bool Fits(const TextRequest& request, const TextInfo& info) {
    return (std::isnan(request.availableWidth) || info.width <= request.availableWidth) &&
           (std::isnan(request.availableHeight) || info.height <= request.availableHeight);
}

bool FitsAt(const TextRequest& request, TextStyle& style, float size, TextInfo& out) {
    style.usedSize = size;
    const TextRequest sized = {
        request.text,     style,         request.availableWidth,  request.availableHeight, request.fonts,
        request.iterator, request.i18n,  request.firstLineOffset, request.applyLineHeight, request.notesGaps,
        request.base,     request.levels};
    return CalculateTextRunsAndGlyphs(sized, out) && Fits(request, out);
}

}  // namespace

bool LayoutText(const TextRequest& request, TextInfo& out) {
    using css::FontFitModeType;
    TextStyle style = request.style;
    const FontFitModeType mode = style.fit;
    const bool known = !std::isnan(request.availableWidth) || !std::isnan(request.availableHeight);
    // Without a mode the size is the caller's: an inline flow scales its texts itself.
    const float first = mode == FontFitModeType::None ? style.usedSize : style.fontSize;
    const bool fits = FitsAt(request, style, first, out);
    if (mode == FontFitModeType::None || !known || out.lines.empty())
        return !out.lines.empty() || request.text.empty();
    const float size = FindFittingSize(mode, style.fontSize, fits,
                                       [&](float tried) { return FitsAt(request, style, tried, out); });
    if (!Near(out.usedSize, size)) FitsAt(request, style, size, out);
    return true;
}

}  // namespace qorvex::layout
