#include "css/style/computed_serializer.h"

#include "css/values/value_text.h"

namespace qorvex::css {

CssString SerializeComputed(PropertyId longhand, const LayoutStyleRefs& style) {
    CssString text;
    // Where solving derives the final value, that is the computed value, not what was declared.
    if (longhand == PropertyId::FontSize) {
        const Length size = Length::Pixels(style.text->computedFontSize);
        SerialiseValue(longhand, &size, text);
    } else if (longhand == PropertyId::FontWeight) {
        const auto weight = static_cast<FontWeight>(style.text->computedFontWeight / 100);
        SerialiseValue(longhand, &weight, text);
    } else {
        SerialiseValue(longhand, style.Field(longhand), text);
    }
    return text;
}

void AppendComputedStyle(const LayoutStyleRefs& style, CssString& out) {
    for (size_t id = 0; id < kLonghandCount; ++id) {
        const auto longhand = static_cast<PropertyId>(id);
        out.append(PropertyName(longhand));
        out.append(": ");
        out.append(std::string_view(SerializeComputed(longhand, style)));
        out.append("\n");
    }
}

}  // namespace qorvex::css
