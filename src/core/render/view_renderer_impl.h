// Draws the frames of one view. Render thread only. It may outlive the view, and then finds no frame.
#pragma once

#include <fresco/command_buffer.h>
#include <qorvex/renderers.h>

#include "core/frame/render_link.h"
#include "core/memory/containers.h"
#include "core/tasks/task_system.h"

namespace qorvex {

class CachedImagesManager;
class RendererRegistry;
class ViewImpl;

class ViewRendererImpl final : public ViewRenderer {
  public:
    // The view has a scene.
    ViewRendererImpl(ViewImpl& view, RendererRegistry& registry);
    ~ViewRendererImpl() override;

    void Destroy() override;
    PaintStatus Paint(unsigned frame_id, bool wait_for_completion) override;
    void SetRenderTarget(void* color, void* depth, const RenderTargetDescription* description) override;
    void SetRenderTargetSimple(void* color, void* depth, unsigned width, unsigned height,
                               unsigned samples) override;
    void FreeRenderingResources() override;

  private:
    RendererRegistry& registry_;
    RefPtr<RenderLink> link_;
    FrameQueue& frame_queue_;
    RefPtr<CachedImagesManager> images_;
    fresco::IScene& scene_;
    TaskFamilyHandle family_;
};

}  // namespace qorvex
