// Numbers and names of the CSS properties, derived from the property table.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

#include "css/values/property_table.h"

namespace qorvex::css {

enum class PropertyId : uint16_t {
#define QORVEX_ROW(id, ...) id,
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)
    // Names no property: the number of longhands, and the start of the shorthands.
    kLonghandCount,
    QORVEX_CSS_SHORTHANDS(QORVEX_ROW)
#undef QORVEX_ROW
        kEnd,
    kUnknown = 0xFFFF,
};

inline constexpr size_t kLonghandCount = static_cast<size_t>(PropertyId::kLonghandCount);
inline constexpr size_t kPropertyEnd = static_cast<size_t>(PropertyId::kEnd);
static_assert(kLonghandCount == 118 && kPropertyEnd == 139);
static_assert(static_cast<int>(PropertyId::BorderBottomStyle) == 15);
static_assert(static_cast<int>(PropertyId::BackgroundImage) == 38);
static_assert(static_cast<int>(PropertyId::BorderImageSource) == 60);
static_assert(static_cast<int>(PropertyId::Color) == 83);
static_assert(static_cast<int>(PropertyId::Transform) == 100);
static_assert(static_cast<int>(PropertyId::AnimationName) == 106);
static_assert(static_cast<int>(PropertyId::TransitionProperty) == 114);
static_assert(static_cast<int>(PropertyId::Animation) == 119);
static_assert(static_cast<int>(PropertyId::Transition) == 138);

// Where a longhand's computed value lies, and which handle of LayoutStyleRefs holds it.
enum class StyleGroup : uint8_t { Layout, Visual, TextLayout, Transform, Animation, Transition };
inline constexpr size_t kStyleGroupCount = 6;

// What a changed value asks for at least; a member of the text group can be only Visual.
enum class ChangeClass : uint8_t { Layout, Visual, Transform, Animation, Transition };

constexpr size_t IndexOf(PropertyId id) {
    return static_cast<size_t>(id);
}
constexpr bool IsLonghand(PropertyId id) {
    return IndexOf(id) < kLonghandCount;
}
constexpr bool IsShorthand(PropertyId id) {
    return IndexOf(id) > kLonghandCount && IndexOf(id) < kPropertyEnd;
}

// Case-sensitive: property names in sheets are matched exactly as written. kUnknown for a name of no
// property.
[[nodiscard]] PropertyId FindProperty(std::string_view name);
// The empty text for the count row and out of range.
[[nodiscard]] std::string_view PropertyName(PropertyId id);

}  // namespace qorvex::css
