// The rendering library as an object: fonts, scenes, and the render thread's resources. The engine works with
// any implementation of this class; two are given here.
#pragma once
#include <fresco/allocator.h>
#include <fresco/build_identifier.h>
#include <fresco/file_manipulator.h>
#include <fresco/font.h>
#include <fresco/logging.h>
#include <fresco/paint_helpers.h>
#include <fresco/scene.h>

namespace fresco {

struct RenderingLibraryParams {
    IAllocator* allocator = nullptr;  // null: malloc
    Logging::ILogHandler* logHandler = nullptr;
    uint32_t loggingSeverity = Logging::Info;
    float floatParam = 2.5f;
    uint32_t regionParams[2] = {};
    const char* additionalOptions = nullptr;
    uint64_t extraParam = 0;
};

class IRenderingLibrary {
  public:
    // The CPU back end. Null on failure.
    static IRenderingLibrary* Initialize(const RenderingLibraryParams& params);

    // The calling thread becomes the render thread; the arguments belong to the back end (the CPU one takes
    // none).
    virtual void RegisterRenderThread(void* device, void* context, uint64_t flags) = 0;
    // Images and surfaces go; ids stay taken. Render thread.
    virtual void FreeRenderingResources() = 0;
    // 64 hexadecimal digits that change with the interfaces in this folder: kBuildIdentifier.text.
    virtual const char* GetBuildIdentifier() const = 0;
    virtual void SetFileManipulator(IFileManipulator* files) = 0;
    virtual IFontService* GetFontService() = 0;
    virtual IScene* CreateScene(const SceneParams& params) = 0;
    // Who helps with the frames of all scenes from now on; null (as at the start): nobody. The object must
    // live until it is replaced. Render thread, or any before the first frame.
    virtual void SetPaintHelpers(IPaintHelpers* helpers) = 0;
    // Names that nobody draws any more: the images go with the next work on the render thread. Any thread.
    virtual void RetireImages(const ImageId* ids, uint32_t count) = 0;
    // Passed on from the engine's own forwarding operation.
    virtual void Forward(uint64_t first, uint64_t second, uint64_t third) = 0;
    // No scene may be left.
    virtual void Destroy() = 0;

  protected:
    ~IRenderingLibrary() = default;
};

// Takes every call and draws nothing: for tests, and servers that only want layout. Fonts measure as usual.
IRenderingLibrary* CreateNullRenderingLibrary(const RenderingLibraryParams& params);

}  // namespace fresco
