// Turns the laid-out tree into command buffers. Layout thread; nothing is drawn here.
#pragma once

#include "display/frame_record.h"
#include "display/render_caches.h"
#include "layout/perform_layout.h"

namespace qorvex {
struct TaskFamilyHandle;
}

namespace qorvex::dsp {

struct RecordRequest {
    RenderCaches& caches;  // of the view, used on the layout thread only
    float scaleX = 1;      // virtual resolution
    float scaleY = 1;
    bool partialRedraw = true;
    bool showPaintRectangles = false;
    bool record = true;  // false: rendering is off; pending resources still travel
    uint32_t frameNumber = 0;
    // Buffers queued by other tasks (uploads, releases): they go first. Taken over.
    BufferList resourceBuffers{};
    // Of the view, for results that elements have for the DOM; null: nobody wants them.
    const TaskFamilyHandle* family = nullptr;
};

// Body of the task RecordRendering; takes the pass's dirty region and leaves it empty.
FrameRecord RecordRendering(layout::LayoutPass& pass, RecordRequest&& request);

}  // namespace qorvex::dsp
