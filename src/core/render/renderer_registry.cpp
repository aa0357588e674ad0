#include "core/render/renderer_registry.h"

#include <qorvex/renderers.h>

#include "core/logging/log.h"

namespace qorvex {

void RendererRegistry::Add(ViewRenderer* renderer) {
    qsl::MutexLock lock(mutex_);
    views_.push_back(renderer);
}

void RendererRegistry::Add(SystemRenderer* renderer) {
    qsl::MutexLock lock(mutex_);
    systems_.push_back(renderer);
}

void RendererRegistry::Remove(ViewRenderer* renderer) {
    qsl::MutexLock lock(mutex_);
    views_.erase_if([&](ViewRenderer* other) { return other == renderer; });
}

void RendererRegistry::Remove(SystemRenderer* renderer) {
    qsl::MutexLock lock(mutex_);
    systems_.erase_if([&](SystemRenderer* other) { return other == renderer; });
}

void RendererRegistry::DestroyForgotten() {
    Vector<ViewRenderer*> views;
    Vector<SystemRenderer*> systems;
    {
        qsl::MutexLock lock(mutex_);
        views.swap(views_);
        systems.swap(systems_);
    }
    if (views.empty() && systems.empty()) return;
    LogError("Library::Uninitialize called before its renderers were destroyed");
    for (ViewRenderer* renderer : views)
        renderer->Destroy();
    for (SystemRenderer* renderer : systems)
        renderer->Destroy();
}

}  // namespace qorvex
