// A rendering library without pixels, for tests and servers: fonts measure, buffers record, and nothing is
// drawn.
#include <fresco/library.h>
#include <fresco/rendering_library.h>
#include "fresco/core/heap.h"
#include "fresco/fonts/font_service.h"

namespace fresco {
namespace {

class NullScene final : public IScene {
  public:
    void SetRenderTarget(void*, void*, const RenderTargetDescription&) override {}
    uint64_t NewFrame() override { return frames_.fetch_add(1, std::memory_order_relaxed); }
    void ExecuteFrontEnd(CommandBuffer* const*, uint32_t) override {}
    void ExecuteBackEnd(CommandBuffer* const* buffers, uint32_t count) override {
        stats_ = {};
        for (uint32_t i = 0; i < count; ++i)
            stats_.commands += buffers[i] ? buffers[i]->GetStreamSize() > 0 : 0;
    }
    void ExecuteBuffers(CommandBuffer* const*, uint32_t, IBufferListener* listener, void* userData) override {
        if (listener) listener->OnBuffersConsumed(userData);
    }
    void FreeSurfaces(const SurfaceId*, uint32_t) override {}
    void FreeImages(const ImageId*, uint32_t) override {}
    CaptureData SerializeBuffers(CommandBuffer* const*, uint32_t) override { return {}; }
    void FreeCapture(CaptureData) override {}
    void SetCacheLimit(SceneCache, CacheLimit, uint64_t) override {}
    void ClearCaches(uint32_t) override {}
    void SetCustomCompositor(ICustomCompositor*) override {}
    void SetCustomEffectRenderer(ICustomEffectRenderer*) override {}
    SceneStats GetStats() const override { return stats_; }
    void FreeResources() override {}
    void Finish() override {}
    void Destroy() override { HeapDelete(this); }

  private:
    std::atomic<uint64_t> frames_{1};
    SceneStats stats_;
};

class NullLibrary final : public IRenderingLibrary {
  public:
    void RegisterRenderThread(void*, void*, uint64_t) override {}
    void FreeRenderingResources() override {}
    const char* GetBuildIdentifier() const override { return kBuildIdentifier.text; }
    void SetFileManipulator(IFileManipulator* files) override { fonts_.SetFiles(files); }
    IFontService* GetFontService() override { return &fonts_; }
    IScene* CreateScene(const SceneParams&) override { return HeapNew<NullScene>(); }
    void SetPaintHelpers(IPaintHelpers*) override {}
    void RetireImages(const ImageId*, uint32_t) override {}
    void Forward(uint64_t, uint64_t, uint64_t) override {}
    void Destroy() override {
        HeapDelete(this);
        Library::Stop();
    }
    FontService& fonts() { return fonts_; }

  private:
    FontService fonts_;
};

}  // namespace

IRenderingLibrary* CreateNullRenderingLibrary(const RenderingLibraryParams& params) {
    Library::Start(params.allocator, params.logHandler, params.loggingSeverity);
    auto* library = HeapNew<NullLibrary>();
    if (!library) {
        Library::Stop();
        return nullptr;
    }
    library->fonts().SetOptions(params.additionalOptions);
    return library;
}

}  // namespace fresco
