// A scene of the CPU back end.
#pragma once
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {

class CpuScene final : public IScene {
  public:
    explicit CpuScene(SharedState& shared) : shared_(shared), backend_(shared) {}

    void SetRenderTarget(void* color, void* depth, const RenderTargetDescription& description) override;
    uint64_t NewFrame() override { return frames_.fetch_add(1, std::memory_order_relaxed); }
    void ExecuteFrontEnd(CommandBuffer* const* buffers, uint32_t count) override;
    void ExecuteBackEnd(CommandBuffer* const* buffers, uint32_t count) override;
    void ExecuteBuffers(CommandBuffer* const* buffers, uint32_t count, IBufferListener* listener,
                        void* userData) override;
    void FreeSurfaces(const SurfaceId* ids, uint32_t count) override;
    void FreeImages(const ImageId* ids, uint32_t count) override;
    CaptureData SerializeBuffers(CommandBuffer* const* buffers, uint32_t count) override;
    void FreeCapture(CaptureData capture) override;
    void SetCacheLimit(SceneCache cache, CacheLimit limit, uint64_t value) override;
    void ClearCaches(uint32_t mask) override;
    void SetCustomCompositor(ICustomCompositor* compositor) override {
        backend_.SetCustomCompositor(compositor);
    }
    void SetCustomEffectRenderer(ICustomEffectRenderer* renderer) override {
        backend_.SetCustomEffectRenderer(renderer);
    }
    SceneStats GetStats() const override { return const_cast<CpuBackend&>(backend_).stats(); }
    void FreeResources() override;
    void Finish() override {}
    void Destroy() override;

    // For replays, whose streams are not command buffers.
    CpuBackend& backend() { return backend_; }

  private:
    void ExecuteAll(CommandBuffer* const* buffers, uint32_t count);
    bool PaintInBands(CommandBuffer* const* buffers, uint32_t count);

    SharedState& shared_;
    CpuBackend backend_;
    // For helping threads; made when the first one may come.
    Vector<std::unique_ptr<CpuBackend, HeapDeleter<CpuBackend>>> helpers_;
    std::atomic<uint64_t> frames_{1};
};

}  // namespace fresco::cpu
