// What display elements see while one frame is recorded. Lives for one record, on the layout thread.
#pragma once

#include "css/values/color.h"
#include "css/values/length_context.h"
#include "layout/layout_handle.h"
#include "layout/work_counters.h"

#include <fresco/paint.h>

namespace qorvex {
struct TaskFamilyHandle;
}

namespace qorvex::dsp {

class PathCache;
class ScratchSurfaces;
class ShadowCache;
struct FrameRecord;

class PaintContext {
  public:
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
    // Where results for the DOM go; null: nobody wants them.
    const TaskFamilyHandle* family = nullptr;
};

inline fresco::Color ToFresco(const css::Color& color) {
    return {color.red, color.green, color.blue, color.alpha};
}

inline fresco::Paint SolidPaint(const fresco::Color& color) {
    fresco::Paint paint;
    paint.color = color;
    return paint;
}

}  // namespace qorvex::dsp
