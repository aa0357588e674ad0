#include "css/style/text_step.h"

#include "css/style/property_appliers.h"
#include "dom/change_mask.h"

namespace qorvex::css {
namespace {

bool DerivedEqual(const TextLayoutStyle& a, const TextLayoutStyle& b) {
    return static_cast<const TextLayoutDerived&>(a) == static_cast<const TextLayoutDerived&>(b);
}

bool FieldsEqual(const TextLayoutStyle& a, const TextLayoutStyle& b, PropertyId id) {
    switch (id) {
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    case PropertyId::id:                               \
        return a.field == b.field;
        QORVEX_CSS_TEXT_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
        default:
            return true;
    }
}

// Colours change what is painted and no glyph's place, so a text that only changes colour is not laid out
// again.
bool DiffersInLayout(const TextLayoutStyle& a, const TextLayoutStyle& b) {
    bool same = DerivedEqual(a, b);
#define QORVEX_ROW(id, name, type, parser, field, ...)                                          \
    if (PropertyId::id != PropertyId::Color && PropertyId::id != PropertyId::TextStrokeColor && \
        PropertyId::id != PropertyId::SelectionColor)                                           \
        same = same && a.field == b.field;
    QORVEX_CSS_TEXT_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
    return !same;
}

// What is inherited must be what the group says: not where the parent declared something relative to a font
// size or a weight, which its heirs take as an absolute value.
bool HoldsAbsoluteValues(const TextLayoutStyle& text) {
    const auto isPixels = [](Length length) { return length.unit == LengthUnit::Px; };
    return isPixels(text.fontSize) && text.fontSize.value == text.computedFontSize &&
           isPixels(text.textStrokeWidth) &&
           (text.letterSpacing.kind != SpacingKind::Length || isPixels(text.letterSpacing.length)) &&
           (text.lineHeight.kind != SpacingKind::Length || isPixels(text.lineHeight.length) ||
            text.lineHeight.length.unit == LengthUnit::Em) &&
           static_cast<uint16_t>(text.fontWeight) * 100 == text.computedFontWeight;
}

}  // namespace

TextStep::Change TextStep::OfElement(const StyleHandle<TextLayoutStyle>& from,
                                     const StyleHandle<TextLayoutStyle>& to, const PropertySet& dirty) {
    if (element_.Is(from, to) && dirty_ == dirty) return change_;
    element_ = {from, to};
    dirty_ = dirty;
    change_ = {};
    dirty.ForEach([&](PropertyId id) {
        if (FieldsEqual(*from, *to, id)) return;
        ++change_.properties;
        change_.mask |= kPropertyAppliers[IndexOf(id)].changeMask;
    });
    if (!DerivedEqual(*from, *to)) change_.mask |= dom::kChangeLayout;
    return change_;
}

uint32_t TextStep::MaskOfText(const StyleHandle<TextLayoutStyle>& from,
                              const StyleHandle<TextLayoutStyle>& to) {
    if (text_.Is(from, to)) return textMask_;
    text_ = {from, to};
    textMask_ = dom::kChangeVisual;
    if (DiffersInLayout(*from, *to)) textMask_ |= dom::kChangeLayout;
    if (from->textTransform != to->textTransform) textMask_ |= dom::kChangeTextTransform;
    return textMask_;
}

bool TextStep::IsInheritable(const StyleHandle<TextLayoutStyle>& parent) {
    if (parent_ == parent) return inheritable_;
    parent_ = parent;
    const TextLayoutStyle& initial = *DefaultStyles().text;
    inheritable_ = parent->fontFitMode == initial.fontFitMode &&
                   parent->textOverflow == initial.textOverflow && parent->fontSdf == initial.fontSdf &&
                   HoldsAbsoluteValues(*parent);
    return inheritable_;
}

}  // namespace qorvex::css
