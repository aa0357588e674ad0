#include "layout/fonts/font_description.h"

#include <fresco/font.h>

#include <algorithm>

namespace qorvex::layout {

namespace {

// By weight code; 400 has no bit.
constexpr uint32_t kWeightFlags[] = {
    0,
    fresco::kFontWeight100,
    fresco::kFontWeight200,
    fresco::kFontWeight300,
    0,
    fresco::kFontWeight500,
    fresco::kFontWeight600,
    fresco::kFontWeight700,
    fresco::kFontWeight800,
    fresco::kFontWeight900,
};

constexpr std::string_view kGenericFamilies[] = {
    "serif",         "sans-serif",   "monospace",  "cursive", "fantasy", "system-ui", "ui-serif",
    "ui-sans-serif", "ui-monospace", "ui-rounded", "math",    "emoji",   "fangsong",
};

}  // namespace

uint8_t StyleCode(css::FontStyle style) {
    switch (style) {
        case css::FontStyle::Italic:
            return kItalicStyle;
        case css::FontStyle::Oblique:
            return kObliqueStyle;
        default:
            return kNormalStyle;
    }
}

uint32_t ToFontFlags(const FontDescription& description) {
    const uint32_t style = description.style == kItalicStyle || description.style == kObliqueStyle
                               ? uint32_t{fresco::kFontItalic}
                               : 0u;
    const bool valid = description.weight <= kHeaviestWeight;
    return style | (valid ? kWeightFlags[description.weight] : 0);
}

uint8_t StyleFromFlags(uint32_t flags) {
    if (flags & fresco::kFontItalic) return kItalicStyle;
    return flags & fresco::kFontOblique ? kObliqueStyle : kNormalStyle;
}

uint8_t WeightFromFlags(uint32_t flags) {
    for (uint8_t weight = kLightestWeight; weight <= kHeaviestWeight; ++weight) {
        if (kWeightFlags[weight] != 0 && (flags & kWeightFlags[weight])) return weight;
    }
    return kNormalWeight;
}

bool IsGenericFamily(std::string_view family) {
    return std::find(std::begin(kGenericFamilies), std::end(kGenericFamilies), family) !=
           std::end(kGenericFamilies);
}

}  // namespace qorvex::layout
