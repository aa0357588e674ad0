#include "css/style/derived_text_values.h"

#include "core/logging/log.h"
#include "dom/element.h"

namespace qorvex::css {
namespace {

// CSS Fonts Module Level 4, 2.2.1 in the engine's codes, hundreds of the weight.
uint16_t ResolveWeight(FontWeight weight, uint16_t parentWeight) {
    const uint16_t parent = parentWeight / 100;
    switch (weight) {
        case FontWeight::Bolder:
            return parent < 4 ? 400 : parent < 6 ? 700 : 900;
        case FontWeight::Lighter:
            return parent >= 8 ? 700 : parent >= 6 ? 400 : 100;
        default:
            break;
    }
    const auto code = static_cast<uint16_t>(weight);
    if (code < 1 || code > 9) {
        AssertFailure("FontWeight should be evaluated to a specific value.");
        return parentWeight;
    }
    return static_cast<uint16_t>(code * 100);
}

float ResolveFontSize(Length size, float parentSize, LengthContext metrics) {
    metrics.em = parentSize;
    const float pixels = ResolveLength(size, metrics, parentSize);
    return pixels > 0 && std::isfinite(pixels) ? pixels : parentSize;
}

}  // namespace

bool UpdateDerivedText(LayoutStyleRefs& style, const LayoutStyleRefs& parent, LengthContext metrics) {
    const TextLayoutStyle& text = *style.text;
    const float fontSize = ResolveFontSize(text.fontSize, parent.text->computedFontSize, metrics);
    metrics.em = fontSize;
    metrics.fallback = 0;
    const uint16_t weight = ResolveWeight(text.fontWeight, parent.text->computedFontWeight);
    const float stroke = ResolveLength(text.textStrokeWidth, metrics);
    const float spacing = text.letterSpacing.kind == SpacingKind::Length
                              ? ResolveLength(text.letterSpacing.length, metrics)
                              : 0;
    // A percentage is one of the element's own font size (CSS Inline Layout, 4.2).
    const float lineHeight = text.lineHeight.kind == SpacingKind::Length
                                 ? ResolveLength(text.lineHeight.length, metrics, fontSize)
                                 : 0;
    if (text.computedFontSize == fontSize && text.computedFontWeight == weight &&
        text.computedStrokeWidth == stroke && text.computedLetterSpacing == spacing &&
        text.computedLineHeight == lineHeight) {
        return false;
    }
    TextLayoutStyle& changed = style.Mutable<TextLayoutStyle>();
    changed.computedFontSize = fontSize;
    changed.computedFontWeight = weight;
    changed.computedStrokeWidth = stroke;
    changed.computedLetterSpacing = spacing;
    changed.computedLineHeight = lineHeight;
    return true;
}

bool UpdateTypefaces(dom::Element& element, layout::IFontResolver& fonts) {
    LayoutStyleRefs& style = element.GetStyle();
    const TextLayoutStyle& text = *style.text;
    layout::TypefaceList faces;
    fonts.ResolveTypefaces(text.fontFamily, text.fontStyle,
                           static_cast<uint8_t>(text.computedFontWeight / 100), element.GetLayoutLink(),
                           faces);
    if (faces == text.typefaces) return false;
    style.Mutable<TextLayoutStyle>().typefaces = std::move(faces);
    return true;
}

}  // namespace qorvex::css
