#include "core/render/view_renderer_impl.h"

#include <fresco/scene.h>

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"
#include "core/render/renderer_registry.h"
#include "core/view_impl.h"
#include "resources/cached_images_manager.h"

namespace qorvex {

namespace {

constexpr uint32_t kSimpleTargetFlags = 256;

PaintStatus DrawReadyTasks(RenderFrame& frame, TaskFamilyHandle family, uint32_t frame_id) {
    PaintStatus status = PaintStatus::NothingExecuted;
    while (frame.ExecuteOne(family)) {
        status = PaintStatus::InProgress;
        LogTrace("Executing one draw for frame ", frame_id);
    }
    return frame.GetState() == RenderFrame::State::Closed ? PaintStatus::Complete : status;
}

}  // namespace

ViewRendererImpl::ViewRendererImpl(ViewImpl& view, RendererRegistry& registry)
    : registry_(registry),
      link_(&view.GetRenderLink()),
      frame_queue_(link_->GetFrames()),
      images_(view.GetServices().images),
      scene_(*link_->GetScene()),
      family_(view.GetTaskFamily()) {
    link_->CountRenderer(+1);
    link_->AskForRedraw();  // its target shows nothing yet
    registry_.Add(this);
}

ViewRendererImpl::~ViewRendererImpl() = default;

PaintStatus ViewRendererImpl::Paint(unsigned frame_id, bool wait_for_completion) {
    ThreadScope scope;
    LogTrace("Paint frame");
    if (frame_queue_.TakeLoss()) link_->AskForRedraw();
    RenderFramePtr frame;
    PaintStatus status = PaintStatus::NothingExecuted;
    if (!frame_queue_.Find(frame_id, &frame)) {
        LogDebug("Trying to Paint missing/already drawn frame ", frame_id);
        status = PaintStatus::FrameMissing;
    } else if (!frame) {
        status = PaintStatus::Complete;
    } else if (wait_for_completion) {
        LogTrace("Drawing to completion frame ", frame_id);
        status = frame->ExecuteToCompletion(family_) ? PaintStatus::Complete : PaintStatus::NothingExecuted;
    } else {
        status = DrawReadyTasks(*frame, family_, frame_id);
    }
    images_->ReleasePendingGPUResources(scene_);
    if (status == PaintStatus::Complete || (wait_for_completion && status != PaintStatus::FrameMissing)) {
        LogTrace("Frame complete ", frame_id);
        frame_queue_.Remove(frame_id);
    }
    return status;
}

void ViewRendererImpl::SetRenderTarget(void* color, void* depth, const RenderTargetDescription* description) {
    ThreadScope scope;
    fresco::RenderTargetDescription target;
    if (description) {
        target.color = {description->Width, description->Height, description->Samples, description->Flags};
        target.depth = target.color;
    }
    scene_.SetRenderTarget(color, depth, target);
}

void ViewRendererImpl::SetRenderTargetSimple(void* color, void* depth, unsigned width, unsigned height,
                                             unsigned samples) {
    RenderTargetDescription description;
    description.Flags = kSimpleTargetFlags;
    description.Width = width;
    description.Height = height;
    description.Samples = samples;
    SetRenderTarget(color, depth, &description);
}

void ViewRendererImpl::FreeRenderingResources() {
    ThreadScope scope;
    LogDebug("ViewRenderer::FreeRenderingResources called.");
    // From here on the view discards new frames until it has noticed.
    frame_queue_.CountReset();
    images_->ForgetGPUResources();
    frame_queue_.DiscardAll();
    scene_.FreeResources();
}

void ViewRendererImpl::Destroy() {
    ThreadScope scope;
    registry_.Remove(this);
    link_->CountRenderer(-1);
    frame_queue_.ClearFrames();
    scene_.SetRenderTarget(nullptr, nullptr, fresco::RenderTargetDescription());
    scene_.Finish();
    Delete<MemoryTag::General>(this);
}

}  // namespace qorvex
