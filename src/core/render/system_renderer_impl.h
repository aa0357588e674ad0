// The render thread's end of a system. Render thread only.
#pragma once

#include <qorvex/renderers.h>

#include "core/memory/containers.h"

namespace fresco {
class IRenderingLibrary;
}

namespace qorvex {

class RendererRegistry;

class SystemRendererImpl final : public SystemRenderer {
  public:
    SystemRendererImpl(fresco::IRenderingLibrary& rendering, RendererRegistry& registry, bool debug_names,
                       bool external);
    ~SystemRendererImpl() override = default;

    ViewRenderer* CreateViewRenderer(View* view) override;
    void Destroy() override;
    void RegisterRenderThread(void* device, void* context, uint64_t flags) override;
    void FreeRenderingResources() override;

  private:
    bool debug_names_;
    fresco::IRenderingLibrary& rendering_;
    RendererRegistry& registry_;
    bool external_rendering_library_;
};

}  // namespace qorvex
