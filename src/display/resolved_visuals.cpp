#include "display/resolved_visuals.h"

#include <algorithm>
#include <cmath>

namespace qorvex::dsp {

using layout::Edges;
using layout::Near;

namespace {

// From a blur radius to where the tail of its Gaussian no longer shows.
constexpr float kBlurExtent = 3.2552474f;

bool NearItem(const ResolvedShadow& a, const ResolvedShadow& b) {
    return Near(a.x, b.x) && Near(a.y, b.y) && Near(a.blur, b.blur) && Near(a.spread, b.spread) &&
           a.inset == b.inset;
}
bool NearItem(const FilterExtent& a, const FilterExtent& b) {
    return Near(a.x, b.x) && Near(a.y, b.y) && Near(a.blurX, b.blurX) && Near(a.blurY, b.blurY);
}
bool NearPoint(layout::Point a, layout::Point b) {
    return Near(a.x, b.x) && Near(a.y, b.y);
}
bool NearItem(const ResolvedImageLayer& a, const ResolvedImageLayer& b) {
    return Near(a.tile, b.tile) && Near(a.spacingX, b.spacingX) && Near(a.spacingY, b.spacingY) &&
           a.repeatX == b.repeatX && a.repeatY == b.repeatY && NearPoint(a.start, b.start) &&
           NearPoint(a.end, b.end);
}
template <typename T>
bool NearList(const ResolvedVisuals::List<T>& a, const ResolvedVisuals::List<T>& b) {
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](const T& x, const T& y) { return NearItem(x, y); });
}

void Grow(Edges& edges, float left, float right, float top, float bottom) {
    edges.left = std::max(edges.left, left);
    edges.right = std::max(edges.right, right);
    edges.top = std::max(edges.top, top);
    edges.bottom = std::max(edges.bottom, bottom);
}

void GrowByShadow(Edges& edges, const ResolvedShadow& shadow, float blurred) {
    const float reach = shadow.spread + blurred;
    Grow(edges, reach - shadow.x, reach + shadow.x, reach - shadow.y, reach + shadow.y);
}

float TextShadowReach(float blur) {
    return std::ceil(blur / 2 * kBlurExtent);
}

}  // namespace

bool Near(const ResolvedVisuals& a, const ResolvedVisuals& b) {
    return NearPoint(a.radii.topLeft, b.radii.topLeft) && NearPoint(a.radii.topRight, b.radii.topRight) &&
           NearPoint(a.radii.bottomRight, b.radii.bottomRight) &&
           NearPoint(a.radii.bottomLeft, b.radii.bottomLeft) && NearList(a.backgrounds, b.backgrounds) &&
           NearList(a.masks, b.masks) && Near(a.borderImageWidth, b.borderImageWidth) &&
           NearList(a.borderImages, b.borderImages) && Near(a.borderImageSlice, b.borderImageSlice) &&
           Near(a.borderImageOutset, b.borderImageOutset) && NearList(a.boxShadows, b.boxShadows) &&
           NearList(a.textShadows, b.textShadows) && NearList(a.filters, b.filters);
}

bool HasRadii(const fresco::CornerRadii& r) {
    for (const layout::Point& corner : {r.topLeft, r.topRight, r.bottomRight, r.bottomLeft}) {
        if (corner.x > 0 && corner.y > 0) return true;
    }
    return false;
}

Edges PaintOutset(const ResolvedVisuals& visuals) {
    Edges edges = visuals.borderImageOutset;
    for (const ResolvedShadow& shadow : visuals.boxShadows) {
        if (!shadow.inset) GrowByShadow(edges, shadow, shadow.blur);
    }
    // Blurred glyphs are not cut off at the blur radius as boxes are: they show as far as the tail does.
    for (const ResolvedShadow& shadow : visuals.textShadows)
        GrowByShadow(edges, shadow, TextShadowReach(shadow.blur));
    return edges;
}

Edges FilterOutset(const ResolvedVisuals& visuals) {
    // Filters apply one after the other, so their reaches add up.
    Edges edges;
    for (const FilterExtent& filter : visuals.filters) {
        const float x = filter.blurX * kBlurExtent;
        const float y = filter.blurY * kBlurExtent;
        edges.left += std::max(x - filter.x, 0.0f);
        edges.right += std::max(x + filter.x, 0.0f);
        edges.top += std::max(y - filter.y, 0.0f);
        edges.bottom += std::max(y + filter.y, 0.0f);
    }
    return edges;
}

}  // namespace qorvex::dsp
