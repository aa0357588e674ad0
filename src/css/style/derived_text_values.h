// The numbers of the text group that follow from its properties: font size, weight, spacing and stroke in
// final units, and the faces of the family list.
#pragma once

#include "css/values/layout_style_refs.h"
#include "css/values/length_context.h"
#include "css/values/property_set.h"
#include "layout/fonts/font_resolver.h"

namespace qorvex::dom {
class Element;
}

namespace qorvex::css {

// The properties that the derived numbers depend on, the parent's values of them included.
inline constexpr PropertySet kDerivedTextInputs = [] {
    PropertySet set;
    set.Add(PropertyId::FontSize);
    set.Add(PropertyId::FontWeight);
    set.Add(PropertyId::LetterSpacing);
    set.Add(PropertyId::LineHeight);
    set.Add(PropertyId::TextStrokeWidth);
    return set;
}();
inline constexpr PropertySet kFontKeyInputs = [] {
    PropertySet set;
    set.Add(PropertyId::FontFamily);
    set.Add(PropertyId::FontStyle);
    set.Add(PropertyId::FontWeight);
    return set;
}();

// `metrics` holds the viewport units and the rem. True if a number changed.
bool UpdateDerivedText(LayoutStyleRefs& style, const LayoutStyleRefs& parent, LengthContext metrics);

// Asks for the faces of the element's family list. True if they changed.
bool UpdateTypefaces(dom::Element& element, layout::IFontResolver& fonts);

}  // namespace qorvex::css
