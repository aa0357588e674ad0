#include "fresco/cpu/cpu_library.h"

#include <fresco/library.h>
#include "fresco/core/log.h"
#include "fresco/cpu/cpu_scene.h"

namespace fresco {
namespace cpu {

void CpuLibrary::FreeRenderingResources() {
    shared_.resources.Clear();
    shared_.layers.Clear();
    shared_.glyphs.Clear();
}

IScene* CpuLibrary::CreateScene(const SceneParams&) {
    return HeapNew<CpuScene>(shared_);
}

void CpuLibrary::Forward(uint64_t, uint64_t, uint64_t) {
    FRESCO_WARN("IRenderingLibrary::Forward is not available in this build");
}

void CpuLibrary::Destroy() {
    HeapDelete(this);
    Library::Stop();
}

}  // namespace cpu

IRenderingLibrary* IRenderingLibrary::Initialize(const RenderingLibraryParams& params) {
    Library::Start(params.allocator, params.logHandler, params.loggingSeverity);
    auto* library = HeapNew<cpu::CpuLibrary>();
    if (!library) {
        Library::Stop();
        return nullptr;
    }
    library->shared().fonts.SetOptions(params.additionalOptions);
    return library;
}

}  // namespace fresco
