// What code that is written once for all properties asks of one property, derived from the property table:
//
//   PropertyTraits<PropertyId::Width>::Type           Extent
//   PropertyTraits<PropertyId::Width>::Group          LayoutStyle
//   PropertyTraits<PropertyId::Width>::kField         &LayoutStyle::width
//   ...::kInherited, kAnimatable, kChange, kGroup, kName, Initial()
#pragma once

#include "css/values/property_set.h"
#include "css/values/property_values.h"
#include "css/values/style_groups.h"

namespace qorvex::css {

template <PropertyId id>
struct PropertyTraits;

#define QORVEX_TRAITS(group, id, name, type, field, inheritance, animation, change, ...) \
    template <>                                                                          \
    struct PropertyTraits<PropertyId::id> {                                              \
        using Type = type;                                                               \
        using Group = group##Style;                                                      \
        static constexpr Type Group::*kField = &Group::field;                            \
        static constexpr StyleGroup kGroup = StyleGroup::group;                          \
        static constexpr std::string_view kName = name;                                  \
        static constexpr bool kInherited = QORVEX_##inheritance;                         \
        static constexpr bool kAnimatable = QORVEX_##animation;                          \
        static constexpr ChangeClass kChange = ChangeClass::change;                      \
        static Type Initial() { return __VA_ARGS__; }                                    \
    };
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    QORVEX_TRAITS(Layout, id, name, type, field, __VA_ARGS__)
QORVEX_CSS_LAYOUT_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    QORVEX_TRAITS(Visual, id, name, type, field, __VA_ARGS__)
QORVEX_CSS_VISUAL_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    QORVEX_TRAITS(TextLayout, id, name, type, field, __VA_ARGS__)
QORVEX_CSS_TEXT_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    QORVEX_TRAITS(Transform, id, name, type, field, __VA_ARGS__)
QORVEX_CSS_TRANSFORM_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    QORVEX_TRAITS(Animation, id, name, type, field, __VA_ARGS__)
QORVEX_CSS_ANIMATION_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
#define QORVEX_ROW(id, name, type, parser, field, ...) \
    QORVEX_TRAITS(Transition, id, name, type, field, __VA_ARGS__)
QORVEX_CSS_TRANSITION_PROPERTIES(QORVEX_ROW)
#undef QORVEX_ROW
#undef QORVEX_TRAITS

// Calls visit.template operator()<PropertyId::X>() for each longhand in id order.
template <class Visitor>
void ForEachLonghand(Visitor&& visit) {
#define QORVEX_ROW(id, ...) visit.template operator()<PropertyId::id>();
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)
#undef QORVEX_ROW
}

}  // namespace qorvex::css
