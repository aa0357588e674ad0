// The task graph of one frame.
#pragma once

#include "core/frame/frame_data.h"

namespace qorvex {

struct FrameGraphRequest {
    FrameDataPtr frame;
    layout::LayoutWork work = layout::LayoutWork::None;
    // Tasks that script and input have scheduled for the layout side; null when there are none.
    TaskPtr scheduled;
    // On the resource channel, ahead of layout; null when there are no new glyphs.
    TaskPtr preload;
    // Null in asynchronous mode; else set when the whole layout side of the frame is done.
    std::atomic<uint32_t>* synchronous_done = nullptr;
};

// Makes the tasks, ties them together and pushes them. Main thread, with the layout side idle.
void PushFrameGraph(TaskSystem& tasks, FrameGraphRequest request);

}  // namespace qorvex
