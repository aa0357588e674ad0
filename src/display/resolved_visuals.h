// Paint values of one node in pixels, resolved from its visual style against its box. Only nodes that need
// any of them have the record.
#pragma once

#include "core/memory/containers.h"
#include "layout/geometry.h"

#include <cstdint>

namespace qorvex::dsp {

struct ResolvedShadow {
    float x = 0;
    float y = 0;
    float blur = 0;
    float spread = 0;
    bool inset = false;
};

struct FilterExtent {
    float x = 0;
    float y = 0;
    float blurX = 0;
    float blurY = 0;
};

// One layer of a background: where its first tile lies, relative to the border box, and how it repeats. The
// size is 0 while an image has not told its own.
struct ResolvedImageLayer {
    layout::Rect tile{};
    float spacingX = 0;
    float spacingY = 0;
    bool repeatX = false;
    bool repeatY = false;
    // Of a gradient: start and end of a linear one, centre and half axes of a radial one, in units of the
    // larger side of the tile.
    layout::Point start{};
    layout::Point end{};
};

struct ResolvedVisuals {
    template <typename T>
    using List = Vector<T, MemoryTag::LayoutNodes>;

    fresco::CornerRadii radii;
    List<ResolvedImageLayer> backgrounds;
    List<ResolvedImageLayer> masks;  // at most one
    // At most one; its tile is the whole source, at the corner of the border image area.
    List<ResolvedImageLayer> borderImages;
    layout::Edges borderImageSlice;  // in pixels of the source
    layout::Edges borderImageWidth;
    layout::Edges borderImageOutset;
    List<ResolvedShadow> boxShadows;
    List<ResolvedShadow> textShadows;
    List<FilterExtent> filters;
};

// Equal within the tolerance of lengths.
bool Near(const ResolvedVisuals& a, const ResolvedVisuals& b);
bool HasRadii(const fresco::CornerRadii& radii);

// How far paint reaches beyond the box that makes it.
layout::Edges PaintOutset(const ResolvedVisuals& visuals);
// How far the node's filters spread what the node and its subtree paint.
layout::Edges FilterOutset(const ResolvedVisuals& visuals);

}  // namespace qorvex::dsp
