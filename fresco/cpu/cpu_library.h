// The CPU implementation of IRenderingLibrary.
#pragma once
#include <fresco/rendering_library.h>
#include "fresco/cpu/cpu_backend.h"

namespace fresco::cpu {

class CpuLibrary final : public IRenderingLibrary {
  public:
    void RegisterRenderThread(void*, void*, uint64_t) override {}
    void FreeRenderingResources() override;
    const char* GetBuildIdentifier() const override { return kBuildIdentifier.text; }
    // Only fonts that the options name are opened by the library itself.
    void SetFileManipulator(IFileManipulator* files) override { shared_.fonts.SetFiles(files); }
    IFontService* GetFontService() override { return &shared_.fonts; }
    IScene* CreateScene(const SceneParams& params) override;
    void SetPaintHelpers(IPaintHelpers* helpers) override { shared_.helpers = helpers; }
    void RetireImages(const ImageId* ids, uint32_t count) override {
        shared_.resources.RetireImages(ids, count);
    }
    void Forward(uint64_t first, uint64_t second, uint64_t third) override;
    void Destroy() override;

    SharedState& shared() { return shared_; }

  private:
    SharedState shared_;
};

}  // namespace fresco::cpu
