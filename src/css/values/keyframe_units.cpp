#include "css/values/keyframe_units.h"

namespace qorvex::css {

namespace {

bool Fit(const Length& a, const Length& b) {
    return a.unit == b.unit;
}
bool Fit(const Extent& a, const Extent& b) {
    return a.kind == b.kind && a.unit == b.unit;
}
bool Fit(const BorderWidth& a, const BorderWidth& b) {
    return a.kind == BorderWidthKind::Length && b.kind == a.kind && a.unit == b.unit;
}
bool Fit(const BorderRadius& a, const BorderRadius& b) {
    return Fit(a.horizontal, b.horizontal) && Fit(a.vertical, b.vertical);
}
bool Fit(const BackgroundPosition& a, const BackgroundPosition& b) {
    return Fit(a.x, b.x) && Fit(a.y, b.y);
}
bool Fit(const BackgroundSize& a, const BackgroundSize& b) {
    return a.mode == b.mode;
}
bool Fit(const BorderColor& a, const BorderColor& b) {
    return a.kind == ColorKind::Color && b.kind == a.kind;
}
bool Fit(const TransformOrigin& a, const TransformOrigin& b) {
    return Fit(a.x, b.x) && Fit(a.y, b.y) && Fit(a.z, b.z);
}
bool Fit(const ZIndex& a, const ZIndex& b) {
    return a.kind == b.kind;
}
bool Fit(const ShadowItem& a, const ShadowItem& b) {
    return a.inset == b.inset && Fit(a.offsetX, b.offsetX) && Fit(a.offsetY, b.offsetY) &&
           Fit(a.blur, b.blur) && Fit(a.spread, b.spread) && Fit(a.color, b.color);
}
bool Fit(const FilterFunction& a, const FilterFunction& b) {
    if (a.kind != b.kind) return false;
    if (a.kind == FilterKind::Blur) return Fit(a.radiusX, b.radiusX);
    if (a.kind == FilterKind::AxisBlur) return Fit(a.radiusX, b.radiusX) && Fit(a.radiusY, b.radiusY);
    return a.kind != FilterKind::DropShadow || Fit(a.shadow, b.shadow);
}
bool Fit(const ClipPathType& a, const ClipPathType& b) {
    if (a.hasBox != b.hasBox || (a.hasBox && a.box != b.box)) return false;
    if (!a.shape || !b.shape) return !a.shape == !b.shape;
    return a.shape->kind() == b.shape->kind();
}
bool FitSize(const BackgroundSize& a, const BackgroundSize& b) {
    return a.mode == b.mode && Fit(a.width, b.width) && Fit(a.height, b.height);
}

// Item by item over the shorter list.
template <class List, class Rule>
bool FitItems(const List& a, const List& b, Rule&& rule) {
    size_t count = std::min<size_t>(a.size(), b.size());
    for (size_t i = 0; i < count; ++i)
        if (!rule(a[i], b[i])) return false;
    return true;
}
bool Fit(const BackgroundSizeListType& a, const BackgroundSizeListType& b) {
    return FitItems(a, b, FitSize);
}
constexpr auto kFit = [](const auto& a, const auto& b) { return Fit(a, b); };
bool Fit(const BoxShadowListType& a, const BoxShadowListType& b) {
    return FitItems(a, b, kFit);
}
bool Fit(const TextShadowListType& a, const TextShadowListType& b) {
    return FitItems(a, b, kFit);
}
bool Fit(const FilterListType& a, const FilterListType& b) {
    return FitItems(a, b, kFit);
}

template <class T>
concept HasRule = requires(const T& value) {
    Fit(value, value);
};

}  // namespace

bool FitInOneAnimation(const Declaration& first, const Declaration& other) {
    if (first.kind() != DeclarationKind::Value || other.kind() != DeclarationKind::Value)
        return first.kind() == other.kind() || first.kind() == DeclarationKind::CustomExpression ||
               other.kind() == DeclarationKind::CustomExpression;
    bool fits = true;
    ForEachLonghand([&]<PropertyId id>() {
        using Traits = PropertyTraits<id>;
        if constexpr (Traits::kAnimatable && HasRule<typename Traits::Type>) {
            if (first.property() == id) fits = Fit(first.Get<id>(), other.Get<id>());
        }
    });
    return fits;
}

}  // namespace qorvex::css
