// Draws the frames of one view. Render thread only. The view outlives it.
#pragma once

#include <fresco/command_buffer.h>
#include <qorvex/renderers.h>

#include "core/memory/containers.h"
#include "core/tasks/task_system.h"

namespace fresco {
class IScene;
}

namespace qorvex {

class FrameQueue;
class ViewImpl;

class ViewRendererImpl final : public ViewRenderer {
  public:
    explicit ViewRendererImpl(ViewImpl& view);
    ~ViewRendererImpl() override = default;

    void Destroy() override;
    PaintStatus Paint(unsigned frame_id, bool wait_for_completion) override;
    void SetRenderTarget(void* color, void* depth, const RenderTargetDescription* description) override;
    void SetRenderTargetSimple(void* color, void* depth, unsigned width, unsigned height,
                               unsigned samples) override;
    void FreeRenderingResources() override;

  private:
    void ReleaseTextures();

    ViewImpl& view_;
    TaskFamilyHandle family_;
    fresco::IScene& scene_;
    FrameQueue& frame_queue_;
    // Images that went while their frame was being drawn.
    Vector<fresco::ImageId, MemoryTag::Rendering> textures_to_release_;
};

}  // namespace qorvex
