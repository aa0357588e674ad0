#include "layout/text/text_style.h"

namespace qorvex::layout {

TextStyle MakeTextStyle(const css::TextLayoutStyle& style) {
    TextStyle text;
    text.typefaces = style.typefaces;
    text.fontSize = text.usedSize = style.computedFontSize;
    text.letterSpacing = style.computedLetterSpacing;
    text.lineHeight =
        style.lineHeight.kind == css::SpacingKind::Length ? style.computedLineHeight : kNormalLineHeight;
    text.align = style.textAlign;
    text.fit = style.fontFitMode;
    text.overflowWrap = style.overflowWrap;
    text.whiteSpace = style.whiteSpace;
    text.overflow = style.textOverflow;
    return text;
}

bool SameTextStyle(const TextStyle& a, const TextStyle& b) {
    return a.typefaces == b.typefaces && Near(a.fontSize, b.fontSize) &&
           Near(a.letterSpacing, b.letterSpacing) && Near(a.lineHeight, b.lineHeight) && a.align == b.align &&
           a.fit == b.fit && a.overflowWrap == b.overflowWrap && a.whiteSpace == b.whiteSpace &&
           a.overflow == b.overflow && a.complexText == b.complexText;
}

}  // namespace qorvex::layout
