// The frame cycle: what Advance does, in order, and what blocks what.
#include <fresco/scene.h>

#include <cmath>

#include "core/api_call.h"
#include "core/debug/thread_counting_allocator.h"
#include "core/frame/frame_graph.h"
#include "core/logging/log.h"
#include "core/view_impl.h"
#include "layout/fonts/font_manager.h"
#include "resources/cached_images_manager.h"
#include "resources/cached_svg_manager.h"
#include "script/bindings/window.h"
#include "script/engine_seam.h"

namespace qorvex {

void ViewImpl::Advance(double time) {
    const APICall call(family_, api_depth_);
    if (!call) return;
    if (!services_.tasks->IsRunning()) {
        LogError("View::Advance called after StopWorkers");
        return;
    }
    if (advancing_) {
        LogError("View::Advance called from inside Advance");
        return;
    }
    TempMark mark;
    advancing_ = true;
    pushed_frame_ = false;
    OpenFrameId();
    const uint64_t allocations = ThreadCountingAllocator::CountOnThisThread();
    {
        StageTimer timer(stats_, open_frame_id_, &FrameStats::Advance);
        HandleRendererReset();
        services_.library_timers->SetClock(this);
        TakeTime(time);
        RunMainThreadResults();
        if (document_) document_->MaybeFinishLoad();
        ExecuteTimersAndScripts();
        if (document_)
            AdvanceDocument();
        else
            CompleteIdleFrame();
    }
    stats_.Update(open_frame_id_, [&](FrameStats& stats) {
        stats.Allocations = ThreadCountingAllocator::CountOnThisThread() - allocations;
    });
    services_.library_timers->SetClock(nullptr);
    CloseFrame();
    advancing_ = false;
}

void ViewImpl::AdvanceDocument() {
    if (document_->GetBuildState() != dom::BuildState::Built) document_->IterateDOMBuilding();
    // A script of the step above may have left the view without a document.
    if (!document_) {
        CompleteIdleFrame();
        return;
    }
    document_->GetImageClock().Advance(time_);
    layout::LayoutWork work = SolveFrame();
    TaskPtr preload = MakePreloadTask();
    WaitForPendingFrame();
    // Results that came in meanwhile may have brought another document, or taken the last one away.
    if (!document_) {
        CompleteIdleFrame();
        return;
    }
    if (!document_->GetLayoutTree().Root()) {
        work = SolveFrame();
        if (!preload) preload = MakePreloadTask();
    }
    CommitFrame(work);
    QueueCacheOperations();
    const bool fading = ShouldRecord() && !render_caches_.highlighted.Empty();
    const bool nothing_to_do = work == layout::LayoutWork::None && !dirty_region_.HasArea() && !fading;
    if (nothing_to_do && requested_frames_ == 0) {
        CompleteIdleFrame();
        return;
    }
    if (requested_frames_ > 0) --requested_frames_;
    PushFrame(work, std::move(preload));
}

void ViewImpl::OpenFrameId() {
    if (frame_open_) return;
    open_frame_id_ = frame_id_++;
    frame_open_ = true;
    frame_queue_.RegisterFrame(open_frame_id_);
    stats_.Begin(open_frame_id_);
}

void ViewImpl::HandleRendererReset() {
    const uint32_t generation = frame_queue_.GetResets();
    if (generation == last_rendering_generation_) return;
    WaitUntilLayoutIdle();
    LogDebug("Rendering resources reset detected. Next valid frame id ", open_frame_id_);
    MarkWholeViewDirty();
    render_caches_.ForgetResources();
    services_.images->ReloadAll();
    services_.svgs->ReloadAll();
    last_rendering_generation_ = generation;
}

void ViewImpl::TakeTime(double time) {
    // A clock that shows no time would stop every timer for good.
    if (!std::isfinite(time)) {
        LogWarning("Time given to Advance is not finite");
        return;
    }
    // Compared with the time before the last one, so that one late frame may step back once.
    if (time < previous_time_) {
        LogWarning("Time given to Advance is less than last advance time, last advance time: ",
                   previous_time_, " / time given: ", time);
        return;
    }
    previous_time_ = time_;
    time_ = time;
}

void ViewImpl::RunMainThreadResults() {
    if (services_.fonts) services_.fonts->RunMainTasks();
    services_.tasks->Run(TaskChannels::ResourceEvents, false, nullptr, family_.family);
    services_.tasks->Run(TaskChannels::Main, false, nullptr, family_.family);
}

void ViewImpl::ExecuteTimersAndScripts() {
    StageTimer timer(stats_, open_frame_id_, &FrameStats::Script);
    LogTrace("Executing timers and JS");
    // Timers come before frame callbacks, so that what a timer has prepared shows in this frame.
    services_.library_timers->Advance(time_);
    timers_.Advance(time_);
    if (script_context_ && script_context_->window)
        script_context_->window->RunTimersAndFrameCallbacks(time_);
    PumpScriptEngine();
    LogTrace("Handling continuous gestures");
}

void ViewImpl::PumpScriptEngine() {
    // The engine's own timers, collection above all, can wait until the page is there, but for no load that
    // hangs.
    const bool loads = document_ && !document_->IsLoadFired();
    if (loads && ++loading_frames_ < limits::kLoadingFramesWithoutPump) return script::SettleScriptHeap();
    loading_frames_ = 0;
    script::PumpScriptEngine();
}

layout::LayoutWork ViewImpl::SolveFrame() {
    StageTimer timer(stats_, open_frame_id_, &FrameStats::Style);
    const auto& counters = static_cast<css::StyleEngine&>(document_->GetStyleEngine()).GetCounters();
    const uint64_t solved = counters.elementsSolved;
    document_->SolveStyles();
    stats_.Update(open_frame_id_,
                  [&](FrameStats& stats) { stats.Restyled += counters.elementsSolved - solved; });
    return document_->UpdateLayoutStyles(std::exchange(force_full_layout_, false));
}

TaskPtr ViewImpl::MakePreloadTask() {
    if (!services_.preload_font_data || !services_.fonts || !document_) return TaskPtr();
    return document_->TakeFontPreload(services_.fonts->Service());
}

// The one place where a frame waits for the one before it: the main thread has done all its own work and
// needs the layout side idle.
void ViewImpl::WaitForPendingFrame() {
    WaitUntilLayoutIdle();
}

void ViewImpl::WaitUntilLayoutIdle() {
    while (layout_unblocked_.load(std::memory_order_acquire) == 0) {
        if (!services_.tasks->IsRunning()) return DropFrameOnLayoutSide();
        // No thread may be there to serve the layout side (a paused game, a job that has not started yet),
        // and this one has nothing else to do. The tasks of a frame form a chain: whoever runs one goes on
        // with the next, so what is not queued now ends without help.
        services_.tasks->Run(TaskChannels::Layout, false, nullptr, family_.family);
        services_.tasks->Run(TaskChannels::Main, true, &layout_unblocked_, family_.family);
    }
}

// The client has stopped the workers first: what is queued never runs, and what a worker is in must end.
void ViewImpl::DropFrameOnLayoutSide() {
    services_.tasks->DestroyFamily(family_.family);
    frame_queue_.DiscardAll();
    layout_unblocked_.store(1, std::memory_order_release);
}

void ViewImpl::CommitFrame(layout::LayoutWork work) {
    StageTimer timer(stats_, open_frame_id_, &FrameStats::Commit);
    if (continuous_repaint_) MarkWholeViewDirty();
    if (link_->TakeRedraw()) picture_lost_ = true;
    if (picture_lost_ && ShouldRecord()) {
        picture_lost_ = false;
        MarkWholeViewDirty();
        // Some of them may never have been drawn.
        render_caches_.shadows.Clear();
    }
    update_.reset();
    const layout::LayoutTree& tree = document_->GetLayoutTree();
    if (work == layout::LayoutWork::None && tree.Changed().Empty() && tree.Removed().Empty()) return;
    update_ = MakeRef<layout::LayoutUpdateData>();
    // A full layout finds the areas for itself.
    document_->CommitLayout(*update_, work == layout::LayoutWork::Layout ? nullptr : &dirty_region_, nullptr);
}

void ViewImpl::QueueCacheOperations() {
    ApplyViewSideCacheRequests();
    if (cache_requests_.Empty()) return;
    GetOpenFrame().Push(MakeTask("HandleQueuedCacheOperations",
                                 [requests = std::exchange(cache_requests_, CacheRequests()),
                                  scene = scene_](TaskFamilyHandle) { requests.Apply(*scene); }));
}

RenderFrame& ViewImpl::GetOpenFrame() {
    if (open_frame_) return *open_frame_;
    OpenFrameId();
    open_frame_ = RenderFrame::Create();
    frame_queue_.SetFrame(open_frame_id_, open_frame_);
    if (frame_queue_.GetResets() != last_rendering_generation_) {
        open_frame_->Discard();
        LogTrace("Discarded frame ", open_frame_id_);
    }
    return *open_frame_;
}

bool ViewImpl::ShouldRecord() const {
    return rendering_enabled_ && !(wait_for_renderer_ && !link_->HasRenderer());
}

FrameDataPtr ViewImpl::MakeFrameData() {
    if (!update_) update_ = MakeRef<layout::LayoutUpdateData>();
    GetOpenFrame();
    FrameDataPtr frame = MakeRef<FrameData>();
    frame->family = family_;
    frame->view_id = id_;
    frame->frame_id = open_frame_id_;
    frame->root = layout::HandlePtr(document_->GetLayoutTree().Root());
    frame->update = std::move(update_);
    frame->width = width_;
    frame->height = height_;
    frame->dirty = std::exchange(dirty_region_, dsp::DirtyRegion());
    frame->should_record = ShouldRecord();
    if (!frame->should_record) picture_lost_ = true;
    frame->show_paint_rectangles = show_paint_rectangles_;
    frame->paint_option = paint_option_;
    frame->disable_flex_basis_units = disable_flex_basis_units_;
    frame->snap_to_pixels = services_.snap_to_pixels;
    frame->flex_algorithm = flex_algorithm_;
    frame->scale_x = scale_x_;
    frame->scale_y = scale_y_;
    frame->render_frame = std::move(open_frame_);
    if (scene_) frame->scene_frame = scene_->NewFrame();
    frame->scene = scene_;
    frame->link = link_.get();
    frame->caches = &render_caches_;
    frame->images = RefPtr<CachedImagesManager>(services_.images);
    frame->stats = &stats_;
    frame->layout_unblocked = &layout_unblocked_;
    frame->on_frame_complete = on_frame_complete_;
    frame->callback_user_data = callback_user_data_;
    frame->capture_callback = capture_callback_;
    frame->capture_user_data = capture_user_data_;
    if (!capture_all_) capture_callback_ = nullptr;
    return frame;
}

TaskPtr ViewImpl::MakeScheduledTask() {
    auto scheduled = document_->TakeScheduledLayoutTasks();
    if (scheduled.empty()) return TaskPtr();
    return MakeTask("ExecuteScheduledLayoutTasks",
                    [scheduled = std::move(scheduled)](TaskFamilyHandle family) {
                        for (const auto& task : scheduled)
                            task(family);
                    });
}

void ViewImpl::PushFrame(layout::LayoutWork work, TaskPtr preload) {
    pushed_frame_ = true;
    layout_unblocked_.store(0, std::memory_order_release);
    std::atomic<uint32_t> done{0};
    FrameGraphRequest request;
    request.frame = MakeFrameData();
    request.work = work;
    request.scheduled = MakeScheduledTask();
    const bool has_preload = static_cast<bool>(preload);
    request.preload = std::move(preload);
    if (!asynchronous_layout_) request.synchronous_done = &done;
    PushFrameGraph(*services_.tasks, std::move(request));
    if (asynchronous_layout_) return;
    // A client without worker threads has nobody else to load the glyphs that layout waits for.
    if (has_preload) services_.tasks->Run(TaskChannels::Resources, false, nullptr, family_.family);
    services_.tasks->Run(TaskChannels::Layout, true, &done, family_.family);
    // A callback has stopped the workers: the frame must not outlive `done`.
    if (done.load(std::memory_order_acquire) == 0) DropFrameOnLayoutSide();
}

void ViewImpl::CompleteIdleFrame() {
    if (on_frame_complete_) on_frame_complete_(callback_user_data_, id_, open_frame_id_, 0);
}

void ViewImpl::CloseFrame() {
    if (open_frame_) {
        open_frame_->PushClose();
        open_frame_.reset();
    }
    frame_open_ = false;
}

}  // namespace qorvex
