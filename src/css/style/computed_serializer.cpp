#include "css/style/computed_serializer.h"

#include "css/values/value_text.h"

namespace qorvex::css {
namespace {

template <class Value>
void Put(PropertyId longhand, const Value& value, CssString& out) {
    SerialiseValue(longhand, &value, out);
}

template <class Spacing>
Spacing WithPixels(Spacing spacing, float pixels) {
    if (spacing.kind == SpacingKind::Length) spacing.length = Length::Pixels(pixels);
    return spacing;
}

}  // namespace

void SerialiseComputed(PropertyId longhand, const LayoutStyleRefs& style, CssString& out) {
    const TextLayoutStyle& text = *style.text;
    switch (longhand) {
        case PropertyId::FontSize:
            return Put(longhand, Length::Pixels(text.computedFontSize), out);
        case PropertyId::FontWeight:
            return Put(longhand, static_cast<FontWeight>(text.computedFontWeight / 100), out);
        case PropertyId::TextStrokeWidth:
            return Put(longhand, Length::Pixels(text.computedStrokeWidth), out);
        case PropertyId::LetterSpacing:
            return Put(longhand, WithPixels(text.letterSpacing, text.computedLetterSpacing), out);
        case PropertyId::LineHeight:
            // A plain number is an em and is inherited as one, so it stays.
            if (text.lineHeight.length.unit == LengthUnit::Em) break;
            return Put(longhand, WithPixels(text.lineHeight, text.computedLineHeight), out);
        default:
            break;
    }
    SerialiseValue(longhand, style.Field(longhand), out);
}

}  // namespace qorvex::css
