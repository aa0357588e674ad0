// What differs between the longhands when their computed values are written: the field and its comparison.
// One template is expanded for each row of the property table; everything else about applying a property is
// written once, for ids (see property_solver.h).
#pragma once

#include <array>
#include <cstdint>

#include "css/values/layout_style_refs.h"
#include "css/values/property_id.h"

namespace qorvex::css {

struct AnimatedValues;

struct PropertyApplier {
    // Stores `value` in the style unless it is there already: compares before it makes the group private, so
    // that an unchanged value neither copies a group nor breaks sharing. True if the style changed.
    bool (*store)(LayoutStyleRefs& style, const void* value);
    // The property's slot of animated values; null for a property that cannot be animated.
    void* (*animatedSlot)(AnimatedValues& values);
    void (*assign)(void* target, const void* value);
    uint32_t changeMask;  // dom::ChangeMask bits that a changed value asks for
};

extern const std::array<PropertyApplier, kLonghandCount> kPropertyAppliers;

}  // namespace qorvex::css
