// What a view keeps between frames for its recording. Layout thread, except where noted.
#pragma once

#include "display/path_cache.h"
#include "display/scratch_surfaces.h"
#include "display/shadow_cache.h"

namespace qorvex::dsp {

struct RenderCaches {
    ShadowCache shadows;
    PathCache paths;
    ScratchSurfaces scratch;
    // Dirty lists of the last frames, for the paint-rectangles highlight.
    Vector<layout::Rect, MemoryTag::Rendering> highlighted;

    // The rendering resources were freed on the render thread: ids kept here mean nothing any more.
    void ForgetResources();
};

}  // namespace qorvex::dsp
