#include "display/background_geometry.h"

#include "css/values/style_groups.h"
#include "display/box.h"

#include <algorithm>
#include <cmath>

namespace qorvex::dsp {

using css::Gradient;
using css::LengthContext;
using css::ResolveLength;
using layout::LayoutNode;
using layout::Point;
using layout::Rect;
using layout::Size;

namespace {

// One layer's placing values; lists that are shorter than the image list repeat.
struct Placing {
    css::Length x, y;
    css::BackgroundSize size;
    css::BackgroundRepeatType repeat;
};

template <typename List, typename Item>
Item Cycled(const List& list, size_t index, Item initial) {
    return list.empty() ? initial : list[index % list.size()];
}

// Fits an image of `own` size (0: none, as of a gradient) into `area`.
Size TileSize(const css::BackgroundSize& size, Size area, Size own, const LengthContext& lengths) {
    const bool hasRatio = own.width > 0 && own.height > 0;
    if (size.mode != css::BackgroundSizeMode::Size) {
        if (!hasRatio) return area;
        const float x = area.width / own.width;
        const float y = area.height / own.height;
        const float scale = size.mode == css::BackgroundSizeMode::Cover ? std::max(x, y) : std::min(x, y);
        return {own.width * scale, own.height * scale};
    }
    const bool autoWidth = !size.width.IsLength();
    const bool autoHeight = !size.height.IsLength();
    Size tile{std::max(ResolveExtent(size.width, lengths, area.width, 0), 0.0f),
              std::max(ResolveExtent(size.height, lengths, area.height, 0), 0.0f)};
    if (autoWidth && autoHeight) return hasRatio ? own : area;
    if (autoWidth) tile.width = hasRatio ? tile.height * own.width / own.height : area.width;
    if (autoHeight) tile.height = hasRatio ? tile.width * own.height / own.width : area.height;
    return tile;
}

void RoundTile(float area, float& tile) {
    if (!(tile > 0)) return;
    tile = area / std::max(std::round(area / tile), 1.0f);
}

ResolvedImageLayer PlaceLayer(const Placing& placing, const Rect& area, Size own,
                              const LengthContext& lengths) {
    ResolvedImageLayer layer;
    Size tile = TileSize(placing.size, {area.width, area.height}, own, lengths);
    if (placing.repeat.x == css::RepeatMode::Round) RoundTile(area.width, tile.width);
    if (placing.repeat.y == css::RepeatMode::Round) RoundTile(area.height, tile.height);
    layer.tile = {area.x + ResolveLength(placing.x, lengths, area.width - tile.width),
                  area.y + ResolveLength(placing.y, lengths, area.height - tile.height), 0, tile.width,
                  tile.height};
    layer.repeatX = placing.repeat.x != css::RepeatMode::NoRepeat;
    layer.repeatY = placing.repeat.y != css::RepeatMode::NoRepeat;
    return layer;
}

Size IntrinsicSize(const ImageSlots* slots, size_t index) {
    return slots != nullptr && index < slots->size() ? (*slots)[index].intrinsic : Size{};
}

void ResolveLinear(const Gradient& gradient, Size tile, ResolvedImageLayer& out) {
    Point direction;
    if (gradient.sides != 0) {
        const float x = static_cast<float>((gradient.sides & css::kSideRight) != 0) -
                        static_cast<float>((gradient.sides & css::kSideLeft) != 0);
        const float y = static_cast<float>((gradient.sides & css::kSideBottom) != 0) -
                        static_cast<float>((gradient.sides & css::kSideTop) != 0);
        // Towards a corner the line of the middle colour runs through the two neighbouring corners.
        direction = x != 0 && y != 0 ? Point{x * tile.height, y * tile.width} : Point{x, y};
    } else {
        constexpr float kRadiansPerDegree = 0.017453292f;
        direction = {std::sin(gradient.angle * kRadiansPerDegree),
                     -std::cos(gradient.angle * kRadiansPerDegree)};
    }
    const float norm = std::hypot(direction.x, direction.y);
    if (!(norm > 0))
        direction = {0, 1};
    else
        direction = {direction.x / norm, direction.y / norm};
    const float half = (std::fabs(tile.width * direction.x) + std::fabs(tile.height * direction.y)) / 2;
    const Point center{tile.width / 2, tile.height / 2};
    out.start = {center.x - direction.x * half, center.y - direction.y * half};
    out.end = {center.x + direction.x * half, center.y + direction.y * half};
}

Point KeywordRadii(const Gradient& gradient, Size tile, Point center) {
    const float left = std::fabs(center.x), right = std::fabs(tile.width - center.x);
    const float top = std::fabs(center.y), bottom = std::fabs(tile.height - center.y);
    const bool farthest = gradient.size == css::GradientSize::FarthestSide ||
                          gradient.size == css::GradientSize::FarthestCorner;
    const bool corner = gradient.size == css::GradientSize::ClosestCorner ||
                        gradient.size == css::GradientSize::FarthestCorner;
    const float x = farthest ? std::max(left, right) : std::min(left, right);
    const float y = farthest ? std::max(top, bottom) : std::min(top, bottom);
    if (gradient.shape == css::GradientShape::Circle) {
        const float radius = corner ? std::hypot(x, y) : farthest ? std::max(x, y) : std::min(x, y);
        return {radius, radius};
    }
    // An ellipse through the corner keeps the ratio that it has at the sides.
    const float scale = corner ? std::sqrt(2.0f) : 1;
    return {x * scale, y * scale};
}

void ResolveRadial(const Gradient& gradient, Size tile, const LengthContext& lengths,
                   ResolvedImageLayer& out) {
    const Point center{ResolveLength(gradient.centerX, lengths, tile.width),
                       ResolveLength(gradient.centerY, lengths, tile.height)};
    out.start = center;
    out.end = gradient.hasExplicitSize ? Point{ResolveLength(gradient.radiusX, lengths, tile.width),
                                               ResolveLength(gradient.radiusY, lengths, tile.height)}
                                       : KeywordRadii(gradient, tile, center);
}

}  // namespace

void ResolveGradient(const Gradient& gradient, Size tile, const LengthContext& lengths,
                     ResolvedImageLayer& out) {
    const float unit = std::max(tile.width, tile.height);
    if (!(unit > 0)) return;
    gradient.IsRadial() ? ResolveRadial(gradient, tile, lengths, out) : ResolveLinear(gradient, tile, out);
    out.start = {out.start.x / unit, out.start.y / unit};
    out.end = {out.end.x / unit, out.end.y / unit};
}

void ResolveBackgrounds(const LayoutNode& node, const Rect& box, const LengthContext& lengths,
                        ResolvedVisuals& out) {
    const css::VisualStyle& style = *node.style->visual;
    const Rect local{0, 0, 0, box.width, box.height};
    const Rect area = layout::Inset(local, node.border());
    const bool hasSlots = node.display && node.display->Has(IDisplayElement::kPaintsBox);
    auto* element = hasSlots ? static_cast<Box*>(node.display.get()) : nullptr;
    for (size_t i = 0; i < style.backgroundImage.size(); ++i) {
        const css::ImageValue& image = style.backgroundImage[i];
        const Placing placing{Cycled(style.backgroundPositionX, i, css::Length::Percent(0)),
                              Cycled(style.backgroundPositionY, i, css::Length::Percent(0)),
                              Cycled(style.backgroundSize, i, css::BackgroundSize()),
                              Cycled(style.backgroundRepeat, i, css::BackgroundRepeatType())};
        const Size own =
            image.IsGradient() || element == nullptr ? Size{} : IntrinsicSize(element->BackgroundSlots(), i);
        ResolvedImageLayer layer = PlaceLayer(placing, area, own, lengths);
        if (image.gradient)
            ResolveGradient(*image.gradient, {layer.tile.width, layer.tile.height}, lengths, layer);
        out.backgrounds.push_back(layer);
    }
    if (style.maskImage.kind <= css::ImageKind::Initial) return;
    const Placing placing{style.maskPosition.x, style.maskPosition.y, style.maskSize, style.maskRepeat};
    const Size own = element == nullptr ? Size{} : IntrinsicSize(element->MaskSlots(), 0);
    ResolvedImageLayer layer = PlaceLayer(placing, local, own, lengths);
    if (style.maskImage.gradient)
        ResolveGradient(*style.maskImage.gradient, {layer.tile.width, layer.tile.height}, lengths, layer);
    out.masks.push_back(layer);
}

}  // namespace qorvex::dsp
