// Drawing. Both renderers live on the render thread: everything here is called there, and there only.
#pragma once

#include <cstdint>

namespace qorvex {

class View;

enum class PaintStatus : std::uint32_t {
    FrameMissing = 0,     // the id is unknown, or was painted to completion before
    NothingExecuted = 1,  // nothing has been recorded yet, or the frame was discarded
    InProgress = 2,       // something was drawn and more is to come; call again with this id
    Complete = 3,         // all is drawn, or the frame had nothing to draw
};

struct SystemRendererSettings {
    // Resources carry names that graphics debuggers show.
    bool EnableDebugNames = false;
};

// What View's drawing is to fit. The colour target itself is an object of the rendering back end: for the CPU
// back end a fresco::CpuRenderTarget, which names the pixels and their row pitch.
struct RenderTargetDescription {
    std::uint32_t Flags = 256;
    std::uint32_t Width = 0;  // pixels
    std::uint32_t Height = 0;
    std::uint32_t Samples = 1;
};

// Draws the frames of one view. Best destroyed before its View; a renderer that outlives the view finds no
// frame to paint, and goes with Library::Uninitialize, with an Error line, when it is forgotten.
class ViewRenderer {
  protected:
    virtual ~ViewRenderer() = default;

  public:
    virtual void Destroy() = 0;
    // Draws the frame with this id, as OnFrameComplete gave it, onto the render target. Frames may be painted
    // in any order; an id that completed is forgotten. With waitForCompletion the call blocks until the
    // frame's recording has finished, or the view or the workers end, so the layout side must be served by
    // another thread.
    virtual PaintStatus Paint(unsigned frameId, bool waitForCompletion) = 0;
    // The targets stay the client's and must live until another target is set or the renderer is destroyed.
    // depth may be null for back ends without one; description gives the size.
    virtual void SetRenderTarget(void* color, void* depth, const RenderTargetDescription* description) = 0;
    virtual void SetRenderTargetSimple(void* color, void* depth, unsigned width, unsigned height,
                                       unsigned samples) = 0;
    // Drops everything that lives in the rendering back end for this view, for example before a device is
    // lost. Frames not painted yet are discarded; the next Advance redraws the whole view.
    virtual void FreeRenderingResources() = 0;
};

// The render thread's end of a System. Destroyed at any time before Library::Uninitialize.
class SystemRenderer {
  protected:
    virtual ~SystemRenderer() = default;

  public:
    // One for each view. Released with ViewRenderer::Destroy.
    virtual ViewRenderer* CreateViewRenderer(View* view) = 0;
    virtual void Destroy() = 0;
    // The calling thread becomes the render thread of an internal rendering library; the arguments belong to
    // its back end (the CPU one takes none).
    virtual void RegisterRenderThread(void* device, void* context, std::uint64_t flags) = 0;
    // Drops what an internal rendering library holds for all views. Call every ViewRenderer's
    // FreeRenderingResources along with it.
    virtual void FreeRenderingResources() = 0;
};

}  // namespace qorvex
