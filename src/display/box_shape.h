// Analysis of a box before it paints: which sides and corners it has, and the cheapest operations that draw
// it.
#pragma once

#include "display/resolved_visuals.h"
#include "layout/layout_handle.h"

#include <fresco/paint.h>

namespace qorvex::dsp {

// Sides and corners in the order left, right, top, bottom and top-left, top-right, bottom-left, bottom-right.
enum BoxShapeBits : uint32_t {
    kSideLeft = 0x1,
    kSideRight = 0x2,
    kSideTop = 0x4,
    kSideBottom = 0x8,
    kAllSides = 0xF,
    kRoundTopLeft = 0x10,
    kRoundTopRight = 0x20,
    kRoundBottomLeft = 0x40,
    kRoundBottomRight = 0x80,
    kAnyRound = 0xF0,
    // The corner's two radii are equal, or it is not round.
    kCircularTopLeft = 0x100,
    kCircularTopRight = 0x200,
    kCircularBottomLeft = 0x400,
    kCircularBottomRight = 0x800,
    kAllCircular = 0xF00,
    // Both sides draw, in different colours.
    kDiffersTopLeft = 0x1000,
    kDiffersTopRight = 0x2000,
    kDiffersBottomLeft = 0x4000,
    kDiffersBottomRight = 0x8000,
    kAnyDiffers = 0xF000,
    kShapeCircle = 0x20000,
    kShapeEllipse = 0x40000,
    kShapeUniformRounded = 0x80000,
    kShapeIrregular = 0x100000,
    kShapeUniformRect = 0x200000,
    kOuterShadow = 0x400000,
    kInsetShadow = 0x800000,
};

enum class BoxKind : uint8_t { Plain = 0, Rounded = 1, Bordered = 2, RoundedBordered = 3 };

struct BoxShape {
    layout::Rect box{};         // border box as painted
    layout::Edges border;       // widths of the sides that draw, 0 for the others
    fresco::CornerRadii radii;  // scaled down to fit
    fresco::Color colors[4];    // left, right, top, bottom
    uint32_t bits = 0;
    BoxKind kind = BoxKind::Plain;

    bool IsRounded() const { return kind == BoxKind::Rounded || kind == BoxKind::RoundedBordered; }
};

bool SameColor(const fresco::Color& a, const fresco::Color& b);

BoxShape AnalyseBox(const layout::LayoutNode& node, bool snapToPixels);

// Radii that do not fit their box shrink together, which keeps their proportions (CSS Backgrounds 3,
// section 4.5).
void FitRadii(fresco::CornerRadii& radii, float width, float height);

// The radii of the rectangle that lies `by` inside.
fresco::CornerRadii InsetRadii(const fresco::CornerRadii& radii, const layout::Edges& by);
// Radii of a rectangle that is larger by `spread`; a sharp corner stays sharp.
fresco::CornerRadii SpreadRadii(const fresco::CornerRadii& radii, float spread);

}  // namespace qorvex::dsp
