// What the tasks of one frame share: made by Advance, freed when the last task lets go.
//
// Invariant: while the frame is on the layout side the layout thread owns everything in here; the main thread
// touches it only before the tasks are pushed and after UnblockLayout.
#pragma once

#include <fresco/library.h>
#include <fresco/scene.h>

#include "core/debug/frame_stats_recorder.h"
#include "core/frame/render_frame.h"
#include "core/frame/render_link.h"
#include "core/tasks/task_system.h"
#include "display/dirty_region.h"
#include "display/record_rendering.h"
#include "layout/perform_layout.h"
#include "qorvex/frame_capture.h"
#include "qorvex/view_settings.h"
#include "resources/cached_images_manager.h"

namespace qorvex {

class FrameData : public AtomicRefCounted<FrameData, MemoryTag::LayoutData> {
  public:
    TaskFamilyHandle family;
    uint32_t view_id = 0;
    uint32_t frame_id = 0;
    layout::HandlePtr root;
    layout::LayoutUpdatePtr update;
    uint32_t width = 0;
    uint32_t height = 0;
    dsp::DirtyRegion dirty;  // swapped out of the view
    bool should_record = true;
    bool show_paint_rectangles = false;
    bool paint_option = false;  // no partial redraw
    bool disable_flex_basis_units = false;
    bool snap_to_pixels = true;
    layout::FlexAlgorithm flex_algorithm = layout::FlexAlgorithm::Yoga;
    float scale_x = 1;
    float scale_y = 1;
    // Moved out of the view. It exists before recording starts, so that Paint can wait for a frame that is
    // still being laid out.
    RenderFramePtr render_frame;
    uint64_t scene_frame = 0;

    // Borrowed from the view, which waits for its frame before it goes.
    fresco::IScene* scene = nullptr;
    RenderLink* link = nullptr;
    dsp::RenderCaches* caches = nullptr;
    RefPtr<CachedImagesManager> images;
    FrameStatsRecorder* stats = nullptr;
    std::atomic<uint32_t>* layout_unblocked = nullptr;

    OnFrameCompleteCallback on_frame_complete = nullptr;
    void* callback_user_data = nullptr;
    FrameCaptureCallback capture_callback = nullptr;
    void* capture_user_data = nullptr;

    layout::LayoutPass MakePass();
};

using FrameDataPtr = RefPtr<FrameData>;

// Body of the task RecordRendering: records, and hands what came of it to the render thread. Layout thread.
void RecordFrame(FrameData& frame);

}  // namespace qorvex
