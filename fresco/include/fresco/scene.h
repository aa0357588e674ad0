// A scene: where one view's buffers are executed. All operations but NewFrame belong to the render thread.
#pragma once
#include <fresco/command_buffer.h>

namespace fresco {

struct SceneParams {
    uint32_t values[3] = {};
};

struct SampleDescription {
    uint32_t width = 0, height = 0;
    uint32_t samples = 1;
    uint32_t flags = 256;
};

struct RenderTargetDescription {
    SampleDescription color, depth;
};

// What `color` points at for the CPU back end: RGBA8, premultiplied, of the size that the description gives.
// The client keeps it until another target is set.
struct CpuRenderTarget {
    void* pixels = nullptr;
    uint32_t width = 0, height = 0;
    uint32_t rowPitch = 0;  // bytes
};

enum class SceneCache : uint32_t { ScratchLayers, ScratchTextures, Cache4 };
enum class CacheLimit : uint32_t { Count, Bytes };

// A recorded frame with all that it needs; the content of a capture file. Freed with IScene::FreeCapture.
struct CaptureData {
    void* data = nullptr;
    size_t size = 0;
};

// Told when a list of buffers has been consumed and pixels that it referred to may go.
class IBufferListener {
  public:
    virtual void OnBuffersConsumed(void* userData) = 0;

  protected:
    ~IBufferListener() = default;
};

// The client's hook for `custom` effects: draws into the layer's pixels in place.
struct CustomEffectLayer {
    const char* name;
    const float* params;  // four
    const char* text1;
    const char* text2;
    void* pixels;  // RGBA8 premultiplied for the CPU back end
    uint32_t width, height, rowPitch;
    Matrix4 transform;  // current where the layer began
};

class ICustomEffectRenderer {
  public:
    virtual ~ICustomEffectRenderer() = default;
    virtual void RenderCustomEffect(const CustomEffectLayer& layer) = 0;
};

// The client's hook for layers that bear a composition id: it gets the finished layer instead of the target.
struct CompositionLayer {
    const char* id;
    const void* pixels;  // RGBA8 premultiplied for the CPU back end
    uint32_t width, height, rowPitch;
    int32_t x, y;  // of the layer in the target
    float opacity;
    Matrix4 worldMatrix;
    Rect aabb;
};

class ICustomCompositor {
  public:
    virtual ~ICustomCompositor() = default;
    // False: the library merges the layer as usual.
    virtual bool OnLayer(const CompositionLayer& layer) = 0;
};

// Counts of the last ExecuteBackEnd. With paint helpers a draw or layer counts for each band that it touches.
struct SceneStats {
    uint64_t commands = 0;
    uint64_t draws = 0;
    uint64_t paintedPixels = 0;  // pixels that some draw touched, counted for each draw
    uint64_t layers = 0;

    SceneStats& operator+=(const SceneStats& other) {
        commands += other.commands, draws += other.draws;
        paintedPixels += other.paintedPixels, layers += other.layers;
        return *this;
    }
};

class IScene {
  public:
    // `color` and `depth` are the back end's own; null colour means no target, and draws into it do nothing.
    virtual void SetRenderTarget(void* color, void* depth, const RenderTargetDescription& description) = 0;
    // A number for the frame to come; may be called from the main thread.
    virtual uint64_t NewFrame() = 0;
    // Resource buffers of a frame, before its drawing: those with a surface draw into it.
    virtual void ExecuteFrontEnd(CommandBuffer* const* buffers, uint32_t count) = 0;
    // The frame's drawing, into the render target.
    virtual void ExecuteBackEnd(CommandBuffer* const* buffers, uint32_t count) = 0;
    // A list on its own, without a frame. `listener` may be null.
    virtual void ExecuteBuffers(CommandBuffer* const* buffers, uint32_t count, IBufferListener* listener,
                                void* userData) = 0;
    // Frees after the frame: ids that do not exist are ignored.
    virtual void FreeSurfaces(const SurfaceId* ids, uint32_t count) = 0;
    virtual void FreeImages(const ImageId* ids, uint32_t count) = 0;
    // The given buffers with the images, surfaces, fonts and target content that they start from. Call it
    // before the buffers execute and after the uploads they rely on. Data is null when there is no memory.
    virtual CaptureData SerializeBuffers(CommandBuffer* const* buffers, uint32_t count) = 0;
    virtual void FreeCapture(CaptureData capture) = 0;
    virtual void SetCacheLimit(SceneCache cache, CacheLimit limit, uint64_t value) = 0;
    // Mask: 4, 8 scratch layers, 16 scratch textures.
    virtual void ClearCaches(uint32_t mask) = 0;
    virtual void SetCustomCompositor(ICustomCompositor* compositor) = 0;
    virtual void SetCustomEffectRenderer(ICustomEffectRenderer* renderer) = 0;
    virtual SceneStats GetStats() const = 0;
    // Everything that the scene alone holds, the surfaces that its buffers made included; images stay.
    virtual void FreeResources() = 0;
    // The last call on the render thread: what is in flight is done when it returns.
    virtual void Finish() = 0;
    // Any thread. What the scene holds goes with it, or with the next work on the render thread.
    virtual void Destroy() = 0;

  protected:
    ~IScene() = default;
};

}  // namespace fresco
