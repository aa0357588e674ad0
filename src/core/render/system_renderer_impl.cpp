#include "core/render/system_renderer_impl.h"

#include <fresco/rendering_library.h>

#include "core/logging/log.h"
#include "core/memory/thread_scope.h"
#include "core/render/renderer_registry.h"
#include "core/render/view_renderer_impl.h"
#include "core/view_impl.h"

namespace qorvex {

SystemRendererImpl::SystemRendererImpl(fresco::IRenderingLibrary& rendering, RendererRegistry& registry,
                                       bool debug_names, bool external)
    : debug_names_(debug_names),
      rendering_(rendering),
      registry_(registry),
      external_rendering_library_(external) {
    registry_.Add(this);
}

ViewRenderer* SystemRendererImpl::CreateViewRenderer(View* view) {
    ThreadScope scope;
    // A rendering library may refuse a scene; such a view cannot be drawn.
    if (!view || !static_cast<ViewImpl&>(*view).GetRenderLink().GetScene()) return nullptr;
    return New<ViewRendererImpl, MemoryTag::General>(static_cast<ViewImpl&>(*view), registry_);
}

void SystemRendererImpl::Destroy() {
    ThreadScope scope;
    registry_.Remove(this);
    Delete<MemoryTag::General>(this);
}

void SystemRendererImpl::RegisterRenderThread(void* device, void* context, uint64_t flags) {
    if (external_rendering_library_) {
        LogError("RegisterRenderThread cannot be used when using external RenderingLibrary!");
        return;
    }
    rendering_.RegisterRenderThread(device, context, flags);
}

void SystemRendererImpl::FreeRenderingResources() {
    if (external_rendering_library_) {
        LogError("FreeRenderingResources cannot be used when using external RenderingLibrary!");
        return;
    }
    rendering_.FreeRenderingResources();
    LogDebug(
        "SystemRenderer::FreeRenderingResources should be called along ViewRenderer::FreeRenderingResources "
        "to "
        "free all resources. Make sure to call ViewRenderer's counterpart to free all resources.");
}

}  // namespace qorvex
