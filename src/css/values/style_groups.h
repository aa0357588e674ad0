// Computed style in counted groups, one field per longhand of the property table plus the numbers that style
// solving derives. A group is shared by any number of nodes, layout records and frames, and is immutable
// while its count is above 1: StyleHandle::MakeMutable is the only way to write. Equal handles therefore mean
// equal style.
#pragma once

#include <cstdint>

#include "css/values/property_table.h"
#include "css/values/property_values.h"
#include "css/values/shared_value.h"

namespace qorvex::css {

struct LayoutDerived {
    // Of text nodes: how the text is aligned in its parent, taken from the parent during solving.
    uint8_t textKind = 0;
    friend bool operator==(const LayoutDerived&, const LayoutDerived&) = default;
};

// Font ids of the text renderer in fallback order; the last one is the embedded fallback font. Faces that are
// not loaded yet have the empty id.
inline constexpr uint32_t kNoTypeface = 0xFFFFFFFF;

struct TextLayoutDerived {
    float computedFontSize = 16;        // pixels
    float computedStrokeWidth = 0;      // pixels
    float computedLetterSpacing = 0;    // pixels
    float computedLineHeight = 0;       // pixels; 0 while line-height is normal: the font decides
    uint16_t computedFontWeight = 400;  // 100 to 900, relative weights resolved
    CssSmallVector<uint32_t, 4> typefaces;
    friend bool operator==(const TextLayoutDerived&, const TextLayoutDerived&) = default;
};

struct NothingDerived {
    friend bool operator==(const NothingDerived&, const NothingDerived&) = default;
};

#define QORVEX_FIELD(id, name, type, parser, field, inheritance, animation, change, ...) \
    type field = __VA_ARGS__;

#define QORVEX_STYLE_GROUP(name, table, derived) \
    struct name : SharedValue<name>, derived {   \
        table(QORVEX_FIELD)                      \
    };

QORVEX_STYLE_GROUP(LayoutStyle, QORVEX_CSS_LAYOUT_PROPERTIES, LayoutDerived)
QORVEX_STYLE_GROUP(VisualStyle, QORVEX_CSS_VISUAL_PROPERTIES, NothingDerived)
QORVEX_STYLE_GROUP(TextLayoutStyle, QORVEX_CSS_TEXT_PROPERTIES, TextLayoutDerived)
QORVEX_STYLE_GROUP(TransformStyle, QORVEX_CSS_TRANSFORM_PROPERTIES, NothingDerived)
QORVEX_STYLE_GROUP(AnimationStyle, QORVEX_CSS_ANIMATION_PROPERTIES, NothingDerived)
QORVEX_STYLE_GROUP(TransitionStyle, QORVEX_CSS_TRANSITION_PROPERTIES, NothingDerived)

#undef QORVEX_STYLE_GROUP
#undef QORVEX_FIELD

}  // namespace qorvex::css
