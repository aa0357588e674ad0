// What display elements see while one frame is recorded. Lives for one record, on the layout thread.
#pragma once

#include "css/values/length.h"
#include "layout/geometry.h"
#include "layout/work_counters.h"

#include <span>

namespace fresco {
class EffectFactory;
class Library;
}  // namespace fresco

namespace qorvex::dsp {

class PathCache;
class ScratchSurfaces;
class ShadowCache;
struct FrameRecord;

class PaintContext {
  public:
    fresco::Library* library = nullptr;
    FrameRecord& record;
    ShadowCache& shadows;
    PathCache& paths;
    ScratchSurfaces& scratch;
    layout::WorkCounters& counters;
    css::LengthContext lengths;  // em is that of the node being painted
    layout::Size viewSize;
    float scaleX = 1;
    float scaleY = 1;
    bool snapToPixels = true;
    bool partialRedraw = false;
    bool showDirtyRects = false;
    // Areas to paint in view coordinates; everything outside may be left out.
    std::span<const layout::Rect> dirty;

    // The node's box as it is painted: snapped unless the library was started without snapping.
    layout::Rect PaintBox(const layout::LayoutNode& node) const;
};

}  // namespace qorvex::dsp
