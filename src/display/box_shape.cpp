#include "display/box_shape.h"

#include "css/values/style_groups.h"
#include "display/paint_context.h"
#include "display/transforms.h"

#include <algorithm>

namespace qorvex::dsp {

using css::BorderStyleType;
using fresco::CornerRadii;
using layout::Edges;
using layout::LayoutNode;
using layout::Near;
using layout::Point;

namespace {

void ReadSides(const LayoutNode& node, BoxShape& shape) {
    const css::LayoutStyle& style = *node.style->layout;
    const css::VisualStyle& visual = *node.style->visual;
    const css::Color& current = node.style->text->color;
    struct Side {
        float width;
        BorderStyleType type;
        const css::BorderColor& color;
        float& out;
    };
    const Side sides[] = {
        {node.border().left, style.borderLeftStyle, visual.borderLeftColor, shape.border.left},
        {node.border().right, style.borderRightStyle, visual.borderRightColor, shape.border.right},
        {node.border().top, style.borderTopStyle, visual.borderTopColor, shape.border.top},
        {node.border().bottom, style.borderBottomStyle, visual.borderBottomColor, shape.border.bottom}};
    for (uint32_t i = 0; i < 4; ++i) {
        shape.colors[i] = ToFresco(sides[i].color.Resolve(current));
        // Dotted and dashed sides take room but paint nothing.
        if (sides[i].type != BorderStyleType::Solid || sides[i].width <= layout::kLengthTolerance) continue;
        sides[i].out = sides[i].width;
        shape.bits |= 1u << i;
    }
    auto differ = [&](uint32_t a, uint32_t b, uint32_t bit) {
        const uint32_t both = (1u << a) | (1u << b);
        if ((shape.bits & both) == both && !SameColor(shape.colors[a], shape.colors[b])) shape.bits |= bit;
    };
    differ(2, 0, kDiffersTopLeft);
    differ(2, 1, kDiffersTopRight);
    differ(3, 0, kDiffersBottomLeft);
    differ(3, 1, kDiffersBottomRight);
}

void ReadCorners(BoxShape& shape) {
    const Point corners[] = {shape.radii.topLeft, shape.radii.topRight, shape.radii.bottomLeft,
                             shape.radii.bottomRight};
    for (uint32_t i = 0; i < 4; ++i) {
        const bool round = corners[i].x > 0 && corners[i].y > 0;
        if (round) shape.bits |= kRoundTopLeft << i;
        if (!round || Near(corners[i].x, corners[i].y)) shape.bits |= kCircularTopLeft << i;
    }
}

bool HasUniformSides(const BoxShape& shape) {
    const Edges& b = shape.border;
    return (shape.bits & kAllSides) == kAllSides && Near(b.left, b.right) && Near(b.left, b.top) &&
           Near(b.left, b.bottom);
}

// The radii of each edge use all of it, left and right alike: what remains is an ellipse.
bool IsElliptic(const BoxShape& shape) {
    const CornerRadii& r = shape.radii;
    return Near(r.topLeft.x + r.topRight.x, shape.box.width) &&
           Near(r.bottomLeft.x + r.bottomRight.x, shape.box.width) &&
           Near(r.topLeft.y + r.bottomLeft.y, shape.box.height) &&
           Near(r.topRight.y + r.bottomRight.y, shape.box.height) && Near(r.topLeft.x, r.topRight.x) &&
           Near(r.bottomLeft.x, r.bottomRight.x) && Near(r.topLeft.y, r.topRight.y) &&
           Near(r.bottomLeft.y, r.bottomRight.y) && Near(r.topLeft.y, r.bottomLeft.y);
}

void Classify(BoxShape& shape) {
    const bool sides = (shape.bits & kAllSides) != 0;
    const bool uniform = !sides || HasUniformSides(shape);
    if ((shape.bits & kAnyRound) == 0) {
        shape.kind = sides ? BoxKind::Bordered : BoxKind::Plain;
        if (uniform) shape.bits |= kShapeUniformRect;
        return;
    }
    shape.kind = sides ? BoxKind::RoundedBordered : BoxKind::Rounded;
    if (uniform && IsElliptic(shape)) {
        shape.bits |= Near(shape.box.width, shape.box.height) ? kShapeCircle : kShapeEllipse;
    } else if (uniform && (shape.bits & kAllCircular) == kAllCircular) {
        shape.bits |= kShapeUniformRounded;
    } else {
        shape.bits |= kShapeIrregular;
    }
}

bool ShowsAnything(const ResolvedShadow& shadow) {
    return !Near(shadow.x, 0) || !Near(shadow.y, 0) || !Near(shadow.blur, 0) || !Near(shadow.spread, 0);
}

}  // namespace

void FitRadii(CornerRadii& r, float width, float height) {
    float factor = 1;
    auto fit = [&](float available, float first, float second) {
        if (first + second > 0) factor = std::min(factor, available / (first + second));
    };
    fit(width, r.topLeft.x, r.topRight.x);
    fit(width, r.bottomLeft.x, r.bottomRight.x);
    fit(height, r.topLeft.y, r.bottomLeft.y);
    fit(height, r.topRight.y, r.bottomRight.y);
    if (factor > 1 - 1e-5f) return;
    for (Point* corner : {&r.topLeft, &r.topRight, &r.bottomRight, &r.bottomLeft}) {
        corner->x *= factor;
        corner->y *= factor;
    }
}

CornerRadii InsetRadii(const CornerRadii& r, const Edges& by) {
    auto less = [](Point corner, float x, float y) {
        return Point{std::max(corner.x - x, 0.0f), std::max(corner.y - y, 0.0f)};
    };
    return {less(r.topLeft, by.left, by.top), less(r.topRight, by.right, by.top),
            less(r.bottomRight, by.right, by.bottom), less(r.bottomLeft, by.left, by.bottom)};
}

CornerRadii SpreadRadii(const CornerRadii& r, float spread) {
    auto more = [spread](Point corner) {
        return Point{corner.x > 0 ? std::max(corner.x + spread, 0.0f) : 0,
                     corner.y > 0 ? std::max(corner.y + spread, 0.0f) : 0};
    };
    return {more(r.topLeft), more(r.topRight), more(r.bottomRight), more(r.bottomLeft)};
}

bool SameColor(const fresco::Color& a, const fresco::Color& b) {
    return a.r == b.r && a.g == b.g && a.b == b.b && a.a == b.a;
}

BoxShape AnalyseBox(const LayoutNode& node, bool snapToPixels) {
    BoxShape shape;
    shape.box = PaintBox(node, snapToPixels);
    if (node.visuals) {
        shape.radii = node.visuals->radii;
        FitRadii(shape.radii, shape.box.width, shape.box.height);
        for (const ResolvedShadow& shadow : node.visuals->boxShadows) {
            if (ShowsAnything(shadow)) shape.bits |= shadow.inset ? kInsetShadow : kOuterShadow;
        }
    }
    ReadSides(node, shape);
    ReadCorners(shape);
    Classify(shape);
    return shape;
}

}  // namespace qorvex::dsp
