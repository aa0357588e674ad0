// What a view keeps between frames for its recording. Layout thread; the DOM thread only while no frame is
// there.
#pragma once

#include "display/path_cache.h"
#include "display/scratch_surfaces.h"
#include "display/shadow_cache.h"

namespace qorvex::dsp {

// The dirty rectangles of the last frames, for the highlight that shows what was painted.
class DirtyHistory {
  public:
    using List = Vector<layout::Rect, MemoryTag::Rendering>;
    static constexpr uint32_t kFrames = 8;

    bool Empty() const { return lists_.empty(); }
    void Push(List&& rects);
    // Forgets the oldest frame.
    void Age();
    void Clear() { lists_.clear(); }
    const Vector<List, MemoryTag::Rendering>& Lists() const { return lists_; }

  private:
    Vector<List, MemoryTag::Rendering> lists_;  // oldest first
};

struct RenderCaches {
    ShadowCache shadows;
    PathCache paths;
    ScratchSurfaces scratch;
    DirtyHistory highlighted;

    // The rendering resources were freed on the render thread: ids kept here mean nothing any more.
    void ForgetResources();
};

}  // namespace qorvex::dsp
