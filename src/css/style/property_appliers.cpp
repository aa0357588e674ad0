#include "css/style/property_appliers.h"

#include "css/values/animated_properties.h"
#include "css/values/property_traits.h"
#include "dom/change_mask.h"

namespace qorvex::css {
namespace {

template <PropertyId id>
bool Store(LayoutStyleRefs& style, const void* value) {
    using Traits = PropertyTraits<id>;
    using Group = typename Traits::Group;
    const auto& wanted = *static_cast<const typename Traits::Type*>(value);
    if (style.Get<id>() == wanted) return false;
    style.Mutable<Group>().*Traits::kField = wanted;
    return true;
}

template <PropertyId id>
void Assign(void* target, const void* value) {
    using Type = typename PropertyTraits<id>::Type;
    *static_cast<Type*>(target) = *static_cast<const Type*>(value);
}

constexpr uint32_t MaskOf(ChangeClass change) {
    switch (change) {
        case ChangeClass::Layout:
            return dom::kChangeLayout;
        case ChangeClass::Visual:
            return dom::kChangeVisual;
        case ChangeClass::Transform:
            return dom::kChangeTransform;
        case ChangeClass::Animation:
            return dom::kChangeAnimation;
        case ChangeClass::Transition:
            return dom::kChangeTransition;
    }
    return 0;
}

template <PropertyId id>
constexpr uint32_t ChangeMaskOf() {
    const uint32_t mask = MaskOf(PropertyTraits<id>::kChange);
    switch (id) {
        case PropertyId::TextTransform:
            return mask | dom::kChangeTextTransform;
        case PropertyId::BackgroundImage:
        case PropertyId::MaskImage:
        case PropertyId::BorderImageSource:
        case PropertyId::BorderImageSlice:
            return mask | dom::kChangeImages;
        default:
            return mask;
    }
}

}  // namespace

#define QORVEX_SLOT_ANIMATED(field) [](AnimatedValues& values) -> void* { return &values.field; }
#define QORVEX_SLOT_STEPPED(field) nullptr
#define QORVEX_ROW(id, name, type, parser, field, inheritance, animation, ...)                       \
    PropertyApplier{&Store<PropertyId::id>, QORVEX_SLOT_##animation(field), &Assign<PropertyId::id>, \
                    ChangeMaskOf<PropertyId::id>()},
constinit const std::array<PropertyApplier, kLonghandCount> kPropertyAppliers = {
    QORVEX_CSS_LONGHANDS(QORVEX_ROW)};
#undef QORVEX_ROW
#undef QORVEX_SLOT_STEPPED
#undef QORVEX_SLOT_ANIMATED

}  // namespace qorvex::css
